#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The history of `pmxboard shell` as a file: several shells share it, and nothing that befalls it stops one.

usage: history_test.py PMXBOARD
"""

import fcntl
import os
import pathlib
import random
import resource
import shutil
import signal
import sys
import tempfile
import time
import unittest

from terminal import CTRL_C, CTRL_D, CTRL_R, ENTER, PROMPT, UP, Terminal, program_of

PROGRAM = ""
NOBODY = 65534
HEADING = b"_HiStOrY_V2_\n"
KEPT = 1000          # lines that a shell looks at
MEBIBYTE = 1 << 20
LOCK_PATIENCE = 3    # seconds that a shell waits for another one


def entries(count, begin=0):
    """Lines as they stand in the file."""
    return b"".join(b"#\\040old\\040%d\n" % number for number in range(begin, begin + count))


class History(unittest.TestCase):
    def setUp(self):
        self.home = pathlib.Path(tempfile.mkdtemp())
        self.addCleanup(shutil.rmtree, self.home)
        self.file = self.home / "history"

    def start(self, file=None, **options):
        shell = Terminal(PROGRAM, self.home, PMXBOARD_HISTORY=str(file or self.file), **options)
        shell.wait_for(PROMPT)
        return shell

    def leave(self, shell):
        shell.type(CTRL_D)
        self.assertEqual(0, shell.end(), shell.seen[-500:])

    def lines(self):
        """The file's lines as somebody typed them; it is a whole history."""
        content = self.file.read_bytes()
        self.assertTrue(content.startswith(HEADING), content[:50])
        self.assertTrue(content.endswith(b"\n"), content[-50:])
        return [line.replace("\\040", " ") for line in content.decode().splitlines()[1:]]

    def goes_on_without(self, file, reason, **options):
        """It says that there is no history, and why, once; and works."""
        shell = self.start(file, **options)
        for number in range(3):
            self.assertIn("ucMode = ", shell.command(f"state ucMode # {number}"))
        shell.type(UP)
        self.assertIn("ucMode = ", shell.command())
        self.leave(shell)
        self.assertEqual(1, shell.seen.count("no history is kept: "), shell.seen)
        self.assertIn(reason, shell.seen.split("no history is kept: ")[1].split("\r\n")[0])

    def test_two_shells_lose_nothing_of_each_other(self):
        shells = [self.start(), self.start()]
        for number in range(60):
            shells[number % 2].type(f"# {number % 2} {number}", ENTER)
        for shell in shells:
            for _ in range(30):  # the lines themselves are seen early: what is typed ahead the terminal shows at once
                shell.wait_for(PROMPT)
            self.leave(shell)
        found = self.lines()
        for which in range(2):
            wanted = [f"# {which} {number}" for number in range(which, 60, 2)]
            self.assertEqual(wanted, [line for line in found if line.startswith(f"# {which} ")])
        self.assertEqual(60, len(found))

    def test_one_shell_shortens_while_another_adds(self):
        self.file.write_bytes(HEADING + entries(4_100))
        before = self.start()
        self.assertEqual(KEPT, len(self.lines()))
        self.file.write_bytes(HEADING + entries(4_100))
        before.command("# of the first")
        after = self.start()
        before.command("# of the first again")
        after.command("# of the second")
        self.leave(after)
        self.leave(before)
        self.assertEqual(["# of the first", "# of the first again", "# of the second"], self.lines()[-3:])
        self.assertEqual(KEPT + 2, len(self.lines()))

    def test_3000_pasted_lines_are_added_one_by_one(self):
        shell = self.start()
        shell.command("# the first")
        place = self.file.stat().st_ino
        shell.paste("".join(f"# pasted {number}\r" for number in range(3_000)))
        shell.type("state ucTvType", ENTER)
        shell.wait_for("ucTvType = ")
        shell.wait_for(PROMPT)
        self.leave(shell)
        self.assertEqual(["# the first", *(f"# pasted {number}" for number in range(3_000)), "state ucTvType"],
                         self.lines())
        self.assertEqual(place, self.file.stat().st_ino, "it was written anew")

    def test_it_does_not_grow_without_end(self):
        self.file.write_bytes(HEADING + entries(240_000))
        self.assertLess(4 * MEBIBYTE, self.file.stat().st_size)
        content = self.file.read_bytes()
        shell = self.start()
        self.assertEqual(KEPT, len(self.lines()))
        self.file.write_bytes(content)      # as if others had added to it
        shell.command("# new")
        self.leave(shell)
        self.assertEqual(["# old 239999", "# new"], self.lines()[-2:])
        self.assertEqual(KEPT + 1, len(self.lines()))

    def test_a_very_long_line_is_not_kept(self):
        shell = self.start()
        shell.command("# short")
        shell.paste("# " + "x" * 20_000 + "\r")
        shell.wait_for(PROMPT)
        shell.command("# short again")
        self.leave(shell)
        self.assertEqual(["# short", "# short again"], self.lines())

    def test_killed_at_any_moment_it_is_whole(self):
        chance = random.Random(3)
        for _ in range(8):
            self.file.write_bytes(HEADING + entries(4_100))
            shell = Terminal(PROGRAM, self.home, PMXBOARD_HISTORY=str(self.file))
            limit = time.monotonic() + chance.uniform(0.02, 0.4)
            shell.type("".join(f"# typed {number}\r" for number in range(200)))
            while time.monotonic() < limit:
                time.sleep(0.005)
            os.kill(shell.process, signal.SIGKILL)
            self.assertEqual(-signal.SIGKILL, shell.end())
            found = self.lines()
            typed = [line for line in found if line.startswith("# typed ")]
            self.assertEqual([f"# typed {number}" for number in range(len(typed))], typed)
            self.assertEqual("# old 4099", found[-1 - len(typed)])

    def test_a_part_of_a_line_stays_apart(self):
        self.file.write_bytes(HEADING + b"#\\040old\n#\\040ol")
        shell = self.start()
        shell.command("# new")
        self.leave(shell)
        self.assertEqual(["# old", "# ol", "# new"], self.lines())

    def test_a_foreign_file_is_left_alone(self):
        for content in (b"all that I own\n", b"\0\xff\x1b[2J" * 100, b"x" * (10 * MEBIBYTE), HEADING[:-1],
                        HEADING + b"x\n" * (5 * MEBIBYTE)):
            self.file.write_bytes(content)
            reason = "is larger than 8 MiB" if len(content) > 8 * MEBIBYTE else "is no history of this shell"
            self.goes_on_without(self.file, f"{self.file} {reason}")
            self.assertEqual(content, self.file.read_bytes())

    def test_what_takes_the_histories_place_is_left_alone(self):
        shell = self.start()
        shell.command("# mine")
        self.file.write_bytes(b"all that I own\n")
        shell.command("# not there")
        self.leave(shell)
        self.assertIn("is no history of this shell", shell.seen)
        self.assertEqual(b"all that I own\n", self.file.read_bytes())

    def test_places_that_are_no_file(self):
        (self.home / "directory").mkdir()
        os.mkfifo(self.home / "fifo")
        (self.home / "loop").symlink_to("loop")
        (self.home / "plain").write_bytes(b"")
        for name, reason in (("directory", "is no plain file"), ("fifo", "is no plain file"),
                             ("loop", "cannot write"), ("plain/history", "cannot make"),
                             ("directory/" + "n" * 300, "cannot write"), ("/dev/full", "is no plain file")):
            self.goes_on_without(self.home / name, reason)

    def test_what_may_not_be_read_or_written(self):
        if os.getuid() != 0:
            self.skipTest("needs somebody else")
        self.home.chmod(0o777)
        for mode, reason in ((0o200, "cannot read"), (0o444, "cannot write")):
            self.file.write_bytes(HEADING)
            os.chown(self.file, NOBODY, NOBODY)
            self.file.chmod(mode)
            self.goes_on_without(self.file, f"{reason} {self.file}: Permission denied",
                                 prepare=lambda: os.setuid(NOBODY))
            self.assertEqual(HEADING, self.file.read_bytes())

    def test_a_full_disk(self):
        for room in (0, 3):
            content = HEADING + entries(100)
            self.file.write_bytes(content)
            most = len(content) + room
            self.goes_on_without(self.file, "cannot write",
                                 prepare=lambda: resource.setrlimit(resource.RLIMIT_FSIZE, (most, most)))
            self.assertEqual(content, self.file.read_bytes())

    def test_a_lock_that_is_never_given_back(self):
        self.file.write_bytes(HEADING)
        with self.file.open("rb") as held:
            fcntl.flock(held, fcntl.LOCK_EX)
            begin = time.monotonic()
            self.goes_on_without(self.file, "another program keeps it locked")
            self.assertLess(time.monotonic() - begin, 3 * LOCK_PATIENCE)

    def test_any_bytes_come_back(self):
        strange = bytes(code for code in range(1, 256) if code not in b"\n\\")
        self.file.write_bytes(HEADING + b"#\\040ok\n" + strange + b"\n\\777\\000x\n\\\\\\0\n" + b"\xc3\xa4\n" +
                              b"#\\040\\033[31m\\033]0;x\\007\n")
        shell = self.start()
        for count in range(1, 7):
            shell.type(*[UP] * count, CTRL_C)
            shell.wait_for("^C\r\n" + PROMPT)
        shell.type(CTRL_R, "ok")
        shell.wait_for("# ok")
        shell.command()
        self.assertIn("ucMode = ", shell.command("state ucMode"))
        self.assertNotIn("\x1b]0;", shell.seen)
        self.assertNotIn("\x1b[31m", shell.seen)
        self.leave(shell)


def main():
    global PROGRAM
    PROGRAM = program_of(sys.argv, __doc__)
    unittest.main()


if __name__ == "__main__":
    main()
