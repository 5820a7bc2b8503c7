#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the tests of board and tool in a build that counts, and prints which lines and branches of these wings they
reach: the board's devices, the language of scenarios, the recorder, and the reader of logs.

What cannot be reached stands in unreached.txt, each with its reason. What is not reached yet stands in
unreached_yet.txt, which a program writes: it fails when something else is missing, or when something of it was reached.
--renew writes it anew, but not when a wing reaches less than before.

usage: check_wings.py --build DIRECTORY --profdata PROGRAM --cov PROGRAM --tool PMXBOARD
                      --recorder PRODUCT INTERRUPTED LATE [--renew] TEST_PROGRAM...
"""

import argparse
import collections
import pathlib
import re
import sys

sys.dont_write_bytecode = True

sys.path.append(str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

import counted  # noqa: E402
import whole_file  # noqa: E402

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
HEAD = """# SPDX-License-Identifier: MIT OR GPL-2.0-only
# What no test of board and tool reaches yet, and could: check_wings.py --renew writes this list. Behind its number each
# has the text of its line; lines that follow one another are one, which has the first one's.
"""
RENEW = "cmake --build --preset coverage --target renew_coverage"


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


def read_yet(text):
    """{Missing: number} of what is not reached yet."""
    known, file, kind = {}, "", ""
    for line in text.splitlines():
        if match := re.fullmatch(r"(\d+) (.*)", line):
            known[counted.Missing(file, kind, match[2])] = int(match[1])
        elif line and not line.startswith("#"):
            file, kind = line.split()
    return known


def written(missing):
    """The list, as read_yet reads it."""
    entries = collections.defaultdict(list)
    for one, number in missing.items():
        entries[f"{one.file} {one.kind}"].append(f"{number} {one.text}\n")
    return HEAD + "".join(f"\n{head}\n{''.join(lines)}" for head, lines in sorted(entries.items()))


def sums(missing):
    """Counter of (wing, kind)."""
    found = collections.Counter()
    for one, number in missing.items():
        found[wing_of(one.file), one.kind] += number
    return found


def worse(missing, known):
    """Wings that reach less than the list says."""
    before = sums(known)
    for (wing, kind), number in sorted(sums(missing).items()):
        if number > before[wing, kind]:
            yield f"{wing}: {number} {counted.NEVER[kind]}, {before[wing, kind]} before: write their tests"


def without(missing, named):
    """What is missing and has no reason."""
    return {one: number - named.get(one, 0) for one, number in missing.items() if number > named.get(one, 0)}


def stale(missing, named):
    for one, number in named.items():
        if number > missing.get(one, 0):
            yield (f"{one}\n    {number} {counted.NEVER[one.kind]} in the list of what cannot be, "
                   f"{missing.get(one, 0)} seen")


def compare(missing, named, yet):
    """What is wrong; a line for each."""
    yield from stale(missing, named)
    rest = without(missing, named)
    different = list(counted.judge(rest, yet))
    yield from different
    if different and not list(worse(rest, yet)):
        yield f"no wing reaches less than before; that the list says what is so now: {RENEW}"


def renew(missing, named, file):
    rest = without(missing, named)
    complaints = list(worse(rest, read_yet(file.read_text(encoding="utf-8")))) if file.exists() else []
    if not complaints:
        whole_file.write(file, written(rest))
    return complaints


def measure(arguments):
    """Runs the tests; the wings' files."""
    counts = arguments.build / "counts"
    failed = counted.run(commands(arguments), counts, ROOT)
    if failed:
        sys.exit(failed)
    tools = counted.Tools(arguments.profdata, arguments.cov)
    product, interrupted, _ = arguments.recorder
    programs = [*arguments.programs, arguments.tool, product, interrupted]
    files = [file for file in counted.files_of(tools.export(programs, counts), ROOT, ("board/", "tools/", "recorder/"))
             if wing_of(file.name)]
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
    parser.add_argument("--renew", action="store_true", help="write unreached_yet.txt anew")
    parser.add_argument("programs", nargs="+", type=pathlib.Path)
    arguments = parser.parse_args()

    files = measure(arguments)
    missing = counted.all_missing(files)
    named, complaints = counted.read_list((HERE / "unreached.txt").read_text(encoding="utf-8"))
    named = {one: number for one, number in named.items() if wing_of(one.file)}
    for wing in WINGS:
        print("\n".join([wing, *counted.table([file for file in files if wing_of(file.name) == wing], KINDS), ""]))

    list_of_rest = HERE / "unreached_yet.txt"
    if arguments.renew:
        complaints += renew(missing, named, list_of_rest)
    else:
        complaints += compare(missing, named, read_yet(list_of_rest.read_text(encoding="utf-8")))
    rest = sums(without(missing, named))
    print("\n".join(complaints))
    print(f"wings: {len(complaints)} complaints, {sum(named.values())} that cannot come about, not reached yet: "
          f"{sum(number for (_, kind), number in rest.items() if kind == 'line')} lines, "
          f"{sum(number for (_, kind), number in rest.items() if kind == 'branch')} branches")
    return 1 if complaints else 0


if __name__ == "__main__":
    sys.exit(main())
