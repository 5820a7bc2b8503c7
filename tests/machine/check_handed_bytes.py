#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the object that ships on a stack filled with a byte, then with another, and holds every byte that it hands to
the platform by address against the image written here: fields that nobody fills and padding are 0.

Another driver may copy such a record whole, compare it with the last one, or pass it on. Bytes that happen to lie on
the stack would make equal requests different, and show what was there.

usage: check_handed_bytes.py OBJECT...    the objects of one link: pmx_if.o, or one for each source
"""

import pathlib
import struct
import sys

import layer_machine

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))
from platform_functions import PLATFORM_HEADERS, ROOT, functions  # noqa: E402

FILLS = (0xA5, 0x5A)

# By command and query of the HDMI/AV driver: the size of what the parameter points to.
COMMAND_SIZES = {0: 1, 1: 4, 2: 4, 4: 1, 5: 1, 6: 1, 7: 1, 8: 1, 9: 32, 10: 32, 13: 1, 15: 1, 16: 32,
                 **{command: 4 for command in range(17, 32)}}
QUERY_SIZES = {1: 16}


def command_parameter(call):
    return {1: COMMAND_SIZES[call.arguments[0] & 0xFFFFFFFF]}


def query_parameter(call):
    return {1: QUERY_SIZES[call.arguments[0] & 0xFFFFFFFF]}


# What each platform function is handed by address: argument and size.
HANDED = {
    "fgPmxDrvSetAvd": command_parameter,
    "fgPmxDrvGetAvdInfo": query_parameter,
    "i4NFBPartitionRead": lambda _: {2: 4},
    "PMX_HalPlaneOrder": lambda _: {2: 32},
    "PMX_HalSetPlaneOrder": lambda _: {1: 8, 2: 32},
    "PMX_HalGetPlaneOrder": lambda _: {1: 8},
    "PMX_HalSetGamma": lambda _: {2: 9},
    "_i4OSD_SetPosOffset": lambda _: {0: 20},
}
# What takes pointers to other things: texts, handles and tables of the layer's own, results that are written alone.
NOT_BYTES = set("""
    x_vsnprintf PMX_IsLog Printf UTIL_Printf Assert get_part_id_by_name
    x_sema_create x_timer_create x_timer_start register_pm_ops unregister_pm_ops
    i4ImRegisterInterface2 i4ImUnregisterInterface2 i4ImQueryInterface i4ImReleaseInterface
""".split())


def little(size, *numbers):
    return b"".join((number & (1 << 8 * size) - 1).to_bytes(size, "little") for number in numbers)


def data(text):
    return bytes.fromhex(text)


class Scenario:
    """One operation, and what it hands over: (function, bytes of its pointers in the order of the arguments)."""

    def __init__(self, operation, *expected, answers=None):
        self.function, *self.arguments = operation
        self.expected, self.answers = list(expected), answers or {}

    def __str__(self):
        arguments = ("…" if isinstance(argument, bytes) else str(argument) for argument in self.arguments)
        return f"{self.function}({', '.join(arguments)})"


def output(enable, mode, frequency, setup=(0, 0, 0, 0)):
    """One entry of a request; what pads it is not the layer's to hand on."""
    return struct.pack("<B3sIIIIII", enable, b"\x3C\x3C\x3C", mode, frequency, *setup)


def resolution(display, mixer, chip, setup, osd5, port_mode, port_on, hdmi_on):
    """PMX_SET_HDMI_RES_PARAMETER_T, offset by offset."""
    image = bytes([
        0,               # 0   u1ScaleMode
        display,         # 1   ucHdmiOutDisplayResolution
        mixer,           # 2   ucFmtOutResolution
        mixer,           # 3   ucCCIROutResolution
        chip,            # 4   ucHdmiOutMode
        0, 0, 0,         # 5   padding
    ]) + little(4, *setup) + bytes([  # 8 eCcirDrvInfo
        osd5,            # 24  fgOsdMsg
        port_mode,       # 25  ucCCIROutMode
        port_on,         # 26  fgCCIROutEnable
        hdmi_on,         # 27  fgHdmiOutEnable
        0, 0,            # 28  u2_Vfreq
        0, 0,            # 30  padding
    ])
    assert len(image) == 32
    return image


def sent(image):
    """The three commands of a mode change: video PLL, digital port, HDMI."""
    return [("fgPmxDrvSetAvd", image)] * 3


def answer_query(machine):
    """A driver that fills the outputs of its record."""
    def answer(call):
        machine.write(call.arguments[1] + 8, little(4, 12))
        machine.write(call.arguments[1] + 12, little(2, 60))
        return 1
    return answer


ONE_MODE = resolution(12, 12, 0, (0, 0, 0, 0), 0, 1, 0, 1)
ONE_SD_MODE = resolution(2, 2, 0, (0, 0, 0, 0), 0, 1, 0, 1)
EACH = resolution(10, 8, 2, (2, 5, 1, 0x01020304), 255, 0, 255, 1)
EACH_OFF = resolution(3, 3, 255, (1, 2, 2, 9), 1, 0, 0, 0)
REQUEST = output(255, 8, 60, (2, 5, 1, 0x01020304)) + output(1, 10, 60) + output(1, 8, 60) + output(1, 0, 60)
REQUEST_OFF = output(0, 3, 50, (1, 2, 2, 9)) + output(0, 12, 50) + output(0, 13, 50) + output(1, 3, 50)
TWO_BYTES = data("3C 3C")

SCENARIOS = [
    Scenario(("PMX_Reset", 0), ("i4NFBPartitionRead", bytes(4)),
             ("PMX_HalPlaneOrder", little(4, 4, 3, 1, 0, 2, 5, 6, 7))),
    Scenario(("PMX_GetHDMIDefaultRes",), ("i4NFBPartitionRead", bytes(4))),

    # Both modes differ from what was set before them: the whole sequence runs each time.
    Scenario(("PMX_SetMode", 0, 12, 60, 2), *sent(ONE_MODE)),
    Scenario(("PMX_SetMode", 0, 2, 60, 0), *sent(ONE_SD_MODE)),
    Scenario(("PMX_SetModeEx", 0, REQUEST, 60, 2, 255), *sent(EACH)),
    Scenario(("PMX_SetModeEx", 0, REQUEST_OFF, 50, 0xFF, 1), *sent(EACH_OFF)),
    Scenario(("PMX_SetModeEx", 0, REQUEST_OFF, 50, 0xFF, 1), *sent(EACH_OFF), answers={"fgIsHotPlugChgRes": 1}),

    Scenario(("PMX_SetTVSystem", 0, 60, 255), ("fgPmxDrvSetAvd", data("3C 00 FF 00"))),
    Scenario(("PMX_SetTVSystem", 0, 24, 0), ("fgPmxDrvSetAvd", data("18 00 00 00"))),
    Scenario(("PMX_ChkSupportedRes", 0, 255, 0xFEDC, TWO_BYTES, TWO_BYTES),
             ("fgPmxDrvGetAvdInfo", data("FF 00 00 00  DC FE 00 00  00 00 00 00  00 00 00 00"))),
    Scenario(("PMX_ChkSupportedRes", 0, 12, 60, TWO_BYTES, TWO_BYTES),
             ("fgPmxDrvGetAvdInfo", data("0C 00 00 00  3C 00 00 00  00 00 00 00  00 00 00 00")),
             answers={"fgPmxDrvGetAvdInfo": answer_query}),
    Scenario(("PMX_SetHdmiDeepColor", 0, 255), ("fgPmxDrvSetAvd", data("FF"))),
    Scenario(("PMX_RecordUiResAuto", 2), ("fgPmxDrvSetAvd", data("02"))),

    Scenario(("PMX_SetPlaneOrderArray", 0, little(4, 0x105, 1, 2, 3, 4, 5, 6, 0xFFFFFFFF)),
             ("PMX_HalPlaneOrder", little(4, 0x105, 1, 2, 3, 4, 5, 6, 0xFFFFFFFF))),
    Scenario(("PMX_SetPlaneOrder", 0, 255, 0), ("PMX_HalPlaneOrder", little(4, 255, 1, 2, 3, 4, 5, 6, 255))),
    Scenario(("PMX_SetArbPlaneOrder", 0, 0xF6543210), ("PMX_HalSetPlaneOrder", bytes(range(8)), bytes(32)),
             ("_i4OSD_SetPosOffset", little(4, 1, 4, 5, 0, 0))),
    Scenario(("PMX_GetArbPlaneOrder", 0, bytes(4)), ("PMX_HalGetPlaneOrder", bytes(8))),

    Scenario(("PMX_SetBrightness", 0, 255, 0), ("fgPmxDrvSetAvd", data("FF"))),
    Scenario(("PMX_SetContrast", 0, 254, 0), ("fgPmxDrvSetAvd", data("FE"))),
    Scenario(("PMX_SetHue", 0, 2, 0), ("fgPmxDrvSetAvd", data("02"))),
    Scenario(("PMX_SetSaturation", 0, 1, 0), ("fgPmxDrvSetAvd", data("01"))),
    Scenario(("PMX_SetSharpness", 0, 128, 0), ("fgPmxDrvSetAvd", data("80"))),
    Scenario(("PMX_SetGamma", 0, 1), ("PMX_HalSetGamma", bytes([0, 99, 136, 163, 186, 206, 224, 240, 255]))),
    Scenario(("PMX_SetGamma", 0, 2), ("PMX_HalSetGamma", bytes([0, 121, 155, 180, 199, 216, 230, 243, 255]))),
    Scenario(("PMX_SetGamma", 0, 3), ("PMX_HalSetGamma", bytes([0, 85, 125, 155, 180, 202, 221, 239, 255]))),
    Scenario(("PMX_SetGamma", 0, 4), ("PMX_HalSetGamma", bytes([0, 100, 137, 164, 187, 206, 224, 240, 255]))),
    Scenario(("PMX_SetGamma", 0, 255), ("PMX_HalSetGamma", None)),

    Scenario(("PMX_SetAspectRatio", 0, 0x89ABCDEF), ("fgPmxDrvSetAvd", little(4, 0x89ABCDEF))),
    Scenario(("PMX_SetAspectRatioEx", 0, 5, 0), ("fgPmxDrvSetAvd", little(4, 5))),
    Scenario(("PMX_SetAspectRatioEx", 0, 0x01020304, 255)),
    Scenario(("PMX_SetAspectRatioNext", 0), ("fgPmxDrvSetAvd", little(4, 0x01020304))),

    Scenario(("PMX_SetDigitalOutRgb", 0, 0), ("fgPmxDrvSetAvd", data("02"))),
    Scenario(("PMX_SetDigitalOutRgb", 0, 4), ("fgPmxDrvSetAvd", data("01"))),
    Scenario(("PMX_SetExternalChipSetting", 0, 0x81828384), ("fgPmxDrvSetAvd", little(4, 0x81828384))),
    Scenario(("PMX_SetExternalChipSetting", 14, 3), ("fgPmxDrvSetAvd", little(4, 3))),
]


def shown(handed):
    """What was handed over, a line for each call; bytes in groups of four."""
    lines = []
    for function, *images in handed:
        texts = ("null" if image is None else " ".join(image[i:i + 4].hex() for i in range(0, len(image), 4))
                 for image in images)
        lines.append(f"    {function}: {' | '.join(texts)}")
    return "\n".join(lines) or "    nothing"


def observed(machine, scenario):
    machine.answers = {"fgPmxDrvSetAvd": 1, "TVE_SetFmtEx": 1}
    for function, answer in scenario.answers.items():
        machine.answers[function] = answer(machine) if callable(answer) else answer
    arguments = [machine.caller_memory(argument) if isinstance(argument, bytes) else argument
                 for argument in scenario.arguments]
    machine.call(scenario.function, *arguments)
    calls = [event for event in machine.events if isinstance(event, layer_machine.Call) and event.handed]
    return [(call.name, *(call.handed[number] for number in sorted(call.handed))) for call in calls]


def complaints(objects, scenarios):
    machine = layer_machine.Machine(objects)
    machine.handed = HANDED
    for fill in FILLS:
        machine.fill = fill
        machine.power_on()
        for scenario in scenarios:
            try:
                handed = observed(machine, scenario)
            except KeyError as error:
                yield error.args[0]
                continue
            if handed != scenario.expected:
                yield (f"{scenario} on a stack of {fill:02x}:\n  expected:\n{shown(scenario.expected)}\n"
                       f"  found:\n{shown(handed)}")
    yield from unseen(set(machine.image.needed), scenarios)


def unseen(needed, scenarios):
    """Platform functions that take a pointer, and at whose bytes nobody has looked."""
    seen = {function for scenario in scenarios for function, *_ in scenario.expected}
    for header in PLATFORM_HEADERS:
        for function in functions(ROOT / header):
            if function.name in needed - NOT_BYTES - seen and "*" in function.declared:
                yield f"{function.name}: takes a pointer, and no operation here hands it anything"


if __name__ == "__main__":
    sys.exit(layer_machine.check(__doc__, complaints, SCENARIOS, "operations, every byte that they hand over"))
