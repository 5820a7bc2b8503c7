#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Time for a command is the same at the end of a long run as at its beginning, and memory does not grow: instructions
of 20,000 and of 40,000 commands, memory of 2,000 and of 200,000.

usage: check_long_runs.py PMXBOARD
"""

import pathlib
import subprocess
import sys
import tempfile

sys.dont_write_bytecode = True
sys.path.append(str(pathlib.Path(__file__).resolve().parents[1] / "common"))

import instructions as counted  # noqa: E402

MOST_INSTRUCTIONS = 2.1  # of twice the commands, in those of the commands
MOST_MEMORY = 8 * 1024   # of a hundred times the commands, in KiB more than of the commands


def scenario(directory, commands):
    """So many commands, each with two platform calls and a log line."""
    path = directory / f"{commands}.pmx"
    lines = ["PMX_Init", *(f"PMX_SetBrightness 0 {number % 256} 1" for number in range(commands))]
    path.write_text("\n".join(lines) + "\n", encoding="utf-8")
    return path


def run(*command):
    result = subprocess.run(command, capture_output=True, text=True, check=False)
    if result.returncode != 0:
        sys.exit(f"{' '.join(map(str, command))}: {result.stderr}")
    return result.stderr


def instructions(pmxboard, directory, commands):
    return counted.of(pmxboard, "run", "--quiet", scenario(directory, commands))


def memory(pmxboard, directory, commands):
    """The most that the process held, in KiB."""
    starter = ("import resource, subprocess, sys; subprocess.run(sys.argv[1:], check=True); "
               "print(resource.getrusage(resource.RUSAGE_CHILDREN).ru_maxrss, file=sys.stderr)")
    return int(run(sys.executable, "-c", starter, pmxboard, "run", "--quiet", scenario(directory, commands)))


def main():
    pmxboard = pathlib.Path(sys.argv[1])
    with tempfile.TemporaryDirectory() as name:
        directory = pathlib.Path(name)
        few, many = (instructions(pmxboard, directory, commands) for commands in (20_000, 40_000))
        small, large = (memory(pmxboard, directory, commands) for commands in (2_000, 200_000))
    print(f"{few:,} instructions for 20,000 commands, {many / few:.2f} times as many for 40,000; "
          f"{small:,} KiB for 2,000 commands, {large - small:,} more for 200,000")
    return 0 if many <= MOST_INSTRUCTIONS * few and large <= small + MOST_MEMORY else 1


if __name__ == "__main__":
    sys.exit(main())
