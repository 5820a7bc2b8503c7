#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes what the headers promise about each function, and say of each field, as tables that the tool is built with:
its help is the text that a reader of the headers sees.

usage: contracts.py OUTPUT
"""

import json
import pathlib
import re
import sys

sys.dont_write_bytecode = True

import declarations  # noqa: E402
import names  # noqa: E402
from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, ROOT, functions, joined, parts  # noqa: E402

SECTION = re.compile(r"^/\* ((?:(?!\*/).)*)\*/", re.DOTALL | re.MULTILINE)


def sections(path):
    """(line, title) of the comments that head the groups of a header: their first sentence."""
    text = pathlib.Path(path).read_text(encoding="utf-8")
    for match in SECTION.finditer(text):
        yield text.count("\n", 0, match.start()) + 1, re.split(r"[.:](?:\s|$)", joined(match[1]))[0]


def c_text(text):
    return json.dumps(text, ensure_ascii=False)


def rows(header):
    heads = list(sections(ROOT / header))
    for function in functions(ROOT / header):
        brief, parameters, result, context = parts(function.contract)
        section = [title for line, title in heads if line < function.line][-1:] or [""]
        listed = ", ".join(f"{{ {', '.join(map(c_text, parameter))} }}" for parameter in parameters)
        declaration = f"{function.result} {function.name}({function.declared})"
        texts = [function.name, declaration, pathlib.Path(header).name, section[0], brief, result, context]
        yield f"        {{ {', '.join(map(c_text, texts))}, {{ {listed} }} }},"


def field_rows():
    """The fields that a comment tells of, of the layer's own records and of those that cross the interfaces."""
    for path in (ROOT / "src/driver/pmx/pmx_if.h", *names.headers(ROOT)):
        for record in declarations.records(declarations.read(path)):
            for field in record.fields:
                if field.text:
                    yield f"        {{ {c_text(record.name)}, {c_text(field.name)}, {c_text(field.text)} }},"


def main():
    output, = sys.argv[1:]
    fields_text = "\n".join(field_rows())
    functions_text = "\n".join(row for header in (LAYER_HEADER, *PLATFORM_HEADERS) for row in rows(header))
    pathlib.Path(output).write_text(f"""// Written from the headers when the tool is built.
#include "tools/pmxboard/functions/contracts.h"

namespace pmxboard
{{

const std::vector<Contract>& contracts()
{{
    static const std::vector<Contract> all = {{
{functions_text}
    }};
    return all;
}}

const std::vector<FieldText>& field_texts()
{{
    static const std::vector<FieldText> all = {{
{fields_text}
    }};
    return all;
}}

}} // namespace pmxboard
""", encoding="utf-8")


if __name__ == "__main__":
    main()
