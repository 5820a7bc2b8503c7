#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes a body for every platform function: it does nothing, and answers what lets the layer go on. The bodies are
weak, so that a console takes the place of an empty one.

usage: empty.py FILE
"""

import pathlib
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

from platform_functions import PLATFORM_HEADERS, ROOT, functions  # noqa: E402

HEAD = """// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Written from the headers. */
"""
ANSWERS = {"TVE_SetFmtEx": "TVE_SET_OK", "i4GetHotPlugStatus": "1", "fgPmxDrvSetAvd": "TRUE"}
OUTPUTS = {"x_sema_create": "*phSema = 1;", "x_timer_create": "*phTimer = 2;"}


def body(function):
    statements = [OUTPUTS[function.name]] if function.name in OUTPUTS else []
    if function.has_result:
        statements.append(f"return {ANSWERS.get(function.name, '0')};")
    head = f"__attribute__((weak)) {function.result} {function.name}({function.declared})"
    return f"{head}\n{{\n    {' '.join(statements)}\n}}\n"


def code():
    headers = [ROOT / header for header in PLATFORM_HEADERS]
    text = HEAD + "".join(f'#include "{header.name}"\n' for header in headers) + "\n"
    return text + "\n".join(body(function) for header in headers for function in functions(header))


if __name__ == "__main__":
    pathlib.Path(sys.argv[1]).write_text(code(), encoding="utf-8")
