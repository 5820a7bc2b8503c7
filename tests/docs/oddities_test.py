#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds oddities.py a document that is right, and documents with each kind of mistake."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("oddities.py")
HEADING = "| What a caller sees | What depends on it | Test |\n|---|---|---|\n"
SOURCE = "TEST(Plain, One)\n{\n}\nTEST_F(Fixture, Two_ToBe)\nTEST_P(Swept, Three)\n// TEST(Plain, Gone)\n"


class Oddities(unittest.TestCase):
    def check(self, text):
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            (root / "tests/deep").mkdir(parents=True)
            (root / "tests/deep/some_test.cpp").write_text(SOURCE)
            (root / "oddities.md").write_text(text)
            result = subprocess.run([sys.executable, CHECKER, root / "oddities.md", root / "tests"],
                                    capture_output=True, text=True, check=False)
            return result.returncode, result.stdout + result.stderr

    def test_rows_that_name_tests(self):
        code, text = self.check(f"# Title\n\n{HEADING}| `a` | b | `Plain.One`, `Fixture.Two_ToBe` |\n"
                                f"| c | | `Swept.Three` |\n\nText.\n")
        self.assertEqual(0, code, text)
        self.assertIn("3 tests named", text)

    def test_mistakes(self):
        for row, message in (("| a | b | `Plain.Two` |", "oddities.md:3: there is no test Plain.Two"),
                             ("| a | b | `Plain.Gone` |", "there is no test Plain.Gone"),
                             ("| a | b | `Fixture.One` |", "there is no test Fixture.One"),
                             ("| a | b | |", "no test is named"),
                             ("| a | b | none |", "something else than tests"),
                             ("| a | `Plain.One` |", "three cells"),
                             ("| | b | `Plain.One` |", "the first one says something")):
            code, text = self.check(f"{HEADING}{row}\n| a | b | `Plain.One` |\n")
            self.assertEqual(1, code, text)
            self.assertIn(message, text)

    def test_another_table(self):
        code, text = self.check(f"{HEADING}| a | b | `Plain.One` |\n\n| Another |\n|---|\n| row |\n")
        self.assertEqual(1, code, text)
        self.assertIn("oddities.md:5: a table begins with", text)

    def test_no_rows(self):
        for text in ("# Title\n", HEADING):
            code, text = self.check(text)
            self.assertEqual(1, code, text)
            self.assertIn("no rows found", text)


if __name__ == "__main__":
    unittest.main()
