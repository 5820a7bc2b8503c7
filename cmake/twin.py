#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Makes a second layer that can be linked beside the first: what is the layer's own gets names of its own, and the
objects that neighbours see stay one, the first layer's.

usage: twin.py READELF OBJCOPY INPUT OUTPUT
"""

import pathlib
import subprocess
import sys
import tempfile

PREFIX = "pmx_twin_"


def defined_symbols(readelf, path):
    """(name, type, whether neighbours see it) of each global symbol that an object defines."""
    listed = subprocess.run([readelf, "--syms", "--wide", path], capture_output=True, text=True, check=True).stdout
    for line in listed.splitlines():
        words = line.split()
        if len(words) == 8 and words[4] == "GLOBAL" and words[6] != "UND":
            yield words[7], words[3], words[5] == "DEFAULT"


def main(readelf, objcopy, source, target):
    renamed, common = [], []
    for name, kind, is_public in defined_symbols(readelf, source):
        (common if kind == "OBJECT" and is_public else renamed).append(name)
    if not renamed or not common:
        raise SystemExit(f"{source} is no layer: it has {len(renamed)} symbols of its own and {len(common)} in common")
    with tempfile.TemporaryDirectory() as folder:
        own, shared = pathlib.Path(folder) / "own", pathlib.Path(folder) / "common"
        own.write_text("".join(f"{name} {PREFIX}{name}\n" for name in renamed), encoding="utf-8")
        shared.write_text("".join(f"{name}\n" for name in common), encoding="utf-8")
        subprocess.run([objcopy, f"--redefine-syms={own}", f"--weaken-symbols={shared}", source, target], check=True)


if __name__ == "__main__":
    main(*sys.argv[1:])
