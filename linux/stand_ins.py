#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes stand-ins for the neighbouring drivers from their headers: a module that has none of them links and loads, and
the layer runs. They answer as the virtual board's defaults do, remember what they are asked for again, and do nothing
else.

usage: stand_ins.py FILE [REAL...]     REAL: a function, or a header without .h, for which a driver is there
"""

import pathlib
import sys
import textwrap

sys.dont_write_bytecode = True
ROOT = pathlib.Path(__file__).resolve().parent.parent
sys.path.insert(0, str(ROOT / "cmake"))

from platform_functions import PLATFORM_HEADERS, functions  # noqa: E402
import whole_file  # noqa: E402

OF_THE_PORT = {"u_os", "drv_if"}
LONGEST_LINE = 120
HEAD = """// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Stand-ins for the neighbouring drivers, written from their headers. */
"""

# What the drivers remember; only what something asks for again. It is volatile as registers are: the timer's context
# mixes planes, too.
MEMORY = {
    "mixed": "static volatile UINT8 mixed[8] = { 1, 1, 1, 1, 1, 1, 1, 1 };",
    "selectors": "static volatile UINT8 selectors[8] = { 0, 1, 2, 3, 4, 5, 6, 7 };",
}
ANSWERS = {
    "TVE_SetFmtEx": "return u4Tve <= TVE_2 ? TVE_SET_OK : 0;",
    "vPmxMixPlane": "if (ucPmxId == 0 && ucPlane < 8)\n    mixed[ucPlane] = 1;",
    "vPmxNotMixPlane": "if (ucPmxId == 0 && ucPlane < 8)\n    mixed[ucPlane] = 0;",
    "fgPmxHalMixPlane": "return ucPmxId == 0 && ucPlane < 8 && mixed[ucPlane];",
    "PMX_HalInitPlaneOrder": """UINT8 plane;

for (plane = 0; ucPmxId == 0 && plane < 8; plane++)
    selectors[plane] = plane;""",
    "PMX_HalSetPlaneOrder": """int plane;

if (ucPmxId != 0)
    return -1;
for (plane = 0; plane < 8; plane++)
{
    if (pu1PlnSel[plane] > 7)
        return -1;
}
for (plane = 0; plane < 8; plane++)
{
    selectors[plane] = pu1PlnSel[plane];
    pi4PlnDelay[plane] = 0;
}
return 0;""",
    "PMX_HalGetPlaneOrder": """int plane;

if (ucPmxId != 0)
    return -1;
for (plane = 0; plane < 8; plane++)
    pu1PlnSel[plane] = selectors[plane];
return 0;""",
    "i4GetHotPlugStatus": "return 1;",
    "VDP_GetHwEnable": "return ucVdpId == 0 ? VDP_ENABLED : VDP_DISABLED;",
    "fgPmxDrvSetAvd": "return pvParameter != NULL;",
    "fgPmxDrvGetAvdInfo": """PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T* prQuery = pvParameter;

if (u4Query != PMX_GET_VALID_RES_AND_VFREQ || prQuery == NULL)
    return FALSE;
prQuery->u4ValidAutoRes = prQuery->u4ResCheck;
prQuery->u2ValidAutoVfreq = prQuery->u2VsyncFreq;
return TRUE;""",
}
for pair in ("1_2", "3_4", "6_7", "4_7", "1_3", "5_8"):
    MEMORY[f"swapped_{pair}"] = f"static volatile BOOL swapped_{pair};"
    ANSWERS[f"PMX_HalSwapPlane{pair}"] = f"if (ucPmxId == 0)\n    swapped_{pair} = u4Swap != 0;"
    ANSWERS[f"fgPmxHalSwapPlane{pair}"] = f"return ucPmxId == 0 && swapped_{pair};"


class Unknown(Exception):
    """A name that stands for nothing that could be real."""


def neighbours():
    """{header without .h: its functions} of the drivers beside the layer."""
    found = {pathlib.PurePath(header).stem: list(functions(ROOT / header)) for header in PLATFORM_HEADERS}
    return {header: listed for header, listed in found.items() if header not in OF_THE_PORT}


def stand_in(function):
    """A function as C code."""
    head = f"{function.result} {function.name}("
    glued = ", ".join(parameter.replace(" ", "\0") for parameter in function.declared.split(", "))
    first = textwrap.wrap(glued + ")", LONGEST_LINE, initial_indent=head, subsequent_indent=" " * len(head))
    body = ANSWERS.get(function.name, "return 0;" if function.has_result else "")
    return "\n".join(first).replace("\0", " ") + "\n{\n" + textwrap.indent(body + "\n" if body else "", "    ") + "}\n"


def stand_ins(real):
    """The file, without the functions and headers that are real."""
    drivers = neighbours()
    names = {function.name for listed in drivers.values() for function in listed}
    unknown = [name for name in real if name not in names | drivers.keys()] + sorted(ANSWERS.keys() - names)
    if unknown:
        raise Unknown(f"no neighbouring driver, and no function of one, is called {', '.join(unknown)}")
    text = "\n".join(stand_in(function) for header, listed in drivers.items() if header not in real
                     for function in listed if function.name not in real)
    memory = "\n".join(line for name, line in MEMORY.items() if name in text)
    includes = "".join(f'#include "{header}.h"\n' for header in sorted(drivers))
    return f"{HEAD}{includes}\n{memory}\n\n{text}"


def main():
    try:
        whole_file.write(sys.argv[1], stand_ins(sys.argv[2:]))
    except Unknown as reason:
        sys.exit(str(reason))


if __name__ == "__main__":
    main()
