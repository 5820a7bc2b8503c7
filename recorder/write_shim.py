#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the recorder: a function before each operation of the layer, and one behind each call that the layer makes.

usage: write_shim.py LAYER OUTPUT     LAYER: pmx_if.o, which tells what state it has
"""

import pathlib
import sys

import interface

PLANES = 8  # tables of video planes that stand ready for recording at a time


def take(name, rows):
    lines = "".join(f"    PMX_COPY(pucTo + {at}, (const void*)&{symbol}, {size});\n" for symbol, size, at in rows)
    return f"static inline void {name}(UCHAR* pucTo)\n{{\n{lines}}}\n"


def private(name, size):
    return f'extern UCHAR {name}[{size}] __attribute__((visibility("hidden")));\n'


def begin(function, index, kind, is_operation):
    lines = interface.encoding(function, is_operation)
    lines += [f"u4Used += PMX_WORDS({interface.size_of(output, output.written)});"
              for output in interface.fixed_outputs(function)]
    lines += ["u4Used += 1;" for _ in interface.tables(function)]
    return lines + [f"rEvent = rBegin({kind}, {index}, au4Words, u4Used);"]


def end(function, kind):
    lines, fits = ["u4Used = 4;"], "true"
    for output in interface.fixed_outputs(function):
        lines.append(f"u4Used = u4PmxPutRaw(au4Words, u4Used, {output.name}, "
                     f"{interface.size_of(output, output.written)});")
    for place, word in zip(interface.tables(function), ("u4OfferTable(ppvIf)", "(UINT32)(size_t)*ppvTag")):
        lines.append(f"au4Words[u4Used++] = result >= 0 && {place.name} != 0 ? {word} : 0;")
    for parameter in function.parameters:
        if interface.is_text_out(parameter):
            lines.append(f"u4Used = u4PmxPutBytes(au4Words, u4Used, {parameter.name}, {parameter.name} == 0 ? 0 : "
                         f"u4PmxLength({parameter.name}, PMX_MOST_BYTES - 1));")
            fits = "false"
    answer = "(UINT32)result" if function.has_result else "0"
    return lines + [f"vEnd({kind}, &rEvent, {answer}, au4Words, u4Used - 4, {fits});"]


def recording(function, index, real, kind, is_operation):
    call = f"{real}({interface.handed_on(function)})"
    if not is_operation:
        call = exchanged(function, call)
    if function.has_result:
        plain = f"return {call};"
        call = f"result = {call};"
    else:
        plain = f"{{ {call}; return; }}"
        call = f"{call};"
    lines = interface.collecting(function)
    declared = [line for line in lines if not line.endswith(");")]
    declared += [f"UINT32 au4Words[{interface.room(function, is_operation)}];", "PMX_EVENT_T rEvent;",
                 "UINT32 u4Used = 3;"]
    declared += [f"{function.result} result;"] if function.has_result else []
    body = [*declared, *(line for line in lines if line.endswith(");")), f"if (prRecorder == 0)\n        {plain}",
            *begin(function, index, kind, is_operation), call, *end(function, kind)]
    if function.has_result:
        body.append("return result;")
    return "\n    ".join(body)


def exchanged(function, call):
    """A call in which the recorder's own functions and tables stand for the layer's."""
    for parameter in function.parameters:
        if parameter.kind == "symbol":
            other = "pfReal" if parameter.name.startswith("pf") else "pvReal"
            call = call.replace(parameter.name, f"{other}({parameter.name})")
    return call


def operation(function, index):
    real = f"pmx_recorded_{function.name}"
    body = recording(function, index, real, "PMX_RECORDER_OPERATION", True)
    return f"{function.declaration(real)};\n{function.declaration()}\n{{\n    {body}\n}}\n"


def platform_function(function, index):
    body = recording(function, index, function.name, "PMX_RECORDER_CALL", False)
    name = f"pmx_recorder_{function.name}"
    return f"{function.declaration(name)};\n{function.declaration(name)}\n{{\n    {body}\n}}\n"


def plane_call(function, index):
    """What stands in a table that is handed out to the layer: a function for each table."""
    body = recording(function, index, f"aprPlane[u4Plane]->{function.name}", "PMX_RECORDER_CALL", False)
    inner = function.declaration("u4PlaneCall").replace("(", "(UINT32 u4Plane, ", 1)
    names = interface.handed_on(function)
    slots = "\n".join(f"static {function.declaration(f'u4PlaneCall{i}')}\n{{\n    return u4PlaneCall({i}, {names});\n}}"
                      for i in range(PLANES))
    rows = ", ".join(f"u4PlaneCall{i}" for i in range(PLANES))
    pointer = "static " + function.declaration("(*const apfPlaneCall[PLANES])", named=False)
    return f"static {inner}\n{{\n    {body}\n}}\n\n{slots}\n\n{pointer} = {{ {rows} }};\n"


PLANE_TABLES = """
/* A video plane's table is handed to the layer with the one function exchanged that it calls. Whoever registers another
 * table each time in the end has the rest unrecorded. */
static const IVdp* volatile aprPlane[PLANES];
static IVdp arOffered[PLANES];

static UINT32 u4OfferTable(void** ppvIf);
"""

OFFER = """
static UINT32 u4OfferTable(void** ppvIf)
{
    const IVdp* const prReal = (const IVdp*)*ppvIf;
    UINT32 i;
    for (i = 0; i < PLANES && aprPlane[i] != prReal && aprPlane[i] != 0; ++i)
    {
    }
    if (i == PLANES)
        return PMX_SYMBOL_OTHER;
    if (aprPlane[i] == 0)
    {
        arOffered[i] = *prReal;
        arOffered[i].pu4SetColorMode = apfPlaneCall[i];
        aprPlane[i] = prReal;
    }
    *ppvIf = &arOffered[i];
    return PMX_SYMBOL_OTHER + 1 + i;
}
"""

SYMBOLS = """
extern const IPMX pmx_recorded__rPMXIF;
extern const PM_OPERATIONS_T pmx_recorded_pmx_pm_ops;
void pmx_recorded__PMX_TmrIsr(HANDLE_T h, void* pvArg);

static UINT32 u4Symbol(size_t zAddress)
{
    return zAddress == 0                                   ? PMX_SYMBOL_NULL
           : zAddress == (size_t)&pmx_recorded__PMX_TmrIsr ? PMX_SYMBOL_ISR
           : zAddress == (size_t)&pmx_recorded__rPMXIF     ? PMX_SYMBOL_TABLE
           : zAddress == (size_t)&pmx_recorded_pmx_pm_ops  ? PMX_SYMBOL_POWER
                                                           : PMX_SYMBOL_OTHER;
}

/* What others call the layer through leads to the recorder. */
static x_timer_cb_fct pfReal(x_timer_cb_fct pfGiven)
{
    return pfGiven == pmx_recorded__PMX_TmrIsr ? _PMX_TmrIsr : pfGiven;
}

static const void* pvReal(const void* pvGiven)
{
    return pvGiven == &pmx_recorded__rPMXIF     ? (const void*)&_rPMXIF
           : pvGiven == &pmx_recorded_pmx_pm_ops ? (const void*)&pmx_pm_ops
                                                 : pvGiven;
}
"""


def table_of_slots():
    header = interface.signatures.ROOT / "src/driver/private_inc/drv_if_pmx.h"
    rows = [f"    .{found.function.name} = {found.model}," for found in
            interface.signatures.platform_functions.function_pointers(header) if found.model]
    if not rows:
        raise SystemExit(f"{header} has no table of the mixer's")
    return "const IPMX _rPMXIF = {\n" + "\n".join(rows) + "\n};\n"


def source(layer):
    exported, private_ones, exported_size, size = interface.placed(layer)
    platform = interface.platform()
    includes = "\n".join(f'#include "{header}"' for header in interface.HEADERS)
    functions = "\n".join(platform_function(function, i) for i, function in enumerate(platform)
                          if function.name != interface.PLANE_CALL)
    [[index, plane]] = [(i, function) for i, function in enumerate(platform) if function.name == interface.PLANE_CALL]
    offered = "\n".join(operation(function, i) for i, function in enumerate(interface.operations()))
    return f"""/* Written from the headers when the recorder is built. */
{includes}
#include "encoding.h"

#define PMX_INTERFACE {interface.check_sum()}
#define PMX_EXPORTED_SIZE {exported_size}u
#define PMX_STATE_SIZE {size}u
#define PLANES {PLANES}u
DRV_STATIC_ASSERT(2 + PMX_WORDS(PMX_STATE_SIZE) <= 255, "a snapshot is one event");

{''.join(private(name, size) for name, size, at in private_ones)}
{take("vPmxTakeExported", exported)}
{take("vPmxTakePrivate", private_ones)}
#include "ring.h"
{SYMBOLS}{PLANE_TABLES}
{plane_call(plane, index)}{OFFER}
{functions}
{offered}
{table_of_slots()}
const PM_OPERATIONS_T pmx_pm_ops = {{ .suspend = i4PMX_Suspend, .resume = i4PMX_Resume }};
"""


def main():
    layer, output = sys.argv[1:]
    pathlib.Path(output).write_text(source(layer), encoding="utf-8")


if __name__ == "__main__":
    main()
