#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Pictures in a terminal: it is asked what it can show, and what it gets is what a PNG of the same has.

usage: graphics_test.py CHECKED OPTIMISED

CHECKED and OPTIMISED are the tool with sanitizers and as it is shipped: pictures take the first one tens of times as
long, and it shows one of each kind.

Where the machine gives out no terminals the tests are skipped, exit code 77.
"""

import base64
import os
import pathlib
import re
import struct
import subprocess
import sys
import tempfile
import time
import unittest
import zlib

from terminal import CTRL_C, CTRL_D, ENTER, PROMPT, Terminal, program_of

CHECKED = OPTIMISED = ""
KITTY_QUESTION = "\x1b_Gi=31,s=1,v=1,a=q,t=d,f=24;AAAA\x1b\\"
ATTRIBUTES_QUESTION = "\x1b[c"
# As terminals of each kind answer.
KITTY_ANSWER = "\x1b_Gi=31;OK\x1b\\"
KITTY_REFUSAL = "\x1b_Gi=31;ENOTSUPPORTED:no pictures\x1b\\"
WITH_SIXEL, PLAIN, OF_CLASS_4 = "\x1b[?62;4;22c", "\x1b[?62;22c", "\x1b[?4;6c"
SCENE = ("PMX_Init", "outputs hdmi=720p60", "source vdp0 start 1280x720", "source vdp0 picture ramp",
         "source osd0 start 1280x720 rgb")
BLOCK = "▀"


def read_png(data):
    """(width, height, rows of R, G, B) of a PNG as the tool writes it: eight bits, not interlaced."""
    width, height, depth, kind, *_, interlaced = struct.unpack(">IIBBBBB", data[16:29])
    if (depth, kind, interlaced) != (8, 2, 0):
        raise AssertionError("another kind of PNG")
    packed, at = b"", 8
    while at < len(data):
        length, name = struct.unpack(">I4s", data[at:at + 8])
        packed += data[at + 8:at + 8 + length] if name == b"IDAT" else b""
        at += length + 12
    lines, pitch = zlib.decompress(packed), 3 * width
    rows, above = [], bytes(pitch)
    for begin in range(0, len(lines), pitch + 1):
        above = unfiltered(lines[begin], lines[begin + 1:begin + 1 + pitch], above)
        rows.append(above)
    return width, height, rows


def unfiltered(kind, line, above):
    if kind == 0:
        return line
    predicted = (None, first, second, average, nearest)[kind]
    row = bytearray(line)
    for i, value in enumerate(line):
        left, up, corner = (row[i - 3], above[i], above[i - 3]) if i >= 3 else (0, above[i], 0)
        row[i] = (value + predicted(left, up, corner)) & 255
    return bytes(row)


def first(left, _up, _corner):
    return left


def second(_left, up, _corner):
    return up


def average(left, up, _corner):
    return (left + up) // 2


def nearest(left, up, corner):
    """What PNG calls the Paeth predictor."""
    if left == up == corner:
        return left
    return min((left, up, corner), key=lambda each: abs(left + up - corner - each))


def read_sixels(text):
    """The same of sixels: a line of them is six rows, a character a column of six bits in the chosen colour."""
    raster = re.match(r'"1;1;(\d+);(\d+)', text)
    width, height = int(raster[1]), int(raster[2])
    rows, colours = [bytearray(3 * width) for _ in range(height)], {}
    x = top = 0
    colour = None
    for token in re.finditer(r"#(\d+)(?:;2;(\d+);(\d+);(\d+))?|(?:!(\d+))?([?-~])|([$-])", text[raster.end():]):
        number, *parts, count, sixel, move = token.groups()
        if number and parts[0]:
            colours[number] = bytes(round(int(part) * 255 / 100) for part in parts)
        elif number:
            colour = colours[number]
        elif sixel:
            for bit in range(6):
                if ord(sixel) - 63 >> bit & 1:
                    rows[top + bit][3 * x:3 * (x + int(count or 1))] = colour * int(count or 1)
            x += int(count or 1)
        else:
            x, top = 0, top + (6 if move == "-" else 0)
    return width, height, rows


def column_sums(rows):
    return [sum(column) for column in zip(*rows)]


def kitty_pictures(text):
    """The bytes of each picture that is shown as kitty takes it."""
    pictures, letters = [], ""
    for keys, piece in re.findall(r"\x1b_G([^;]*);([^\x1b]*)\x1b\\", text):
        if len(piece) > 4096 or (letters == "") != keys.startswith("a=T,f=100,q=2,"):
            raise AssertionError(f"a piece of {len(piece)} with {keys}")
        letters += piece
        if keys.endswith("m=0"):
            pictures.append(base64.b64decode(letters, validate=True))
            letters = ""
    if letters:
        raise AssertionError("the last picture does not end")
    return pictures


def sixel_pictures(text):
    return [read_sixels(found) for found in re.findall(r"\x1bP[\d;]*q([^\x1b]*)\x1b\\", text)]


class PictureTest(unittest.TestCase):
    def setUp(self):
        self.program = OPTIMISED
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.home = pathlib.Path(directory.name)

    def start(self, *arguments, **environment):
        shell = Terminal(self.program, self.home, *arguments, **({"NO_COLOR": None} | environment))
        shell.wait_for(PROMPT)
        for line in SCENE:
            shell.command(line)
        return shell

    def leave(self, shell):
        shell.type(CTRL_D)
        self.assertEqual(0, shell.end(), shell.seen[-2000:])

    def shot(self, shell, answer, *, question=KITTY_QUESTION + ATTRIBUTES_QUESTION, line="shot hdmi"):
        """What comes of it where the terminal is asked this, and answers that."""
        shell.type(line, ENTER)
        self.assertIn(question, shell.wait_for(ATTRIBUTES_QUESTION))
        shell.type(answer)
        return shell.wait_for(PROMPT)

    def png(self, shell, size, output="hdmi"):
        taken = self.home / "taken.png"
        shell.command(f"shot {output} {taken} {size}")
        return taken.read_bytes()

    def assert_sixels(self, shown, png):
        (width, height, rows), = sixel_pictures(shown)
        wanted_width, wanted_height, wanted = read_png(png)
        self.assertEqual((wanted_width, wanted_height), (width, height))
        # Few colours are mixed into others: squares of so many pixels have the right one.
        side = 8
        for top in range(0, height, side):
            found, sought = column_sums(rows[top:top + side]), column_sums(wanted[top:top + side])
            for left in range(0, 3 * width, 3 * side):
                for part in range(left, left + 3):
                    columns = slice(part, min(left + 3 * side, 3 * width), 3)
                    apart = abs(sum(found[columns]) - sum(sought[columns]))
                    self.assertLessEqual(apart, 10 * side * side, f"at {left // 3},{top}")


class UnderSanitizers(PictureTest):
    def setUp(self):
        super().setUp()
        self.program = CHECKED

    def test_each_kind_of_picture(self):
        for answer, kind in ((KITTY_ANSWER + PLAIN, "kitty"), (WITH_SIXEL, "sixel"), (PLAIN, "blocks")):
            shell = self.start(columns=80, pixels=80 * 2)
            shown, png = self.shot(shell, answer), self.png(shell, "128x72")
            self.assertEqual([png] if kind == "kitty" else [], kitty_pictures(shown))
            self.assertEqual(kind == "blocks", BLOCK in shown)
            if kind == "sixel":
                self.assert_sixels(shown, png)
            self.leave(shell)


class Graphics(PictureTest):
    def test_a_terminal_that_takes_pictures_as_kitty_does(self):
        for answer in (PLAIN, WITH_SIXEL):
            shell = self.start()
            shown = self.shot(shell, KITTY_ANSWER + answer)
            self.assertEqual([self.png(shell, "640x360")], kitty_pictures(shown))
            self.assertNotIn(BLOCK, shown)
            self.leave(shell)

    def test_a_terminal_that_takes_sixels(self):
        for answer in (WITH_SIXEL, KITTY_REFUSAL + WITH_SIXEL):
            shell = self.start()
            shown = self.shot(shell, answer)
            self.assert_sixels(shown, self.png(shell, "640x360"))
            self.assertNotIn(BLOCK, shown)
            self.leave(shell)

    def test_a_terminal_that_takes_neither(self):
        for answer in (PLAIN, OF_CLASS_4, KITTY_REFUSAL + PLAIN):
            shell = self.start()
            shown = self.shot(shell, answer)
            self.assertIn(BLOCK, shown)
            self.assertNotIn("\x1bP", shown)
            self.assertEqual([], kitty_pictures(shown))
            self.leave(shell)

    def test_it_is_asked_once(self):
        shell = self.start()
        self.shot(shell, WITH_SIXEL)
        again = shell.command("shot all")
        self.assertNotIn(ATTRIBUTES_QUESTION, again)
        self.assert_sixels(again, self.png(shell, "640x360", "all"))
        self.leave(shell)

    def test_a_picture_is_as_wide_as_its_window_has_it(self):
        shell = self.start(columns=80, pixels=80 * 6)
        shown = self.shot(shell, KITTY_ANSWER + PLAIN)
        self.assertEqual([self.png(shell, "384x216")], kitty_pictures(shown))
        self.leave(shell)
        shell = self.start(columns=80, pixels=80 * 30)  # and no wider than terminals take it
        shown = self.shot(shell, KITTY_ANSWER + PLAIN)
        self.assertEqual([self.png(shell, "960x540")], kitty_pictures(shown))
        self.leave(shell)

    def test_what_is_typed_meanwhile_is_the_next_line(self):
        shell = self.start()
        shell.type("shot hdmi", ENTER, "sta")
        shell.wait_for(ATTRIBUTES_QUESTION)
        shell.type("te ucT", KITTY_ANSWER, "v", WITH_SIXEL[:5])
        time.sleep(0.05)
        shell.type(WITH_SIXEL[5:], "Type", ENTER)
        self.assertIn("ucTvType = ", shell.wait_for("ucTvType = "))
        shell.wait_for(PROMPT)
        self.assertEqual(1, len(kitty_pictures(shell.seen.rpartition(ATTRIBUTES_QUESTION)[2])))
        self.leave(shell)

    def test_a_terminal_that_does_not_answer(self):
        shell = self.start()
        begin = time.monotonic()
        shell.type("shot hdmi", ENTER)
        shell.wait_for(ATTRIBUTES_QUESTION)
        shell.type("state ucTvType", ENTER)
        self.assertIn(BLOCK, shell.wait_for(PROMPT))
        self.assertGreater(time.monotonic() - begin, 1.9)
        shell.wait_for("ucTvType = ")
        shell.wait_for(PROMPT)
        self.leave(shell)

    def still_works(self, shell):
        """An empty line is left, and what is typed is what is read."""
        shell.type(CTRL_C)
        shell.wait_for("^C\r\n" + PROMPT)
        self.assertRegex(shell.command("state ucTvType"), r"^ *\S*ucTvType = ")
        self.leave(shell)

    def asked(self):
        shell = self.start(LC_ALL="C.UTF-8")
        shell.type("shot hdmi", ENTER)
        shell.wait_for(ATTRIBUTES_QUESTION)
        return shell

    def test_an_answer_that_breaks_off_is_not_typed(self):
        for answer in (WITH_SIXEL[:-1], WITH_SIXEL[:3], KITTY_ANSWER[:-2], KITTY_ANSWER[:3], KITTY_ANSWER + PLAIN[:5]):
            with self.subTest(answer=answer):
                shell = self.asked()
                shell.type(answer)
                shown = shell.wait_for(PROMPT)
                self.assertEqual(KITTY_ANSWER not in answer, BLOCK in shown)
                self.assertRegex(shell.command("state ucTvType"), r"^ *\S*ucTvType = ")
                self.leave(shell)

    def test_an_answer_that_comes_too_late_is_not_typed(self):
        shell = self.asked()
        self.assertIn(BLOCK, shell.wait_for(PROMPT))
        shell.type("sta", KITTY_ANSWER, "te uc", WITH_SIXEL, "TvType", KITTY_REFUSAL, PLAIN, ENTER)
        self.assertIn("ucTvType = ", shell.wait_for(PROMPT).replace("\r\n", "\n"))
        shell.type(KITTY_ANSWER[:-2], CTRL_C)
        shell.wait_for("^C\r\n" + PROMPT)
        shell.type(WITH_SIXEL[:-1], CTRL_C)
        shell.wait_for("^C\r\n" + PROMPT)
        self.still_works(shell)

    def test_bytes_that_are_no_text_take_no_key_along(self):
        shell = self.asked()
        os.write(shell.terminal, b"sta\0te\xff \xc3uc\0T\x80vType" + PLAIN.encode() + b"\r")
        self.assertIn(BLOCK, shell.wait_for(PROMPT))
        shell.wait_for("ucTvType = ")
        shell.wait_for(PROMPT)
        self.still_works(shell)

    def test_control_c_meanwhile_is_a_key(self):
        shell = self.start()
        shell.type("shot hdmi", ENTER)
        shell.wait_for(ATTRIBUTES_QUESTION)
        shell.type("PMX_Nonsense\x03", PLAIN)
        shell.wait_for("^C\r\n" + PROMPT)
        self.assertNotIn("no command", shell.command("state ucTvType"))
        self.leave(shell)

    def test_what_need_not_be_asked_is_not(self):
        for variables, is_kitty in (({"TERM": "xterm-kitty"}, True), ({"KITTY_WINDOW_ID": "1"}, True),
                                    ({"TERM": "linux"}, False), ({"TERM": "linux", "NO_COLOR": "1"}, False),
                                    ({"NO_COLOR": "1", "KITTY_WINDOW_ID": "1"}, False),
                                    ({"PMXBOARD_GRAPHICS": "kitty"}, True),
                                    ({"PMXBOARD_GRAPHICS": "none", "KITTY_WINDOW_ID": "1"}, False)):
            with self.subTest(variables=variables):
                shell = self.start(**variables)
                shown = shell.command("shot hdmi")
                self.assertNotIn(ATTRIBUTES_QUESTION, shown)
                self.assertEqual([self.png(shell, "640x360")] if is_kitty else [], kitty_pictures(shown))
                self.leave(shell)

    def test_within_another_terminal_the_outer_one_does_not_count(self):
        for name in ("screen-256color", "tmux-256color"):
            shell = self.start(TERM=name, KITTY_WINDOW_ID="1")
            shown = self.shot(shell, WITH_SIXEL, question=ATTRIBUTES_QUESTION)
            self.assertNotIn(KITTY_QUESTION, shell.seen)
            self.assertEqual(1, len(sixel_pictures(shown)))
            self.leave(shell)

    def test_nobody_asks_for_what_nobody_sees(self):
        shell = self.start("-q")
        self.assertNotIn(ATTRIBUTES_QUESTION, shell.command("shot hdmi"))
        self.leave(shell)
        shell = self.start()
        imagined = shell.command("what-if shot hdmi")
        self.assertNotIn(ATTRIBUTES_QUESTION, imagined)
        self.assertIn(BLOCK, imagined)
        self.leave(shell)

    def test_a_run_asks_nobody(self):
        scenario = self.home / "scene.pmx"
        scenario.write_text("\n".join((*SCENE, "shot hdmi\n")), encoding="utf-8")
        for variables, is_kitty in (({}, False), ({"KITTY_WINDOW_ID": "1"}, True)):
            run = Terminal(self.program, self.home, str(scenario), command="run", NO_COLOR=None, **variables)
            self.assertEqual(0, run.end(), run.seen[-2000:])
            self.assertNotIn(ATTRIBUTES_QUESTION, run.seen)
            self.assertEqual(is_kitty, BLOCK not in run.seen)
            self.assertEqual(is_kitty, len(kitty_pictures(run.seen)) == 1)

    def test_a_pipe_gets_what_is_asked_for(self):
        def shown(*arguments, code=0, **variables):
            environment = os.environ | {"TERM": "xterm-kitty", "KITTY_WINDOW_ID": "1"} | variables
            ended = subprocess.run([self.program, "run", *arguments, "-"], input="\n".join((*SCENE, "shot hdmi\n")),
                                   capture_output=True, text=True, check=False, env=environment)
            self.assertEqual(code, ended.returncode, ended.stderr)
            return ended.stdout + ended.stderr

        plain = shown()
        self.assertNotIn("\x1b", plain)
        self.assertEqual(plain, shown("--graphics", "none"))
        self.assertIn(BLOCK, shown("--graphics=blocks"))
        self.assertIn(BLOCK, shown("--color", "always"))
        self.assertEqual(1, len(sixel_pictures(shown("--graphics", "sixel"))))
        self.assertEqual(1, len(kitty_pictures(shown(PMXBOARD_GRAPHICS="kitty"))))
        self.assertEqual(plain, shown("--graphics", "none", PMXBOARD_GRAPHICS="kitty"))
        self.assertIn("--graphics", shown("--graphics", "sixels", code=2))

    def test_a_variable_that_says_nothing_that_can_be_meant(self):
        told = "PMXBOARD_GRAPHICS is \\x1Bpaint; it may be auto, none, blocks, sixel or kitty"
        wrong = os.environ | {"PMXBOARD_GRAPHICS": "\x1bpaint"}

        def ended(*arguments, lines=SCENE, code=0):
            ran = subprocess.run([CHECKED, *arguments], input="\n".join((*lines, "")), capture_output=True, text=True,
                                 check=False, env=wrong)
            self.assertEqual(code, ran.returncode, ran.stderr)
            return ran.stdout + ran.stderr

        for arguments in (("modes",), ("ops",), ("decode", "-"), ("run", "-"), ("shell",), ("--version",)):
            with self.subTest(arguments=arguments):
                self.assertNotIn("PMXBOARD_GRAPHICS", ended(*arguments, lines=()))
        shot = (*SCENE, f"shot hdmi {self.home / 'menu.png'}", "shot hdmi")
        self.assertIn(f"<stdin>:{len(shot)}: {told}\n", ended("run", "-", lines=shot, code=1))
        self.assertIn(f"<stdin>:{len(shot)}: {told}\n", ended("shell", lines=shot, code=1))
        self.assertNotIn("PMXBOARD_GRAPHICS", ended("run", "--graphics", "blocks", "-", lines=shot))
        self.assertNotIn("PMXBOARD_GRAPHICS", ended("run", "--quiet", "-", lines=shot))
        wrong["PMXBOARD_GRAPHICS"] = ""
        self.assertNotIn("PMXBOARD_GRAPHICS", ended("run", "-", lines=shot))


def main():
    global CHECKED, OPTIMISED
    CHECKED, OPTIMISED = (program_of(sys.argv, __doc__) for _ in range(2))
    unittest.main()


if __name__ == "__main__":
    main()
