#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What is read of clang's counts, and what is made of it, held against reports that must be refused."""

import pathlib
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import counted  # noqa: E402
from counted import File, Missing, Segment, Total  # noqa: E402

SOURCE = """int one(int a, int b)
{
    if (a && b)
        return 1;
    return 0;
}
"""
# The body, "b", and what is returned when both are true; a gap stands before that.
BODY, RIGHT, GAP, THEN = [2, 1], [3, 14], [3, 16], [4, 9]
A, B, BOTH = [3, 9, 3, 10], [3, 14, 3, 15], [3, 9, 3, 15]


def report(body=2, right=1, then=1, branches=((1, 1), (1, 1)), alone=(True, True)):
    return {
        "segments": [[*BODY, body, True, True, False], [*RIGHT, right, True, True, False],
                     [3, 15, body, True, False, False], [*GAP, then, True, True, True],
                     [*THEN, then, True, True, False], [4, 18, body, True, False, False],
                     [6, 2, 0, False, False, False]],
        "branches": [[*place, true, false, 0, 0, 4] for place, (true, false) in zip((A, B), branches)],
        "mcdc_records": [[*BOTH, 0, 5, list(alone)]],
    }


def file(*arguments, **more):
    return File("board/one.cpp", report(*arguments, **more), SOURCE)


class Reading(unittest.TestCase):
    def test_what_is_reached_is_not_missing(self):
        self.assertEqual({}, file().missing())
        self.assertEqual({"line": Total(5, 5), "branch": Total(4, 4), "condition": Total(2, 2)}, file().totals())

    def test_line_is_known_by_what_begins_on_it(self):
        self.assertEqual({2: 2, 3: 2, 4: 0, 5: 2, 6: 2}, file(then=0).lines)
        self.assertEqual({Missing("board/one.cpp", "line", "return 1;"): 1}, file(then=0).missing())

    def test_lines_that_follow_one_another_are_one(self):
        nothing = file(0, 0, 0, ((0, 0), (0, 0)), (False, False)).missing()
        self.assertEqual(5, nothing[Missing("board/one.cpp", "line", "{")])
        self.assertEqual(4, nothing[Missing("board/one.cpp", "branch", "if (a && b)")])
        self.assertEqual(2, nothing[Missing("board/one.cpp", "condition", "if (a && b)")])

    def test_an_outcome_that_never_came_about_is_missing(self):
        self.assertEqual({Missing("board/one.cpp", "branch", "if (a && b)"): 2},
                         file(branches=((1, 0), (1, 0))).missing())

    def test_a_condition_that_was_never_come_to_is_missing(self):
        self.assertEqual({Missing("board/one.cpp", "branch", "if (a && b)"): 3},
                         file(right=0, branches=((0, 2), (0, 0))).missing())

    def test_a_condition_that_the_compiler_answers_is_none(self):
        self.assertEqual(Total(2, 2), file(branches=((1, 1), (0, 0))).totals()["branch"])

    def test_a_condition_that_never_decided_is_missing(self):
        self.assertEqual({Missing("board/one.cpp", "condition", "if (a && b)"): 1},
                         file(alone=(True, False)).missing())

    def test_what_is_compiled_twice_counts_together(self):
        both = report(branches=((1, 0), (1, 0)), alone=(True, False))
        other = report(branches=((0, 1), (0, 1)), alone=(False, True))
        for name in ("branches", "mcdc_records"):
            both[name] += other[name]
        self.assertEqual({}, File("board/one.cpp", both, SOURCE).missing())

    def test_what_is_counted_apart_counts_together(self):
        one, other = file(then=0, branches=((1, 0), (1, 0))), file(branches=((0, 1), (0, 1)))
        one.count_also(other)
        self.assertEqual({}, one.missing())
        one.count_also(one)
        self.assertEqual({(3, 9, 3, 10): [1, 1], (3, 14, 3, 15): [1, 1]}, one.branches)

    def test_lines_that_are_left_out_by_the_preprocessor_are_none(self):
        segments = [Segment(1, 1, 1, True, True, False), Segment(3, 1, 0, False, True, False),
                    Segment(5, 1, 1, True, False, False), Segment(6, 2, 0, False, False, False)]
        self.assertEqual([1, 2, 6], [number for number, _ in counted.lines_of(segments)])

    def test_no_code_has_no_lines(self):
        self.assertEqual([], list(counted.lines_of([])))


class List(unittest.TestCase):
    ENTRY = "board/one.cpp branch 2\n    if (a && b)\nnobody calls it so\n"
    ONE = Missing("board/one.cpp", "branch", "if (a && b)")

    def test_entries_are_read(self):
        text = "# what it is\n\n" + self.ENTRY + "\n" + self.ENTRY.replace("branch 2", "line 1")
        self.assertEqual(({self.ONE: 2, self.ONE._replace(kind="line"): 1}, []), counted.read_list(text))

    def test_list_may_be_empty(self):
        self.assertEqual(({}, []), counted.read_list("# nothing\n"))

    def test_bad_entries_are_named(self):
        for bad in (self.ENTRY.replace("nobody calls it so\n", ""), self.ENTRY.replace(" 2", ""),
                    self.ENTRY.replace(" 2", " 0"), self.ENTRY.replace("branch", "brunch"),
                    self.ENTRY + "\n" + self.ENTRY):
            self.assertEqual(1, len(counted.read_list(bad)[1]), bad)

    def test_more_and_fewer_than_listed_are_refused(self):
        self.assertEqual([], list(counted.judge({self.ONE: 2}, {self.ONE: 2})))
        for missing, known in (({self.ONE: 2}, {}), ({}, {self.ONE: 2}), ({self.ONE: 1}, {self.ONE: 2})):
            self.assertEqual(1, len(list(counted.judge(missing, known))))

    def test_percent_is_not_rounded_up(self):
        self.assertEqual("  1999 of  2000  99.9%", str(Total(1999, 2000)))


class Running(unittest.TestCase):
    def test_a_failed_program_is_told(self):
        with tempfile.TemporaryDirectory() as folder:
            counts = pathlib.Path(folder)
            failed = counted.run([["true"], ["sh", "-c", "echo odd; exit 3"]], counts, counts)
            self.assertIn("ended with 3\nodd", failed)
            self.assertEqual("", counted.run([["true"]], counts, counts))


if __name__ == "__main__":
    unittest.main()
