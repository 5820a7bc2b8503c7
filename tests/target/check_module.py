#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Links an object for a kernel as a kernel's build links a module: with C files of the stack, compiled as kernels
compile theirs. The linker has nothing to warn of, and nothing stays open but what every kernel offers to modules.

usage: check_module.py OBJECT COMPILER SKELETON
"""

import pathlib
import subprocess
import sys
import tempfile

ROOT = pathlib.Path(__file__).resolve().parents[2]
GLUE = ROOT / "src/driver/pmx/pmx_export.c"
INCLUDES = ("tests/kernel/include", "src/system/inc", "src/driver/inc", "src/driver/private_inc")
# Of a kernel for ARMv7; in which state it is compiled is the object's matter.
FLAGS = ("-D__KERNEL__", "-std=gnu11", "-nostdinc", "-ffreestanding", "-Wall", "-Wextra", "-Werror", "-O2",
         "-mabi=aapcs-linux", "-march=armv7-a", "-marm", "-msoft-float", "-fno-short-enums", "-fshort-wchar",
         "-fno-common", "-fno-pic", "-funwind-tables")
OF_THE_KERNEL = {"memcpy", "memset", "__aeabi_unwind_cpp_pr0", "__aeabi_unwind_cpp_pr1"}


def run(*command):
    return subprocess.run(command, capture_output=True, text=True, check=False)


def link(shipped, compiler, sources, directory):
    """(module, what the linker said); no module when it failed."""
    objects = []
    for source in sources:
        objects.append(directory / f"{pathlib.Path(source).stem}.o")
        made = run(compiler, *FLAGS, *(f"-I{ROOT / include}" for include in INCLUDES), "-c", source, "-o",
                   objects[-1])
        if made.returncode != 0:
            sys.exit(f"{source}: {made.stderr}")
    module = directory / "module.o"
    linked = run(compiler.removesuffix("gcc") + "ld", "-r", "-o", module, *objects, shipped)
    return module if linked.returncode == 0 else None, linked.stderr


def main():
    shipped, compiler, skeleton = sys.argv[1:]
    with tempfile.TemporaryDirectory() as directory:
        module, said = link(shipped, compiler, (skeleton, GLUE), pathlib.Path(directory))
        found = said.splitlines()
        if module:
            names = run("nm", "--undefined-only", "--format=posix", module).stdout.splitlines()
            found += [f"{name} stays open" for name in sorted({line.split()[0] for line in names} - OF_THE_KERNEL)]
    for complaint in found:
        print(f"{shipped}: {complaint}")
    if not found:
        print(f"{shipped}: fits into a kernel's module")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
