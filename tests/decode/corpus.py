#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Damaged console logs, and what the log reader tells of them: every statement is held against what the board itself
recorded while the log was made, and every reason against what the layer gives that tells its reasons.

usage: corpus.py PMXBOARD PMXBOARD_WITH_THE_TWIN COUNT [SEED]    COUNT logs, drawn from SEED

The logs are those of the scenarios at several levels of the console, whole, and damaged as serial consoles damage them.
The record is the trace of calls: what drivers were called for, what the timer and the display part did, and when.
"""

import collections
import concurrent.futures
import json
import pathlib
import random
import re
import subprocess
import sys
import tempfile

SCENARIOS = sorted(pathlib.Path("scenarios").glob("*.pmx"))
LEVELS = (9, 9, 9, 8, 1, 0)
GRAPHICS = range(2, 7)  # planes of the mixer, counted from 0
SECONDS_A_LINE = 0.0003  # that a serial console takes
WORKERS = 2
MOST_SAID = 40
ENOUGH = 0.95  # of what damaged logs determine
# A reason is given so many entries before the line that determines it, or behind it, at most.
BEFORE, BEHIND = 12, 8
# Reasons that at level 9 a line always tells: SOURCE_TWICE, FORMAT_FROM_OUTPUT, FORMAT_FROM_OFF, FULL_CHANGE, NO_SINK,
# HELD_BACK, TIMED_OUT, MASTER_FROM_PORT.
ALWAYS_TOLD = (13, 32, 33, 35, 38, 40, 42, 44)

Line = collections.namedtuple("Line", "boot index text time")  # of the layer: where its record has it


class Record:
    """What the board saw in one run, boot by boot."""

    def __init__(self, pmxboard, scenario):
        run = subprocess.run([pmxboard, "run", "--trace-format", "jsonl", scenario], capture_output=True, check=False)
        self.name = scenario.stem
        self.path = scenario
        self.boots = []
        entries = [json.loads(line) for line in run.stdout.splitlines() if line.startswith(b'{"sequence":')]
        boots = [[]]
        for entry in entries:
            if entry["sequence"] == 1 and boots[-1]:
                boots.append([])
            boots[-1].append(entry)
        self.boots = [sorted(boot, key=lambda entry: entry["sequence"]) for boot in boots]
        for boot in self.boots:
            for place, entry in enumerate(boot):
                entry["place"] = place
                entry.setdefault("function", "")

        self.reasons = [[] for _ in self.boots]  # by boot: (the entry behind which it was given, number, values)

    def lines(self, level):
        """What a console of this level shows."""
        made = []
        for number, boot in enumerate(self.boots):
            shown = 0
            for index, entry in enumerate(boot):
                text = None
                if entry["kind"] == "log" and entry.get("level", -1) <= level:
                    text = entry["text"]
                elif entry["kind"] == "assert":
                    arguments = entry["arguments"]
                    text = f"ASSERT {arguments['szExpression']}, {arguments['szFile']}:{arguments['i4Line']}"
                if text is None:
                    continue
                time = entry["time_us"] / 1e6 + shown * SECONDS_A_LINE
                made.append(Line(number, index, text.strip(), time))
                shown += 1
        return made


def take_reasons(twin, records):
    """Has the layer that tells its reasons run all scenarios, and notes the reasons of each boot."""
    run = subprocess.run([twin, "--reasons", "run", "--trace-format", "jsonl",
                          *(str(record.path) for record in records)], capture_output=True, check=False)
    boots = []
    early = []  # given before the boot's first entry was written
    for line in run.stdout.splitlines():
        if line.startswith(b'{"sequence":'):
            if line.startswith(b'{"sequence":1,'):
                boots.append([])
            boots[-1] += early
            early = []
        elif line.startswith(b'{"reason":'):
            entry = json.loads(line)
            reason = (entry["after"], entry["reason"], entry["values"])
            (boots[-1] if boots and entry["after"] > 0 else early).append(reason)
    count = sum(len(record.boots) for record in records)
    if len(boots) != count:
        raise RuntimeError(f"the twin starts {len(boots)} times, and not {count}: {run.stderr.decode()}")
    for record in records:
        record.reasons, boots = boots[:len(record.boots)], boots[len(record.boots):]


# ---- What the board saw

def arguments(entry):
    values = entry.get("arguments", {})
    return [value["value"] if isinstance(value, dict) and "value" in value else value for value in values.values()]


def behind(boot, index, function, within=12):
    """The next call of a function behind an entry, not far from it."""
    for entry in boot[index + 1:index + 1 + within]:
        if entry["function"] == function and entry["kind"] == "call":
            return entry
    return None


def ahead(boot, index, function, within=400):
    for entry in reversed(boot[max(0, index - within):index]):
        if entry["function"] == function and entry["kind"] == "call":
            return entry
    return None


def begin_of_change(boot, index):
    """The entry with which the mode change began that prints this one."""
    for place in range(index, -1, -1):
        if boot[place]["kind"] == "log" and boot[place]["text"] == "SetModeEx\n":
            return place
    return None


def mixes_graphics(boot, index):
    """Whether all planes of graphics were mixed just before the layer said that none waits."""
    mixed = [arguments(entry)[1] for entry in boot[max(0, index - 12):index] if entry["function"] == "vPmxMixPlane"]
    return set(GRAPHICS) <= set(mixed)


def is_out(boot, index):
    """Whether graphics are out of the mix behind an entry."""
    out = False
    for entry in boot[:index + 1]:
        if entry["kind"] == "call" and entry["function"] in ("vPmxMixPlane", "vPmxNotMixPlane"):
            if arguments(entry)[1] == GRAPHICS[0]:
                out = entry["function"] == "vPmxNotMixPlane"
    return out


def is_release(boot, index):
    return boot[index].get("text") == "Set Osd Enable :0.\n" and mixes_graphics(boot, index)


def is_hold(boot, index):
    entry = boot[index]
    return entry["kind"] == "log" and entry["text"].startswith("[PMX] VDP_SetClearVideo") and \
        behind(boot, index, "VDP_SetClearVideo", 60) is not None and \
        behind(boot, index, "vPmxNotMixPlane", 60) is not None


# ---- Damage

class Console:
    """A log: bytes, and for each physical line which line of the layer it is, if any."""

    def __init__(self, lines):
        self.lines = lines  # of the layer, in the order of the log
        self.sources = {}  # by line number
        self.data = b""
        self.stamped = False
        self.exact = 0.0
        self.pieces = set()  # lines with the rest of one that something foreign broke in two
        self.damaged = False


def cut(lines, draw):
    if draw.random() < 0.5:
        return lines[draw.randrange(len(lines)):]
    return lines[:draw.randrange(1, len(lines) + 1)]


def reboot(lines, draw):
    again = [line._replace(boot=line.boot + 100) for line in lines]
    return lines[:draw.randrange(1, len(lines) + 1)] + again


def lose(lines, draw):
    kept = list(lines)
    for _ in range(draw.randrange(1, 4)):
        begin = draw.randrange(len(kept))
        del kept[begin:begin + draw.choice((1, 1, 2, 3, 5, 10, 25, 60))]
        if not kept:
            return list(lines[:1])
    return kept


def double(lines, draw):
    made = []
    for line in lines:
        made += [line] * (2 if draw.random() < 0.08 else 1)
    return made


def reorder(lines, draw):
    made = list(lines)
    for _ in range(max(1, len(made) // 20)):
        begin = draw.randrange(len(made))
        end = min(len(made), begin + draw.randrange(2, 5))
        part = made[begin:end]
        if len({line.boot for line in part}) == 1 and part[-1].time - part[0].time < 0.5:
            draw.shuffle(part)
            made[begin:end] = part
    return made


DAMAGE = {"whole": lambda lines, draw: lines, "cut": cut, "reboot": reboot, "lost": lose, "doubled": double,
          "reordered": reorder, "interleaved": lambda lines, draw: lines}


def clock(time):
    time += 12 * 3600 + 34 * 60 + 56.2
    return f"{int(time // 3600) % 24:02}:{int(time // 60) % 60:02}:{time % 60:09.6f}"


# What leads to a line, how exact it is, and whether it counts from the boot.
STAMPS = {
    "none": (lambda time, wall: "", None),
    "kernel": (lambda time, wall: f"[{time:12.6f}] ", 1e-6),
    "printk": (lambda time, wall: f"<6>[{time:12.6f}] ", 1e-6),
    "clock": (lambda time, wall: clock(wall)[:-3] + " ", 1e-3),
    "seconds": (lambda time, wall: "Nov 22 " + clock(wall)[:-7] + " player app[123]: ", 1.0),
    "both": (lambda time, wall: "Nov 22 " + clock(wall)[:-7] + f" player kernel: [{time:12.6f}] ", 1e-6),
    "iso": (lambda time, wall: "2026-11-22T" + clock(wall) + "+00:00 player kernel: ", 1e-6),
}
FOREIGN = ("ir: key 0x1c", "[AUD] decoder 0 underrun, 12 ms", "eth0: link up", "cec: standby ignored",
           "mmc0: new high speed SDHC card at address 0007", "[HDMI] EDID read, 256 bytes")


def written(lines, draw, kind):
    """The bytes of a log, as one console among many writes them."""
    console = Console(lines)
    stamp, console.exact = STAMPS[draw.choice(list(STAMPS))]
    console.stamped = console.exact is not None
    console.kind = kind
    end = draw.choice(("\n", "\n", "\r\n"))
    colour = draw.random() < 0.2
    out = []
    wall = 0.0
    before = None
    for line in lines:
        if before is None or line.boot != before.boot:
            wall = 0.0 if before is None else wall + 20 + before.time
            if before is not None and (console.stamped or draw.random() < 0.5):
                out.append(draw.choice(("U-Boot 2011.03 (Mar 01 2011)", "[    0.000000] Linux version 2.6.35")))
        before = line
        lead = stamp(line.time + 1, wall + line.time)
        if kind == "interleaved" and draw.random() < 0.4:
            out.append(lead + draw.choice(FOREIGN))
        text = lead + line.text
        if colour:
            text = f"\x1b[32m{text}\x1b[0m"
        console.sources[len(out) + 1] = line
        if kind == "interleaved" and draw.random() < 0.05 and len(line.text) > 20 and not colour:
            place = len(lead) + draw.randrange(14, len(line.text) - 1)
            out += [text[:place], lead + draw.choice(FOREIGN), text[place:]]
            console.pieces.add(len(out))
        else:
            out.append(text)
    console.data = (end.join(out) + end).encode()
    return console


# ---- Statements

class Held:
    """Statements of one story against the record."""

    def __init__(self, record, console, story):
        self.record = record
        self.console = console
        self.story = story
        self.false = []
        self.checked = 0
        self.own = 0

    def boot_of(self, line):
        return self.record.boots[line.boot % 100]

    def source(self, number):
        return self.console.sources.get(number)

    def sources(self, event):
        return [(number, self.source(number)) for number in event["lines"] if self.source(number) is not None]

    def any(self, event, test):
        return any(test(self.boot_of(line), line.index) for _, line in self.sources(event))

    def time_between(self, begin, end):
        one, other = self.source(begin), self.source(end)
        return None if one is None or other is None or one.boot != other.boot else other.time - one.time

    def since(self, event, words, ends):
        """`, 2.5 s after line 5`: of the lines that may be meant, one is so much later."""
        found = re.search(r"(?:(about )?([\d.]+) s )?after line (\d+)", words)
        if not found:
            return True
        begin = self.source(int(found[3]))
        if begin is None:
            return False
        if found[2] is None:
            return True
        slack = 0.06 + (self.console.exact or 0) + (0.5 if found[1] else 0)
        passed = [self.time_between(int(found[3]), number) for number, _ in ends]
        return any(time is not None and abs(time - float(found[2])) <= slack for time in passed)

    def check(self):
        for event in self.story["events"]:
            if event["kind"] == "call":
                for words in [event["title"], *event["details"]]:
                    self.statement(event, words)
                for told in event["reasons"]:
                    self.reason(event, told)
            elif event["kind"] == "gap":
                self.gap(event)
            else:
                self.start(event)
        return self.false

    def say(self, event, words, good):
        self.checked += 1
        if not good:
            self.false.append(f"{event['first_line']}-{event['last_line']} {event['operation']}: {words}")

    def statement(self, event, words):
        if event["operation"] == "PMX_QueryStatus":  # the report's own lines, put together
            self.own += 1
            return
        for pattern, test in STATEMENTS:
            if pattern.match(words):
                self.say(event, words, test(self, event, words))
                return
        self.own += 1
        if event["first_line"] not in self.console.sources and event["first_line"] not in self.console.pieces:
            self.false.append(f"{event['first_line']}: no line of the layer: {words}")

    def reason(self, event, told):
        """The layer gave it, with these values, where the line stands."""
        line = self.source(told["line"])
        good = line is not None and told["line"] in event["lines"]
        if good:
            sequence = self.boot_of(line)[line.index]["sequence"]
            good = any(number == told["id"] and -BEFORE <= after - sequence <= BEHIND and
                       all(known in (None, given) for known, given in zip(told["values"], values))
                       for after, number, values in self.record.reasons[line.boot % 100])
        self.say(event, f"{told['name']}: {told['text']}", good)

    def start(self, event):
        """A boot lies before the line, behind the line of the layer before."""
        before = [self.source(n) for n in sorted(self.console.sources) if n < event["first_line"]]
        behind_it = [self.source(n) for n in sorted(self.console.sources) if n >= event["first_line"]]
        good = not before or not behind_it or before[-1].boot != behind_it[0].boot
        self.say(event, event["title"], good)

    def gap(self, event):
        """The log has not all, in the order in which it was printed: before the line, or behind it."""
        order = {(line.boot, line.index): place for place, line in enumerate(self.console.every)}
        numbers = sorted(self.console.sources)
        line = event["first_line"]
        behind_it = event["title"].startswith("its call")
        numbers = [n for n in numbers if behind_it or n <= line]
        sources = [self.source(n) for n in numbers]
        places = [order[line.boot % 100, line.index] for line in sources]
        good = any(other != one + 1 for one, other in zip(places, places[1:]))
        if behind_it or event["title"].startswith("the log ends within"):
            good = good or not places or places[-1] != len(self.console.every) - 1
        self.say(event, event["title"], good or bool(self.console.pieces))


def request(held, event, words):
    """All outputs that are named were asked for by one call."""
    found = re.match(r"mode change requested(?: \(|: (.*))?", words)
    begins = {begin_of_change(held.boot_of(line), line.index) for _, line in held.sources(event)
              if re.match(r"SetModeEx|CCIR\(|HDMI\(|CAV |CVBS\(|OSD5\(", line.text)}
    if found[1] and len(begins) != 1:
        return False
    names = {"digital port": "CCIR(", "HDMI": "HDMI(", "component": "CAV (", "composite": "CVBS("}
    for part in (found[1] or "").split(";")[0].split(", "):
        for name, begin in names.items():
            if not part.startswith(name + " "):
                continue
            on = not part.endswith(" off")
            if not any(line.text.startswith(begin + ("1" if on else "0")) for _, line in held.sources(event)):
                return False
    return True


def hold(held, event, _):
    return held.any(event, is_hold)


def back(held, event, words):
    ends = [(n, line) for n, line in held.sources(event) if is_release(held.boot_of(line), line.index)]
    begin = re.search(r"after line (\d+)", words)
    good = bool(ends) and held.since(event, words, ends)
    if begin:
        line = held.source(int(begin[1]))
        good = good and line is not None and is_hold(held.boot_of(line), line.index)
    return good


def timer_set(held, event, _):
    return held.any(event, lambda boot, index: boot[index]["kind"] == "log" and "Timer Set" in boot[index]["text"]
                    and behind(boot, index, "x_timer_start") is not None)


def timer_out(held, event, words):
    def ran(boot, index):
        started = ahead(boot, index, "x_timer_start", len(boot))
        expiry = [e for e in boot[max(0, index - 3):index] if e["function"] == "expiry"]
        if boot[index].get("text") != "PMX timeout.\n":
            return False
        by_call = boot[index]["operation"] == "_PMX_TmrIsr" and not expiry
        return by_call or (expiry and started is not None)
    ends = [(n, line) for n, line in held.sources(event) if line.text == "PMX timeout."]
    begin = re.search(r"after line (\d+)", words)
    good = held.any(event, ran) and held.since(event, words, ends)
    if begin:
        line = held.source(int(begin[1]))
        good = good and line is not None and "Timer Set" in line.text
        passed = held.time_between(int(begin[1]), ends[0][0]) if ends else None
        good = good and passed is not None and abs(passed - 10) < 0.6 + (held.console.exact or 0)
    return good


def left(held, event, _):
    """Of the lines that are there, none brings these graphics back."""
    first = held.source(event["first_line"])
    if first is None or not is_hold(held.boot_of(first), first.index):
        return False
    later = [line for n, line in sorted(held.console.sources.items()) if event["first_line"] < n <= event["last_line"]]
    own = [line for line in later if line.boot == first.boot]
    numbers = [one.text for one in sorted(own, key=lambda line: line.index)] if held.console.stamped else \
        [one.text for one in own]
    return not any(one == "PMX_SetOsdEnable." and other == "Set Osd Enable :0."
                   for one, other in zip(numbers, numbers[1:])) or held.console.damaged


def no_sink(held, event, _):
    def none(boot, index):
        asked = ahead(boot, index, "i4GetHotPlugStatus", 30)
        return "fgHdmiExist" in boot[index].get("text", "") and asked is not None and asked["result"] != 1
    return held.any(event, none)


def no_resolution(held, event, _):
    def none(boot, index):
        if "fgHdmiExist" not in boot[index].get("text", ""):
            return False
        begin = begin_of_change(boot, index)
        return not any(e["function"] == "fgPmxDrvSetAvd" and "PMX_SET_HDMI_RES_CHG" in json.dumps(e["arguments"])
                       and e["operation"] == "PMX_SetModeEx" for e in boot[begin:index])
    return held.any(event, none)


def switches(held, event, _):
    return held.any(event, lambda boot, index: re.match(r"Display Format Change :[^0]", boot[index].get("text", "")))


def lowered(held, event, words):
    ends = [(n, line) for n, line in held.sources(event) if line.text == "Display Format Change :0."]
    return bool(ends) and held.since(event, words, ends)


def programmed(held, event, _):
    if event["operation"] == "PMX_SetMode":
        return held.any(event, lambda boot, index: behind(boot, index, "PMX_HalSetMode") is not None)

    def driven(boot, index):
        return boot[index].get("text", "").startswith("PMX Start to set") and \
            behind(boot, index, "OSD_BASE_SetDisplayMode", 4) is not None
    return held.any(event, driven)


def converter_a(held, event, words):
    wanted = [0, 0] if words.endswith("off") else [1, 1] if words.endswith("to BT.601") else [1, 0]

    def set_so(boot, index):
        call = ahead(boot, index, "PMX_HalSetCC_A", 4)
        return boot[index].get("text", "").startswith("CC_A") and call is not None and \
            (arguments(call)[1:] == wanted or (wanted[0] == 0 and arguments(call)[1] == 0))
    return held.any(event, set_so)


def converter_scaler(held, event, words):
    wanted = 1 if "BT.709" in words else 0

    def set_so(boot, index):
        call = ahead(boot, index, "PMX_HalSetScaler709601", 4)
        return boot[index].get("text", "").startswith("Scaler CC") and call is not None and arguments(call)[1] == wanted
    return held.any(event, set_so)


def master(held, event, words):
    found = re.search(r" to \S+ \((\d+)\)$", words)
    wanted = int(found[1]) if found else None  # of a line that was broken in two

    def announced(boot, index):
        call = behind(boot, index, "OSDSetColorSpace", 3)
        return "Master Color Space change" in boot[index].get("text", "") and call is not None and \
            wanted in (None, arguments(call)[0])
    return held.any(event, announced)


def to_be_told(held, event, _):
    return held.any(event, lambda boot, index: boot[index].get("text", "").startswith("Inform Vdp")
                    and behind(boot, index, "i4ImQueryInterface", 3) is not None)


def no_table(held, event, _):
    return held.any(event, lambda boot, index: boot[index].get("text", "").startswith("Query VDP")
                    and ahead(boot, index, "i4ImQueryInterface", 3) is not None)


def by_operation(*operations):
    return lambda held, event, _: held.any(event, lambda boot, index: boot[index]["operation"] in operations
                                           or boot[index]["depth"] > 0 or not boot[index]["operation"])


def refused(held, event, _):
    return held.any(event, lambda boot, index: "PMX_CheckCap error" in boot[index].get("text", ""))


def goes_on(held, event, words):
    """Of a mode change: the line that is named and those of the event were printed by one call, unless some are lost
    in between: then the call would have gone on so."""
    begin = held.source(int(re.search(r"line (\d+)", words)[1]))
    if event["operation"] != "PMX_SetModeEx":
        return begin is not None
    calls = {begin_of_change(held.boot_of(line), line.index) for _, line in held.sources(event)}
    return held.console.damaged or calls == {begin_of_change(held.boot_of(begin), begin.index)}


def without_begin(held, _event, _words):
    return held.console.damaged


def nothing_back_here(held, event, _):
    """The lines of the event have no return."""
    return not any(line.text == "PMX_SetOsdEnable." for _, line in held.sources(event)) or held.console.damaged


STATEMENTS = [(re.compile(pattern), test) for pattern, test in (
    (r"mode change requested", request),
    (r"graphics wait for the display part", hold),
    (r"graphics are mixed again", back),
    (r"the display timer is set", timer_set),
    (r"the display timer has run out", timer_out),
    (r"nothing (up to|before)|as far as its lines tell", left),
    (r"nobody is waited for: no sink", no_sink),
    (r"no wait for the display part: HDMI", no_resolution),
    (r"the display part begins to switch", switches),
    (r"the display part's flag is lowered", lowered),
    (r"everything is programmed for mode ", programmed),
    (r"converter A ", converter_a),
    (r"scaler's converter ", converter_scaler),
    (r"the master colour space changes", master),
    (r"a video plane is to be told", to_be_told),
    (r"that video plane was passed over", no_table),
    (r"video plane \d+ starts", by_operation("PMX_VdpEnabled")),
    (r"video plane \d+ stops", by_operation("PMX_VdpDisabled")),
    (r"OSD plane \d+ starts", by_operation("PMX_OsdEnabled")),
    (r"OSD plane \d+ stops", by_operation("PMX_OsdDisabled")),
    (r"refused by the capability word; nothing was set", refused),
    (r"nothing here lets graphics back", nothing_back_here),
    (r"goes on, as the call of line \d+ does", goes_on),
    (r"a mode change, of which the log has the end", without_begin),
)]


def determined(held):
    """What the remaining lines determine of mode changes, hold-backs and releases: how many, and which are not told."""
    console, story = held.console, held.story
    events = [event for event in story["events"] if event["kind"] == "call"]

    def told(number, pattern):
        return any(number in event["lines"] and
                   any(re.match(pattern, words) for words in [event["title"], *event["details"]]) for event in events)

    wanted = {}  # each once, however often its line stands there
    numbers = sorted(console.sources)
    after = dict(zip(numbers, numbers[1:]))
    for number in numbers:
        line = console.sources[number]
        boot = held.boot_of(line)
        pattern = None
        if line.text == "SetModeEx":
            pattern = "mode change requested"
        elif is_hold(boot, line.index):
            pattern = "graphics wait for the display part"
        elif line.text == "PMX timeout.":
            pattern = "the display timer has run out"
        elif line.text == "PMX_SetOsdEnable." and number in after:
            other = console.sources[after[number]]
            if other.text == "Set Osd Enable :0." and other.boot == line.boot and is_release(boot, other.index):
                pattern = "graphics are mixed again"
                line, number = other, after[number]
        if pattern is not None:
            wanted.setdefault((line.boot, line.index, pattern), []).append(number)
    missed = [f"{numbers}: {pattern} is not told" for (_, _, pattern), numbers in wanted.items()
              if not any(told(number, pattern) for number in numbers)]
    return len(wanted), missed


def reasons_missed(held):
    """The reasons that a whole log at the highest level determines, and the story does not tell."""
    told = collections.Counter(told["id"] for event in held.story["events"] for told in event["reasons"])
    given = collections.Counter(number for boot in held.record.reasons for _, number, _ in boot)
    return [f"reason {number} is told {told[number]} times, and was given {given[number]} times"
            for number in ALWAYS_TOLD if told[number] < given[number]]


def unsure(story):
    return [f"{event['first_line']}: {event['title']}" for event in story["events"]
            if event["kind"] == "gap" or event["assumed"]]


# ---- The corpus

def drawn(records, seed, number):
    """One log of the corpus. The same seed and number draw the same log."""
    draw = random.Random(f"{seed} {number}")
    record = records[number % len(records)]
    kind = list(DAMAGE)[number // len(records) % len(DAMAGE)] if number < len(records) else draw.choice(list(DAMAGE))
    level = draw.choice(LEVELS)
    every = record.lines(level)
    if not every:
        return record, None
    console = written(DAMAGE[kind](every, draw), draw, kind)
    console.every = every
    console.level = level
    console.damaged = kind not in ("whole", "interleaved") or bool(console.pieces)
    return record, console


def decoded(pmxboard, data):
    with tempfile.NamedTemporaryFile() as log:
        log.write(data)
        log.flush()
        run = subprocess.run([pmxboard, "decode", "--json", log.name], capture_output=True, check=False)
    if run.returncode != 0:
        raise RuntimeError(run.stderr.decode())
    return json.loads(run.stdout)


def judged(pmxboard, records, seed, number):
    record, console = drawn(records, seed, number)
    figures = collections.Counter()
    if console is None:
        return figures, []
    story = decoded(pmxboard, console.data)
    held = Held(record, console, story)
    said = [f"false: {one}" for one in held.check()]
    count, missed = determined(held)
    figures.update(reasons=sum(len(event["reasons"]) for event in story["events"]))
    figures.update(logs=1, statements=held.checked, own=held.own, false=len(held.false))
    whole = "damaged" if console.damaged else "whole"
    figures.update({f"{whole} logs": 1, f"{whole} determined": count, f"{whole} told": count - len(missed)})
    figures[f"kind {console.kind}"] += 1
    if not console.damaged:
        said += [f"unsure in a whole log: {one}" for one in unsure(story)]
        said += [f"not told of a whole log: {one}" for one in missed]
        if console.level == LEVELS[0]:
            said += [f"not told of a whole log: {one}" for one in reasons_missed(held)]
    else:
        figures["unsure"] += len(unsure(story))
    return figures, [f"log {number} ({record.name}, {console.kind}, level {console.level}): {one}" for one in said]


def main():
    pmxboard = pathlib.Path(sys.argv[1]).resolve()
    count = int(sys.argv[3])
    seed = int(sys.argv[4]) if len(sys.argv) > 4 else 1
    records = [record for record in (Record(pmxboard, scenario) for scenario in SCENARIOS) if record.boots[0]]
    take_reasons(pathlib.Path(sys.argv[2]).resolve(), records)
    total = collections.Counter()
    said = []
    with concurrent.futures.ThreadPoolExecutor(WORKERS) as pool:
        for figures, wrong in pool.map(lambda number: judged(pmxboard, records, seed, number), range(count)):
            total.update(figures)
            said += wrong
    told, wanted = total["damaged told"], total["damaged determined"]
    print(f"{total['logs']} logs, {total['whole logs']} of them whole; {total['statements']} statements held against "
          f"what the board saw, {total['own']} that say what their lines say")
    print(f"of the statements {total['reasons']} are reasons, held against what the layer gives")
    print(f"false: {total['false']}; unsure, of damaged logs alone: {total['unsure']}")
    print(f"mode changes, hold-backs, releases and ends of the timer: of {total['whole determined']} in whole logs "
          f"{total['whole told']} are told, of {wanted} that remain in damaged ones {told}")
    print("damage:", ", ".join(f"{name[5:]} {total[name]}" for name in sorted(total) if name.startswith("kind ")))
    print(*said[:MOST_SAID], sep="\n")
    if told < ENOUGH * wanted:
        said.append("too little is told as sure")
        print(said[-1])
    return 1 if said or not wanted else 0


if __name__ == "__main__":
    sys.exit(main())
