#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds help_examples.py tools whose examples work, and such whose do not."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("help_examples.py")

TOOL = """#!/bin/sh
case "$1$2" in
--help) printf 'A tool.\\n\\nSubcommands:\\n  walk    Walk.\\n\\nExamples:\\n  pmxboard walk 0\\n      walk\\n' ;;
walk--help) printf '%b' "$(cat "$(dirname "$(readlink -f "$0")")/walk")" ;;
walk*) exit "$2" ;;
esac
"""


class HelpExamples(unittest.TestCase):
    def check(self, walk_help):
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            (root / "tool").write_text(TOOL)
            (root / "tool").chmod(0o755)
            (root / "walk").write_text(walk_help)
            (root / "scenarios").mkdir()
            result = subprocess.run([sys.executable, CHECKER, root / "tool", root], capture_output=True, text=True,
                                    check=False)
            return result.returncode, result.stdout + result.stderr

    def test_good(self):
        code, text = self.check("Walk.\n\nExamples:\n  pmxboard walk 0\n      one\n"
                                "  pmxboard walk 3 >there; test -d scenarios && exit 3\n      two steps\n"
                                "      fail (exit code 3)\n  cat there\n      what came before is there\n"
                                "\nMore.\n  no\n")
        self.assertEqual(0, code, text)
        self.assertIn("4 examples, 0 failures", text)

    def test_failing(self):
        for walk, message in (("Examples:\n  pmxboard walk 2\n      fails\n", "exit code 2, expected 0"),
                              ("Examples:\n  pmxboard walk 0\n      no (exit code 1)\n", "exit code 0, expected 1"),
                              ("Examples:\n  pmxboard walk 0\n", "is not explained"),
                              ("Walk.\n", "walk --help: no examples")):
            code, text = self.check(walk)
            self.assertEqual(1, code, text)
            self.assertIn(message, text)


if __name__ == "__main__":
    unittest.main()
