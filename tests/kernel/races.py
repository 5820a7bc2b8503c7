# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Judges what a kernel that looks for data races has reported of pmx.ko: who touches the record without the mutex is
listed, with the reason, for the threads' tests."""

import dataclasses
import pathlib
import re
import subprocess
import sys

ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "tests/threads"))

from check_threads import LOCKING, entries  # noqa: E402

LISTED = ROOT / "tests/threads/unlocked_by_design.supp"
PLANTED = "count"  # of planted.c
# So many of those that are listed are seen whenever three threads run; fewer say that nobody looked.
LEAST_SEEN = 5
TITLE = re.compile(r"BUG: KCSAN: data-race in ")
ACCESS = re.compile(r"(?P<alone>race at unknown origin, with )?(?:read-write|read|write)(?: \(\w+\))* to 0x[0-9a-f]+ "
                    r"of \d+ bytes by (?:task \d+|interrupt) on cpu \d+:$")
FRAME = re.compile(r" ?([\w.]+)\+0x([0-9a-f]+)/0x([0-9a-f]+)(?: \[(\w+)\])?$")


@dataclasses.dataclass(frozen=True)
class Place:
    symbol: str
    offset: int
    size: int
    module: str


@dataclasses.dataclass
class Report:
    accesses: int = 2  # one, where only the value shows that somebody else was there
    places: list = dataclasses.field(default_factory=list)


def reports(lines):
    """Each report with the places that can be read of it."""
    found, expects_place = [], False
    for line in lines:
        access = ACCESS.match(line)
        if TITLE.match(line):
            found.append(Report())
        elif access and found:
            found[-1].accesses = 1 if access["alone"] else 2
            expects_place = True
        elif expects_place:
            expects_place = False
            frame = FRAME.match(line)
            if frame:
                found[-1].places.append(Place(frame[1], int(frame[2], 16), int(frame[3], 16), frame[4] or ""))
    return found


class Functions:
    """Functions by places in them, as the source calls them; the layer is compiled so that each stays by itself."""

    def __init__(self):
        self._known = {}

    def at(self, place):
        if place.symbol not in self._known:
            told = subprocess.run(["c++filt", "-p", place.symbol.partition(".")[0]], check=True, capture_output=True,
                                  text=True).stdout
            self._known[place.symbol] = plain(told.strip())
        return self._known[place.symbol]


def plain(name):
    """A function as its source calls it."""
    return name.replace("(anonymous namespace)::", "").partition("(")[0]


def of_the_module(lines, functions):
    """(pairs of functions, or one alone; reports that cannot be read)"""
    pairs, unreadable = [], 0
    for report in reports(lines):
        if len(report.places) != report.accesses:
            unreadable += 1
        elif any(place.module == "pmx" for place in report.places):
            pairs.append(tuple(functions.at(place) for place in report.places))
    return pairs, unreadable


def complaints(pairs, listed):
    for pair in sorted(set(tuple(sorted(pair)) for pair in pairs)):
        for name in sorted(set(pair) - listed - LOCKING):
            yield f"{name} is not listed in {LISTED.name}, and races: {' and '.join(pair)}"
        if len(pair) == 2 and set(pair) <= LOCKING:
            yield f"{pair[0]} races with {pair[1]}, and both hold the mutex"


def told(console, head):
    return [line.removeprefix(head + " ") for line in console if line.startswith(head + " ")]


def judge(ktap, console):
    listed, wrong = entries(LISTED.read_text(encoding="utf-8"))
    functions = Functions()
    pairs, unreadable = of_the_module(told(console, "RACES"), functions)
    wrong += complaints(pairs, listed)
    if unreadable:
        wrong.append(f"{unreadable} reports cannot be read")
    seen = {name for pair in pairs for name in pair} & listed
    ktap.verdict(f"races: {len(pairs)} reports of {len(seen)} functions that take no lock, by design", wrong)
    few = [f"only {', '.join(sorted(seen)) or 'none'}"] if len(seen) < LEAST_SEEN else []
    ktap.verdict(f"races: of {LEAST_SEEN} functions and more", few)
    planted, _ = of_the_module(told(console, "PLANTED"), functions)
    ktap.verdict("races: the one that is planted", [] if (PLANTED, PLANTED) in planted else ["nobody has seen it"])
