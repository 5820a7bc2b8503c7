#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds check_threads.py suppression files and reports that it must refuse, and some that it must not."""

import pathlib
import sys
import unittest

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).parent))

import check_threads  # noqa: E402
from check_threads import Access  # noqa: E402

LOCKED_WRITE = Access("i4Pmx_Connect", True)
UNLOCKED_READ = Access("PMX_VdpEnabled", False)

# As ThreadSanitizer words it.
REPORT = """==================
WARNING: ThreadSanitizer: data race (pid=2572)
  Read of size 1 at 0x0000004122b1 by thread T4:
    #0 PMX_VdpEnabled src/driver/pmx/pmx_source.cpp:36 (layer_threads+0x408bb3)
    #1 <null> <null> (libstdc++.so.6+0xd44a2)

  Previous write of size 1 at 0x0000004122b1 by thread T3 (mutexes: write M9):
    #0 i4Pmx_Connect src/driver/pmx/pmx_port.cpp:48 (layer_threads+0x408535)
    #1 i4Pmx_Disconnect src/driver/pmx/pmx_port.cpp:64 (layer_threads+0x40867f)

  Location is global '_arPmxConf' of size 480 at 0x000000412240 (layer_threads+0x4122b1)

SUMMARY: ThreadSanitizer: data race src/driver/pmx/pmx_source.cpp:36 in PMX_VdpEnabled
==================
"""


class Entries(unittest.TestCase):
    def complaints(self, text):
        return check_threads.entries(text)[1]

    def test_good(self):
        listed, complaints = check_threads.entries("# About all.\n\n# Why.\nrace_top:^A$\n# Why too.\nrace_top:^B$\n")
        self.assertEqual(({"A", "B"}, []), (listed, complaints))

    def test_an_entry_without_a_reason(self):
        self.assertIn("no reason", self.complaints("# Why.\nrace_top:^A$\nrace_top:^B$\n")[0])
        self.assertIn("no reason", self.complaints("# Why.\n\nrace_top:^A$\n")[0])

    def test_anything_wider_than_one_function(self):
        for entry in ("race:^A$", "race_top:A", "race_top:^A*$", "race:pmx_source.cpp", "called_from_lib:x"):
            self.assertIn("not race_top", self.complaints(f"# Why.\n{entry}\n")[0], entry)

    def test_twice(self):
        self.assertIn("A is listed twice", self.complaints("# Why.\nrace_top:^A$\n# Why.\nrace_top:^A$\n"))

    def test_a_function_that_locks(self):
        for name in check_threads.LOCKING:
            self.assertIn("holds the mutex", self.complaints(f"# Why.\nrace_top:^{name}$\n")[0])


class Races(unittest.TestCase):
    def test_both_accesses_are_read(self):
        self.assertEqual(([(UNLOCKED_READ, LOCKED_WRITE)] * 2, []), check_threads.races(REPORT + REPORT))

    def test_an_atomic_access_is_read(self):
        pairs, complaints = check_threads.races(REPORT.replace("Read of", "Atomic read of"))
        self.assertEqual(([(UNLOCKED_READ, LOCKED_WRITE)], []), (pairs, complaints))

    def test_a_lost_stack(self):
        pairs, complaints = check_threads.races(REPORT.replace(
            "    #0 i4Pmx_Connect src/driver/pmx/pmx_port.cpp:48 (layer_threads+0x408535)\n"
            "    #1 i4Pmx_Disconnect src/driver/pmx/pmx_port.cpp:64 (layer_threads+0x40867f)\n",
            "    [failed to restore the stack]\n"))
        self.assertEqual([], pairs)
        self.assertIn("without two readable stacks", complaints[0])

    def test_other_reports(self):
        pairs, complaints = check_threads.races(REPORT.replace("data race (pid", "double lock of a mutex (pid"))
        self.assertEqual([], pairs)
        self.assertIn("double lock of a mutex", complaints[0])

    def test_a_report_that_is_cut_off(self):
        self.assertTrue(check_threads.races(REPORT[:400])[1])

    def test_silence(self):
        self.assertEqual(([], []), check_threads.races("ThreadSanitizer: Matched 3 suppressions (pid=1):\n"))


class Exact(unittest.TestCase):
    def judge(self, pairs, *listed):
        return check_threads.judge_exact(pairs, set(listed))

    def test_the_list_is_what_was_seen(self):
        self.assertEqual([], self.judge([(UNLOCKED_READ, LOCKED_WRITE)], "PMX_VdpEnabled"))

    def test_not_listed(self):
        self.assertIn("PMX_VdpEnabled touches", self.judge([(UNLOCKED_READ, LOCKED_WRITE)])[0])

    def test_listed_and_not_seen(self):
        self.assertIn("PMX_GetMode is listed", self.judge([(UNLOCKED_READ, LOCKED_WRITE)], "PMX_VdpEnabled",
                                                          "PMX_GetMode")[0])

    def test_a_lock_that_is_forgotten_or_new(self):
        unlocked_write = Access("i4Pmx_Connect", False)
        self.assertIn("i4Pmx_Connect touches", self.judge([(UNLOCKED_READ, unlocked_write)], "PMX_VdpEnabled")[0])
        locked_read = Access("PMX_VdpEnabled", True)
        self.assertIn("PMX_VdpEnabled holds", self.judge([(locked_read, UNLOCKED_READ)], "PMX_VdpEnabled")[0])

    def test_two_that_hold_the_mutex(self):
        self.assertIn("races with", " ".join(self.judge([(LOCKED_WRITE, LOCKED_WRITE)])))


class WithoutMutex(unittest.TestCase):
    WRITE = Access("i4Pmx_Connect", False)
    READ = Access("PMX_InformVdpColorSpace", False)
    INNER_READ = Access("vInformVdp", False)

    def test_what_the_mutex_protects_is_reported(self):
        for read in (self.READ, self.INNER_READ):
            self.assertEqual([], check_threads.judge_without_mutex([(self.WRITE, self.WRITE), (self.WRITE, read)]))

    def test_something_is_missing(self):
        self.assertIn("a connection while", check_threads.judge_without_mutex([(self.WRITE, self.WRITE)])[0])
        self.assertIn("two connections", check_threads.judge_without_mutex([(self.READ, self.WRITE)])[0])
        self.assertEqual(2, len(check_threads.judge_without_mutex([])))

    def test_something_else_gets_through(self):
        pairs = [(self.WRITE, self.WRITE), (self.WRITE, self.READ), (self.WRITE, UNLOCKED_READ)]
        self.assertIn("not among those", check_threads.judge_without_mutex(pairs)[0])

    def test_a_mutex_is_held_after_all(self):
        pairs = [(self.WRITE, self.WRITE), (self.WRITE, self.READ), (self.WRITE, LOCKED_WRITE)]
        self.assertEqual(["i4Pmx_Connect holds a mutex"], check_threads.judge_without_mutex(pairs))


if __name__ == "__main__":
    unittest.main()
