#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Has the manual page written for small tools, and holds it against what their helps say; mandoc must like it."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

WRITER = pathlib.Path(__file__).resolve().parents[2] / "tools/pmxboard/man_page.py"
OVERVIEW = """A small tool.
Usage: tool [OPTIONS] SUBCOMMAND

Options:
  -h,--help                   Help
  --version                   Version

Subcommands:
  walk                        Walk.

Examples:
  tool walk
      walk
"""
WALK = """Walk
                              somewhere.
Usage: tool walk [OPTIONS] WHERE [WITH...]

Positionals:
  WHERE TEXT REQUIRED         Where to
  WITH ...                    With whom, and
                              why not

Options:
  -h,--help                   Help
  -f,--far                    Farther. Much farther
  --pace,--speed SLOW|FAST ... Needs: --far
                              Pace

Examples:
  printf 'there\\n' | tool walk -
      walk there

Walking is healthy.
Exit codes: 0 there, 1 lost.
"""


class ManPage(unittest.TestCase):
    def written(self, overview=OVERVIEW, walk=WALK):
        """(exit code, what was said, page, what mandoc says of it)"""
        with tempfile.TemporaryDirectory() as directory:
            root = pathlib.Path(directory)
            (root / "overview").write_text(overview)
            (root / "walk").write_text(walk)
            (root / "tool").write_text(f'#!/bin/sh\nif [ "$1" = walk ]; then cat "{root}/walk"\n'
                                       f'else cat "{root}/overview"; fi\n')
            (root / "tool").chmod(0o755)
            page = root / "tool.1"
            result = subprocess.run([sys.executable, WRITER, root / "tool", "2026-11-02", page], capture_output=True,
                                    text=True, check=False)
            if result.returncode != 0:
                return result.returncode, result.stderr, "", ""
            lint = subprocess.run(["mandoc", "-T", "lint", "-W", "warning", page], capture_output=True, text=True,
                                  check=False)
            return 0, result.stderr, page.read_text(), lint.stdout + lint.stderr

    def test_tells_what_the_helps_tell(self):
        code, said, page, lint = self.written()
        self.assertEqual((0, "", ""), (code, said, lint))
        for part in (".Dd November 2, 2026\n", ".Nd a small tool\n",
                     ".Cm walk\n.Op Fl f\n.Op Fl -pace Ar SLOW|FAST\n.Ar WHERE\n.Op Ar WITH ...\n",
                     ".Ss walk\nWalk somewhere.\n", ".It Ar WHERE\nWhere to.\n",
                     ".It Ar WITH\nWith whom, and why not.\n", ".It Fl f , Fl -far\nFarther.\nMuch farther.\n",
                     ".It Fl -pace Ar SLOW|FAST , Fl -speed Ar SLOW|FAST\nPace; with --far only.\n",
                     ".Pp\nWalking is healthy.\n", ".It Cm walk\n0 there, 1 lost.\n",
                     "Walk there.\n.Bd -literal -offset indent\n$ printf 'there\\en' | tool walk -\n.Ed\n",
                     ".It Fl -version\nVersion.\n"):
            self.assertIn(part, page)

    def test_refuses_what_it_cannot_read(self):
        for overview, walk, message in ((OVERVIEW, WALK.replace("  -f,--far", " -f,--far"), " -f,--far"),
                                        (OVERVIEW, WALK.replace("      walk there", "   walk there"), "walk there"),
                                        (OVERVIEW, WALK.replace("Usage:", "Use:"), "Walk"),
                                        (OVERVIEW.replace("Subcommands", "Commands"), WALK, "no sub-commands")):
            code, said, _, _ = self.written(overview, walk)
            self.assertEqual(1, code, said)
            self.assertIn("in a form that is not known here", said)
            self.assertIn(message, said)


if __name__ == "__main__":
    unittest.main()
