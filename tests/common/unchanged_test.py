#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What passed is told and not run again; whatever changed, failed or is continuous integration's is run."""

import os
import pathlib
import subprocess
import sys
import tempfile
import unittest

UNCHANGED = pathlib.Path(__file__).with_name("unchanged.py")
# Counts its runs, and ends as it is told.
CHECK = """import pathlib, sys
runs, code = (pathlib.Path(__file__).with_name(name) for name in ("runs", "code"))
runs.write_text(runs.read_text() + "x")
sys.exit(int(code.read_text()))
"""


@unittest.skipUnless(pathlib.Path("/var/lib/dpkg/status").exists(), "what is installed is not told here")
class Unchanged(unittest.TestCase):
    def setUp(self):
        kept = tempfile.TemporaryDirectory()
        self.addCleanup(kept.cleanup)
        self.place = pathlib.Path(kept.name)
        self.folder = self.place / "inputs/below"
        self.folder.mkdir(parents=True)
        self.input = self.write("inputs/below/one", "first")
        self.runs, self.code = self.write("runs", ""), self.write("code", "0")
        self.check = self.write("check.py", CHECK)

    def write(self, name, text):
        path = self.place / name
        path.write_text(text, encoding="utf-8")
        return path

    def run_it(self, *more, inputs=None, environment=None):
        ended = subprocess.run([sys.executable, UNCHANGED, self.place / "stamps/one", *(inputs or ["inputs"]), "--",
                                sys.executable, self.check, *more], cwd=self.place, text=True,
                               capture_output=True, check=False,
                               env={**os.environ, "CI": "", **(environment or {})})
        return ended.returncode, ended.stdout + ended.stderr

    def expect(self, runs, *more, code=0, **how):
        ended, text = self.run_it(*more, **how)
        self.assertEqual((code, runs), (ended, len(self.runs.read_text())), text)
        return text

    def test_what_passed_is_told(self):
        self.assertNotIn("unchanged", self.expect(1))
        self.assertRegex(self.expect(1), r"^unchanged since \d{4}-\d\d-\d\d \d\d:\d\d:\d\d, when it passed")

    def test_what_changed_runs(self):
        self.expect(1)
        self.input.write_text("other", encoding="utf-8")
        self.expect(2)
        self.write("inputs/below/another", "")
        self.expect(3)
        self.input.rename(self.folder / "renamed")
        self.expect(4)
        self.check.write_text(CHECK + "\n", encoding="utf-8")
        self.expect(5)
        self.expect(6, "other word")
        self.expect(6, "other word")

    def test_what_failed_runs_again(self):
        self.code.write_text("1", encoding="utf-8")
        self.expect(1, code=1)
        self.expect(2, code=1)
        self.code.write_text("77", encoding="utf-8")
        self.expect(3, code=77)
        self.code.write_text("0", encoding="utf-8")
        self.expect(4)
        self.expect(4)

    def test_what_changes_meanwhile_runs_again(self):
        self.check.write_text(CHECK.replace("sys.exit", f"open({str(self.input)!r}, 'a').write('x'); sys.exit"),
                              encoding="utf-8")
        self.expect(1)
        self.expect(2)

    def test_continuous_integration_runs_everything(self):
        self.expect(1)
        self.expect(2, environment={"CI": "true"})

    def test_an_input_that_is_not_there(self):
        code, text = self.run_it(inputs=["input"])
        self.assertEqual((1, "unchanged.py: no input input\n"), (code, text))


if __name__ == "__main__":
    unittest.main()
