#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds check_traces.py against programs whose traces differ from the list, each in one way."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("check_traces.py")


class CheckTraces(unittest.TestCase):
    def setUp(self):
        scratch = tempfile.TemporaryDirectory()
        self.addCleanup(scratch.cleanup)
        self.root = pathlib.Path(scratch.name)
        for name in ("one", "two"):
            (self.root / f"{name}.pmx").write_text(name)
        self.program('cat "$3"')
        self.assertEqual(0, self.check("--renew").returncode)

    def program(self, commands):
        program = self.root / "program"
        program.write_text(f"#!/bin/sh\n{commands}\n")
        program.chmod(0o755)

    def check(self, *options, command=None):
        return subprocess.run(
            [sys.executable, CHECKER, *options, "--list", self.root / "list.txt", "--scenarios", self.root,
             *(command or [self.root / "program"])], capture_output=True, text=True, check=False)

    def refused(self, text):
        result = self.check()
        self.assertNotEqual(0, result.returncode)
        self.assertIn(text, result.stdout + result.stderr)
        return result.stdout

    def test_the_same_traces_pass(self):
        result = self.check()
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)
        self.assertIn("2 scenarios", result.stdout)

    def test_an_emulator_with_options_may_come_before(self):
        result = self.check(command=["env", "-u", "NOTHING", self.root / "program"])
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)

    def test_another_trace(self):
        self.program('cat "$3"; case "$3" in *two.pmx) echo more;; esac')
        out = self.refused("two.pmx: another trace than the listed one")
        self.assertNotIn("one.pmx: ", out)
        self.assertIn("repeat: ", out)

    def test_the_line_of_an_assertion_may_move(self):
        self.program('echo "  | ASSERT 0, x.cpp:7"')
        self.assertEqual(0, self.check("--renew").returncode)
        self.program('echo "  | ASSERT 0, x.cpp:12"')
        self.assertEqual(0, self.check().returncode)
        self.program('echo "  | ASSERT 1, x.cpp:12"')
        self.refused("another trace")

    def test_a_scenario_that_fails(self):
        self.program('echo "two went wrong" >&2; exit 1')
        self.assertIn("ended with 1: two went wrong", self.refused("one.pmx: ended with 1"))

    def test_a_failing_scenario_renews_nothing(self):
        before = (self.root / "list.txt").read_text()
        self.program("exit 1")
        self.assertNotEqual(0, self.check("--renew").returncode)
        self.assertEqual(before, (self.root / "list.txt").read_text())

    def test_a_new_scenario(self):
        (self.root / "three.pmx").write_text("three")
        self.refused("three.pmx: not in the list of hashes")

    def test_a_scenario_that_is_gone(self):
        (self.root / "two.pmx").unlink()
        self.refused("two.pmx: listed, but there is no such scenario")

    def test_a_malformed_list(self):
        (self.root / "list.txt").write_text("one.pmx\n")
        self.refused("no hash and scenario")

    def test_no_scenarios_and_no_program(self):
        (self.root / "program").unlink()
        self.refused("program: is not there")
        for file in self.root.glob("*.pmx"):
            file.unlink()
        self.refused("no scenarios there")


if __name__ == "__main__":
    unittest.main()
