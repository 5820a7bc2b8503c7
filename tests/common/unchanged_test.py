#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What passed is told and not run again; whatever changed, failed or is continuous integration's is run."""

import os
import pathlib
import subprocess
import sys
import tempfile
import unittest
import unittest.mock

sys.dont_write_bytecode = True

import unchanged  # noqa: E402

UNCHANGED = pathlib.Path(unchanged.__file__)
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
        ended = subprocess.run([sys.executable, "-I", "-S", UNCHANGED, self.place / ".stamps/one",
                                *(inputs or ["inputs"]), "--", sys.executable, self.check, *more], cwd=self.place,
                               text=True, capture_output=True, check=False,
                               env={**os.environ, "CI": "", "PMX_AGAIN": "", **(environment or {})})
        return ended.returncode, ended.stdout + ended.stderr

    def expect(self, runs, *more, code=0, **how):
        ended, text = self.run_it(*more, **how)
        self.assertEqual((code, runs), (ended, len(self.runs.read_text())), text)
        return text

    def test_what_passed_is_told(self):
        self.assertNotIn("unchanged", self.expect(1))
        text = self.expect(1)
        self.assertRegex(text, r"^unchanged since \d{4}-\d\d-\d\d \d\d:\d\d:\d\d, when it passed")
        self.assertIn("<CTestLabel>unchanged</CTestLabel>\n", text)   # what ctest counts

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

    def test_everything_is_run_where_that_is_said(self):
        self.expect(1)
        self.expect(2, environment={"PMX_AGAIN": "true"})
        self.expect(2)
        self.expect(3, environment={"CI": "true"})
        self.expect(4, environment={"CI": "true"})

    def test_what_fails_when_it_is_run_again_is_no_longer_unchanged(self):
        self.expect(1)
        self.code.write_text("1", encoding="utf-8")
        self.expect(2, code=1, environment={"PMX_AGAIN": "true"})
        self.expect(3, code=1)

    def test_a_program_is_what_is_in_it(self):
        program = self.write("program", "x" * (1 << 19))
        for runs, content, day in ((1, "x", 1), (1, "x", 2), (2, "y", 2), (2, "y", 3), (3, "x", 3)):
            program.write_text(content * (1 << 19), encoding="utf-8")
            os.utime(program, (day, day))
            self.expect(runs, program)

    def test_what_is_in_a_large_file_is_read_once(self):
        program = self.write("program", "x" * (1 << 19))
        contents = unchanged.Contents(self.place / "kept")
        with unittest.mock.patch.object(unchanged, "SETTLED", -1):
            first = contents.of(str(program))
        with unittest.mock.patch.object(contents, "read") as read:
            self.assertEqual(first, contents.of(str(program)))
            read.assert_not_called()
            os.utime(program, (1, 1))
            self.assertNotEqual(first, contents.of(str(program)))

    def test_what_has_just_been_written_may_change_unseen(self):
        program = self.write("program", "x" * (1 << 19))
        unchanged.Contents(self.place / "kept").of(str(program))
        self.assertFalse((self.place / "kept").exists())

    def test_of_the_surroundings_it_sees_what_counts(self):
        self.check.write_text("import os, sys\nsys.stdout.write(' '.join(sorted(os.environ)))\n", encoding="utf-8")
        _, text = self.run_it(environment={"ELSEWHERE": "1", "PMX_DISTURBED": "all"})
        self.assertIn("PMX_DISTURBED", text)
        self.assertNotIn("ELSEWHERE", text)
        for runs_again, more in ((False, {"ELSEWHERE": "2"}), (True, {"PMX_DISTURBED": ""}), (True, {"LANG": "x"})):
            _, text = self.run_it(environment={"PMX_DISTURBED": "all", **more})
            self.assertEqual(runs_again, "unchanged since" not in text, more)
            self.run_it(environment={"PMX_DISTURBED": "all"})

    def test_an_input_that_is_not_there(self):
        code, text = self.run_it(inputs=["input"])
        self.assertEqual((1, "unchanged.py: no input input\n"), (code, text))

    def test_an_input_that_need_not_be_there(self):
        self.expect(1, inputs=["?inputs/more"])
        self.expect(1, inputs=["?inputs/more"])
        self.write("inputs/more", "")
        self.expect(2, inputs=["?inputs/more"])


if __name__ == "__main__":
    unittest.main()
