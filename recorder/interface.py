# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What recorder and replay have in common: the numbers of functions, and how the arguments of each become words. Both
are written from the headers, so that a replay makes of its arguments what the recorder made of them."""

import pathlib
import re
import sys
import zlib

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[1] / "tools" / "cost"))

import elf  # noqa: E402
import signatures  # noqa: E402

HEADERS = signatures.HEADERS
PLANE_CALL = signatures.PLANE_CALL
# Constant objects through which others call the layer, and what a symbol among the arguments is.
TABLES = ("_rPMXIF", "pmx_pm_ops")
SYMBOLS = {"_PMX_TmrIsr": "PMX_SYMBOL_ISR", "_rPMXIF": "PMX_SYMBOL_TABLE", "pmx_pm_ops": "PMX_SYMBOL_POWER"}
# These are handed texts that somebody else made, too. All other texts that the layer hands over are its own, and stay.
FROM_OUTSIDE = ("x_vsnprintf", "UTIL_Printf")
# This one also gets a text that was made from a format, and no values with it.
PRINTS_WHAT_WAS_MADE = "UTIL_Printf"
# Operations that take a format, and when they read it. Otherwise nobody may: a caller has it ready for a level that is
# on, perhaps, and no sooner.
READS_FORMAT_WHEN = {"PMX_Printf": "level >= 0 && level <= 31 && (PMX_debug_level >> level & 1u) != 0"}


def constant(name):
    """A number of pmx_recorder.h."""
    header = (pathlib.Path(__file__).parent / "pmx_recorder.h").read_text(encoding="utf-8")
    return int(re.search(rf"^#define {name} (\d+)u\b", header, re.M)[1])


def operations():
    return list(signatures.operations().values())


def platform():
    return list(signatures.platform().values())


def check_sum():
    """Tells interfaces apart: the numbers in a recording are those of one of them."""
    listed = [function.declaration() for function in (*operations(), *platform())]
    return f"0x{zlib.crc32(chr(10).join(listed).encode()):08X}u"


def variables(layer):
    """(name, size, whether neighbours see it) of the layer's variables, those first that neighbours see."""
    found = [(symbol.name, symbol.size, not symbol.is_local) for symbol in elf.Elf(layer).symbols
             if symbol.type == elf.OBJECT and symbol.section and symbol.section.flags & elf.WRITE]
    return sorted(found, key=lambda one: (not one[2], one[0]))


def placed(layer):
    """(name, size, offset) of the exported variables, of the private ones, and the sizes of the first and of all."""
    at, rows = 0, {True: [], False: []}
    exported_size = 0
    for name, size, is_exported in variables(layer):
        if not is_exported and not rows[False]:
            exported_size = at = (at + 3) // 4 * 4
        rows[is_exported].append((name, size, at))
        at += size
    return rows[True], rows[False], exported_size, (at + 3) // 4 * 4


def watched(layer):
    """(words that stand together: name of the first variable, number; single variables: name, size) of what neighbours
    see. Words are looked at faster than single variables."""
    rows = {}
    for symbol in elf.Elf(layer).symbols:
        if symbol.type == elf.OBJECT and symbol.section and symbol.section.flags & elf.WRITE:
            rows.setdefault(symbol.section, []).append(symbol)
    runs, single = [], []
    for section, symbols in rows.items():
        run = []
        for symbol in [*sorted(symbols, key=lambda one: one.value), None]:
            if symbol and not symbol.is_local:
                run.append(symbol)
                continue
            end = run[-1].value + run[-1].size if run else 0
            if run and run[0].value % 4 == 0 and section.align >= 4 and end >= run[0].value + 4:
                words = min((end - run[0].value + 3) // 4, (section.size - run[0].value) // 4)
                runs.append((run[0].name, words))
                run = [one for one in run if one.value + one.size > run[0].value + 4 * words]
            single += [(one.name, one.size) for one in run]
            run = []
    return runs, single


def is_from_outside(function, is_operation):
    """Whether texts are kept, or their check sums, in place of where they stand."""
    return is_operation or function.name in FROM_OUTSIDE


def is_text_out(parameter):
    return bool(parameter.written) and "strlen" in parameter.written


def fixed_outputs(function):
    """What is written behind pointers and has a size that is known before."""
    return [parameter for parameter in function.parameters if parameter.written and not is_text_out(parameter)]


def tables(function):
    return [parameter for parameter in function.parameters if parameter.kind == "table"]


def size_of(parameter, expression):
    return f"({parameter.name} == 0 ? 0 : u4PmxSize({expression}, PMX_MOST_BYTES))"


def encoding(function):
    """The lines that put what a platform function is handed into au4Words, from u4Used on."""
    lines, previous = [], ""
    is_format_kept = "list" in [parameter.kind for parameter in function.parameters]
    for parameter in function.parameters:
        name = parameter.name
        if parameter.kind == "list":
            lines.append("u4Used = u4PmxPutSums(au4Words, u4Used, &rKept, aiValues);")
        elif parameter.kind == "values":
            code = "u4Code"
            if function.name == PRINTS_WHAT_WAS_MADE:
                code = f"u4PmxNumbersAlone(u4Code, {previous}, PMX_FRAME(au4Words))"
            lines.append(f"u4Used = u4PmxPutValues(au4Words, u4Used, {code}, aiValues);")
        elif parameter.kind == "tag":
            lines.append(f"au4Words[u4Used++] = (UINT32)(size_t){name};")
        elif parameter.kind == "symbol":
            lines.append(f"au4Words[u4Used++] = u4Symbol((size_t){name});")
        elif parameter.kind == "text" and is_format_kept:
            lines.append(f"vPmxKeep(&rKept, {name}, aiValues);")
            lines.append(f"au4Words[u4Used++] = u4PmxBeginning({name}, PMX_KEPT(rKept.u4Format));")
        elif parameter.kind == "text":
            lines.append(f"au4Words[u4Used++] = u4PmxText({name});")
        elif parameter.kind == "data":
            lines.append(f"u4Used = u4PmxPutBytes(au4Words, u4Used, {name}, {name} == 0 ? 0 : {parameter.read});")
        elif parameter.kind in ("place", "table"):
            lines.append(f"au4Words[u4Used++] = {name} != 0;")
        else:
            lines.append(f"au4Words[u4Used++] = (UINT32){name};")
        previous = name
    return lines


def collecting(function):
    """The lines that gather the values of a format first."""
    kinds = [parameter.kind for parameter in function.parameters]
    if "values" not in kinds and "list" not in kinds:
        return []
    [text] = [parameter.name for parameter in function.parameters if parameter.kind == "text"]
    kept, begin = [], f"va_start(rValues, {text});"
    if "list" in kinds:
        kept = ["PMX_KEPT_T rKept;"]
        [given] = [parameter.name for parameter in function.parameters if parameter.kind == "list"]
        begin = f"va_copy(rValues, {given});"
    return ["long aiValues[PMX_MOST_VALUES] = { 0 };", f"const UINT32 u4Code = u4PmxCode({text});", "va_list rValues;",
            *kept, begin, "vPmxCollect(u4Code, rValues, aiValues);", "va_end(rValues);"]


def handed_on(function):
    """The arguments of the call behind."""
    names = [parameter.name for parameter in function.parameters if parameter.kind != "values"]
    if function.is_variadic:
        names += [f"aiValues[{i}]" for i in range(16)]
    return ", ".join(names)


def room(function):
    """How many words what a platform function is handed takes at most, behind three others."""
    sizes = {"data": 65, "values": 16, "list": 16}
    return 3 + sum(sizes.get(parameter.kind, 1) for parameter in function.parameters)
