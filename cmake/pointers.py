# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What the headers say of pointers: which way a parameter goes, and what stands behind it.

A contract writes `@param[in]`, `@param[out]` or `@param[in,out]` for what the function reads, writes or both, and
behind the parameter's name, in brackets, what the pointer leads to:

    nothing         one object of the type that is pointed to
    [8] [NAME]      so many of them; NAME is a constant
    [size bytes]    as many bytes as the parameter `size` says
    [text]          a text with its terminator; [text of size]: at most as many characters as the parameter `size` says
    [tag]           a value that travels in the pointer: nobody looks behind it
    [symbol]        the address of an object or a function that both sides know by name
    [by command]    what the value of the parameter `command` asks for: its own text names the enumeration ("a NAME
                    value"), and there each enumerator's comment begins with a type in brackets

Of a void**, [tag] and [symbol] are what it receives. An output of which the text says "not tested for null" is written
whatever the pointer is. Which names a number has is told by "a NAME value": see declarations.py.
"""

import dataclasses
import re

import declarations
from declarations import Unclear
from platform_functions import parts

DIRECTIONS = ("in", "out", "in,out")
NOT_TESTED = "not tested for null"
CHARACTERS = {"CHAR", "char"}
BYTES = {"UCHAR", "UINT8", "BYTE", "void"}


@dataclasses.dataclass(frozen=True)
class Pointer:
    direction: str  # one of DIRECTIONS
    target: str     # the type that is pointed to, without const
    kind: str       # items, bytes, text, tag, symbol, by
    size: str       # how many items or bytes, of a text at most; by: the parameter that tells; or nothing
    may_be_null: bool = True  # as far as the function is concerned

    @property
    def is_read(self):
        return self.direction != "out"

    @property
    def is_written(self):
        return self.direction != "in"


def declared_parameters(function):
    """(type, name) of every parameter but the variable ones."""
    for text in function.declared.split(","):
        match = re.fullmatch(r"\s*(.*?[\s*])(\w+)\s*", text)
        if match:
            yield match[1].strip(), match[2]


def described(function):
    """{parameter: (text, direction, what stands in brackets)}; the last two are empty where they are not written."""
    return {name: (text, direction, behind) for name, text, direction, behind in parts(function.contract)[1]}


def is_pointer(type_name, callbacks):
    return "*" in type_name or type_name in callbacks


def enumerations(text):
    """{enumeration: {enumerator: the type in brackets, or nothing}} of a header."""
    return {one.name: {each.name: each.type for each in one.enumerators} for one in declarations.enumerations(text)}


def _kind_and_size(behind, numbers):
    """What stands in brackets. `numbers` are the function's parameters that are not pointers."""
    if not behind:
        return "items", ""
    if behind in ("tag", "symbol", "text"):
        return behind, ""
    if re.fullmatch(r"[1-9]\d*|[A-Z]\w*", behind):
        return "items", behind
    match = re.fullmatch(r"(?:(?P<text>text of|by) )?(?P<size>\w+)(?P<bytes> bytes)?", behind)
    if not match or bool(match["text"]) == bool(match["bytes"]):
        raise Unclear(f"[{behind}] is none of [8], [NAME], [size bytes], [text], [text of size], [tag], [symbol], "
                      "[by command]")
    if match["size"] not in numbers:
        raise Unclear(f"[{behind}]: {match['size']} is no number that the function is given")
    return "bytes" if match["bytes"] else "by" if match["text"] == "by" else "text", match["size"]


def _contradiction(type_name, pointer, is_callback):
    """What the type does not allow."""
    if is_callback or type_name.endswith("**"):
        if pointer.kind != "symbol" and (is_callback or pointer.kind != "tag"):
            return "is the address of a function: [symbol]" if is_callback else "receives a [tag] or a [symbol]"
        if pointer.direction != ("in" if is_callback else "out"):
            return f"is not @param[{pointer.direction}]"
    elif pointer.kind in ("tag", "symbol") and pointer.direction != "in":
        return f"is not written: nobody writes behind a [{pointer.kind}]"
    elif pointer.kind == "tag" and type_name != "void*":
        return "is no [tag]: that is a void*"
    elif type_name.startswith("const ") and pointer.is_written:
        return "is const, and not written"
    elif pointer.kind == "text" and bool(pointer.size) != pointer.is_written:
        return "is a text: [text] when it is read, [text of size] when it is written"
    elif (pointer.kind == "text") != (pointer.target in CHARACTERS):
        return "is a text: [text]" if pointer.target in CHARACTERS else "is no [text]"
    elif pointer.kind == "items" and pointer.target == "void":
        return "tells no type: how many bytes stand behind it?"
    elif pointer.kind == "bytes" and pointer.target not in BYTES:
        return f"points to {pointer.target}, not to bytes"
    return ""


def pointer_of(function, type_name, name, callbacks=()):
    """The Pointer that a parameter is; Unclear when its contract does not tell."""
    numbers = {other for other_type, other in declared_parameters(function) if not is_pointer(other_type, callbacks)}
    text, direction, behind = described(function).get(name, ("", "", ""))
    if direction not in DIRECTIONS:
        raise Unclear(f"{function.name}: {name} is a pointer: @param[in], @param[out] or @param[in,out]")
    try:
        kind, size = _kind_and_size(behind, numbers)
    except Unclear as reason:
        raise Unclear(f"{function.name}: {name}: {reason}") from None
    target = type_name.removeprefix("const ").removesuffix("*").strip()
    pointer = Pointer(direction, target, kind, size, NOT_TESTED not in text)
    contradiction = _contradiction(type_name, pointer, type_name in callbacks)
    if contradiction:
        raise Unclear(f"{function.name}: {name} {contradiction}")
    return pointer


def types_by_value(function, pointer, known):
    """{enumerator: type} of a pointer whose meaning hangs on another parameter. `known`: enumerations() of the
    headers."""
    name = declarations.named(described(function)[pointer.size][0])
    if not known.get(name):
        raise Unclear(f"{function.name}: {pointer.size} does not say of which enumeration: \"a NAME value\"")
    for enumerator, type_name in known[name].items():
        if not type_name:
            raise Unclear(f"{function.name}: {enumerator} does not tell the type of what goes with it: /**< [TYPE]")
    return known[name]
