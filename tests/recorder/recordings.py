# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Recordings as docs/recorder.md describes them, read and changed by tests."""

import pathlib
import struct
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "recorder"))

import interface  # noqa: E402

HEADER_WORDS = 28
POINTER_SIZE, EXPORTED_SIZE, STATE_SIZE, RING_WORDS = range(5, 9)  # words of the header
HEAD, SNAPSHOT_COUNT, FIRST_SNAPSHOT = 10, 11, 12
OPERATION, CALL, RETURN, CHANGE, SNAPSHOT = range(1, 6)
ANSWERED = 0x80
PRESENT = 0x80000000  # of what stands behind a pointer


class Recording:
    def __init__(self, content):
        self.words = list(struct.unpack(f"<{len(content) // 4}I", content))

    def bytes(self):
        return struct.pack(f"<{len(self.words)}I", *self.words)

    def events(self):
        """(place, kind, whether it is answered, function) of a ring that has not run over."""
        at, end = HEADER_WORDS, HEADER_WORDS + self.words[HEAD]
        while at < end:
            head = self.words[at]
            yield at, head >> 8 & 0x7F, bool(head >> 8 & ANSWERED), head >> 16 & 0xFF
            at += head & 0xFF

    def event(self, place):
        """Its words."""
        return self.words[place:place + (self.words[place] & 0xFF)]

    def of(self, *events):
        """A recording with the same beginning, and these events behind it."""
        began = next(self.events())[0]
        held = [word for event in (self.event(began), *events) for word in event]
        changed = Recording(self.bytes())
        changed.words[HEAD], changed.words[SNAPSHOT_COUNT] = len(held), 1
        changed.words[HEADER_WORDS:HEADER_WORDS + len(held)] = held
        return changed

    def begin(self, name, last=False):
        """(number of the event, from 0; the event) of a function's first call, or of its last one."""
        kind, listed = CALL, [function.name for function in interface.platform()]
        if name not in listed:
            kind, listed = OPERATION, [function.name for function in interface.operations()]
        found = [(i, event) for i, event in enumerate(self.events()) if event[1::2] == (kind, listed.index(name))]
        return found[-1 if last else 0]

    def argument(self, name):
        """(number of the event, place of the second argument) of a function's first call."""
        at, began = self.begin(name)
        return at, began[0] + 4

    def answer(self, name, last=False):
        """(number of the event in which it is answered, from 0; place of the answer) of such a call."""
        events = list(self.events())
        at, began = self.begin(name, last)
        if not began[2]:
            at = next(i for i, event in enumerate(events) if event[1] == RETURN and
                      self.words[event[0] + 3] == began[0] - HEADER_WORDS)
        return at, events[at][0] + 2
