#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Feeds calling.py documents that are right, and documents with each kind of mistake."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECKER = pathlib.Path(__file__).with_name("calling.py")

# A tool that shows every command, a call for those that begin with PMX_, and refuses the command "wrong".
TOOL = '''#!/usr/bin/env python3
import sys
if sys.argv[1:] == ["ops", "--json", "PMX_Get"]:
    print('[{"name": "PMX_Get", "brief": "Ask.", "example_needs": ["quit"], "example": "PMX_Get 2"}]')
    sys.exit()
for number, line in enumerate(sys.stdin.read().splitlines(), start=1):
    print("> " + line)
    if line == "wrong":
        sys.exit(f"-:{number}: no such command: wrong")
    if line.startswith("print "):
        print(line.split('"')[1].replace("\\\\n", "\\n"), end="")
    if line.startswith("PMX_"):
        print("  | " + line.split()[0] + " ")
        print("        2.000  Send({a=1, b=2}, 1)")
        print("        2.000    Nested(Some_argument, Another_argument,")
        print("                     \\"a, text\\") = 0")
        print("  = 1")
'''

SHOWN = '''> PMX_Set 1
  | PMX_Set
  Send({a=1, b=2}, 1)
    Nested(Some_argument, Another_argument, "a, text") = 0
  = 1
'''


def block(body, kind="pmx"):
    return f"Text.\n\n```{kind}\n{body}```\n"


class Calling(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.root = pathlib.Path(directory.name)
        self.tool = self.root / "tool"
        self.tool.write_text(TOOL)
        self.tool.chmod(0o755)
        self.document = self.root / "calling.md"
        self.header = self.root / "offered.h"

    def check(self, text, *options):
        self.document.write_text(text)
        result = subprocess.run([sys.executable, CHECKER, *options, self.document, self.tool], capture_output=True,
                                text=True, check=False)
        return result.returncode, result.stdout + result.stderr

    def test_an_example_that_shows_what_the_run_shows(self):
        code, text = self.check(block(SHOWN) + block("quit\n", "sh"))
        self.assertEqual(0, code, text)

    def test_a_line_that_differs_is_missing_or_is_too_many(self):
        for body in (SHOWN.replace("= 1", "= 2"), SHOWN.replace("  = 1\n", ""), SHOWN + "  = 1\n",
                     SHOWN.replace("  | PMX_Set\n", "")):
            code, text = self.check(block(SHOWN) + block(body))
            self.assertEqual(1, code, text)
            self.assertIn("calling.md:12: the run shows something else", text)

    def test_dots_stand_for_any_lines(self):
        for body in ("> PMX_Set 1\n  ...\n", "> PMX_Set 1\n  ...\n  = 1\n", "> PMX_Set 1\n  | PMX_Set\n  ...\n"):
            self.assertEqual(0, self.check(block(body))[0], body)
        self.assertEqual(1, self.check(block("> PMX_Set 1\n  ...\n  = 2\n"))[0])

    def test_a_record_shown_twice_is_shown_once(self):
        twice = SHOWN + SHOWN.replace("{a=1, b=2}", "{as before}")
        self.assertEqual(0, self.check(block(twice))[0])
        self.assertEqual(1, self.check(block(SHOWN + SHOWN))[0])

    def test_the_prologue_runs_before_examples_that_do_not_power_on(self):
        code, text = self.check(block("> wrong\n", "pmx prologue") + block("> power-on\n" + SHOWN))
        self.assertEqual(0, code, text)
        code, text = self.check(block("> wrong\n", "pmx prologue") + block(SHOWN))
        self.assertEqual(1, code, text)
        self.assertIn("no such command: wrong", text)

    def test_a_command_that_fails_is_found_in_its_example(self):
        code, text = self.check(block(SHOWN) + block("> wrong\n") + block(SHOWN))
        self.assertEqual(1, code, text)
        self.assertIn("calling.md:12: -:", text)

    def test_nothing_to_check_is_a_mistake(self):
        for text in ("Text.\n", block("> PMX_Set 1\n", "pmx prologue"), block("no command\n")):
            self.assertEqual(1, self.check(text)[0], text)

    def test_fix_writes_what_the_run_shows_and_nothing_else(self):
        kept = block("> power-on\n", "pmx prologue") + block("> PMX_Set 1\n  ...\n") + block("quit\n", "sh")
        code, text = self.check(kept + block("> PMX_Set 1\n  = 7\n"), "--fix")
        self.assertEqual(0, code, text)
        self.assertEqual(kept + block(SHOWN), self.document.read_text())

    def test_every_function_of_the_header_is_called(self):
        self.header.write_text("PMX_API UINT32 PMX_Set(UCHAR ucId);\nPMX_API const CHAR* PMX_Get(void);\n")
        code, text = self.check(block(SHOWN), "--header", self.header)
        self.assertEqual(1, code, text)
        self.assertIn("no example calls PMX_Get", text)
        self.assertNotIn("PMX_Set\n", text)
        self.assertEqual(0, self.check(block(SHOWN), "--header", self.header, "--fix")[0])
        shown = SHOWN.replace("PMX_Set 1", "PMX_Get 2").replace("PMX_Set", "PMX_Get")
        self.assertEqual(block(SHOWN) + "\n`PMX_Get`: Ask.\n\n```pmx\n> power-on\n> quit\n" + shown + "```\n",
                         self.document.read_text())
        self.header.write_text("PMX_API UINT32 PMX_Set(UCHAR ucId);\n")
        self.assertEqual(0, self.check(block(SHOWN), "--header", self.header)[0])
        self.header.write_text("\n")
        self.assertEqual(1, self.check(block(SHOWN), "--header", self.header)[0])


if __name__ == "__main__":
    unittest.main()
