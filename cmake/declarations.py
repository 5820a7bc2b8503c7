# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Reads what the headers declare besides functions: enumerations, constants that are numbers, and records.

What a number's name is told by stands in the text beside it: `a NAME value`, where NAME is an enumeration, or what the
names of several constants begin with ("a PMX_TV_TYPE_ value"). A parameter, a result or a field whose type is an
enumeration needs no words.
"""

import dataclasses
import pathlib
import re

COMMENT = re.compile(r"/\*.*?\*/|//[^\n]*", re.DOTALL)
ENUMERATION = re.compile(r"^(?:typedef\s+)?DRV_ENUM(?:\((?P<name>\w+)\)|_UNNAMED)\s*\{(?P<body>.*?)\}",
                         re.DOTALL | re.MULTILINE)
ENUMERATOR = re.compile(r"^\s*(?P<name>\w+)\s*=\s*(?P<number>\d+)\s*,?[ ]*(?:/\*\*<\s*(?:\[(?P<type>\w+)\])?)?",
                        re.MULTILINE)
CONSTANT = re.compile(r"^[ \t]*#define (?P<name>[A-Z]\w*) (?P<number>0x[0-9A-Fa-f]+|\d+)u?(?=[ \t]*(?:/[/*]|$))",
                      re.MULTILINE)
RECORD = re.compile(r"^typedef\s+struct\s*\{(?P<body>.*?)^\}\s*(?P<name>\w+)\s*;", re.DOTALL | re.MULTILINE)
FIELD = re.compile(r"""^[ \t]*(?P<type>(?:const[ ])?\w+\**)[ ](?P<name>\w+)
                       (?:\[(?P<count>\w+)\]|[ ]:[ ]\d+)?;
                       (?:[ ]*/\*(?:\*<)?(?P<comment>.*?)\*/)?""", re.DOTALL | re.MULTILINE | re.VERBOSE)
NAMED = re.compile(r"\b([A-Z]+_\w*) value\b")


class Unclear(Exception):
    """What a header does not tell, or not in the way it is read. Begins with FILE:LINE where it is known."""


@dataclasses.dataclass(frozen=True)
class Enumerator:
    name: str
    number: int
    type: str  # in brackets at the beginning of its comment: of what goes with it; or nothing
    line: int


@dataclasses.dataclass(frozen=True)
class Enumeration:
    name: str  # or nothing
    enumerators: tuple
    line: int


@dataclasses.dataclass(frozen=True)
class Constant:
    name: str
    number: int
    line: int


@dataclasses.dataclass(frozen=True)
class Field:
    name: str
    type: str
    count: str  # of an array; or nothing
    text: str   # of the comment behind it
    line: int


@dataclasses.dataclass(frozen=True)
class Record:
    name: str
    fields: tuple  # those that are no functions
    line: int


def _line(text, position):
    return text.count("\n", 0, position) + 1


def _enumerators(text, body_start, body):
    """The enumerators of a body; every one has its number."""
    found = list(ENUMERATOR.finditer(body))
    names = [match["name"] for match in found]
    for part in COMMENT.sub("", body).split(","):
        name = part.split("=")[0].strip()
        if name and name not in names:
            raise Unclear(f"{_line(text, body_start + body.index(name))}: {name}: one line, and a decimal number: "
                          "NAME = 1,")
    return tuple(Enumerator(match["name"], int(match["number"]), match["type"] or "",
                            _line(text, body_start + match.start("name"))) for match in found)


def enumerations(text):
    """Every enumeration of a header's text, in its order."""
    for match in ENUMERATION.finditer(text):
        yield Enumeration(match["name"] or "", _enumerators(text, match.start("body"), match["body"]),
                          _line(text, match.start()))


def constants(text):
    """Every constant of a header's text that is a plain number, in its order."""
    for match in CONSTANT.finditer(text):
        yield Constant(match["name"], int(match["number"], 0), _line(text, match.start()))


def records(text):
    """Every record of a header's text, in its order."""
    for match in RECORD.finditer(text):
        fields = [Field(field["name"], field["type"], field["count"] or "", " ".join((field["comment"] or "").split()),
                        _line(text, match.start("body") + field.start("name")))
                  for field in FIELD.finditer(match["body"])]
        yield Record(match["name"], tuple(fields), _line(text, match.start("name")))


def named(text):
    """The NAME of "a NAME value", or nothing."""
    found = set(NAMED.findall(text))
    if len(found) > 1:
        raise Unclear("one thing has its names from " + " and from ".join(sorted(found)))
    return found.pop() if found else ""


def read(path):
    return pathlib.Path(path).read_text(encoding="utf-8")
