# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Contracts: what the headers promise about every function, and that the virtual board keeps up."""

import pathlib
import re
import sys

sys.path.insert(0, str(pathlib.Path(__file__).parents[2] / "cmake"))

import pointers  # noqa: E402
from cpp import Source  # noqa: E402
from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, function_pointers  # noqa: E402
from platform_functions import functions as declared  # noqa: E402

HEADER_DIRECTORIES = ("src/system/inc", "src/driver/inc", "src/driver/private_inc")


def read_declarations(root, header):
    return list(declared(root / header)) if (root / header).exists() else []


def check_contract(declaration, needs_context):
    """A contract is a comment that names every parameter, the result, and for the layer where it may be called."""
    comment = declaration.contract
    if not comment:
        yield f"{declaration.name}: no contract (/** … */ directly above)"
        return
    named = list(pointers.described(declaration))
    for parameter in declaration.parameters:
        if parameter not in named:
            yield f"{declaration.name}: no @param {parameter}"
    for parameter in named:
        if parameter not in declaration.parameters:
            yield f"{declaration.name}: @param {parameter} is no parameter"
    if declaration.has_result and "@return" not in comment:
        yield f"{declaration.name}: no @return"
    if not declaration.has_result and "@return" in comment:
        yield f"{declaration.name}: @return, but nothing is returned"
    if needs_context and "@context" not in comment:
        yield f"{declaration.name}: no @context"


def check_headers(root):
    for header in (LAYER_HEADER, *PLATFORM_HEADERS):
        for declaration in read_declarations(root, header):
            for message in check_contract(declaration, header == LAYER_HEADER):
                yield header, declaration.line, message


def check_pointers(declaration, callbacks, enumerations):
    """Every pointer tells which way it goes and what stands behind it; what is no pointer says nothing of it."""
    described = pointers.described(declaration)
    for type_name, name in pointers.declared_parameters(declaration):
        try:
            if pointers.is_pointer(type_name, callbacks):
                pointer = pointers.pointer_of(declaration, type_name, name, callbacks)
                if pointer.kind == "by":
                    pointers.types_by_value(declaration, pointer, enumerations)
            elif any(described.get(name, ("", "", ""))[1:]):
                yield f"{declaration.name}: {name} is no pointer, and needs neither a direction nor brackets"
        except pointers.Unclear as reason:
            yield str(reason)


def check_member(pointer, offered, callbacks, enumerations):
    """A table's member: a tag in front needs no words; other pointers need a contract, or that of a function."""
    function = pointer.function
    if pointer.model:
        if offered.get(pointer.model) != function.declared:
            yield f"{function.name}: as {pointer.model}, which the layer does not offer with the same parameters"
    elif pointers.described(function):
        yield from check_pointers(function, callbacks, enumerations)
    elif any(pointers.is_pointer(type_name, callbacks) and (place > 0 or type_name != "void*")
             for place, (type_name, _) in enumerate(pointers.declared_parameters(function))):
        yield f"{function.name}: its pointers need a contract, or /**< as FUNCTION */"


def check_all_pointers(root):
    headers = sorted(path for directory in HEADER_DIRECTORIES for path in (root / directory).glob("*.h"))
    called = {header: list(function_pointers(header)) for header in headers}
    callbacks = {pointer.function.name for found in called.values() for pointer in found if pointer.is_type}
    enumerations = pointers.enumerations("\n".join(header.read_text(encoding="utf-8") for header in headers))
    offered = {declaration.name: declaration.declared for declaration in read_declarations(root, LAYER_HEADER)}
    for header in headers:
        name = header.relative_to(root).as_posix()
        for declaration in declared(header):
            for message in check_pointers(declaration, callbacks, enumerations):
                yield name, declaration.line, message
        for pointer in called[header]:
            check = (check_pointers(pointer.function, callbacks, enumerations) if pointer.is_type
                     else check_member(pointer, offered, callbacks, enumerations))
            for message in check:
                yield name, pointer.function.line, message


def check_board(root):
    """Every platform function of the board records itself first, under its own name and with all its arguments, and
    ends with what lets no exception leave it."""
    functions, ended = {}, set()
    for path in sorted((root / "board").glob("*.cpp")):
        text = path.read_text(encoding="utf-8")
        ended |= set(re.findall(r"^\}\nBOARD_CALL_END\((\w+)\)$", text, re.M))
        for function in Source(text).functions():
            functions[function.name] = (path.relative_to(root).as_posix(), function)
    if not functions:
        return

    for header in PLATFORM_HEADERS:
        for declaration in read_declarations(root, header):
            if declaration.name not in functions:
                yield header, declaration.line, f"{declaration.name}: the board does not have it"
                continue
            name, function = functions[declaration.name]
            match = re.match(r"\s*(BOARD_\w+)\s*\(\s*(\w+)((?:[^;]|\n)*?)\)\s*;", function.body)
            if not match or not match.group(1).startswith("BOARD_CALL"):
                yield name, function.line, f"{function.name}: the first statement is not its BOARD_CALL"
            elif match.group(2) != function.name:
                yield name, function.line, f"{function.name}: recorded as {match.group(2)}"
            elif function.name not in ended:
                yield name, function.line, f"{function.name}: its block ends without BOARD_CALL_END({function.name})"
            elif declaration.has_result == (match.group(1) == "BOARD_CALL"):
                yield name, function.line, f"{function.name}: {match.group(1)} does not fit its result"
            else:
                for parameter in declaration.parameters:
                    if not re.search(rf"\b{parameter}\b", match.group(3)):
                        yield name, function.line, f"{function.name}: {parameter} is not recorded"


def complaints(root):
    return [*check_headers(root), *check_all_pointers(root), *check_board(root)]
