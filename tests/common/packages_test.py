#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Where packages are looked for follows from the package sources of the machine."""

import sys
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


if __name__ == "__main__":
    unittest.main()
