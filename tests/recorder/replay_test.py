#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Records scenarios and replays them: as they are, with another answer, argument or result, out of a memory dump, out
of a ring that has run over, and damaged.

usage: replay_test.py CHECKED OPTIMISED PRODUCT INTERRUPTED LATE

CHECKED and OPTIMISED are the tool with sanitizers and as it is shipped.
"""

import json
import os
import pathlib
import random
import re
import signal
import struct
import subprocess
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

from recordings import (ANSWERED, CALL, CHANGE, EXPORTED_SIZE, FIRST_SNAPSHOT, HEAD, HEADER_WORDS,  # noqa: E402
                        OPERATION, POINTER_SIZE, PRESENT, RETURN, RING_WORDS, SNAPSHOT, SNAPSHOT_COUNT, STATE_SIZE,
                        Recording, interface)

ROOT = pathlib.Path(__file__).resolve().parents[2]
# What no scenario can say.
NO_SCENARIO = {
    "connect-while-informing": "a thread of its own that waits for the mutex within a call",
    "plane-connects-back": "an operation within pu4SetColorMode, which is no function that a line can name",
    "second-source-while-announcing": "a thread of its own that waits for the mutex within a call",
}
SCENARIOS = sorted((ROOT / "scenarios").glob("*.pmx"))
MODE_CHANGE = "PMX_Init\nPMX_SetMode 0 RES_720P50HZ 50 0\nPMX_SetMode 0 RES_480P 60 0\n"


def verbs_of(scenario):
    """What its lines begin with, operations and expectations apart."""
    words = {line.split()[0] for line in scenario.read_text(encoding="utf-8").splitlines() if line.strip()}
    return {word for word in words if re.match("[a-z][a-z-]*$", word)} - {"expect"}


def of_each_verb():
    """Scenarios that have every verb between them: those first that have the most that is new."""
    verbs = {scenario: verbs_of(scenario) for scenario in SCENARIOS}
    wanted, chosen = set().union(*verbs.values()), []
    while wanted:
        chosen.append(max(SCENARIOS, key=lambda scenario: len(verbs[scenario] & wanted)))
        wanted -= verbs[chosen[-1]]
    return chosen


class Replay(unittest.TestCase):
    program = None  # the checked one

    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.place = pathlib.Path(folder.name)
        self.file = self.place / "recording"

    def run_tool(self, *arguments):
        return subprocess.run([self.program or CHECKED, *map(str, arguments)], capture_output=True, text=True, cwd=ROOT,
                              timeout=60, check=False)

    def record(self, lines, *options):
        scenario = self.place / "scenario.pmx"
        scenario.write_text(lines, encoding="utf-8")
        ended = self.run_tool("record", *options, self.file, scenario)
        self.assertEqual(0, ended.returncode, ended.stderr)
        return Recording(self.file.read_bytes())

    def replay(self, content):
        self.file.write_bytes(content)
        return self.run_tool("replay", self.file)

    def replays_and_plays_the_same(self, scenario):
        """Whether a scenario came of its recording: a few say what no scenario can."""
        ended = self.run_tool("record", self.file, scenario)
        self.assertEqual(0, ended.returncode, f"{scenario.name}: {ended.stderr}")
        ended = self.run_tool("replay", self.file)
        self.assertEqual(0, ended.returncode, f"{scenario.name}: {ended.stdout}{ended.stderr}")
        self.assertRegex(ended.stdout, r"^equal: [1-9]\d* operations, [1-9]\d* calls\n$", scenario.name)
        ended = self.run_tool("replay", "--to-scenario", self.file)
        if scenario.stem in NO_SCENARIO:
            self.assertEqual(1, ended.returncode, f"{scenario.stem}: why is it an exception?")
            self.assertRegex(ended.stdout, r"\n# missing: .*\n$", scenario.name)
            return False
        self.assertEqual(0, ended.returncode, f"{scenario.name}: {ended.stdout[-300:]}{ended.stderr}")
        written = self.place / "written.pmx"
        written.write_text(ended.stdout, encoding="utf-8")
        ended = self.run_tool("run", "--quiet", written)
        self.assertEqual((0, ""), (ended.returncode, ended.stderr), scenario.name)
        return True

    def test_every_scenario_replays_equal_and_becomes_one_that_plays_the_same(self):
        self.assertGreater(len(SCENARIOS), 40)
        self.program = OPTIMISED
        self.assertGreater(sum(map(self.replays_and_plays_the_same, SCENARIOS)), 40)

    def test_scenarios_of_each_verb_do_so_under_sanitizers(self):
        chosen = of_each_verb()
        self.assertGreater(len(chosen), 4)
        for scenario in {*chosen, *(scenario for scenario in SCENARIOS if scenario.stem in NO_SCENARIO)}:
            self.replays_and_plays_the_same(scenario)

    def test_a_scenario_says_what_was_answered(self):
        self.record("sink unplug\nfault x_sema_create 0 phSema=77\nPMX_Init\nexpect misuses 0\n")
        ended = self.run_tool("replay", "--to-scenario", self.file)
        self.assertEqual(0, ended.returncode, ended.stdout)
        self.assertIn("\nfault x_sema_create 0 on 1 phSema=77\nPMX_Init\n", ended.stdout)

    def test_what_neighbours_do_meanwhile(self):
        self.record("PMX_Init\nmeanwhile PMX_HalSetMode poke ucBrightness 7\nPMX_SetMode 0 RES_720P50HZ 50 0\n"
                    "meanwhile TVE_SetFmtEx PMX_SetBrightness 0 9 1\nPMX_SetMode 0 RES_480P 60 0\n"
                    "PMX_GetBrightness 0\n")
        self.assertEqual("equal", self.run_tool("replay", self.file).stdout.split(":")[0])

    def test_another_answer_departs_there(self):
        recording = self.record(MODE_CHANGE)
        # Its handle stands in an object that neighbours see: that was a change from outside, and then it returned.
        number, place = recording.answer("x_timer_create")
        recording.words[place] = 0xFFFFFFFF
        ended = self.replay(recording.bytes())
        self.assertEqual(1, ended.returncode)
        self.assertIn(f"departs at event {number + 2} of {len(list(recording.events()))}", ended.stdout)
        self.assertIn("in PMX_Init: another call\n", ended.stdout)
        self.assertIn("computed: Assert(", ended.stdout)
        self.assertIn("record:   {ucEnable=", ended.stdout)

    def test_another_argument_departs_there(self):
        recording = self.record(MODE_CHANGE)
        numbers = [function.name for function in interface.platform()]
        place, number = next((event[0], i) for i, event in enumerate(recording.events())
                             if event[1] == CALL and event[3] == numbers.index("PMX_HalSetMode"))
        recording.words[place + 4] += 1
        ended = self.replay(recording.bytes())
        self.assertEqual(1, ended.returncode)
        self.assertRegex(ended.stdout, rf"^departs at event {number + 1} .* PMX_\w+: other arguments\n")
        self.assertRegex(ended.stdout, r"recorded: PMX_HalSetMode\(0, \w+\)\n  computed: PMX_HalSetMode\(0, \w+\)\n")

    def test_another_result_departs_there(self):
        recording = self.record("PMX_Init\nPMX_GetMode 0\n")
        numbers = [function.name for function in interface.operations()]
        [place] = [event[0] for event in recording.events()
                   if event[1:] == (OPERATION, True, numbers.index("PMX_GetMode"))]
        recording.words[place + 2] = 5
        ended = self.replay(recording.bytes())
        self.assertIn("another result\n  recorded: end of PMX_GetMode = 5\n  computed: end of PMX_GetMode = 1\n",
                      ended.stdout)
        recording.words[place + 2] = 1
        recording.words[place + (recording.words[place] & 0xFF) - 1] ^= 1
        self.assertIn("another output", self.replay(recording.bytes()).stdout)

    def test_the_layer_says_why_it_refuses(self):
        recording = self.record("PMX_Init\nPMX_ChkSupportedRes 0 RES_480P 60\n")
        _, place = recording.answer("fgPmxDrvGetAvdInfo")
        recording.words[place] = 0
        ended = self.replay(recording.bytes())
        self.assertEqual(1, ended.returncode)
        self.assertRegex(ended.stdout, r"\nthe layer's reasons:\n  refused: PMX_ChkSupportedRes = 0\n  because ")

    def test_what_was_recorded_is_shown(self):
        self.record("PMX_Init\nPMX_GetMode 0\n")
        shown = self.run_tool("replay", "--show", self.file).stdout
        self.assertRegex(shown, r"^1\t0\t0\tsnapshot\n")
        self.assertRegex(shown, r"(?m)^\d+\t0\t0\tPMX_Init\(\)$")
        self.assertRegex(shown, r"(?m)^\d+\t\d+\t0\t  PMX_HalSetMode\(0, RES_\w+\)$")
        self.assertRegex(shown, r'(?m)^\d+\t0\t0\t  PMX_IsLog\(1, "PMX_Init')
        self.assertRegex(shown, r"(?m)^\d+\t\d+\t0\t  x_reg_write32\(0xFD0000\w\w, \w+\)$")
        self.assertRegex(shown, r"(?m)^\d+\t\d+\t0\tend of PMX_Init$")
        self.assertRegex(shown, r"PMX_GetMode\(0, \[A5\]\) = 1\n$")

    def test_time_goes_on_when_its_ticks_begin_again(self):
        recording = self.record("PMX_Init\n")
        for number, (place, *_) in enumerate(recording.events()):
            recording.words[place + 1] = 0xFFFFFFF0 + 7 * number & 0xFFFFFFFF
        self.assertEqual(0, self.replay(recording.bytes()).returncode)
        told = self.events()
        self.assertEqual([0xFFFFFFF0 + 7 * number for number in range(len(told))], [one["time_us"] for one in told])

    def test_three_small_arguments_take_24_bytes(self):
        recording = self.record(MODE_CHANGE)
        functions, most = interface.platform(), 0
        for place, kind, _, number in recording.events():
            if kind == CALL and {parameter.kind for parameter in functions[number].parameters} <= {"number"}:
                count = len(functions[number].parameters)
                self.assertEqual(3 + count, recording.words[place] & 0xFF, functions[number].name)
                most = max(most, count if count <= 3 else 0)
        self.assertEqual(3, most)

    def test_what_was_recorded_is_told_to_programs(self):
        recording = self.record("PMX_Init\nPMX_GetMode 0\n")
        told = self.events()
        self.assertEqual(len(list(recording.events())), len(told))
        self.assertEqual(list(range(1, len(told) + 1)), [one["event"] for one in told])
        self.assertEqual({"event": len(told), "time_us": told[-1]["time_us"], "thread": 0, "depth": 0,
                          "kind": "operation", "function": "PMX_GetMode", "answer": 1,
                          "text": "PMX_GetMode(0, [A5]) = 1"}, told[-1])
        trace = json.loads(self.run_tool("replay", "--chrome", self.file).stdout)["traceEvents"]
        self.assertEqual(len(told), len(trace))
        phases = [event["ph"] for event in trace]
        self.assertEqual(phases.count("B"), phases.count("E"))
        self.assertEqual(("B", "PMX_Init"), next((event["ph"], event["name"]) for event in trace
                                                 if event["name"].startswith("PMX_")))

    def test_a_ring_that_has_run_over(self):
        recording = self.record("PMX_Init\n" + 60 * MODE_CHANGE.removeprefix("PMX_Init\n"), "--size", "32768")
        ring, head = recording.words[RING_WORDS], recording.words[HEAD]
        self.assertEqual(32768 // 4, ring)
        self.assertGreater(head, 2 * ring)
        self.assertGreaterEqual(recording.words[SNAPSHOT_COUNT], 4 * (head // ring))
        ended = self.run_tool("replay", self.file)
        self.assertEqual(0, ended.returncode, ended.stdout + ended.stderr)
        lost = int(ended.stdout.split("lost before: ")[1].split()[0]) // 4
        self.assertGreaterEqual(head - lost, 3 * ring // 4)

    def test_out_of_a_memory_dump(self):
        content = self.record(MODE_CHANGE).bytes()
        self.assertEqual(0, self.replay(random.Random(1).randbytes(1001) + content + b"\xff" * 99).returncode)

    def test_the_first_words_alone_are_no_recording(self):
        content = self.record(MODE_CHANGE).bytes()
        alone = content[:12] + bytes(199) + content[:12]
        self.assertEqual(0, self.replay(alone + content).returncode)
        ended = self.replay(alone)
        self.assertEqual(2, ended.returncode)
        self.assertIn("has version 0", ended.stderr)

    def test_a_call_that_no_operation_makes(self):
        recording = self.record(MODE_CHANGE)
        call = next(event[0] for event in recording.events() if event[1] == CALL)
        self.file.write_bytes(recording.of(self.unanswered(recording, call), self.operation(recording)).bytes())
        ended = self.run_tool("replay", "--to-scenario", self.file)
        self.assertEqual((2, ""), (ended.returncode, ended.stdout))
        self.assertIn("begins with a call and no operation", ended.stderr)
        self.assertIn("nothing: no operation runs", self.run_tool("replay", self.file).stdout)

    def test_depth_has_a_limit(self):
        recording = self.record(MODE_CHANGE)
        call = next(event[0] for event in recording.events() if event[1] == CALL)
        deeper = self.operation(recording) + self.unanswered(recording, call)
        ended = self.replay(recording.of(*(100 * [deeper])).bytes())
        self.assertEqual(1, ended.returncode, ended.stderr)
        self.assertIn("departs at event 130 of 201", ended.stdout)
        self.assertIn("the recording contradicts itself", ended.stdout)

    @staticmethod
    def operation(recording):
        return recording.event(next(event[0] for event in recording.events() if event[1] == OPERATION))

    @staticmethod
    def unanswered(recording, place):
        head, *words = recording.event(place)
        return [head & ~(ANSWERED << 8), *words]

    def test_what_a_product_keeps(self):
        subprocess.run([PRODUCT, self.file, "0"], check=True, timeout=60)
        ended = self.run_tool("replay", self.file)
        self.assertEqual(0, ended.returncode, ended.stdout + ended.stderr)
        # A ring of 64 KiB, which has lost something: two operations for each mode change.
        self.assertGreater(int(ended.stdout.split("lost before: ")[1].split()[0]), 65536)
        self.assertGreaterEqual(int(ended.stdout.split()[1]), 2 * 20)

    def test_a_recorder_prints_what_is_printed_without(self):
        printed = [subprocess.run([PRODUCT, "print", file], check=True, timeout=60, stdout=subprocess.PIPE,
                                  text=True).stdout for file in ("-", self.file)]
        self.assertEqual(["     42 behind a width", "thr, tw    .", "12345678% and    so, %s %d", "12345678 1234.",
                          300 * "f" + 200 * "v" + ".", 500 * "a" + 11 * "b", "7" + 510 * "c", "3 4 ABC",
                          "002 precise (null)", 511 * "p", "1234567891234567", "any"], printed[0].splitlines()[:-1])
        self.assertEqual(printed[0], printed[1])
        ended = self.run_tool("replay", self.file)
        self.assertEqual(0, ended.returncode, ended.stdout + ended.stderr)

    def test_what_is_kept_of_long_texts(self):
        subprocess.run([PRODUCT, "print", self.file], check=True, timeout=60, stdout=subprocess.DEVNULL)
        told = self.events()
        printed = [one["text"] for one in told if one.get("function") == "PMX_Printf" and one["kind"] == "operation"]
        self.assertEqual([f'PMX_Printf({level}, ""...)' for level in (2, -1, 32)], printed[4:7])
        kept = [re.findall(r'"([^"]*)"(\.\.\.)?', text) for text in printed[7:]]
        self.assertEqual([("%.3ld %.9999s %s", ""), ("precise", "")], kept[4])
        self.assertEqual([("%.511s", ""), (511 * "p", "")], kept[5])
        self.assertEqual([[(300 * "f" + "%s.", ""), (200 * "v", "")],
                          [("%s%s", ""), (500 * "a", ""), (388 * "b", "...")],
                          [("%d" + 509 * "c", "...")]], kept[:3])
        ended = self.run_tool("replay", "--to-scenario", self.file)
        self.assertEqual(1, ended.returncode)
        self.assertIn("# missing: all of the text, or the values that go with it, of PMX_Printf", ended.stdout)

    def interrupted(self, way):
        ended = subprocess.run([INTERRUPTED, way, self.file], check=True, timeout=60, stdout=subprocess.PIPE, text=True)
        return ended.stdout

    def events(self):
        return [json.loads(line) for line in self.run_tool("replay", "--json", self.file).stdout.splitlines()]

    def replays_equal(self, operations, **environment):
        ended = subprocess.run([CHECKED, "replay", self.file], capture_output=True, text=True, timeout=60, check=False,
                               env={**os.environ, **environment})
        self.assertEqual(0, ended.returncode, ended.stdout + ended.stderr)
        self.assertGreater(int(ended.stdout.split()[1]), operations)

    def test_another_context_enters_at_every_moment(self):
        self.interrupted("between")
        self.replays_equal(300)
        running, snapshots = set(), 0
        for event in self.events():
            if event["kind"] == "operation" and "answer" not in event:
                running.add((event["thread"], event["function"]))
            elif event["kind"] == "return":
                running.discard((event["thread"], event.get("function")))
            elif event["kind"] == "snapshot":
                self.assertEqual(set(), running, f"event {event['event']}: no snapshot while somebody is inside")
                snapshots += 1
        self.assertGreater(snapshots, 3)

    def test_no_snapshot_is_torn(self):
        self.interrupted("torn")
        kinds = [event["kind"] for event in self.events()]
        self.assertGreater(kinds.count("nothing"), 2)
        self.assertGreater(kinds.count("snapshot"), 2)
        self.replays_equal(20)

    def test_threads_come_in_the_recorded_order(self):
        for way, operations in (("turns", 400), ("between", 300)):
            self.interrupted(way)
            self.assertEqual({0, 1}, {event["thread"] for event in self.events()})
            for _ in range(3):
                self.replays_equal(operations, LD_PRELOAD=str(LATE), ASAN_OPTIONS="verify_asan_link_order=0")

    def test_two_planes_that_are_told_at_once(self):
        self.assertEqual("1 2, 0 mistaken\n", self.interrupted("planes"))

    def test_a_table_of_texts_that_is_full(self):
        self.interrupted("full")
        self.assertIn("it has a text that was not told", self.run_tool("replay", self.file).stdout)

    def test_a_table_that_is_null(self):
        recording = self.record("PMX_Init\nsource vdp0 connect\nPMX_InformVdpColorSpace 0\n")
        number, _ = recording.answer("i4ImQueryInterface")
        place = list(recording.events())[number][0]
        recording.words[place + (recording.words[place] & 0xFF) - 2] = 0
        ended = self.replay(recording.bytes())
        self.assertEqual(1, ended.returncode, ended.stderr)
        self.assertIn("computed: nothing: no table was handed out\n", ended.stdout)

    def test_a_null_pointer_that_an_operation_does_not_test(self):
        for name, given, place, parameter in (
                ("d_PMX_GetOrderVdpComp0", "0", 4, "pu4OnTop"), ("PMX_GetArbPlaneOrder", "0", 4, "pu4PlaneOrder"),
                ("PMX_GetSwapEnable", "0 1", 4, "pucEnable"),
                ("PMX_ChkSupportedRes", "0 RES_480P 60", 6, "ucSupportedAutoRes"),
                ("PMX_ChkSupportedRes", "0 RES_480P 60", 8, "ucSupportedAutoVsyncFreg")):
            with self.subTest(name, parameter=parameter):
                recording = self.record(f"PMX_Init\n{name} {given}\nPMX_SetBrightness 0 9 1\n")
                self.make_null(recording, name, place)
                ended = self.replay(recording.bytes())
                self.assertEqual(1, ended.returncode, ended.stderr)
                self.assertIn(f"recorded: end of {name} = 1\n", ended.stdout)
                self.assertIn(f"computed: a write behind {parameter}, which is null\n", ended.stdout)
                self.assertIn(f"{name} does not test {parameter} for null: its caller must", ended.stdout)

    def test_a_recording_that_ends_with_what_a_null_pointer_stopped(self):
        recording = self.record("PMX_Init\nd_PMX_GetOrderVdpComp0 0\n")
        place = self.make_null(recording, "d_PMX_GetOrderVdpComp0", 4)
        ended = self.replay(recording.of(self.unanswered(recording, place)).bytes())
        self.assertEqual(1, ended.returncode, ended.stderr)
        self.assertIn("recorded: nothing more\n", ended.stdout)
        self.assertIn("computed: a write behind pu4OnTop, which is null\n", ended.stdout)

    def test_a_null_pointer_behind_which_nothing_is_written(self):
        recording = self.record("PMX_Init\nPMX_GetSwapEnable 0 9\n")
        self.make_null(recording, "PMX_GetSwapEnable", 4)
        ended = self.replay(recording.bytes())
        self.assertEqual(0, ended.returncode, ended.stdout)

    def make_null(self, recording, name, place):
        """Of an output that is one word at most; where the operation begins."""
        began = recording.begin(name)[1][0]
        self.assertEqual(PRESENT, recording.words[began + place] & PRESENT)
        recording.words[began + place:began + place + 2] = [0]
        recording.words.insert(began + (recording.words[began] & 0xFF) - 1, 0)
        return began

    def test_what_another_thread_does_within_a_call_is_no_operation_to_be_explained(self):
        recording = self.record("PMX_Init\nmeanwhile as thread PMX_HalSetMode PMX_SetBrightness 0 9 1\n"
                                "PMX_SetMode 0 RES_720P50HZ 50 0\nPMX_ChkSupportedRes 0 RES_480P 60\n")
        self.assertGreater(len({event["thread"] for event in self.events()}), 1)
        _, place = recording.answer("fgPmxDrvGetAvdInfo", last=True)
        recording.words[place] = 0
        ended = self.replay(recording.bytes())
        self.assertEqual(1, ended.returncode, ended.stderr)
        self.assertIn(", in PMX_ChkSupportedRes: ", ended.stdout)
        self.assertRegex(ended.stdout, r"\nthe layer's reasons:\n  refused: PMX_ChkSupportedRes = 0\n  because ")

    def test_what_is_left_after_a_crash(self):
        for event in (2, 3, 50, 777, 2000, 30001):
            ended = subprocess.run([PRODUCT, self.file, str(event)], check=False, timeout=60)
            self.assertEqual(-signal.SIGKILL, ended.returncode)
            ended = self.run_tool("replay", self.file)
            self.assertEqual(0, ended.returncode, f"{event}: {ended.stdout}{ended.stderr}")

    def test_what_is_no_recording(self):
        content = self.record("PMX_Init\n").bytes()
        swapped = b"".join(content[i:i + 4][::-1] for i in range(0, len(content), 4))
        for changed, told in ((b"", "there is no recording in it"), (content[:60], "ends within its header"),
                              (content[:-4], "ends within its ring"), (swapped, "the other order of bytes"),
                              (content[:12] + b"\x01" + content[13:], "has version 1; this tool reads version 2"),
                              (content[:12] + b"\x07" + content[13:], "has version 7"),
                              (content[:16] + b"\x00" + content[17:], "another version of the layer's interface")):
            ended = self.replay(changed)
            self.assertEqual(2, ended.returncode, told)
            self.assertIn(told, ended.stderr)

    def test_headers_that_cannot_be(self):
        recording = self.record("PMX_Init\n")
        head = recording.words[HEAD]
        for word, value, told in (
                (POINTER_SIZE, 2, "was made where pointers have 2 bytes"),
                (EXPORTED_SIZE, recording.words[EXPORTED_SIZE] + 4, "another version of the layer's interface"),
                (STATE_SIZE, recording.words[STATE_SIZE] - 4, "another version of the layer's interface"),
                (RING_WORDS, recording.words[RING_WORDS] + 1, "ring has an impossible size"),
                (RING_WORDS, 1024, "ring has an impossible size"),
                (SNAPSHOT_COUNT, 0, "has no snapshot to begin with"),
                (FIRST_SNAPSHOT, head, "has no snapshot to begin with"),
                (FIRST_SNAPSHOT, head - recording.words[RING_WORDS] - 1, "has no snapshot to begin with"),
                (FIRST_SNAPSHOT, list(recording.events())[1][0] - HEADER_WORDS, "has no snapshot where it says")):
            changed = Recording(recording.bytes())
            changed.words[word] = value & 0xFFFFFFFF
            ended = self.replay(changed.bytes())
            self.assertEqual((2, ""), (ended.returncode, ended.stdout), told)
            self.assertIn(told, ended.stderr)

    def test_events_that_cannot_be(self):
        recording = self.record("PMX_Init\n")
        for kind, function, words, told in (
                (OPERATION, 255, 3, "no such operation"), (OPERATION, 0, 2, "it is too short"),
                (CALL, 255, 3, "no such function"), (CALL, 0, 2, "it is too short"), (RETURN, 0, 3, "it is too short"),
                (CHANGE, 0, 3, "it is no state"), (SNAPSHOT, 0, 3, "it is no state"),
                (9, 0, 3, "no such kind of event"), (CHANGE, 0, 1, "it has an impossible length"),
                (CHANGE, 0, 255, "it has an impossible length")):
            event = [function << 16 | kind << 8 | words, *(min(words, 9) - 1) * [0]]
            ended = self.replay(recording.of(event).bytes())
            self.assertEqual((2, ""), (ended.returncode, ended.stdout), told)
            self.assertIn(f": event 2 is damaged: {told}\n", ended.stderr)

    def test_what_an_event_lacks_is_nothing(self):
        recording = self.record("PMX_Init\n")
        numbers = [function.name for function in interface.operations()]
        shown = []
        for name, *words in (("PMX_SetModeEx",), ("PMX_SetModeEx", 0, 0xFFFFFFFF), ("PMX_Printf", 0),
                             ("PMX_Printf", 0, 0x80000009)):
            event = [numbers.index(name) << 16 | OPERATION << 8 | 3 + len(words), 0, 0, *words]
            self.file.write_bytes(recording.of(event).bytes())
            shown.append(self.run_tool("replay", "--show", self.file).stdout.splitlines()[-1].split("\t")[-1])
            self.assertIn(self.run_tool("replay", self.file).returncode, (0, 1))
        self.assertEqual(["PMX_SetModeEx(0, null, 0, DRV_NON_EXT_CHIP, 0)",
                          "PMX_SetModeEx(0, [], 0, DRV_NON_EXT_CHIP, 0)", "PMX_Printf(0, null)", 'PMX_Printf(0, "")'],
                         shown)

    def test_pointers_are_shown_by_what_is_known_of_them(self):
        recording = self.record("PMX_Init\nsource vdp0 connect\nPMX_InformVdpColorSpace 0\nPMX_Printf 0 \"\"\n")
        self.assertEqual(0, self.replay(recording.bytes()).returncode)
        shown = self.run_tool("replay", "--show", self.file).stdout
        for text in ("register_pm_ops(pmx_pm_ops)", "IID_IVdp, <place>, <place>)", 'PMX_Printf(0, ""...)'):
            self.assertIn(text, shown)
        symbol, (_, query) = recording.begin("register_pm_ops")[1][0], recording.begin("i4ImQueryInterface")
        for word, text in ((0, "null"), (9, "<elsewhere>")):
            recording.words[symbol + 3] = word
            recording.words[query[0] + 6] = word
            self.file.write_bytes(recording.bytes())
            shown = self.run_tool("replay", "--show", self.file).stdout
            self.assertIn(f"register_pm_ops({text})", shown)
            self.assertIn(f"IID_IVdp, {'<place>' if word else 'null'}, <place>)", shown)

    def test_an_end_without_a_beginning(self):
        recording = self.record("PMX_Init\n")
        self.file.write_bytes(recording.of([RETURN << 8 | 4, 0, 7, 0xFFFFFFF0]).bytes())
        self.assertTrue(self.run_tool("replay", "--show", self.file).stdout.endswith("\tend of something before\n"))
        end = self.events()[-1]
        self.assertEqual(("return", 0), (end["kind"], end["depth"]))
        self.assertNotIn("answer", end)
        ended = self.run_tool("replay", self.file)
        self.assertIn("  recorded: end of something before\n  computed: nothing: no operation runs\n", ended.stdout)

    def test_what_contradicts_itself_departs_there(self):
        recording = self.record(MODE_CHANGE + "PMX_GetMode 0\n")
        began = len(recording.event(next(recording.events())[0]))
        numbers = [function.name for function in interface.operations()]
        init = [head for head, *_ in (recording.event(event[0]) for event in recording.events()
                                      if event[1:] == (OPERATION, False, numbers.index("PMX_Init")))][0]
        place = recording.begin("x_sema_create")[1][0]
        asked = self.unanswered(recording, place)
        first = [init, 0, 0]
        answered = [init | ANSWERED << 8, 0, 0]
        mode = [numbers.index("PMX_GetMode") << 16 | OPERATION << 8 | 5, 0, 0, 0, 0]
        for events, recorded, computed, why in (
                ([first, [RETURN << 8 | 4, 0, 0, began]], "end of PMX_Init", None, "another call"),
                ([answered], "end of PMX_Init", None, "another call"),
                ([first, first], "PMX_Init()", None, "another call"),
                ([mode, asked], None, "end of PMX_GetMode = 0", "the operation ends too early")):
            ended = self.replay(recording.of(*events).bytes())
            self.assertEqual(1, ended.returncode, ended.stderr)
            self.assertIn(f": {why}\n", ended.stdout)
            self.assertIn(f"  recorded: {recorded}\n" if recorded else "  recorded: ", ended.stdout)
            self.assertIn(f"  computed: {computed}\n" if computed else "  computed: ", ended.stdout)

    def test_a_call_that_does_not_return(self):
        recording = self.record(MODE_CHANGE)
        events = list(recording.events())
        number, (place, *_) = recording.begin("x_sema_create")
        before = [recording.event(event[0]) for event in events[1:number]]
        asked = self.unanswered(recording, place)
        for next_one in (asked, [RETURN << 8 | 4, 0, 0, 0xFFFFFFF0]):
            ended = self.replay(recording.of(*before, asked, next_one).bytes())
            self.assertEqual(1, ended.returncode, ended.stderr)
            self.assertIn(f"departs at event {number + 2} of {number + 2}", ended.stdout)
            self.assertIn("computed: nothing: x_sema_create has not returned\n", ended.stdout)
        longer = [recording.words[place] + 1, *recording.event(place)[1:], 0]
        ended = self.replay(recording.of(*before, longer).bytes())
        self.assertIn("PMX_Init: other arguments\n", ended.stdout)

    def test_a_value_too_many_is_shown(self):
        recording = self.record("PMX_Init\n")
        began = recording.event(list(recording.events())[1][0])
        head, *words = recording.event(recording.begin("PMX_IsLog")[1][0])
        self.file.write_bytes(recording.of(began, [head + 1, *words, 7]).bytes())
        shown = self.run_tool("replay", "--show", self.file).stdout
        self.assertTrue(shown.endswith('  PMX_IsLog(1, "PMX_Init\\n", 0x7)\n'), shown)

    def test_a_recorder_that_there_cannot_be_is_refused(self):
        self.assertEqual(0, subprocess.run([PRODUCT, "refused", "-"], check=False, timeout=60).returncode)

    def test_another_record_departs_there(self):
        recording = self.record("PMX_Init\n")
        snapshot = recording.event(next(recording.events())[0])
        again = recording.of(snapshot)
        self.assertEqual(0, self.replay(again.bytes()).returncode)
        for word, field in ((2, r"\w+"), (len(snapshot) - 20, r"_arPmxConf\.ar\w+\[\d\]\.[\w.]+")):
            again.words[HEADER_WORDS + len(snapshot) + word] ^= 1
            ended = self.replay(again.bytes())
            again.words[HEADER_WORDS + len(snapshot) + word] ^= 1
            self.assertEqual(1, ended.returncode, ended.stderr)
            self.assertRegex(ended.stdout, r"^departs at event 2 of 2")
            self.assertRegex(ended.stdout, r"(?m)^  computed: another record$")
            self.assertRegex(ended.stdout, rf": {field}: \w+ was recorded, \w+ computed\b")

    def test_what_stands_before_damage_is_replayed(self):
        recording = self.record(MODE_CHANGE)
        events = list(recording.events())
        recording.words[HEAD] += 7  # a place that was taken, and not filled
        ended = self.replay(recording.bytes())
        self.assertEqual(0, ended.returncode, ended.stderr)
        damage = f"event {len(events) + 1} is damaged: it has an impossible length; nothing behind it is read"
        self.assertRegex(ended.stdout, rf"^{damage}\nequal: 3 operations, [1-9]\d* calls\n$")
        shown = self.run_tool("replay", "--show", self.file)
        self.assertEqual(len(events), len(shown.stdout.splitlines()))
        self.assertIn(damage, shown.stderr)
        recording.words[events[len(events) // 2][0]] = 0
        self.file.write_bytes(recording.bytes())
        shown = self.run_tool("replay", "--show", self.file)
        self.assertEqual(len(events) // 2, len(shown.stdout.splitlines()))
        recording.words[events[1][0]] = 0
        ended = self.replay(recording.bytes())
        self.assertEqual(2, ended.returncode)
        self.assertIn("event 2 is damaged", ended.stderr)

    def test_damage_does_no_harm(self):
        recording = self.record(MODE_CHANGE)
        draw = random.Random(7)
        ends, damaged = set(), 0
        for _ in range(25):
            words = list(recording.words)
            for _ in range(draw.randint(1, 4)):
                at = draw.randrange(HEADER_WORDS + recording.words[HEAD])
                words[at] = draw.choice((0, 0xFFFFFFFF, words[at] ^ 1 << draw.randrange(32), draw.getrandbits(32)))
            ended = self.replay(struct.pack(f"<{len(words)}I", *words))
            self.assertIn(ended.returncode, (0, 1, 2), f"{ended.returncode}: {ended.stderr}")
            self.assertEqual(ended.returncode == 2, ended.stderr.startswith("pmxboard: "), ended.stderr)
            ends.add(ended.returncode)
            damaged += "is damaged: " in ended.stdout
        self.assertIn(1, ends)
        self.assertGreater(damaged, 0)


if __name__ == "__main__":
    CHECKED, OPTIMISED, PRODUCT, INTERRUPTED, LATE = (pathlib.Path(sys.argv.pop(1)).resolve() for _ in range(5))
    unittest.main()
