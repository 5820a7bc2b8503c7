# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Reads the functions that the headers declare: functions(path) yields those of one header, function_pointers(path) the
types of functions that are called through a pointer, and parts(contract) takes a contract to pieces.
"""

import dataclasses
import pathlib
import re

ROOT = pathlib.Path(__file__).resolve().parent.parent
# The headers behind which the rest of the stack stands, and the one that the layer itself offers.
PLATFORM_HEADERS = ["src/system/inc/u_os.h"] + [f"src/driver/private_inc/{name}.h" for name in (
    "drv_if", "pmx_hal", "drv_tve", "drv_vdp", "drv_osd", "drv_av_d")]
LAYER_HEADER = "src/driver/private_inc/drv_pmx.h"

CONTRACT = r"(?:/\*\*(?!<)(?P<contract>(?:(?!\*/).)*)\*/\s*)?"  # right before it
RESULT = r"(?P<result>(?:const\s+)?\w+(?:\s*\*+)?)"
DECLARATION = re.compile(
    rf"""{CONTRACT}
        ^(?:PMX_API\s+)?
        {RESULT}\s*\b(?P<name>\w+)
        \((?P<parameters>[^()]*)\)
        (?:\s*DRV_PRINTF_FORMAT\(\d+,\s*\d+\))?\s*;""",
    re.DOTALL | re.MULTILINE | re.VERBOSE)
FUNCTION_POINTER = re.compile(
    rf"""(?:/\*\*\s*as\s+(?P<model_above>\w+)\s*\*/\s*|{CONTRACT})
        ^\s*(?P<typedef>typedef\s+)?
        {RESULT}\s*\(\*(?P<name>\w+)\)
        \((?P<parameters>[^()]*)\)\s*;
        (?:[ ]*/\*\*<\s*as\s+(?P<model>\w+)\s*\*/)?""",
    re.DOTALL | re.MULTILINE | re.VERBOSE)
TAG = re.compile(r"^@(param|return|context)\b(?:\[([^\]]*)\])?\s*", re.MULTILINE)
BEHIND = re.compile(r"\[([^\]]*)\]\s*")  # see pointers.py
LOOKS_LIKE_ONE = {"typedef", "return", "DRV_STATIC_ASSERT", "static_assert", "DRV_ENUM"}


@dataclasses.dataclass(frozen=True)
class Function:
    name: str
    has_result: bool
    result: str        # its type
    declared: str      # its parameters as they are declared
    parameters: tuple  # names
    contract: str      # the comment directly above the declaration, or nothing
    line: int


@dataclasses.dataclass(frozen=True)
class FunctionPointer:
    function: Function
    is_type: bool  # a typedef; else a member of a table
    model: str     # the function whose contract a member has, where the header names one


def parameter_names(text):
    """The names of all parameters but the variable ones."""
    for parameter in text.split(","):
        match = re.search(r"(\w+)\s*(?:\[\w*\])?\s*$", parameter)
        if match and parameter.strip() != "void":
            yield match.group(1)


def _function(match, text):
    return Function(match["name"], match["result"] != "void", match["result"], " ".join(match["parameters"].split()),
                    tuple(parameter_names(match["parameters"])), (match["contract"] or "").strip(),
                    text.count("\n", 0, match.start("name")) + 1)


def functions(path):
    """Every function that a header declares, in its order."""
    text = pathlib.Path(path).read_text(encoding="utf-8")
    for match in DECLARATION.finditer(text):
        if not {match["result"], match["name"]} & LOOKS_LIKE_ONE:
            yield _function(match, text)


def function_pointers(path):
    """Every typedef of a pointer to a function, and every such member of a table, in the header's order."""
    text = pathlib.Path(path).read_text(encoding="utf-8")
    for match in FUNCTION_POINTER.finditer(text):
        yield FunctionPointer(_function(match, text), match["typedef"] is not None,
                              match["model_above"] or match["model"] or "")


def _without_stars(comment):
    return "\n".join(re.sub(r"^\s*\* ?", "", line).strip() for line in comment.split("\n"))


def joined(text):
    """One line of several; runs of blanks within a line stay, for they set columns apart."""
    return re.sub(r"\s*\n\s*", " ", text).strip()


def parts(contract):
    """(brief, [(parameter, text, direction, what stands behind it)], result, context) of a contract."""
    text = _without_stars(contract)
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
