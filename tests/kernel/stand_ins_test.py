#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The port to Linux has every platform function once: written by hand, or as a stand-in that a real driver replaces.

usage: stand_ins_test.py COMPILER
"""

import pathlib
import subprocess
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True
ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path[:0] = [str(ROOT / "linux"), str(ROOT / "cmake"), str(ROOT / "tests/tidy")]

import stand_ins  # noqa: E402
from cpp import Source  # noqa: E402
from platform_functions import PLATFORM_HEADERS, functions  # noqa: E402

COMPILER = sys.argv.pop(1) if len(sys.argv) > 1 else "gcc"
FLAGS = ["-std=gnu11", "-ffreestanding", "-fno-short-enums", "-Wall", "-Wextra", "-Wno-unused-parameter", "-Werror",
         *(f"-I{ROOT / 'src' / folder}" for folder in ("system/inc", "driver/inc", "driver/private_inc"))]
DECLARED = {function.name for header in PLATFORM_HEADERS for function in functions(ROOT / header)}
CALLER = """
int main(void)
{
    UINT8 set[8] = { 7, 6, 5, 4, 3, 2, 1, 0 }, got[8], wrong[8] = { 8 };
    INT32 delays[8] = { 1, 1, 1, 1, 1, 1, 1, 1 };
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query = { 12, 60, 0, 0 };
    int failed = 0;

#define EXPECT(Condition) failed = failed ? failed : (Condition) ? 0 : __LINE__
    EXPECT(TVE_SetFmtEx(TVE_2, 0, 0, 0, 0, 0, 0) == TVE_SET_OK && TVE_SetFmtEx(2, 0, 0, 0, 0, 0, 0) != TVE_SET_OK);
    EXPECT(fgPmxHalMixPlane(0, 7) && !fgPmxHalMixPlane(0, 8) && !fgPmxHalMixPlane(1, 0));
    vPmxNotMixPlane(0, 7);
    vPmxNotMixPlane(0, 8);
    vPmxNotMixPlane(1, 6);
    EXPECT(!fgPmxHalMixPlane(0, 7) && fgPmxHalMixPlane(0, 6));
    vPmxMixPlane(0, 7);
    EXPECT(fgPmxHalMixPlane(0, 7));
    EXPECT(PMX_HalSetPlaneOrder(0, set, delays) == 0 && delays[7] == 0);
    EXPECT(PMX_HalSetPlaneOrder(0, wrong, delays) != 0 && PMX_HalSetPlaneOrder(1, set, delays) != 0);
    EXPECT(PMX_HalGetPlaneOrder(0, got) == 0 && got[0] == 7 && got[7] == 0);
    PMX_HalInitPlaneOrder(0);
    EXPECT(PMX_HalGetPlaneOrder(0, got) == 0 && got[0] == 0 && got[7] == 7 && PMX_HalGetPlaneOrder(1, got) != 0);
    PMX_HalSwapPlane1_2(0, 2);
    PMX_HalSwapPlane3_4(1, 1);
    EXPECT(fgPmxHalSwapPlane1_2(0) == TRUE && !fgPmxHalSwapPlane1_2(1) && !fgPmxHalSwapPlane3_4(0));
    EXPECT(i4GetHotPlugStatus() == 1 && !fgIsHotPlugChgRes() && !fgVdpIsWaitforSyncCtrl());
    EXPECT(VDP_GetHwEnable(0) == VDP_ENABLED && VDP_GetHwEnable(1) == VDP_DISABLED);
    EXPECT(fgPmxDrvSetAvd(0, &query, 1) == TRUE && fgPmxDrvSetAvd(0, 0, 1) == FALSE);
    EXPECT(fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query) == TRUE && query.u4ValidAutoRes == 12 &&
           query.u2ValidAutoVfreq == 60);
    EXPECT(fgPmxDrvGetAvdInfo(2, &query) == FALSE);
    return failed != 0;
}
"""


def by_hand():
    """Every platform function that a file of the port defines, as often as that happens."""
    return [function.name for path in sorted((ROOT / "linux").glob("*.c"))
            for function in Source(path.read_text(encoding="utf-8")).functions() if function.name in DECLARED]


def compiled(text, *more):
    """The names that the file defines; more arguments make a program of it, which is run."""
    with tempfile.TemporaryDirectory() as directory:
        source, made = pathlib.Path(directory, "code.c"), pathlib.Path(directory, "made")
        source.write_text(text, encoding="utf-8")
        subprocess.run([COMPILER, *FLAGS, *(more or ["-c"]), source, "-o", made], check=True)
        if more:
            return subprocess.run([made], check=False).returncode
        listed = subprocess.run(["nm", "--defined-only", "--extern-only", "--format=posix", made], check=True,
                                capture_output=True, text=True).stdout
        return [line.split()[0] for line in listed.splitlines()]


class StandIns(unittest.TestCase):
    def test_every_platform_function_is_there_once(self):
        self.assertEqual(sorted(DECLARED), sorted(by_hand() + compiled(stand_ins.stand_ins([]))))

    def test_each_is_left_out_alone(self):
        everything = compiled(stand_ins.stand_ins([]))
        for name in everything:
            left = stand_ins.stand_ins([name])
            self.assertNotIn(f" {name}(", left)
            self.assertEqual(len(everything) - 1, left.count("\n{\n"), name)
        for left_out in (["drv_tve"], ["fgPmxHalMixPlane", "vPmxMixPlane", "vPmxNotMixPlane"], ["drv_osd", "pmx_hal"]):
            self.assertLess(len(compiled(stand_ins.stand_ins(left_out))), len(everything))

    def test_all_at_once(self):
        self.assertEqual([], compiled(stand_ins.stand_ins(list(stand_ins.neighbours()))))

    def test_what_is_unknown_is_refused(self):
        for name in ("PMX_HalSetMod", "u_os", "x_sema_lock", "drv_tve.h"):
            with self.assertRaisesRegex(stand_ins.Unknown, f"is called {name}$"):
                stand_ins.stand_ins([name])

    def test_they_answer_as_the_boards_defaults(self):
        self.assertEqual(0, compiled(stand_ins.stand_ins([]) + '#include "drv_if_pmx.h"\n' + CALLER, "-O1"))


if __name__ == "__main__":
    unittest.main()
