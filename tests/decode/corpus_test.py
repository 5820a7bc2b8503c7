#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Whether the corpus finds false statements: true stories, falsified.

usage: corpus_test.py PMXBOARD PMXBOARD_WITH_THE_TWIN
"""

import copy
import functools
import pathlib
import random
import sys
import unittest

sys.dont_write_bytecode = True

import corpus  # noqa: E402

# A scenario, and what of its story is replaced by what.
FALSE = (
    ("display-part-never-answers", "10.0 s after", "24.9 s after"),
    ("display-part-never-answers", "graphics are mixed again", "graphics wait for the display part"),
    ("display-part-never-answers", "the display timer has run out", "the display timer is set"),
    ("display-part-answers", "the display part's flag is lowered, as", "the display timer has run out, as"),
    ("hdmi-unplugged-then-plugged", "nobody is waited for: no sink", "no wait for the display part: HDMI"),
    ("same-mode-again", "no wait for the display part: HDMI", "nobody is waited for: no sink"),
    ("frequency-change", "digital port off", "digital port 480i"),
    ("disc-menu-over-video", "to DRV_PMX_CS_YCBCR_601 (0)", "to DRV_PMX_CS_YCBCR_709 (1)"),
    ("disc-menu-over-video", "converter A BT.601 to BT.709", "converter A off"),
    ("first-look", "graphics wait for the display part", "graphics are mixed again"),
)


@functools.cache
def held_once(name):
    record = corpus.Record(PMXBOARD, pathlib.Path("scenarios") / f"{name}.pmx")
    console = corpus.written(record.lines(9), random.Random(3), "whole")
    console.every, console.level = record.lines(9), 9
    corpus.take_reasons(TWIN, [record])
    return record, console, corpus.decoded(PMXBOARD, console.data)


class Falsified(unittest.TestCase):
    def held(self, name):
        record, console, story = held_once(name)
        return record, console, copy.deepcopy(story)

    def test_a_true_story_has_nothing_false(self):
        for name, _, _ in FALSE:
            self.assertEqual([], corpus.Held(*self.held(name)).check(), name)

    def test_each_false_statement_is_found(self):
        for name, true, false in FALSE:
            record, console, story = self.held(name)
            changed = copy.deepcopy(story)
            for event in changed["events"]:
                event["title"] = event["title"].replace(true, false)
                event["details"] = [words.replace(true, false) for words in event["details"]]
            self.assertNotEqual(story, changed, f"{name} does not say: {true}")
            self.assertTrue(corpus.Held(record, console, changed).check(), f"{name}: {false}")

    def test_a_false_reason_is_found(self):
        record, console, story = self.held("first-look")
        for key, wrong in (("id", 38), ("values", [0]), ("line", 1)):
            changed = copy.deepcopy(story)
            found = [reason for event in changed["events"] for reason in event["reasons"]
                     if reason["name"] == "HELD_BACK"]
            self.assertTrue(found)
            found[0][key] = wrong
            self.assertTrue(corpus.Held(record, console, changed).check(), key)

    def test_a_reason_that_is_not_told_is_missed(self):
        record, console, story = self.held("first-look")
        self.assertEqual([], corpus.reasons_missed(corpus.Held(record, console, story)))
        for event in story["events"]:
            event["reasons"] = []
        self.assertTrue(corpus.reasons_missed(corpus.Held(record, console, story)))

    def test_a_gap_and_a_start_in_a_whole_log_are_false(self):
        record, console, story = self.held("first-look")
        for kind in ("gap", "start"):
            event = {"kind": kind, "operation": "", "title": "before this line", "first_line": 9, "last_line": 9,
                     "lines": [9], "details": [], "assumed": []}
            changed = {**story, "events": [*story["events"], event]}
            self.assertTrue(corpus.Held(record, console, changed).check(), kind)
            self.assertEqual(kind == "gap", bool(corpus.unsure(changed)))

    def test_what_is_not_told_is_missed(self):
        record, console, story = self.held("display-part-never-answers")
        count, missed = corpus.determined(corpus.Held(record, console, story))
        self.assertEqual((4, []), (count, missed))
        count, missed = corpus.determined(corpus.Held(record, console, {**story, "events": []}))
        self.assertEqual(4, len(missed))


if __name__ == "__main__":
    PMXBOARD = pathlib.Path(sys.argv.pop(1)).resolve()
    TWIN = pathlib.Path(sys.argv.pop(1)).resolve()
    unittest.main()
