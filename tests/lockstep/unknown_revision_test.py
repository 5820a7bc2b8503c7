#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""A revision that the repository does not have is refused.

usage: unknown_revision_test.py DIRECTORY
"""

import pathlib
import subprocess
import sys
import unittest

MADE = pathlib.Path(sys.argv.pop(1)).resolve()


class Unknown(unittest.TestCase):
    def test_an_unknown_revision_is_refused(self):
        script = pathlib.Path(__file__).with_name("compare_revisions.py")
        done = subprocess.run([sys.executable, script, "--made", MADE, "no-such-revision"], capture_output=True,
                              text=True, check=False)
        self.assertEqual(1, done.returncode)
        self.assertRegex(done.stderr, "^compare: ")


if __name__ == "__main__":
    unittest.main()
