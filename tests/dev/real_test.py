#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""./dev with the real programs that build, in a tree that is small: moved, at once, interrupted."""

import os
import shutil
import signal
import sys
import time
import unittest

sys.dont_write_bytecode = True

from trees import TreeTest  # noqa: E402

PROJECT = """cmake_minimum_required(VERSION 3.25)
project(small LANGUAGES NONE)
add_custom_command(OUTPUT ${PROJECT_BINARY_DIR}/pmxboard
    COMMAND sh ${PROJECT_SOURCE_DIR}/make.sh ${PROJECT_SOURCE_DIR}/text ${PROJECT_BINARY_DIR}/pmxboard
    DEPENDS ${PROJECT_SOURCE_DIR}/text
    VERBATIM)
add_custom_target(all_of_it ALL DEPENDS ${PROJECT_BINARY_DIR}/pmxboard)
"""

PRESETS = """{
    "version": 6,
    "configurePresets": [
        { "name": "release", "generator": "Ninja", "binaryDir": "${sourceDir}/build/${presetName}" }
    ],
    "buildPresets": [{ "name": "release", "configurePreset": "release" }]
}
"""

# In two halves, so that one is there when the step is interrupted, or another one begins.
MAKE = """{ echo '#!/bin/sh'; echo 'echo first'; } >"$2"
sleep "${SLOW_STEP:-0}"
printf 'echo "%s"\\n' "$(cat "$1")" >>"$2"
chmod +x "$2"
"""


class Real(TreeTest):
    def setUp(self):
        super().setUp()
        (self.stubs / "cmake").unlink()
        self.fill(self.tree)

    def fill(self, tree):
        for name, text in (("CMakeLists.txt", PROJECT), ("CMakePresets.json", PRESETS), ("make.sh", MAKE),
                           ("text", "old\n")):
            (tree / name).write_text(text, encoding="utf-8")

    def runs(self, text, tree=None):
        found = self.dev("run", script=(tree or self.tree) / "dev")
        shown = f"first\n{text}\n"   # by the run, and by the report
        self.assertEqual((0, shown * 2), (found[0], found[1][:found[1].index("The same with pictures")]), found)
        return found[2]

    def test_nothing_to_do_says_nothing(self):
        self.assertIn("configuring build/release", self.runs("old"))
        self.assertEqual("", self.runs("old"))

    def test_odd_names(self):
        tree = self.make_tree("a b (c) ü~!%@{},:=+ -")
        self.fill(tree)
        self.assertNotIn("every time", self.runs("old", tree))
        self.assertEqual("", self.runs("old", tree))
        (tree / "text").write_text("new\n", encoding="utf-8")
        self.runs("new", tree)

    def test_a_copy_builds_itself(self):
        self.runs("old")
        copy = self.space / "copy"
        shutil.copytree(self.tree, copy, symlinks=True)
        (copy / "text").write_text("new\n", encoding="utf-8")
        self.runs("new", copy)
        self.assertEqual("", self.runs("old"))
        for file in (copy / "build").rglob("*"):
            if file.is_file() and file.suffix != ".log":
                self.assertNotIn(os.fsencode(self.tree) + b"/", file.read_bytes(), file)

    def test_two_at_once_after_a_change(self):
        self.runs("old")
        (self.tree / "text").write_text("new\n", encoding="utf-8")
        runs = [self.start("run", SLOW_STEP="0.5") for _ in range(3)]
        texts = [run.communicate(timeout=60)[0] for run in runs]
        self.assertEqual([0, 0, 0], [run.returncode for run in runs], texts)
        for text in texts:
            self.assertIn("first\nnew\n" * 2 + "The same with pictures", text, texts)

    def test_what_was_interrupted_is_made_again(self):
        run = self.start("run", SLOW_STEP="60")
        half = self.tree / "build/release/pmxboard"
        until = time.monotonic() + 60
        while not half.exists():
            self.assertLess(time.monotonic(), until)
            time.sleep(0.05)
        os.killpg(run.pid, signal.SIGINT)
        run.communicate(timeout=60)
        self.assertEqual(-signal.SIGINT, run.returncode)
        self.runs("old")


if __name__ == "__main__":
    unittest.main()
