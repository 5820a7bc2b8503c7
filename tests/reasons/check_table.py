#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the table of reasons: a number once given stays its reason's, new ones are appended, each sentence shows the
values that its row announces, and each reason is given somewhere in the layer and by nothing else. The page tells which
of them a console log determines, as the log reader has it, and at which level of the console.

usage: check_table.py [--renew] [ROOT]

With --renew the tables of the page are written anew.
"""

import pathlib
import re
import sys

sys.dont_write_bytecode = True

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

import whole_file  # noqa: E402
from reason_places import places  # noqa: E402

ROOT = pathlib.Path(__file__).resolve().parents[2]
HEADER = "src/driver/private_inc/pmx_reason.h"
NUMBERS = "tests/reasons/numbers.txt"
PAGE = "docs/reasons.md"
LAYER = "src/driver/pmx"
LOG_REASONS = "tools/pmxboard/decode/reasons.cpp"
LOG_TEXTS = "tools/pmxboard/decode/text_table.cpp"
LOG_REASON = re.compile(r'\{ PMX_REASON_(\w+),\s*"([^"]+)"')
LOG_TEXT = re.compile(r'(?:\{ (\w+),\s+|(\w+)\()"((?:[^"\\]|\\.)*)"')
# Of texts that rows make with a function; what has no level is printed at every one.
MADE = {"refused": 8, "swap": 8, "report": 0}
# Those whose values or conditions stand in lines of the request, which are printed at level 9.
OF_THE_REQUEST = {"MODE_NEVER": 9, "MODE_BIT": 9}
ROW = re.compile(r'X\(\s*(\d+),\s*(\w+),\s*(\w+),\s*(\w+),\s*(\w+),\s*\\?\s*"([^"]*)"\)')
CLASS = re.compile(r'X\((\d+), (\w+), "([^"]*)"\)')
CONVERSION = re.compile(r"%0?\d*(.)")
# What a kind of value is shown as.
SHOWN_AS = {"NONE": "", "SIGNED": "d", "WORD": "X", "PLANES": "X"}


def rows(text):
    """The table: (number, name, class, kinds, sentence) of each row."""
    for number, name, kind_of, first, second, sentence in ROW.findall(text):
        yield int(number), name, kind_of, (first, second), sentence


def levels_in_logs(root):
    """At which level of the console a log determines a reason: {name: level}, 0 for every level."""
    texts = [(begin, MADE.get(made, 0) if made else int(level) if level.isdigit() else 0)
             for level, made, begin in LOG_TEXT.findall((root / LOG_TEXTS).read_text(encoding="utf-8"))]
    found = {}
    for name, begin in LOG_REASON.findall((root / LOG_REASONS).read_text(encoding="utf-8")):
        levels = [level for text, level in texts if text.startswith(begin)]
        found[name] = OF_THE_REQUEST.get(name, min([*levels, found.get(name, 9)]))
    return found


def page(text, header, in_logs):
    """The page with its tables, which stand behind their marks, as the sources have them."""
    tables = {"classes": ["| Class | What a caller may do |", "|---|---|",
                          *(f"| `{name}` | {advice} |" for _, name, advice in CLASS.findall(header))],
              "reasons": ["| | Reason | Class | In a log | Sentence |", "|---|---|---|---|---|",
                          *(f"| {number} | `{name}` | `{kind}` | {in_logs.get(name, '')} | {sentence} |"
                            for number, name, kind, _, sentence in rows(header))]}
    for mark, lines in tables.items():
        written = f"<!-- {mark} -->\n\n" + "".join(f"{line}\n" for line in lines)
        text = re.sub(rf"<!-- {mark} -->\n\n?(?:^\|.*\n)*", lambda _, written=written: written, text, flags=re.M)
    return text


def known_numbers(text):
    """The numbers that have been given: {name: number}, in their order."""
    lines = [line.split() for line in text.splitlines() if not line.startswith("#")]
    return {name: int(number) for number, name in lines}


def complaints(root):
    table = list(rows((root / HEADER).read_text(encoding="utf-8")))
    known = known_numbers((root / NUMBERS).read_text(encoding="utf-8"))
    given = {}
    for path in sorted((root / LAYER).iterdir()):
        if path.suffix in (".cpp", ".h") and path.name != "pmx_why.h":
            for name, line in places(path.read_text(encoding="utf-8")):
                given.setdefault(name, f"{path.relative_to(root)}:{line}")
    if not table:
        yield f"{HEADER}: no table was found"
    if [number for number, *_ in table] != list(range(1, len(table) + 1)):
        yield f"{HEADER}: the numbers do not run from 1 on without a gap"
    named = {name: number for number, name, *_ in table}
    for name, number in known.items():
        if named.get(name) != number:
            yield f"{HEADER}: {name} is {number} for ever, and not {named.get(name, 'gone')}"
    for name, number in named.items():
        if name not in known:
            yield f"{NUMBERS}: append \"{number} {name}\": a number that was given stays"
    header = (root / HEADER).read_text(encoding="utf-8")
    kinds_known = header[header.index("PMX_REASON_KINDS"):header.index("PMX_REASONS_KNOWN")]
    kinds_known = set(re.findall(r"X\((\w+)\)", kinds_known))
    for _, name, _, kinds, sentence in table:
        if not kinds_known.issuperset(kinds):
            yield f"{HEADER}: {name}: its values are of no known kind: {kinds}"
        wanted = [SHOWN_AS.get(kind, "u") for kind in kinds if kind != "NONE"]
        if CONVERSION.findall(sentence) != wanted:
            yield f"{HEADER}: {name}: the sentence shows {CONVERSION.findall(sentence)}, its values are {wanted}"
        if sentence.endswith((".", "\n")) or sentence != sentence.strip():
            yield f"{HEADER}: {name}: the sentence has no full stop or end of line"
    in_logs = levels_in_logs(root)
    if not in_logs:
        yield f"{LOG_REASONS}: no rows were found"
    for name in in_logs:
        if name not in named:
            yield f"{LOG_REASONS}: no reason is called {name}"
    for name, place in given.items():
        if name not in named:
            yield f"{place}: no reason is called {name}"
    for name in named:
        if name not in given:
            yield f"{HEADER}: {name}: nothing in {LAYER} gives this reason"


def main(*words):
    renew, root = "--renew" in words, pathlib.Path(next((word for word in words if word != "--renew"), ROOT))
    text = (root / PAGE).read_text(encoding="utf-8")
    wanted = page(text, (root / HEADER).read_text(encoding="utf-8"), levels_in_logs(root))
    if renew:
        whole_file.write(root / PAGE, wanted)
    found = list(complaints(root))
    if not renew and wanted != text:
        found.append(f"{PAGE}: its tables are not the header's: check_table.py --renew writes them")
    for complaint in found:
        print(complaint)
    print(f"reasons: {len(found)} complaints")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
