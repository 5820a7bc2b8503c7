#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes a body for every platform function: it does nothing and answers zero. The bodies are weak, so that a function
that is written by hand elsewhere in the program takes its place.

usage: stand_ins.py OUTPUT
"""

import pathlib
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

from platform_functions import PLATFORM_HEADERS, ROOT, functions  # noqa: E402


def bodies(path):
    """The definitions of what one header declares."""
    for function in functions(path):
        statement = "return {};" if function.has_result else ""
        yield (f"__attribute__((weak)) {function.result} {function.name}({function.declared})\n"
               f"{{\n    {statement}\n}}\n")


def main():
    headers = [ROOT / header for header in PLATFORM_HEADERS]
    text = ["// Written from the platform headers when the program is built.",
            '#pragma GCC diagnostic ignored "-Wunused-parameter"']
    text += [f'#include "{header.name}"' for header in headers] + [""]
    for header in headers:
        text += bodies(header)
    pathlib.Path(sys.argv[1]).write_text("\n".join(text), encoding="utf-8")


if __name__ == "__main__":
    main()
