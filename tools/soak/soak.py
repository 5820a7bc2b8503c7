#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Lets the mixer live long, on this machine and on the target, by the same random operations: both see the same calls,
results and records, nobody misuses the platform who need not, and memory stays level here.

usage: soak.py HOST TARGET [NUMBER [SEED]]

HOST and TARGET are the program soak, as it runs here and under the emulator; NUMBER operations are drawn, ten million
unless it is said otherwise.
"""

import argparse
import json
import subprocess
import sys

OPERATIONS = 10_000_000
MOST_GROWTH_KIB = 1024  # from the first tenth to the end
SAME = ("operations", "entries", "misuses", "hash")
MISUSED = 1


class Failed(Exception):
    """What is wrong."""


def positive(text):
    if int(text) <= 0:
        raise ValueError
    return int(text)


def reports(name, process):
    """What a program tells on its way; its diagnostics are shown as they come."""
    for line in process.stdout:
        try:
            yield json.loads(line)
        except json.JSONDecodeError:
            raise Failed(f"{name} tells what is no report: {line.strip()}") from None
    if process.wait() not in (0, MISUSED):
        raise Failed(f"{name} broke down: it ended with {process.returncode}")


def follow(here, there):
    """The reports of the first program, while those of the other one are the same."""
    told = []
    for one, other in zip(reports("the host", here), reports("the target", there), strict=True):
        print(f"{one['operations']:,} operations, {one['entries']:,} calls and lines, hash {one['hash']}, "
              f"{one['memory_kib']:,} KiB", flush=True)
        if any(one[key] != other[key] for key in SAME):
            raise Failed(f"the target has seen something else: {other}")
        told.append(one)
    return told


def judge(told):
    if not told:
        raise Failed("nothing was told")
    if told[-1]["misuses"]:
        raise Failed(f"the platform was misused {told[-1]['misuses']:,} times")
    growth = told[-1]["memory_kib"] - told[0]["memory_kib"]
    if growth > MOST_GROWTH_KIB:
        raise Failed(f"memory has grown by {growth:,} KiB since the first tenth")


def main():
    parser = argparse.ArgumentParser(prog="dev soak", description=__doc__.splitlines()[0])
    parser.add_argument("host")
    parser.add_argument("target")
    parser.add_argument("number", type=positive, nargs="?", default=OPERATIONS, help="how many operations")
    parser.add_argument("seed", type=positive, nargs="?", default=1, help="other operations for another seed")
    given = parser.parse_args()
    started = [subprocess.Popen([program, str(given.number), str(given.seed)], stdout=subprocess.PIPE, text=True)
               for program in (given.host, given.target)]
    try:
        judge(follow(*started))
    except Failed as failure:
        sys.exit(f"soak: {failure}")
    except ValueError:
        sys.exit("soak: one program tells less than the other")
    finally:
        for process in started:
            process.kill()
            process.wait()
    print("the same on both, without misuse, memory level")


if __name__ == "__main__":
    try:
        main()
    except KeyboardInterrupt:
        sys.exit(130)
