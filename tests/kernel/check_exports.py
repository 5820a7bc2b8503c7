#!/usr/bin/env python3
"""Compiles the kernel glue as a kernel would, without any header of the host, and names what it exports.

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


def exports(root, compiler, directory):
    glue = directory / "pmx_export.o"
    subprocess.run([compiler, *FLAGS, *(f"-I{root / include}" for include in INCLUDES), "-c",
                    root / "src/driver/pmx/pmx_export.c", "-o", glue], check=True)
    names = subprocess.run(["nm", "--defined-only", "--format=posix", glue], check=True, capture_output=True,
                           text=True).stdout
    return {line.split()[0].removeprefix("exported_") for line in names.splitlines()}


def main():
    root = pathlib.Path(sys.argv[1])
    wrong = 0
    with tempfile.TemporaryDirectory() as directory:
        for compiler in sys.argv[2:]:
            found = exports(root, compiler, pathlib.Path(directory))
            for name in sorted(EXPORTS - found):
                print(f"{compiler}: {name} is not exported")
            for name in sorted(found - EXPORTS):
                print(f"{compiler}: {name} is exported and should not be")
            wrong += found != EXPORTS
    print(f"kernel exports: {len(EXPORTS)} names, {len(sys.argv) - 2} compilers, {wrong} wrong")
    return 1 if wrong or len(sys.argv) < 3 else 0


if __name__ == "__main__":
    sys.exit(main())
