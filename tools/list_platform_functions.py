#!/usr/bin/env python3
"""Lists the functions that the headers declare: as text, as JSON, or as the C++ table that the board is built with.

    list_platform_functions.py                         NAME of every platform function, one a line
    list_platform_functions.py --json                  result, parameters and contract of each
    list_platform_functions.py --cpp FILE              the table behind board::platform_functions()
    list_platform_functions.py --layer ...             the functions that the mixer layer offers instead

As a module: functions(path) and platform_functions() yield the declarations.
"""

import argparse
import dataclasses
import json
import pathlib
import re
import sys

ROOT = pathlib.Path(__file__).resolve().parent.parent
# The headers behind which the rest of the stack stands. What is marked PMX_API belongs to the layer itself.
PLATFORM_HEADERS = [ROOT / "src" / path for path in (
    "system/inc/u_os.h", "driver/private_inc/drv_if.h", "driver/private_inc/pmx_hal.h",
    "driver/private_inc/drv_tve.h", "driver/private_inc/drv_vdp.h", "driver/private_inc/drv_osd.h",
    "driver/private_inc/drv_av_d.h")]
LAYER_HEADERS = [ROOT / "src/driver/private_inc/drv_pmx.h"]

DECLARATION = re.compile(
    r"""(?:/\*\*(?P<doc>(?:(?!\*/).)*)\*/\s*)?                   # the contract right before it
        ^(?P<layer>PMX_API\s+)?
        (?P<result>(?:const\s+)?\w+(?:\s*\*+)?)\s*\b(?P<name>\w+)
        \((?P<parameters>[^()]*)\)
        (?:\s*DRV_PRINTF_FORMAT\(\d+,\s*\d+\))?\s*;""",
    re.DOTALL | re.MULTILINE | re.VERBOSE)


@dataclasses.dataclass
class Parameter:
    type: str
    name: str


@dataclasses.dataclass
class Function:
    name: str
    result: str
    parameters: list[Parameter]
    variadic: bool
    doc: str
    layer: bool
    header: str
    line: int

    @property
    def has_result(self):
        return self.result != "void"


def parse_parameters(text, where):
    """The parameters, and whether any number of values follows them."""
    parameters, variadic = [], False
    text = " ".join(text.split())
    if text in ("", "void"):
        return parameters, variadic
    for part in text.split(","):
        part = part.strip()
        if part == "...":
            variadic = True
            continue
        match = re.fullmatch(r"(.*?[\s*])(\w+)", part)
        if not match:
            sys.exit(f"{where}: not a parameter: {part}")
        parameters.append(Parameter(match.group(1).strip(), match.group(2)))
    return parameters, variadic


def contract(comment):
    """The text of a contract without its margin."""
    lines = [re.sub(r"^\s*\* ?", "", line) for line in (comment or "").strip().splitlines()]
    return "\n".join(line.rstrip() for line in lines).strip()


def functions(path):
    """Every function that a header declares, in its order."""
    path = pathlib.Path(path)
    text = path.read_text(encoding="utf-8")
    for match in DECLARATION.finditer(text):
        if match["result"] in ("typedef", "return") or match["name"] in ("DRV_STATIC_ASSERT", "DRV_ENUM"):
            continue
        line = text.count("\n", 0, match.start("name")) + 1
        parameters, variadic = parse_parameters(match["parameters"], f"{path}:{line}")
        yield Function(match["name"], match["result"].strip(), parameters, variadic, contract(match["doc"]),
                       bool(match["layer"]), path.name, line)


def platform_functions(headers=None):
    """The functions that the layer needs of the rest of the stack."""
    return [function for header in headers or PLATFORM_HEADERS for function in functions(header)
            if not function.layer]


def layer_functions(headers=None):
    """The functions that the layer offers."""
    return [function for header in headers or LAYER_HEADERS for function in functions(header) if function.layer]


def cpp_table(listed):
    rows = "\n".join(f'    {{ "{function.name}", {str(function.has_result).lower()} }},' for function in listed)
    return f"""// Generated from the headers; see {pathlib.Path(__file__).name}.
#include "board/trace.h"

namespace board
{{
namespace
{{

constexpr PlatformFunction functions[] = {{
{rows}
}};

}} // namespace

std::span<const PlatformFunction> platform_functions()
{{
    return functions;
}}

}} // namespace board
"""


def main():
    parser = argparse.ArgumentParser(description="List the functions that the headers declare.")
    parser.add_argument("--layer", action="store_true", help="those that the layer offers, not those that it needs")
    output = parser.add_mutually_exclusive_group()
    output.add_argument("--cpp", metavar="FILE", type=pathlib.Path, help="write the C++ table to this file")
    output.add_argument("--json", action="store_true", help="everything that is known, as JSON")
    parser.add_argument("headers", nargs="*", help="read these instead of the project's headers")
    arguments = parser.parse_args()

    listed = (layer_functions if arguments.layer else platform_functions)(arguments.headers)
    names = [function.name for function in listed]
    twice = sorted({name for name in names if names.count(name) > 1})
    if not listed or twice:
        sys.exit("declared twice: " + ", ".join(twice) if twice else "the headers declare no function")

    if arguments.cpp:
        arguments.cpp.parent.mkdir(parents=True, exist_ok=True)
        arguments.cpp.write_text(cpp_table(listed), encoding="utf-8")
    elif arguments.json:
        print(json.dumps([dataclasses.asdict(function) for function in listed], indent=2))
    else:
        print("\n".join(names))
    return 0


if __name__ == "__main__":
    sys.exit(main())
