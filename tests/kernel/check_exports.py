#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Compiles the kernel glue as a kernel would, without any header of the host, and names what it exports; the licence
must be one that gives the module the kernel's own exports.

usage: check_exports.py SOURCE_DIRECTORY COMPILER...
"""

import pathlib
import subprocess
import sys
import tempfile

EXPORTS = {"PMX_GetMode", "fgPMX_DisplayModeReady", "i4Pmx_Connect", "i4Pmx_Disconnect", "PMX_OsdEnabled",
           "PMX_OsdDisabled"}
FLAGS = ["-D__KERNEL__", "-std=gnu11", "-nostdinc", "-ffreestanding", "-fno-short-enums", "-Wall", "-Wextra", "-Werror"]
INCLUDES = ["tests/kernel/include", "src/system/inc", "src/driver/inc", "src/driver/private_inc"]


LICENCE = b"license=Dual MIT/GPL\0"


def compiled(root, compiler, directory):
    """(names that are exported, what the module's loader reads)"""
    glue = directory / "pmx_export.o"
    subprocess.run([compiler, *FLAGS, *(f"-I{root / include}" for include in INCLUDES), "-c",
                    root / "src/driver/pmx/pmx_export.c", "-o", glue], check=True)
    names = subprocess.run(["nm", "--defined-only", "--format=posix", glue], check=True, capture_output=True,
                           text=True).stdout
    information = directory / "modinfo"
    subprocess.run(["objcopy", "-O", "binary", "--only-section=.modinfo", glue, information], check=True)
    exported = {line.split()[0].removeprefix("exported_") for line in names.splitlines()} - {"module_license"}
    return exported, information.read_bytes()


def main():
    root = pathlib.Path(sys.argv[1])
    wrong = 0
    with tempfile.TemporaryDirectory() as directory:
        for compiler in sys.argv[2:]:
            found, information = compiled(root, compiler, pathlib.Path(directory))
            if information != LICENCE:
                print(f"{compiler}: the loader reads {information}, and not {LICENCE}")
            for name in sorted(EXPORTS - found):
                print(f"{compiler}: {name} is not exported")
            for name in sorted(found - EXPORTS):
                print(f"{compiler}: {name} is exported and should not be")
            wrong += found != EXPORTS or information != LICENCE
    print(f"kernel exports: {len(EXPORTS)} names, {len(sys.argv) - 2} compilers, {wrong} wrong")
    return 1 if wrong or len(sys.argv) < 3 else 0


if __name__ == "__main__":
    sys.exit(main())
