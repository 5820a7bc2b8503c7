#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes a ctest file that registers each suite of a test program as one test: a process for each case takes several
times as long as the cases.

usage: list_suites.py PROGRAM PREFIX DIRECTORY TIMEOUT OUTPUT EXCEPT [ENVIRONMENT...]

EXCEPT are patterns of cases that are not run, as GoogleTest's filter has them; it may be empty.
"""

import pathlib
import re
import subprocess
import sys


class Unreadable(Exception):
    """The program's list of cases is not one."""


def suites(listing):
    """{suite: number of its cases}, in the program's order; instances of a parametrised suite count as that suite."""
    found, current = {}, None
    for line in listing.splitlines():
        if match := re.fullmatch(r"(?:\w+/)?(\w+)\.(?:\s*#.*)?", line):
            current = match[1]
            found.setdefault(current, 0)
        elif re.match(r"  \S", line) and current:
            found[current] += 1
        elif not line.startswith("Running main()"):
            raise Unreadable(f"not a list of cases: {line}")
    if not found or not all(found.values()):
        raise Unreadable("no cases")
    return found


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
