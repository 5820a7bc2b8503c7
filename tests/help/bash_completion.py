#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Asks bash what it would complete.

usage: bash_completion.py TOOL ROOT
"""

import os
import pathlib
import re
import subprocess
import sys
import tempfile
import unittest

TOOL, ROOT = (pathlib.Path(argument).resolve() for argument in sys.argv[1:3])

ASK = """
source "$1"; shift
COMP_WORDS=("$@"); COMP_CWORD=$(($# - 1))
_pmxboard
printf '%s\\n' "${COMPREPLY[@]}"
"""


class BashCompletion(unittest.TestCase):
    def completed(self, *words, cwd=ROOT):
        with tempfile.TemporaryDirectory() as directory:
            (pathlib.Path(directory) / "pmxboard").symlink_to(TOOL)
            environment = {**os.environ, "PATH": f"{directory}:{os.environ['PATH']}"}
            script = ROOT / "tools/pmxboard/pmxboard.bash"
            result = subprocess.run(["bash", "-uc", ASK, "bash", script, "pmxboard", *words], cwd=cwd,
                                    env=environment, capture_output=True, text=True, check=False, timeout=60)
        self.assertEqual("", result.stderr)
        return set(result.stdout.split())

    def test_subcommands(self):
        self.assertLessEqual({"run", "state", "shell", "ops", "modes", "decode", "record", "replay"},
                             self.completed(""))
        self.assertEqual({"state", "status", "shell"}, self.completed("s"))

    def test_options(self):
        self.assertLessEqual({"--trace-format", "--only", "--op", "-q", "--quiet", "--color", "--colour"},
                             self.completed("run", "-"))
        self.assertEqual({"--only", "--op"}, self.completed("run", "--o"))
        self.assertEqual({"--version"}, self.completed("--v"))

    def test_values(self):
        told = subprocess.run([TOOL, "run", "--help"], capture_output=True, text=True, check=True).stdout
        formats = set(re.search(r"--trace-format (\S+)", told)[1].split("|"))
        self.assertLessEqual({"jsonl", "off"}, formats)
        self.assertEqual(formats, self.completed("run", "--trace-format", ""))
        self.assertEqual({"auto", "always"}, self.completed("state", "--color", "a"))
        self.assertEqual({"never"}, self.completed("modes", "--colour", "n"))
        self.assertEqual({"sixel"}, self.completed("run", "--graphics", "s"))

    def test_names(self):
        self.assertEqual({"PMX_SetTvType"}, self.completed("run", "--op", "PMX_SetTvT"))
        self.assertEqual({"PMX_Init,PMX_SetTvType"}, self.completed("run", "--op", "PMX_Init,PMX_SetTvT"))
        self.assertNotIn("power-on", self.completed("run", "--op", ""))
        self.assertEqual({"TVE_SetFmtEx"}, self.completed("run", "--only", "TVE_SetFmtE"))
        self.assertEqual({"VDP_SetTvFormat,TVE_SetFmtEx"},
                         self.completed("run", "--only", "VDP_SetTvFormat,TVE_SetFmtE"))
        self.assertEqual({"RES_1080I60HZ", "RES_1080I50HZ"}, self.completed("modes", "RES_1080I"))
        self.assertEqual({"PMX_GetTvType"}, self.completed("ops", "PMX_GetTvT"))
        self.assertIn("default", self.completed("run", "--board", "def"))
        self.assertEqual({"ucTvType"}, self.completed("state", "saved.json", "ucTvT"))

    def test_files(self):
        self.assertEqual({"scenarios/cold-boot.pmx"}, self.completed("run", "scenarios/cold"))
        self.assertEqual({"scenarios"}, self.completed("run", "-q", "scen"))
        with tempfile.TemporaryDirectory() as directory:
            for name in ("saved state.json", "notes.txt"):
                (pathlib.Path(directory) / name).touch()
            self.assertEqual({"saved", "state.json"}, self.completed("state", "sav", cwd=directory))
            self.assertEqual(set(), self.completed("run", "no", cwd=directory))

    def test_is_registered(self):
        result = subprocess.run(["bash", "-c", 'source "$1"; complete -p pmxboard', "bash",
                                 ROOT / "tools/pmxboard/pmxboard.bash"], capture_output=True, text=True, check=True)
        self.assertEqual("complete -F _pmxboard pmxboard\n", result.stdout)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
