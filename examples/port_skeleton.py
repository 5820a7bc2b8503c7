#!/usr/bin/env python3
"""Writes port_skeleton.c: one empty body with its contract for every function that a stack provides.

usage: port_skeleton.py [--check]    rewrite the file, or compare it with what the headers declare
"""

import pathlib
import subprocess
import sys

ROOT = pathlib.Path(__file__).resolve().parent.parent
sys.path.insert(0, str(ROOT / "cmake"))
from platform_functions import PLATFORM_HEADERS, functions  # noqa: E402

SKELETON = ROOT / "examples/port_skeleton.c"
HEAD = """/* Every function that a stack provides, with its contract and an empty body: what a port starts from.
 * Written from the headers by port_skeleton.py; copy it and fill the bodies, group by group, console first. As it
 * stands it links with pmx_if.o, answers 0 to everything and does nothing. */
"""


def body(function):
    lines = [f"    (void){name};" for name in function.parameters]
    if function.has_result:
        lines.append("    return 0;")
    return "\n".join(lines) + "\n" if lines else ""


def skeleton():
    names = sorted(pathlib.PurePath(header).name for header in PLATFORM_HEADERS)
    text = HEAD + "".join(f'#include "{name}"\n' for name in names)
    for header in PLATFORM_HEADERS:
        text += f"\n/* {pathlib.PurePath(header).name} */\n"
        for function in functions(ROOT / header):
            text += (f"\n/** {function.contract} */\n{function.result} {function.name}({function.declared})\n"
                     f"{{\n{body(function)}}}\n")
    return subprocess.run(["clang-format", "--style=file", f"--assume-filename={SKELETON}"], check=True, input=text,
                          capture_output=True, text=True, encoding="utf-8").stdout


def main():
    if sys.argv[1:] == ["--check"]:
        if SKELETON.read_text(encoding="utf-8") != skeleton():
            print("examples/port_skeleton.c is not what the headers declare: run examples/port_skeleton.py")
            return 1
        return 0
    SKELETON.write_text(skeleton(), encoding="utf-8")
    return 0


if __name__ == "__main__":
    sys.exit(main())
