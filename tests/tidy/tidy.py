#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Keeps the house clean: reads every file of the project and names what does not belong there.

usage: tidy.py [ROOT]
"""

import pathlib
import re
import sys

sys.dont_write_bytecode = True

import contracts  # noqa: E402
from cpp import Source  # noqa: E402

LONGEST_LINE = 120
LONGEST_FUNCTION = 70
LONG_FUNCTIONS = "tests/tidy/long_functions.txt"
CODE = {".c", ".cpp", ".h"}
NOT_OURS = {".git", "build", "__pycache__", ".cache", "LICENSES"}

# The brackets keep these patterns from finding themselves.
UNFINISHED = re.compile(r"\b(T[O]DO|F[I]XME|X[X]X|H[A]CK)\b")
OUT_OF_PLACE = re.compile(
    r"\bsp[e]c(ification)?s?\b|\br[e]quirements?\b|\bP[a]rts? \d|\bissue[s]? #?\d"
    r"|/w[o]rk/|/t[m]p/|\bsh[a]red/|/h[o]me/", re.I)

# A line that ends in a semicolon is code when it has an operator or a bracket and no four words of prose in a row.
COMMENTED_OUT = re.compile(
    r"^(?!- )(?!.*\b[a-z]+ [a-z]+ [a-z]+ [a-z]+\b).*([=()\[\]]|->).*;$|^(return|break|continue|goto)\b.*;$|\{$|^\}"
    r"|^#\s*(if|ifdef|ifndef|else|endif|define|include)\b|^(if|for|while|switch)\s*\(.*\)$")

# What the layer does without: its record and tables are plain data, and nothing is allocated, thrown or dispatched.
NOT_IN_THE_LAYER = [
    (re.compile(r"\b(class|virtual|template|typename|new|delete|throw|try|catch|dynamic_cast|typeid|co_await)\b"),
     "is not used in the layer"),
    (re.compile(r"\b(malloc|calloc|realloc|free)\s*\("), "allocates"),
    (re.compile(r"\bstd::"), "is the hosted library"),
    (re.compile(r"\bswitch\s*\([^)]*(?<!Swap)Mode[^)]*\)"), "decides by mode: facts of modes stand in the mode table"),
    (re.compile(r"(?<!&)\b_arPmxDispPartStatus\s*\."),
     "is read or stored: the timer's context shares it, so that goes through prPmxStatus"),
    (re.compile(r"^[ \t]*#\s*include\s*<(?!stddef\.h>|stdarg\.h>|linux/)[^>]*>", re.M),
     "is a header of neither the compiler nor the kernel"),
]

# The wings of the tool, from the bottom up: a file includes what stands in its own wing or further down.
TOOL = "tools/pmxboard/"
WINGS = ("files", "text", "functions", "reasons", "state", "recording", "view", "language", "prompt", "decode",
         "report", "graphics", "commands")
INCLUDE = re.compile(r'^#include "tools/pmxboard/(\w+)/', re.M)


def files(root):
    for path in sorted(root.rglob("*")):
        if path.is_file() and not NOT_OURS & set(path.relative_to(root).parts):
            yield path


def text_of(path):
    """The text of a file, or None for a binary one."""
    content = path.read_bytes()
    if b"\0" in content:
        return None
    try:
        return content.decode("utf-8")
    except UnicodeDecodeError:
        return None


def check_text(name, text):
    """Any text file: white space, length of lines, words."""
    if text and not text.endswith("\n"):
        yield text.count("\n") + 1, "no newline at the end of the file"
    if text.endswith("\n\n"):
        yield text.count("\n"), "blank line at the end of the file"
    if OUT_OF_PLACE.search(name):
        yield 1, "a word in the file's name is out of place here"
    for number, line in enumerate(text.split("\n"), start=1):
        if "\t" in line or "\r" in line:
            yield number, "tab or carriage return"
        if line != line.rstrip():
            yield number, "blanks at the end of the line"
        if len(line) > LONGEST_LINE and not name.endswith((".md", ".svg", ".pmx", ".json", ".xml")):
            yield number, f"{len(line)} columns; the limit is {LONGEST_LINE}"
        found = UNFINISHED.search(line)
        if found:
            yield number, f"unfinished: {found.group()}"
        found = OUT_OF_PLACE.search(line)
        if found:
            yield number, f"out of place here: {found.group().strip()}"


def check_comments(source):
    """Code that was commented out. An example in a contract is indented by four columns more than its text."""
    for comment in source.comments:
        lines = comment.text.removeprefix("//").removesuffix("*/").split("\n")
        for offset, line in enumerate(lines):
            if comment.text.startswith("/*"):
                line = re.sub(r"^\s*/?\*+[!<]*", "", line)
            text = line.lstrip("/!< ")
            is_example = comment.text.startswith("/*") and len(line) - len(line.lstrip()) > 5
            if COMMENTED_OUT.search(text.strip()) and not is_example:
                yield comment.line + offset, f"commented-out code: {text.strip()}"
    for match in re.finditer(r"^[ \t]*#\s*if\s+0\b", source.code, re.M):
        yield source.line_of(match.start()), "commented-out code: #if 0"


def check_function_length(name, source, allowed):
    """Functions beyond the limit, but for those that are allowed for a reason; those leave the set `allowed`."""
    for function in source.functions():
        if function.length <= LONGEST_FUNCTION:
            continue
        if (name, function.name) in allowed:
            allowed.discard((name, function.name))
        else:
            yield function.line, f"{function.name}: {function.length} lines; the limit is {LONGEST_FUNCTION}"


def check_layer(source):
    for pattern, why in NOT_IN_THE_LAYER:
        for match in pattern.finditer(source.code):
            yield source.line_of(match.start()), f"{match.group().strip()} {why}"


def check_wings(name, source):
    wing = name.removeprefix(TOOL).partition("/")[0]
    if wing not in WINGS:
        return
    for match in INCLUDE.finditer(source.text):
        if match[1] not in WINGS:
            yield source.line_of(match.start()), f"{match[1]} is no wing of the tool: {', '.join(WINGS)}"
        elif WINGS.index(match[1]) > WINGS.index(wing):
            yield source.line_of(match.start()), f"{wing} does not know {match[1]}, which is built on it"


def allowed_long_functions(root):
    """(file, function) of every line `FILE FUNCTION  # reason`."""
    path = root / LONG_FUNCTIONS
    allowed, complaints = set(), []
    for number, line in enumerate(path.read_text(encoding="utf-8").splitlines() if path.exists() else [], start=1):
        entry, _, reason = line.partition("#")
        if not entry.strip():
            continue
        if len(entry.split()) != 2 or not reason.strip():
            complaints.append((LONG_FUNCTIONS, number, "a line is FILE FUNCTION  # reason"))
            continue
        allowed.add(tuple(entry.split()))
    return allowed, complaints


def complaints(root):
    allowed, found = allowed_long_functions(root)
    for path in files(root):
        name = path.relative_to(root).as_posix()
        text = text_of(path)
        if text is None:
            continue
        found += [(name, *complaint) for complaint in check_text(name, text)]
        if path.suffix in CODE:
            source = Source(text)
            found += [(name, *complaint) for complaint in check_comments(source)]
            found += [(name, *complaint) for complaint in check_function_length(name, source, allowed)]
            if name.startswith(TOOL):
                found += [(name, *complaint) for complaint in check_wings(name, source)]
            if name.startswith("src/driver/pmx/"):
                found += [(name, *complaint) for complaint in check_layer(source)]
    found += [(LONG_FUNCTIONS, 1, f"no longer needed: {file} {function}") for file, function in sorted(allowed)]
    found += contracts.complaints(root)
    return found


def main():
    root = pathlib.Path(sys.argv[1] if len(sys.argv) > 1 else ".").resolve()
    found = complaints(root)
    for name, line, message in found:
        print(f"{name}:{line}: {message}")
    print(f"tidy: {len(found)} complaints")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
