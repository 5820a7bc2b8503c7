#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What a script renews in the tree is replaced whole or not at all."""

import os
import pathlib
import resource
import signal
import stat
import subprocess
import sys
import tempfile
import time
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]
MODULES = ROOT / "cmake"
WRITE = "import sys; sys.dont_write_bytecode = True; import whole_file; whole_file.write(sys.argv[1], {})"


class WholeFile(unittest.TestCase):
    def setUp(self):
        kept = tempfile.TemporaryDirectory()
        self.addCleanup(kept.cleanup)
        self.place = pathlib.Path(kept.name)
        self.file = self.place / "file"
        self.file.write_text("before")

    def start(self, text, path=None, **options):
        return subprocess.Popen([sys.executable, "-c", WRITE.format(text), path or self.file], stderr=subprocess.PIPE,
                                env={**os.environ, "PYTHONPATH": str(MODULES)}, **options)

    def is_alone(self):
        self.assertEqual([self.file], [path for path in self.place.iterdir() if path.name.startswith((".", "file"))])

    def test_it_is_replaced_and_keeps_its_mode_and_links(self):
        self.file.chmod(0o640)
        link = self.place / "link"
        link.symlink_to(self.file)
        self.assertEqual((None, b""), self.start("'aft\\u00e4r\\n'", link).communicate())
        self.assertTrue(link.is_symlink())
        self.assertEqual("aft\u00e4r\n", self.file.read_text(encoding="utf-8"))
        self.assertEqual(0o640, stat.S_IMODE(self.file.stat().st_mode))
        self.is_alone()

    def test_a_new_file_has_the_usual_mode(self):
        self.file.unlink()
        self.assertEqual((None, b""), self.start("'new'", preexec_fn=lambda: os.umask(0o027)).communicate())
        self.assertEqual(0o640, stat.S_IMODE(self.file.stat().st_mode))

    def test_a_full_disk_leaves_it(self):
        def limit():
            signal.signal(signal.SIGXFSZ, signal.SIG_IGN)
            resource.setrlimit(resource.RLIMIT_FSIZE, (100, 100))
        failed = self.start("'x' * 1000", preexec_fn=limit)
        self.assertIn(b"File too large", failed.communicate()[1])
        self.assertEqual((1, "before"), (failed.returncode, self.file.read_text()))
        self.is_alone()

    def test_killed_at_any_moment_it_is_whole(self):
        for number in range(6):
            writer = self.start("'x' * 5_000_000")
            time.sleep(0.02 * number)
            writer.kill()
            writer.communicate()
            self.assertIn(self.file.read_text(), ("before", "x" * 5_000_000))

    def test_whoever_renews_a_file_writes_it_so(self):
        listed = subprocess.run(["git", "-C", ROOT, "ls-files", "*.py"], capture_output=True, text=True, check=True)
        renewing = [name for name in listed.stdout.split() if not name.endswith("_test.py")
                    and any(word in (ROOT / name).read_text(encoding="utf-8") for word in ("--fix", "--renew"))]
        self.assertLess(5, len(renewing))
        for name in renewing:
            self.assertNotIn(".write_text(", (ROOT / name).read_text(encoding="utf-8"), name)


if __name__ == "__main__":
    unittest.main()
