#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the tool that measures costs against small cases that are counted by hand."""

import copy
import json
import pathlib
import re
import sys
import unittest

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parent.parent.parent / "tools" / "cost"))

import callgraph  # noqa: E402
import card as cards  # noqa: E402
import check  # noqa: E402
import diff  # noqa: E402
import goals  # noqa: E402
import instructions  # noqa: E402
import paths  # noqa: E402
import program  # noqa: E402
import signatures  # noqa: E402


def node(title, frame, kind="static"):
    label = f"void {title}()\\nx.cpp:1:1\\n{frame} bytes ({kind})\\n0 dynamic objects"
    return f'node: {{ title: "{title}" label: "{label}" }}\n'


def edge(source, target, label="x.cpp:7:3"):
    return f'edge: {{ sourcename: "{source}" targetname: "{target}" label: "{label}" }}\n'


class CallGraph(unittest.TestCase):
    def test_worst_path_is_the_deepest_not_the_longest(self):
        text = (node("top", 8) + node("a", 16) + node("b", 8) + node("big", 100)
                + edge("top", "a") + edge("a", "b") + edge("top", "big"))
        worst = callgraph.read([text], set()).worst("top")
        self.assertEqual(108, worst.bytes)
        self.assertEqual(("top", "big"), worst.names)

    def test_paths_go_through_several_files(self):
        graph = callgraph.read([node("top", 8) + edge("top", "low"), node("low", 24)], set())
        self.assertEqual(32, graph.worst("top").bytes)

    def test_recursion_is_refused(self):
        text = node("a", 8) + node("b", 8) + edge("a", "b") + edge("b", "a")
        with self.assertRaisesRegex(callgraph.CallGraphError, "recursion: a > b > a"):
            callgraph.read([text], set())

    def test_the_platform_has_no_frame_and_a_stranger_is_refused(self):
        text = node("top", 8) + edge("top", "TVE_SetEnable")
        self.assertEqual(8, callgraph.read([text], {"TVE_SetEnable"}).worst("top").bytes)
        with self.assertRaisesRegex(callgraph.CallGraphError, "TVE_SetEnable, of which nothing is known"):
            callgraph.read([text], set())

    def test_indirect_calls_are_listed(self):
        graph = callgraph.read([node("top", 8) + edge("top", "__indirect_call", "src/x.cpp:7:3")], set())
        self.assertEqual([("top", "x.cpp:7")], graph.indirect)

    def test_a_frame_without_a_bound_is_refused(self):
        with self.assertRaisesRegex(callgraph.CallGraphError, "without a bound"):
            callgraph.read([node("top", 8, "dynamic")], set())


class PathTable(unittest.TestCase):
    def test_a_path_begins_with_power_on_unless_it_says_so_itself(self):
        read = paths.read("[PMX_A cheapest]\nPMX_A 1\n[PMX_A dearest]\npower-on\nPMX_B # first\nPMX_A 0\n",
                          {"PMX_A"})
        self.assertEqual(("power-on", "PMX_Init", "PMX_A 1"), read[0].lines)
        self.assertEqual(("power-on", "PMX_B", "PMX_A 0"), read[1].lines)

    def test_an_operation_that_stands_nowhere_has_its_example(self):
        read = paths.read("[PMX_A only]\nPMX_A 1\n", {"PMX_A", "PMX_B"},
                          {"PMX_A": ([], "PMX_A 2"), "PMX_B": (["PMX_Init", "PMX_A 3"], "PMX_B 4")})
        self.assertEqual([("PMX_A only", ("power-on", "PMX_Init", "PMX_A 1")),
                          ("PMX_B only", ("power-on", "PMX_Init", "PMX_A 3", "PMX_B 4"))],
                         [(path.name, path.lines) for path in read])

    def refused(self, text, message):
        with self.assertRaisesRegex(paths.PathError, message):
            paths.read(text, {"PMX_A"})

    def test_wrong_tables_are_refused(self):
        self.refused("[PMX_A only]\nPMX_B\n", "calls PMX_B, not PMX_A")
        self.refused("[PMX_A only]\n", "no lines")
        self.refused("[PMX_A cheapest]\nPMX_A\n", "needs a cheapest and a dearest")
        self.refused("[PMX_A only]\nPMX_A\n[PMX_A only]\nPMX_A\n", "stands here twice")
        self.refused("[PMX_A only]\nPMX_A\n[PMX_C only]\nPMX_C\n", "no operation")
        self.refused("PMX_A\n", "before the first heading")


class Floor(unittest.TestCase):
    def test_a_straight_line_of_the_same_calls_with_constants(self):
        recorded = {"name": "PMX_SetTvType", "arguments": [0, 3], "result": 1,
                    "calls": [{"name": "PMX_HalSetTvType", "arguments": [0, 3], "result": None, "outputs": {}}]}
        text = program.floor(4, recorded, program.Data("data_"))
        self.assertRegex(text, r"UINT32 floor_4\(UCHAR \w+, UCHAR \w+\)")
        body = text.split("{")[1]
        self.assertRegex(body, r"^\s*PMX_HalSetTvType\(\(UCHAR\)0ll, \(UCHAR\)3ll\);\s*return \(UINT32\)1ll;\s*}")

    def test_texts_are_written_byte_by_byte(self):
        self.assertEqual(r'"a\"\\\n\001\?"', program.c_text(b'a"\\\n\x01?'))


class Signatures(unittest.TestCase):
    """What the headers say is what stands between layer and platform has to know: kind, bytes read, bytes written."""

    def known(self, function, parameter):
        found = {**signatures.operations(), **signatures.platform()}[function]
        [known] = [(each.kind, each.read, each.written) for each in found.parameters if each.name == parameter]
        return known

    def test_of_the_platform(self):
        for function, parameter, expected in (
                ("x_sema_create", "phSema", ("place", "", "sizeof *phSema")),
                ("x_sema_create", "u4InitValue", ("number", "", "")),
                ("x_timer_start", "pfCallback", ("symbol", "", "")),
                ("x_timer_start", "pvArg", ("tag", "", "")),
                ("x_vsnprintf", "szBuffer", ("place", "", "strlen(szBuffer) + 1")),
                ("x_vsnprintf", "szFormat", ("text", "", "")),
                ("x_vsnprintf", "rArgs", ("list", "", "")),
                ("PMX_IsLog", "", ("values", "", "")),
                ("i4NFBPartitionRead", "pvDest", ("place", "", "u4Count")),
                ("register_pm_ops", "prOps", ("symbol", "", "")),
                ("i4ImQueryInterface", "ppvTag", ("table", "", "")),
                ("PMX_HalPlaneOrder", "pu4PlaneOrder", ("data", "8 * sizeof(UINT32)", "")),
                ("PMX_HalSetPlaneOrder", "pi4PlnDelay", ("place", "", "8 * sizeof(INT32)")),
                ("PMX_HalSetGamma", "pucCurve", ("data", "9 * sizeof(UCHAR)", "")),
                ("_i4OSD_SetPosOffset", "pi4Offset", ("data", "5 * sizeof(INT32)", "")),
                ("pu4SetColorMode", "pvTag", ("tag", "", ""))):
            self.assertEqual(expected, self.known(function, parameter), f"{function} {parameter}")

    def test_of_the_layer(self):
        for function, parameter, expected in (
                ("PMX_SetModeEx", "prOutConf", ("data", "PMX_OUTPUT_NUM * sizeof(PMX_RESOLUTION_T)", "")),
                ("PMX_SetPlaneOrderArray", "pu4PlaneOrder", ("data", "8 * sizeof(UINT32)", "")),
                ("PMX_ChkSupportedRes", "ucSupportedAutoVsyncFreg", ("place", "", "sizeof *ucSupportedAutoVsyncFreg")),
                ("i4PmxGetMode", "pvTag", ("tag", "", "")),
                ("PMX_Printf", "format_string", ("text", "", ""))):
            self.assertEqual(expected, self.known(function, parameter), f"{function} {parameter}")

    def test_of_what_a_command_says(self):
        kind, read, written = self.known("fgPmxDrvSetAvd", "pvParameter")
        self.assertEqual(("data", ""), (kind, written))
        cases = dict(re.findall(r"([^?:]+) \? (sizeof\(\w+\)) :", read.strip("()")))
        sizes = {name: size for names, size in cases.items() for name in re.findall(r"== (\w+)", names)}
        self.assertEqual(32 - 4, len(sizes))  # 0 to 31 without 3, 11, 12, 14
        self.assertEqual("sizeof(UINT32)", sizes["PMX_CHG_HDMI_VIDEO_ASPECT_RATIO"])
        self.assertEqual("sizeof(PMX_SET_TV_SYS_PARAMETER_T)", sizes["PMX_SET_UI_TV_SYSTEM"])
        for name in ("PMX_SET_VIDEO_PLL", "PMX_SET_HDMI_RES_CHG", "PMX_SET_CCIR_RES_CHG"):
            self.assertEqual("sizeof(PMX_SET_HDMI_RES_PARAMETER_T)", sizes[name])
        self.assertEqual(23, list(sizes.values()).count("sizeof(UINT8)") + list(sizes.values()).count("sizeof(BOOL)"))
        self.assertTrue(read.endswith(": 0)"))
        query = "(u4Query == PMX_GET_VALID_RES_AND_VFREQ ? sizeof(PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T) : 0)"
        self.assertEqual(("data", query, query), self.known("fgPmxDrvGetAvdInfo", "pvParameter"))


class SelfCosts(unittest.TestCase):
    def test_what_was_executed_in_a_callee_does_not_count_for_the_caller(self):
        text = "\n".join(["part: 1", "desc: Trigger: Client Request: layer/PMX_A only", "fn=PMX_A", "0 5",
                          "calls=2 0", "0 70", "0 3", "fn=helper", "0 70", "part: 2",
                          "desc: Trigger: Program termination", "fn=main", "0 9"])
        self.assertEqual({"layer/PMX_A only": {"PMX_A": 8, "helper": 70}}, instructions.self_costs(text))


def card():
    path = {"operation": "PMX_A", "kind": "only", "line": "PMX_A", "after": [], "calls": 3, "registers": 1, "logs": 1,
            "layer": 100, "floor": 60}
    function = {"label": "PMX_A", "code": 200, "texts": 20, "frame": 16, "stack": 100, "through": ["PMX_A"]}
    return {"compilers": {"host": "g++ 12", "target": "arm 12"},
            "totals": {"code": 1000, "texts": 500, "tables": 100, "ram": 50, "heap": 0},
            "kernel": {"code": 1300, "texts": 500, "tables": 100, "ram": 50, "unwind": 200},
            "in_kernel": {"kernel": "6.1", "mode": 900, "frequency": 1000, "again": 700},
            "files": {"pmx_a": {"code": 1000, "texts": 500, "tables": 100, "ram": 50}},
            "functions": {"PMX_A": function},
            "tables": {"T": 100}, "ram": {"_arPmxConf": 40, "x": 10}, "repeated": [], "indirect": [],
            "recorder": {"change": 1000, "calls": 9, "call": 100, "code": 5000, "functions": {"PMX_A": 50}},
            "paths": [path]}


class AsJson(unittest.TestCase):
    def test_says_the_same_with_an_entry_a_line(self):
        text = cards.as_json(card())
        self.assertEqual(card(), json.loads(text))
        self.assertIn('\n  "PMX_A": {"label": "PMX_A", "code": 200, ', text)
        self.assertIn('\n  {"operation": "PMX_A", "kind": "only", ', text)
        entries = sum(len(part) for part in card().values())
        self.assertEqual(2 + entries + sum(2 if part else 1 for part in card().values()), text.count("\n"))


class Check(unittest.TestCase):
    def complaints(self, change):
        now = card()
        change(now)
        return check.all_of(card(), now)[0]

    def test_no_change(self):
        self.assertEqual([], self.complaints(lambda now: None))

    def test_one_percent_more_instructions_pass_and_three_do_not(self):
        self.assertEqual([], self.complaints(lambda now: now["paths"][0].update(layer=101)))
        self.assertEqual(["PMX_A only: instructions: 100 has grown to 103"],
                         self.complaints(lambda now: now["paths"][0].update(layer=103)))

    def test_one_percent_more_bytes_pass_and_three_do_not(self):
        for kind, old, bit_more, much_more in (("code", 1000, 1010, 1030), ("texts", 500, 505, 515),
                                               ("tables", 100, 101, 103), ("ram", 50, 51, 52)):
            self.assertEqual([], self.complaints(lambda now, grown={kind: bit_more}: now["totals"].update(grown)))
            self.assertEqual([f"{kind} in all: {old} has grown to {much_more}"],
                             self.complaints(lambda now, grown={kind: much_more}: now["totals"].update(grown)))
        self.assertEqual([], self.complaints(lambda now: now["kernel"].update(unwind=204)))
        self.assertEqual(["unwind in a kernel: 200 has grown to 208"],
                         self.complaints(lambda now: now["kernel"].update(unwind=208)))
        self.assertEqual(1, len(self.complaints(lambda now: now["functions"]["PMX_A"].update(stack=103))))
        self.assertEqual(1, len(self.complaints(lambda now: now["files"]["pmx_a"].update(code=1030))))

    def test_what_recording_costs_may_not_grow(self):
        self.assertEqual([], self.complaints(lambda now: now["recorder"].update(change=1010)))
        self.assertEqual(["the recorder: change: 1000 has grown to 1030"],
                         self.complaints(lambda now: now["recorder"].update(change=1030)))
        self.assertEqual(["the recorder: PMX_A: 50 has grown to 60"],
                         self.complaints(lambda now: now["recorder"]["functions"].update(PMX_A=60)))

    def test_fewer_of_anything_pass_but_calls(self):
        self.assertEqual([], self.complaints(lambda now: now["paths"][0].update(layer=50)))
        for kind in ("calls", "registers", "logs"):
            self.assertEqual(1, len(self.complaints(lambda now, kind=kind: now["paths"][0].update({kind: 0}))))
            self.assertEqual(1, len(self.complaints(lambda now, kind=kind: now["paths"][0].update({kind: 4}))))

    def test_an_operation_that_the_card_lacks_is_told_with_its_place(self):
        self.assertEqual([], list(check.operations(card(), {"PMX_A": "layer.h:1"})))
        self.assertEqual(["layer.h:2: the card has no PMX_B"],
                         list(check.operations(card(), {"PMX_A": "layer.h:1", "PMX_B": "layer.h:2"})))

    def test_the_header_tells_where_operations_are(self):
        self.assertEqual(set(signatures.operations()), set(signatures.places()))
        self.assertRegex(signatures.places()["PMX_Init"], r"drv_pmx\.h:\d+$")

    def test_paths_that_came_and_went(self):
        self.assertEqual(["PMX_A only: measured no more, and still on the card"],
                         self.complaints(lambda now: now["paths"].clear()))
        self.assertEqual(["PMX_A other: the card has no such path"],
                         self.complaints(lambda now: now["paths"].append({**card()["paths"][0], "kind": "other"})))

    def test_another_compiler_is_not_compared_with_and_says_so(self):
        now = card()
        now["compilers"]["host"] = "g++ 13"
        now["paths"][0]["layer"] = 200
        complaints, notes = check.all_of(card(), now)
        self.assertEqual([], complaints)
        self.assertIn("instructions are not compared", notes[0])
        now["paths"][0]["calls"] = 4
        self.assertEqual(1, len(check.all_of(card(), now)[0]))


class Goals(unittest.TestCase):
    LIST = {"size": {"code": 1000, "tables": 100, "frame": 16, "stack": 100, "ram": 10},
            "price": {"any": 40, "loop": 60, "own": {}}, "loops": {"operations": []}, "stack": {"apart": []},
            "recorder": {"call": 120, "change": 1000},
            "in_kernel": {"mode": 900, "frequency": 1000, "again": 700}}

    def complaints(self, explained=(), **changes):
        now = copy.deepcopy(card())
        now["totals"].update({name: value for name, value in changes.items() if name in now["totals"]})
        now["paths"][0].update({name: value for name, value in changes.items() if name == "layer"})
        now["repeated"] = changes.get("repeated", [])
        now["recorder"].update({name: value for name, value in changes.items() if name in ("call", "change")})
        now["in_kernel"].update({name: value for name, value in changes.items() if name in now["in_kernel"]})
        every = [*goals.of_sizes(self.LIST, now), *goals.of_prices(self.LIST, now), *goals.of_kernel(self.LIST, now),
                 *goals.of_recorder(self.LIST, now)]
        return list(goals.complaints(every, [{"goals": list(explained), "because": "so"}] if explained else []))

    def test_met_goals_need_no_explanation(self):
        self.assertEqual([], self.complaints())

    def test_a_miss_needs_one(self):
        self.assertEqual(1, len(self.complaints(code=1001)))
        self.assertEqual([], self.complaints(["code"], code=1001))
        self.assertEqual(1, len(self.complaints(layer=101)))
        self.assertEqual([], self.complaints(["PMX_A"], layer=101))
        self.assertEqual(1, len(self.complaints(ram=51)))
        self.assertEqual(1, len(self.complaints(repeated=["twice"])))
        self.assertEqual(1, len(self.complaints(call=121)))
        self.assertEqual([], self.complaints(["recorded change"], change=1001))
        for name in ("mode", "frequency", "again"):
            self.assertEqual(1, len(self.complaints(**{name: 1001})))
            self.assertEqual([], self.complaints([f"kernel_{name}"], **{name: 1001}))

    def test_a_stale_explanation_and_one_of_nothing_are_refused(self):
        self.assertRegex(self.complaints(["code"])[0], "its explanation is stale")
        self.assertRegex(self.complaints(["PMX_Z"])[0], "no such goal")


class Difference(unittest.TestCase):
    def test_every_symbol_that_changed_with_its_change(self):
        now = card()
        now["functions"]["PMX_B"] = {**now["functions"]["PMX_A"], "label": "PMX_B", "code": 30}
        now["functions"]["PMX_A"]["code"] = 190
        now["paths"][0]["layer"] = 90
        now["kernel"]["unwind"] = 208
        text = diff.text(card(), now)
        self.assertRegex(text, r"(?m)^  PMX_B +0 +30 +\+30  new$")
        self.assertRegex(text, r"(?m)^  PMX_A +200 +190 +-10$")
        self.assertRegex(text, r"(?m)^  PMX_A only +40 +30 +-10$")
        self.assertRegex(text, r"(?m)^bytes in a kernel .*\n  unwind +200 +208 +\+8$")
        without = diff.text({**card(), "kernel": {}}, card())  # a revision before there was that form
        self.assertRegex(without, r"(?m)^  unwind +0 +200 +\+200  new$")
        self.assertIn("register accesses: no change", text)


if __name__ == "__main__":
    unittest.main()
