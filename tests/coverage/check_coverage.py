#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs test programs over a compile of the layer that counts, and prints which of its lines and branches they run.
A report to look at, line by line, is left in the build directory: coverage/index.html.

It fails when a line was not run, when a branch was not taken and is not in the list of those that cannot be, and when
the list allows for more than is needed. An entry of the list is three lines or more, entries are set apart by blank
lines; a line's text stands for the line, so that entries stay right when code moves:

    FILE FUNCTION NUMBER_OF_BRANCHES
        the line of source
    why these branches are never taken

usage: check_coverage.py --build DIRECTORY --counts DIRECTORY [--list FILE] PROGRAM...
"""

import argparse
import collections
import json
import pathlib
import subprocess
import sys

sys.dont_write_bytecode = True

import counted  # noqa: E402

ROOT = pathlib.Path(__file__).resolve().parents[2]
LAYER = "src/driver/pmx/"
SHARDS = 2  # so many processes run the tests of a program
# Suites that go through very many values, and run no line or branch that the others do not.
SWEEPS = ("--gtest_filter=-Sweep.*:MasterColourSpaceSweep.*:*/ArbOrderPermutations.*:HandshakeStates.*:"
          "HandshakeInjection.*")


class Branch(collections.namedtuple("Branch", "file function text")):
    """Where branches are: the text of their line in a function of a file."""

    def __str__(self):
        return f"{self.file}: {self.function}: {self.text}"


def read_list(text):
    """({Branch: number}, complaints) of the list of branches that are never taken."""
    return counted.read_list(text, Branch, "FUNCTION", r"\S+")


class File:
    """What gcovr reports of one file."""

    def __init__(self, report, source):
        self.name = pathlib.PurePath(report["file"]).name
        self.lines = [line for line in report["lines"] if not line.get("gcovr/noncode")]
        self.functions = sorted((function["lineno"], function["name"]) for function in report["functions"])
        self.source = source.splitlines()

    def text(self, number):
        return self.source[number - 1].strip()

    def function(self, number):
        return ([name for first, name in self.functions if first <= number] or ["-"])[-1]

    def lines_run(self):
        return sum(line["count"] > 0 for line in self.lines)

    def branches(self):
        return [branch for line in self.lines for branch in line["branches"]]

    def branches_taken(self):
        return sum(branch["count"] > 0 for branch in self.branches())

    def lines_not_run(self):
        return [f"{LAYER}{self.name}:{line['line_number']}: never run: {self.text(line['line_number'])}"
                for line in self.lines if line["count"] == 0]

    def branches_not_taken(self):
        missing = collections.Counter()
        for line in self.lines:
            number = line["line_number"]
            missing[Branch(self.name, self.function(number), self.text(number))] += sum(
                branch["count"] == 0 for branch in line["branches"])
        return +missing


def plain_name(name):
    """A function's name as a grep finds it, without the parameters that C++ gives it."""
    return name.partition("(")[0]


def judge(files, allowed):
    """What is wrong."""
    complaints = [complaint for file in files for complaint in file.lines_not_run()]
    missing = sum((file.branches_not_taken() for file in files), collections.Counter())
    for branch in [*missing, *(branch for branch in allowed if branch not in missing)]:
        never, known = missing[branch], allowed.get(branch, 0)
        if never > known:
            complaints.append(f"{branch}\n    {never} branches never taken, {known} in the list")
        elif never < known:
            complaints.append(f"{branch}\n    the list allows for {known} branches never taken, there are {never}")
    return complaints


def table(files):
    rows = [(file.name, file.lines_run(), len(file.lines), file.branches_taken(), len(file.branches()))
            for file in files]
    rows.append(("all", *(sum(column) for column in list(zip(*rows))[1:])))
    yield f"{'':26}{'lines':>14}{'branches':>17}"
    for name, lines, of_lines, branches, of_branches in rows:
        yield (f"{name:26}{lines:5} of {of_lines:4}{percent(lines, of_lines):>5}"
               f"{branches:5} of {of_branches:4}{percent(branches, of_branches):>5}")


def percent(number, of_all):
    """Never rounded up to a hundred."""
    return f"{100 * number // of_all}%" if of_all else ""


def run(programs, counts):
    """Run the tests anew; what they print, if they fail."""
    for old in counts.rglob("*.gcda"):
        old.unlink()
    environment = [{"GTEST_TOTAL_SHARDS": str(SHARDS), "GTEST_SHARD_INDEX": str(index)} for index in range(SHARDS)]
    for program in programs:
        command = [program, "--gtest_brief=1", SWEEPS]
        running = [subprocess.Popen(["env", *(f"{name}={value}" for name, value in shard.items()), *command], cwd=ROOT,
                                    stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True)
                   for shard in environment]
        texts = [process.communicate()[0] for process in running]
        for process, text in zip(running, texts):
            if process.returncode != 0:
                return f"{program}: tests fail\n{text}"
    return ""


def measure(build, counts):
    report = build / "coverage"
    report.mkdir(exist_ok=True)
    subprocess.run(["gcovr", "--root", ROOT, "--filter", LAYER, "--json", report / "coverage.json",
                    "--html-details", report / "index.html", counts], cwd=ROOT, check=True)
    files = json.loads((report / "coverage.json").read_text(encoding="utf-8"))["files"]
    for file in files:
        for function in file["functions"]:
            function["name"] = plain_name(function["name"])
    return [File(file, (ROOT / file["file"]).read_text(encoding="utf-8"))
            for file in sorted(files, key=lambda file: file["file"])]


def main():
    parser = argparse.ArgumentParser(description="Check which lines and branches of the layer the tests run.")
    parser.add_argument("--build", required=True, type=pathlib.Path, help="build directory")
    parser.add_argument("--counts", required=True, type=pathlib.Path, help="where the compile leaves its counts")
    parser.add_argument("--list", type=pathlib.Path, default=ROOT / "tests/coverage/uncovered_branches.txt")
    parser.add_argument("programs", nargs="+", type=pathlib.Path)
    arguments = parser.parse_args()

    failed = run(arguments.programs, arguments.counts)
    if failed:
        sys.exit(failed)
    files = measure(arguments.build, arguments.counts)
    if not files:
        sys.exit("no file of the layer was measured")
    allowed, complaints = read_list(arguments.list.read_text(encoding="utf-8"))
    complaints += judge(files, allowed)

    print("\n".join([*table(files), "", *complaints]))
    print(f"coverage: {len(complaints)} complaints, {sum(allowed.values())} branches that cannot be taken")
    return 1 if complaints else 0


if __name__ == "__main__":
    sys.exit(main())
