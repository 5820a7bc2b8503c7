#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Reading a log is linear in its length, whatever it holds, and a line costs no more than it did: instructions of the
optimised tool for some kilobytes and for twice as many, beyond what it takes to begin and to end.

usage: check_linear.py PMXBOARD
"""

import pathlib
import sys
import tempfile

sys.dont_write_bytecode = True
sys.path.append(str(pathlib.Path(__file__).resolve().parents[1] / "common"))

import instructions as counted  # noqa: E402

CAPTURED = pathlib.Path(__file__).with_name("player.log").read_bytes()
FEW = 50_000  # bytes
MOST_TIMES = 2.1  # as many instructions for twice the bytes
MOST_A_LINE = 50_000  # instructions, of a line of the captured log, story and all

# What is repeated to the length that is wanted.
KINDS = {
    "captured": CAPTURED,
    "coloured": b"".join(b"\x1b[1;32m12:34:56.789\x1b[0m " + line + b"\n" for line in CAPTURED.splitlines()),
    "foreign": b"ir: key\n",
    "without lines": b"[PMX] PMX(",
    "cut": b"CC_A disable\n[   1.5] PMX Start to set OSD Dis\n",
    "returns": b"PMX_Init\r",
}


def instructions(pmxboard, directory, content):
    log = directory / "log"
    log.write_bytes(content)
    return counted.of(pmxboard, "decode", log)


def complaints(kind, content, few, many):
    if many > MOST_TIMES * few:
        yield f"{kind}: {many / few:.2f} times the instructions for twice the bytes"
    if kind == "captured" and few > MOST_A_LINE * content.count(b"\n"):
        yield f"{kind}: more than {MOST_A_LINE:,} instructions a line"


def main():
    pmxboard = pathlib.Path(sys.argv[1])
    found = []
    with tempfile.TemporaryDirectory() as directory:
        always = instructions(pmxboard, pathlib.Path(directory), b"")
        for kind, piece in KINDS.items():
            content = piece * (FEW // len(piece))
            few, many = (instructions(pmxboard, pathlib.Path(directory), content * times) - always for times in (1, 2))
            lines = content.count(b"\n")
            print(f"{kind}: {few:,} instructions for {len(content):,} bytes in {lines:,} lines, "
                  f"{many / few:.2f} times as many for twice the bytes")
            found += complaints(kind, content, few, many)
    print(*found, sep="\n")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
