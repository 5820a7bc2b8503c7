#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs rules.py on the log reader, and on such as must be refused.

usage: rules_test.py DIRECTORY
"""

import pathlib
import re
import shutil
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("rules.py")
GIVEN = []


class Rules(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.directory = pathlib.Path(directory.name, "decode")
        shutil.copytree(GIVEN[0], self.directory)

    def check(self):
        return subprocess.run([sys.executable, CHECKER, self.directory], capture_output=True, text=True, check=False)

    def replace(self, name, pattern, replacement):
        path = self.directory / name
        text, count = re.subn(pattern, replacement, path.read_text(encoding="utf-8"))
        self.assertNotEqual(0, count, pattern)
        path.write_text(text, encoding="utf-8")

    def refused(self, said):
        result = self.check()
        self.assertEqual(1, result.returncode, result.stdout)
        self.assertRegex(result.stdout, said)

    def test_the_log_reader_is_whole(self):
        result = self.check()
        self.assertEqual(0, result.returncode, result.stdout)

    def test_a_name_without_a_body_is_told(self):
        self.replace("texts.h", r"(?m)^Function opens;", "Function planted;\nFunction opens;")
        self.refused(r"texts\.h:\d+: rules::planted has no body")

    def test_a_body_without_a_row_is_told(self):
        self.replace("texts.h", r"(?m)^Function opens;", "Function planted;\nFunction opens;")
        self.replace("story.cpp", r"(?m)^void rules::opens", "void rules::planted(Teller&, const Item&) {}\n\\g<0>")
        self.refused(r"story\.cpp:\d+: no row of text_table\.cpp follows rules::planted")

    def test_each_rule_that_loses_its_rows_is_told(self):
        names = re.findall(r"(?m)^Function (\w+);", (self.directory / "texts.h").read_text(encoding="utf-8"))
        rows = (self.directory / "text_table.cpp").read_text(encoding="utf-8")
        for name in names:
            self.replace("text_table.cpp", rf"\brules::{name}\b|(?<!Text )\b{name}\b(?! *\()", "another")
            self.refused(rf"story\.cpp:\d+: no row of text_table\.cpp follows rules::{name}\n")
            (self.directory / "text_table.cpp").write_text(rows, encoding="utf-8")

    def test_no_rules_at_all_are_refused(self):
        self.replace("texts.h", r"(?m)^Function ", "Other ")
        self.refused("no rules found")


if __name__ == "__main__":
    GIVEN = sys.argv[1:2]
    unittest.main(argv=sys.argv[:1])
