#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What looks at kernels that watch finds what they report, and notices who does not watch."""

import contextlib
import io
import pathlib
import re
import sys
import tempfile
import unittest
from unittest import mock

sys.dont_write_bytecode = True

import debug_kernel  # noqa: E402
import every_kernel  # noqa: E402
import machines  # noqa: E402
import own  # noqa: E402
import races  # noqa: E402
import run  # noqa: E402

REPORT = """==================================================================
BUG: KCSAN: data-race in PMX_GetMode [pmx] / PMX_SetModeEx [pmx]

write to 0xffffffffc0009a90 of 1 bytes by task 48 on cpu 1:
 PMX_SetModeEx+0x1f/0x40 [pmx]
 work+0x25/0x90 [pmx]

read (marked) to 0xffffffffc0009a90 of 1 bytes by interrupt on cpu 0:
 PMX_GetMode+0x11/0x20 [pmx]
 kthread+0x1/0x2

value changed: 0x01 -> 0x02
==================================================================
"""


class Named:
    """Functions that are what they are called."""

    @staticmethod
    def at(place):
        return place.symbol


class Races(unittest.TestCase):
    def pairs(self, text):
        return races.of_the_module(text.splitlines(), Named)

    def test_a_report_is_read(self):
        self.assertEqual([races.Place("PMX_SetModeEx", 0x1f, 0x40, "pmx"),
                          races.Place("PMX_GetMode", 0x11, 0x20, "pmx")], races.reports(REPORT.splitlines())[0].places)
        self.assertEqual(([("PMX_SetModeEx", "PMX_GetMode")], 0), self.pairs(REPORT))
        self.assertEqual(2, len(self.pairs(REPORT + REPORT)[0]))

    def test_a_race_of_which_one_access_is_seen(self):
        alone = REPORT.partition("\n\nread")[0].replace("write to", "race at unknown origin, with write to")
        self.assertEqual(([("PMX_SetModeEx",)], 0), self.pairs(alone))
        self.assertEqual(1, len(list(races.complaints([("PMX_SetModeEx",)], set()))))
        self.assertEqual([], list(races.complaints([("PMX_SetModeEx",), ("i4Pmx_Connect",)], {"PMX_SetModeEx"})))

    def test_what_cannot_be_read_is_told(self):
        for line in (" PMX_GetMode+0x11/0x20 [pmx]\n", " PMX_SetModeEx+0x1f/0x40 [pmx]\n"):
            self.assertEqual(([], 1), self.pairs(REPORT.replace(line, " 0x0\n")))
        self.assertEqual(([], 1), self.pairs(REPORT.partition("\n\nread")[0]))

    def test_races_of_the_kernel_alone_are_its_own(self):
        self.assertEqual(([], 0), self.pairs(REPORT.replace(" [pmx]\n", "\n")))

    def test_who_is_listed_may_race_and_nobody_else(self):
        listed = {"PMX_GetMode", "PMX_SetMode"}
        self.assertEqual([], list(races.complaints([("PMX_GetMode", "PMX_SetMode"), ("PMX_GetMode", "i4Pmx_Connect")],
                                                   listed)))
        self.assertRegex(next(races.complaints([("PMX_GetMode", "PMX_Other")], listed)), "^PMX_Other is not listed")
        self.assertRegex(next(races.complaints([("i4Pmx_Connect", "i4Pmx_Disconnect")], listed)), "both hold the mutex")

    def test_names_are_those_of_the_source(self):
        functions = races.Functions()
        for symbol, name in (("_ZL12vStoreFormatPK9REQUEST_T.isra.0", "vStoreFormat"), ("PMX_GetMode", "PMX_GetMode"),
                             ("_ZN12_GLOBAL__N_15innerEi.part.1", "inner")):
            self.assertEqual(name, functions.at(races.Place(symbol, 1, 2, "pmx")))


class Watching(unittest.TestCase):
    def test_whatever_a_watcher_says_is_a_complaint(self):
        said = re.search(r"^complaints='(.*)'$", (run.HERE / "init.sh").read_text("utf-8"), re.M)[1]
        for line in ("WARNING: possible circular locking dependency detected",
                     "BUG: sleeping function called from invalid context at kernel/locking/mutex.c:580",
                     "ODEBUG: free active (active state 0) object type: hrtimer hint: never+0x1/0x4 [pmx]",
                     "UBSAN: shift-out-of-bounds in planted.c:83:15",
                     "kmemleak: 8 new suspected memory leaks (see /sys/kernel/debug/kmemleak)",
                     "BUG: KASAN: use-after-free in PMX_SetModeEx+0x9d/0x7ac [pmx]"):
            self.assertRegex(line, said)
        self.assertNotRegex("pmx: [PMX] create a timer", said)
        _, wrong = run.parsed(["COMPLAINT UBSAN: x", "DONE 1.0"])
        self.assertEqual(["COMPLAINT UBSAN: x"], wrong)

    def test_objects_that_nobody_watches(self):
        def complaints(names):
            with mock.patch.object(run, "run", lambda program, option, path: names(path)), \
                    tempfile.TemporaryDirectory() as folder:
                pathlib.Path(folder, "pmx.mod").write_text("/made/pmx_port.o\n", encoding="utf-8")
                return list(debug_kernel.unwatched(mock.Mock(), pathlib.Path(folder),
                                                   debug_kernel.INSTRUMENTED["debug"]))

        self.assertEqual([], complaints(lambda path: "U __asan_load4 U __ubsan_handle_x"))
        self.assertEqual([], complaints(lambda path: "U __ubsan_x" + " U __asan_load1" * (path.name != "pmx_layout.o")))
        self.assertEqual(["__asan_load", "__ubsan_"], [line.split()[0] for line in complaints(lambda _: "U memcpy")])
        self.assertRegex(complaints(lambda path: "U __ubsan_x" + " U __asan_load1" * (path.name < "pmx_k"))[0],
                         "^__asan_load is called by none of .*pmx_port.o")

    def test_of_the_port_what_is_in_the_module_is_looked_at(self):
        with tempfile.TemporaryDirectory() as folder:
            linked = pathlib.Path(folder, "pmx.mod")
            linked.write_text("/made/pmx_mode.o\n/made/pmx_module.o\n/made/record.o\n", encoding="utf-8")
            looked_at = debug_kernel.objects(pathlib.Path(folder))
            self.assertIn("pmx_module.o", looked_at)
            self.assertNotIn("pmx_recorder.o", looked_at)  # of modules that were asked for it
            self.assertNotIn("record.o", looked_at)  # the tests' own
            linked.write_text("/made/pmx_recorder.o\n", encoding="utf-8")
            self.assertEqual({f"{path.stem}.o" for path in (run.ROOT / "src/driver/pmx").glob("*.cpp")},
                             set(debug_kernel.objects(pathlib.Path(folder))) - {"pmx_recorder.o"})

    def test_every_fault_is_planted(self):
        script = debug_kernel.GUEST.read_text(encoding="utf-8")
        code = (debug_kernel.WATCHED / "planted.c").read_text(encoding="utf-8")
        known = set(re.findall(r'^    \{ "([\w-]+)", plant_', code, re.M))
        planted = re.findall(r"^    plant ([\w-]+) ", script, re.M)
        self.assertEqual(known, {*planted, "race"})
        self.assertEqual(debug_kernel.CHECKS["planted"], len(planted) + 1)

    def test_the_numbers_of_checks_are_those_of_the_script(self):
        script = debug_kernel.GUEST.read_text(encoding="utf-8")
        bodies = dict(re.findall(r"^(\w+)\(\)\n{\n(.*?)^}", script, re.M | re.S))
        counted = {name: len(re.findall(r"^ +check ", bodies[name], re.M)) for name in ("threads", "awake")}
        self.assertEqual({"scenarios": counted["awake"], "threads": sum(counted.values()), "races": counted["threads"]},
                         {name: number for name, number in debug_kernel.CHECKS.items() if name != "planted"})

    def test_the_threads_go_on_for_as_long_as_is_asked_for(self):
        for minutes, seconds in ((0, debug_kernel.SECONDS), (60, debug_kernel.SECONDS + 3600)):
            with mock.patch.object(run, "image"), mock.patch.object(run, "boot") as boot:
                debug_kernel.booted(None, None, pathlib.Path(), "threads", minutes=minutes)
            self.assertEqual((f"part=threads minutes={minutes}", seconds),
                             (boot.call_args.kwargs["words"], boot.call_args.kwargs["seconds"]))
        script = debug_kernel.GUEST.read_text(encoding="utf-8")
        self.assertIn('sed -n \'s/.*minutes=\\([0-9]*\\).*/\\1/p\' /proc/cmdline', script)

    def test_what_the_threads_did_is_told_once(self):
        shown = io.StringIO()
        with contextlib.redirect_stdout(shown):
            debug_kernel.tell_use(["# 12010 calls, 40 expiries, 0 misplaced", "# 24020 calls, 80 expiries", "DONE 1"])
        self.assertEqual("# three threads: 24020 calls, 80 expiries\n", shown.getvalue())

    def test_settings_that_a_kernel_does_not_take(self):
        wanted = "# why\nCONFIG_A=y\nCONFIG_B=y\nCONFIG_C=3\nCONFIG_D=n\n"
        self.assertEqual(["CONFIG_A=y", "CONFIG_C=3"],
                         own.refused(wanted, "# CONFIG_A is not set\nCONFIG_B=y\nCONFIG_C=4\n"))
        self.assertEqual(["CONFIG_D=n"], own.refused("CONFIG_D=n\n", "CONFIG_D=y\n"))

    def test_every_own_kernel_has_its_fragments(self):
        for machine, name in ((machines.ARM, "debug"), (machines.ARM, "thumb2"), (machines.PC, "kcsan")):
            self.assertGreater(len(own.SETTING.findall(own.fragments(machine, [name]))), 20)
        self.assertEqual({"thumb2", "newest", "amd64"}, set(every_kernel.KERNELS))


if __name__ == "__main__":
    unittest.main()
