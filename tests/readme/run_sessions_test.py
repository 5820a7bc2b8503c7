#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds run_sessions.py sessions that show what comes, and such that do not."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

RUNNER = pathlib.Path(__file__).with_name("run_sessions.py")
TOOL = """#!/bin/sh
test "$1" = shell || { printf 'one\\ntwo\\nthree\\nfour\\n'; exit "${1:-0}"; }
while read -r line; do echo "> $line"; echo "did $line"; touch "$line"; done
"""


class RunSessions(unittest.TestCase):
    def run_document(self, text, *options):
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            (root / "README.md").write_text(text, encoding="utf-8")
            (root / "tool").write_text(TOOL)
            (root / "scenarios").mkdir()
            (root / "scenarios/here.pmx").touch()
            (root / "tool").chmod(0o755)
            result = subprocess.run([sys.executable, RUNNER, *options, root / "README.md", root / "tool"],
                                    capture_output=True, text=True, check=False)
            return result.returncode, result.stdout

    def test_good(self):
        code, text = self.run_document("```console\n$ pmxboard 0\none\n…\nthree\n…\n$ pmxboard shell\npmx> a\ndid a\n"
                                       "pmx> b\n…\n$ ls a b scenarios build\na\nb\n\nbuild:\n\nscenarios:\n"
                                       "here.pmx\n```\n```sh\nfalse\n```\n", "--most", "5")
        self.assertEqual(0, code, text)
        self.assertIn("5 commands, 0 failures", text)

    def test_bad(self):
        for block, message in (("$ pmxboard 0\none\n", "README.md:2: shows something else"),
                               ("$ pmxboard 0\none\n…\nfive\n…\n", "shows something else"),
                               ("$ pmxboard 0\n…\nthree\n…\ntwo\n…\n", "shows something else"),
                               ("$ pmxboard 0\ntwo\n…\n", "shows something else"),
                               ("$ pmxboard 0\n…\nthree\n", "shows something else"),
                               ("$ pmxboard 3\n…\n", "exit code 3"),
                               ("$ pmxboard shell\npmx> a\ndid b\n", "README.md:3: shows something else"),
                               ("pmx> a\n", "of no shell"),
                               ("$ true\n$ true\n$ true\n", "at most 2 are wanted"),
                               ("", "no sessions found")):
            code, text = self.run_document(f"```console\n{block}```\n", "--most", "2")
            self.assertEqual(1, code, block)
            self.assertIn(message, text)


if __name__ == "__main__":
    unittest.main()
