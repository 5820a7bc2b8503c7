#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Changes what the tool writes in ways that a schema must refuse, and names where.

usage: schemas_test.py TOOL
"""

import copy
import json
import pathlib
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import check_schemas  # noqa: E402
from schemas import Schemas  # noqa: E402

TOOL = []
NAMED = {"value": 2, "name": "RES_480P"}


def written():
    """(schema, document) of each kind that the tool writes."""
    with tempfile.TemporaryDirectory() as directory:
        looks = check_schemas.of_looks(TOOL[0], pathlib.Path(directory))
        looks += check_schemas.of_recordings(TOOL[0], pathlib.Path(directory))
    return [*looks, *check_schemas.of_commands(TOOL[0])]


def places(document, path=()):
    """The path of every object in a document."""
    children = document.items() if isinstance(document, dict) else enumerate(document)
    if isinstance(document, dict):
        yield path
    for key, child in children:
        if isinstance(child, (dict, list)):
            yield from places(child, (*path, key))


def cut(document):
    """The beginning of every list: the rest is of the same kind."""
    if isinstance(document, dict):
        return {key: cut(child) for key, child in document.items()}
    return list(map(cut, document[:2])) if isinstance(document, list) else document


def at(document, path):
    for key in path:
        document = document[key]
    return document


class SchemasRefuse(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.schemas, cls.written = Schemas(), written()

    def of(self, name, kind=None):
        return copy.deepcopy(next(document for written_as, document in self.written
                                  if written_as == name and (kind is None or document["kind"] == kind)))

    def refused(self, name, document, where):
        complaint = self.schemas.complaint(name, document)
        self.assertTrue(complaint.startswith(where), f"{name}: {complaint!r} does not begin with {where}")

    def test_what_the_tool_writes_is_accepted(self):
        self.assertEqual({"trace", "state", "status", "diff", "ops", "modes", "decode", "recording"},
                         {name for name, _ in self.written})
        for name, document in self.written:
            self.assertEqual("", self.schemas.complaint(name, document))

    def test_a_key_more_or_less_in_any_line_of_a_trace(self):
        lines = [document for name, document in self.written if name == "trace"]
        self.assertEqual({"call", "log", "state", "status", "diff", "what-if", "explanation"},
                         {line["kind"] for line in lines})
        for line in lines:
            refusal = "Unevaluated" if line["kind"] == "status" else "Additional"
            self.refused("trace", {**line, "colour": "red"}, f"$: {refusal} properties")
            for key in line.keys() - {"result", "level", "thread"}:
                self.refused("trace", {name: value for name, value in line.items() if name != key}, "$: '")
            self.refused("trace", {**line, "kind": "shout"}, "$.kind: 'shout' is not one of")

    def test_a_key_more_anywhere_but_among_what_the_layer_names(self):
        for name in ("diff", "status", "modes", "decode", "ops", "recording"):
            document = cut(self.of(name))
            for path in places(document):
                if {"values", "report", "fields"} & set(path):
                    continue
                changed = copy.deepcopy(document)
                at(changed, path)["colour"] = "red"
                self.assertNotEqual("", self.schemas.complaint(name, changed), f"{name} {path}")

    def test_values(self):
        line = self.of("trace", "call")
        for value in (2, -1, None, "text", [1, [2]], NAMED, {**NAMED, "hex": "0x2"}, {"symbol": "x"}, {"a": NAMED}):
            self.assertEqual("", self.schemas.complaint("trace", {**line, "arguments": {"x": value}}), value)
        for value in (1.5, True, {"value": "2", "name": "RES_480P"}, {**NAMED, "of": 1}, {**NAMED, "name": 2},
                      {"value": 2, "hex": "2"}, {"value": 2, "hex": "0xg"}, {"symbol": 3}, [[1.5]], {"a": {"b": 1.5}}):
            self.refused("trace", {**line, "arguments": {"x": value}}, "$.arguments.x")

    def test_a_trace_in_a_trace(self):
        line = self.of("trace", "what-if")
        line["calls"] = [{**self.of("trace", "call"), "depth": "0"}]
        self.refused("trace", line, "$.calls[0].depth: '0' is not of type 'integer'")

    def test_states(self):
        state = self.of("state")
        self.refused("state", {**state, "version": 2}, "$.version: 1 was expected")
        self.refused("state", {**state, "values": {}}, "$: ")
        self.refused("state", {key: value for key, value in state.items() if key != "state"}, "$: ")
        for path in (("mixer", "mode"), ("record", "ucMode"), ("os",)):
            changed = copy.deepcopy(state)
            del at(changed["state"], path[:-1])[path[-1]]
            self.refused("state", changed, "$.state")
            changed = copy.deepcopy(state)
            at(changed["state"], path[:-1])["colour"] = "red"
            self.refused("state", changed, "$.state")

    def test_differences(self):
        difference = self.of("diff")
        difference["changes"] = [{"path": "ucMode"}]
        self.refused("diff", difference, "$.changes[0]")

    def test_lists(self):
        for name, key, value in (("modes", "pll_family", 59), ("modes", "width", "720"), ("ops", "owner", "nobody"),
                                 ("ops", "usage", None), ("ops", "arguments", [{"name": "x"}])):
            document = self.of(name)
            document[0][key] = value
            self.refused(name, document, f"$[0].{key}")
            self.refused(name, [], "$: [] is too short")

    def test_recordings(self):
        kinds = ("operation", "call", "return", "change", "snapshot")
        self.assertLessEqual(set(kinds), {document["kind"] for name, document in self.written if name == "recording"})
        for kind in kinds:
            event = self.of("recording", kind)
            for key in ("event", "time_us", "thread", "depth", "kind", "text"):
                self.refused("recording", {name: value for name, value in event.items() if name != key}, "$: '")
            self.refused("recording", {**event, "kind": "shout"}, "$.kind: 'shout' is not one of")
            self.refused("recording", {**event, "answer": "0"}, "$.answer: ")
            self.refused("recording", {**event, "thread": -1}, "$.thread: -1 is less than the minimum of 0")
        for kind, key in (("operation", "function"), ("call", "function"), ("return", "answer")):
            event = {name: value for name, value in self.of("recording", kind).items() if name != key}
            self.refused("recording", event, f"$: '{key}' is a required property")
        self.refused("recording", {**self.of("recording", "snapshot"), "answer": 0}, "$.answer: ")

    def test_decoded_logs(self):
        logs = [document for name, document in self.written if name == "decode" and isinstance(document, dict)]
        departed = next(log for log in logs if log["against"] and log["against"]["departure"])
        for path, value in ((("events", 0, "problem"), "yes"), (("texts", 0, "cut"), "middle"), (("level",), "9"),
                            (("against", "departure", "kind"), "other")):
            changed = copy.deepcopy(departed)
            at(changed, path[:-1])[path[-1]] = value
            self.refused("decode", changed, "$." + str(path[0]))


if __name__ == "__main__":
    TOOL = [pathlib.Path(sys.argv[1]).resolve()]
    unittest.main(argv=sys.argv[:1])
