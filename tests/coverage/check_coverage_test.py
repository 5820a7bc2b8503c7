#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The coverage check, held against reports that it must refuse."""

import sys
import unittest

sys.dont_write_bytecode = True

from check_coverage import Branch, File, judge, percent, plain_name, read_list, table  # noqa: E402

SOURCE = """void PMX_One()
{
    if (a && b)
        return;
}
void PMX_Two()
{
    if (a && b)
        return;
}
"""


def report(**counts):
    """A report of SOURCE; lines are named line3=(times run, times that each branch was taken…)."""
    lines = []
    for name, (count, *branches) in counts.items():
        lines.append({"line_number": int(name.removeprefix("line")), "count": count,
                      "branches": [{"count": branch} for branch in branches]})
    return File({"file": "src/driver/pmx/pmx_x.cpp", "lines": lines,
                 "functions": [{"name": "PMX_Two", "lineno": 6}, {"name": "PMX_One", "lineno": 1}]}, SOURCE)


IN_ONE = Branch("pmx_x.cpp", "PMX_One", "if (a && b)")
IN_TWO = Branch("pmx_x.cpp", "PMX_Two", "if (a && b)")


class Judge(unittest.TestCase):
    def test_everything_run_is_fine(self):
        self.assertEqual([], judge([report(line1=(1,), line3=(1, 1, 1))], {}))

    def test_line_never_run_is_named(self):
        self.assertEqual(["src/driver/pmx/pmx_x.cpp:4: never run: return;"], judge([report(line4=(0,))], {}))

    def test_line_never_run_cannot_be_allowed(self):
        self.assertEqual(1, len(judge([report(line3=(0, 0, 0))], {IN_ONE: 2})))

    def test_branch_never_taken_is_named_with_its_function(self):
        complaints = judge([report(line3=(1, 1, 1), line8=(1, 1, 0))], {})
        self.assertEqual(["pmx_x.cpp: PMX_Two: if (a && b)\n    1 branches never taken, 0 in the list"], complaints)

    def test_listed_branch_is_fine(self):
        self.assertEqual([], judge([report(line8=(1, 1, 0, 0))], {IN_TWO: 2}))

    def test_entry_holds_for_its_own_function_alone(self):
        self.assertEqual(2, len(judge([report(line8=(1, 1, 0))], {IN_ONE: 1})))

    def test_more_branches_than_listed_are_refused(self):
        self.assertIn("2 branches never taken, 1 in the list", judge([report(line8=(1, 0, 0))], {IN_TWO: 1})[0])

    def test_fewer_branches_than_listed_are_refused(self):
        self.assertIn("allows for 2 branches never taken, there are 1",
                      judge([report(line8=(1, 1, 0))], {IN_TWO: 2})[0])

    def test_entry_that_is_covered_is_refused(self):
        self.assertIn("allows for 1 branches never taken, there are 0",
                      judge([report(line8=(1, 1, 1))], {IN_TWO: 1})[0])

    def test_entry_of_a_line_that_is_gone_is_refused(self):
        gone = Branch("pmx_x.cpp", "PMX_One", "if (c)")
        self.assertEqual(1, len(judge([report(line3=(1, 1, 1))], {gone: 1})))


class List(unittest.TestCase):
    ENTRY = "pmx_x.cpp PMX_Two 2\n    if (a && b)\nnobody calls it so\n"

    def test_entries_are_read(self):
        text = "# what the list is\n\n" + self.ENTRY + "\n" + self.ENTRY.replace("PMX_Two 2", "PMX_One 1")
        self.assertEqual(({IN_TWO: 2, IN_ONE: 1}, []), read_list(text))

    def test_list_may_be_empty(self):
        self.assertEqual(({}, []), read_list("# nothing\n"))

    def test_bad_entries_are_named(self):
        for bad in (self.ENTRY.replace("nobody calls it so\n", ""), self.ENTRY.replace(" 2", ""),
                    self.ENTRY.replace(" 2", " 0"), self.ENTRY + "\n" + self.ENTRY):
            self.assertEqual(1, len(read_list(bad)[1]), bad)


class Texts(unittest.TestCase):
    def test_table_sums_up(self):
        *_, last = table([report(line3=(1, 1, 0)), report(line4=(0,), line8=(1, 1, 1))])
        self.assertEqual("all 2 of 3 66% 3 of 4 75%", " ".join(last.split()))

    def test_percent_is_not_rounded_up(self):
        self.assertEqual(["99%", "100%", ""], [percent(1999, 2000), percent(2, 2), percent(0, 0)])

    def test_names_lose_their_parameters(self):
        self.assertEqual("vSetTvType", plain_name("vSetTvType(unsigned char)"))


if __name__ == "__main__":
    unittest.main()
