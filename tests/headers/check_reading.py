#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Compares what the scripts of cmake/ read in the headers with what a compiler finds there: functions with their
parameters, functions behind pointers, enumerations with their numbers, records with their fields; of the layer's own
header the records alone.

usage: check_reading.py CLANG++ ROOT
"""

import json
import pathlib
import re
import subprocess
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

import declarations  # noqa: E402
import names  # noqa: E402
import pointers  # noqa: E402
from platform_functions import function_pointers, functions  # noqa: E402

FUNCTION_POINTER = re.compile(r"(.*?)\s*\(\*\)\((.*)\)")
RECORDS = {"struct", "union"}


def plain(type_name):
    """A type as both sides can write it; arrays are compared by their name alone."""
    type_name = re.sub(r"\b(enum|struct) ", "", type_name).replace("__va_list_tag *", "va_list")
    return re.sub(r"\s*([*,()])\s*", r"\1", re.sub(r"\[\w*\]", "", type_name)).strip()


def tree(clang, root, path):
    directories = [*names.HEADER_DIRECTORIES, pathlib.Path(names.RECORD_HEADER).parent]
    includes = [f"-I{root / directory}" for directory in directories]
    command = [clang, "-x", "c++", "-std=c++20", "-fsyntax-only", "-Xclang", "-ast-dump=json", *includes, str(path)]
    return json.loads(subprocess.run(command, check=True, capture_output=True, text=True).stdout,
                      object_hook=with_files())


def with_files():
    """A place names its file only where that is another than the last one's: this names it everywhere."""
    last = ""

    def hook(node):
        nonlocal last
        if "offset" in node:
            last = node.setdefault("file", last)
        return node

    return hook


def inside(node, path):
    """The declarations of a file itself, not of what it includes."""
    for child in node.get("inner", []):
        place = child.get("loc", {})
        if child.get("kind") == "LinkageSpecDecl":
            yield from inside(child, path)
        elif place.get("expansionLoc", place).get("file") == str(path) and not child.get("isImplicit"):
            yield child


def number(node):
    return int(node["value"]) if "value" in node else number(node["inner"][0])


def described(function):
    """(result, parameters) of a type as clang writes it."""
    result, _, parameters = function.partition("(")
    return plain(result), plain(parameters.removesuffix(")").removesuffix("void"))


def found_by_the_compiler(nodes):
    by_id = {node["id"]: node for node in nodes}
    for node in nodes:
        kind, name = node["kind"], node.get("name", "")
        if kind == "FunctionDecl" and "inline" not in node:
            parameters = [(plain(each["type"]["qualType"]), each["name"]) for each in node.get("inner", [])
                          if each["kind"] == "ParmVarDecl"]
            yield "function", name, (described(node["type"]["qualType"])[0], node.get("variadic", False), *parameters)
        elif kind == "EnumDecl":
            yield "enumeration", name, tuple((each["name"], number(each)) for each in node.get("inner", [])
                                             if each["kind"] == "EnumConstantDecl")
        elif kind == "TypedefDecl" and (pointed := FUNCTION_POINTER.fullmatch(node["type"]["qualType"])):
            yield "pointer", name, (plain(pointed[1]), plain(pointed[2]))
        elif kind == "TypedefDecl":
            yield from record(name, by_id.get(node["inner"][0].get("ownedTagDecl", {}).get("id")))


def record(name, node):
    if node is None or node.get("tagUsed") not in RECORDS:
        return
    fields = []
    for field in (each for each in node["inner"] if each["kind"] == "FieldDecl"):
        pointed = FUNCTION_POINTER.fullmatch(field["type"]["qualType"])
        if pointed:
            yield "pointer", field["name"], (plain(pointed[1]), plain(pointed[2]))
        else:
            fields.append((plain(field["type"]["qualType"]), field["name"]))
    yield "record", name, tuple(fields)


def types_of(function):
    return [(plain(type_name), name) for type_name, name in pointers.declared_parameters(function)]


def found_by_the_scripts(path):
    text = declarations.read(path)
    for function in functions(path):
        yield "function", function.name, (plain(function.result), "..." in function.declared, *types_of(function))
    for pointer in function_pointers(path):
        function = pointer.function
        yield "pointer", function.name, (plain(function.result), ",".join(each for each, _ in types_of(function)))
    for one in declarations.enumerations(text):
        yield "enumeration", one.name, tuple((each.name, each.number) for each in one.enumerators)
    for one in declarations.records(text):
        yield "record", one.name, tuple((plain(field.type), field.name) for field in one.fields)


# Headers whose enumerations a preprocessor makes of a table; who reads the table holds it (tests/reasons).
TABLES_OF_THEIR_OWN = {"pmx_reason.h"}


def differences(clang, root):
    """(messages, how many declarations were compared)."""
    messages, compared = [], 0
    for path in [*names.headers(root), root / names.RECORD_HEADER]:
        read = {"record"} if path == root / names.RECORD_HEADER else {"function", "pointer", "enumeration", "record"}
        if path.name in TABLES_OF_THEIR_OWN:
            read.discard("enumeration")
        theirs = [one for one in found_by_the_compiler(list(inside(tree(clang, root, path), path))) if one[0] in read]
        ours = [one for one in found_by_the_scripts(path) if one[0] in read]
        where = path.relative_to(root).as_posix()
        messages += [f"{where}: {kind} {name}: not read as it is: {told}" for kind, name, told in theirs
                     if (kind, name, told) not in ours]
        messages += [f"{where}: {kind} {name}: not what the compiler finds: {told}" for kind, name, told in ours
                     if (kind, name, told) not in theirs]
        if sorted(ours, key=str) != sorted(theirs, key=str) and not messages:
            messages.append(f"{where}: something is read more than once")
        compared += len(theirs)
    return messages, compared


def main():
    clang, root = sys.argv[1], pathlib.Path(sys.argv[2]).resolve()
    messages, compared = differences(clang, root)
    print("\n".join(messages + [f"{compared} declarations compared, {len(messages)} differ"]))
    return 1 if messages or not compared else 0


if __name__ == "__main__":
    sys.exit(main())
