#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""One version everywhere: what the tool says, what the header says, and what the objects that ship say.

usage: check_version.py VERSION TOOL HEADER OBJECT...
"""

import pathlib
import re
import subprocess
import sys


def of_tool(tool):
    return subprocess.run([tool, "--version"], capture_output=True, text=True, check=True).stdout.strip()


def of_header(header):
    """The text and the three numbers that a header defines."""
    text = pathlib.Path(header).read_text(encoding="utf-8")
    defined = dict(re.findall(r'^#define PMX_VERSION_(\w+) "?([\d.]+)"?$', text, re.M))
    return defined.get("TEXT"), ".".join(defined.get(part, "?") for part in ("MAJOR", "MINOR", "PATCH"))


def of_object(path):
    comments = subprocess.run(["readelf", "--string-dump=.comment", path], capture_output=True, text=True,
                              check=True).stdout
    return re.findall(r"^ *\[ *[0-9a-f]+\]  (PMX .*)$", comments, re.M)


def complaints(version, tool, header, objects):
    if of_tool(tool) != f"pmxboard {version}":
        yield f"{tool} --version says {of_tool(tool)}"
    if of_header(header) != (version, version):
        yield f"{header} says {of_header(header)}"
    for path in objects:
        if of_object(path) != [f"PMX {version}"]:
            yield f"{path} says {of_object(path)}"


def main():
    version, tool, header, *objects = sys.argv[1:]
    found = list(complaints(version, tool, header, objects))
    print("\n".join(f"{complaint}, and not {version}" for complaint in found)
          or f"version {version}: tool, header and {len(objects)} objects")
    return 1 if found or not objects else 0


if __name__ == "__main__":
    sys.exit(main())
