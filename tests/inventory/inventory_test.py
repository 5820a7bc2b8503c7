#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The counting of tests, held against lists and programs that it must refuse."""

import pathlib
import sys
import unittest

sys.path.insert(0, str(pathlib.Path(__file__).parent))

import inventory  # noqa: E402
import list_suites  # noqa: E402

LISTING = "Running main() from gmock_main.cc\nMute.\n  Off\n  On\nAll/Modes.\n  Each/0  # GetParam() = 1\n  Each/1\n"


class ListSuites(unittest.TestCase):
    def test_suites_and_their_cases(self):
        self.assertEqual({"Mute": 2, "Modes": 2}, list_suites.suites(LISTING))

    def test_what_is_no_list(self):
        for listing in ("", "Running main() from x\n", "Mute.\n", "Mute.\n  Off\nEmpty.\n", "error: no\n"):
            with self.assertRaises(list_suites.Unreadable, msg=listing):
                list_suites.suites(listing)

    def test_registration(self):
        text = list_suites.registration("/b/tests", "layer", "/s", "60", "*/1", ["A=1", "B=x y"], LISTING)
        self.assertIn("add_test([==[layer.Modes]==] [==[/b/tests]==] --gtest_brief=1 "
                      "[==[--gtest_filter=Modes.*:*/Modes.*-*/1]==])", text)
        self.assertIn("ENVIRONMENT [==[A=1;B=x y]==]", text)
        self.assertEqual(2, text.count("add_test("))


class Inventory(unittest.TestCase):
    def test_equal(self):
        self.assertEqual([], list(inventory.complaints({"a": 1, "ctest": 2}, {"a": 1, "ctest": 2})))

    def test_gone_new_fewer_more(self):
        found = list(inventory.complaints({"a": 1, "b": 2, "c": 3}, {"b": 1, "c": 4, "d": 5}))
        self.assertEqual(["a: 1 tests are gone, there is no such program", "b: 1 tests, and there must be 2",
                          "c: 4 tests, and there must be 3", "d: 5 tests, not in the list"], found)

    def test_the_list(self):
        self.assertEqual({"a": 1}, inventory.read("# words\n\na 1\n"))
        for text in ("a\n", "a one\n", "a 1\na 2\n", "a 1 2\n", "a -1\n"):
            with self.assertRaises(ValueError, msg=text):
                inventory.read(text)


if __name__ == "__main__":
    unittest.main()
