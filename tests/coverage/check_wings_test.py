#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The check of board and tool, held against what it must refuse, and what it must not write."""

import pathlib
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import check_wings  # noqa: E402
from counted import Missing  # noqa: E402


class Wings(unittest.TestCase):
    IF, LINE = Missing("board/one.cpp", "branch", "if (a && b)"), Missing("board/one.cpp", "line", "return 1;")

    def test_files_belong_to_their_wing(self):
        tool = "tools/pmxboard/"
        for name, wing in (("board/mixer.cpp", "board"), ("board/picture/mix.cpp", None),
                           ("recorder/ring.h", "recorder"), (tool + "recording/replay.cpp", "recorder"),
                           (tool + "language/line.cpp", "language"), (tool + "decode/log.cpp", "decode"),
                           (tool + "report/page.cpp", None)):
            self.assertEqual(wing, check_wings.wing_of(name))

    def test_what_is_written_is_read(self):
        missing = {self.IF: 2, self.LINE: 12, Missing("recorder/ring.h", "line", "}"): 1}
        self.assertEqual(missing, check_wings.read_yet(check_wings.written(missing)))

    def test_same_as_before_is_fine(self):
        self.assertEqual([], list(check_wings.compare({self.IF: 2}, {}, {self.IF: 2})))
        self.assertEqual([], list(check_wings.compare({self.IF: 2}, {self.IF: 2}, {})))
        self.assertEqual([], list(check_wings.compare({self.IF: 2}, {self.IF: 1}, {self.IF: 1})))

    def test_what_is_new_and_what_is_gone_are_told(self):
        self.assertIn("2 branches never taken, 0 in the list", next(check_wings.compare({self.IF: 2}, {}, {})))
        self.assertIn("0 branches never taken, 2 in the list", next(check_wings.compare({}, {}, {self.IF: 2})))

    def test_a_reason_for_what_is_reached_is_refused(self):
        told = next(check_wings.compare({self.IF: 1}, {self.IF: 2}, {}))
        self.assertIn("in the list of what cannot be, 1 seen", told)

    def test_a_list_is_written_anew_when_nothing_became_worse(self):
        with tempfile.TemporaryDirectory() as folder:
            place = pathlib.Path(folder) / "list"
            self.assertEqual([], check_wings.renew({self.IF: 3, self.LINE: 1}, {self.IF: 1}, place))
            self.assertEqual({self.IF: 2, self.LINE: 1}, check_wings.read_yet(place.read_text(encoding="utf-8")))
            elsewhere = self.IF._replace(text="if (c)")
            self.assertEqual([], check_wings.renew({elsewhere: 2}, {}, place))
            self.assertEqual({elsewhere: 2}, check_wings.read_yet(place.read_text(encoding="utf-8")))

    def test_a_list_that_became_worse_stays(self):
        with tempfile.TemporaryDirectory() as folder:
            place = pathlib.Path(folder) / "list"
            check_wings.renew({self.IF: 1}, {}, place)
            self.assertEqual(["board: 2 branches never taken, 1 before: write their tests"],
                             check_wings.renew({self.IF: 2}, {}, place))
            self.assertEqual({self.IF: 1}, check_wings.read_yet(place.read_text(encoding="utf-8")))


if __name__ == "__main__":
    unittest.main()
