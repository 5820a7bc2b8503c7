# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What the headers tell of the layer's operations and the platform's functions, as those need it who stand between
them: for each parameter how it is recorded, and how many bytes are read or written behind it."""

import dataclasses
import functools
import pathlib
import sys

ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "cmake"))

import platform_functions  # noqa: E402
import pointers  # noqa: E402
from pointers import Unclear  # noqa: E402

HEADERS = ("drv_pmx.h", "drv_if_vdp.h", "u_os.h", "drv_if.h", "pmx_hal.h", "drv_tve.h", "drv_vdp.h", "drv_osd.h",
           "drv_av_d.h")
HEADER_DIRECTORIES = ("src/system/inc", "src/driver/inc", "src/driver/private_inc")

# A video plane's table is the one thing that the layer calls through a pointer.
PLANE_CALL = "pu4SetColorMode"
PLANE_TABLE = "src/driver/private_inc/drv_if_vdp.h"
REGISTERS = ("x_reg_read32", "x_reg_write32")
LOGS = ("PMX_IsLog", "Printf", "UTIL_Printf")


@dataclasses.dataclass(frozen=True)
class Parameter:
    type: str
    name: str
    kind: str     # number, tag, text, symbol, values, list (va_list), data, table, place
    read: str     # bytes that are read behind the pointer, as a C++ expression over the parameters, or nothing
    written: str  # bytes that are written there, or nothing
    is_tested: bool = True  # for null, by the function, where it leads somewhere


@dataclasses.dataclass(frozen=True)
class Function:
    name: str
    result: str
    parameters: tuple

    @property
    def has_result(self):
        return self.result != "void"

    @property
    def is_variadic(self):
        return any(parameter.kind == "values" for parameter in self.parameters)

    def declaration(self, name=None, named=True):
        declared = ", ".join(_declared(parameter, named) for parameter in self.parameters) or "void"
        return f"{self.result} {name or self.name}({declared})"


def _declared(parameter, named):
    if parameter.kind == "values":
        return "..."
    return f"{parameter.type} {parameter.name}" if named else parameter.type


@functools.cache
def _known():
    """The function types that are handed over, and the enumerations, of all headers."""
    paths = [path for directory in HEADER_DIRECTORIES for path in sorted((ROOT / directory).glob("*.h"))]
    callbacks = {found.function.name for path in paths for found in platform_functions.function_pointers(path)
                 if found.is_type}
    texts = "\n".join(path.read_text(encoding="utf-8") for path in paths)
    return callbacks, pointers.enumerations(texts)


def _bytes_by_value(function, pointer):
    """As many as the type has that goes with a command."""
    enumerators = {}
    for enumerator, type_name in pointers.types_by_value(function, pointer, _known()[1]).items():
        enumerators.setdefault(type_name, []).append(f"{pointer.size} == {enumerator}")
    cases = "".join(f"{' || '.join(listed)} ? sizeof({type_name}) : " for type_name, listed in enumerators.items())
    return f"({cases}0)"


def _bytes(function, name, pointer):
    if pointer.kind == "by":
        return _bytes_by_value(function, pointer)
    if pointer.kind == "bytes":
        return pointer.size
    if pointer.kind == "text":
        return f"strlen({name}) + 1"
    return f"{pointer.size} * sizeof({pointer.target})" if pointer.size else f"sizeof *{name}"


def _pointer(function, type_name, name):
    pointer = pointers.pointer_of(function, type_name, name, _known()[0])
    if type_name == "void**":
        return Parameter(type_name, name, "table", "", "")
    if pointer.kind in ("tag", "symbol"):
        return Parameter(type_name, name, pointer.kind, "", "")
    if pointer.kind == "text" and not pointer.is_written:
        return Parameter(type_name, name, "text", "", "")
    size = _bytes(function, name, pointer)
    return Parameter(type_name, name, "data" if pointer.is_read else "place", size if pointer.is_read else "",
                     size if pointer.is_written else "", pointer.may_be_null)


def _function(declared):
    parameters = []
    for type_name, name in pointers.declared_parameters(declared):
        if pointers.is_pointer(type_name, _known()[0]):
            parameters.append(_pointer(declared, type_name, name))
        else:
            parameters.append(Parameter(type_name, name, "list" if type_name == "va_list" else "number", "", ""))
    if declared.declared.endswith("..."):
        parameters.append(Parameter("", "", "values", "", ""))
    return Function(declared.name, declared.result, tuple(parameters))


@functools.cache
def operations():
    """What the layer offers, by name, in the header's order."""
    listed = platform_functions.functions(ROOT / platform_functions.LAYER_HEADER)
    return {declared.name: _function(declared) for declared in listed}


def places():
    """Where each of them is declared."""
    header = platform_functions.LAYER_HEADER
    return {declared.name: f"{header}:{declared.line}" for declared in platform_functions.functions(ROOT / header)}


@functools.cache
def platform():
    """What the layer needs, by name, and the one function of a video plane's table."""
    listed = {declared.name: _function(declared) for header in platform_functions.PLATFORM_HEADERS
              for declared in platform_functions.functions(ROOT / header)}
    [plane_call] = [found.function for found in platform_functions.function_pointers(ROOT / PLANE_TABLE)
                    if found.function.name == PLANE_CALL]
    listed[PLANE_CALL] = _function(plane_call)
    return listed
