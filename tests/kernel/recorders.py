#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes what stands around the port in a kernel from the headers: a recorder of every platform function, and a table
of all that a scenario can call.

usage: recorders.py FILE WRAPPED     the C file, and the linker's list of the functions that are recorded
"""

import pathlib
import sys
import textwrap

sys.dont_write_bytecode = True
ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "cmake"))

import declarations  # noqa: E402
import pointers  # noqa: E402
from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, function_pointers, functions  # noqa: E402

SLOT_HEADER = "src/driver/private_inc/drv_if_pmx.h"
RECORD_HEADERS = (SLOT_HEADER, "src/driver/private_inc/drv_av_d.h", "src/driver/inc/x_avd.h")
BY_HAND = ["PMX_IsLog", "Printf", "UTIL_Printf"]  # record.c: their arguments vary
NOT_RECORDED = ["x_vsnprintf"]                    # its values cannot be read twice
OF_THE_PORT = ["pmx_power_begin", "pmx_power_end", "pmx_console_end"]
SCRIPTED = {"x_sema_lock", "x_sema_unlock", "i4GetHotPlugStatus", "fgIsHotPlugChgRes", "fgVdpIsWaitforSyncCtrl",
            "VDP_GetHwEnable", "fgPmxDrvSetAvd", "fgPmxDrvGetAvdInfo", "PMX_HalSetPlaneOrder"}
ACTS_WHEN_IT_FAILS = {"x_sema_unlock"}
UNTOUCHED = "0xA5A5A5A5"

HEADERS = [LAYER_HEADER, *PLATFORM_HEADERS]
CALLBACKS = {pointer.function.name for header in HEADERS for pointer in function_pointers(ROOT / header)
             if pointer.is_type}
RECORDS = {record.name: record for header in RECORD_HEADERS if (ROOT / header).exists()
           for record in declarations.records(declarations.read(ROOT / header))}
ENUMERATIONS = {name: each for header in HEADERS
                for name, each in pointers.enumerations(declarations.read(ROOT / header)).items()}


def value(expression, type_name):
    """Statements that record a value, a record's fields one after the other."""
    if type_name not in RECORDS:
        return [f"line_number(line, {expression});"]
    inside = [statement for field in RECORDS[type_name].fields
              for statement in value(f"{expression}.{field.name}", field.type)]
    return ["line_open(line, '{');", *inside, "line_close(line, '}');"]


def items(name, count):
    return [f"line_open(line, '[');", f"for (i = 0; i < (int)({count}); i++)",
            f"    line_number(line, {name}[i]);", "line_close(line, ']');"]


def by_number(function, pointer, name):
    """A record or a number of the type that another parameter asks for."""
    lines = [f"switch ({pointer.size})", "{"]
    for enumerator, type_name in pointers.types_by_value(function, pointer, ENUMERATIONS).items():
        lines += [f"case {enumerator}:", *("    " + each for each in value(f"(*({type_name}*){name})", type_name)),
                  "    break;"]
    return lines + ["default:", "    line_unchanged(line);", "}"]


def argument(function, type_name, name):
    """Statements that record an argument, behind the call."""
    if not pointers.is_pointer(type_name, CALLBACKS):
        return [f"line_number(line, (long long){name});"]
    pointer = pointers.pointer_of(function, type_name, name, CALLBACKS)
    received = "*" if type_name.endswith("**") else ""
    if pointer.kind == "tag":
        recorded = [f"line_number(line, (unsigned long){received}{name});"]
    elif pointer.kind == "symbol":
        recorded = [f"line_symbol(line, (const void*){received}{name});"]
    elif pointer.kind == "text":
        recorded = [f"line_text(line, {name});"]
    elif pointer.kind == "by":
        recorded = by_number(function, pointer, name)
    elif pointer.kind == "bytes":
        recorded = items(f"((const UINT8*){name})", pointer.size)
    else:
        recorded = items(name, pointer.size) if pointer.size else [f"line_number(line, *{name});"]
    is_left_alone = received or pointer.size
    if pointer.direction == "out" and function.has_result and is_left_alone:
        return ["if (fails)", "    line_unchanged(line);", "else", "{", *("    " + each for each in recorded), "}"]
    if pointer.kind in ("items", "bytes", "by"):
        return [f"if (!{name})", "    line_number(line, 0);", "else", "{", *("    " + each for each in recorded), "}"]
    return recorded


def recorder(function):
    """__wrap_FUNCTION, which calls what is scripted, and that or itself the port."""
    name, handed = function.name, ", ".join(function.parameters)
    if name == "x_timer_start":
        handed = handed.replace("pfCallback", "recorded_expiry(pfCallback)")
    called = f"script_{name}" if name in SCRIPTED else f"__real_{name}"
    lines = ["int i, answer;", "bool fails = false;", f'struct line* line = line_begin("{name}");', ""]
    if function.has_result:
        lines = [f"{function.result} result;", *lines, f'if (script_fails("{name}", &answer))', "{"]
        lines += [f"    {called}({handed});"] * (name in ACTS_WHEN_IT_FAILS)
        lines += [f"    result = ({function.result})answer;", "    fails = true;", "}", "else", "{",
                  f"    result = {called}({handed});", "    fails = (int)result < 0;", "}"]
    else:
        lines.append(f"{called}({handed});")
    for type_name, parameter in pointers.declared_parameters(function):
        lines += argument(function, type_name, parameter)
    lines.append("line_end_result(line, (long long)result);" if function.has_result else "line_end(line);")
    lines += [f'script_call_ends("{name}");', *["(void)i;", "(void)answer;", "(void)fails;"]]
    lines += ["return result;"] * function.has_result
    declared = "".join(f"{function.result} {each}({function.declared});\n"
                       for each in (f"__real_{name}", f"__wrap_{name}", *([called] if name in SCRIPTED else [])))
    body = textwrap.indent("\n".join(lines), "    ")
    return f"{declared}{function.result} __wrap_{name}({function.declared})\n{{\n{body}\n}}\n"


def read_outputs(name, count):
    """An argument of records: their numbers stand one after the other."""
    return [f"PMX_RESOLUTION_T {name}s[{count}] = {{}};",
            f"PMX_RESOLUTION_T* {name} = is_null(words) ? NULL : {name}s;",
            f"for (i = 0; {name} && i < {count}; i++)", "{",
            *(f"    {name}s[i].{field} = number(words);" for field in (
                "fgOutputEnable", "eResMode", "u4VFreq", "eCcirDrvInfo.eDgoMode", "eCcirDrvInfo.eDgoFmt",
                "eCcirDrvInfo.eDgiMode", "eCcirDrvInfo.eDgiFmt")), "}"]


def parameter(contract, type_name, name):
    """(statements that read it, the argument, statements that tell an output)"""
    if not pointers.is_pointer(type_name, CALLBACKS):
        return [f"{type_name} {name} = number(words);"], name, []
    pointer = pointers.pointer_of(contract, type_name, name, CALLBACKS)
    if pointer.kind == "tag":
        return [f"void* {name} = is_null(words) ? NULL : (void*)(unsigned long)number(words);"], name, []
    if pointer.target in RECORDS:
        return read_outputs(name, pointer.size), name, []
    if pointer.direction == "in":
        return [f"{pointer.target} {name}s[{pointer.size}];",
                f"{pointer.target}* {name} = is_null(words) ? NULL : {name}s;",
                f"for (i = 0; {name} && i < {pointer.size}; i++)", f"    {name}s[i] = number(words);"], name, []
    read = [f"{pointer.target} {name}s = ({pointer.target}){UNTOUCHED};",
            f"{pointer.target}* {name} = is_null(words) ? NULL : &{name}s;"]
    told = [f"if ({name} && {name}s == ({pointer.target}){UNTOUCHED})", f'    trace_result("*{name} untouched");',
            f"else if ({name})", f'    trace_result("*{name} = %lld", (long long){name}s);']
    return read, name, told


def command(function, contract, called, is_slot):
    """A function that reads a call's arguments, makes it and tells what it answers."""
    read, handed, told = [], [], []
    listed = list(pointers.declared_parameters(function))
    for type_name, name in listed[1:] if is_slot else listed:
        statements, given, tells = parameter(contract, type_name, name)
        read += statements
        handed.append(given)
        told += tells
    if is_slot:
        handed.insert(0, "pvTag")
        called = f"((const IPMX*)table)->{function.name}"
        read = ["void *table, *itsTag, *pvTag;", 'bool itsOwn = strcmp(word(words), "tag") == 0;',
                "long long other = itsOwn ? 0 : number(words);", *read,
                "if (i4ImQueryInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, &table, &itsTag) < 0)", "{",
                "    words->wrong = true;", "    return;", "}",
                "pvTag = itsOwn ? itsTag : (void*)(unsigned long)other;"]
    lent = "prOutConf" in handed
    call = f"{called}({', '.join(handed)})"
    made = [f"result = (long long){call};"] if function.has_result else [f"{call};"]
    made = ["lent_outputs = prOutConf;", *made, "lent_outputs = NULL;"] if lent else made
    made += ["i4ImReleaseInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, itsTag);"] * is_slot
    verb = "ipmx" if is_slot else function.name
    result = [f'trace_result("{verb} = %lld", result);'] if function.has_result else []
    body = ["int i;", "long long result = 0;", *read, "(void)i;", "(void)result;", "if (words->wrong)", "    return;",
            *made, *result, *told]
    text = textwrap.indent("\n".join(body), "    ")
    return f"static void run_{function.name}(struct words* words)\n{{\n{text}\n}}\n"


def operations():
    return [function for function in functions(ROOT / LAYER_HEADER) if "..." not in function.declared]


def slots():
    offered = {function.name: function for function in functions(ROOT / LAYER_HEADER)}
    return [(pointer.function, offered[pointer.model]) for pointer in function_pointers(ROOT / SLOT_HEADER)
            if not pointer.is_type]


def recorded():
    found = [function for header in PLATFORM_HEADERS for function in functions(ROOT / header)]
    return [function for function in found if function.name not in BY_HAND + NOT_RECORDED]


def table(name, listed):
    rows = "".join(f'    {{ "{each}", run_{each} }},\n' for each in listed)
    return f"const struct command {name}[] = {{\n{rows}    {{}}\n}};\n"


def code():
    includes = "".join(f'#include "{pathlib.PurePath(header).name}"\n' for header in sorted(HEADERS))
    parts = ["// SPDX-License-Identifier: MIT OR GPL-2.0-only\n/* Written from the headers. */\n"
             f'#include <linux/string.h>\n\n{includes}#include "record.h"\n',
             "x_timer_cb_fct recorded_expiry(x_timer_cb_fct function);\n", *map(recorder, recorded()),
             *(command(function, function, function.name, False) for function in operations()),
             *(command(function, model, "", True) for function, model in slots()),
             table("operations", [function.name for function in operations()]),
             table("slots", [function.name for function, _ in slots()])]
    return "\n".join(parts)


def main():
    pathlib.Path(sys.argv[1]).write_text(code(), encoding="utf-8")
    names = [function.name for function in recorded()] + BY_HAND + OF_THE_PORT
    pathlib.Path(sys.argv[2]).write_text("".join(f"--wrap={name}\n" for name in names), encoding="utf-8")


if __name__ == "__main__":
    main()
