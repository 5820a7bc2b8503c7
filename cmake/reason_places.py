#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Reads where the layer gives its reasons, and writes which of them each operation can give: its own, and those of
what it calls in the layer.

usage: reason_places.py OUTPUT SOURCE...     the table behind reasons_of()

As a module: places(text) yields the reasons that a source gives, arguments(text, begin) takes a macro to pieces.
"""

import pathlib
import re
import sys

sys.dont_write_bytecode = True

from platform_functions import LAYER_HEADER, ROOT, functions  # noqa: E402

LAYER = "src/driver/pmx"
MACRO = re.compile(r"\bPMX_(WHY_EITHER|WHY|NOTE_IF|NOTE)\(")
DEFINITION = re.compile(r"^(?!#|typedef|extern)[^\n;={}]*?\b(\w+)\([^;{}]*\)\n\{\n(.*?)^\}", re.DOTALL | re.MULTILINE)
CALL = re.compile(r"\b(\w+)\(")
OPENING, CLOSING = "([{", ")]}"


def arguments(text, begin):
    """The arguments of a macro, and where its closing bracket stands; `begin` is behind the opening one."""
    found, depth, from_here = [], 0, begin
    for i in range(begin, len(text)):
        if text[i] in CLOSING and depth == 0:
            return found + [text[from_here:i]], i
        if text[i] in OPENING:
            depth += 1
        elif text[i] in CLOSING:
            depth -= 1
        elif text[i] == "," and depth == 0:
            found.append(text[from_here:i])
            from_here = i + 1
    raise ValueError("a macro of reasons does not end")


def places(text):
    """(name of the reason, line) of each that a text gives."""
    for match in MACRO.finditer(text):
        if match[1] != "WHY_EITHER":
            given, _ = arguments(text, match.end())
            yield given[1 if match[1] == "NOTE_IF" else 0].strip(), text.count("\n", 0, match.start()) + 1


def layer_functions(sources):
    """{name: (the reasons that it gives itself as (reason, file, line), what it calls)} of the layer's functions."""
    bodies = {}
    for path in sorted(sources):
        text = path.read_text(encoding="utf-8")
        for match in DEFINITION.finditer(text):
            first = text.count("\n", 0, match.start(2))
            own = [(reason, f"{LAYER}/{path.name}", first + line) for reason, line in places(match[2])]
            bodies[match[1]] = (own, set(CALL.findall(match[2])))
    return bodies


def reached_from(operation, bodies, stops=frozenset()):
    """The functions that an operation calls, itself included; not beyond those that stop it."""
    reached, ahead = set(), [operation]
    while ahead:
        name = ahead.pop()
        if name in reached or name not in bodies or (name in stops and name != operation):
            continue
        reached.add(name)
        ahead += sorted(bodies[name][1])
    return reached


def hands_on(operation, bodies, operations):
    """The operation that another one is nothing but a call of, or itself."""
    own, calls = bodies[operation]
    called = sorted(calls & operations)
    is_adaptor = operation.startswith(("i4Pmx", "d_PMX_")) and len(called) == 1 and not own
    return called[0] if is_adaptor else operation


def reasons_of(operation, bodies, operations):
    """(reason, function, file, line, whether it is the operation's own) of all that an operation can give. Those of
    another operation that it calls on its way are not its own."""
    own = reached_from(hands_on(operation, bodies, operations), bodies, operations)
    found = [(reason, name, file, line, name in own) for name in reached_from(operation, bodies)
             for reason, file, line in bodies[name][0]]
    return sorted(found, key=lambda place: place[2:])


def main(output, *sources):
    bodies = layer_functions([pathlib.Path(source) for source in sources])
    lines = ["// Written by cmake/reason_places.py", '#include "tools/pmxboard/reasons/reason.h"', "",
             "#include <map>", "", "namespace pmxboard", "{", "",
             "std::span<const ReasonPlace> reasons_of(std::string_view operation)", "{",
             "    static const std::map<std::string_view, std::vector<ReasonPlace>> places = {"]
    operations = {function.name for function in functions(ROOT / LAYER_HEADER)}
    for function in functions(ROOT / LAYER_HEADER):
        if function.name not in bodies:
            raise SystemExit(f"{LAYER_HEADER}:{function.line}: {function.name} has no body in {LAYER}")
        rows = "".join(f'\n            {{ PMX_REASON_{reason}, "{name}", "{file}", {line}, {str(own).lower()} }},'
                       for reason, name, file, line, own in reasons_of(function.name, bodies, operations))
        lines.append(f'        {{ "{function.name}", {{{rows} }} }},')
    lines += ["    };", "    const auto found = places.find(operation);",
              "    return found == places.end() ? std::span<const ReasonPlace>() : found->second;", "}", "",
              "} // namespace pmxboard", ""]
    pathlib.Path(output).write_text("\n".join(lines), encoding="utf-8")


if __name__ == "__main__":
    main(*sys.argv[1:])
