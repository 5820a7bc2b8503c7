#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds what ctest leaves out of the tests of the layer against a list: a filter that takes more than it means is
noticed, and so is a suite that runs nowhere with one compile of the layer.

usage: left_out.py LIST BUILD TARGET PROGRAM...

LIST has a line for each suite that a place does not run whole. A place is a test program: those of BUILD by their
names, those of TARGET, the build for the target, with "target:" in front. Each PROGRAM is one of BUILD that holds tests
of the layer; what a program of that name on the target holds are the same cases.
"""

import collections
import json
import pathlib
import re
import subprocess
import sys

from list_suites import Unreadable, cases, suite_of

LINE = re.compile(r"((?:target:)?\w+) (\w+) (\d+|all)(?: (.+))?")


def pattern(written):
    """A filter's pattern as a regular expression."""
    return re.compile("".join({"*": ".*", "?": "."}.get(letter, re.escape(letter)) for letter in written))


def runs(wanted, case):
    """Whether a filter, as GoogleTest reads it, has a case run."""
    chosen, _, left_out = wanted.partition("-")
    return (any(pattern(one).fullmatch(case) for one in (chosen or "*").split(":"))
            and not any(pattern(one).fullmatch(case) for one in left_out.split(":")))


def program_of(place):
    return place.removeprefix("target:")


class Place:
    """How ctest runs one program: filters, and which parts of how many run with each."""

    def __init__(self):
        self.parts = collections.defaultdict(set)

    def add(self, test):
        wanted = [word.partition("=")[2] for word in test["command"] if word.startswith("--gtest_filter=")]
        properties = {one["name"]: one["value"] for one in test.get("properties", [])}
        environment = dict(entry.partition("=")[::2] for entry in properties.get("ENVIRONMENT", []))
        if not properties.get("DISABLED", False):
            total = int(environment.get("GTEST_TOTAL_SHARDS", 1))
            self.parts[wanted[0] if wanted else "*", total].add(int(environment.get("GTEST_SHARD_INDEX", 0)))

    def incomplete(self):
        """Filters of which some part does not run."""
        return [wanted for (wanted, total), parts in self.parts.items() if parts != set(range(total))]

    def runs(self, case):
        return any(runs(wanted, case) for wanted, _ in self.parts)


def places(tests, build, target, programs):
    """{place: Place} of what ctest has."""
    found = collections.defaultdict(Place)
    for test in tests:
        command = test.get("command", [])
        # What is not run again while its inputs stay the same stands behind them.
        words = list(map(pathlib.Path, command[command.index("--") + 1:] if "--" in command else command))
        # Checks that are handed a program run it as they like; on the target an emulator stands in front.
        for path in words[:1]:
            if path.name in programs and path.is_relative_to(build):
                found[path.name].add(test)
        for path in words[1:]:
            if path.name in programs and path.is_relative_to(target):
                found[f"target:{path.name}"].add(test)
    return found


def left_out(found, known):
    """{(place, suite): number of cases that are left out}."""
    missing = collections.Counter()
    for place, how in found.items():
        for case in known[program_of(place)]:
            missing[place, suite_of(case)] += not how.runs(case)
    return {key: number for key, number in missing.items() if number}


def nowhere(found, known):
    """(program, suite) of the suites of which no case runs, on the host or on the target."""
    for program, all_of_it in sorted(known.items()):
        hows = [how for place, how in found.items() if program_of(place) == program]
        seen = {suite_of(case) for case in all_of_it if any(how.runs(case) for how in hows)}
        for suite in sorted({suite_of(case) for case in all_of_it} - seen):
            yield program, suite


def read(text, known):
    """{(place, suite): number}. Throws ValueError with the line that is none."""
    expected = {}
    for number, line in enumerate(text.splitlines(), start=1):
        if line.startswith("#") or not line.strip():
            continue
        match = LINE.fullmatch(line)
        if not match or (match[1], match[2]) in expected:
            raise ValueError(f"line {number}: a line is a place, a suite, how many cases or all, and why: {line}")
        held = sum(suite_of(case) == match[2] for case in known.get(program_of(match[1]), []))
        if not held:
            raise ValueError(f"line {number}: there is no such place or suite: {line}")
        expected[match[1], match[2]] = held if match[3] == "all" else int(match[3])
    return expected


def complaints(expected, found, known):
    missing = left_out(found, known)
    for place, how in sorted(found.items()):
        for wanted in how.incomplete():
            yield f"{place}: not every part of {wanted} runs"
    for program in sorted(known):
        if program not in found:
            yield f"{program}: ctest does not run it"
    for place, suite in sorted(expected.keys() | missing.keys()):
        told, is_so = expected.get((place, suite), 0), missing.get((place, suite), 0)
        if told != is_so:
            yield f"{place}: {is_so} cases of {suite} are left out, and {told} is what the list says"
    for program, suite in nowhere(found, known):
        yield f"{program}: nothing of {suite} runs anywhere"


def output_of(*command):
    result = subprocess.run(command, capture_output=True, text=True, check=False)
    if result.returncode != 0:
        sys.exit(f"{' '.join(map(str, command))}: {result.stderr.strip()}")
    return result.stdout


def main():
    path, build, target, *programs = map(pathlib.Path, sys.argv[1:])
    try:
        known = {program.name: cases(output_of(program, "--gtest_list_tests")) for program in programs}
        expected = read(path.read_text(encoding="utf-8"), known)
    except (OSError, ValueError, Unreadable) as error:
        sys.exit(f"{path}: {error}")
    tests = json.loads(output_of("ctest", "--test-dir", build, "--show-only=json-v1"))["tests"]
    found = places(tests, build, target, known)
    complained = list(complaints(expected, found, known))
    for complaint in complained:
        print(f"{path}: {complaint}")
    if not complained:
        for place, how in sorted(found.items()):
            all_of_it = known[program_of(place)]
            print(f"{place}: {sum(map(how.runs, all_of_it))} of {len(all_of_it)} cases")
    return 1 if complained else 0


if __name__ == "__main__":
    sys.exit(main())
