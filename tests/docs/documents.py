#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Checks what documents tell their readers: commands work, links lead somewhere.

usage: documents.py ROOT TOOL DOCUMENT...

The commands of ```sh blocks run in ROOT; see tests/readme/run_readme.py. A link is relative to its document.
"""

import pathlib
import re
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parent.parent / "readme"))

import run_readme  # noqa: E402

LINK = re.compile(r"\]\(([^)#\s]+)(?:#[^)]*)?\)")


def complaints(document, root, tool):
    text = document.read_text(encoding="utf-8")
    for number, command in run_readme.commands(text):
        message = run_readme.check(command, root, tool)
        if message:
            yield number, f"{command}: {message}"
    for number, line in enumerate(text.splitlines(), start=1):
        for target in LINK.findall(line):
            if "://" not in target and not (document.parent / target).exists():
                yield number, f"leads nowhere: {target}"


def main():
    root, tool = (pathlib.Path(argument).resolve() for argument in sys.argv[1:3])
    documents = [pathlib.Path(argument).resolve() for argument in sys.argv[3:]]
    failures = 0 if documents else 1
    for document in documents:
        found = list(complaints(document, root, tool))
        failures += len(found)
        for number, complaint in found:
            print(f"{document.name}:{number}: {complaint}")
        if not found:
            print(f"{document.name}: fine")
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
