#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the rules of decoding together: each has its name, its body and a row that follows it.

usage: rules.py DIRECTORY    that of the log reader
"""

import pathlib
import re
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[1] / "tidy"))

from cpp import Source  # noqa: E402

NAMES = "texts.h"
ROWS = "text_table.cpp"
NAME = re.compile(r"^Function (\w+);", re.M)
BODY = re.compile(r"^void rules::(\w+)\(", re.M)
# What makes rows may be called as the rule that they follow, which then is written in full.
MAKES_ROWS = re.compile(r"^constexpr Text (\w+)\(", re.M)


def found(pattern, file, source):
    return {match[1]: f"{file}:{source.line_of(match.start(1))}" for match in pattern.finditer(source.plain)}


def followed(rows):
    """The names that rows mention. A macro makes rows, too."""
    full = set(re.findall(r"\brules::(\w+)", rows.code))
    makers = set(MAKES_ROWS.findall(rows.code))
    return full | (set(re.findall(r"\b[a-z]\w+\b", re.sub(r"\brules::\w+", "", rows.code))) - makers)


def names_in(directory):
    return found(NAME, directory / NAMES, Source((directory / NAMES).read_text(encoding="utf-8")))


def complaints(directory):
    sources = {path: Source(path.read_text(encoding="utf-8")) for path in sorted(directory.glob("*.cpp"))}
    names = names_in(directory)
    bodies = {}
    for path, source in sources.items():
        bodies |= found(BODY, path, source)
    in_rows = followed(sources[directory / ROWS])
    if not names or not bodies:
        yield f"{directory}: no rules found"
    for name, place in names.items():
        if name not in bodies:
            yield f"{place}: rules::{name} has no body: void rules::{name}(Teller&, const Item&)"
        elif name not in in_rows:
            yield f"{bodies[name]}: no row of {ROWS} follows rules::{name}"


def main():
    directory = pathlib.Path(sys.argv[1])
    said = list(complaints(directory))
    print(*said or [f"{len(names_in(directory))} rules, each with a body and rows"], sep="\n")
    return 1 if said else 0


if __name__ == "__main__":
    sys.exit(main())
