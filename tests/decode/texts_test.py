#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs texts.py on the layer's object and on such as must be refused.

usage: texts_test.py OBJECT TOOL OBJCOPY
"""

import json
import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("texts.py")
GIVEN = []


class Texts(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.directory = pathlib.Path(directory.name)
        table = subprocess.run([GIVEN[1], "decode", "--texts", "--json"], check=True, capture_output=True, text=True)
        self.rows = json.loads(table.stdout)

    def check(self, path=None, rows=None):
        table = self.directory / "table.json"
        table.write_text(json.dumps(self.rows if rows is None else rows), encoding="utf-8")
        return subprocess.run([sys.executable, CHECKER, path or GIVEN[0], table], capture_output=True, text=True,
                              check=False)

    def refused(self, text, **given):
        result = self.check(**given)
        self.assertEqual(1, result.returncode, result.stdout + result.stderr)
        self.assertIn(text, result.stdout)

    def with_section(self, content, flags):
        planted = self.directory / "planted.bin"
        planted.write_bytes(content)
        path = self.directory / "planted.o"
        subprocess.run([GIVEN[2], "--add-section", f".rodata.planted={planted}", "--set-section-flags",
                        f".rodata.planted={flags}", GIVEN[0], path], check=True)
        return path

    def test_the_table_is_the_objects(self):
        result = self.check()
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)

    def test_a_planted_text_is_found(self):
        path = self.with_section(b"PMX planted %d\n\0", "alloc,load,readonly,data")
        self.refused(r"the table lacks: 'PMX planted %d\n'", path=path)

    def test_a_planted_row_is_found(self):
        rows = self.rows + [{**self.rows[0], "format": "PMX planted %d\n"}]
        self.refused(r"the object lacks: 'PMX planted %d\n'", rows=rows)

    def test_each_row_that_is_missing_is_found(self):
        for format in {row["format"] for row in self.rows[::40]}:
            rows = [row for row in self.rows if row["format"] != format]
            self.refused(f"the table lacks: {format!r}", rows=rows)

    def test_an_empty_table_is_refused(self):
        self.refused("no texts found", rows=[])


if __name__ == "__main__":
    GIVEN = sys.argv[1:4]
    unittest.main(argv=sys.argv[:1])
