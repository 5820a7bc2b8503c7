#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the object that ships, and holds its loads and stores in the handshake's status, and those that connecting makes
in a port, against what is written here: which, in which order, between which calls, and that each is of its own and as
wide as its field.

The flags are read and written by callers' threads, by the timer and by the display part without a lock, and a port by
the sources' threads. A compiler that merges two of them, or moves one past another, gives the others a state that
nobody wrote.

Running it rather than reading its assembly: where an access goes is then a number, not the end of a chain of registers,
inlining does not matter, and one check serves every processor. What a run cannot see is code that it does not reach: a
place that names the status and was not reached is therefore a complaint; the record is named nearly everywhere.

usage: check_stores.py OBJECT...    the objects of one link: pmx_if.o, or one for each source
"""

import struct
import sys

import layer_machine



class Watched:
    """What is looked at: an object's bytes, from a place on that depends on how wide its pointers are."""

    def __init__(self, name, size, at, fields):
        self.name, self.size, self.at, self.fields = name, size, at, fields

    def start(self, machine):
        return self.at.get(machine.processor.word, 0)

    def word_of(self, access, start):
        """An access as the expectations spell it."""
        field = self.fields.get((access.offset - start, access.size))
        if field is None:
            what = "store" if access.is_store else "load"
            return f"{what}-of-{access.size}-bytes-at-{access.offset - start}"
        return f"{field}={access.value}" if access.is_store else f"{field}?"


STATUS = Watched("_arPmxDispPartStatus", 7, {},
                 {(0, 4): "timer", (4, 1): "change", (5, 1): "osd", (6, 1): "set"})
PORT_SIZE, PORT = 28, 4
RECORDS_PORT = Watched("_arPmxConf", PORT_SIZE, {4: 60 + PORT * PORT_SIZE, 8: 80 + PORT * PORT_SIZE},
                       {(0, 2): "type", (2, 2): "id", (4, 1): "connected", (5, 1): "enabled"})

RES_1080P60HZ, RES_2D_576I50HZ = 12, 38


class Scenario:
    """One operation, and what it does in the status.

    Expected are words: "change?" loads the format-change flag, "osd=1" stores 1 in the OSD-enable flag; "timer" is the
    timer's handle, "set" the flag that it is set; of a port, "type" and "id" are the source's. Every other word is a
    platform function: its calls are looked at then, those of others are not.
    """

    def __init__(self, operation, expected, flags=(0, 0, 0), boot=False, watched=STATUS, **answers):
        self.function, *self.arguments = operation
        self.watched = watched
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

    # Each on its own, between lock and unlock: who looks without the mutex finds a port that is on its way.
    Scenario(("i4Pmx_Connect", 66, 0, 0xB0, 2), "x_sema_lock connected=1 type=176 id=2 x_sema_unlock",
             watched=RECORDS_PORT),
    Scenario(("i4Pmx_Disconnect", 66, 0, 0xB0, 2), "x_sema_lock connected=0 type=0 id=0 enabled=0 x_sema_unlock",
             watched=RECORDS_PORT),
]


def observed(machine, scenario):
    """What an operation did, in the words of its expectation."""
    watched, start = scenario.watched, scenario.watched.start(machine)
    if watched is STATUS and not scenario.boot:
        machine.write(machine.watched, struct.pack("<I3B", 0x51, *scenario.flags))
    machine.answers = {"fgPmxDrvSetAvd": 1, "TVE_SetFmtEx": 1, "i4GetHotPlugStatus": 1, **scenario.answers}
    arguments = [machine.caller_memory(argument) if isinstance(argument, tuple) else argument
                 for argument in scenario.arguments]
    if scenario.function in ("PMX_Uninit", "i4PMX_Uninit"):
        machine.write(machine.image.symbols["_PmxInitiated"], [1])
    machine.call(scenario.function, *arguments)
    words = [event.name if isinstance(event, layer_machine.Call) else watched.word_of(event, start)
             for event in machine.events if isinstance(event, layer_machine.Call) or event.offset + event.size > start]
    return [word for word in words if word[-1] == "?" or "=" in word or "-of-" in word or word in scenario.expected]


def complaints(objects, scenarios):
    for watched in (STATUS, RECORDS_PORT):
        of_this = [scenario for scenario in scenarios if scenario.watched is watched]
        if of_this:
            yield from complaints_of(objects, watched, of_this)


def complaints_of(objects, watched, scenarios):
    machine = layer_machine.Machine(objects, watched.name, watched.size + max([0, *watched.at.values()]))
    for scenario in sorted(scenarios, key=lambda scenario: not scenario.boot):
        try:
            words = observed(machine, scenario)
        except KeyError as error:
            yield error.args[0]
            continue
        if words != scenario.expected:
            yield f"{scenario}:\n    expected: {' '.join(scenario.expected)}\n    found:    {' '.join(words)}"
    places = list(machine.image.places_that_name(watched.name, watched.size))
    for place in places:
        if watched is STATUS and place not in machine.reached:
            yield f"{machine.image.function_at(place)}: names {watched.name}, and nothing here reaches it"
    if not places:
        yield f"nothing in it names {watched.name}"


if __name__ == "__main__":
    sys.exit(layer_machine.check(__doc__, complaints, SCENARIOS, "operations, each field by itself and in its order"))
