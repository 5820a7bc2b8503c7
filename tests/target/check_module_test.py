#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds check_module.py objects that do not fit into a kernel's module, each for one reason, and one that does.

usage: check_module_test.py SKELETON C_COMPILER CPP_COMPILER FLAG...    the target's, with the product's flags for a
                                                                       kernel
"""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("check_module.py")
COMPILERS = []
SKELETON = []

# What the stack's C files of a module call of the layer.
CALLED = ("PMX_GetMode", "fgPMX_DisplayModeReady", "i4Pmx_Connect", "i4Pmx_Disconnect", "PMX_OsdEnabled",
          "PMX_OsdDisabled", "PMX_Uninit")
GOOD = "enum Size { SMALL, LARGE };\nextern \"C\" int iUse(int);\n" + "".join(
    f'extern "C" __attribute__((visibility("default"))) void {name}(void) {{}}\n' for name in CALLED)


class CheckModule(unittest.TestCase):
    def check(self, text=GOOD, flags=()):
        with tempfile.TemporaryDirectory() as scratch:
            sample = pathlib.Path(scratch) / "sample.cpp"
            sample.write_text(text)
            subprocess.run([*COMPILERS[1:], *flags, "-c", sample, "-o", sample.with_suffix(".o")], check=True)
            return subprocess.run([sys.executable, CHECKER, sample.with_suffix(".o"), COMPILERS[0], *SKELETON],
                                  capture_output=True, text=True, check=False)

    def refused(self, text, *arguments, **named):
        result = self.check(*arguments, **named)
        self.assertEqual(1, result.returncode, result.stdout + result.stderr)
        self.assertIn(text, result.stdout)

    def test_a_fitting_object_passes(self):
        result = self.check()
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)
        self.assertIn("fits into a kernel's module", result.stdout)

    def test_widths_that_a_linker_warns_of(self):
        self.refused("uses variable-size enums", flags=["-fshort-enums"])
        self.refused("uses 4-byte wchar_t", flags=["-fno-short-wchar"])

    def test_floating_point_in_registers(self):
        self.refused("uses VFP register arguments", flags=["-mfloat-abi=hard", "-mfpu=vfpv3-d16"])

    def test_what_no_kernel_offers(self):
        self.refused("__aeabi_uldivmod stays open",
                     GOOD + "unsigned long long ullOf; unsigned uBy; void vDivide() { ullOf /= uBy; }\n")
        self.refused("iUse stays open", GOOD + "int iAsk(); int iAsk() { return iUse(1); }\n")
        self.refused("PMX_OsdDisabled stays open", GOOD.replace("PMX_OsdDisabled", "PMX_Other"))

    def test_a_symbol_that_is_there_twice(self):
        self.refused("multiple definition of `x_timer_create'",
                     GOOD + 'extern "C" int x_timer_create() { return 0; }\n')


if __name__ == "__main__":
    SKELETON, COMPILERS = sys.argv[1:2], sys.argv[2:]
    unittest.main(argv=sys.argv[:1])
