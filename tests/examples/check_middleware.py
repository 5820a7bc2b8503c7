#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the middleware example and holds what it prints against what it is written to show.

usage: check_middleware.py PROGRAM [BOARD]
"""

import subprocess
import sys

# In this order, other lines between them.
LINES = [
    "video plane 0: the mixer works in BT.601",
    "picture: 1920 x 1080",
    "aspect ratio: code 2",
    "Mode(10) CS(0)",
    "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[0]'s CompT(65 ), CompId(0 ),  Connected(1 ) ",
    "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[1].eResMode(RES_1080I60HZ)",
    "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[3].eResMode(RES_480I)",
    "done, 0 broken invariants",
]


def check(command):
    """Ends the program where the example does not do what it should."""
    run = subprocess.run(command, capture_output=True, text=True, check=False)
    sys.stderr.write(run.stderr)
    if run.returncode != 0:
        sys.exit(f"exit code {run.returncode}")
    printed = iter(run.stdout.splitlines())
    for line in LINES:
        if line not in printed:
            sys.exit(f"not printed, or too early: {line}")


def main():
    check(sys.argv[1:])
    return 0


if __name__ == "__main__":
    sys.exit(main())
