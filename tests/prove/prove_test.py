#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The layer as C is the layer; each fault can be planted; what the checker says is read; and the page about it tells
what is presumed. The proof itself needs the checker, and is ./dev prove."""

import contextlib
import dataclasses
import fcntl
import io
import os
import pathlib
import re
import shutil
import subprocess
import sys
import tempfile
import types
import unittest
import unittest.mock

sys.dont_write_bytecode = True

import checker  # noqa: E402
import harness  # noqa: E402
import pointers  # noqa: E402
import promises  # noqa: E402
import prove  # noqa: E402
import same  # noqa: E402
import verdicts  # noqa: E402
import view  # noqa: E402

PAGE = (prove.ROOT / "docs/proof.md").read_text(encoding="utf-8")
REACHED = "".join(f"[{world}_x.assertion.1] line 9 {harness.REACHED}: FAILURE\n" for world in harness.WORLDS)


def read(text):
    return view.as_c(text, {"arPortInfo": "PMX_PORT_NUM"})


class View(unittest.TestCase):
    def changed(self, name, before, after):
        """What is told of a source in whose view that stands instead."""
        path = self.folder / f"{name}.c"
        text = path.read_text(encoding="utf-8")
        self.assertEqual(1, text.count(before), before)
        path.write_text(text.replace(before, after), encoding="utf-8")
        with unittest.mock.patch.object(view, "sources", lambda root: [root / view.LAYER / f"{name}.cpp"]):
            return view.disagreements(view.ROOT, self.folder)[1]

    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = pathlib.Path(folder.name)
        view.write(view.ROOT, self.folder)

    def test_it_compiles_to_the_layers_own_code(self):
        number, different = view.disagreements(view.ROOT, self.folder)
        self.assertEqual([], different)
        self.assertGreater(number, 126)

    def test_another_statement_is_noticed(self):
        self.assertEqual(["i4Pmx_Connect"], self.changed("pmx_port", "fgConnected = TRUE", "fgConnected = FALSE"))

    def test_members_of_a_table_that_change_places_are_noticed(self):
        self.assertEqual(["pmx_pm_ops"], self.changed("pmx_if", "= i4PMX_Suspend,", "= i4PMX_Resume,"))

    def test_a_sign_is_noticed_where_the_code_is_the_same(self):
        was, signed = "- (UINT32)pi4PlnDelay", "- pi4PlnDelay"
        self.assertEqual(["PMX_SetArbPlaneOrder"], self.changed("pmx_arb_order", was, signed))
        with unittest.mock.patch.object(view, "TRAPS", []):
            self.assertEqual([], self.changed("pmx_arb_order", signed, signed))

    def test_each_index_into_a_record_states_its_bound(self):
        self.assertEqual("x->arPortInfo[PMX_WITHIN(a[b + 1], PMX_PORT_NUM)].fgEnabled",
                         read("x->arPortInfo[a[b + 1]].fgEnabled"))
        self.assertEqual("f() { P* p = x->arPortInfo;\n p[PMX_WITHIN(i, PMX_PORT_NUM)];\n}\np[i];",
                         read("f() { P* p = x->arPortInfo;\n p[i];\n}\np[i];"))
        self.assertEqual("f() { P* p = x->arPortInfo;\n return p[PMX_WITHIN(i, PMX_PORT_NUM)];\n}\n",
                         read("f() { P* p = x->arPortInfo;\n return p[i];\n}\n"))
        self.assertEqual('"x.arPortInfo[%d]"', read('"x.arPortInfo[%d]"'))
        self.assertEqual({"aucPlaneOrder", "arPortInfo", "arOutputConf"}, view.member_arrays(view.ROOT).keys())

    def test_what_cannot_be_guarded_is_refused(self):
        for text in ("memcpy(x->arPortInfo, y, 9);", "*(x.arPortInfo + 9) = y;", "f(y, x->arPortInfo);",
                     "x->arPortInfo[i++].fgEnabled", "x->arPortInfo[f(i)].fgEnabled", "x->arPortInfo[i = 3].fgEnabled"):
            with self.subTest(text), self.assertRaises(view.Failed):
                read(text)


class Promises(unittest.TestCase):
    def setUp(self):
        self.functions = {function.name: function for function in harness.operations(harness.ROOT)}

    def of(self, name):
        return promises.of_result(self.functions[name], set())

    def told(self, result):
        function = dataclasses.replace(self.functions["PMX_GetGamma"], contract=f"Read.\n@return {result}")
        return promises.of_result(function, set())

    def test_they_are_read_from_the_contracts(self):
        self.assertEqual((["ucPmxId != 0", "pucGamma == 0", promises.LACKS.format(20)],
                          [("!refused[0] || result == 0", "0: a mixer id other than 0"),
                           ("!refused[1] || result == 0", "0: a null pointer"),
                           ("!refused[2] || result == 0", "0: capability bit 20 is clear"),
                           ("refused[0] || refused[1] || refused[2] || result == 1", "1: all else")]),
                         self.of("PMX_GetGamma"))
        self.assertEqual(([], [("result == 1", "1: all else")]), self.of("PMX_SetOsdEnable"))
        self.assertIn(("!refused[0] || result == 0", "0: a tag whose low 8 bits are not 0"), self.of("i4PmxSetMode")[1])
        self.assertIn((f"!({promises.HDMI_REFUSES}) || result == 0", "0: the HDMI/AV driver refuses it"),
                      self.of("PMX_SetAspectRatio")[1])
        self.assertEqual("result == PMX_NO_SUCH_PORT", promises.refusal_of(self.functions["i4Pmx_Connect"], set()))
        self.assertEqual("", promises.refusal_of(self.functions["PMX_SetOsdEnable"], set()))

    def test_words_that_nobody_understands_are_refused(self):
        self.assertEqual(["ucPmxId != 0"], self.told("1; 0 for a mixer id other than 0, and then it rains")[0])
        for result in ("a number", "1; 0 for a blue moon", "1; sometimes 0", "1 on Mondays; 0 for a null pointer",
                       "1; 0 for a plane without a port"):
            with self.subTest(result), self.assertRaises(promises.Unclear):
                self.told(result)

    def test_who_stores_nothing_says_so(self):
        nothing = {name for name, function in self.functions.items()
                   if promises.stores_nothing(function, self.functions)}
        self.assertLessEqual({"PMX_GetCap", "i4PmxGetMode", "PMX_QueryStatus", "PMX_SetMediaType", "i4PMX_Suspend",
                              "PMX_Printf", "i4PmxOsdEnabled", "PMX_CheckCap"}, nothing)
        self.assertFalse({"d_PMX_Set2DSmooth", "PMX_SetMode", "PMX_SetDelay", "PMX_SetForceMode"} & nothing)

    def test_who_may_sleep_says_so(self):
        for context in ("a thread that may sleep; takes no lock", "any thread that may sleep",
                        "the framework's thread, with no other mixer call running; sleeps"):
            self.assertTrue(promises.may_sleep(context))
        for context in ("any thread; takes no lock", "the timer's", "any thread, and the timer's; any time", "any"):
            self.assertFalse(promises.may_sleep(context))

    def test_whatever_is_named_is_an_operation(self):
        for names in (promises.STORED_ALL_THE_SAME, promises.OTHER_WORDS, promises.UNSAID, promises.NOTHING_DONE,
                      harness.PRESUMED, harness.ALSO, harness.CALLED_BY, harness.FORGETS_THE_TIMER):
            self.assertLessEqual(set(names), self.functions.keys())

    def test_what_is_handed_over_is_looked_at_where_it_is_written(self):
        text = harness.stand_ins(harness.ROOT)
        for name, (condition, what) in harness.HANDED.items():
            self.assertIn(f'CLAIM({condition}, "{name}: {what}");', text)
        self.assertIn('CLAIM(!mind.mayNotSleep, "x_thread_delay: called where it may sleep");', text)
        self.assertNotIn('"PMX_IsLog: called where it may sleep"', text)

    def test_each_symbol_is_compared_with_what_it_names(self):
        by_hand = {"x_timer_start", "i4ImQueryInterface"}
        callbacks = harness.callback_types(harness.ROOT)
        for header in harness.PLATFORM_HEADERS:
            for function in harness.functions(harness.ROOT / header):
                if any(pointers.pointer_of(function, type_name, name, callbacks).kind == "symbol"
                       for type_name, name in pointers.declared_parameters(function)
                       if pointers.is_pointer(type_name, callbacks)):
                    self.assertIn(function.name, harness.HANDED.keys() | by_hand)

    def test_every_operation_is_called_in_every_world(self):
        text = harness.text(harness.ROOT)
        for name in self.functions:
            for world in harness.WORLDS:
                self.assertEqual(1, text.count(f"void {world}_{name}(void)"), name)


class Same(unittest.TestCase):
    def test_texts_are_objects_by_their_contents(self):
        texts = same.Texts()
        self.assertEqual(texts.name('"a%d"'), texts.name('"a"\n   "%d"'))
        self.assertNotEqual(texts.name('"a"'), texts.name('"b"'))
        self.assertEqual(3, texts.defined().count("[1];"))

    def test_calls_with_values_are_told_by_their_number(self):
        known = set()
        text = 'void Log(int, const char*, ...); f() { Log(0, x); Log(1, y[a, b], g(c, d), e); }'
        self.assertEqual("void Log(int, const char*, ...); f() { Log_0(0, x); "
                         "Log_2(1, y[a, b], (__SIZE_TYPE__)(g(c, d)), (__SIZE_TYPE__)(e)); }",
                         same.by_number_of_values(text, "Log", 2, known))
        self.assertEqual({("Log", 0), ("Log", 2)}, known)

    def test_what_can_be_touched_is_read_from_the_text(self):
        every = same.leaves(view.ROOT)
        self.assertEqual(len(every), len({leaf.place for leaf in every}))

        def touched(text):
            return {leaf.place for leaf in same.mentioned(every, text)}

        self.assertEqual({"_arPmxConf[0].ucMode", "MutexPMX"}, touched("const PMX_CONF_T* p; p->ucMode = MutexPMX;"))
        self.assertEqual(8, len(touched("p->arPortInfo[i].fgConnected = 1;")))
        self.assertEqual(8 * 9, len(touched("x = p->arPortInfo[i];")))
        self.assertEqual(8 * 9, len(touched("memcpy(a, prPort, 3); p->arPortInfo[i].fgEnabled;")))
        for text in ("memcpy(prConf, &_arPmxConfDefault, 9);", "PMX_CONF_T rConf;", "*prPmxConf() = x;"):
            self.assertEqual(len(every), len(touched(text)))

    def test_what_the_checker_says_is_taken_apart(self):
        ends = "".join(f"[end.assertion.{i}] line 9 {harness.REACHED}: FAILURE\n" for i in range(2))
        said = same.Said(whole(f"[end.assertion.7] line 8 {same.SAME}result: FAILURE\n{ends}"))
        self.assertEqual(({"end.assertion.7": "same: result"}, [], []), (said.different, said.odd, said.undefined))
        self.assertTrue(said.is_reached(True))
        self.assertFalse(said.is_reached(False))
        self.assertEqual(["f: division by zero in a / b"],
                         same.Said(whole(f"[f.1] line 2 division by zero in a / b: FAILURE\n{ends}")).undefined)
        self.assertEqual(["the checker did not come to its end"], same.Said(ends).odd)
        for text in (f"[called.1] line 2 {same.ROOM}: FAILURE",
                     "[f.unwind.0] line 3 unwinding assertion loop 0: FAILURE",
                     "[f.1] line 2 division by zero: UNKNOWN", "no body for function f", "killed"):
            self.assertEqual(1, len(same.Said(whole(f"{text}\n")).odd), text)

    def test_code_is_the_same_when_all_that_it_rests_on_is(self):
        with tempfile.TemporaryDirectory() as directory:
            today = same.Today(None, pathlib.Path(directory))
            tree = prove.planted({"file": "pmx_handshake.cpp", "from": "PMX_SetOsdEnableFlag(FALSE);",
                                  "to": "PMX_SetOsdEnableFlag(TRUE);"}, pathlib.Path(directory) / "tree")
            pair = today.pair(tree, "planted")
            for name, is_same in (("PMX_SetOsdEnable", False), ("_PMX_TmrIsr", False), ("PMX_SetModeEx", False),
                                  ("PMX_SetOsdEnableFlag", True), ("PMX_SetEnable", True)):
                self.assertEqual(is_same, pair.same_code(name), name)
            self.assertEqual([], pair.different_tables())
            path = tree / view.LAYER / "pmx_lifecycle.cpp"
            text = path.read_text(encoding="utf-8")
            path.write_text(f"{text}\nUINT32 u4Secret = 0;\n", encoding="utf-8")
            with self.assertRaisesRegex(same.Unlike, "u4Secret"):
                today.pair(tree, "secret")
            path.write_text(text, encoding="utf-8")
            path = tree / view.LAYER / "pmx_if.cpp"
            text = path.read_text(encoding="utf-8")
            swapped = text.replace(".pi4OsdDisabled = i4PmxOsdDisabled", ".pi4OsdDisabled = i4PmxVdpDisabled")
            path.write_text(swapped, encoding="utf-8")
            self.assertEqual(["_rPMXIF"], today.pair(tree, "swapped").different_tables())

    def test_the_first_call_is_told_although_the_end_differs_too(self):
        at_a_call, at_the_end = f"{same.AT_A_CALL}what is kept", f"{same.SAME}result"
        late = subprocess.TimeoutExpired("cbmc", 1)

        def first(told, *said):
            pair = same.Pair.__new__(same.Pair)
            with unittest.mock.patch.object(pair, "_told", create=True, side_effect=told), \
                    unittest.mock.patch.object(pair, "_said", create=True, side_effect=said):
                return pair._first("f", "NOBODY", "program", types.SimpleNamespace(
                    different={"end.1": at_a_call, "end.2": at_the_end}))

        end_alone = ("program", types.SimpleNamespace(different={"end.2": at_the_end}))
        both = ("program", types.SimpleNamespace(different={"end.1": at_a_call, "end.2": at_the_end}))
        self.assertEqual(["call 5"], first([(["call 5"], 4), (["at the end: result"], 0)], end_alone))
        self.assertEqual(["call 3"], first([(["call 5"], 4), (["call 3"], 2)], both, end_alone))
        self.assertEqual(["call 5"], first([(["call 5"], 4)], late))
        self.assertEqual(["at a call, what is kept; result"], first([late]))

    def test_what_is_gone_is_told(self):
        with tempfile.TemporaryDirectory() as directory:
            tree = pathlib.Path(directory)
            shutil.copytree(view.ROOT / "src", tree / "src")
            for name, change in ((same.LAYER_HEADER, lambda text: text.replace("PMX_GetGamma(", "PMX_GetGone(")),
                                 (harness.OBJECT_HEADERS[0], lambda text: f"{text}\nextern const UINT32 u4Gone;\n")):
                text = (tree / name).read_text(encoding="utf-8")
                self.assertNotEqual(text, change(text))
                (tree / name).write_text(change(text), encoding="utf-8")
            pair = same.Pair.__new__(same.Pair)
            pair.old = types.SimpleNamespace(root=tree, code={"u4Gone": ["00"]})
            pair.new = types.SimpleNamespace(root=view.ROOT, code={})
            self.assertEqual(["u4Gone"], pair.different_tables())
            self.assertEqual({"PMX_GetGamma": "there was none", "PMX_GetGone": "there is none any more"},
                             same.unlike(pair))
            pair.same_code = lambda name: True
            for names, told in ((same.declared(view.ROOT), {"PMX_GetGamma", "PMX_GetGone"}), (["PMX_GetMode"], set())):
                ktap = unittest.mock.Mock()
                pool = unittest.mock.Mock()
                pool.submit.return_value.result.return_value = same.Found("code")
                with contextlib.redirect_stdout(io.StringIO()):
                    same.compare(ktap, pool, pair, names)
                wrong = {call.args[0] for call in ktap.verdict.call_args_list if call.args[1]}
                self.assertEqual({"tables and first values", *told}, wrong)

    def test_each_refactoring_can_be_planted_and_belongs_to_an_operation(self):
        names = {function.name for function in harness.operations(harness.ROOT)}
        for change in prove.refactorings():
            self.assertTrue(prove.faulty(change))
            self.assertIn(change["operation"], names)


def whole(text):
    """What the checker says, with its sum."""
    lines = [line for line in text.splitlines() if verdicts.CHECKED.match(line)]
    failed = sum(line.endswith("FAILURE") for line in lines)
    return f"{text}\n** {failed} of {len(lines)} failed (2 iterations)\nVERIFICATION FAILED\n"


class Verdicts(unittest.TestCase):
    def test_an_output_that_lacks_something_is_wrong(self):
        text = whole(f"[f.1] line 7 division by zero: SUCCESS\n{REACHED}")
        self.assertEqual([], verdicts.Verdict(text).wrong)
        for cut in (text.partition("**")[0], text.replace("VERIFICATION FAILED", "")):
            self.assertEqual(["the checker did not come to its end"], verdicts.Verdict(cut).wrong)
        for odd in (text.replace("zero: SUCCESS", "zero: VANISHED"), text.replace("[f.1] line 7 division", "")):
            self.assertEqual(["3 of 3 checks failed by its lines, 3 of 4 by its sum"], verdicts.Verdict(odd).wrong)
        self.assertEqual(1, len(verdicts.Verdict(text.replace("3 of 4", "4 of 4")).wrong))

    def test_what_does_not_hold_is_told_with_its_place(self):
        verdict = verdicts.Verdict(whole("src/x.cpp function f\n[f.1] line 7 division by zero: SUCCESS\n"
                                         f"[f.2] line 8 array 'a' upper bound in a[i]: FAILURE\n{REACHED}"))
        self.assertEqual((2, ["src/x.cpp:8: array 'a' upper bound in a[i]: FAILURE"]), (verdict.number, verdict.wrong))
        self.assertEqual([], verdicts.Verdict(whole(REACHED)).wrong)

    def test_what_proves_nothing_is_wrong(self):
        self.assertEqual(["nothing was proved: killed"], verdicts.Verdict("", complaint="killed").wrong)
        for text in (REACHED.replace("FAILURE", "SUCCESS", 1), REACHED.partition("\n")[2]):
            self.assertEqual(["an end is not reached: what is presumed cannot be"], verdicts.Verdict(whole(text)).wrong)
        without_body = whole(f"no body for function f\n{REACHED}")
        self.assertEqual(["no body for function f"], verdicts.Verdict(without_body).wrong)

    def test_each_check_is_asked_for_by_its_name(self):
        for name in ("bounds", "pointer", "div-by-zero", "signed-overflow", "undefined-shift"):
            self.assertIn(f"--{name}-check", verdicts.OPTIONS)
        self.assertIn("--unwinding-assertions", verdicts.OPTIONS)
        checker.hold_known("6.7.1-1 1.2")
        for version in ("5.95.1-1", "7.0.0-1", ""):
            with self.subTest(version), self.assertRaises(checker.Unavailable):
                checker.hold_known(version)

    def test_a_checker_that_is_not_whole_is_fetched_once_more(self):
        def fetch(folder, programs=checker.PROGRAMS):
            fetched.append(folder)
            for name in programs:
                path = folder / "unpacked" / name
                path.parent.mkdir(parents=True, exist_ok=True)
                path.touch()
            return "6.6.0-4"

        fetched = []
        with tempfile.TemporaryDirectory() as directory, unittest.mock.patch.object(checker, "_fetch", fetch):
            cache = pathlib.Path(directory)
            checker.Checker(cache)
            checker.Checker(cache)
            self.assertEqual(1, len(fetched))
            (cache / "unpacked/usr/bin/cbmc").unlink()
            checker.Checker(cache)
            self.assertEqual(2, len(fetched))
            (cache / "unpacked/usr/bin/cbmc").unlink()
            with unittest.mock.patch.object(checker, "_fetch", lambda folder: fetch(folder, ())):
                with self.assertRaisesRegex(checker.Unavailable, "has no usr/bin/cbmc"):
                    checker.Checker(cache)
            self.assertEqual(3, len(fetched))
            checker.Checker(cache)  # what was not whole is not taken for whole by the next
            self.assertEqual(4, len(fetched))

    def test_a_checker_that_another_tree_mends_is_left_to_it(self):
        def fetch(folder):
            for name in checker.PROGRAMS:
                path = folder / "unpacked" / name
                path.parent.mkdir(parents=True, exist_ok=True)
                path.touch()
            return "6.6.0-4"

        def mended_while_it_is_looked_at(folder):
            found = lacks(folder)
            with open(folder / "lock", "w", encoding="utf-8") as lock:  # nobody else could mend it now
                with self.assertRaises(BlockingIOError) if found else contextlib.nullcontext():
                    fcntl.flock(lock, fcntl.LOCK_EX | fcntl.LOCK_NB)
            return found

        lacks = checker.lacks
        with tempfile.TemporaryDirectory() as directory, unittest.mock.patch.object(checker, "_fetch", fetch):
            cache = pathlib.Path(directory)
            checker.Checker(cache)
            (cache / "unpacked/usr/bin/cbmc").unlink()
            with unittest.mock.patch.object(checker, "lacks", mended_while_it_is_looked_at):
                checker.Checker(cache)

    def test_what_judges_is_part_of_what_was_proved(self):
        self.assertLessEqual({pathlib.Path(module.__file__).resolve() for module in
                              (prove, verdicts, checker, harness)}, set(verdicts.JUDGES))
        with tempfile.TemporaryDirectory() as directory:
            judge = pathlib.Path(directory) / "judge.py"
            keys = set()
            for version, texts, judged in (("1", ["a"], "x"), ("2", ["a"], "x"), ("1", ["b"], "x"), ("1", ["a"], "y")):
                judge.write_text(judged, encoding="utf-8")
                keys.add(verdicts.key(version, texts, [judge]))
                self.assertIn(verdicts.key(version, texts, [judge]), keys)
            self.assertEqual(4, len(keys))

    def test_what_was_proved_is_kept_for_the_same_text_alone(self):
        with tempfile.TemporaryDirectory() as directory:
            folder = pathlib.Path(directory)
            prove.Results(folder, "one").keep("f", 7)
            self.assertEqual(7, prove.Results(folder, "one").get("f"))
            self.assertIsNone(prove.Results(folder, "one").get("g"))
            self.assertIsNone(prove.Results(folder, "two").get("f"))
            self.assertEqual(7, prove.Results(folder, "one").get("f"))
            (folder / "one/f").write_text("", encoding="utf-8")
            self.assertIsNone(prove.Results(folder, "one").get("f"))

    def test_the_oldest_results_go_and_whoever_uses_them_goes_on(self):
        with tempfile.TemporaryDirectory() as directory:
            folder = pathlib.Path(directory)
            first = prove.Results(folder, "0")
            for number in range(prove.KEPT + 1):
                prove.Results(folder, str(number))
                os.utime(folder / str(number), (number, number))
            prove.Results(folder, str(prove.KEPT))
            self.assertEqual([str(number + 1) for number in range(prove.KEPT)], sorted(os.listdir(folder)))
            first.keep("f", 7)
            self.assertEqual(7, first.get("f"))


    def test_results_that_another_tree_deletes_meanwhile_are_no_error(self):
        def write_text(path, text, **how):
            deleted.append(path)
            if len(deleted) == 1:
                shutil.rmtree(path.parent)
            return written(path, text, **how)

        deleted, written = [], pathlib.Path.write_text
        with tempfile.TemporaryDirectory() as directory:
            folder = pathlib.Path(directory)
            results = prove.Results(folder, "one")
            with unittest.mock.patch.object(pathlib.Path, "write_text", write_text):
                results.keep("f", 7)
            self.assertEqual((7, 2), (results.get("f"), len(deleted)))
            there = [folder / "gone", folder / "one"]
            with unittest.mock.patch.object(pathlib.Path, "iterdir", lambda _: iter(there)):
                prove.Results(folder, "one")
            self.assertEqual(7, results.get("f"))


class Faults(unittest.TestCase):
    def seen(self, text, **words):
        verdict = verdicts.Verdict(whole(f"src/x.cpp function f\n{text}{REACHED}"))
        return prove.seen_as({"seen": "division by zero", **words}, verdict)

    def test_one_is_seen_in_what_was_refuted_alone(self):
        refuted = "[f.1] line 7 division by zero in a / b: FAILURE\n"
        self.assertEqual("src/x.cpp:7: division by zero in a / b", self.seen(refuted))
        self.assertEqual("src/x.cpp:7: division by zero in a / b", self.seen(refuted, at="x.cpp"))
        self.assertEqual("", self.seen(refuted, at="y.cpp"))
        self.assertEqual("", self.seen(refuted, seen="x.cpp"))
        self.assertEqual("", self.seen("[f.1] line 7 division by zero in a / b: UNKNOWN\n"))
        died = verdicts.Verdict("", complaint="division by zero: FAILURE")
        self.assertEqual("", prove.seen_as({"seen": "division by zero"}, died))

    def test_each_can_be_planted_and_belongs_to_an_operation(self):
        names = {function.name for function in harness.operations(harness.ROOT)}
        faults = prove.all_faults()
        self.assertEqual(len(faults), len({(fault["file"], fault["from"], fault["to"]) for fault in faults}))
        for fault in faults:
            with self.subTest(fault["what"]):
                self.assertNotEqual(prove.faulty(fault), (view.ROOT / view.LAYER / fault["file"]).read_text("utf-8"))
                self.assertIn(fault["operation"], names)

    def test_a_sample_has_some_of_each_world_and_others_in_each_turn(self):
        numbers = {"NOBODY": 31, "ANYBODY": 3, "HANDSHAKE": 11}
        faults = [{"what": number, "world": world} for world in harness.WORLDS for number in range(numbers[world])]
        for number, shares in ((8, (4, 2, 2)), (20, (12, 3, 5)), (len(faults), (31, 3, 11)), (1, (1, 0, 0))):
            seen = []
            for turn in range(31):
                chosen = prove.sample(faults, number, turn)
                self.assertEqual(len(chosen), len({(fault["world"], fault["what"]) for fault in chosen}))
                for world, share in zip(harness.WORLDS, shares):
                    self.assertEqual(share, len([fault for fault in chosen if fault["world"] == world]))
                seen += [fault for fault in chosen if fault not in seen]
            self.assertEqual(31 if number == 1 else len(faults), len(seen))
        self.assertEqual([{"what": 1}], prove.sample([{"what": 1}], 8, 3))

    def test_each_claim_has_one(self):
        seen = [fault["seen"] for fault in prove.all_faults()]
        by_hand = re.findall(r'CLAIM\([^"]*"([^"]*)"\)', (prove.HERE / "surroundings.c").read_text(encoding="utf-8"))
        of_the_checker = ("upper bound", "pointer NULL in", "pointer outside object bounds", "arithmetic overflow",
                          "shift distance too large", "shift distance is negative", "unwinding assertion",
                          "source region readable", "index within the array of a record")
        of_contracts = ("can be read", "can be written", "has a meaning", "called where it may sleep", "takes no lock",
                        "a refusal leaves", "it leaves", "what is given stays", "flags stay in their ranges",
                        "refused, ", "the layer knows its timer", "0: a mixer id", "0: a null pointer",
                        "0: capability bit", "0: a tag", "PMX_NO_SUCH_PORT: ", "1: all else")
        more = [condition for conditions in harness.ALSO.values() for condition in conditions]
        handed = [f"{name}: {what}" for name, (_, what) in harness.HANDED.items() if not name.startswith("unregister")]
        for words in (*by_hand, *of_the_checker, *of_contracts, *more, *handed):
            words = re.sub(r".*: (?=called where)", "", words)
            with self.subTest(words):
                self.assertTrue(any(words in each or each.rpartition(": ")[2] in words for each in seen))

class Arguments(unittest.TestCase):
    def test_the_option_stands_where_it_likes(self):
        for words in (["--faults", "PMX_SetMode"], ["PMX_SetMode", "--faults"]):
            chosen, names, faults = prove.asked_for(["cache", "made", *words])
            self.assertTrue(chosen.faults)
            self.assertEqual(prove.SAMPLE, chosen.sample)
            self.assertEqual(["PMX_SetMode"], names)
            self.assertEqual({"PMX_SetMode"}, {fault["operation"] for fault in faults})


class Page(unittest.TestCase):
    def test_it_tells_what_is_presumed_and_excepted(self):
        for names in (promises.STORED_ALL_THE_SAME, promises.UNSAID, harness.PRESUMED, harness.FORGETS_THE_TIMER):
            for name in names:
                self.assertIn(f"`{name}`", PAGE)

    def test_its_numbers_are_right(self):
        self.assertEqual(len(harness.operations(harness.ROOT)), int(re.search(r"\b(\d+) operations\b", PAGE)[1]))
        self.assertEqual(len(prove.all_faults()), int(re.search(r"\b(\d+) faults\b", PAGE)[1]))
        self.assertEqual(prove.SAMPLE, int(re.search(r"`./dev prove` plants (\d+)\b", PAGE)[1]))
        run = (prove.ROOT / ".ci/run").read_text(encoding="utf-8")
        self.assertIn(f"`{re.search(r'./dev prove .*', run)[0]}`", PAGE)


if __name__ == "__main__":
    unittest.main()
