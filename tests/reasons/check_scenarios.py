#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds that the layer that tells its reasons does what the one does that ships: all scenarios are run by the tool
with either, and every call, console line, result and store is the same.

usage: check_scenarios.py PMXBOARD PMXBOARD_WITH_THE_TWIN SCENARIO...
"""

import concurrent.futures
import subprocess
import sys


def trace_of(program, scenarios):
    done = subprocess.run([program, "run", "--stores", "--trace-format", "jsonl", *scenarios], capture_output=True,
                          text=True, check=False)
    return done.returncode, done.stdout.splitlines(), done.stderr.splitlines()


def difference(first, second):
    """A complaint about two runs, or nothing."""
    if first[0] != 0:
        return f"the scenarios end with {first[0]}: {first[2]}"
    for number, (a, b) in enumerate(zip(first[1], second[1]), start=1):
        if a != b:
            return f"line {number}:\n  ships:   {a}\n  reasons: {b}"
    if first != second:
        return f"{len(first[1])} lines and {first[2]}, but {len(second[1])} and {second[2]}"
    return None


def main(shipped, twin, *scenarios):
    with concurrent.futures.ThreadPoolExecutor(2) as pool:
        first, second = pool.map(lambda program: trace_of(program, scenarios), (shipped, twin))
    told = second[2].pop() if second[2] else ""
    complaint = difference(first, second)
    if complaint is None and (not told.startswith("reasons: ") or told == "reasons: 0"):
        complaint = f"the twin told no reasons: {told}"
    if complaint is None and len(first[1]) < 2 * len(scenarios):
        complaint = f"{len(first[1])} lines alone"
    print(f"{len(scenarios)} scenarios, {len(first[1])} lines, {told}: {complaint or 'no difference'}")
    return 1 if complaint else 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
