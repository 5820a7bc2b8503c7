#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""soak.py over programs that tell what a test says, and the program itself; or that it sees the same on the target.

usage: soak_test.py SOAK [SOAK_EMULATED]
"""

import json
import pathlib
import subprocess
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True
SOAK = pathlib.Path(__file__).resolve().parents[2] / "tools/soak/soak.py"
PROGRAM, *EMULATED = sys.argv[1:]


def report(operations, **other):
    return {"operations": operations, "entries": 5 * operations, "misuses": 0, "hash": "ab", "memory_kib": 7000} | other


class Soak(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)

    def program(self, name, *told, code=0):
        path = self.folder / name
        lines = "".join(f"echo '{json.dumps(each)}'\n" for each in told)
        path.write_text(f"#!/bin/sh\n{lines}exit {code}\n", encoding="utf-8")
        path.chmod(0o755)
        return path

    def soak(self, *words):
        return subprocess.run([SOAK, *words], capture_output=True, text=True, check=False, timeout=120)

    def expect_failure(self, message, here, there):
        result = self.soak(here, there, "20")
        self.assertEqual(1, result.returncode, result)
        self.assertIn(message, result.stderr)

    def test_the_same_on_both_is_right(self):
        told = report(10), report(20, hash="cd", memory_kib=8024)
        here, there = self.program("here", *told), self.program("there", told[0], told[1] | {"memory_kib": 99999})
        result = self.soak(here, there)
        self.assertEqual(0, result.returncode, result)
        self.assertIn("20 operations, 100 calls and lines, hash cd, 8,024 KiB\nthe same on both", result.stdout)

    def test_what_differs_is_told(self):
        here = self.program("here", report(10), report(20))
        for key, value in (("hash", "cd"), ("entries", 1), ("misuses", 1)):
            there = self.program("there", report(10), report(20, **{key: value}))
            self.expect_failure("the target has seen something else", here, there)

    def test_memory_that_grows_is_told(self):
        here = self.program("here", report(10), report(20, memory_kib=8025))
        self.expect_failure("memory has grown by 1,025 KiB", here, here)

    def test_a_misuse_is_told(self):
        here = self.program("here", report(10), report(20, misuses=3), code=1)
        self.expect_failure("the platform was misused 3 times", here, here)

    def test_a_program_that_ends_early_is_told(self):
        here = self.program("here", report(10), report(20))
        self.expect_failure("the target broke down: it ended with 139", here,
                            self.program("there", report(10), code=139))
        self.expect_failure("less than the other", here, self.program("there", report(10)))
        nothing = self.program("nothing")
        self.expect_failure("nothing was told", nothing, nothing)

    def test_what_is_no_number_is_refused(self):
        for number in ("0", "-1", "many"):
            self.assertEqual(2, self.soak("here", "there", number).returncode)


def reports(program, number, seed):
    result = subprocess.run([program, number, seed], capture_output=True, text=True, check=True)
    return [{**json.loads(line), "memory_kib": 0} for line in result.stdout.splitlines()]


class OnTheTarget(unittest.TestCase):
    def test_it_sees_the_same(self):
        self.assertEqual(reports(PROGRAM, "5000", "1"), reports(*EMULATED, "5000", "1"))


class Program(unittest.TestCase):
    """The program as tests have it, with sanitizers."""

    def test_a_seed_tells_all(self):
        one = reports(PROGRAM, "500", "1")
        self.assertEqual(list(range(50, 501, 50)), [each["operations"] for each in one])
        self.assertEqual(10, len({each["hash"] for each in one}))
        self.assertEqual(one, reports(PROGRAM, "500", "1"))
        self.assertNotEqual(one[0]["hash"], reports(PROGRAM, "500", "2")[0]["hash"])

    def test_usage(self):
        for words in (("1",), ("0", "1"), ("-1", "1"), ("1", "x"), ("1", "1", "1")):
            self.assertEqual(2, subprocess.run([PROGRAM, *words], capture_output=True, check=False).returncode)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1], defaultTest=["OnTheTarget"] if EMULATED else ["Soak", "Program"])
