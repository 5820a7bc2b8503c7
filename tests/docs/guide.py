#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the tables of the guide to scenarios against those that the tool writes from its own verbs, and its table of
trace formats against the formats that there are.

usage: guide.py [--renew] TOOL GUIDE
"""

import pathlib
import re
import subprocess
import sys

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

import whole_file  # noqa: E402

TABLE = re.compile(r"^\| (?:Command|Expectation) \|.*\n(?:\|.*\n)+", re.M)

FORMATS = re.compile(r"--trace-format (\S+)")
FORMAT_TABLE = re.compile(r"^\| Format \|.*\n\|-.*\n((?:\|.*\n)+)", re.M)


def run(*command):
    return subprocess.run(command, capture_output=True, text=True, check=True).stdout


def stale_formats(path, text, tool):
    """Trace formats that the guide or the tool has alone."""
    table = FORMAT_TABLE.search(text)
    told = re.findall(r"^\| `(\w+)`", table[1], re.M) if table else []
    line = text.count("\n", 0, table.start()) + 1 if table else 1
    there = FORMATS.search(run(tool, "run", "--help"))[1].split("|")
    return [f"{path}:{line}: trace format {name}: " + ("no row tells of it" if name in there else "the tool has none")
            for name in sorted({*told} ^ {*there})]


def main():
    *renew, tool, path = sys.argv[1:]
    guide = pathlib.Path(path)
    text = guide.read_text(encoding="utf-8")
    written = TABLE.findall(run(tool, "guide"))
    told = TABLE.findall(text)
    if len(written) != 2 or len(told) != 2:
        sys.exit(f"{path}: {len(told)} tables, and the tool writes {len(written)}; there are two")
    if renew:
        whole_file.write(guide, TABLE.sub(lambda _: written.pop(0), text))
        return 0
    formats = stale_formats(path, text, tool)
    for complaint in formats:
        print(complaint)
    stale = [row for one, other in zip(told, written) for row in set(one.splitlines()) ^ set(other.splitlines())]
    for row in sorted(stale):
        print(f"{path}: {row}")
    if told != written:
        print("the guide does not tell of the verbs as they are: cmake --build --preset debug --target renew_guide")
    else:
        print(f"{path}: {sum(table.count(chr(10)) - 2 for table in told)} forms are told")
    return 0 if told == written and not formats else 1


if __name__ == "__main__":
    sys.exit(main())
