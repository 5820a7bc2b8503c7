#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds build_twice.py files that are alike, and files that are not."""

import pathlib
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import build_twice  # noqa: E402


class BuildTwice(unittest.TestCase):
    def found(self, first, second):
        with tempfile.TemporaryDirectory() as directory:
            folders = [pathlib.Path(directory) / name for name in ("one", "two")]
            for folder, content in zip(folders, (first, second)):
                folder.mkdir()
                (folder / "x.o").write_bytes(content)
            return list(build_twice.compare(folders, ["x.o"]))

    def test_alike(self):
        self.assertEqual([], self.found(b"abc", b"abc"))

    def test_different(self):
        self.assertEqual(["x.o: 2 of 4 bytes, the first at 0x1"], self.found(b"abcd", b"aXcY"))
        self.assertEqual(["x.o: 3 and 4 bytes"], self.found(b"abc", b"abcd"))


if __name__ == "__main__":
    unittest.main()
