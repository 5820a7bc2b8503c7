#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds check_headers.py headers that must be refused, each for one reason, and one that must pass.

usage: check_headers_test.py OPTION...    the compilers, as for check_headers.py
"""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("check_headers.py")
COMPILERS = []

GOOD = """#ifndef A_H
#define A_H
#if defined(__KERNEL__) && !defined(__cplusplus)
#include <linux/types.h>
#else
#include <stddef.h>
#endif
typedef enum { ONE = 1 } NUMBER_T;
int iNumber(NUMBER_T eNumber, size_t zSize);
#endif
"""


class CheckHeaders(unittest.TestCase):
    def check(self, only="", **headers):
        with tempfile.TemporaryDirectory() as directory:
            for name, text in headers.items():
                pathlib.Path(directory, name + ".h").write_text(text)
            return subprocess.run([sys.executable, CHECKER, *COMPILERS, f"--only={only}", directory],
                                  capture_output=True, text=True, check=False)

    def refused(self, text, variant, **headers):
        result = self.check(variant, **headers)
        self.assertEqual(1, result.returncode, result.stdout + result.stderr)
        self.assertIn(text, result.stdout)
        self.assertIn(variant, result.stdout)

    def test_a_good_header_passes(self):
        result = self.check(a=GOOD)
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)
        self.assertIn("1 headers", result.stdout)

    def test_not_self_contained(self):
        self.refused("b.h: ", "-std=c11", a=GOOD, b="int iOther(size_t zSize);\n")

    def test_not_guarded(self):
        self.refused("a.h twice: ", "-std=c++20", a="typedef struct { int iOne; } ONE_T;\n")

    def test_not_valid_c(self):
        self.refused("a.h: ", "-x c ", a="#ifndef A_H\n#define A_H\nenum E : int { ONE };\n#endif\n")

    def test_not_valid_cpp(self):
        self.refused("a.h: ", "-x c++", a="#ifndef A_H\n#define A_H\nint iNew(int new);\n#endif\n")

    def test_needs_a_hosted_header(self):
        self.refused("a.h: ", "--target=arm-none-eabi", a="#ifndef A_H\n#define A_H\n#include <stdio.h>\n#endif\n")

    def test_needs_the_compilers_header_in_a_kernel(self):
        self.refused("a.h: ", "__KERNEL__", a="#ifndef A_H\n#define A_H\n#include <stddef.h>\n#endif\n")

    def test_needs_a_header_that_older_kernels_lack(self):
        guarded = "#ifndef A_H\n#define A_H\n#ifdef __KERNEL__\n{}\n#endif\nextern int iOne;\n#endif\n"
        self.refused("a.h: ", "/old_kernel", a=guarded.format("#include <linux/stdarg.h>"))
        result = self.check(a=guarded.format("#include <linux/types.h>"))
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)

    def test_needs_the_compilers_variable_arguments_in_a_kernel_of_today(self):
        self.refused("a.h: ", "/kernel", a="#ifndef A_H\n#define A_H\n#include <stdarg.h>\n#endif\n")

    def test_collides_with_another_header(self):
        self.refused("all together", "", a=GOOD, b="#ifndef B_H\n#define B_H\nvoid iNumber(void);\n#endif\n")

    def test_wrong_width_on_the_32_bit_target(self):
        self.refused("a.h: ", "--target=arm-none-eabi", a="#ifndef A_H\n#define A_H\n#ifdef __cplusplus\n"
                     'static_assert(sizeof(long) == 8, "");\n#endif\n#endif\n')

    def test_no_headers_at_all(self):
        self.assertIn("no headers found", self.check().stderr)


if __name__ == "__main__":
    COMPILERS = sys.argv[1:]
    unittest.main(argv=sys.argv[:1])
