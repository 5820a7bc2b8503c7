#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""`pmxboard shell` on a terminal, as somebody uses it who types.

usage: shell_test.py PMXBOARD

Where the machine gives out no terminals the tests are skipped, exit code 77.
"""

import pathlib
import re
import sys
import tempfile
import unittest

from terminal import (CTRL_A, CTRL_C, CTRL_D, CTRL_E, CTRL_R, CTRL_U, DOWN, ENTER, PROMPT, RIGHT, TAB, UP,
                      Terminal, program_of)

PROGRAM = ""


class Shell(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.home = pathlib.Path(directory.name)
        self.history = self.home / ".local/state/pmxboard/history"

    def start(self, *arguments, **environment):
        terminal = Terminal(PROGRAM, self.home, *arguments, **environment)
        terminal.wait_for(PROMPT)
        return terminal

    def leave(self, terminal, code=0):
        terminal.type(CTRL_D)
        self.assertEqual(code, terminal.end(), terminal.seen)

    def test_tab_completes_and_lists(self):
        shell = self.start()
        shell.type("PMX_SetTv", TAB)
        shell.wait_for("ype ")
        shell.type("0 ", TAB)               # what both names begin with
        shell.wait_for("PMX_TV_TYPE_")
        shell.type(TAB)
        shell.wait_for("PMX_TV_TYPE_NTSC  PMX_TV_TYPE_PAL\r\n")
        shell.wait_for("PMX_SetTvType 0 PMX_TV_TYPE_")
        shell.type("P", TAB)
        shell.wait_for("AL")
        self.assertIn("  = 1\n", shell.command())
        self.assertIn("ucTvType = PMX_TV_TYPE_PAL", shell.command("state ucTvT", TAB))
        self.leave(shell)

    def test_tab_does_not_care_for_capital_letters(self):
        shell = self.start()
        shell.type("pmx_settvt", TAB)
        shell.wait_for("PMX_SetTvType ")
        self.assertIn("  = 1\n", shell.command("0 pmx_tv_type_p", TAB))
        self.assertIn("ucTvType = PMX_TV_TYPE_PAL", shell.command("state ucTvType"))
        self.leave(shell)

    def test_tab_tells_which_argument_is_being_written(self):
        shell = self.start()
        shell.type("PMX_SetModeEx 0 [ [0], [1, RES_", TAB)
        shell.wait_for("prOutConf[1].eResMode: one of the resolution modes\r\n")
        shell.type(CTRL_C)
        shell.wait_for(PROMPT)
        shell.type("PMX_SetHue 0 ", TAB)
        shell.wait_for("ucHue: a number of 8 bits\r\n")
        shell.type(CTRL_C)
        shell.wait_for(PROMPT)
        self.leave(shell)

    def test_a_breakpoint_gives_the_prompt_back(self):
        shell = self.start()
        shell.command("break PMX_HalSetTvType")
        self.assertIn("stopped in PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)", shell.command("PMX_SetTvType 0 3"))
        self.assertIn("ucTvType = PMX_TV_TYPE_PAL", shell.command("state ucTvType"))
        self.assertIn("  = 1\n", shell.command("continue"))
        self.leave(shell)

    def test_tab_in_the_middle_of_a_line(self):
        shell = self.start()
        self.assertIn("  = 1\n", shell.command("SetTvType 0 3", CTRL_A, "PMX_"))
        shell.type(" 0 PMX_TV_TYPE_PAL", CTRL_A, "PMX_SetTv", TAB)
        self.assertIn("  = 1\n", shell.command())
        self.leave(shell)

    def test_nothing_to_complete_leaves_the_line(self):
        shell = self.start()
        shell.command("poke ucMode 0")
        self.assertIn("ucMode = RES_480I", shell.command("state ucMode # PMX", TAB, TAB))
        self.leave(shell)

    def test_many_candidates_are_shown_when_asked_for(self):
        shell = self.start()
        shell.type("PMX_", TAB)
        shell.wait_for("candidates; show them all? (y or n) ")
        shell.type("n")
        self.assertNotIn("PMX_QueryStatus", shell.wait_for(PROMPT + "PMX_"))
        shell.type(TAB)
        shell.wait_for("(y or n) ")
        shell.type("y")
        self.assertIn("PMX_QueryStatus", shell.wait_for(PROMPT + "PMX_"))
        shell.type(CTRL_C)
        shell.wait_for(PROMPT)
        self.leave(shell)

    def test_candidates_fit_the_window(self):
        shell = self.start(columns=44)
        shell.type("sink valid RES_3D_1080", TAB)
        listed = shell.wait_for(PROMPT)
        self.assertIn("RES_3D_1080I60HZ_SBS_HALF", listed)
        lines = [line for line in listed.split("\r\n")[1:-1]]
        self.assertGreater(len(lines), 3)
        for line in lines:
            self.assertLessEqual(len(line.rstrip()), 44, line)
        shell.type(CTRL_U)
        self.leave(shell)

    def test_cursor_keys_and_control_keys_edit(self):
        shell = self.start()
        shell.command("poke ucMode 2")
        self.assertIn('"name": "RES_480P"', shell.command("ucMode", CTRL_A, "state ", CTRL_E, " --json"))
        self.assertIn("ucMode = RES_480P", shell.command("sate ucMode", CTRL_A, RIGHT, "t"))
        self.leave(shell)

    def test_arrow_up_brings_history_back(self):
        shell = self.start()
        shell.command("PMX_SetTvType 0 3")
        shell.command("state ucTvType")
        shell.type(UP, UP, DOWN, UP)
        self.assertIn("PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)", shell.command())
        self.leave(shell)

    def test_history_is_kept_from_shell_to_shell(self):
        first = self.start()
        first.command("PMX_SetTvType 0 3")
        self.leave(first)
        self.assertTrue(self.history.is_file())
        self.assertEqual(0, self.history.stat().st_mode & 0o077)
        second = self.start()
        second.type(UP)
        self.assertIn("PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)", second.command())
        self.leave(second)

    def test_history_stands_where_it_is_wanted(self):
        elsewhere = self.home / "elsewhere"
        shell = self.start(PMXBOARD_HISTORY=str(elsewhere))
        shell.command("state ucMode")
        self.leave(shell)
        self.assertIn("ucMode", elsewhere.read_text())
        shell = self.start(XDG_STATE_HOME=str(self.home / "state"))
        shell.command("state ucMode")
        self.leave(shell)
        self.assertTrue((self.home / "state/pmxboard/history").is_file())
        self.assertFalse(self.history.exists())

    def test_history_can_be_off_or_impossible(self):
        for variables in ({"PMXBOARD_HISTORY": ""}, {"HOME": "/dev/null"}, {"HOME": None}):
            with self.subTest(variables=variables):
                shell = self.start(**variables)
                shell.command("state ucTvType")
                shell.type(UP)              # within a shell there is one all the same
                self.assertIn("ucTvType = ", shell.command())
                self.leave(shell)
                self.assertEqual([], list(self.home.iterdir()))

    def test_control_r_searches_the_history(self):
        shell = self.start()
        shell.command("PMX_SetTvType 0 3")
        shell.command("state ucMode")
        shell.type(CTRL_R, "SetTv")
        shell.wait_for("PMX_SetTvType")
        self.assertIn("PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)", shell.command() + shell.command())
        self.leave(shell)

    def test_control_c_drops_the_line_and_nothing_else(self):
        shell = self.start()
        shell.type("PMX_Nonsense", CTRL_C)
        shell.wait_for("^C\r\n" + PROMPT)
        self.assertIn("ucMode = ", shell.command("state ucMode"))
        self.assertNotIn("no command", shell.seen)
        self.leave(shell)
        self.assertNotIn("Nonsense", self.history.read_text())

    def test_errors_are_shown_and_the_shell_goes_on(self):
        shell = self.start()
        self.assertIn("no command PMX_Int; did you mean PMX_Init?\n", shell.command("PMX_Int"))
        self.assertIn("expected asserts 1, found 0\n", shell.command("expect asserts 1"))
        self.assertIn("a '[' does not close", shell.command("PMX_SetPlaneOrderArray 0 [1"))
        self.assertIn("ucMode = ", shell.command("state ucMode"))
        self.leave(shell)

    def test_a_misuse_is_told_at_the_end(self):
        shell = self.start()
        shell.command("neighbour x_reg_write32 3 0")
        self.leave(shell, code=1)
        self.assertIn("misused", shell.seen)

    def test_what_was_typed_is_not_echoed_again(self):
        shell = self.start()
        self.assertNotIn("> PMX_SetTvType", shell.command("PMX_SetTvType 0 3").removesuffix(PROMPT))
        self.leave(shell)

    def test_help_is_the_contract(self):
        shell = self.start()
        text = shell.command("help PMX_SetTvType")
        self.assertTrue(text.startswith("PMX_SetTvType ucPmxId ucTvType\n"), text)
        self.assertIn("Store and program the TV type.\n", text)
        self.assertIn("Ctrl-D ends", shell.command("help"))
        self.leave(shell)

    def test_quit_and_exit_end_it(self):
        for word in ("quit", "exit"):
            shell = self.start()
            shell.type(word, ENTER)
            self.assertEqual(0, shell.end())

    def test_colour_is_for_terminals_whose_users_want_it(self):
        colour = re.compile("\x1b\\[[0-9;]+m")
        for arguments, variables, wanted in (((), {"NO_COLOR": None}, True), ((), {"NO_COLOR": "1"}, False),
                                             ((), {"NO_COLOR": None, "TERM": "dumb"}, False),
                                             (("--color", "never"), {"NO_COLOR": None}, False),
                                             (("--color", "always"), {"NO_COLOR": "1"}, True)):
            with self.subTest(arguments=arguments, variables=variables):
                shell = self.start(*arguments, **variables)
                shown = shell.command("PMX_SetTvType 0 3")
                self.assertEqual(wanted, bool(colour.search(shown)), shown)
                self.leave(shell)

    def test_simple_terminals_do(self):
        for name in ("dumb", "vt100", "linux", None):
            with self.subTest(terminal=name):
                shell = self.start(TERM=name)
                shell.type("PMX_SetTv", TAB)
                shell.wait_for("PMX_SetTvType" if name in ("dumb", None) else "ype")
                self.assertIn("  = 1\n", shell.command("0 3"))
                shell.type(UP)
                self.assertIn("  = 1\n", shell.command())
                self.leave(shell)

    def test_a_long_line_is_edited_beyond_the_window(self):
        shell = self.start(columns=40)
        shell.command("PMX_Init")
        line = "PMX_SetModeEx 0 [[0], [1, RES_720P50HZ], [0], [0]] 50 DRV_NON_EXT_CHIP 0"
        shell.type(line, CTRL_A, CTRL_E)
        self.assertIn("  = 1\n", shell.command())
        self.leave(shell)


def main():
    global PROGRAM
    PROGRAM = program_of(sys.argv, __doc__)
    unittest.main()


if __name__ == "__main__":
    main()
