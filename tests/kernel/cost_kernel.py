#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Measures in Debian's ARM kernel, in virtual time, how many instructions mode changes take: in the layer itself, with
a console, and, for comparison, in the kernel's own display driver for an emulated card. What is measured twice has to
be the same. Puts the figures on the cost card. Prints KTAP; ends with 1 when that cannot be done, or a goal is missed
for no reason that is told, and with 77 when the kernel is not to be had.

usage: cost_kernel.py CACHE MADE PMXBOARD OBJECT
"""

import math
import re
import sys

sys.dont_write_bytecode = True

import debian  # noqa: E402
import run  # noqa: E402

sys.path.insert(0, str(run.ROOT / "tools/cost"))

import cost  # noqa: E402
import goals as goal_list  # noqa: E402

GUEST = run.HERE / "cost.sh"
# What a boot tells: module or driver, path.
FIGURES = {"mode": "pmx_empty mode", "frequency": "pmx_empty frequency", "again": "pmx_empty again",
           "again, printed": "pmx_printed again", "again, put aside": "pmx_aside again", "bochs": "bochs mode"}
ROUNDS = 2
MANY = 1000  # mode changes, over which the clock's steps do not count


def instructions(took, changes):
    """Of a mode change, to the digit where there were many of them, two paths by turns; else to the tens."""
    return math.ceil(round(2 * took / changes) / 2) if changes >= MANY else round(took / changes, -1)


def rounds(console):
    """A list of what each round has told, in instructions a mode change."""
    found = []
    for line in console:
        if line.startswith("ROUND "):
            found.append({})
        match = re.fullmatch(r"COST (\S+ \S+) (\d+) (\d+)", line)
        if match and found:
            found[-1][match[1]] = int(instructions(int(match[2]), int(match[3])))
    return [{name: told[key] for name, key in FIGURES.items() if key in told} for told in found]


def complaints(told):
    """What keeps the rounds from being figures."""
    if len(told) != ROUNDS:
        return [f"{len(told)} rounds of {ROUNDS}"]
    missing = [f"round {number}: {name} was not measured" for number, one in enumerate(told, start=1)
               for name in FIGURES if name not in one]
    return missing or [f"{name}: {told[0][name]}, and then {told[1][name]}" for name in FIGURES
                       if told[0][name] != told[1][name]]


def boot(kernel, made):
    modules = run.module(kernel, made / "cost", sources=run.HERE / "cost")
    run.image(kernel, modules, {}, made, GUEST, kernel.machine.peers)
    run.run(f"{kernel.machine.cross}gcc", "-O2", "-static", "-s", "-Wall", "-Wextra", "-Werror", "-o",
            made / "root/set_crtc", run.HERE / "cost/set_crtc.c")
    return run.boot(kernel, run.packed(made / "root", made), made / "cost.log", *run.VIRTUAL_TIME,
                    "-device", "bochs-display,romfile=")


def measure(ktap, cache, made, _program, _shipped):
    kernel = debian.kernel(cache)
    console = boot(kernel, made)
    told, wrong = rounds(console), run.parsed(console)[1]
    ktap.verdict(f"{ROUNDS} rounds tell the same", wrong + complaints(told))
    if ktap.failures:
        return
    figures = {"kernel": kernel.release, **told[0]}
    for goal in goal_list.of_kernel(goal_list.load(cost.TOOL / "goals.toml"), {"in_kernel": figures}):
        print(f"# {goal.text}: {goal.found} instructions, goal {goal.limit}")
    for name in ("again, printed", "again, put aside", "bochs"):
        print(f"# {name}: {figures[name]} instructions")
    ktap.verdict("goals, and explanations of those that are missed", cost.take(figures))


if __name__ == "__main__":
    sys.exit(run.carried_out(measure, sys.argv[1:]))
