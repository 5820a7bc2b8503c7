#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the object that ships, and holds its loads and stores in the handshake's status against what is written here:
which, in which order, between which calls, and that each is of its own and as wide as its field.

The flags are read and written by callers' threads, by the timer and by the display part without a lock. A compiler that
merges two of them, or moves one past another, gives the others a state that nobody wrote.

Running it rather than reading its assembly: where an access goes is then a number, not the end of a chain of registers,
inlining does not matter, and one check serves every processor. What a run cannot see is code that it does not reach: a
place that names the status and was not reached is therefore a complaint.

usage: check_stores.py OBJECT...    the objects of one link: pmx_if.o, or one for each source
"""

import struct
import sys

import layer_machine

STATUS, STATUS_SIZE = "_arPmxDispPartStatus", 7
FIELDS = {(0, 4): "timer", (4, 1): "change", (5, 1): "osd", (6, 1): "set"}

RES_1080P60HZ, RES_2D_576I50HZ = 12, 38


class Scenario:
    """One operation, and what it does in the status.

    Expected are words: "change?" loads the format-change flag, "osd=1" stores 1 in the OSD-enable flag; "timer" is the
    timer's handle, "set" the flag that it is set. Every other word is a platform function: its calls are looked at
    then, those of others are not.
    """

    def __init__(self, operation, expected, flags=(0, 0, 0), boot=False, **answers):
        self.function, *self.arguments = operation
        self.expected, self.flags, self.boot, self.answers = expected.split(), flags, boot, answers

    def __str__(self):
        with_flags = ", ".join(f"{name}={value}" for name, value in zip(("change", "osd", "set"), self.flags) if value)
        answers = ", ".join(f"{name}() = {value}" for name, value in self.answers.items())
        arguments = ", ".join("…" if isinstance(argument, tuple) else str(argument) for argument in self.arguments)
        conditions = " with ".join(filter(None, (f"{self.function}({arguments})", with_flags, answers)))
        return conditions + (" at boot" if self.boot else "")


MIX = "vPmxMixPlane vPmxMixPlane vPmxMixPlane vPmxMixPlane vPmxMixPlane"
UNMIX = MIX.replace("Mix", "NotMix")
RESET = "osd=0 change=0 set=0 timer=0"
LOWERED = f"change=0 osd=1 fgVdpIsWaitforSyncCtrl osd? {MIX} osd=0"
HELD_BACK = f"change? change? VDP_SetClearVideo {UNMIX} timer? x_timer_stop timer? x_timer_start set=1"


def request(mode):
    """Four enabled outputs, as a caller has them in memory."""
    return tuple(struct.pack("<B3xII16x", 1, mode, 60) * 4)


SCENARIOS = [
    Scenario(("PMX_Reset", 0), f"{RESET} get_part_id_by_name", flags=(1, 1, 1)),
    Scenario(("PMX_Reset", 1), "", flags=(1, 1, 1)),
    Scenario(("PMX_Init",), f"x_sema_create {RESET} get_part_id_by_name x_timer_create", boot=True),
    Scenario(("PMX_Init",), ""),
    Scenario(("PMX_Stop",), "PMX_VsyncStop"),
    Scenario(("PMX_Uninit",), "PMX_VsyncStop i4ImUnregisterInterface2 timer? x_timer_delete x_sema_delete"),
    Scenario(("PMX_Uninit",), "timer? x_timer_delete Assert", x_timer_delete=1),
    Scenario(("i4PMX_Uninit", 0), "PMX_VsyncStop i4ImUnregisterInterface2 timer? x_timer_delete"),

    Scenario(("PMX_SetFormatChangeFlag", 1), "PMX_IsLog change=1"),
    Scenario(("PMX_SetFormatChangeFlag", 255), "PMX_IsLog change=255", flags=(0, 1, 1)),
    Scenario(("PMX_SetFormatChangeFlag", 0), "PMX_IsLog change=0 PMX_IsLog osd=1 fgVdpIsWaitforSyncCtrl "
             f"PMX_IsLog osd? {MIX} PMX_IsLog osd=0", flags=(1, 0, 1)),
    Scenario(("PMX_SetFormatChangeFlag", 0), "PMX_IsLog change=0 PMX_IsLog osd=1 fgVdpIsWaitforSyncCtrl",
             flags=(1, 0, 1), fgVdpIsWaitforSyncCtrl=1),
    Scenario(("PMX_SetOsdEnableFlag", 1), "PMX_IsLog osd=1", flags=(1, 0, 1)),
    Scenario(("PMX_SetOsdEnableFlag", 2), "PMX_IsLog osd=2"),
    Scenario(("PMX_SetOsdEnable",), "PMX_IsLog osd?", flags=(1, 0, 1)),
    Scenario(("PMX_SetOsdEnable",), f"PMX_IsLog osd? {MIX} PMX_IsLog osd=0", flags=(1, 2, 1)),
    Scenario(("_PMX_TmrIsr", 2, 0), f"PMX_IsLog set=0 PMX_IsLog change=0 PMX_IsLog osd=1 fgVdpIsWaitforSyncCtrl "
             f"PMX_IsLog osd? {MIX} PMX_IsLog osd=0", flags=(1, 0, 1)),
    Scenario(("PMX_SetFormatChangeTimer", 250), "PMX_IsLog timer? x_timer_stop timer? x_timer_start"),
    Scenario(("PMX_SetFormatChangeTimer", 250), "PMX_IsLog timer? x_timer_stop Assert timer? x_timer_start Assert",
             x_timer_stop=1, x_timer_start=1),
    Scenario(("fgPMX_DisplayModeReady",), "change? PMX_IsLog change?"),
    Scenario(("fgPMX_DisplayModeReady",), "change? PMX_IsLog change?", flags=(255, 1, 1)),

    # The first request sends HDMI a change: whether the timer is set is not asked.
    Scenario(("PMX_SetModeEx", 0, request(RES_2D_576I50HZ), 60, 0, 0), LOWERED, flags=(1, 0, 1)),
    Scenario(("PMX_SetModeEx", 0, request(RES_1080P60HZ), 60, 0, 0),
             f"OSD_BASE_SetFlag_PMXChangeResDone i4GetHotPlugStatus {HELD_BACK}", flags=(1, 0, 1)),
    Scenario(("PMX_SetModeEx", 0, request(RES_1080P60HZ), 60, 1, 0),
             f"OSD_BASE_SetFlag_PMXChangeResDone i4GetHotPlugStatus {LOWERED} change? change?", flags=(1, 0, 1),
             i4GetHotPlugStatus=0),
    # The same once more.
    Scenario(("PMX_SetModeEx", 0, request(RES_1080P60HZ), 60, 1, 0),
             f"PMX_HalScalerReset set? {LOWERED} change? change?", flags=(1, 0, 0)),
    Scenario(("PMX_SetModeEx", 0, request(RES_1080P60HZ), 60, 1, 0),
             f"PMX_HalScalerReset set? i4GetHotPlugStatus {HELD_BACK}", flags=(1, 0, 2)),
    Scenario(("PMX_SetModeEx", 0, request(RES_1080P60HZ), 60, 1, 0),
             "PMX_HalScalerReset set? i4GetHotPlugStatus change? change?", flags=(0, 1, 1)),
]


def word_of(event):
    """An event as the expectations spell it."""
    if isinstance(event, layer_machine.Call):
        return event.name
    field = FIELDS.get((event.offset, event.size))
    if field is None:
        what = "store" if event.is_store else "load"
        return f"{what}-of-{event.size}-bytes-at-{event.offset}"
    return f"{field}={event.value}" if event.is_store else f"{field}?"


def observed(machine, scenario):
    """What an operation did, in the words of its expectation."""
    if not scenario.boot:
        machine.write(machine.watched, struct.pack("<I3B", 0x51, *scenario.flags))
    machine.answers = {"fgPmxDrvSetAvd": 1, "TVE_SetFmtEx": 1, "i4GetHotPlugStatus": 1, **scenario.answers}
    arguments = [machine.caller_memory(argument) if isinstance(argument, tuple) else argument
                 for argument in scenario.arguments]
    if scenario.function in ("PMX_Uninit", "i4PMX_Uninit"):
        machine.write(machine.image.symbols["_PmxInitiated"], [1])
    machine.call(scenario.function, *arguments)
    words = [word_of(event) for event in machine.events]
    return [word for word in words if word[-1] == "?" or "=" in word or "-of-" in word or word in scenario.expected]


def complaints(objects, scenarios):
    machine = layer_machine.Machine(objects, STATUS, STATUS_SIZE)
    for scenario in sorted(scenarios, key=lambda scenario: not scenario.boot):
        try:
            words = observed(machine, scenario)
        except KeyError as error:
            yield error.args[0]
            continue
        if words != scenario.expected:
            yield f"{scenario}:\n    expected: {' '.join(scenario.expected)}\n    found:    {' '.join(words)}"
    places = list(machine.image.places_that_name(STATUS, STATUS_SIZE))
    for place in places:
        if place not in machine.reached:
            yield f"{machine.image.function_at(place)}: names {STATUS}, and nothing here reaches it"
    if not places:
        yield f"nothing in it names {STATUS}"


if __name__ == "__main__":
    sys.exit(layer_machine.check(__doc__, complaints, SCENARIOS, "operations, each flag by itself and in its order"))
