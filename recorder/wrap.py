#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Gives the names of the object that ships other names, so that somebody can stand between it and its neighbours. Code
and data stay what they are.

usage: wrap.py OBJCOPY LAYER recorded|replayed OUTPUT

recorded  operations and tables get pmx_recorded_ before their names, what the layer needs pmx_recorder_; variables
          keep theirs, and the private ones can be seen
replayed  everything that the layer defines gets pmx_replayed_ before its name, what it needs pmx_replay_
"""

import pathlib
import subprocess
import sys
import tempfile

import interface
from interface import elf


def new_names(layer, manner):
    """{name: new name}, and the private variables."""
    needed, own, private = {}, {}, []
    platform = {function.name for function in interface.platform()}
    for symbol in elf.Elf(layer).symbols:
        is_variable = symbol.type == elf.OBJECT and symbol.section and symbol.section.flags & elf.WRITE
        if symbol.is_local and is_variable:
            private.append(symbol.name)
        if symbol.is_local and manner == "replayed" and symbol.type in (elf.OBJECT, elf.FUNC):
            own[symbol.name] = f"pmx_replayed_{symbol.name}"  # whoever looks for it finds one of that name
        elif symbol.is_local or not symbol.name:
            continue
        elif symbol.section is None and symbol.name in platform:  # and not what a compiler takes for granted
            needed[symbol.name] = ("pmx_recorder_" if manner == "recorded" else "pmx_replay_") + symbol.name
        elif symbol.section and (manner == "replayed" or symbol.type == elf.FUNC or symbol.name in interface.TABLES):
            own[symbol.name] = f"pmx_{manner}_{symbol.name}"
    if not needed or not own or not private:
        raise SystemExit(f"{layer} is no layer that ships")
    return needed | own, private


def main():
    objcopy, layer, manner, output = sys.argv[1:]
    names, private = new_names(layer, manner)
    with tempfile.TemporaryDirectory() as folder:
        renamed, seen = pathlib.Path(folder) / "renamed", pathlib.Path(folder) / "seen"
        renamed.write_text("".join(f"{old} {new}\n" for old, new in names.items()), encoding="utf-8")
        seen.write_text("".join(f"{name}\n" for name in private), encoding="utf-8")
        # Its debug information goes by the old names: it stays with the object that ships.
        subprocess.run([objcopy, "--strip-debug", f"--globalize-symbols={seen}", layer, output], check=True)
        subprocess.run([objcopy, f"--redefine-syms={renamed}", output], check=True)


if __name__ == "__main__":
    main()
