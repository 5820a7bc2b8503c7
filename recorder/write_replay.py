#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the platform on which a recording is replayed, and the table of what can be called there.

usage: write_replay.py LAYER OUTPUT     LAYER: pmx_if.o, which tells what state it has
"""

import pathlib
import sys

import interface

PLANE = "replayed_plane_call"


def call_of(function, index):
    lines = interface.collecting(function)
    lines = [*lines, f"UINT32 au4Words[{interface.room(function)}];", "UINT32 u4Used = 3;",
             *interface.encoding(function)]
    reserved = [f"PMX_WORDS({interface.size_of(output, output.written)})"
                for output in interface.fixed_outputs(function)] + ["1"] * len(interface.tables(function))
    room = " + ".join(reserved) or "0"
    lines.append(f"[[maybe_unused]] Answer answer = Replay::call({index}, au4Words, u4Used, {room});")
    for output in interface.fixed_outputs(function):
        lines.append(f"answer.write({output.name}, {interface.size_of(output, output.written)});")
    for parameter in function.parameters:
        if interface.is_text_out(parameter):
            lines.append(f"answer.write_text({parameter.name}, zSize);")
    if interface.tables(function):
        lines += ["answer.write_table(ppvIf, &plane_table);", "answer.write_tag(ppvTag);"]
    lines.append("Replay::go_on();")
    if function.has_result:
        lines.append(f"return static_cast<{function.result}>(answer.number);")
    return "\n    ".join(lines)


def stand_in(function, index):
    is_plane = function.name == interface.PLANE_CALL
    name = PLANE if is_plane else f"pmx_replay_{function.name}"
    declared = ("static " if is_plane else "") + function.declaration(name)
    return f"{declared}\n{{\n    {call_of(function, index)}\n}}\n"


def argument(parameter):
    """(what it is read into, what is handed over)."""
    name = parameter.name
    if parameter.kind == "tag":
        return f"void* const {name} = reinterpret_cast<void*>(std::uintptr_t{{ given.number() }});", name
    if parameter.kind == "text":
        return f"Bytes {name} = given.bytes();", f"{name}.text()"
    if not parameter.is_tested:
        return f"Bytes {name} = given.bytes();", f"static_cast<{parameter.type}>({name}.pointer_or_spare())"
    if parameter.kind in ("data", "place"):
        return f"Bytes {name} = given.bytes();", f"static_cast<{parameter.type}>({name}.pointer())"
    return f"const auto {name} = static_cast<{parameter.type}>(given.number());", name


def thunk(function, index):
    lines, handed, name = [], [], f"pmx_replayed_{function.name}"
    for parameter in function.parameters:
        if parameter.kind == "values":
            lines.append(f"const std::vector<long> values = given.values({handed[-1]});")
            handed += [f"values[{i}]" for i in range(16)]
            continue
        line, word = argument(parameter)
        lines.append(line)
        handed.append(word)
    call = f"{name}({', '.join(handed)});"
    lines.append(f"const auto result = {call}" if function.has_result else call)
    for output in interface.fixed_outputs(function):
        if not output.is_tested:
            lines.append(f'given.note_loss("{output.name}", {output.name});')
        lines.append(f"{output.name}.put_into(written);")
    lines.append("return static_cast<UINT32>(result);" if function.has_result else "return 0;")
    body = "\n    ".join(lines)
    return (f"static UINT32 run_{index}([[maybe_unused]] Given& given, [[maybe_unused]] std::vector<UINT32>& written)\n"
            f"{{\n    {body}\n}}\n")


def described(function, is_operation):
    rows = ", ".join(f'{{ "{parameter.name}", "{parameter.kind}" }}' for parameter in function.parameters)
    says = [str(told).lower() for told in (function.has_result, not interface.is_from_outside(function, is_operation))]
    return f'{{ "{function.name}", {", ".join(says)}, {{ {rows} }} }}'


def source(layer):
    exported, private, exported_size, size = interface.placed(layer)
    offered, platform = interface.operations(), interface.platform()
    includes = "\n".join(f'#include "{header}"' for header in interface.HEADERS)
    originals = "\n".join(function.declaration(f"pmx_replayed_{function.name}") + ";" for function in offered)
    variables = "\n".join(f"extern unsigned char pmx_replayed_{name}[];" for name, _, _ in (*exported, *private))
    rows = ", ".join(f'{{ "{name}", pmx_replayed_{name}, {length}, {at} }}'
                     for name, length, at in (*exported, *private))
    listed = ",\n".join(f"    {{ {described(function, True)}, run_{i} }}" for i, function in enumerate(offered))
    called = ",\n".join(f"    {described(function, False)}" for function in platform)
    [plane] = [function for function in platform if function.name == interface.PLANE_CALL]
    functions = "\n".join(stand_in(function, i) for i, function in enumerate(platform))
    return f"""// Written from the headers when the tool is built.
#include <cstdarg>
#include <cstdint>
#include <vector>

#include "recorder/encoding.h"
#include "tools/pmxboard/recording/replayed.h"

{includes}

using namespace pmxboard;

extern "C" {{
{originals}
{variables}
extern const unsigned char pmx_replayed__rPMXIF[];
extern const unsigned char pmx_replayed_pmx_pm_ops[];
static {plane.declaration(PLANE)};

static const IVdp plane_table = {{ .{interface.PLANE_CALL} = {PLANE} }};

static UINT32 u4Symbol(std::uintptr_t address)
{{
    return address == 0 ? PMX_SYMBOL_NULL
           : address == reinterpret_cast<std::uintptr_t>(&pmx_replayed__PMX_TmrIsr) ? PMX_SYMBOL_ISR
           : address == reinterpret_cast<std::uintptr_t>(pmx_replayed__rPMXIF) ? PMX_SYMBOL_TABLE
           : address == reinterpret_cast<std::uintptr_t>(pmx_replayed_pmx_pm_ops) ? PMX_SYMBOL_POWER
           : PMX_SYMBOL_OTHER;
}}

{functions}
}}

{chr(10).join(thunk(function, i) for i, function in enumerate(offered))}
static const std::vector<ReplayedOperation> all_operations = {{
{listed}
}};
static const std::vector<Described> all_functions = {{
{called}
}};
static const std::vector<Variable> all_variables = {{ {rows} }};

const ReplayedLayer& pmxboard_replayed_layer()
{{
    static const ReplayedLayer layer = {{ {interface.check_sum()}, {exported_size}, {size}, all_operations,
                                         all_functions, all_variables }};
    return layer;
}}
"""


def main():
    layer, output = sys.argv[1:]
    pathlib.Path(output).write_text(source(layer), encoding="utf-8")


if __name__ == "__main__":
    main()
