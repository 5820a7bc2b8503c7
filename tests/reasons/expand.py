#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Takes the reasons out of the layer's sources, as somebody would who never heard of them, line for line.

As a module: without_reasons(text) yields the text that is left.
"""

import pathlib
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

from reason_places import MACRO, arguments, places  # noqa: E402, F401


def _answer(kind, given):
    """What ships of a macro."""
    if kind == "WHY":
        return "(" + given[1].strip() + ")"
    return without_reasons(given[-1]).strip() if kind == "WHY_EITHER" else ""


def without_reasons(text):
    """The same number of lines, and of each macro what ships."""
    left, rest = [], 0
    for match in MACRO.finditer(text):
        if match.start() < rest:
            continue
        given, end = arguments(text, match.end())
        lines = text.count("\n", match.start(), end)
        answer = _answer(match[1], given)
        left += [text[rest:match.start()], answer, "\n" * (lines - answer.count("\n"))]
        rest = end + 1
    return "".join(left) + text[rest:]
