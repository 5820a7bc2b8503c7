#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes a ctest file that registers each suite of a test program as one test: a process for each case takes several
times as long as the cases.

usage: list_suites.py PROGRAM PREFIX DIRECTORY TIMEOUT OUTPUT [--except=PATTERNS] [--always SUITE...]
                      [--environment ENTRY...] --unchanged COMMAND... STAMPS INPUT...

PATTERNS are of cases that are not run, as GoogleTest's filter has them. A suite is run by the command behind
--unchanged (tests/common/unchanged.py, without its stamp's name), but for those that are always run.
"""

import argparse
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


def unchanged(command, name):
    """The words in front of a check that is not run again while its inputs stay the same."""
    script = next(number for number, word in enumerate(command) if word.endswith(".py"))
    stamps, inputs = command[script + 1], command[script + 2:]
    return [*command[:script + 1], f"{stamps}/{name}", *inputs, "--"]


def registration(how, listing):
    lines = []
    for suite in suites(listing):
        name = f"{how.prefix}.{suite}"
        pattern = f"--gtest_filter={suite}.*:*/{suite}.*" + (f"-{how.left_out}" if how.left_out else "")
        words = [] if suite in how.always else unchanged(how.unchanged, name)
        words += [how.program, "--gtest_brief=1", pattern]
        lines += [f"add_test({quoted(name)} {' '.join(map(quoted, words))})",
                  f"set_tests_properties({quoted(name)} PROPERTIES WORKING_DIRECTORY {quoted(how.directory)} TIMEOUT "
                  f"{how.timeout} ENVIRONMENT {quoted(';'.join(how.environment))})"]
    unknown = set(how.always) - suites(listing).keys()
    if unknown:
        raise Unreadable(f"no such suites: {' '.join(sorted(unknown))}")
    return "\n".join(lines) + "\n"


def arguments_of(words):
    """What stands behind --unchanged has options of its own."""
    parser = argparse.ArgumentParser()
    for name in ("program", "prefix", "directory", "timeout", "output"):
        parser.add_argument(name)
    parser.add_argument("--except", dest="left_out", default="")
    parser.add_argument("--always", nargs="*", default=[])
    parser.add_argument("--environment", nargs="*", default=[])
    split = words.index("--unchanged")
    how = parser.parse_args(words[:split])
    how.unchanged = words[split + 1:]
    return how


def main():
    how = arguments_of(sys.argv[1:])
    listed = subprocess.run([how.program, "--gtest_list_tests"], capture_output=True, text=True, check=False)
    if listed.returncode != 0:
        sys.exit(f"{how.program} cannot list its cases: {listed.stderr}")
    try:
        text = registration(how, listed.stdout)
    except Unreadable as error:
        sys.exit(f"{how.program}: {error}")
    pathlib.Path(how.output).write_text(text, encoding="utf-8")


if __name__ == "__main__":
    main()
