#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the tests of board and tool in a build that counts, and prints which lines and branches of these wings they
reach: the board's devices, the language of scenarios, the recorder, and the reader of logs.

What no test reaches stands in unreached_wings.txt, by the reason why: it fails when something else is missing, and when
something of that list is reached. A reason begins a line and ends with an empty one; below it stands where it holds:

    Why nothing of this is reached.
     FILE line|branch
      NUMBER the line of source

What a NUMBER and a line of source are, counted.py tells.

usage: check_wings.py --build DIRECTORY --profdata PROGRAM --cov PROGRAM --tool PMXBOARD
                      --recorder PRODUCT INTERRUPTED LATE TEST_PROGRAM...
"""

import argparse
import pathlib
import re
import sys

sys.dont_write_bytecode = True

import counted  # noqa: E402

ROOT = pathlib.Path(__file__).resolve().parents[2]
HERE = pathlib.Path(__file__).resolve().parent
KINDS = ("line", "branch")
WINGS = {
    "board": r"board/[^/]+",
    "language": r"tools/pmxboard/language/.+",
    "recorder": r"(recorder|tools/pmxboard/recording)/.+",
    "decode": r"tools/pmxboard/decode/.+",
}
# A build that counts has symbols of its own, at no address and within functions.
ELSEWHERE = "--gtest_filter=-Trace.Objects_AreRecordedByName:ExecutableSymbols.NameAt_TheBeginningOfWhatHasAName"


def wing_of(name):
    return next((wing for wing, pattern in WINGS.items() if re.fullmatch(pattern, name)), None)


def commands(arguments):
    """The tests that run these wings."""
    tool = str(arguments.tool)
    for program in arguments.programs:
        yield [str(program), "--gtest_brief=1", ELSEWHERE]
    for scenario in sorted((ROOT / "scenarios").glob("*.pmx")):
        yield [tool, "run", "--quiet", str(scenario)]
    yield [sys.executable, "tests/recorder/replay_test.py", tool, tool, *map(str, arguments.recorder)]
    yield [sys.executable, "tests/decode/to_scenario.py", tool]


def read_reasons(text):
    """({Missing: number}, complaints) of what no test reaches, each for a reason."""
    named, complaints, reason, place = {}, [], "", ()
    for line in text.splitlines():
        if line.startswith("#"):
            continue
        if not line.startswith(" "):
            reason, place = line, ()
        elif (head := re.fullmatch(rf" (\S+) ({'|'.join(KINDS)})", line)) and reason:
            place = head.groups()
        elif (entry := re.fullmatch(r"  ([1-9]\d*) (.+)", line)) and place:
            one = counted.Missing(*place, entry[2])
            if one in named:
                complaints.append(f"listed twice: {one.kind}: {one}")
            named[one] = int(entry[1])
        else:
            complaints.append(f"neither a reason, nor where it holds: {line.strip()}")
    return named, complaints


def measure(arguments):
    """Runs the tests; the wings' files."""
    counts = arguments.build / "counts"
    failed = counted.run(commands(arguments), counts, ROOT)
    if failed:
        sys.exit(failed)
    tools = counted.Tools(arguments.profdata, arguments.cov)
    product, interrupted, _ = arguments.recorder
    programs = [*arguments.programs, arguments.tool, product]
    files = {}
    # What is compiled otherwise, of the same name, is counted apart.
    for counted_together in (programs, [interrupted]):
        for file in counted.files_of(tools.export(counted_together, counts), ROOT, ("board/", "tools/", "recorder/")):
            if wing_of(file.name):
                files.setdefault(file.name, file).count_also(file)
    files = list(files.values())
    found = {wing_of(file.name) for file in files}
    if missing := set(WINGS) - found:
        sys.exit(f"nothing was counted of {', '.join(sorted(missing))}")
    tools.page(programs, counts, [ROOT / file.name for file in files], arguments.build / "page")
    return files


def main():
    parser = argparse.ArgumentParser(description="Check which lines and branches of board and tool the tests reach.")
    parser.add_argument("--build", required=True, type=pathlib.Path, help="build directory")
    parser.add_argument("--profdata", required=True, help="llvm-profdata of the compiler's version")
    parser.add_argument("--cov", required=True, help="llvm-cov of the compiler's version")
    parser.add_argument("--tool", required=True, type=pathlib.Path, help="pmxboard")
    parser.add_argument("--recorder", required=True, type=pathlib.Path, nargs=3, help="what replay_test.py takes")
    parser.add_argument("programs", nargs="+", type=pathlib.Path)
    arguments = parser.parse_args()

    files = measure(arguments)
    named, complaints = read_reasons((HERE / "unreached_wings.txt").read_text(encoding="utf-8"))
    complaints += counted.judge(counted.all_missing(files), named)
    for wing in WINGS:
        print("\n".join([wing, *counted.table([file for file in files if wing_of(file.name) == wing], KINDS), ""]))
    print("\n".join(complaints))
    print(f"wings: {len(complaints)} complaints, {sum(named.values())} that no test reaches, for a reason each")
    return 1 if complaints else 0


if __name__ == "__main__":
    sys.exit(main())
