#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds run_readme.py documents whose commands fail, and one whose commands work."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

RUNNER = pathlib.Path(__file__).with_name("run_readme.py")


class RunReadme(unittest.TestCase):
    def run_document(self, text):
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            (root / "README.md").write_text(text)
            for name, script in (("dev", "printf '  run   run\\n  test  test\\n'"), ("tool", "exit ${2:-0}")):
                (root / name).write_text(f"#!/bin/sh\n{script}\n")
                (root / name).chmod(0o755)
            result = subprocess.run([sys.executable, RUNNER, root / "README.md", root / "tool"], capture_output=True,
                                    text=True, check=False)
            return result.returncode, result.stdout

    def test_good_commands(self):
        code, text = self.run_document("```sh\n./dev run  # what one sees\npmxboard run 0\n"
                                       "build/release/pmxboard run \\\n    0\n\ntest -e README.md\n```\n")
        self.assertEqual(0, code, text)
        self.assertEqual(4, text.count("README.md:"))

    def test_other_blocks_are_no_commands(self):
        code, text = self.run_document("```sh\n./dev test\n```\n```c\nfalse\n```\n```\nfalse\n```\nfalse\n")
        self.assertEqual(0, code, text)

    def test_failures(self):
        for command, message in (("./dev frobnicate", "frobnicate is no verb"), ("pmxboard run 3", "exit code 3"),
                                 ("build/release/pmxboard run 4", "exit code 4"), ("false | true", "exit code 1"),
                                 ("./dev", "no verb")):
            code, text = self.run_document(f"```sh\n{command}\n```\n")
            self.assertEqual(1, code, text)
            self.assertIn(message, text)

    def test_a_document_without_commands(self):
        code, text = self.run_document("# Title\n")
        self.assertEqual(1, code, text)
        self.assertIn("no commands found", text)


if __name__ == "__main__":
    unittest.main()
