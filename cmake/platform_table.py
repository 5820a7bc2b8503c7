#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the table of platform functions that the board is built with: which have a result, what they are given, and
what may be put into their outputs.

usage: platform_table.py OUTPUT     the table behind board::platform_functions()
"""

import pathlib
import sys

sys.dont_write_bytecode = True

import pointers  # noqa: E402
from declarations import Unclear  # noqa: E402
from platform_functions import PLATFORM_HEADERS, ROOT, function_pointers, functions  # noqa: E402


def _put(function, pointer, known):
    """What puts something into an output, called with nowhere to put it; nothing for what goes by its address."""
    if pointer.kind == "symbol":
        return ""
    if pointer.kind == "by":
        types = set(pointers.types_by_value(function, pointer, known).values())
        if len(types) != 1:
            raise Unclear(f"{function.name}: a fault cannot tell which of several records an output is")
        return f"put_record<{types.pop()}>(nullptr, written)"
    if pointer.kind in ("bytes", "text"):
        return f"put_{pointer.kind}(nullptr, 0, written)"
    if pointer.kind == "tag":
        return "put_tag(nullptr, written)"
    if pointer.size:
        return f"put_list<{pointer.target}>(nullptr, {pointer.size}, written)"
    return f"put_number<{pointer.target}>(nullptr, written)"


def _parameters(function, callbacks, known):
    for type_name, name in pointers.declared_parameters(function):
        if type_name == "va_list":
            continue
        if not pointers.is_pointer(type_name, callbacks):
            yield f'{{ "{name}", true, true, false, nullptr }}'
            continue
        pointer = pointers.pointer_of(function, type_name, name, callbacks)
        put = _put(function, pointer, known) if pointer.is_written else ""
        check = f"[](std::string_view written) {{ outputs::{put}; }}" if put else "nullptr"
        yield f'{{ "{name}", false, {str(pointer.is_read).lower()}, {str(pointer.is_written).lower()}, {check} }}'


def table(root):
    callbacks = {pointer.function.name for header in PLATFORM_HEADERS for pointer in function_pointers(root / header)
                 if pointer.is_type}
    known = {name: types for header in PLATFORM_HEADERS
             for name, types in pointers.enumerations((root / header).read_text(encoding="utf-8")).items()}
    listed = [(header, function) for header in PLATFORM_HEADERS for function in functions(root / header)]
    names = [function.name for _, function in listed]
    twice = sorted({name for name in names if names.count(name) > 1})
    if twice or not listed:
        raise Unclear("declared twice: " + ", ".join(twice) if twice else "the headers declare no function")
    lists, rows = [], []
    for header, function in listed:
        try:
            parameters = ",\n    ".join(_parameters(function, callbacks, known))
        except Unclear as reason:
            raise Unclear(f"{header}:{function.line}: {reason}") from None
        if parameters:
            lists.append(f"constexpr PlatformParameter OF_{function.name}[] = {{\n    {parameters},\n}};")
        rows.append(f'        {{ "{function.name}", {str(function.has_result).lower()}, '
                    f'{"OF_" + function.name if parameters else "{}"} }},')
    includes = "\n".join(f'#include "{pathlib.Path(header).name}"' for header in PLATFORM_HEADERS)
    definitions, table_rows = "\n".join(lists), "\n".join(rows)
    return f"""// Written from the platform headers when the board is built.
#include "board/outputs.h"
#include "board/trace.h"
{includes}

namespace board
{{
namespace
{{

{definitions}

}} // namespace

std::span<const PlatformFunction> platform_functions()
{{
    static constexpr PlatformFunction FUNCTIONS[] = {{
{table_rows}
    }};
    return FUNCTIONS;
}}

}} // namespace board
"""


def main():
    try:
        text = table(ROOT)
    except Unclear as reason:
        sys.exit(str(reason))
    pathlib.Path(sys.argv[1]).write_text(text, encoding="utf-8")


if __name__ == "__main__":
    main()
