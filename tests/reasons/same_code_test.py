#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The check itself: what it takes out, and that it sees a reason which leaves something behind.

usage: same_code_test.py SOURCE_DIRECTORY COMPILER FLAG...
"""

import pathlib
import shutil
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import check_same_code  # noqa: E402
import expand  # noqa: E402

SOURCES, COMMAND = pathlib.Path(sys.argv[1]), sys.argv[2:]


class Expansion(unittest.TestCase):
    def test_an_answer_is_what_is_left(self):
        self.assertEqual(expand.without_reasons("return PMX_WHY(MIXER_ID, 0, ucPmxId);"), "return (0);")

    def test_a_note_leaves_nothing(self):
        self.assertEqual(expand.without_reasons("{ PMX_NOTE(FULL_CHANGE, f(a, b), 2); g(); }"), "{ ; g(); }")
        self.assertEqual(expand.without_reasons("PMX_NOTE_IF(a < 0, X, a);"), ";")

    def test_of_two_answers_the_last_is_left(self):
        self.assertEqual(expand.without_reasons("return PMX_WHY_EITHER(a, PMX_WHY(A, 0), PMX_WHY(B, 1, 2));"),
                         "return (1);")

    def test_lines_stay(self):
        self.assertEqual(expand.without_reasons("a\nreturn PMX_WHY(X,\n  0,\n  f(1));\nb"), "a\nreturn (0)\n\n;\nb")

    def test_each_place_is_found(self):
        text = "PMX_WHY_EITHER(a, PMX_WHY(A, 0),\n PMX_WHY(B, 0));\nPMX_NOTE_IF(x, C);\nPMX_NOTE(D, 1);"
        self.assertEqual(list(expand.places(text)), [("A", 1), ("B", 2), ("C", 3), ("D", 4)])

    def test_a_macro_without_end_is_told(self):
        with self.assertRaises(ValueError):
            expand.without_reasons("PMX_NOTE(A, (1)")


class SameCode(unittest.TestCase):
    def result_with(self, old, new):
        with tempfile.TemporaryDirectory() as folder:
            sources = pathlib.Path(folder) / "pmx"
            shutil.copytree(SOURCES, sources)
            why = sources / "pmx_why.h"
            text = why.read_text(encoding="utf-8")
            self.assertIn(old, text)
            why.write_text(text.replace(old, new), encoding="utf-8")
            return check_same_code.main(sources, *COMMAND)

    def test_a_note_that_does_something_is_found(self):
        self.assertEqual(self.result_with("#define PMX_NOTE(Name, ...) ((void)0)",
                                          "#define PMX_NOTE(Name, ...) ((void)(bComp0OnTop = 1))"), 1)

    def test_another_answer_is_found(self):
        self.assertEqual(self.result_with("#define PMX_WHY(Name, Answer, ...) (Answer)",
                                          "#define PMX_WHY(Name, Answer, ...) (decltype(Answer))((Answer) + 1)"), 1)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
