#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Installs a build into a directory of its own, holds the bill of materials against what lies there, runs the tool, and
builds and runs the middleware example against it and nothing else.

usage: check_install.py CMAKE BUILD_DIRECTORY VERSION LINKER_FLAGS
"""

import pathlib
import subprocess
import sys
import tempfile

sys.dont_write_bytecode = True

import bill  # noqa: E402

ROOT = pathlib.Path(__file__).resolve().parents[2]


def run(*command, **options):
    result = subprocess.run(command, capture_output=True, text=True, check=False, **options)
    if result.returncode != 0:
        sys.exit(f"{' '.join(map(str, command))}\nexit code {result.returncode}\n{result.stdout}{result.stderr}")


def main():
    cmake, build, version, linker_flags = sys.argv[1:]
    with tempfile.TemporaryDirectory() as directory:
        prefix = pathlib.Path(directory) / "prefix"
        elsewhere = pathlib.Path(directory) / "examples"
        run(cmake, "--install", build, "--prefix", prefix)
        wrong = bill.complaints(prefix, version)
        if wrong:
            sys.exit("\n".join(["the bill of materials:", *wrong]))
        # Under a name that the project itself does not have, so that only the installed boards can serve.
        boards = prefix / "share/pmx/boards"
        (boards / "default").rename(boards / "installed")
        run(prefix / "bin/pmxboard", "run", "--quiet", "--board", "installed",
            prefix / "share/pmx/scenarios/cold-boot.pmx", cwd=directory)

        for part in ("share/man/man1/pmxboard.1", "share/bash-completion/completions/pmxboard",
                     "share/pmx/examples/port_skeleton.c", "include/pmx/pmx_version.h",
                     "share/pmx/schemas/trace.schema.json", "share/doc/pmx/LICENSE"):
            if not (prefix / part).is_file():
                sys.exit(f"{part} is not installed")

        run(cmake, "-G", "Ninja", "-S", prefix / "share/pmx/examples", "-B", elsewhere, f"-DCMAKE_PREFIX_PATH={prefix}",
            f"-DCMAKE_EXE_LINKER_FLAGS={linker_flags}", f"-DCMAKE_C_FLAGS=-Wall -Wextra -Werror {linker_flags}")
        run(cmake, "--build", elsewhere)
        run(sys.executable, ROOT / "tests/examples/check_middleware.py", elsewhere / "middleware",
            boards / "installed")
    return 0


if __name__ == "__main__":
    sys.exit(main())
