#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""static.py over faults that it has to find, and files that it has to choose."""

import pathlib
import sys
import tempfile
import unittest
import unittest.mock

sys.dont_write_bytecode = True

import static  # noqa: E402

BEHIND_VARIABLE_ARGUMENTS = """
#define SAY(text, ...) say(text __VA_OPT__(, ) __VA_ARGS__)
#define KEEP(value, ...) keep(__VA_ARGS__ __VA_OPT__(, ) value)
int beyond(int number)
{
    int few[2] = { 0, number };
    SAY("nothing");
    SAY("a number", number);
    KEEP(1, 2);
    return few[2];
}
"""
FREED_TWICE = "#include <stdlib.h>\nvoid twice(void *memory)\n{\n    free(memory);\n    free(memory);\n}\n"


class Static(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.root = pathlib.Path(folder.name).resolve() / "a tree"
        for folder in (*static.INCLUDED, "board"):
            (self.root / folder).mkdir(parents=True, exist_ok=True)

    def write(self, name, text):
        (self.root / name).write_text(text, encoding="utf-8")
        return pathlib.Path(name)

    def cppcheck(self, text, suffix=".cpp"):
        file = self.write(f"board/fault{suffix}", static.readable(text))
        return static.cppcheck([file], self.root, suffix, is_all=False)

    def test_a_fault_behind_variable_arguments_is_found_at_its_line(self):
        for suffix in (".cpp", ".c"):
            self.assertIn(f"board/fault{suffix}:10: error: ", self.cppcheck(BEHIND_VARIABLE_ARGUMENTS, suffix))
            self.assertEqual("", self.cppcheck(BEHIND_VARIABLE_ARGUMENTS.replace("few[2];", "few[1];"), suffix))

    def test_what_is_suppressed_and_not_found_any_more_is_told(self):
        file = self.write("board/files.cpp", "int none();\n")
        self.assertIn("Unmatched suppression: uninitMemberVar", static.cppcheck([file], self.root, ".cpp", True))
        self.assertEqual("", static.cppcheck([file], self.root, ".cpp", False))

    def test_no_file_is_no_finding(self):
        self.assertEqual("", static.cppcheck([], self.root, ".c", True))

    def analyzed(self, text):
        file = self.root / self.write("board/fault.c", text)
        return static.analyzed({"directory": str(self.root), "command":
                                f"/usr/bin/ccache /usr/bin/cc -fsanitize=address -o fault.o -c '{file}'"})

    def test_the_analyzer_finds_what_is_freed_twice(self):
        self.assertIn("-Wanalyzer-double-free", self.analyzed(FREED_TWICE))
        self.assertEqual("", self.analyzed(FREED_TWICE.replace("    free(memory);\n", "", 1)))
        self.assertFalse((self.root / "fault.o").exists())

    def test_c_files_of_the_build(self):
        names = "board/a.c", "board/a.c", "build/made.c", "board/b.cpp"
        commands = [{"file": str(self.root / name)} for name in names]
        source = {pathlib.Path("board/a.c")}
        self.assertEqual([commands[1]], static.c_commands(commands, source, self.root, False))
        self.assertEqual([commands[1], commands[2]], static.c_commands(commands, source, self.root, True))

    def chosen(self, *differing):
        files = [pathlib.Path(name) for name in ("board/a.cpp", "board/a.h", "board/b.c")]
        answer = {self.root / name if isinstance(name, str) else name for name in differing}, "main"
        with unittest.mock.patch.object(static.lint, "changed", return_value=answer):
            return [file.name for file in static.chosen(files, self.root, False)[0]]

    def test_what_differs_is_looked_at(self):
        self.assertEqual([], self.chosen())
        self.assertEqual([], self.chosen("docs/a.md"))
        self.assertEqual(["b.c"], self.chosen("board/b.c"))
        self.assertEqual(["a.cpp", "b.c"], self.chosen("board/a.h"))
        self.assertEqual(["a.cpp", "b.c"], self.chosen(static.SUPPRESSED))

    def test_without_a_main_line_everything(self):
        with unittest.mock.patch.object(static.lint, "changed", side_effect=static.lint.NothingToCompareWith("why")):
            found, why = static.chosen([pathlib.Path("board/a.cpp")], self.root, False)
        self.assertEqual(([pathlib.Path("board/a.cpp")], "all 1 files, since why"), (found, why))


if __name__ == "__main__":
    unittest.main()
