#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What a compiler sees of the recorder that is not GNU's: nothing that only GNU's knows; and what it has to be given,
it is told.

usage: other_compiler.py COMPILER SHIM
"""

import pathlib
import re
import subprocess
import sys

HERE = pathlib.Path(__file__).resolve().parent
ROOT = HERE.parents[1]
OURS = (str(ROOT / "recorder"), "shim.c")
# What C99 has for values comes out of the compiler's own headers, and what all functions have out of the layer's.
OF_OTHERS = r"__builtin_va_\w+|__attribute__\(\(visibility\(.default.\)\)\)"


def preprocessed(compiler, shim, *options):
    names = ("src/system/inc", "src/driver/inc", "src/driver/private_inc", "recorder")
    folders = [f"-I{ROOT / name}" for name in names]
    return subprocess.run([compiler, "-E", "-std=c99", "-U__GNUC__", *folders, *options, shim], capture_output=True,
                          text=True, check=False)


def foreign(text):
    """Lines of the recorder with words that only GNU's compilers know."""
    name, lines = "", 0
    for line in text.splitlines():
        marker = re.match(r'# \d+ "([^"]*)"', line)
        if marker:
            name = marker[1]
        elif name.startswith(OURS[0]) or name.endswith(OURS[1]):
            lines += bool(line.strip())
            found = re.search(r"__(attribute|asm|atomic|builtin)\w*", re.sub(OF_OTHERS, "", line))
            if found:
                yield f"{name}: {found[0]}: {line.strip()[:100]}"
    if lines < 1000:
        yield f"only {lines} lines were looked at"


def main():
    compiler, shim = sys.argv[1:]
    alone = preprocessed(compiler, shim)
    if alone.returncode == 0 or "PMX_RECORDER_PUBLISHED have to be defined" not in alone.stderr:
        raise SystemExit(f"it is not told what it has to be given: {alone.stderr[-500:]}")
    given = preprocessed(compiler, shim, "-include", str(HERE / "interrupted.h"))
    wrong = [given.stderr[-500:]] if given.returncode else list(foreign(given.stdout))
    if wrong:
        raise SystemExit("\n".join(wrong))
    print("the recorder says nothing that only GNU's compilers know")


if __name__ == "__main__":
    main()
