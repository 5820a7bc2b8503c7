#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes what two layers side by side have in common, from the headers: the platform's functions, which hand all that
they are given to a recorder, and the tables of operations, state and names with both layers' addresses.

usage: generate.py OUTPUT
"""

import pathlib
import re
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "tools" / "cost"))

import signatures  # noqa: E402

LAYERS = ("first_", "second_")  # what stands before the names of either layer
NAMED = ("_rPMXIF", "pmx_pm_ops", "_PMX_TmrIsr")
STATE_HEADERS = ("src/driver/private_inc/drv_if_pmx.h", "src/driver/pmx/pmx_if.h")
STATE = re.compile(r"^extern (?:PMX_API )?(?!const\b)\w+ (\w+)(?:\[\d+\])?;", re.M)
OPERATION_WITH_VALUES = "PMX_Printf"


def state():
    """The layer's variables, as its headers declare them."""
    return [name for header in STATE_HEADERS
            for name in STATE.findall((signatures.ROOT / header).read_text(encoding="utf-8"))]


def parameters(function):
    return ", ".join(f'{{ "{parameter.type}", "{parameter.name}", Kind::{parameter.kind} }}'
                     for parameter in function.parameters)


def function_row(function, index, prefix):
    listed = f"{prefix}_parameters_{index}" if function.parameters else "nullptr"
    return f'{{ "{function.name}", "{function.result}", {listed}, {len(function.parameters)} }}'


def parameter_tables(functions, prefix):
    return "\n".join(f"static const Parameter {prefix}_parameters_{i}[] = {{ {parameters(function)} }};"
                     for i, function in enumerate(functions) if function.parameters)


def stand_in(function, index):
    """A function of the platform."""
    lines, writes, previous = [f"Recorder call({index});"], [], ""
    for parameter in function.parameters:
        name = parameter.name
        if parameter.kind == "values":
            lines += ["va_list values;", f"va_start(values, {previous});", f"call.values({previous}, values);",
                      "va_end(values);"]
        elif parameter.kind == "list":
            lines.append(f"call.values({previous}, {name});")
        elif parameter.kind == "symbol":
            lines.append(f"call.symbol(reinterpret_cast<const void*>({name}));")
        elif parameter.kind == "data":
            lines.append(f"call.data({name}, {name} == nullptr ? 0 : {parameter.read});")
        elif parameter.kind == "table":
            lines.append(f"call.place({name});")
        else:
            lines.append(f"call.{parameter.kind}({name});")
        if parameter.written and parameter.kind != "table":
            element = parameter.type.removesuffix("*")
            width = "1" if element == "void" else f"sizeof({element})"
            writes.append(f"call.write({name}, ({parameter.written}) / {width}, {width});")
        previous = name
    lines.append(f"const std::int64_t result = call.answer({str(function.result == 'BOOL').lower()}, "
                 f"{str(function.result == 'UINT32').lower()});")
    if function.name in ("x_sema_create", "x_timer_create", "i4NFBPartitionRead"):
        lines.append("if (result == 0)")  # a failure leaves the place as it was
    if function.name == "x_vsnprintf":
        writes = ["call.write_text(szBuffer, zSize);"]
    if function.name == "i4ImQueryInterface":
        writes = ["*ppvIf = const_cast<IVdp*>(&plane_table);", "call.write_tag(ppvTag);"]
    lines += writes
    lines.append(f"return ({function.result})result;" if function.has_result else "(void)result;")
    body = "\n    ".join(lines)
    return f"{function.declaration()}\n{{\n    {body}\n}}\n"


def thunk(function, index):
    """Calls an operation, given its address and its arguments as they are kept."""
    types = ", ".join("..." if parameter.kind == "values" else parameter.type for parameter in function.parameters)
    given = ", ".join(f"({parameter.type})arguments[{i}]" for i, parameter in enumerate(function.parameters)
                      if parameter.kind != "values")
    if function.is_variadic:  # its formats take a number and a text
        given += ", (int)arguments[2], (const char*)arguments[3]"
    call = f"(({function.result} (*)({types or 'void'}))entry)({given})"
    body = f"return (std::uint64_t)(std::int64_t){call};" if function.has_result else f"{call};\n    return 0;"
    return (f"static std::uint64_t run_{index}(const void* entry, const std::uint64_t* arguments)\n{{\n"
            f"    (void)arguments;\n    {body}\n}}\n")


def external(name, kind):
    """Declarations of something that both layers have under a name; an older one may lack it."""
    return "".join(f'extern "C" {kind} {layer}{name}{"()" if kind == "void" else "[]"} __attribute__((weak));\n'
                   for layer in LAYERS)


def addresses(name):
    return ", ".join(f"(void*){layer}{name}" for layer in LAYERS)


def takes_null(contract):
    return str("null pointer" in contract or contract.startswith("IPMX")).lower()


def source():
    functions = list(signatures.platform().values())
    offered = list(signatures.operations().values())
    contracts = {declared.name: declared.contract for declared in signatures.platform_functions.functions(
        signatures.ROOT / signatures.platform_functions.LAYER_HEADER)}
    includes = "\n".join(f'#include "{header}"' for header in signatures.HEADERS)
    objects = [name for name in NAMED if name not in signatures.operations()]
    rows = "\n".join(f'    {{ {function_row(function, i, "operation")}, run_{i}, {{ {addresses(function.name)} }}, '
                     f"{takes_null(contracts[function.name])} }}," for i, function in enumerate(offered))
    externals = [external(function.name, "void") for function in offered]
    externals += [external(name, "unsigned char") for name in [*state(), *objects]]
    return f"""// Written from the headers when the program is built.
#include <cstdarg>
#include <cstring>

#include "tests/lockstep/lockstep.h"
#include "tests/lockstep/recorder.h"

{includes}

using namespace lockstep;

{parameter_tables(functions, "platform")}

const Function lockstep::platform[] = {{
{chr(10).join(f"    {function_row(function, i, 'platform')}," for i, function in enumerate(functions))}
}};
const unsigned lockstep::platform_count = {len(functions)};

extern "C"
{{
{chr(10).join(stand_in(function, i) for i, function in enumerate(functions))}
}}

const IVdp lockstep::plane_table = {{ .pu4SetColorMode = {signatures.PLANE_CALL} }};

{"".join(externals)}
{parameter_tables(offered, "operation")}

{chr(10).join(thunk(function, i) for i, function in enumerate(offered))}
const Operation lockstep::operations[] = {{
{rows}
}};
const unsigned lockstep::operation_count = {len(offered)};

const Named lockstep::state_objects[] = {{
{chr(10).join(f'    {{ "{name}", {{ {addresses(name)} }} }},' for name in state())}
}};
const unsigned lockstep::state_object_count = {len(state())};

const Named lockstep::named_addresses[] = {{
{chr(10).join(f'    {{ "{name}", {{ {addresses(name)} }} }},' for name in NAMED)}
}};
const unsigned lockstep::named_address_count = {len(NAMED)};
"""


def main():
    pathlib.Path(sys.argv[1]).write_text(source(), encoding="utf-8")


if __name__ == "__main__":
    main()
