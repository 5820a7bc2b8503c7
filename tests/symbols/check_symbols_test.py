#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds check_symbols.py objects that must be refused, each for one reason, and one that must pass.

usage: check_symbols_test.py COMPILER FLAG...    with the flags of the product
"""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("check_symbols.py")
COMPILER = []

GOOD = r"""
#define PUBLIC extern "C" __attribute__((visibility("default")))
extern "C" void Platform(int);
PUBLIC int Object;
PUBLIC void Operation(void);
int Object = 1;
static int Private(int i4Value) { return i4Value + Object; }
void Operation(void) { Platform(Private(2)); }
"""


class CheckSymbols(unittest.TestCase):
    def check(self, source, defined="Operation\nObject\n", needed="Platform\n", extra_flags=()):
        with tempfile.TemporaryDirectory() as directory:
            directory = pathlib.Path(directory)
            (directory / "defined.txt").write_text(defined)
            (directory / "needed.txt").write_text(needed)
            (directory / "sample.cpp").write_text(source)
            objects = [directory / name for name in ("sample.o", "core.o", "if.o")]
            for command in ([*COMPILER, *extra_flags, "-c", directory / "sample.cpp", "-o", objects[0]],
                            ["ld", "-r", "-o", objects[1], objects[0]],
                            ["objcopy", "--localize-hidden", objects[1], objects[2]]):
                subprocess.run(command, check=True)
            return subprocess.run(
                [sys.executable, CHECKER, "--defined", directory / "defined.txt", "--needed",
                 directory / "needed.txt", objects[2]], capture_output=True, text=True, check=False)

    def refused(self, text, source, **lists):
        result = self.check(source, **lists)
        self.assertEqual(1, result.returncode, result.stdout + result.stderr)
        self.assertIn(text, result.stdout)

    def test_a_clean_object_passes(self):
        result = self.check(GOOD)
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)
        self.assertIn("defines 2 symbols", result.stdout)

    def test_optional_names_may_be_absent(self):
        result = self.check(GOOD, needed="Platform\n? memcpy\n")
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)

    def test_no_other_mark(self):
        result = self.check(GOOD, defined="Operation\nObject\n- Later\n")
        self.assertIn("neither a name nor a comment", result.stderr)

    def test_hidden_names_become_local(self):
        result = self.check(GOOD + "int Hidden(int); int Hidden(int i4) { return i4; }")
        self.assertEqual(0, result.returncode, result.stdout + result.stderr)

    def test_extra_definition(self):
        self.refused("Extra: defined, but not listed", GOOD + "PUBLIC void Extra(void); void Extra(void) {}")

    def test_extra_object(self):
        self.refused("Extra: defined, but not listed", GOOD + "PUBLIC int Extra; int Extra;")

    def test_missing_definition(self):
        self.refused("Absent: not defined, but listed", GOOD, defined="Operation\nObject\nAbsent\n")

    def test_extra_need(self):
        self.refused("Extra: needed, but not listed",
                     GOOD + "extern \"C\" void Extra(void); PUBLIC void Object2(void); void Object2(void) { Extra(); }",
                     defined="Operation\nObject\nObject2\n")

    def test_need_never_called(self):
        self.refused("Absent: never called, but listed", GOOD, needed="Platform\nAbsent\n")

    def test_weak_symbol(self):
        self.refused("Operation: weak symbol",
                     GOOD.replace("(void);", "(void) __attribute__((weak));"))

    def test_inline_function_in_a_section_group(self):
        self.refused("section group",
                     GOOD + "inline __attribute__((noinline)) int Shared(int i4) { return i4 * Object; }"
                     "PUBLIC int User(int); int User(int i4) { return Shared(i4); }",
                     defined="Operation\nObject\nUser\n")

    def test_static_constructor(self):
        self.refused("code that runs before the first call",
                     GOOD + "extern \"C\" int Number(void); int Early = Number();", needed="Platform\nNumber\n")

    def test_constructor_function(self):
        self.refused("code that runs before the first call",
                     GOOD + "__attribute__((constructor)) static void Early(void) { Platform(3); }")

    def test_position_independent_code(self):
        self.refused("relocation R_X86_64_", GOOD + "extern \"C\" int Far; PUBLIC int Near(void);"
                     "int Near(void) { return Far; }", defined="Operation\nObject\nNear\n",
                     needed="Platform\nFar\n", extra_flags=["-fpic"])

    def test_thread_local_data(self):
        self.refused("thread-local symbol", GOOD + "thread_local int Mine; PUBLIC int* Near(void);"
                     "int* Near(void) { return &Mine; }", defined="Operation\nObject\nNear\n")
        self.refused("thread-local section", GOOD + "thread_local int Mine; PUBLIC int* Near(void);"
                     "int* Near(void) { return &Mine; }", defined="Operation\nObject\nNear\n")

    def test_common_symbol(self):
        self.refused("Bss: common symbol", GOOD + "asm(\".comm Bss,4,4\");", defined="Operation\nObject\nBss\n")

    def test_no_object(self):
        lists = ["--defined", "/dev/null", "--needed", "/dev/null"]
        result = subprocess.run([sys.executable, CHECKER, *lists, "absent.o"], capture_output=True, text=True,
                                check=False)
        self.assertNotEqual(0, result.returncode)
        self.assertIn("absent.o: cannot be read", result.stderr)

    def test_a_list_with_a_malformed_line(self):
        result = self.check(GOOD, defined="Operation Object\n")
        self.assertIn("neither a name nor a comment", result.stderr)
        self.assertNotEqual(0, result.returncode)

    def test_a_list_with_a_name_twice(self):
        result = self.check(GOOD, defined="Operation\nObject\n? Object\n")
        self.assertIn("listed twice: Object", result.stderr)
        self.assertNotEqual(0, result.returncode)


if __name__ == "__main__":
    COMPILER = sys.argv[1:]
    unittest.main(argv=sys.argv[:1])
