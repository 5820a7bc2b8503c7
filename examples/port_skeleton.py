#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes port_skeleton.c: a body with its contract for every function that a stack provides. What answers says that it
is not there yet, in the way that its contract has for that; the list of timers is kept.

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
/* Every function that a stack provides, with its contract and a body that does nothing yet: what a port starts from.
 * Written from the headers; copy it and fill the bodies, group by group, console first. As it stands it links with
 * pmx_if.o and keeps its contracts: who is told something takes it and forgets it, who is asked for something answers
 * that it is not there, and why so stands beside the answer. The list of timers that every port keeps is kept. */
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
    "x_vsnprintf": """    (void)szFormat;
    (void)rArgs;
    if (zSize != 0)
        szBuffer[0] = '\\0';
    return -1; /* a failure, and the text has an end all the same */
""",
}
NO_SEMAPHORES = "-1", "there are no semaphores: none was created, and the layer asserts that"
NO_PARTITIONS = "-1", "no such partition, and the destination stays as it is"
NO_KERNEL = "-1", "nobody would call them"
NO_MANAGER = "-1", "nothing can be published, and what is asked for is not there: a success would need a table to call"
NO_ORDER = "-1", "the hardware has no selectors, and writes none"
NOT_SWAPPED = "FALSE", "no planes are swapped"
IGNORED = "0", "the layer ignores it"
# What a function answers that is not there, and why. A function with a result that is in neither table is refused.
RESULTS = {
    "x_sema_create": NO_SEMAPHORES,
    "x_sema_lock": NO_SEMAPHORES,
    "x_sema_unlock": NO_SEMAPHORES,
    "x_sema_delete": NO_SEMAPHORES,
    "x_timer_start": ("fgTimerExists(hTimer) ? OSR_OK : -1", "started, and never runs out"),
    "x_timer_stop": ("fgTimerExists(hTimer) ? OSR_OK : -1", "a stop succeeds whether it runs or not"),
    "get_part_id_by_name": NO_PARTITIONS,
    "i4NFBPartitionRead": NO_PARTITIONS,
    "x_reg_read32": ("0", "a read cannot fail"),
    "register_pm_ops": NO_KERNEL,
    "unregister_pm_ops": NO_KERNEL,
    "i4ImRegisterInterface2": NO_MANAGER,
    "i4ImUnregisterInterface2": NO_MANAGER,
    "i4ImQueryInterface": NO_MANAGER,
    "i4ImReleaseInterface": NO_MANAGER,
    "PMX_HalSetPlaneOrder": NO_ORDER,
    "PMX_HalGetPlaneOrder": NO_ORDER,
    "fgPmxHalMixPlane": ("FALSE", "no plane is mixed"),
    "fgPmxHalSwapPlane1_2": NOT_SWAPPED,
    "fgPmxHalSwapPlane3_4": NOT_SWAPPED,
    "fgPmxHalSwapPlane6_7": NOT_SWAPPED,
    "fgPmxHalSwapPlane4_7": NOT_SWAPPED,
    "fgPmxHalSwapPlane1_3": NOT_SWAPPED,
    "fgPmxHalSwapPlane5_8": NOT_SWAPPED,
    "TVE_SetFmtEx": ("TVE_SET_OK", "told, like all others of the encoder; anything else is a broken invariant"),
    "VDP_GetHwEnable": ("VDP_DISABLED", "the plane is not shown"),
    "fgVdpIsWaitforSyncCtrl": ("FALSE", "who answers TRUE owes a PMX_SetOsdEnable"),
    "_i4OSD_SetPosOffset": IGNORED,
    "_i4Osd5Out": IGNORED,
    "_i4Osd5Out_CVBSOnly": IGNORED,
    "fgPmxDrvSetAvd": ("FALSE", "refused: there is no sink to command"),
    "fgPmxDrvGetAvdInfo": ("FALSE", "no answer, and the outputs stay as they are"),
    "i4GetHotPlugStatus": ("0", "no sink is plugged in"),
    "fgIsHotPlugChgRes": ("FALSE", "no hot plug wants anything"),
}
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
    if function.has_result and function.name not in RESULTS:
        sys.exit(f"{function.name}: what does the skeleton answer, and why? Add it to RESULTS")
    result, why = RESULTS.get(function.name, ("", ""))
    lines = [f"    (void){name};" for name in function.parameters if name not in result]
    if function.has_result:
        lines.append(f"    return {result}; /* {why} */")
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
