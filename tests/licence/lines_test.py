#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds lines.py small projects: with every licence said, with one that is missing, and with files that it cannot
know."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import lines  # noqa: E402

EXCEPTIONS = "Format: x\n\nFiles: *\nLicense: x\n\nFiles: *.bin docs/made.md\n tests/made.txt\nLicense: x\n"
CLEAN = {".reuse/dep5": EXCEPTIONS, "LICENSES/MIT.txt": "May be used.\n", "LICENSE": "Either.\n", "a.bin": "\1",
         "docs/made.md": "Made.\n", "tests/made.txt": "made\n", "a.cpp": f"// {lines.LICENCE}\nint a;\n",
         "dev": f"#!/bin/sh\n# {lines.LICENCE}\ntrue\n", "b.md": f"<!-- {lines.LICENCE} -->\n# B\n"}
EXCEPT_ITSELF = {".reuse/dep5": EXCEPTIONS.replace("*.bin", "*.bin .reuse/dep5")}


class Lines(unittest.TestCase):
    def found(self, files, fix=False):
        """(complaints, the files afterwards)"""
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            subprocess.run(["git", "init", "-q", root], check=True)
            named = {**CLEAN, **EXCEPT_ITSELF, **files}
            for name, text in named.items():
                (root / name).parent.mkdir(parents=True, exist_ok=True)
                (root / name).write_text(text)
            complaints = list(lines.complaints(root, fix))
            return complaints, {name: (root / name).read_text() for name in named}

    def test_a_clean_project_passes(self):
        self.assertEqual([], self.found({})[0])

    def test_a_missing_line_is_named_with_what_to_write(self):
        for name, line in (("x.cpp", f"// {lines.LICENCE}"), ("x/CMakeLists.txt", f"# {lines.LICENCE}"),
                           (".clang-tidy", f"# {lines.LICENCE}"), ("x.s.in", f"/* {lines.LICENCE} */"),
                           ("x.md", f"<!-- {lines.LICENCE} -->")):
            [complaint], _ = self.found({name: "text\n"})
            self.assertIn(f"{name}:1: does not say its licence: {line} ", complaint)

    def test_another_licence_or_place_is_none(self):
        self.assertEqual(1, len(self.found({"x.cpp": f"// {lines.TAG} MIT\nint x;\n"})[0]))
        self.assertEqual(1, len(self.found({"x.cpp": f"int x;\n\n// {lines.LICENCE}\n"})[0]))

    def test_a_kind_of_file_that_is_not_known(self):
        [complaint], _ = self.found({"x.strange": "text\n"})
        self.assertIn("x.strange: unknown kind of file", complaint)

    def test_fix_writes_the_line_once(self):
        complaints, after = self.found({"x.cpp": "int x;\n", "run": "#!/bin/sh\ntrue\n"}, fix=True)
        self.assertEqual([], complaints)
        self.assertEqual(f"// {lines.LICENCE}\nint x;\n", after["x.cpp"])
        self.assertEqual(f"#!/bin/sh\n# {lines.LICENCE}\ntrue\n", after["run"])
        self.assertEqual(([], after), self.found(after, fix=True))


if __name__ == "__main__":
    unittest.main()
