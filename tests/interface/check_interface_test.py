#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Changes headers, and the skeleton with them, in ways that break callers or neighbours, and looks for the names.

usage: check_interface_test.py SKELETON COMPILER
"""

import pathlib
import shutil
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import check_interface  # noqa: E402

ARGUMENTS = []


class CheckInterface(unittest.TestCase):
    def differences(self, *changes):
        """What differs when these texts are replaced wherever they stand."""
        skeleton, compiler = ARGUMENTS
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            headers = [pathlib.Path(shutil.copytree(check_interface.ROOT / header, root / header))
                       for header in check_interface.HEADERS]
            body = pathlib.Path(shutil.copy(skeleton, root / "port_skeleton.c"))
            check_interface.dump(root / "before.xml", [], body, compiler, headers)
            places = [body, *(path for header in headers for path in header.iterdir())]
            for old, new in changes:
                texts = {path: path.read_text(encoding="utf-8") for path in places}
                self.assertTrue(any(old in text for text in texts.values()), f"{old} stands nowhere")
                for path, text in texts.items():
                    path.write_text(text.replace(old, new), encoding="utf-8")
            check_interface.dump(root / "after.xml", [], body, compiler, headers)
            return check_interface.differences(root / "before.xml", root / "after.xml")

    def test_no_change(self):
        self.assertEqual("", self.differences())
        self.assertEqual("", self.differences(("Create a semaphore.", "Make a semaphore.")))

    def named(self, change, *names):
        told = self.differences(change)
        for name in names:
            self.assertIn(name, told)

    def test_an_argument_of_another_width(self):
        self.named(("TVE_SetFmtEx(UINT32 u4Tve, UCHAR ucMainFmt", "TVE_SetFmtEx(UINT32 u4Tve, UINT32 ucMainFmt"),
                   "UINT32 TVE_SetFmtEx(", "parameter 2 of type 'typedef UCHAR' changed", "from UCHAR to UINT32")

    def test_another_result(self):
        self.named(("BOOL fgVdpIsWaitforSyncCtrl(", "UINT32 fgVdpIsWaitforSyncCtrl("), "fgVdpIsWaitforSyncCtrl(",
                   "return type changed")

    def test_a_function_that_goes_or_comes(self):
        self.named(("x_thread_delay(", "x_thread_sleep("), "[D] 'function void x_thread_delay(",
                   "[A] 'function void x_thread_sleep(")

    def test_a_field_that_moves(self):
        self.named(("    HANDLE_T hPMXTimer;", "    UINT8 ucNew;\n    HANDLE_T hPMXTimer;"),
                   "struct PMX_DISPLAY_PART_STATUS_T", "'HANDLE_T hPMXTimer' offset changed from 0 to 32")

    def test_a_record_that_travels_behind_a_pointer_to_anything(self):
        self.named(("UINT16 u2VsyncFreq;", "UINT32 u2VsyncFreq;"),
                   "struct PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T", "type of 'UINT16 u2VsyncFreq' changed")

    def test_an_enumerator_with_another_number(self):
        self.named(("HDMI_PICTURE_16_9 = 2", "HDMI_PICTURE_16_9 = 3"), "enum HDMI_PICTURE_ASPECT_RATIO_T",
                   "'HDMI_PICTURE_ASPECT_RATIO_T::HDMI_PICTURE_16_9' from value '2' to '3'")


if __name__ == "__main__":
    ARGUMENTS = [pathlib.Path(sys.argv[1]).resolve(), sys.argv[2]]
    unittest.main(argv=sys.argv[:1])
