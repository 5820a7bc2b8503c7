#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the document of oddities against the tests: every row names tests, and every test named exists.

usage: oddities.py DOCUMENT TESTS

TESTS is the directory of the sources in which TEST, TEST_F and TEST_P stand.
"""

import pathlib
import re
import sys

CASE = re.compile(r"^TEST(?:_F|_P)?\(\s*(\w+)\s*,\s*(\w+)\s*\)", re.M)
NAMED = re.compile(r"`(\w+\.\w+)`")
HEADING = "| What a caller sees | What depends on it | Test |"


def cases(directory):
    """Suite.Test of every case."""
    return {".".join(match) for path in sorted(directory.rglob("*.cpp"))
            for match in CASE.findall(path.read_text(encoding="utf-8"))}


def complaints(text, known):
    rows, inside = 0, False
    for number, line in enumerate(text.splitlines(), start=1):
        if not line.startswith("|"):
            inside = False
            continue
        if line == HEADING:
            inside = True
            continue
        if not inside:
            yield number, f"a table begins with {HEADING}"
            continue
        if set(line) <= set("|- "):
            continue
        rows += 1
        cells = line.strip("|").split("|")
        named = NAMED.findall(cells[-1])
        if len(cells) != 3 or not cells[0].strip():
            yield number, "a row has three cells, and the first one says something"
        if not named:
            yield number, "no test is named"
        if NAMED.sub("", cells[-1]).strip(" ,"):
            yield number, f"the last cell holds something else than tests: {cells[-1].strip()}"
        for name in named:
            if name not in known:
                yield number, f"there is no test {name}"
    if rows == 0:
        yield 1, "no rows found"


def main():
    document, tests = map(pathlib.Path, sys.argv[1:])
    text, known = document.read_text(encoding="utf-8"), cases(tests)
    found = list(complaints(text, known))
    for number, complaint in found:
        print(f"{document.name}:{number}: {complaint}")
    if not found:
        print(f"{document.name}: {len(NAMED.findall(text))} tests named, all of them exist")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
