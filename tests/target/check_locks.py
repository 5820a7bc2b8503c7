#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds what the headers and the porting guide say of MutexPMX against the compiler's call graph: which operations can
take it. A caller that does not know waits for ever.

usage: check_locks.py ROOT DIRECTORY    DIRECTORY has the call graphs, *.ci
"""

import pathlib
import re
import sys

sys.dont_write_bytecode = True
sys.path[:0] = [str(pathlib.Path(__file__).resolve().parents[2] / directory) for directory in ("cmake", "tools/cost")]

from callgraph import EDGE  # noqa: E402
from platform_functions import LAYER_HEADER, functions  # noqa: E402

TOLD_IN = (LAYER_HEADER, "src/driver/private_inc/drv_if_vdp.h", "docs/porting.md")


def callers(texts, function):
    """Every function from which this one can be reached."""
    calling = {}
    for text in texts:
        for source, target, _ in EDGE.findall(text):
            calling.setdefault(target, set()).add(source)
    found, left = set(), [function]
    while left:
        new = calling.get(left.pop(), set()) - found
        found |= new
        left += new
    return found


def orders_of_locks(text, operations):
    """The operations named in each sentence that has both MutexPMX and pu4SetColorMode."""
    for sentence in re.split(r"\.\s", re.sub(r"\s+\*?\s*", " ", text)):
        words = set(re.findall(r"\w+", sentence))
        if {"MutexPMX", "pu4SetColorMode"} <= words:
            yield words & operations


def complaints(root, directory):
    texts = [path.read_text(encoding="utf-8") for path in sorted(directory.glob("*.ci"))]
    operations = {function.name: function for function in functions(root / LAYER_HEADER)}
    taking = callers(texts, "x_sema_lock") & set(operations)
    if not taking:
        yield f"{directory}: no operation there takes the mutex"
    for name, function in operations.items():
        told = "MutexPMX" in function.contract.partition("@context")[2]
        if told != (name in taking):
            yield f"{name} {'can' if name in taking else 'cannot'} take MutexPMX, and its @context says otherwise"
    for path in TOLD_IN:
        named = list(orders_of_locks((root / path).read_text(encoding="utf-8"), set(operations)))
        if taking not in named:
            listed = " / ".join(" ".join(sorted(names ^ taking)) for names in named)
            yield f"{path}: no sentence names all that can take MutexPMX and nothing else; at odds: {listed or 'all'}"


def main():
    root, directory = map(pathlib.Path, sys.argv[1:])
    found = list(complaints(root, directory))
    for complaint in found:
        print(complaint)
    print(f"locks: {len(found)} complaints")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
