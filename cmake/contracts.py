#!/usr/bin/env python3
"""Writes what the headers promise about each function as a table that the tool is built with: its help is the text
that a reader of the headers sees.

usage: contracts.py OUTPUT
"""

import json
import pathlib
import re
import sys

sys.dont_write_bytecode = True

from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, ROOT, functions  # noqa: E402

TAG = re.compile(r"^@(param|return|context)\b(?:\[([^\]]*)\])?\s*", re.MULTILINE)
BEHIND = re.compile(r"\[([^\]]*)\]\s*")  # see pointers.py
SECTION = re.compile(r"^/\* ((?:(?!\*/).)*)\*/", re.DOTALL | re.MULTILINE)


def without_stars(comment):
    return "\n".join(re.sub(r"^\s*\* ?", "", line).strip() for line in comment.split("\n"))


def joined(text):
    """One line of several; runs of blanks within a line stay, for they set columns apart."""
    return re.sub(r"\s*\n\s*", " ", text).strip()


def parts(comment):
    """(brief, [(parameter, text, direction, what stands behind it)], result, context) of a contract."""
    text = without_stars(comment)
    tags = list(TAG.finditer(text))
    ends = [tag.start() for tag in tags[1:]] + [len(text)]
    parameters, single = [], {"return": "", "context": ""}
    for tag, end in zip(tags, ends):
        body = joined(text[tag.end():end])
        if tag[1] == "param":
            name, _, meaning = body.partition(" ")
            meaning = meaning.strip()
            behind = BEHIND.match(meaning)
            parameters.append((name, meaning[behind.end():] if behind else meaning, tag[2] or "",
                               behind[1] if behind else ""))
        else:
            single[tag[1]] = body
    return joined(text[:tags[0].start()] if tags else text), parameters, single["return"], single["context"]


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


def main():
    output, = sys.argv[1:]
    functions_text = "\n".join(row for header in (LAYER_HEADER, *PLATFORM_HEADERS) for row in rows(header))
    pathlib.Path(output).write_text(f"""// Written from the headers when the tool is built.
#include "tools/pmxboard/contracts.h"

namespace pmxboard
{{

const std::vector<Contract>& contracts()
{{
    static const std::vector<Contract> all = {{
{functions_text}
    }};
    return all;
}}

}} // namespace pmxboard
""", encoding="utf-8")


if __name__ == "__main__":
    main()
