"""Contracts: what the headers promise about every function, and that the virtual board and the symbol lists keep up."""

import pathlib
import re
import sys

sys.path.insert(0, str(pathlib.Path(__file__).parents[2] / "cmake"))

from cpp import Source  # noqa: E402
from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, functions as declared  # noqa: E402

DEFINED = "tests/symbols/defined.txt"
NEEDED = "tests/symbols/needed.txt"
COMPILERS_OWN = {"memcpy", "memset"}


def read_declarations(root, header):
    return list(declared(root / header)) if (root / header).exists() else []


def check_contract(declaration, needs_context):
    """A contract is a comment that names every parameter, the result, and for the layer where it may be called."""
    comment = declaration.contract
    if not comment:
        yield f"{declaration.name}: no contract (/** … */ directly above)"
        return
    named = re.findall(r"@param(?:\[\w+\])?\s+(\w+)", comment)
    for parameter in declaration.parameters:
        if parameter not in named:
            yield f"{declaration.name}: no @param {parameter}"
    for parameter in named:
        if parameter not in declaration.parameters:
            yield f"{declaration.name}: @param {parameter} is no parameter"
    if declaration.has_result and "@return" not in comment:
        yield f"{declaration.name}: no @return"
    if not declaration.has_result and "@return" in comment:
        yield f"{declaration.name}: @return, but nothing is returned"
    if needs_context and "@context" not in comment:
        yield f"{declaration.name}: no @context"


def check_headers(root):
    for header in (LAYER_HEADER, *PLATFORM_HEADERS):
        for declaration in read_declarations(root, header):
            for message in check_contract(declaration, header == LAYER_HEADER):
                yield header, declaration.line, message


def read_list(root, path):
    """{name: mark} of a symbol list; the mark is "", "-" or "?"."""
    if not (root / path).exists():
        return {}
    matches = re.finditer(r"^([-?] )?(\w+)$", (root / path).read_text(encoding="utf-8"), re.M)
    return {match.group(2): (match.group(1) or "").strip() for match in matches}


def check_lists(root):
    """The headers declare what the lists of symbols name, and nothing else."""
    platform = {declaration.name for header in PLATFORM_HEADERS for declaration in read_declarations(root, header)}
    needed = set(read_list(root, NEEDED)) - COMPILERS_OWN
    for name in sorted(platform - needed):
        yield NEEDED, 1, f"{name}: declared in a platform header, but not listed"
    for name in sorted(needed - platform):
        yield NEEDED, 1, f"{name}: listed, but declared in no platform header"

    offered = {declaration.name for declaration in read_declarations(root, LAYER_HEADER)}
    defined = read_list(root, DEFINED)
    for name in sorted(offered):
        if defined.get(name) != "":
            yield DEFINED, 1, f"{name}: declared in {LAYER_HEADER}, but not listed as there"


def check_board(root):
    """Every platform function of the board records itself first, under its own name and with all its arguments."""
    functions = {}
    for path in sorted((root / "board").glob("*.cpp")):
        for function in Source(path.read_text(encoding="utf-8")).functions():
            functions[function.name] = (path.relative_to(root).as_posix(), function)
    if not functions:
        return

    for header in PLATFORM_HEADERS:
        for declaration in read_declarations(root, header):
            if declaration.name not in functions:
                yield header, declaration.line, f"{declaration.name}: the board does not have it"
                continue
            name, function = functions[declaration.name]
            match = re.match(r"\s*(BOARD_\w+)\s*\(\s*(\w+)((?:[^;]|\n)*?)\)\s*;", function.body)
            if not match or not match.group(1).startswith("BOARD_CALL"):
                yield name, function.line, f"{function.name}: the first statement is not its BOARD_CALL"
            elif match.group(2) != function.name:
                yield name, function.line, f"{function.name}: recorded as {match.group(2)}"
            elif declaration.has_result == (match.group(1) == "BOARD_CALL"):
                yield name, function.line, f"{function.name}: {match.group(1)} does not fit its result"
            else:
                for parameter in declaration.parameters:
                    if not re.search(rf"\b{parameter}\b", match.group(3)):
                        yield name, function.line, f"{function.name}: {parameter} is not recorded"


def complaints(root):
    return [*check_headers(root), *check_lists(root), *check_board(root)]
