#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the table of the layer's texts against the strings in the layer's object.

usage: texts.py OBJECT TABLE    TABLE: what `pmxboard decode --texts --json` writes

Every string of the object is one of the table's, whether console text, expression of an assertion, source file, name of
a value or other; and every text of the table is in the object.
"""

import json
import pathlib
import re
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "tools" / "cost"))

import elf  # noqa: E402

PROGBITS = 1
# In sections of tables: what is long enough to be no accident, with a zero at its end.
RUN = re.compile(rb"[\t\n\r\x1b -\x7e]{5,}\0")


def strings(path):
    found = set()
    content = elf.Elf(path)
    for section in content.sections:
        if section.type != PROGBITS or not section.flags & elf.ALLOC or section.flags & elf.EXEC:
            continue
        data = content.bytes_of(section)
        if section.flags & elf.STRINGS:
            found.update(data.split(b"\0"))
        else:
            found.update(run[:-1] for run in RUN.findall(data))
    found.discard(b"")
    return {text.decode("latin-1") for text in found}


def complaints(in_object, in_table):
    for text in sorted(in_object - in_table):
        yield f"the object has a text that the table lacks: {text!r}"
    for text in sorted(in_table - in_object):
        yield f"the table has a text that the object lacks: {text!r}"


def main():
    in_object = strings(sys.argv[1])
    rows = json.loads(pathlib.Path(sys.argv[2]).read_text(encoding="utf-8"))
    in_table = {row["format"] for row in rows}
    if not in_object or not in_table:
        print("no texts found")
        return 1
    found = list(complaints(in_object, in_table))
    for complaint in found:
        print(complaint)
    if not found:
        print(f"{len(in_object)} texts in the object, each in the table's {len(rows)} rows, and the other way round")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
