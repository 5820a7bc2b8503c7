#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What compares a kernel with the board finds what differs, what is missing and what nobody ran; every scenario can be
carried out in a kernel.

usage: run_test.py PMXBOARD
"""

import base64
import contextlib
import dataclasses
import gzip
import io
import os
import pathlib
import re
import shlex
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True
ROOT = pathlib.Path(__file__).resolve().parents[2]

import debian  # noqa: E402
import machines  # noqa: E402
import packages  # noqa: E402
import recorders  # noqa: E402
import run  # noqa: E402
import scenarios  # noqa: E402
from platform_functions import PLATFORM_HEADERS, functions  # noqa: E402

PMXBOARD = sys.argv.pop(1)
COLD_BOOT = ROOT / "scenarios/cold-boot.pmx"


def told(expected, console):
    """What comparing prints, and how many verdicts say no."""
    shown = io.StringIO()
    with contextlib.redirect_stdout(shown):
        ktap = run.Ktap()
        run.compare(ktap, "t", expected, console)
    return shown.getvalue(), ktap.failures


class Comparison(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        calls, results = scenarios.on_the_board(PMXBOARD, COLD_BOOT)
        cls.expected = {"cold-boot": (calls, results)}
        cls.console = ["noise", "SCENARIO cold-boot", *(f"| {line}" for line in calls),
                       *(f"= {line}" for line in results), "END", "DONE 5.0"]

    def test_the_same_is_the_same(self):
        text, failures = told(self.expected, self.console)
        self.assertEqual(0, failures, text)
        self.assertRegex(text, r"ok 1 t cold-boot\nok 2 t boot: 1 scenarios, \d\d+ lines\n$")

    def test_every_line_counts(self):
        for at, line in enumerate(self.console):
            if line[:2] not in ("| ", "= "):
                continue
            for other in ([line + "x"], [], [line, line]):
                text, failures = told(self.expected, self.console[:at] + other + self.console[at + 1:])
                self.assertEqual(1, failures, text)
                self.assertIn("not ok 1 t cold-boot", text)

    def test_a_changed_line_is_shown_beside_the_boards(self):
        changed = [line.replace("x_sema_create(1, 2, 1) = 0", "x_sema_create(1, 1, 1) = 0") for line in self.console]
        self.assertIn("#   board:  x_sema_create(1, 2, 1) = 0\n#   kernel: x_sema_create(1, 1, 1) = 0\n",
                      told(self.expected, changed)[0])

    def test_what_did_not_run(self):
        self.assertIn("# it did not run", told(self.expected, ["DONE 5.0"])[0])
        self.assertEqual(1, told({}, ["DONE 5.0"])[1])
        self.assertIn("# the kernel did not come to its end", told(self.expected, self.console[:-1])[0])
        self.assertIn("# the kernel went away in cold-boot", told(self.expected, self.console[:-2])[0])

    def test_what_the_kernel_complains_of(self):
        for line in ("COMPLAINT WARNING: x", "WRONG rmmod pmx", "Kernel panic - not syncing"):
            text, failures = told(self.expected, [*self.console[:-1], line, self.console[-1]])
            self.assertEqual(1, failures)
            self.assertIn(f"# {line}\n", text)


class Recordings(unittest.TestCase):
    COMMANDS = {"once": ["POWER-ON", "PMX_Init"], "twice": ["PMX_Init", "POWER-ON", "PMX_Init"]}

    def told(self, console, says):
        with tempfile.TemporaryDirectory() as directory:
            program = pathlib.Path(directory, "program")
            program.write_text(f"#!/bin/sh\necho '{says}'\n", encoding="utf-8")
            program.chmod(0o755)
            shown = io.StringIO()
            with contextlib.redirect_stdout(shown):
                ktap = run.Ktap()
                run.replays(ktap, "t", program, self.COMMANDS, console, pathlib.Path(directory, "made"))
        return shown.getvalue()

    def test_every_power_on_has_a_recording_that_replays(self):
        packed = base64.b64encode(gzip.compress(b"recording")).decode()
        once, twice = (["RECORDING " + name, packed, "RECORDED"] for name in self.COMMANDS)
        equal = "equal: 1 operations, 2 calls"
        self.assertEqual("ok 1 t replayed once\nok 2 t replayed twice\n",
                         self.verdicts([*once, *twice, *twice], equal))
        for console, found in (([*once, *twice], 1), ([*once, *twice, *twice[:2]], 1), ([*once, *(3 * twice)], 3),
                               (once, 0)):
            text = self.told(console, equal)
            self.assertIn("not ok 2 t replayed twice", text)
            self.assertIn(f"# {found} recordings of 2\n", text)
        for other in ("departs at event 3 of 4", "equal: 0 operations, 0 calls"):
            self.assertEqual("not ok 1 t replayed once\nnot ok 2 t replayed twice\n",
                             self.verdicts([*once, *twice, *twice], other))

    def verdicts(self, console, says):
        return "".join(re.findall(r"^(?:not )?ok .*\n", self.told(console, says), re.M))

    def test_a_machine_that_lacks_processors(self):
        for told, expected in ((["PROCESSORS 2"], 0), (["PROCESSORS 1"], 1), ([], 1)):
            with contextlib.redirect_stdout(io.StringIO()):
                ktap = run.Ktap()
                run.has_processors(ktap, told)
            self.assertEqual(expected, ktap.failures)


class Boots(unittest.TestCase):
    ALONE = """#!/bin/sh
echo "NICE $(nice)"
"""
    # Comes to its end when all of the others have begun, and tells who it is.
    TOGETHER = """#!/bin/sh
cd "${0%/*}" || exit
while [ "$1" != -initrd ]
do
    shift
done
: >"began-$2"
for tick in $(seq 300)
do
    [ "$(ls -d began-* | wc -l)" -eq 3 ] && echo "DONE $2" && exit
    sleep 0.1
done
"""

    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.folder = pathlib.Path(directory.name)

    def kernel(self, script):
        program = self.folder / "emulator"
        program.write_text(script, encoding="utf-8")
        program.chmod(0o755)
        return debian.Kernel(self.folder, "1.2-x", dataclasses.replace(machines.ARM, emulator=(program,)))

    def test_all_run_at_once_and_are_told_apart(self):
        boots = {name: (name, *options) for name, *options in (
            ("virtual", *run.VIRTUAL_TIME), ("real",), ("several", "-smp", "2"))}
        with run.booted(self.kernel(self.TOGETHER), self.folder, boots) as console_of:
            for name in reversed(boots):
                self.assertEqual([f"DONE {name}"], console_of[name]())
                self.assertTrue((self.folder / f"{name}.log").is_file())

    def test_virtual_time_goes_behind_real_time(self):
        kernel, own = self.kernel(self.ALONE), os.nice(0)
        nice = {options: run.boot(kernel, "archive", self.folder / "log", *options)
                for options in (tuple(run.VIRTUAL_TIME), (), ("-smp", "2"))}
        self.assertEqual({tuple(run.VIRTUAL_TIME): [f"NICE {min(own + 10, 19)}"], (): [f"NICE {own}"],
                          ("-smp", "2"): [f"NICE {own}"]}, nice)

    def test_one_that_cannot_run_is_told_when_the_others_have_ended(self):
        kernel = self.kernel("#!/bin/sh\nsleep 1\necho DONE 1\n")
        (self.folder / "broken.log").mkdir()
        with self.assertRaises(IsADirectoryError), \
                run.booted(kernel, self.folder, {"broken": ("a",), "good": ("a",)}) as console_of:
            console_of["broken"]()
        self.assertEqual("DONE 1\n", (self.folder / "good.log").read_text(encoding="utf-8"))

    def test_one_that_stops_halfway_is_told_beside_one_that_does_not(self):
        kernel = self.kernel("""#!/bin/sh
printf 'SCENARIO x\\n| f()\\nEND\\n'
[ "$(echo "$*" | grep -c -e -smp)" -eq 1 ] || echo DONE 1
""")
        shown = io.StringIO()
        with contextlib.redirect_stdout(shown), \
                run.booted(kernel, self.folder, {"real": ("a",), "several": ("a", "-smp", "2")}) as console_of:
            ktap = run.Ktap()
            for name, console in console_of.items():
                run.compare(ktap, name, {"x": (["f()"], [])}, console())
        self.assertEqual("""KTAP version 1
ok 1 real x
ok 2 real boot: 1 scenarios, 1 lines
ok 3 several x
# the kernel did not come to its end
not ok 4 several boot: 1 scenarios, 1 lines
""", shown.getvalue())


class RealTime(unittest.TestCase):
    def told(self, console):
        shown = io.StringIO()
        with contextlib.redirect_stdout(shown):
            ktap = run.Ktap()
            run.checks(ktap, "t", console)
        return shown.getvalue(), ktap.failures

    def test_checks_that_fail_or_are_missing(self):
        right = [f"RIGHT {number}" for number in range(run.CHECKS)]
        self.assertEqual(0, self.told(["noise", *right])[1])
        text, failures = self.told([*right[1:], "WRONG loads: [ 3 -eq 20 ]"])
        self.assertEqual(1, failures)
        self.assertIn(f"# loads: [ 3 -eq 20 ]\nnot ok {run.CHECKS} t loads\n", text)
        self.assertIn(f"# only {run.CHECKS - 1} were made\n", self.told(right[1:])[0])

    def test_the_number_of_checks_is_that_of_the_script(self):
        script = (run.HERE / "real_time.sh").read_text(encoding="utf-8")
        repeated = sum(len(shlex.split(words)) - 1 for words in re.findall(r"^ +for \w+ in (.*)", script, re.M))
        self.assertEqual(run.CHECKS, len(re.findall(r"^ +check ", script, re.M)) + repeated)

    def test_long_waits_are_left_out_but_one(self):
        chosen, left_out = run.in_real_time({
            "short": ["sleep 900", "PMX_Init"], "long": ["sleep 600", "sleep 600"], "poke": ["poke 28 4 0"],
            "inside": ["meanwhile 0 1 x_thread_delay sleep 10000"], run.LONG_WAIT: ["sleep 3005"]})
        self.assertEqual(["short", run.LONG_WAIT], list(chosen))
        self.assertEqual({"long", "poke", "inside"}, left_out.keys())
        self.assertIn(run.LONG_WAIT, {path.stem for path in (ROOT / "scenarios").glob("*.pmx")})


class Scenarios(unittest.TestCase):
    def read(self, text):
        with tempfile.TemporaryDirectory() as directory:
            path = pathlib.Path(directory, "x.pmx")
            path.write_text(text, encoding="utf-8")
            return list(scenarios.commands(path))

    def test_every_scenario_can_be_carried_out(self):
        known = {function.name for function in recorders.operations()}
        known |= set(re.findall(r'^    \{ "([\w-]+)", run_', (run.HERE / "module/scripts.c").read_text("utf-8"), re.M))
        for path in sorted((ROOT / "scenarios").glob("*.pmx")):
            verbs = {line.split()[0] for line in scenarios.commands(path)}
            self.assertLessEqual(verbs, known | {"POWER-ON", "ipmx"}, path)

    def test_names_and_records_are_numbers(self):
        self.assertEqual(["PMX_SetModeEx 0 " + "0 0 0 0 0 0 0 " + "1 12 0 0 0 0 0 " * 2 + "1 0 0 0 0 0 0 60 0 0"],
                         self.read("PMX_SetModeEx 0 [ [0], [1, RES_1080P60HZ], {fgOutputEnable=1, eResMode=12}, [1] ] "
                                   "60 DRV_NON_EXT_CHIP 0   # why"))
        self.assertEqual(["PMX_GetMode 0 null"], self.read("PMX_GetMode 0 null\nexpect result 0\n"))

    def test_sleeps_in_a_row_are_one(self):
        self.assertEqual(["sleep 1507", "PMX_Init", "sleep 6"],
                         self.read("advance 1s\nexpect asserts 0\nadvance 501ms\nadvance 1us\nPMX_Init\nadvance 1ms\n"))

    def test_what_is_unknown_is_refused(self):
        for line in ("flush x", "PMX_GetMode NO_NAME", "advance soon", "poke no.field 1", "neighbour TVE_SetEnable 0 1",
                     "meanwhile x_thread_delay expect asserts 0"):
            with self.assertRaises(scenarios.Unknown, msg=line):
                self.read(line)


class Recorders(unittest.TestCase):
    def test_every_platform_function_is_recorded(self):
        declared = {function.name for header in PLATFORM_HEADERS for function in functions(ROOT / header)}
        recorded = {function.name for function in recorders.recorded()}
        self.assertEqual(declared, recorded | set(recorders.BY_HAND + recorders.NOT_RECORDED))
        code = recorders.code()
        for name in recorded:
            self.assertIn(f" __wrap_{name}(", code)
        self.assertLessEqual(recorders.SCRIPTED, recorded)


class Kernel(unittest.TestCase):
    def test_what_was_unpacked_for_another_place_is_not_used(self):
        with tempfile.TemporaryDirectory() as directory:
            folder = pathlib.Path(directory).resolve()
            fetched, fetch = [], debian._fetch
            debian._fetch = lambda place, *_: fetched.append(place) or "1.2-x"
            self.addCleanup(setattr, debian, "_fetch", fetch)
            self.assertEqual("1.2-x", debian.kernel(folder).release)
            self.assertEqual("1.2-x", debian.kernel(folder).release)
            self.assertEqual([folder], fetched)
            (folder / packages.USABLE).write_text("/elsewhere\n1.2-x\n", encoding="utf-8")
            debian.kernel(folder)
            self.assertEqual([folder, folder], fetched)
            self.assertEqual("1.2-x", debian.kernel(folder, newest=True).release)
            self.assertEqual([folder] * 3, fetched)

    def test_what_the_kernels_build_finds_in_the_code_is_an_error(self):
        with tempfile.TemporaryDirectory() as directory:
            folder = pathlib.Path(directory).resolve()
            settings = folder / "include/config/auto.conf"
            settings.parent.mkdir(parents=True)
            settings.write_text("CONFIG_X=y\n", encoding="utf-8")
            kernel = debian.Kernel(folder, "1.2-x", machines.PC)
            kernel.headers = folder
            for line, refused in (("x.o: warning: objtool: f() falls through", True), ("CC x.o", False)):
                (folder / "Makefile").write_text(f"modules:\n\t@echo '{line}' >&2\n", encoding="utf-8")
                with self.subTest(line), self.assertRaises(run.Failed) if refused else contextlib.nullcontext():
                    run.module(kernel, folder / "made")

    def test_folders_that_the_kernels_build_cannot_use(self):
        for name in ("a b", "a:b", "a$b", "a'b", "a#b"):
            with self.assertRaises(run.Failed):
                run.check_path(pathlib.Path("/x") / name)
        run.check_path(pathlib.Path("/x/a-b_c.d+e"))


if __name__ == "__main__":
    unittest.main()
