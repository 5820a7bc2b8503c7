#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes, from the headers and from how the board's devices record their calls, what serves programs that have platform
functions of their own; see board/replaced.h.

usage: replaced_functions.py OUTPUT DEVICE...

OUTPUT is one of
    replaced_functions.cpp   records the calls of such functions, and knows which of them there are
    board_functions.h        declares the board's functions by their second names
    weak_functions.h         has the board's functions give way, for a compiler that wants to know it beforehand
    recorded_calls.txt       has the linker lead calls through the recording
"""

import pathlib
import re
import sys

from platform_functions import PLATFORM_HEADERS, ROOT, functions, parameter_names

RECORDING = re.compile(r"BOARD_(CALL\w*)\(\s*(\w+)\s*((?:,[^;]*)?)\);")
# What is given to these cannot be handed on, or is recorded as something else than a call.
OF_THE_CONSOLE = {"PMX_IsLog", "Printf", "UTIL_Printf", "Assert"}
# Whose recording uses a device's own names.
DEVICE_NAMES = ("hdmi_av::command_parameter", "hdmi_av::query_parameter", "mixer::GAMMA_POINTS", "mixer::PLANES",
                "osd_planes::PLANES_WITH_OFFSET")


def recordings(devices):
    """Function to (its macro, arguments): how the devices record their calls."""
    found = {}
    for device in devices:
        for macro, name, arguments in RECORDING.findall(pathlib.Path(device).read_text(encoding="utf-8")):
            found[name] = macro, " ".join(arguments.split())
    return found


def recording_call(function, macro, arguments):
    """The function that the linker puts in front of a program's own one. A macro of the devices says what a fault
    keeps from happening."""
    own, given = f"board_{function.name}", ", ".join(parameter_names(function.declared))
    made = f"__real_{function.name}({given})"
    if macro == "CALL":
        made = f"{made};"
    else:
        made = f"return boardCall.{'answer_or_fault' if macro == 'CALL_ACTING' else 'answer'}({made});"
    return f"""
extern "C" decltype({function.name}) __real_{function.name} __attribute__((weak));
extern "C" {function.result} __wrap_{function.name}({function.declared})
try
{{
    if (__real_{function.name} == {own})
        return {own}({given});
    ::board::replaced::Call replacement;
    BOARD_{macro}({function.name}{arguments});
    replacement.begins("{function.name}");
    {made}
}}
BOARD_CALL_CONTAINED({function.name})
BOARD_PRAGMA(weak __wrap_{function.name})
"""


def row(function):
    linked = f"any({function.name})"
    if function.name not in OF_THE_CONSOLE:
        linked = f"__real_{function.name} != nullptr ? any(__real_{function.name}) : {linked}"
    return f'        {{ "{function.name}", {linked}, any(board_{function.name}) }},'


def source(listed, devices):
    recorded = recordings(devices)
    missing = [function.name for function in listed if function.name not in recorded]
    if missing:
        sys.exit("no device records its call: " + ", ".join(missing))
    calls = "".join(recording_call(function, *recorded[function.name])
                    for function in listed if function.name not in OF_THE_CONSOLE)
    rows = "\n".join(map(row, listed))
    using = "\n".join(f"using ::board::{name};" for name in DEVICE_NAMES)
    return f"""// Written from the platform headers and the devices when the board is built.
#include "board/replaced.h"

#include "board/board_functions.h"
#include "board/devices.h"
#include "board/trace.h"

namespace
{{

{using}

template <typename Function>
void (*any(Function* function))()
{{
    return reinterpret_cast<void (*)()>(function);
}}

}} // namespace
{calls}
namespace board::replaced
{{

std::span<const Function> functions()
{{
    static const Function FUNCTIONS[] = {{
{rows}
    }};
    return FUNCTIONS;
}}

}} // namespace board::replaced
"""


def includes():
    return "\n".join(f'#include "{pathlib.PurePath(name).name}"' for name in PLATFORM_HEADERS)


def header(listed):
    declared = "\n".join(f"{function.result} board_{function.name}({function.declared});" for function in listed)
    return f"""// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Written from the platform headers when the board is built: the board's platform functions by their second names. A
 * program that has a function of its own in the place of one of them hands on by these; the contracts are those of the
 * platform's headers. */
#ifndef BOARD_FUNCTIONS_H
#define BOARD_FUNCTIONS_H

{includes()}

#ifdef __cplusplus
extern "C" {{
#endif

{declared}

#ifdef __cplusplus
}}
#endif

#endif
"""


def weak(listed):
    return includes() + "\n" + "".join(f"#pragma weak {function.name}\n" for function in listed)


def linker_options(listed):
    return "".join(f"--wrap={function.name}\n" for function in listed if function.name not in OF_THE_CONSOLE)


def main():
    output, *devices = map(pathlib.Path, sys.argv[1:])
    listed = [function for name in PLATFORM_HEADERS for function in functions(ROOT / name)]
    texts = {"replaced_functions.cpp": lambda: source(listed, devices), "board_functions.h": lambda: header(listed),
             "weak_functions.h": lambda: weak(listed), "recorded_calls.txt": lambda: linker_options(listed)}
    output.write_text(texts[output.name](), encoding="utf-8")


if __name__ == "__main__":
    main()
