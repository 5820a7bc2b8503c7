#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Compiles the porting skeleton and the self-test of ports as C, for a machine without a library, and links both with
the object that ships: nothing but the kernel's own may stay open.

usage: check_port_skeleton.py SKELETON SELFTEST PMX_IF_OBJECT COMPILER...
"""

import pathlib
import subprocess
import sys
import tempfile

ROOT = pathlib.Path(__file__).resolve().parents[2]
FLAGS = ["-std=c11", "-pedantic", "-Wall", "-Wextra", "-Werror", "-fno-short-enums", "-ffreestanding", "-fno-pie"]
INCLUDES = ["src/system/inc", "src/driver/inc", "src/driver/private_inc"]
OF_THE_KERNEL = {"memcpy", "memset"}


def open_symbols(sources, shipped, compiler, directory):
    linked = directory / "linked.o"
    compiled = [directory / f"{pathlib.Path(source).stem}.o" for source in sources]
    for source, made in zip(sources, compiled):
        subprocess.run([compiler, *FLAGS, *(f"-I{ROOT / include}" for include in INCLUDES), "-c", source, "-o", made],
                       check=True)
    subprocess.run(["ld", "-r", "-o", linked, shipped, *compiled], check=True)
    names = subprocess.run(["nm", "--undefined-only", "--format=posix", linked], check=True, capture_output=True,
                           text=True).stdout
    return {line.split()[0] for line in names.splitlines()}


def main():
    skeleton, selftest, shipped, *compilers = sys.argv[1:]
    missing = set()
    with tempfile.TemporaryDirectory() as directory:
        for compiler in compilers:
            missing |= open_symbols([skeleton, selftest], shipped, compiler, pathlib.Path(directory)) - OF_THE_KERNEL
    for name in sorted(missing):
        print(f"nobody has a body of {name}")
    return 1 if missing or not compilers else 0


if __name__ == "__main__":
    sys.exit(main())
