#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds check_version.py a tool, a header and an object of one version, and each of them of another one."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import check_version  # noqa: E402


class CheckVersion(unittest.TestCase):
    def found(self, tool="1.2.3", header="1.2.3", patch="3", in_object=".ident \"PMX 1.2.3\""):
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            (root / "tool").write_text(f"#!/bin/sh\necho pmxboard {tool}\n")
            (root / "tool").chmod(0o755)
            (root / "version.h").write_text("#define PMX_VERSION_MAJOR 1\n#define PMX_VERSION_MINOR 2\n"
                                            f'#define PMX_VERSION_PATCH {patch}\n#define PMX_VERSION_TEXT "{header}"\n')
            subprocess.run(["as", "-o", root / "object.o", "-"], input=in_object + "\n", text=True, check=True)
            return [pathlib.PurePath(complaint.split()[0]).name for complaint in
                    check_version.complaints("1.2.3", root / "tool", root / "version.h", [root / "object.o"])]

    def test_good(self):
        self.assertEqual([], self.found())

    def test_bad(self):
        self.assertEqual(["tool"], self.found(tool="1.2.4"))
        self.assertEqual(["version.h"], self.found(header="1.2.4"))
        self.assertEqual(["version.h"], self.found(patch="4"))
        self.assertEqual(["object.o"], self.found(in_object=".ident \"PMX 1.2.30\""))
        self.assertEqual(["object.o"], self.found(in_object=""))


if __name__ == "__main__":
    unittest.main()
