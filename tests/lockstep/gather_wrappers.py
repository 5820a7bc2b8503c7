#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the functions that stand before the layer's operations while scenarios run: each notes its arguments and the
state, and lets the call pass. The linker puts them in place (--wrap).

usage: gather_wrappers.py OUTPUT     the functions
       gather_wrappers.py --names    the operations that they stand before, one a line
"""

import pathlib
import sys

sys.dont_write_bytecode = True

import generate  # noqa: E402
import signatures  # noqa: E402


def wrapped():
    """What takes a format and its values cannot be passed on; scenarios do not call it."""
    return [function for function in signatures.operations().values() if not function.is_variadic]


def note(parameter):
    if parameter.kind == "data":
        return f"call.array({parameter.name}, {parameter.name} == nullptr ? 0 : {parameter.read});"
    if parameter.kind == "place":
        return f"call.place({parameter.name});"
    if parameter.kind == "tag":
        return f"call.number(reinterpret_cast<std::uintptr_t>({parameter.name}));"
    return f"call.number({parameter.name});"


def wrapper(function):
    lines = [f'Gathered call("{function.name}");', *(note(parameter) for parameter in function.parameters),
             "call.write();"]
    given = ", ".join(parameter.name for parameter in function.parameters)
    lines.append(f"{'return ' if function.has_result else ''}__real_{function.name}({given});")
    body = "\n    ".join(lines)
    return (f"{function.declaration('__real_' + function.name)};\n"
            f"{function.declaration('__wrap_' + function.name)}\n{{\n    {body}\n}}\n")


def source():
    includes = "\n".join(f'#include "{header}"' for header in signatures.HEADERS)
    rows = "\n".join(f'    {{ "{name}", &{name} }},' for name in generate.state())
    return f"""// Written from the headers when the program is built.
#include "tests/lockstep/gathered.h"

{includes}
#include "src/driver/pmx/pmx_if.h"

using lockstep::Gathered;

const lockstep::StateObject lockstep::gathered_state[] = {{
{rows}
}};
const std::size_t lockstep::gathered_state_count = {len(generate.state())};

extern "C"
{{
{chr(10).join(map(wrapper, wrapped()))}
}}
"""


def main():
    if sys.argv[1] == "--names":
        print("\n".join(function.name for function in wrapped()))
    else:
        pathlib.Path(sys.argv[1]).write_text(source(), encoding="utf-8")


if __name__ == "__main__":
    main()
