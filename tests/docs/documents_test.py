#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds documents.py a document that is right, and documents with each kind of mistake."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("documents.py")


class Documents(unittest.TestCase):
    def check(self, text):
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            for name, content in (("docs/porting.md", text), ("docs/board.md", "# Board\n"), ("tool", "#!/bin/sh\n")):
                (root / name).parent.mkdir(parents=True, exist_ok=True)
                (root / name).write_text(content)
            (root / "tool").chmod(0o755)
            result = subprocess.run([sys.executable, CHECKER, root, root / "tool", root / "docs/porting.md"],
                                    capture_output=True, text=True, check=False)
            return result.returncode, result.stdout + result.stderr

    def test_a_document_that_is_right(self):
        code, text = self.check("[a](board.md) [b](board.md#time) [c](../tool) [d](https://a.example/b)\n"
                                "```sh\npmxboard run && test -e docs/board.md\n```\n")
        self.assertEqual(0, code, text)

    def test_mistakes(self):
        for wrong, message in (("[a](nowhere.md)\n", "porting.md:2: leads nowhere: nowhere.md"),
                               ("```sh\nfalse\n```\n", "porting.md:3: false: exit code 1")):
            code, text = self.check("# Title\n" + wrong)
            self.assertEqual(1, code, text)
            self.assertIn(message, text)


if __name__ == "__main__":
    unittest.main()
