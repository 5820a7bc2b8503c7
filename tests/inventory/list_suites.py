#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes a ctest file that registers each suite of a test program as one test: a process for each case takes several
times as long as the cases.

usage: list_suites.py PROGRAM PREFIX DIRECTORY TIMEOUT OUTPUT EXCEPT [ENVIRONMENT...]

EXCEPT are patterns of cases that are not run, as GoogleTest's filter has them; it may be empty.
"""

import collections
import pathlib
import re
import subprocess
import sys


class Unreadable(Exception):
    """The program's list of cases is not one."""


def cases(listing):
    """The names of all cases, in the program's order: "Mute.Off", "All/Modes.Each/0"."""
    found, current, empty = [], "", False
    for line in listing.splitlines():
        if match := re.fullmatch(r"((?:\w+/)?\w+\.)(?:\s*#.*)?", line):
            if empty:
                raise Unreadable(f"no cases: {current}")
            current, empty = match[1], True
        elif (match := re.match(r"  (\S+)", line)) and current:
            found.append(current + match[1])
            empty = False
        elif not line.startswith("Running main()"):
            raise Unreadable(f"not a list of cases: {line}")
    if not found or empty:
        raise Unreadable("no cases")
    return found


def suite_of(case):
    """Instances of a parametrised suite are of that suite: All/Modes.Each/1 is one of Modes."""
    return case.split(".")[0].split("/")[-1]


def suites(listing):
    """{suite: number of its cases}, in the program's order."""
    return collections.Counter(map(suite_of, cases(listing)))


def quoted(text):
    """As CMake reads it."""
    return f"[==[{text}]==]"


def registration(program, prefix, directory, timeout, left_out, environment, listing):
    lines = []
    for suite, cases in suites(listing).items():
        name = quoted(f"{prefix}.{suite}")
        pattern = f"--gtest_filter={suite}.*:*/{suite}.*" + (f"-{left_out}" if left_out else "")
        lines += [f"add_test({name} {quoted(program)} --gtest_brief=1 {quoted(pattern)})",
                  f"set_tests_properties({name} PROPERTIES WORKING_DIRECTORY {quoted(directory)} TIMEOUT {timeout} "
                  f"ENVIRONMENT {quoted(';'.join(environment))})"]
    return "\n".join(lines) + "\n"


def main():
    program, prefix, directory, timeout, output, left_out, *environment = sys.argv[1:]
    listed = subprocess.run([program, "--gtest_list_tests"], capture_output=True, text=True, check=False)
    if listed.returncode != 0:
        sys.exit(f"{program} cannot list its cases: {listed.stderr}")
    try:
        text = registration(program, prefix, directory, timeout, left_out, environment, listed.stdout)
    except Unreadable as error:
        sys.exit(f"{program}: {error}")
    pathlib.Path(output).write_text(text, encoding="utf-8")


if __name__ == "__main__":
    main()
