#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the operations that a scenario can call, as the headers declare them: the layer's own, the functions of the
platform that a neighbouring driver would call, and the slots of the mixer's table.

usage: operations.py OUTPUT     the tables behind operations(), neighbours() and ipmx_slots()

How an argument is written is told by its type (tools/pmxboard/functions/operation.h). What the type does not tell is
told by the header: see pointers.py.
"""

import pathlib
import sys

sys.dont_write_bytecode = True

import pointers  # noqa: E402
from declarations import Unclear  # noqa: E402
from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, ROOT, function_pointers, functions  # noqa: E402

SLOT_HEADER = "src/driver/private_inc/drv_if_pmx.h"
WRITABLE = ("numbers, [tag], [text] that is read, @param[out] of one number, and @param[in] [N] of const numbers or of "
            "records")


def _argument(function, type_name, name, callbacks):
    """A parameter as an initializer of ParameterName."""
    if not pointers.is_pointer(type_name, callbacks):
        return f'"{name}"'
    pointer = pointers.pointer_of(function, type_name, name, callbacks)
    if pointer.kind == "tag" or (pointer.kind, pointer.direction) == ("text", "in"):
        return f'"{name}"'
    is_list = type_name.startswith("const ") or pointer.target.endswith("_T")
    if (pointer.kind, pointer.direction, pointer.size) == ("items", "out", "") and not is_list:
        return f'"{name}"' if pointer.may_be_null else f'never_null("{name}")'
    if (pointer.kind, pointer.direction) == ("items", "in") and is_list:
        return f'{{ "{name}", {pointer.size or 1} }}'
    raise Unclear(f"{function.name}: {name}: a scenario has no way to write it: it writes {WRITABLE}")


def _row(macro, function, contract, callbacks):
    """A row of a table; `contract` is the function whose contract holds."""
    arguments = [_argument(contract, type_name, name, callbacks)
                 for type_name, name in pointers.declared_parameters(function)]
    return f"        {macro}({', '.join([function.name, *arguments])}),"


def _rows(root, header, callbacks, macro, is_listed=lambda function: True):
    for function in functions(root / header):
        try:
            if is_listed(function):
                yield _row(macro, function, function, callbacks)
        except Unclear as reason:
            raise Unclear(f"{header}:{function.line}: {reason}") from None


def _slots(root, callbacks):
    offered = {function.name: function for function in functions(root / LAYER_HEADER)}
    for pointer in function_pointers(root / SLOT_HEADER):
        function, model = pointer.function, offered.get(pointer.model)
        if pointer.is_type:
            continue
        if model is None or model.declared != function.declared:
            raise Unclear(f"{SLOT_HEADER}:{function.line}: {function.name}: /**< as FUNCTION */: the function of "
                          f"{pathlib.Path(LAYER_HEADER).name} that stands there, with the same parameters")
        try:
            yield _row("SLOT", function, model, callbacks)
        except Unclear as reason:
            raise Unclear(f"{SLOT_HEADER}:{function.line}: {reason}") from None


def table(root):
    headers = (LAYER_HEADER, *PLATFORM_HEADERS)
    callbacks = {pointer.function.name for header in headers for pointer in function_pointers(root / header)
                 if pointer.is_type}

    def is_told(function):
        """Numbers go in, and nothing comes out: what a driver is told, and can be told by a neighbour."""
        types = [type_name for type_name, _ in pointers.declared_parameters(function)]
        return not (function.has_result or "..." in function.declared or
                    any(pointers.is_pointer(type_name, callbacks) for type_name in types))

    operations = "\n".join(_rows(root, LAYER_HEADER, callbacks, "OPERATION"))
    neighbours = "\n".join(row for header in PLATFORM_HEADERS
                           for row in _rows(root, header, callbacks, "OPERATION", is_told))
    slots = "\n".join(_slots(root, callbacks))
    includes = "\n".join(f'#include "{pathlib.Path(header).name}"' for header in headers)
    return f"""// Written from the headers when the tool is built.
{includes}
#include "tools/pmxboard/functions/ipmx.h"
#include "tools/pmxboard/functions/operation.h"

namespace pmxboard
{{

#define OPERATION(function, ...) operation<function>(#function, {{ __VA_ARGS__ }})
#define SLOT(slot, ...) SlotOf<decltype(IPMX::slot), &IPMX::slot>::operation(#slot, {{ __VA_ARGS__ }})

const std::vector<Operation>& operations()
{{
    static const std::vector<Operation> all = {{
{operations}
    }};
    return all;
}}

const std::vector<Operation>& neighbours()
{{
    static const std::vector<Operation> all = {{
{neighbours}
    }};
    return all;
}}

const std::vector<Operation>& ipmx_slots()
{{
    static const std::vector<Operation> all = {{
{slots}
    }};
    return all;
}}

}} // namespace pmxboard
"""


def main():
    try:
        text = table(ROOT)
    except Unclear as reason:
        sys.exit(str(reason))
    pathlib.Path(sys.argv[1]).write_text(text, encoding="utf-8")


if __name__ == "__main__":
    main()
