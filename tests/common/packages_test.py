#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Where packages are looked for follows from the package sources of the machine."""

import pathlib
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import packages  # noqa: E402

RELEASES = ["version,codename,series,created,release,eol", "11,Bullseye,bullseye,2019-07-06,2021-08-14,2024-08-14",
            "12,Bookworm,bookworm,2021-08-14,2023-06-10,2026-06-10", "13,Trixie,trixie,2023-06-10",
            ",Sid,sid,1993-08-16", ",Experimental,experimental,1993-08-16"]


class Releases(unittest.TestCase):
    def test_the_machines_own_is_the_first_of_debian(self):
        self.assertEqual(("http://mirror/debian", "bookworm"), packages.release_of(
            "http://other/ stable Other\nhttp://mirror/debian bookworm-updates Debian\n"
            "http://mirror/debian bookworm Debian\nhttp://second/debian trixie Debian\n"))
        self.assertIsNone(packages.release_of("http://other/ stable Other\n"))

    def test_the_next_one_has_a_number(self):
        self.assertEqual("bookworm", packages.release_after("bullseye", RELEASES))
        self.assertEqual("trixie", packages.release_after("bookworm", RELEASES))
        self.assertIsNone(packages.release_after("trixie", RELEASES))
        self.assertIsNone(packages.release_after("sid", RELEASES))


class Kept(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.folder = pathlib.Path(directory.name).resolve()
        self.fetched = 0

    def fetch(self, _):
        self.fetched += 1
        return f"version {self.fetched}"

    def test_it_is_fetched_once_for_each_wish(self):
        for wish, version in (("a", 1), ("a", 1), ("b", 2), ("b", 2)):
            self.assertEqual((self.folder, f"version {version}"), packages.kept(self.folder, wish, self.fetch))

    def test_a_note_that_was_cut_short_is_none(self):
        for text in ("", f"{self.folder}\n", f"{self.folder}\nversion 1\n"):
            (self.folder / packages.USABLE).write_text(text, encoding="utf-8")
            before = self.fetched
            packages.kept(self.folder, "a", self.fetch)
            self.assertEqual(before + 1, self.fetched)

    def test_a_broken_archive_is_told(self):
        archive = self.folder / "broken.deb"
        archive.write_bytes(b"none")
        with self.assertRaisesRegex(packages.Unavailable, "broken.deb cannot be unpacked"):
            packages.unpack(archive, self.folder)


if __name__ == "__main__":
    unittest.main()
