#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The check of board and tool, held against lists that it must refuse."""

import sys
import unittest

sys.dont_write_bytecode = True

import check_wings  # noqa: E402
from counted import Missing  # noqa: E402

LIST = """# what it is

No memory, and
nobody can have none.
 board/one.cpp branch
  2 if (a && b)
  1 if (c)
 board/one.cpp line
  12 return 1;

Elsewhere.
 recorder/ring.h line
  1 }
"""


class Wings(unittest.TestCase):
    def test_files_belong_to_their_wing(self):
        tool = "tools/pmxboard/"
        for name, wing in (("board/mixer.cpp", "board"), ("board/picture/mix.cpp", None),
                           ("recorder/ring.h", "recorder"), (tool + "recording/replay.cpp", "recorder"),
                           (tool + "language/line.cpp", "language"), (tool + "decode/log.cpp", "decode"),
                           (tool + "report/page.cpp", None)):
            self.assertEqual(wing, check_wings.wing_of(name))

    def test_reasons_hold_for_what_stands_below_them(self):
        self.assertEqual(({Missing("board/one.cpp", "branch", "if (a && b)"): 2,
                           Missing("board/one.cpp", "branch", "if (c)"): 1,
                           Missing("board/one.cpp", "line", "return 1;"): 12,
                           Missing("recorder/ring.h", "line", "}"): 1}, []), check_wings.read_reasons(LIST))

    def test_a_list_may_be_empty(self):
        self.assertEqual(({}, []), check_wings.read_reasons("# nothing\n"))

    def test_what_has_no_reason_is_refused(self):
        for bad in (" board/one.cpp line\n  1 }\n", "Why.\n  1 }\n", LIST.replace("\nElsewhere.\n", "\n\n"),
                    LIST.replace("Elsewhere.\n", ""), "Why.\n board/one.cpp word\n", "Why.\n a.cpp line\n  0 }\n"):
            self.assertIn("neither a reason, nor where it holds", "".join(check_wings.read_reasons(bad)[1]), bad)

    def test_what_stands_twice_is_refused(self):
        self.assertEqual(["listed twice: line: recorder/ring.h: }"],
                         check_wings.read_reasons(LIST + "  1 }\n")[1])


if __name__ == "__main__":
    unittest.main()
