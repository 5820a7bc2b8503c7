#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds that the layer that tells its reasons does what the one does that ships: every scenario is run by the tool
with either, and every call, console line, result and store is the same.

usage: check_scenarios.py PMXBOARD PMXBOARD_WITH_THE_TWIN SCENARIO...
"""

import concurrent.futures
import os
import subprocess
import sys


def trace_of(program, scenario):
    done = subprocess.run([program, "run", "--stores", "--trace-format", "jsonl", scenario], capture_output=True,
                          text=True, check=False)
    return done.returncode, done.stdout.splitlines(), done.stderr.splitlines()


def difference(shipped, twin, scenario):
    """(a complaint or nothing, how many lines were compared, how many reasons were told)"""
    first, second = trace_of(shipped, scenario), trace_of(twin, scenario)
    told = second[2].pop() if second[2] else ""
    if not told.startswith("reasons: "):
        return f"{scenario}: the twin does not end with its reasons: {second}", 0, 0
    if first[0] != 0 or len(first[1]) < 2:
        return f"{scenario}: ends with {first[0]} after {len(first[1])} lines: {first[2]}", 0, 0
    for a, b in zip(first[1], second[1]):
        if a != b:
            return f"{scenario}:\n  ships:   {a}\n  reasons: {b}", 0, 0
    if first != second:
        return f"{scenario}: {len(first[1])} lines and {first[2]}, but {len(second[1])} and {second[2]}", 0, 0
    return None, len(first[1]), int(told.removeprefix("reasons: "))


def main(shipped, twin, *scenarios):
    with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
        results = list(pool.map(lambda scenario: difference(shipped, twin, scenario), scenarios))
    complaints = [complaint for complaint, _, _ in results if complaint]
    reasons = sum(told for _, _, told in results)
    if reasons == 0:
        complaints.append("no scenario made the layer tell a reason")
    for complaint in complaints:
        print(complaint)
    compared = sum(lines for _, lines, _ in results)
    print(f"{len(scenarios)} scenarios, {compared} lines, {reasons} reasons: {len(complaints)} differ")
    return 1 if complaints or not scenarios else 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
