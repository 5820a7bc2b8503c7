#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the report's page as one text of the tool: the template, with style and script where it names them.

usage: write_page.py OUTPUT TEMPLATE STYLE SCRIPT
"""

import pathlib
import sys

LICENCE = "SPDX-License-Identifier"
DELIMITER = "page"
# A compiler need not take longer texts.
LONGEST_PIECE = 16000


def content(name):
    """A file without the line that says its licence, which stands at the head of the page once."""
    lines = pathlib.Path(name).read_text(encoding="utf-8").splitlines(keepends=True)
    return "".join(lines[1:] if LICENCE in lines[0] else lines)


def whole(template, style, script):
    page = pathlib.Path(template).read_text(encoding="utf-8")
    for place, text in (("@STYLE@", style), ("@SCRIPT@", script)):
        if page.count(place) != 1:
            sys.exit(f"{template}: {place} stands there {page.count(place)} times")
        page = page.replace(place, text)
    if page.count("@DATA@") != 1 or f'){DELIMITER}"' in page:
        sys.exit(f"{template}: there is no one place for the data, or a text that ends the literal")
    return page


def literal(text):
    pieces = [text[at:at + LONGEST_PIECE] for at in range(0, len(text), LONGEST_PIECE)]
    return "\n".join(f'R"{DELIMITER}({piece}){DELIMITER}"' for piece in pieces)


def main():
    output, template, style, script = sys.argv[1:]
    page = whole(template, content(style), content(script))
    pathlib.Path(output).write_text(
        f'#include "tools/pmxboard/report/page.h"\n\nconst std::string_view pmxboard::page_template =\n'
        f'{literal(page)};\n', encoding="utf-8")


if __name__ == "__main__":
    main()
