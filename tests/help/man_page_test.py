#!/usr/bin/env python3
"""Feeds man_page.py pages that tell too little, too much, or are broken."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("man_page.py")
TOOL = """#!/bin/sh
case "$1" in
walk) printf 'Options:\\n  -h,--help   Help\\n  --far NAME  Far\\n\\nExamples:\\n' ;;
*) printf 'Options:\\n  -h,--help   Help\\n\\nSubcommands:\\n  walk  Walk.\\n\\n' ;;
esac
"""
PAGE = """.Dd November 21, 2026
.Dt TOOL 1
.Os
.Sh NAME
.Nm tool
.Nd a tool
.Sh DESCRIPTION
.Bl -tag -width indent
.It Cm walk
Walk.
.It Fl h , -help
Help.
.It Fl -far Ar name
Far.
.El
"""


class ManPage(unittest.TestCase):
    def check(self, page):
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            (root / "tool").write_text(TOOL)
            (root / "tool").chmod(0o755)
            (root / "tool.1").write_text(page)
            result = subprocess.run([sys.executable, CHECKER, root / "tool", root / "tool.1"], capture_output=True,
                                    text=True, check=False)
            return result.returncode, result.stdout + result.stderr

    def test_good(self):
        code, text = self.check(PAGE)
        self.assertEqual(0, code, text)
        self.assertIn("1 sub-commands and 3 options", text)

    def test_bad(self):
        for page, message in ((PAGE.replace("Cm walk", "Cm run"), "walk: the manual page tells nothing"),
                              (PAGE.replace("Cm walk", "Cm run"), "run: the tool has no such thing"),
                              (PAGE.replace("Fl h , -help", "Fl h"), "--help: the manual page tells nothing"),
                              (PAGE.replace("Fl -far", "Fl -near"), "--near: the tool has no such thing"),
                              (PAGE + ".Bogus\n", "skipping unknown macro")):
            code, text = self.check(page)
            self.assertEqual(1, code, text)
            self.assertIn(message, text)


if __name__ == "__main__":
    unittest.main()
