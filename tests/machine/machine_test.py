#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds check_stores.py and check_handed_bytes.py, for each compiler and processor, small layers that must be refused,
each for one reason, and some that must pass.

usage: machine_test.py COMMAND...    a compiler with the flags of the product, each in one argument
"""

import pathlib
import shlex
import subprocess
import sys
import tempfile
import unittest

import check_handed_bytes
import check_stores

COMMANDS = []

STATUS = r"""
typedef unsigned char BOOL;
typedef struct { unsigned int hPMXTimer; BOOL fgChange; BOOL fgOsd; BOOL fgSet; } STATUS_T;
#define PUBLIC extern "C" __attribute__((visibility("default")))
PUBLIC STATUS_T _arPmxDispPartStatus;
STATUS_T _arPmxDispPartStatus;
PUBLIC void PMX_Reset(unsigned char);
PUBLIC BOOL fgPMX_DisplayModeReady(void);
extern "C" int get_part_id_by_name(const char*);
extern "C" void PMX_IsLog(int, const char*, ...);
extern "C" void* memset(void*, int, __SIZE_TYPE__);
#define S (*(volatile STATUS_T*)&_arPmxDispPartStatus)
"""

RESET = """
void PMX_Reset(unsigned char ucPmxId)
{
    if (ucPmxId != 0)
        return;
    %s
    get_part_id_by_name("");
}
"""
READY = """
BOOL fgPMX_DisplayModeReady(void)
{
    PMX_IsLog(9, "", S.fgChange);
    return S.fgChange == 0;
}
"""
IN_ORDER = "S.fgOsd = 0; S.fgChange = 0; S.fgSet = 0; S.hPMXTimer = 0;"

RECORD = r"""
typedef struct { unsigned short u2Freq; unsigned char fgAuto; } RECORD_T;
extern "C" unsigned char fgPmxDrvSetAvd(unsigned, void*, unsigned);
#define PUBLIC extern "C" __attribute__((visibility("default")))
PUBLIC unsigned PMX_SetTVSystem(unsigned char, unsigned short, unsigned char);
unsigned PMX_SetTVSystem(unsigned char, unsigned short u2Freq, unsigned char fgAuto)
{
    %s
    fgPmxDrvSetAvd(2, &rRecord, 1);
    return 1;
}
"""


def scenarios_of(check, *functions):
    return [scenario for scenario in check.SCENARIOS if scenario.function in functions]


class Machine(unittest.TestCase):
    def complaints(self, check, command, source, *functions):
        with tempfile.TemporaryDirectory() as scratch:
            text, built = pathlib.Path(scratch, "sample.cpp"), pathlib.Path(scratch, "sample.o")
            text.write_text(source, encoding="utf-8")
            subprocess.run([*shlex.split(command), "-c", text, "-o", built], check=True)
            return list(check.complaints([built], scenarios_of(check, *functions)))

    def passes(self, check, source, *functions):
        for command in COMMANDS:
            with self.subTest(command):
                self.assertEqual([], self.complaints(check, command, source, *functions))

    def refused(self, texts, check, source, *functions):
        """By every compiler's code, with one of the texts: they do not merge alike."""
        for command in COMMANDS:
            with self.subTest(command):
                found = "\n".join(self.complaints(check, command, source, *functions))
                self.assertTrue(any(text in found for text in texts), found or "nothing is complained of")

    def reset(self, stores):
        return STATUS + RESET % stores

    def test_single_stores_in_their_order_pass(self):
        self.passes(check_stores, self.reset(IN_ORDER), "PMX_Reset")

    def test_stores_through_functions_of_their_own_pass(self):
        wrapped = "static void vSet(volatile BOOL* pfg, BOOL fg) { *pfg = fg; }" + RESET % (
            "vSet(&S.fgOsd, 0); vSet(&S.fgChange, 0); vSet(&S.fgSet, 0); S.hPMXTimer = 0;")
        self.passes(check_stores, STATUS + wrapped, "PMX_Reset")

    def test_plain_stores_are_merged_or_moved(self):
        plain = IN_ORDER.replace("S.", "_arPmxDispPartStatus.")
        self.refused(["store-of-"], check_stores, self.reset(plain), "PMX_Reset")

    def test_the_status_cleared_as_one(self):
        self.refused(["store-of-"], check_stores, self.reset("_arPmxDispPartStatus = {};"), "PMX_Reset")

    def test_the_status_cleared_by_the_library(self):
        cleared = self.reset("volatile unsigned u4Size = 8; memset(&_arPmxDispPartStatus, 0, u4Size);")
        self.refused(["store-of-8-bytes-at-0"], check_stores, cleared, "PMX_Reset")

    def test_flags_stored_in_another_order(self):
        self.refused(["change=0 osd=0 set=0 timer=0"], check_stores,
                     self.reset("S.fgChange = 0; S.fgOsd = 0; S.fgSet = 0; S.hPMXTimer = 0;"), "PMX_Reset")

    def test_the_handle_stored_first(self):
        self.refused(["timer=0 osd=0 change=0 set=0"], check_stores,
                     self.reset("S.hPMXTimer = 0; S.fgOsd = 0; S.fgChange = 0; S.fgSet = 0;"), "PMX_Reset")

    def test_two_flags_stored_as_a_half_word(self):
        self.refused(["store-of-2-bytes-at-4 set=0"], check_stores,
                     self.reset("*(volatile unsigned short*)&S.fgChange = 0; S.fgSet = 0; S.hPMXTimer = 0;"),
                     "PMX_Reset")

    def test_the_handle_stored_byte_by_byte(self):
        self.refused(["store-of-1-bytes-at-0"], check_stores, self.reset(
            "S.fgOsd = 0; S.fgChange = 0; S.fgSet = 0;"
            "for (int i = 0; i < 4; i++) ((volatile unsigned char*)&S.hPMXTimer)[i] = 0;"), "PMX_Reset")

    def test_a_flag_stored_twice(self):
        self.refused(["osd=0 osd=0"], check_stores, self.reset("S.fgOsd = 0;" + IN_ORDER), "PMX_Reset")

    def test_a_flag_not_stored(self):
        self.refused(["osd=0 change=0 timer=0"], check_stores, self.reset(IN_ORDER.replace("S.fgSet = 0;", "")),
                     "PMX_Reset")

    def test_another_value_stored(self):
        self.refused(["set=1"], check_stores, self.reset(IN_ORDER.replace("fgSet = 0", "fgSet = 1")), "PMX_Reset")

    def test_a_flag_stored_behind_the_call(self):
        late = STATUS + RESET.replace('get_part_id_by_name("");', 'get_part_id_by_name(""); S.hPMXTimer = 0;')
        self.refused(["set=0 get_part_id_by_name timer=0"], check_stores,
                     late % IN_ORDER.replace("S.hPMXTimer = 0;", ""), "PMX_Reset")

    def test_a_flag_loaded_that_need_not_be(self):
        self.refused(["osd? osd=0"], check_stores, self.reset("if (S.fgOsd != 7) " + IN_ORDER), "PMX_Reset")

    def test_single_loads_pass(self):
        self.passes(check_stores, STATUS + READY, "fgPMX_DisplayModeReady")

    def test_a_flag_loaded_with_its_neighbour(self):
        wide = READY.replace("return S.fgChange == 0", "return (*(volatile unsigned short*)&S.fgChange & 255) == 0")
        self.refused(["PMX_IsLog load-of-2-bytes-at-4"], check_stores, STATUS + wide, "fgPMX_DisplayModeReady")

    def test_a_flag_loaded_once_for_two_uses(self):
        once = READY.replace("PMX_IsLog", "BOOL fg = S.fgChange; PMX_IsLog")
        once = once.replace('"", S.fgChange', '"", fg').replace("S.fgChange == 0", "fg == 0")
        self.refused(["found:    change? PMX_IsLog"], check_stores, STATUS + once, "fgPMX_DisplayModeReady")

    def test_an_access_that_no_operation_reaches(self):
        other = "PUBLIC void PMX_Other(void); void PMX_Other(void) { S.fgSet = 1; }"
        self.refused(["PMX_Other+0x"], check_stores, STATUS + other + RESET % IN_ORDER, "PMX_Reset")

    def test_an_operation_that_is_not_there(self):
        self.refused(["fgPMX_DisplayModeReady: not there"], check_stores, self.reset(IN_ORDER), "PMX_Reset",
                     "fgPMX_DisplayModeReady")

    def test_a_record_of_defined_bytes_passes(self):
        self.passes(check_handed_bytes, RECORD % "struct { RECORD_T r; } static s; s.r.u2Freq = u2Freq;"
                    "s.r.fgAuto = fgAuto; RECORD_T& rRecord = s.r;", "PMX_SetTVSystem")

    def test_a_record_with_bytes_of_the_stack(self):
        # Deep in the frame: small frames are made by pushing arguments, whose upper bytes are 0.
        self.refused(["3c00ffa5"], check_handed_bytes, RECORD % (
            "struct { unsigned char deep[64]; volatile RECORD_T r; } rFilled; rFilled.r.u2Freq = u2Freq;"
            "rFilled.r.fgAuto = fgAuto; RECORD_T& rRecord = (RECORD_T&)rFilled.r;"), "PMX_SetTVSystem")

    def test_a_record_with_a_wrong_byte(self):
        self.refused(["3c000100"], check_handed_bytes, RECORD % (
            "static RECORD_T rRecord; rRecord.u2Freq = u2Freq; rRecord.fgAuto = fgAuto != 0;"), "PMX_SetTVSystem")

    def test_a_command_that_is_not_sent(self):
        silent = RECORD.replace("fgPmxDrvSetAvd(2", "if (u2Freq == 24) fgPmxDrvSetAvd(2")
        self.refused(["nothing"], check_handed_bytes, silent % (
            "static RECORD_T rRecord; rRecord.u2Freq = u2Freq; rRecord.fgAuto = fgAuto;"), "PMX_SetTVSystem")

    def test_a_pointer_that_nobody_looks_at(self):
        source = RECORD % "static RECORD_T rRecord; rRecord.u2Freq = u2Freq; rRecord.fgAuto = fgAuto;"
        source = source.replace("    return 1;", "    PMX_HalSetGamma(0, 1, 0);\n    return 1;")
        self.refused(["PMX_HalSetGamma: takes a pointer"], check_handed_bytes,
                     'extern "C" void PMX_HalSetGamma(unsigned char, unsigned char, const unsigned char*);' + source,
                     "PMX_SetTVSystem")

    def test_no_object(self):
        for check in (check_stores, check_handed_bytes):
            result = subprocess.run([sys.executable, check.__file__, "absent.o"], capture_output=True, text=True,
                                    check=False)
            self.assertNotEqual(0, result.returncode)
            self.assertIn("absent.o: cannot be read", result.stderr)
            result = subprocess.run([sys.executable, check.__file__, __file__], capture_output=True, text=True,
                                    check=False)
            self.assertNotEqual(0, result.returncode)
            self.assertIn("no object file", result.stderr)


if __name__ == "__main__":
    COMMANDS = sys.argv[1:]
    if not COMMANDS:
        sys.exit(__doc__)
    unittest.main(argv=sys.argv[:1])
