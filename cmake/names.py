#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the names of the numbers that cross the interfaces, as the headers have them: which names there are, and which
parameters, results and fields take them.

usage: names.py OUTPUT     the tables behind board/names.h

A family of names is a line of `enum class Family` in board/names.h, which says where its names come from. What has
names is told by the headers: see declarations.py.
"""

import pathlib
import re
import sys

sys.dont_write_bytecode = True

import declarations  # noqa: E402
import pointers  # noqa: E402
from declarations import Unclear  # noqa: E402
from platform_functions import LAYER_HEADER, ROOT, function_pointers, functions, parts  # noqa: E402

HEADER_DIRECTORIES = ("src/system/inc", "src/driver/inc", "src/driver/private_inc")
RECORD_HEADER = "src/driver/pmx/pmx_if.h"  # the layer's own record, which the tool shows
FAMILIES = "board/names.h"
ENUMERATION = re.compile(r"enum class Family\n\{\n(.*?)\n\};", re.DOTALL)
FAMILY = re.compile(r"\s*(?P<name>\w+),?\s*///< (?P<sources>\w+(?:, \w+)*): (?P<title>.+)")
HOW = "///< ENUMERATION: what its values are, or ///< BEGINNING_: …"


def headers(root):
    return [path for directory in HEADER_DIRECTORIES for path in sorted((root / directory).glob("*.h"))]


def families(root):
    """(family, where its names come from, title, line) of each line of board/names.h."""
    text = declarations.read(root / FAMILIES)
    match = ENUMERATION.search(text)
    if match is None:
        raise Unclear(f"{FAMILIES}:1: there is no enum class Family")
    first = text.count("\n", 0, match.start(1)) + 1
    for line, row in enumerate(match[1].split("\n"), first):
        family = FAMILY.fullmatch(row)
        if family is None:
            raise Unclear(f"{FAMILIES}:{line}: {row.strip()}: {HOW}")
        yield family["name"], family["sources"].split(", "), family["title"], line


class Names:
    """What the headers of a project say of names."""

    def __init__(self, root):
        self.root = root
        self.families = list(families(root))
        self.paths = headers(root)
        self.enumerations, self.constants = {}, []
        for path in self.paths:
            self._read(path)
        self.family_of = {source: family for family, sources, _, _ in self.families for source in sources}
        self._check_enumerations()

    def _read(self, path):
        text = declarations.read(path)
        self.constants += [one.name for one in declarations.constants(text)]
        try:
            for one in declarations.enumerations(text):
                if one.name:
                    self.enumerations[one.name] = path, one
                else:
                    self.constants += [each.name for each in one.enumerators]
        except Unclear as reason:
            raise Unclear(f"{path.relative_to(self.root).as_posix()}:{reason}") from None

    def place(self, path, line):
        return f"{path.relative_to(self.root).as_posix()}:{line}"

    def _check_enumerations(self):
        for name, (path, one) in self.enumerations.items():
            if name not in self.family_of:
                raise Unclear(f"{self.place(path, one.line)}: {name}: its names belong to no family; a line in "
                              f"enum class Family of {FAMILIES}: {HOW}")

    def _of_source(self, source):
        """The names that a family has from one enumeration, constant or common beginning."""
        if source in self.enumerations:
            return [one.name for one in self.enumerations[source][1].enumerators]
        if source.endswith("_"):
            return [name for name in self.constants if name.startswith(source)]
        return [source] if source in self.constants else []

    def rows(self):
        """(family, name) in the order of the families."""
        for family, sources, _, line in self.families:
            for source in sources:
                found = self._of_source(source)
                if not found:
                    raise Unclear(f"{FAMILIES}:{line}: {family}: no header declares {source}")
                for name in found:
                    yield family, name

    def _family(self, type_name, text, what):
        try:
            source = type_name if type_name in self.enumerations else declarations.named(text)
        except Unclear as reason:
            raise Unclear(f"{what}: {reason}") from None
        if source and source not in self.family_of:
            raise Unclear(f"{what}: {source} is neither an enumeration nor what the names of a family begin with")
        return self.family_of.get(source, "")

    def _function_uses(self, path, function, model):
        _, parameters, result, _ = parts(model.contract)
        texts = {name: text for name, text, _, _ in parameters}
        what = f"{self.place(path, function.line)}: {function.name}"
        for type_name, name in pointers.declared_parameters(function):
            yield function.name, name, self._family(type_name.rstrip("*"), texts.get(name, ""), f"{what}: {name}")
        yield function.name, "result", self._family(function.result, result, f"{what}: @return")

    def _uses(self):
        offered = {function.name: function for function in functions(self.root / LAYER_HEADER)}
        for path in self.paths:
            for function in functions(path):
                yield from self._function_uses(path, function, function)
            for pointer in function_pointers(path):
                yield from self._function_uses(path, pointer.function, offered.get(pointer.model, pointer.function))
        for path in [*self.paths, self.root / RECORD_HEADER]:
            for record in declarations.records(declarations.read(path)):
                for field in record.fields:
                    what = f"{self.place(path, field.line)}: {record.name}.{field.name}"
                    yield record.name, field.name, self._family(field.type, field.text, what)

    def uses(self):
        """(function or record, parameter, "result" or field, family), sorted; of what has names alone."""
        return sorted({use for use in self._uses() if use[2]})


def table(names):
    includes = "\n".join(f'#include "{path.name}"' for path in names.paths)
    rows = "\n".join(f"    {{ Family::{family}, static_cast<std::int64_t>({name}), \"{name}\" }},"
                     for family, name in names.rows())
    uses = "\n".join(f'    {{ "{owner}", "{argument}", Family::{family} }},'
                     for owner, argument, family in names.uses())
    titles = "\n".join(f'    {{ Family::{family}, "{title}" }},'
                       for family, _, title, _ in names.families if family != "None")
    return f"""// Written from the headers when the board is built.
#include "board/name_table.h"

{includes}

namespace board::names
{{
namespace
{{

constexpr Row all_rows[] = {{
{rows}
}};

constexpr Use all_uses[] = {{
{uses}
}};

constexpr FamilyTitle all_families[] = {{
{titles}
}};

}} // namespace

std::span<const Row> rows()
{{
    return all_rows;
}}

std::span<const Use> uses()
{{
    return all_uses;
}}

std::span<const FamilyTitle> families()
{{
    return all_families;
}}

}} // namespace board::names
"""


def main():
    try:
        text = table(Names(ROOT))
    except Unclear as reason:
        sys.exit(str(reason))
    pathlib.Path(sys.argv[1]).write_text(text, encoding="utf-8")


if __name__ == "__main__":
    main()
