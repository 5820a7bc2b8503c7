#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Brings the build directory of another preset up to date, which is quick when it is; says how to make one that is not
there.

usage: check_built.py CMAKE DIRECTORY PRESET [TARGET]
"""

import pathlib
import subprocess
import sys


def main():
    cmake, directory, preset, *target = sys.argv[1:]
    if not pathlib.Path(directory, "build.ninja").exists():
        sys.exit(f"{directory}: is not there: ./dev build {preset} makes it, and ./dev test too")
    command = [cmake, "--build", directory, "-j", "2", *(["--target", *target] if target else [])]
    result = subprocess.run(command, capture_output=True, text=True, check=False)
    if result.returncode != 0:
        sys.exit(f"{directory} cannot be built:\n{result.stdout}{result.stderr}")
    print(f"{directory}: up to date")


if __name__ == "__main__":
    main()
