#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""A log at level 9 becomes a scenario that prints the same log: for each scenario that there is, byte for byte. What is
left of a log becomes one that can be run.

usage: to_scenario.py PMXBOARD [DIRECTORY]    DIRECTORY keeps what is made
"""

import json
import pathlib
import subprocess
import sys
import tempfile

# What a log does not hold, and its scenario does. One that prints the same all the same is told, too.
WITHOUT = {
    "picture-controls": "the capability word, which refuses",
    "plane-connects-back": "that the video plane's driver connects from inside the call that tells it a colour space",
    "second-source-while-announcing": "that a second source connects, and inside which call of the platform",
    "timer-runs-out-during-change": "inside which call of the platform the timer runs out",
}


# What is left of a log, and a line of what is made of it.
PIECES = {
    "[PMX] create a timer \n": "PMX_Init",
    "PMX_ID(0), Aspect Ratio(2)\n": "fault fgPmxDrvSetAvd FALSE",
    "PMX_Init\nQuery VDP Interface Fail!\n": "fault i4ImQueryInterface -1 on 1",
    "PMX_Init\n" + 2 * "Inform Vdp CS(0)\nQuery VDP Interface Fail!\n": "fault i4ImQueryInterface -1 from 1",
    "PMX_Init\nSetMode, RES_576I\n": "PMX_SetMode 0 RES_576I 50 0",
    "PMX_Init\nSetMode, RES_480P\n": "PMX_SetMode 0 RES_480P 60 0",
}


def printed(pmxboard, scenario):
    """What the layer prints in it, whatever the console's level is."""
    run = subprocess.run([pmxboard, "run", "--trace-format", "jsonl", scenario], capture_output=True, check=False)
    entries = []
    boot = 0
    for line in run.stdout.splitlines():
        if not line.startswith(b'{"sequence":'):
            continue
        entry = json.loads(line)
        boot += entry["sequence"] == 1
        entries.append((boot, entry["sequence"], entry))
    made = []
    for _, _, entry in sorted(entries, key=lambda one: one[:2]):
        if entry["kind"] == "log":
            made.append(entry["text"].encode())
        elif entry["kind"] == "assert":
            arguments = entry["arguments"]
            made.append(f"ASSERT {arguments['szExpression']}, {arguments['szFile']}:{arguments['i4Line']}\n".encode())
    return made, run.stderr.decode(errors="replace")


def first_difference(one, other):
    for number, (left, right) in enumerate(zip(one, other), 1):
        if left != right:
            return f"line {number}: {left!r} became {right!r}"
    return None if len(one) == len(other) else f"{len(one)} lines became {len(other)}"


def difference(pmxboard, scenario, directory):
    """How what the made scenario prints differs from the log; nothing when it does not."""
    log, _ = printed(pmxboard, scenario)
    made = directory / scenario.name
    written = subprocess.run([pmxboard, "decode", "--to-scenario", "-"], input=b"".join(log), capture_output=True,
                             check=False)
    if written.returncode != 0:
        return written.stderr.decode()
    made.write_bytes(written.stdout)
    again, said = printed(pmxboard, made)
    return first_difference(log, again) and f"{first_difference(log, again)} {said}".strip()


def wrong_pieces(pmxboard):
    """What is made of pieces, where it is no scenario, or another one."""
    for piece, line in PIECES.items():
        made = subprocess.run([pmxboard, "decode", "--to-scenario", "-"], input=piece, capture_output=True, text=True,
                              check=False)
        ended = subprocess.run([pmxboard, "run", "-q", "-"], input=made.stdout, capture_output=True, text=True,
                               check=False)
        if line not in made.stdout.splitlines() or ended.returncode != 0:
            yield f"{piece!r} became {made.stdout!r}, which ends with {ended.returncode}: {made.stderr}{ended.stderr}"


def main():
    pmxboard = pathlib.Path(sys.argv[1]).resolve()
    scenarios = sorted(pathlib.Path("scenarios").glob("*.pmx"))
    said = []
    with tempfile.TemporaryDirectory() as name:
        directory = pathlib.Path(sys.argv[2] if len(sys.argv) > 2 else name)
        for scenario in scenarios:
            differs = difference(pmxboard, scenario, directory)
            if differs and scenario.stem not in WITHOUT:
                said.append(f"{scenario.stem}: {differs}")
            elif not differs and scenario.stem in WITHOUT:
                said.append(f"{scenario.stem} prints the same, although its log is without: {WITHOUT[scenario.stem]}")
    said += wrong_pieces(pmxboard)
    said += [f"{name} is no scenario" for name in WITHOUT if not (pathlib.Path("scenarios") / f"{name}.pmx").exists()]
    print(*said, sep="\n")
    print(f"{len(scenarios) - len(WITHOUT)} of {len(scenarios)} scenarios are to be found again in their logs")
    return 1 if said else 0


if __name__ == "__main__":
    sys.exit(main())
