#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds an object file that ships against what the headers tell, or two lists: the global symbols it defines, and those
it needs.

Refused as well is whatever a plain C driver stack, a kernel's module loader for instance, does not provide for: weak
symbols, section groups, code that runs before the first call, thread-local data, and relocations that ask for a global
offset table. The object is read with readelf.
"""

import argparse
import pathlib
import re
import subprocess
import sys

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, functions  # noqa: E402

# Relocations that a loader resolves by address alone. R_X86_64_PLT32 is what assemblers write for every call, also in
# position-dependent code, where no procedure linkage table exists.
PLAIN_RELOCATIONS = {
    "R_X86_64_64", "R_X86_64_32", "R_X86_64_32S", "R_X86_64_PC32", "R_X86_64_PC64", "R_X86_64_PLT32",
}

RUN_BEFORE_MAIN = re.compile(r"^\.(preinit_array|init_array|fini_array|ctors|dtors|init|fini)(\.|$)")


OBJECT = re.compile(r"^extern PMX_API \w[^;=]*?\b(\w+)(?:\[\w*\])?;", re.M)
OBJECTS_HEADER = "src/driver/private_inc/drv_if_pmx.h"
COMPILERS_OWN = ("memcpy", "memset")  # what it may call or not, as it thinks best


class List:
    """Names that an object defines or needs, each with the place that says so, and those that it may need or not."""

    def __init__(self, source, places=(), optional=()):
        self.source, self.places, self.optional = source, dict(places), set(optional)

    @classmethod
    def read(cls, path):
        """A name a line; a leading "? " marks those that may be there or not."""
        listed = cls(path)
        for number, line in enumerate(open(path, encoding="utf-8"), start=1):
            line = line.strip()
            if not line or line.startswith("#"):
                continue
            match = re.fullmatch(r"(\? )?(\w+)", line)
            if not match:
                sys.exit(f"{path}:{number}: neither a name nor a comment: {line}")
            mark, name = match.groups()
            if name in listed.places or name in listed.optional:
                sys.exit(f"{path}:{number}: listed twice: {name}")
            if mark:
                listed.optional.add(name)
            else:
                listed.places[name] = f"{path}:{number}"
        return listed

    def compare(self, names, is_there, is_missing):
        """The complaints about the names of an object; the two texts say what "there" and "missing" mean."""
        for name in sorted(names - self.places.keys() - self.optional):
            yield f"{name}: {is_there}, but not listed in {self.source}"
        for name in sorted(self.places.keys() - names):
            yield f"{name}: {is_missing}, but listed: {self.places[name]}"


def offered(root):
    """What the layer defines: the functions that its header declares, and the objects that are marked there."""
    places = {function.name: f"{LAYER_HEADER}:{function.line}" for function in functions(root / LAYER_HEADER)}
    text = (root / OBJECTS_HEADER).read_text(encoding="utf-8")
    places |= {match[1]: f"{OBJECTS_HEADER}:{text.count(chr(10), 0, match.start(1)) + 1}"
               for match in OBJECT.finditer(text)}
    return List(f"{LAYER_HEADER} or {OBJECTS_HEADER}", places)


def needed(root):
    """What the layer needs: all that the platform's headers declare, and nothing else."""
    places = {function.name: f"{header}:{function.line}" for header in PLATFORM_HEADERS
              for function in functions(root / header)}
    return List("the platform's headers", places, COMPILERS_OWN)


def add_lists(parser):
    """The options that tell what an object defines and needs."""
    parser.add_argument("--headers", type=pathlib.Path, metavar="ROOT", help="the headers of a project tell both")
    parser.add_argument("--defined", help="or: list of the global symbols that it defines")
    parser.add_argument("--needed", help="and list of the symbols that it needs")


def lists_of(arguments):
    """(defined, needed) of those options."""
    if arguments.headers:
        return offered(arguments.headers), needed(arguments.headers)
    return List.read(arguments.defined), List.read(arguments.needed)


def readelf(option, path):
    result = subprocess.run(["readelf", "--wide", option, path], capture_output=True, text=True, check=False,
                            env={"LC_ALL": "C", "PATH": "/usr/bin:/bin"})
    if result.returncode != 0:
        sys.exit(f"{path}: cannot be read: {result.stderr.strip()}")
    return result.stdout.splitlines()


def symbols(path):
    """(name, type, binding, section index) of every symbol."""
    for line in readelf("--symbols", path):
        fields = line.split()
        if len(fields) >= 8 and re.fullmatch(r"\d+:", fields[0]):
            # number value size type binding visibility index name
            yield fields[7], fields[3], fields[4], fields[6]


def sections(path):
    """(name, type, flags) of every section."""
    for line in readelf("--section-headers", path):
        match = re.match(r"\s*\[\s*\d+\]\s(.*)", line)
        fields = match.group(1).split() if match else []
        if len(fields) >= 6 and not fields[0].isupper():
            flags = fields[6] if len(fields) == 10 else ""
            yield fields[0], fields[1], flags


def relocations(path):
    """(section, type, symbol) of every relocation."""
    section = ""
    for line in readelf("--relocs", path):
        match = re.match(r"Relocation section '\.rela?(.*)'", line)
        if match:
            section = match.group(1)
            continue
        fields = line.split()
        if len(fields) >= 3 and fields[2].startswith("R_"):
            yield section, fields[2], fields[4] if len(fields) > 4 else ""


def complaints(path, defined_list, needed_list):
    there, open_names = set(), set()
    for name, kind, binding, index in symbols(path):
        if kind == "TLS":
            yield f"{name}: thread-local symbol"
        if binding in ("WEAK", "UNIQUE"):
            yield f"{name}: weak symbol"
        elif index == "COM":
            yield f"{name}: common symbol"
        if binding != "LOCAL" and name:
            (open_names if index == "UND" else there).add(name)

    yield from defined_list.compare(there, "defined", "not defined")
    yield from needed_list.compare(open_names, "needed", "never called")

    for name, kind, flags in sections(path):
        if kind == "GROUP":
            yield f"{name}: section group"
        if "T" in flags or name.startswith((".tdata", ".tbss")):
            yield f"{name}: thread-local section"
        if RUN_BEFORE_MAIN.match(name) or kind.endswith("_ARRAY"):
            yield f"{name}: code that runs before the first call"

    for section, kind, symbol in relocations(path):
        if kind not in PLAIN_RELOCATIONS:
            yield f"{section}: relocation {kind} to {symbol}"


def main():
    parser = argparse.ArgumentParser(description="Hold an object file against the lists of its symbols.")
    add_lists(parser)
    parser.add_argument("object")
    arguments = parser.parse_args()

    defined_list, needed_list = lists_of(arguments)
    found = list(complaints(arguments.object, defined_list, needed_list))
    for complaint in found:
        print(f"{arguments.object}: {complaint}")
    if not found:
        print(f"{arguments.object}: defines {len(defined_list.places)} symbols, "
              f"needs {len(needed_list.places)} platform functions")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
