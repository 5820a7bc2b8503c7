#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the comparison with the literal writing against layers that are wrong in one place: it has to tell.

usage: neighbours_test.py DIRECTORY LITERAL [UNITTEST-OPTION...]

LITERAL is the literal writing as one object, its names behind their prefix.
"""

import pathlib
import re
import subprocess
import sys
import unittest

sys.dont_write_bytecode = True

MADE, LITERAL = pathlib.Path(sys.argv.pop(1)).resolve(), pathlib.Path(sys.argv.pop(1)).resolve()
sys.argv.insert(1, str(MADE))

import layers  # noqa: E402
from revisions_test import PLANTS, UNSEEN_WITHOUT_NEIGHBOUR, Built, planted_layer  # noqa: E402
from tools import run  # noqa: E402


class Neighbours(unittest.TestCase):
    harness = None

    @classmethod
    def setUpClass(cls):
        Built.make(layers.HERE / "neighbours.cpp")

    def told(self, layer, *options):
        product = layers.renamed(layer, "first_", MADE / "product.o")
        run("g++", "-no-pie", *Built.harness, product, LITERAL, "-o", MADE / "neighbours")
        return subprocess.run([MADE / "neighbours", *options], capture_output=True, text=True, check=False)

    def test_every_plant_is_told(self):
        for name, (source, substitutions, operation, difference) in {**PLANTS, **UNSEEN_WITHOUT_NEIGHBOUR}.items():
            with self.subTest(name):
                done = self.told(planted_layer(source, substitutions, MADE / "plant"), "--operation", operation)
                self.assertEqual(1, done.returncode, done.stdout + done.stderr)
                kind = ": ".join(difference.split(": ")[:2])
                self.assertIn(f"  {kind}: ", done.stdout)

    def test_what_only_a_neighbour_shows(self):
        for name, (source, substitutions, operation, _) in UNSEEN_WITHOUT_NEIGHBOUR.items():
            with self.subTest(name):
                done = self.told(planted_layer(source, substitutions, MADE / "plant"), "--operation", operation,
                                 "--undisturbed")
                self.assertEqual(0, done.returncode, done.stdout + done.stderr)

    def test_everything_is_reached(self):
        done = self.told(Built.layer, "--undisturbed")
        self.assertEqual("", done.stderr)
        counted = re.match(r"(\d+) operations, (\d+) runs without a neighbour; (\d+) bases", done.stdout)
        self.assertEqual(len(layers.signatures.operations()), int(counted[1]))
        self.assertGreater(int(counted[3]), 1000)

    def test_an_operation_that_is_missing_is_told(self):
        layer = MADE / "without.o"
        run("objcopy", "--redefine-sym=PMX_SetDelay=PMX_Forgotten", Built.layer, layer)
        done = self.told(layer, "--undisturbed")
        self.assertEqual(1, done.returncode)
        self.assertIn("PMX_SetDelay was not run\n", done.stderr)
        self.assertIn("PMX_HalSetDelay was not called\n", done.stderr)

    def test_a_file_of_calls_that_is_none_is_refused(self):
        for content in ("PMX_Nothing 1 00\n", "PMX_SetBg 0 0\n", "PMX_SetBg 0 0 zz\n", "\n"):
            with self.subTest(content):
                bases = MADE / "bases.txt"
                bases.write_text(content, encoding="utf-8")
                done = self.told(Built.layer, "--undisturbed", "--bases", bases)
                self.assertEqual(2, done.returncode)
                self.assertNotEqual("", done.stderr)
        done = self.told(Built.layer, "--bases", MADE / "no-such-file")
        self.assertEqual(2, done.returncode)


if __name__ == "__main__":
    unittest.main()
