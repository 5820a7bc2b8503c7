#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the recorder: a function before each operation of the layer, and one behind each call that the layer makes.

usage: write_shim.py LAYER OUTPUT     LAYER: pmx_if.o, which tells what state it has
"""

import pathlib
import sys

import interface

INDENT = "\n    "
FEW_VALUES = 4  # of a format are handed on one by one, more than that as the most there can be
PLANES = 8  # tables of video planes that stand ready for recording at a time


def take(name, rows):
    lines = "".join(f"    PMX_COPY(pucTo + {at}, (const void*)&{symbol}, {size});\n" for symbol, size, at in rows)
    return f"static inline void {name}(UCHAR* pucTo)\n{{\n{lines}}}\n"


def private(name, size):
    return f"extern UCHAR {name}[{size}] PMX_HIDDEN;\n"


def watch(layer):
    """What is looked at whenever the layer is entered or left: words that stand together, and what is left over. A load
    of an address is shorter than making it. A compiler that knows no second name for a variable is not told that they
    are words."""
    runs, single = interface.watched(layer)
    declared = "".join(f"typedef struct {{ UINT32 au4Word[{words}]; }} PMX_RUN_{i}_T;\n"
                       f"#ifdef __GNUC__\nextern PMX_RUN_{i}_T rPmxRun{i} __asm__(\"{name}\");\n#else\n"
                       f"#define rPmxRun{i} (*(const PMX_RUN_{i}_T*)(const void*)&{name})\n#endif\n"
                       for i, (name, words) in enumerate(runs))
    watched = [f"PMX_RUN_{i}_T rRun{i};" for i in range(len(runs))]
    watched += [f"UCHAR auc{name}[{size}];" for name, size in single]
    places = [f"const PMX_RUN_{i}_T* prRun{i};" for i in range(len(runs))] + [f"const void* pv{name};"
                                                                           for name, _ in single]
    found = [f"prPlaces->prRun{i} = &rPmxRun{i};" for i in range(len(runs))]
    found += [f"prPlaces->pv{name} = (const void*)&{name};" for name, _ in single]
    copied = [f"prTo->rRun{i} = *prPlaces->prRun{i};" for i in range(len(runs))]
    copied += [f"PMX_COPY(prTo->auc{name}, prPlaces->pv{name}, {size});" for name, size in single]
    compared = ["PMX_WATCHED_T rAsIs;", "UINT32 u4Differs = 0;", "vPmxWatch(prPlaces, &rAsIs);"]
    compared += [f"u4Differs |= rAsIs.rRun{i}.au4Word[{word}] ^ prFrom->rRun{i}.au4Word[{word}];"
                 for i, (_, words) in enumerate(runs) for word in range(words)]
    compared += [f"u4Differs |= (UINT32)rAsIs.auc{name}[{i}] ^ prFrom->auc{name}[{i}];"
                 for name, size in single for i in range(size)]
    return f"""{declared}typedef struct {{ {" ".join(watched)} }} PMX_WATCHED_T;
typedef struct {{ {" ".join(places)} }} PMX_PLACES_T;

static inline void vPmxFind(PMX_PLACES_T* prPlaces)
{{
    {INDENT.join(found)}
}}

static inline void vPmxWatch(const PMX_PLACES_T* prPlaces, PMX_WATCHED_T* prTo)
{{
    {INDENT.join(copied)}
}}

static inline UINT32 u4PmxDiffers(const PMX_PLACES_T* prPlaces, const PMX_WATCHED_T* prFrom)
{{
    {INDENT.join(compared)}
    return u4Differs;
}}

/* From here on they differ, whatever the layer's objects hold. */
static inline void vPmxSpoil(const PMX_PLACES_T* prPlaces, PMX_WATCHED_T* prTo)
{{
    prTo->rRun0.au4Word[0] = ~prPlaces->prRun0->au4Word[0];
}}
"""


def sizes(function, is_operation):
    """{what is kept of a pointer's bytes: how many, as an expression}, read and written."""
    read, written = {}, {}
    for parameter in function.parameters:
        name, size = parameter.name, None
        if parameter.kind == "text" and is_operation:
            size = f"u4PmxLength({name}, PMX_MOST_BYTES - 1)"
        elif parameter.kind == "data" or (parameter.kind == "place" and is_operation):
            size = f"u4PmxSize({parameter.read or parameter.written}, PMX_MOST_BYTES)"
        if size:
            read[name] = size
    for output in interface.fixed_outputs(function):
        written[output.name] = f"u4PmxSize({output.written}, PMX_MOST_BYTES)"
    return read, written


def counted(function, is_operation):
    """Declarations of sizes, the words of the event as an expression, and those among them that are written."""
    read, written = sizes(function, is_operation)
    lines = [f"const UINT32 u4Read_{name} = {name} == 0 ? 0 : {size};" for name, size in read.items()]
    lines += [f"const UINT32 u4Written_{name} = {name} == 0 ? 0 : {size};" for name, size in written.items()
              if read.get(name) != size]
    outputs = [f"PMX_WORDS({size_name(name, read, written)})" for name in written]
    tables = len(interface.tables(function))
    words = [str(3 + len(function.parameters) + tables), *(f"PMX_WORDS(u4Read_{name})" for name in read), *outputs]
    return lines, " + ".join(words), " + ".join([str(tables), *outputs])


def size_name(name, read, written):
    return f"u4Read_{name}" if read.get(name) == written[name] else f"u4Written_{name}"


def arguments(function, is_operation):
    """The lines that put the arguments behind an event's head."""
    read, _ = sizes(function, is_operation)
    lines, place = [], 0
    for parameter in function.parameters:
        name = parameter.name
        word = f"(UINT32)(size_t){name}" if parameter.kind in ("text", "tag") else f"(UINT32){name}"
        if name in read:
            at = f"pu4To + {place}" if place else "pu4To"
            lines.append(f"pu4To = pu4PutBytes({at}, {name}, u4Read_{name});")
            place = 0
            continue
        if parameter.kind == "symbol":
            word = f"u4Symbol((size_t){name})"
        elif parameter.kind in ("place", "table"):
            word = f"{name} != 0"
        lines.append(f"pu4To[{place}] = {word};")
        place += 1
    return lines


def ending(function, kind, is_operation, words):
    """What comes behind the call."""
    read, written = sizes(function, is_operation)
    answer = "(UINT32)result" if function.has_result else "0"
    if not written and not interface.tables(function):
        return [f"pu4Done(&rEvent, {answer}, 0);" if is_operation else f"vAnswer(&rEvent, {answer});"]
    lines = [f"pu4To = {'pu4Done' if is_operation else 'pu4Answer'}(&rEvent, {answer}, {words});"]
    lines += [f"pu4To = pu4PutRaw(pu4To, {name}, {size_name(name, read, written)});" for name in written]
    for place, word in zip(interface.tables(function), ("u4OfferTable(ppvIf)", "(UINT32)(size_t)*ppvTag")):
        lines.append(f"*pu4To++ = result >= 0 && {place.name} != 0 ? {word} : 0;")
    return lines


def called(function, real, is_operation):
    """(the call, the same that returns at once)"""
    call = f"{real}({interface.handed_on(function)})"
    if not is_operation:
        call = exchanged(function, call)
    if function.has_result:
        return f"result = {call};", f"return {call};"
    return f"{call};", f"{{ {call}; return; }}"


def recording(function, index, real, kind, is_operation):
    """The body of a function that records a call: each argument is written where it stays."""
    call, plain = called(function, real, is_operation)
    declared, count, words = counted(function, is_operation)
    body = ["PMX_EVENT_T rEvent;", "UINT32* pu4To;"]
    body += [f"{function.result} result;"] if function.has_result else []
    body.append(f"if (PMX_SELDOM(rNow.prRecorder == 0))\n        {plain}")
    body.append("{")
    body += [f"    {line}" for line in declared]
    body += [f"    u4Tell({parameter.name});" for parameter in function.parameters if parameter.kind == "text"
             and not is_operation]
    begin = "pu4Operation" if is_operation else "pu4Call"
    body.append(f"    pu4To = {begin}(&rEvent, {kind} << 8 | {index}u << 16 | ({count}));")
    body += [f"    {line}" for line in arguments(function, is_operation)]
    body += ["    (void)pu4To;", f"    {call}"]
    body += [f"    {line}" for line in ending(function, kind, is_operation, words)]
    body.append("}")
    if function.has_result:
        body.append("return result;")
    return INDENT.join(body)


def recording_format(function, index, real):
    """The same for an operation with a format. One that it does not read is handed on as an empty one: whoever turns
    the level on at that moment has it print nothing."""
    if function.name not in interface.READS_FORMAT_WHEN:
        raise SystemExit(f"{function.name} takes a format: READS_FORMAT_WHEN has to say when it is read")
    *numbers, text, _ = [parameter.name for parameter in function.parameters]
    call, plain = called(function, real, True)
    body = [f"const bool fgIsRead = {interface.READS_FORMAT_WHEN[function.name]};",
            "long aiValues[PMX_MOST_VALUES] = { 0 };", "PMX_KEPT_T rKept;", "PMX_EVENT_T rEvent;", "UINT32* pu4To;",
            "va_list rValues;", f"if (!fgIsRead && {text} != 0)\n        {text} = \"\";",
            f"va_start(rValues, {text});", f"vPmxCollect(u4PmxCode({text}), rValues, aiValues);", "va_end(rValues);",
            f"if (rNow.prRecorder == 0)\n        {plain}", f"vPmxKeep(&rKept, {text}, aiValues);",
            "if (!fgIsRead && rKept.u4Format != 0)\n        rKept.u4Format |= PMX_CUT;",
            f"pu4To = pu4Operation(&rEvent, PMX_RECORDER_OPERATION << 8 | {index}u << 16 | "
            f"({3 + len(numbers)} + rKept.u4Words));"]
    body += [f"pu4To[{i}] = (UINT32){name};" for i, name in enumerate(numbers)]
    body += [f"vPutKept(pu4To + {len(numbers)}, &rKept, {text}, aiValues);", call, "pu4Done(&rEvent, 0, 0);"]
    return INDENT.join(body)


def recording_whole(function, index, real):
    """The same for a call with texts from outside: what is kept of it is gathered first."""
    call, plain = called(function, real, False)
    gathered = interface.collecting(function)
    answer = "(UINT32)result" if function.has_result else "0"
    body = [*(line for line in gathered if not line.endswith(");") or " = " in line),
            f"UINT32 au4Words[{interface.room(function)}];", "PMX_EVENT_T rEvent;", "UINT32 u4Used = 3;"]
    texts = [parameter.name for parameter in function.parameters if interface.is_text_out(parameter)]
    body += ["UINT32 u4Room = PMX_MOST_KEPT;", "UINT32* pu4To;"] if texts else []
    body += [f"{function.result} result;"] if function.has_result else []
    body += [line for line in gathered if line.endswith(");") and " = " not in line]
    body += [f"if (rNow.prRecorder == 0)\n        {plain}", *interface.encoding(function),
             f"PMX_COPY(pu4Call(&rEvent, PMX_RECORDER_CALL << 8 | {index}u << 16 | u4Used), au4Words + 3, "
             "4 * (u4Used - 3));", call]
    if not texts:
        body.append(f"pu4Answer(&rEvent, {answer}, 0);")
    for name in texts:
        body += ["vEnter();", f"u4Used = u4PmxKeepText({name}, (UINT32)zSize, &u4Room);",
                 f"pu4To = pu4Return(&rEvent, {answer}, 1 + PMX_WORDS(PMX_KEPT(u4Used)));", "*pu4To = u4Used;",
                 f"pu4PutRaw(pu4To + 1, {name}, PMX_KEPT(u4Used));"]
    return INDENT.join([*body, *(["return result;"] if function.has_result else [])])


def printing_much(function, index):
    """A function for the formats with more values, and for all while nothing is recorded."""
    *numbers, text, _ = function.parameters
    given = ", ".join(parameter.name for parameter in (*numbers, text))
    first = len(numbers) + 1
    handed = ", ".join([given, *(f"aiValue[{i}]" for i in range(16))])
    body = ["long aiValue[PMX_MOST_VALUES] = { 0 };", "const UINT32 u4Count = PMX_CODE_COUNT(u4Code);",
            "PMX_EVENT_T rEvent;", "UINT32* pu4To;", "UINT32 i;", "vPmxCollect(u4Code, rValues, aiValue);",
            f"if ((u4Code & PMX_UNRECORDED) != 0)\n    {{\n        {function.name}({handed});\n        return;\n    }}",
            "vTellValues(PMX_CODE_TEXTS(u4Code), aiValue);",
            f"pu4To = pu4Call(&rEvent, PMX_RECORDER_CALL << 8 | {index}u << 16 | ({3 + first} + u4Count));"]
    body += [f"pu4To[{i}] = (UINT32){parameter.name};" for i, parameter in enumerate(numbers)]
    body += [f"pu4To[{first - 1}] = (UINT32)(size_t){text.name};",
             f"for (i = 0; i < u4Count; ++i)\n        pu4To[{first} + i] = (UINT32)aiValue[i];",
             f"{function.name}({handed});", "vAnswer(&rEvent, 0);"]
    parameters = ", ".join([*(f"{parameter.type} {parameter.name}" for parameter in (*numbers, text)), "UINT32 u4Code",
                            "va_list rValues"])
    return f"static PMX_RARE void vMuch_{function.name}({parameters})\n{{\n    {INDENT.join(body)}\n}}\n\n"


def printing(function, index):
    """The body for a format of the layer, of which is known how many values it takes."""
    *numbers, text, _ = [parameter.name for parameter in function.parameters]
    given = ", ".join([*numbers, text])
    first = len(numbers) + 1
    values = [f"iValue{i}" for i in range(FEW_VALUES)]
    lines = [f"long {', '.join(f'{value} = 0' for value in values)};", "PMX_EVENT_T rEvent;", "UINT32* pu4To;",
             "va_list rValues;",
             f"const UINT32 u4Code = PMX_SELDOM(rNow.prRecorder == 0) ? u4PmxCode({text}) | PMX_UNRECORDED "
             f": u4Tell({text});",
             f"va_start(rValues, {text});", f"if (PMX_SELDOM((u4Code & (PMX_UNRECORDED | 31)) > {FEW_VALUES}))", "{",
             f"    vMuch_{function.name}({given}, u4Code, rValues);", "    va_end(rValues);", "    return;", "}",
             "switch (PMX_CODE_COUNT(u4Code))", "{"]
    for count in range(FEW_VALUES, -1, -1):
        lines.append("default:" if count == FEW_VALUES else f"case {count}:")
        lines += [f"    {value} = va_arg(rValues, long);" for value in values[:count]]
        if count:
            lines.append("    if (PMX_CODE_TEXTS(u4Code) != 0)")
            lines.append(f"        vTellFew(PMX_CODE_TEXTS(u4Code), {', '.join(values)});")
        lines.append(f"    pu4To = pu4Call(&rEvent, PMX_RECORDER_CALL << 8 | {index}u << 16 | {3 + first + count});")
        lines += [f"    pu4To[{i}] = (UINT32){name};" for i, name in enumerate(numbers)]
        lines.append(f"    pu4To[{first - 1}] = (UINT32)(size_t){text};")
        lines += [f"    pu4To[{first + i}] = (UINT32){value};" for i, value in enumerate(values[:count])]
        lines += [f"    {function.name}({', '.join([given, *values[:count]])});", "    break;"]
    return INDENT.join([*lines, "}", "va_end(rValues);", "vAnswer(&rEvent, 0);"])


def exchanged(function, call):
    """A call in which the recorder's own functions and tables stand for the layer's."""
    for parameter in function.parameters:
        if parameter.kind == "symbol":
            other = "pfReal" if parameter.name.startswith("pf") else "pvReal"
            call = call.replace(parameter.name, f"{other}({parameter.name})")
    return call


def operation(function, index):
    real = f"pmx_recorded_{function.name}"
    if function.is_variadic:
        body = recording_format(function, index, real)
    else:
        body = recording(function, index, real, "PMX_RECORDER_OPERATION", True)
    return f"{function.declaration(real)};\n{function.declaration()}\n{{\n    {body}\n}}\n"


def platform_function(function, index):
    if interface.is_from_outside(function, False):
        body = recording_whole(function, index, function.name)
    elif function.is_variadic:
        return printing_much(function, index) + defined(function, printing(function, index))
    else:
        body = recording(function, index, function.name, "PMX_RECORDER_CALL", False)
    return defined(function, body)


def defined(function, body):
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
static const IVdp* aprPlane[PLANES];
static IVdp arOffered[PLANES];
static UINT32 au4Claimed[PLANES]; /* whoever finds 0 here and adds 1 fills the place */
static UINT32 au4Filled[PLANES];

static UINT32 u4OfferTable(void** ppvIf);
"""

OFFER = """
static UINT32 u4OfferTable(void** ppvIf)
{
    const IVdp* const prReal = (const IVdp*)*ppvIf;
    UINT32 i;
    if (prReal == 0)
        return PMX_SYMBOL_NULL;
    for (i = 0; i < PLANES; ++i)
    {
        if (PMX_RECORDER_PUBLISHED(&au4Filled[i]) == 0)
        {
            if (PMX_RECORDER_ADD(&au4Claimed[i], 1u) != 0)
                continue; /* another thread is at it */
            aprPlane[i] = prReal;
            arOffered[i] = *prReal;
            arOffered[i].pu4SetColorMode = apfPlaneCall[i];
            PMX_RECORDER_PUBLISH(&au4Filled[i], 1u);
        }
        if (aprPlane[i] != prReal)
            continue;
        *ppvIf = &arOffered[i];
        return PMX_SYMBOL_OTHER + 1 + i;
    }
    return PMX_SYMBOL_OTHER;
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


def most_beside_a_format():
    """Words of an event that a format from outside shares with others."""
    return 3 + max(len(function.parameters) for function in interface.operations() if function.is_variadic)


def hold_texts(layer):
    """There is a place for each text of the layer, and as many again."""
    most = interface.constant("PMX_RECORDER_TEXTS")
    read = interface.elf.Elf(layer)
    texts = len({text for section in read.sections if section.flags & interface.elf.STRINGS
                 and section.flags & interface.elf.ALLOC for text in read.bytes_of(section).split(b"\0")})
    if not 0 < texts <= most // 2:
        raise SystemExit(f"{layer} has {texts} texts; PMX_RECORDER_TEXTS has to be twice as many, and is {most}")


def source(layer):
    hold_texts(layer)
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
#include "pmx_recorder.h"

#define PMX_INTERFACE {interface.check_sum()}
#define PMX_EXPORTED_SIZE {exported_size}u
#define PMX_STATE_SIZE {size}u
#define PLANES {PLANES}u
DRV_STATIC_ASSERT(2 + PMX_WORDS(PMX_STATE_SIZE) <= PMX_RECORDER_LONGEST, "a snapshot is one event");
DRV_STATIC_ASSERT({most_beside_a_format()} + PMX_MOST_KEPT <= PMX_RECORDER_LONGEST, "so is a format with its values");

{''.join(private(name, size) for name, size, at in private_ones)}
{take("vPmxTakeExported", exported)}
{take("vPmxTakePrivate", private_ones)}
{watch(layer)}
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
