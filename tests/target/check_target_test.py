#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds check_target.py objects for the target that must be refused, each for one reason, and one that must pass.

usage: check_target_test.py COMPILER FLAG...    the target's compiler, with the flags of the product
"""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("check_target.py")
COMPILER = []

GOOD = r"""
#define PUBLIC extern "C" __attribute__((visibility("default")))
extern "C" void Platform(int);
extern "C" int PlatformPrint(const char*, ...);
PUBLIC int Object;
PUBLIC void Operation(void);
int Object = 1;
static int Private(int i4Value) { return i4Value + Object; }
void Operation(void) { Platform(Private(2)); PlatformPrint("%d", 1); }
PUBLIC void Extra(void);
"""


class CheckTarget(unittest.TestCase):
    def check(self, extra="void Extra(void) {}", needed="", flags=(), options=()):
        with tempfile.TemporaryDirectory() as scratch:
            directory = pathlib.Path(scratch)
            (directory / "defined.txt").write_text("Operation\nObject\nExtra\n")
            (directory / "needed.txt").write_text("Platform\nPlatformPrint\n? memcpy\n? memset\n" + needed)
            (directory / "sample.cpp").write_text(GOOD + extra)
            subprocess.run([*COMPILER, *flags, "-fcallgraph-info=su,da", "-c", directory / "sample.cpp", "-o",
                            directory / "sample.o"], check=True)
            prefix = COMPILER[0].removesuffix("g++")
            return subprocess.run(
                [sys.executable, CHECKER, "--defined", directory / "defined.txt", "--needed", directory / "needed.txt",
                 "--objdump", prefix + "objdump", "--frames", directory, *options, directory / "sample.o"],
                capture_output=True, text=True, check=False)

    def refused(self, text, *arguments, **named):
        result = self.check(*arguments, **named)
        self.assertEqual(1, result.returncode, result.stdout + result.stderr)
        self.assertIn(text, result.stdout)

    def test_a_fit_object_passes(self):
        for flags in ([], ["-marm"], ["-O2"]):
            result = self.check(flags=flags)
            self.assertEqual(0, result.returncode, result.stdout + result.stderr)
            self.assertIn("fit for the target", result.stdout)

    def test_64_bit_division(self):
        self.refused("64-bit arithmetic out of line", needed="__aeabi_uldivmod\n",
                     extra="PUBLIC unsigned long long Wide; unsigned long long Wide; "
                           "void Extra(void) { Wide = Wide / (unsigned)Object; }")

    def test_division(self):
        self.refused("__aeabi_idiv: division out of line", needed="? __aeabi_idiv\n",
                     extra="void Extra(void) { Object = 100 / Object; }")

    def test_floating_point_in_software(self):
        self.refused("floating point in software", needed="? __aeabi_fmul\n? __aeabi_i2f\n? __aeabi_f2iz\n",
                     extra="void Extra(void) { Object = (int)((float)Object * 1.5f); }")

    def test_floating_point_unit(self):
        hard = ["-mfloat-abi=softfp", "-mfpu=vfpv3-d16"]
        extra = "void Extra(void) { Object = (int)((float)Object * 1.5f); }"
        self.refused("Extra: vmul.f32", extra=extra, flags=hard)
        self.refused("Extra: vmul.f32", extra=extra, flags=hard, options=["--hard-float-calls"])
        self.refused("Extra: vmul.f32", extra=extra, flags=[*hard, "-marm"])

    def test_attributes_of_the_floating_point_unit(self):
        self.refused("Tag_FP_arch: VFPv3-D16: not soft float", flags=["-mfloat-abi=softfp", "-mfpu=vfpv3-d16"])

    def test_floating_point_in_registers_is_the_systems_matter(self):
        result = self.check(flags=["-mfloat-abi=hard", "-mfpu=vfpv3-d16", "-mgeneral-regs-only"],
                            options=["--hard-float-calls"])
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)

    def test_an_unlisted_helper(self):
        self.refused("__aeabi_memcpy: needed, but not listed",
                     extra='extern "C" void __aeabi_memcpy(void); void Extra(void) { __aeabi_memcpy(); }')
        self.refused("__aeabi_memcpy: a helper of the compiler's run-time library", needed="__aeabi_memcpy\n",
                     extra='extern "C" void __aeabi_memcpy(void); void Extra(void) { __aeabi_memcpy(); }')

    def test_widths_of_a_kernel(self):
        self.refused("Tag_ABI_enum_size: small, and int in a kernel", flags=["-fshort-enums"])
        self.refused("Tag_ABI_PCS_wchar_t: 4, and 2 in a kernel", flags=["-fno-short-wchar"])
        result = self.check(flags=["-fshort-enums", "-fno-short-wchar"], options=["--hard-float-calls"])
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)

    def test_unwind_tables(self):
        self.refused(".ARM.exidx: unwind tables", flags=["-funwind-tables"])
        self.refused("__aeabi_unwind_cpp_pr0: needed, but not listed", flags=["-funwind-tables"])
        self.refused("__aeabi_unwind_cpp_pr0: unwinding", flags=["-funwind-tables"],
                     needed="__aeabi_unwind_cpp_pr0\n")

    def test_unwind_tables_where_they_are_asked_for(self):
        tables, pr0 = ["-marm", "-funwind-tables"], ["--unwinder", "__aeabi_unwind_cpp_pr0"]
        result = self.check(flags=tables, options=pr0)
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)
        self.refused("__aeabi_unwind_cpp_pr0: never called", options=pr0)
        self.refused("unwind tables with 0 entries, and 2 functions", options=pr0)
        self.refused("unwind tables with 2 entries, and 3 functions", flags=tables, options=pr0,
                     extra='void Extra(void) {} asm(".type silent, %function\\n silent: bx lr");')

    def test_no_other_routine_of_the_unwinder(self):
        tables, pr0 = ["-marm", "-funwind-tables"], ["--unwinder", "__aeabi_unwind_cpp_pr0"]
        pr1 = ["--unwinder", "__aeabi_unwind_cpp_pr1"]
        large = ('extern "C" void Use(char*, ...); void Extra(void) {} extern "C" void Many(const char*, ...); '
                 "static void Large(const char*, ...) { char ac[520]; Use(ac); } "
                 "void Many(const char*, ...) { Large(nullptr); }")
        options = [*pr0, "--budget", "Large=600", "--budget", "Many=600"]
        self.refused("__aeabi_unwind_cpp_pr1: unwinding", extra=large, needed="Use\n", flags=tables, options=options)
        self.refused("__aeabi_unwind_cpp_pr1: needed, but not listed", extra=large, needed="Use\n", flags=tables,
                     options=options)
        self.refused("__aeabi_unwind_cpp_pr1: never called", flags=tables, options=[*pr0, *pr1])
        self.refused(".eh_frame: unwind tables", flags=tables, options=pr0,
                     extra='void Extra(void) {} asm(".section .eh_frame, \\"a\\"; .word 0; .text");')

    def test_global_offset_table(self):
        self.refused("relocation R_ARM_GOT_BREL to Platform", flags=["-fPIC"],
                     extra="PUBLIC void (*pf)(int); void (*pf)(int); void Extra(void) { pf = Platform; }")

    def test_thread_local(self):
        self.refused("thread-local", extra="static thread_local int Mine; void Extra(void) { Object = ++Mine; }")

    def test_code_that_runs_before_the_first_call(self):
        self.refused("code that runs before the first call",
                     extra="void Extra(void) {} __attribute__((constructor)) static void Early() { Platform(3); }")

    def test_weak_symbol(self):
        self.refused("Weak: weak symbol", extra="void Extra(void) {} "
                                                "PUBLIC void Weak(void); __attribute__((weak)) void Weak(void) {}")

    def test_frame_over_its_budget(self):
        extra = 'extern "C" void Use(char*); void Extra(void) { char ac[300]; Use(ac); }'
        self.refused("Extra: frame of 31", extra=extra, needed="Use\n")
        result = self.check(extra=extra, needed="Use\n", options=["--budget", "Extra=320"])
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)

    def test_frame_of_a_variadic_function(self):
        self.refused("Many: frame of", needed="Use\n",
                     extra='extern "C" void Use(char*); void Extra(void) {} '
                           "extern \"C\" void Many(const char*, ...); "
                           "void Many(const char*, ...) { char ac[300]; Use(ac); }")

    def test_frame_of_no_fixed_size(self):
        self.refused("Extra: a frame of no fixed size", needed="Use\n",
                     extra='extern "C" void Use(char*); '
                           "void Extra(void) { Use((char*)__builtin_alloca((unsigned)Object)); }")

    def test_a_budget_for_nobody(self):
        self.refused("Nobody: has a frame budget, and does not exist", options=["--budget", "Nobody=1"])

    def test_no_frames(self):
        with tempfile.TemporaryDirectory() as empty:
            self.refused("no stack frames", options=["--frames", empty])

    def test_an_object_that_is_not_there(self):
        result = subprocess.run([sys.executable, CHECKER, "--defined", "/dev/null", "--needed", "/dev/null",
                                 "--objdump", "objdump", "absent.o"], capture_output=True, text=True, check=False)
        self.assertNotEqual(0, result.returncode)
        self.assertIn("absent.o: is not there", result.stderr)


if __name__ == "__main__":
    COMPILER = sys.argv[1:]
    unittest.main(argv=sys.argv[:1])
