#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the fields of records, for whoever shows or fills a record field by field.

usage: records.py OUTPUT            the records that cross the interfaces
       records.py OUTPUT HEADER     those of a header that does not
"""

import pathlib
import sys

sys.dont_write_bytecode = True

import declarations  # noqa: E402
import names  # noqa: E402
from platform_functions import ROOT  # noqa: E402


def records(paths):
    """Every record with fields: tables of functions have none."""
    return [record for path in paths for record in declarations.records(declarations.read(path)) if record.fields]


def each_field(record):
    visits = "\n".join(f'    visit("{record.name}", "{field.name}", record.{field.name});' for field in record.fields)
    return f"""template <typename Record, typename Visit>
    requires std::same_as<std::remove_const_t<Record>, {record.name}>
void each_field(Record& record, const Visit& visit)
{{
{visits}
}}
"""


def table(paths, name="record_fields"):
    """The text of the header NAME.h."""
    listed = records(paths)
    includes = "\n".join(f'#include "{path.resolve().relative_to(ROOT)}"' for path in paths)
    functions = "\n".join(map(each_field, listed))
    applied = " ".join(f"WITH({record.name})" for record in listed)
    return f"""// Written from the headers when the project is built.
#pragma once

#include <concepts>
#include <type_traits>

{includes}

// What is done WITH each of these records.
#define EACH_OF_{name.upper()}(WITH) {applied}

namespace records
{{

// Hands every field to `visit`, in the record's order: the record's name, the field's, and the field.
{functions}
}} // namespace records
"""


def main():
    output, *header = map(pathlib.Path, sys.argv[1:])
    output.write_text(table(header or names.headers(ROOT), output.stem), encoding="utf-8")


if __name__ == "__main__":
    main()
