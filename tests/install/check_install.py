#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Installs a build into a directory of its own, holds the bill of materials against what lies there, runs the tool, and
looks whether anything tells where it was made.

usage: check_install.py CMAKE BUILD_DIRECTORY VERSION BUILD_TYPE

A build for debugging tells that in board and tool, so that a debugger finds the sources.
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


def places_told(prefix, places, is_for_others):
    """The installed files that name a folder of the build."""
    for file in sorted(prefix.rglob("*")):
        name = file.relative_to(prefix)
        if not file.is_file() or (not is_for_others and (name.suffix == ".a" or name.parts[0] == "bin")):
            continue
        content = file.read_bytes()
        for place in places:
            if str(place).encode() in content:
                yield f"{name}: {place}"


def main():
    cmake, build, version, build_type = sys.argv[1:]
    is_for_others = build_type != "Debug"
    with tempfile.TemporaryDirectory() as directory:
        prefix = pathlib.Path(directory) / "prefix"
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
                     "share/pmx/schemas/trace.schema.json", "share/pmx/schemas/recording.schema.json",
                     "lib/pmx/pmx_if_recorded.o", "include/pmx/pmx_recorder.h", "share/pmx/recorder/shim.c",
                     "share/doc/pmx/LICENSE"):
            if not (prefix / part).is_file():
                sys.exit(f"{part} is not installed")

        told = list(places_told(prefix, (ROOT, pathlib.Path(build).resolve()), is_for_others))
        if told:
            sys.exit("\n".join(["where it was made is told by", *told]))
    return 0


if __name__ == "__main__":
    sys.exit(main())
