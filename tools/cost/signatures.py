"""What the headers tell of the layer's operations and the platform's functions, and what they do not tell: how much
stands behind a pointer, and which way it goes."""

import dataclasses
import functools
import pathlib
import re
import sys

ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "cmake"))

import platform_functions  # noqa: E402

HEADERS = ("drv_pmx.h", "drv_if_vdp.h", "u_os.h", "drv_if.h", "pmx_hal.h", "drv_tve.h", "drv_vdp.h", "drv_osd.h",
           "drv_av_d.h")
HEADER_DIRECTORIES = ("src/system/inc", "src/driver/inc", "src/driver/private_inc")

# A video plane's table is the one thing that the layer calls through a pointer.
PLANE_CALL = "pu4SetColorMode"
REGISTERS = ("x_reg_read32", "x_reg_write32")
LOGS = ("PMX_IsLog", "Printf", "UTIL_Printf")

# Bytes behind a pointer, as a C++ expression over the function's parameters. Read by the function ...
READ = {
    ("PMX_HalPlaneOrder", "pu4PlaneOrder"): "8 * sizeof(UINT32)",
    ("PMX_HalSetPlaneOrder", "pu1PlnSel"): "8",
    ("PMX_HalSetGamma", "pucCurve"): "9",
    ("_i4OSD_SetPosOffset", "pi4Offset"): "5 * sizeof(INT32)",
    ("fgPmxDrvSetAvd", "pvParameter"): "cost::avd_parameter_size(u4Command)",
    ("fgPmxDrvGetAvdInfo", "pvParameter"): "sizeof(PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T)",
    ("PMX_SetModeEx", "prOutConf"): "PMX_OUTPUT_NUM * sizeof(PMX_RESOLUTION_T)",
    ("PMX_SetPlaneOrderArray", "pu4PlaneOrder"): "8 * sizeof(UINT32)",
}
# ... and written by it.
WRITTEN = {
    ("x_sema_create", "phSema"): "sizeof(HANDLE_T)",
    ("x_timer_create", "phTimer"): "sizeof(HANDLE_T)",
    ("x_vsnprintf", "szBuffer"): "strlen(szBuffer) + 1",
    ("i4NFBPartitionRead", "pvDest"): "u4Count",
    ("PMX_HalSetPlaneOrder", "pi4PlnDelay"): "8 * sizeof(INT32)",
    ("PMX_HalGetPlaneOrder", "pu1PlnSel"): "8",
    ("fgPmxDrvGetAvdInfo", "pvParameter"): "sizeof(PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T)",
}
TAGS = {"pvTag", "pvArg", "param"}
# The address of an object or function that both sides know by name.
SYMBOLS = {("register_pm_ops", "prOps"), ("unregister_pm_ops", "prOps"), ("i4ImRegisterInterface2", "pvIf"),
           ("x_timer_start", "pfCallback")}


@dataclasses.dataclass(frozen=True)
class Parameter:
    type: str
    name: str
    kind: str     # number, tag, text, symbol, values, list (va_list), data, table, place
    read: str     # bytes that are read behind the pointer, or nothing
    written: str  # bytes that are written there, or nothing


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


class Unknown(Exception):
    """A header declares something of which this file does not know what stands behind it."""


def parameter_of(function, declared):
    if declared == "...":
        return Parameter("", "", "values", "", "")
    match = re.fullmatch(r"(.*?[\s*])(\w+)", declared)
    if not match:
        raise Unknown(f"{function}: a parameter without a name: {declared}")
    type_name, name = match[1].strip(), match[2]
    key = function, name
    read, written = READ.get(key, ""), WRITTEN.get(key, "")
    if type_name == "va_list":
        kind = "list"
    elif key in SYMBOLS:
        kind = "symbol"
    elif type_name == "void*" and name in TAGS:
        kind = "tag"
    elif type_name == "void**":
        kind = "table"
    elif read or written:
        kind = "data" if read else "place"
    elif type_name in ("const CHAR*", "const char*"):
        kind = "text"
    elif "*" in type_name:
        kind, written = "place", f"sizeof *{name}"
        if type_name.startswith("const") or type_name in ("void*", "CHAR*"):
            raise Unknown(f"{function}: tools/cost/signatures.py does not tell how much stands behind {name}")
    else:
        kind = "number"
    return Parameter(type_name, name, kind, read, written)


def _function(declared):
    parameters = tuple(parameter_of(declared.name, text.strip())
                       for text in declared.declared.split(",") if text.strip() not in ("", "void"))
    return Function(declared.name, declared.result, parameters)


@functools.cache
def operations():
    """What the layer offers, by name, in the header's order."""
    listed = platform_functions.functions(ROOT / platform_functions.LAYER_HEADER)
    return {declared.name: _function(declared) for declared in listed}


@functools.cache
def platform():
    """What the layer needs, by name, and the one function of a video plane's table."""
    listed = {declared.name: _function(declared) for header in platform_functions.PLATFORM_HEADERS
              for declared in platform_functions.functions(ROOT / header)}
    listed[PLANE_CALL] = Function(PLANE_CALL, "UINT32", (
        Parameter("void*", "pvTag", "tag", "", ""),
        Parameter("DRV_PMX_COLOR_SPACE_T", "eColorSpace", "number", "", "")))
    return listed
