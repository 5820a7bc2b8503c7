#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The counting of tests, held against lists and programs that it must refuse."""

import pathlib
import sys
import unittest

sys.path.insert(0, str(pathlib.Path(__file__).parent))

import inventory  # noqa: E402
import left_out  # noqa: E402
import list_suites  # noqa: E402

LISTING = "Running main() from gmock_main.cc\nMute.\n  Off\n  On\nAll/Modes.\n  Each/0  # GetParam() = 1\n  Each/1\n"


class ListSuites(unittest.TestCase):
    def test_suites_and_their_cases(self):
        self.assertEqual({"Mute": 2, "Modes": 2}, list_suites.suites(LISTING))

    def test_names_of_cases(self):
        self.assertEqual(["Mute.Off", "Mute.On", "All/Modes.Each/0", "All/Modes.Each/1"], list_suites.cases(LISTING))

    def test_what_is_no_list(self):
        for listing in ("", "Running main() from x\n", "Mute.\n", "Mute.\n  Off\nEmpty.\n", "error: no\n"):
            with self.assertRaises(list_suites.Unreadable, msg=listing):
                list_suites.suites(listing)

    def test_registration(self):
        text = self.registered("--except=*/1", "--always", "Mute", "--environment", "A=1", "B=x y")
        self.assertIn("add_test([==[layer.Modes]==] [==[python]==] [==[-I]==] [==[unchanged.py]==] "
                      "[==[/stamps/layer.Modes]==] [==[boards]==] [==[--]==] [==[/b/tests]==] [==[--gtest_brief=1]==] "
                      "[==[--gtest_filter=Modes.*:*/Modes.*-*/1]==])", text)
        self.assertIn("add_test([==[layer.Mute]==] [==[/b/tests]==] [==[--gtest_brief=1]==] ", text)
        self.assertIn("ENVIRONMENT [==[A=1;B=x y]==]", text)
        self.assertEqual(2, text.count("add_test("))

    def test_a_suite_that_is_not_there_cannot_always_run(self):
        with self.assertRaisesRegex(list_suites.Unreadable, "no such suites: Gone"):
            self.registered("--always", "Mute", "Gone")

    @staticmethod
    def registered(*options):
        return list_suites.registration(list_suites.arguments_of(
            ["/b/tests", "layer", "/s", "60", "out", *options, "--unchanged", "python", "-I", "unchanged.py", "/stamps",
             "boards"]), LISTING)


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


class LeftOut(unittest.TestCase):
    KNOWN = {"layer": ["Mute.Off", "Mute.On", "MuteSweep.Each", "All/Modes.Each/0", "All/Modes.Each/1"]}

    def found(self, *wanted, path=("/b/tests/layer",), **properties):
        return left_out.places([{"command": [*path, *wanted], "properties": [
            {"name": name, "value": value} for name, value in properties.items()]}],
            pathlib.Path("/b"), pathlib.Path("/arm"), self.KNOWN)

    def complaints(self, found, text=""):
        return list(left_out.complaints(left_out.read(text, self.KNOWN), found, self.KNOWN))

    def test_filters_are_read_as_the_test_programs_do(self):
        for wanted, case, expected in (
                ("*", "Mute.Off", True), ("Mute.*", "MuteSweep.Each", False), ("-*Sweep*", "MuteSweep.Each", False),
                ("-*Sweep*:*/1", "Mute.On", True), ("Mute.*:*/Modes.*-*/1", "All/Modes.Each/1", False),
                ("M?te.On", "Mute.On", True)):
            self.assertEqual(expected, left_out.runs(wanted, case), f"{wanted} {case}")

    def test_everything_runs(self):
        self.assertEqual([], self.complaints(self.found()))

    def test_what_is_not_always_run_again_runs(self):
        found = self.found(path=("/python", "unchanged.py", "stamp", "--", "/b/tests/layer"))
        self.assertEqual([], self.complaints(found))

    def test_a_filter_takes_more_than_the_list_says(self):
        self.assertEqual(["layer: 1 cases of MuteSweep are left out, and 0 is what the list says",
                          "layer: nothing of MuteSweep runs anywhere"],
                         self.complaints(self.found("--gtest_filter=-*Sweep*")))

    def test_a_line_for_what_runs(self):
        self.assertEqual(["layer: 0 cases of Mute are left out, and 2 is what the list says"],
                         self.complaints(self.found(), "layer Mute all why not"))

    def test_left_out_here_and_run_on_the_target(self):
        found = self.found("--gtest_filter=-Mute.*") | self.found(path=("/qemu", "/arm/tests/layer"))
        self.assertEqual([], self.complaints(found, "layer Mute all"))

    def test_parts(self):
        part = {"ENVIRONMENT": ["GTEST_TOTAL_SHARDS=2", "GTEST_SHARD_INDEX=1"]}
        self.assertEqual(["layer: not every part of * runs"], self.complaints(self.found(**part)))

    def test_a_program_that_nobody_runs(self):
        for found in ({}, self.found(DISABLED=True), self.found(path=("/python", "/a/check", "/b/tests/layer"))):
            self.assertNotEqual([], self.complaints(found))

    def test_the_list(self):
        for text in ("layer Mute\n", "layer Mute some\n", "layer Sweep all\n", "other Mute all\n",
                     "layer Mute all\nlayer Mute 1\n"):
            with self.assertRaises(ValueError, msg=text):
                left_out.read(text, self.KNOWN)


if __name__ == "__main__":
    unittest.main()
