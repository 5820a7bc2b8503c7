#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the tests that there are against the number that there must be: none vanishes unnoticed.

usage: inventory.py [--renew] LIST BUILD PROGRAM...

LIST names each test program of BUILD with the number of its cases, and `ctest` with the number of its tests.
"""

import pathlib
import re
import subprocess
import sys

sys.path[:0] = [str(pathlib.Path(__file__).parent), str(pathlib.Path(__file__).resolve().parents[2] / "cmake")]

from list_suites import Unreadable, suites  # noqa: E402
import whole_file  # noqa: E402

HEADING = """# How many tests there are, program by program, and how many of ctest's: a test that vanishes is noticed.
# tests/inventory/inventory.py --renew writes this list.
"""


def output_of(*command):
    result = subprocess.run(command, capture_output=True, text=True, check=False)
    if result.returncode != 0:
        sys.exit(f"{' '.join(map(str, command))}: {result.stderr.strip()}")
    return result.stdout


def counted(build, programs):
    found = {}
    for program in map(pathlib.Path, programs):
        try:
            found[program.name] = sum(suites(output_of(program, "--gtest_list_tests")).values())
        except Unreadable as error:
            sys.exit(f"{program}: {error}")
    total = re.search(r"^Total Tests: (\d+)$", output_of("ctest", "--test-dir", build, "-N"), re.M)
    found["ctest"] = int(total[1]) if total else 0
    return found


def read(text):
    """{name: number}. Throws ValueError with the line that is none."""
    numbers = {}
    for number, line in enumerate(text.splitlines(), start=1):
        if line.startswith("#") or not line.strip():
            continue
        match = re.fullmatch(r"(\w+) (\d+)", line)
        if not match or match[1] in numbers:
            raise ValueError(f"line {number}: a line is a name and a number, each name once: {line}")
        numbers[match[1]] = int(match[2])
    return numbers


def complaints(expected, found):
    for name in sorted(expected.keys() | found.keys()):
        if name not in found:
            yield f"{name}: {expected[name]} tests are gone, there is no such program"
        elif name not in expected:
            yield f"{name}: {found[name]} tests, not in the list"
        elif expected[name] != found[name]:
            yield f"{name}: {found[name]} tests, and there must be {expected[name]}"


def main():
    arguments = sys.argv[1:]
    renew = arguments[:1] == ["--renew"]
    path, build, *programs = arguments[1:] if renew else arguments
    path = pathlib.Path(path)
    found = counted(build, programs)
    if renew:
        whole_file.write(path, HEADING + "".join(f"{name} {number}\n" for name, number in found.items()))
        return 0
    try:
        expected = read(path.read_text(encoding="utf-8"))
    except (OSError, ValueError) as error:
        sys.exit(f"{path}: {error}")
    complained = list(complaints(expected, found))
    for complaint in complained:
        print(f"{path}: {complaint}")
    if not complained:
        print(", ".join(f"{name} {number}" for name, number in found.items()))
    return 1 if complained else 0


if __name__ == "__main__":
    sys.exit(main())
