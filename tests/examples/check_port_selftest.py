#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the self-test of a port that is the skeleton, and holds what fails against what must fail there.

usage: check_port_selftest.py PROGRAM LIST

LIST names the contracts that an empty port cannot meet, one a line.
"""

import pathlib
import re
import subprocess
import sys

LINE = re.compile(r"(?P<not>not )?ok (?P<number>\d+) - (?P<what>.*?)(?: # SKIP .*)?$")


def main():
    program, listed = sys.argv[1:]
    ended = subprocess.run([program, "hardware"], capture_output=True, text=True, check=False)
    *lines, plan = [line for line in ended.stdout.splitlines() if not line.startswith("# ")]
    found = [LINE.fullmatch(line) for line in lines]
    numbers = [int(one["number"]) for one in found if one]
    if numbers != list(range(1, len(lines) + 1)) or plan != f"1..{len(lines)}":
        sys.exit(f"no TAP:\n{ended.stdout}")
    must = pathlib.Path(listed).read_text(encoding="utf-8").splitlines()[1:]
    fails = [one["what"] for one in found if one["not"]]
    for what in sorted({*fails} ^ {*must}):
        print(("fails and should not: " if what in fails else "should fail and does not: ") + what)
    if ended.returncode != 1:
        print(f"exit code {ended.returncode}")
    print(f"{len(fails)} of {len(found)} fail")
    return 0 if fails == must and ended.returncode == 1 else 1


if __name__ == "__main__":
    sys.exit(main())
