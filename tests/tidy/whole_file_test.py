#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What a script renews in the tree is replaced whole or not at all."""

import os
import pathlib
import re
import resource
import signal
import stat
import subprocess
import sys
import tempfile
import unittest

ROOT = pathlib.Path(__file__).resolve().parents[2]
MODULES = ROOT / "cmake"
WRITE = "import sys; sys.dont_write_bytecode = True; import whole_file; whole_file.write(sys.argv[1], {})"
# As far as one line tells.
WRITING = re.compile(r"""\.write_(?:text|bytes)\(|\bopen\((?:[^()]|\([^()]*\))*["'][wax]b?\+?["']""")


class WholeFile(unittest.TestCase):
    def setUp(self):
        kept = tempfile.TemporaryDirectory()
        self.addCleanup(kept.cleanup)
        self.place = pathlib.Path(kept.name)
        self.file = self.place / "file"
        self.file.write_text("before")

    def start(self, text, path=None, before="", **options):
        return subprocess.Popen([sys.executable, "-c", before + WRITE.format(text), path or self.file],
                                stderr=subprocess.PIPE, env={**os.environ, "PYTHONPATH": str(MODULES)}, **options)

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

    def test_killed_when_all_is_written_it_is_as_it_was(self):
        for last in ("fsync", "replace"):  # what is still to come
            stopping = f"import os; os.{last} = lambda *_: os.kill(os.getpid(), {int(signal.SIGSTOP)}); "
            writer = self.start("'x' * 5_000_000", before=stopping)
            self.addCleanup(writer.kill)
            _, status = os.waitpid(writer.pid, os.WUNTRACED)
            self.assertTrue(os.WIFSTOPPED(status), f"{last} is not called")
            beside, = (path for path in self.place.iterdir() if path != self.file)
            self.assertEqual((5_000_000, "before"), (beside.stat().st_size, self.file.read_text()), last)
            writer.kill()
            writer.communicate()
            self.assertEqual("before", self.file.read_text(), last)
            beside.unlink()

    def test_whoever_renews_a_file_writes_it_so(self):
        listed = subprocess.run(["git", "-C", ROOT, "ls-files", "*.py"], capture_output=True, text=True, check=True)
        sources = {name: (ROOT / name).read_text(encoding="utf-8") for name in listed.stdout.split()
                   if not name.endswith("_test.py")}
        renewing = {name: source for name, source in sources.items()
                    if any(word in source for word in ("--fix", "--renew"))}
        self.assertLess(5, len(renewing))
        for name, source in renewing.items():
            self.assertIsNone(WRITING.search(source), name)

    def test_what_writes_is_found(self):
        for line in ("path.write_text(text)", "path.write_bytes(b'')", "open(path, 'w')", 'path.open("wb")',
                     'open(path(1), mode="w", encoding="utf-8")'):
            self.assertTrue(WRITING.search(line), line)
        for line in ("open(path)", 'open(path, "rb")', "whole_file.write(path, text)", 'open(path).read(), "w"'):
            self.assertFalse(WRITING.search(line), line)


if __name__ == "__main__":
    unittest.main()
