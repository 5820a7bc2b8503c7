# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the functions that stand between the layer and its surroundings while paths are recorded: one for each
operation and each function of the platform, put in place by the linker (--wrap)."""

import signatures

PRINTERS = {"PMX_IsLog": "PMX_IsLog(i4Level, ", "Printf": "Printf(", "UTIL_Printf": "UTIL_Printf("}


def _records(function):
    """The lines that record the arguments."""
    previous = ""
    for parameter in function.parameters:
        name = parameter.name
        if parameter.kind == "number":
            yield f"call.number({name});"
        elif parameter.kind in ("tag", "text"):
            yield f"call.{parameter.kind}({name});"
        elif parameter.kind == "symbol":
            yield f"call.symbol(reinterpret_cast<const void*>({name}));"
        elif parameter.kind == "data":
            yield f"call.data({name}, {name} == nullptr ? 0 : {parameter.read});"
        elif parameter.kind == "values":
            yield f"va_list values;\n    va_start(values, {previous});\n    call.values({previous}, values);\n" \
                  "    va_end(values);"
        elif parameter.kind != "list":
            yield f"call.place({name});"
        previous = name


def _outputs(function):
    for index, parameter in enumerate(function.parameters):
        if parameter.written:
            name = parameter.name
            yield f"call.wrote({index}, {name}, {name} == nullptr ? 0 : {parameter.written});"


def _forward(function):
    """The call of the real function; what is formatted goes on as text."""
    names = [parameter.name for parameter in function.parameters]
    if function.name in PRINTERS:
        lead = "i4Level, " if function.name == "PMX_IsLog" else ""
        return ("char text[4096];\n    va_start(values, szFormat);\n    "
                "vsnprintf(text, sizeof text, szFormat, values);\n"
                f"    va_end(values);\n    __real_{function.name}({lead}\"%s\", text);")
    if function.is_variadic:  # an operation that is called without values
        names.pop()
    given = ", ".join(names)
    if not function.has_result:
        return f"__real_{function.name}({given});"
    return f"const {function.result} result = __real_{function.name}({given});"


def _wrapper(function, kind):
    lines = [f"cost::Call call(cost::Call::Kind::{kind}, \"{function.name}\");", *_records(function),
             _forward(function), *_outputs(function)]
    if function.name == "i4ImQueryInterface":
        lines += ["if (result >= 0 && u4IfId == IID_IVdp)\n        cost::exchange_table(ppvIf, ppvTag);",
                  "call.wrote(4, ppvTag, sizeof *ppvTag);"]
    if function.has_result:
        lines += ["call.answered(static_cast<std::int64_t>(result));", "return result;"]
    body = "\n    ".join(lines)
    return (f"{function.declaration('__real_' + function.name)};\n"
            f"{function.declaration('__wrap_' + function.name)}\n{{\n    {body}\n}}\n")


def wrapped():
    """Names for the linker."""
    return [*signatures.operations(), *(name for name in signatures.platform() if name != signatures.PLANE_CALL)]


def state_objects(objects):
    """The table of what the layer holds. `objects`: (symbol, size) of each."""
    declared = "\n".join(f'extern "C" unsigned char state_{i}[{size}] __asm__("{name}");'
                         for i, (name, size) in enumerate(objects))
    rows = "\n".join(f'    {{ "{name}", state_{i}, {size} }},' for i, (name, size) in enumerate(objects))
    return f"""{declared}

const cost::StateObject cost::state_objects[] = {{
{rows}
}};
const std::size_t cost::state_object_count = {len(objects)};
"""


def named_addresses():
    names = ["_rPMXIF", "pmx_pm_ops", "_PMX_TmrIsr"]
    rows = "\n".join(f'    {{ "{name}", real_{name} }},' for name in names)
    declared = "\n".join(f'extern "C" const unsigned char real_{name}[] __asm__("'
                         f'{"__real_" if name in signatures.operations() else ""}{name}");' for name in names)
    return f"""{declared}
const cost::NamedAddress cost::named_addresses[] = {{
{rows}
}};
const std::size_t cost::named_address_count = {len(names)};
"""


def source(objects):
    includes = "\n".join(f'#include "{header}"' for header in signatures.HEADERS)
    wrappers = "\n".join([*(_wrapper(function, "Operation") for function in signatures.operations().values()),
                          *(_wrapper(function, "Platform") for name, function in signatures.platform().items()
                            if name != signatures.PLANE_CALL)])
    return f"""// Written from the headers when the cost is measured.
#include <cstdarg>
#include <cstdio>
#include <cstring>

#include "tools/cost/recorder.h"

{includes}

extern "C"
{{
{wrappers}
}}

{named_addresses()}
{state_objects(objects)}"""
