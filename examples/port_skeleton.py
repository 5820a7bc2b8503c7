#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes port_skeleton.c: a body with its contract for every function that a stack provides, all of them empty but
those that keep the list of timers.

usage: port_skeleton.py FILE
"""

import pathlib
import sys
import textwrap

ROOT = pathlib.Path(__file__).resolve().parent.parent
sys.path.insert(0, str(ROOT / "cmake"))
from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, functions  # noqa: E402

LONGEST_LINE = 120
HEAD = """// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Every function that a stack provides, with its contract and an empty body: what a port starts from.
 * Written from the headers; copy it and fill the bodies, group by group, console first. As it
 * stands it links with pmx_if.o, answers 0 and does nothing, but for the list of timers that every port keeps. */
"""

# A port must know its timers: the layer can lose the handle of one that runs.
TIMER_LIST = """
/* The timers that exist; the first has handle 1. */
#define PORT_TIMERS 8
static BOOL afgTimerExists[PORT_TIMERS];

static BOOL fgTimerExists(HANDLE_T hTimer)
{
    return hTimer >= 1 && hTimer <= PORT_TIMERS && afgTimerExists[hTimer - 1];
}
"""
BEFORE = {"x_timer_create": TIMER_LIST}
BODIES = {
    "x_timer_create": """    HANDLE_T hTimer;

    for (hTimer = 1; hTimer <= PORT_TIMERS; hTimer++)
    {
        if (!fgTimerExists(hTimer))
        {
            /* here the system's timer is made */
            afgTimerExists[hTimer - 1] = TRUE;
            *phTimer = hTimer;
            return OSR_OK;
        }
    }
    return -1;
""",
    "x_timer_delete": """    if (!fgTimerExists(hTimer))
        return -1;
    /* here the system's timer is stopped, and an expiry that runs may end (in Linux timer_delete_sync) */
    afgTimerExists[hTimer - 1] = FALSE;
    return OSR_OK;
""",
}
RESULTS = {name: "fgTimerExists(hTimer) ? OSR_OK : -1" for name in ("x_timer_start", "x_timer_stop")}
UNLOAD = """
/* Unloading */

void vPortUnload(void);

/** Shut the layer down and leave no timer behind: an expiry after this would call code that is gone. Whatever the
 *  expiry function reaches (console, mixing of planes, the video plane driver's answer) is still there. */
void vPortUnload(void)
{
    HANDLE_T hTimer;

    PMX_Uninit();
    for (hTimer = 1; hTimer <= PORT_TIMERS; hTimer++)
    {
        if (fgTimerExists(hTimer))
            x_timer_delete(hTimer);
    }
}
"""


def body(function):
    if function.name in BODIES:
        return BODIES[function.name]
    result = RESULTS.get(function.name, "0")
    lines = [f"    (void){name};" for name in function.parameters if name not in result]
    if function.has_result:
        lines.append(f"    return {result};")
    return "\n".join(lines) + "\n" if lines else ""


def head(function):
    """The function's first line, folded behind a comma where it is long."""
    begin = f"{function.result} {function.name}("
    glued = ", ".join(parameter.replace(" ", "\0") for parameter in function.declared.split(", "))
    folded = textwrap.wrap(glued + ")", LONGEST_LINE, initial_indent=begin, subsequent_indent=" " * len(begin))
    return "\n".join(folded).replace("\0", " ")


def skeleton():
    names = sorted(pathlib.PurePath(header).name for header in (*PLATFORM_HEADERS, LAYER_HEADER))
    text = HEAD + "".join(f'#include "{name}"\n' for name in names)
    for header in PLATFORM_HEADERS:
        text += f"\n/* {pathlib.PurePath(header).name} */\n"
        for function in functions(ROOT / header):
            text += BEFORE.get(function.name, "")
            text += f"\n/** {function.contract} */\n{head(function)}\n{{\n{body(function)}}}\n"
    return text + UNLOAD


if __name__ == "__main__":
    pathlib.Path(sys.argv[1]).write_text(skeleton(), encoding="utf-8")
