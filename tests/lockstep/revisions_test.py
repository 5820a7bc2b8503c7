#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the comparison of two layers against layers that are known to be alike, and to differ.

usage: revisions_test.py DIRECTORY [UNITTEST-OPTION...]
"""

import pathlib
import re
import shutil
import subprocess
import sys
import unittest

sys.dont_write_bytecode = True

import compare_revisions  # noqa: E402
import layers  # noqa: E402

MADE = pathlib.Path(sys.argv.pop(1)).resolve()
LAYER = pathlib.PurePath("src/driver/pmx")

# What is planted: a source, substitutions in it (each fits once), the operation that it concerns, and the difference
# that has to be told. Only a neighbour shows the plants of the last list.
PLANTS = {
    "argument": ("pmx_swap_bar_mute.cpp",
                 [(r"PMX_HalSetActiveZone\(ucPmxId, ucMode\)", "PMX_HalSetActiveZone(0, ucMode)")],
                 "PMX_SetActiveZone", "argument: PMX_SetActiveZone: PMX_HalSetActiveZone ucPmxId"),
    "order": ("pmx_picture.cpp", [(r"(    TVE_CVBSSetup_En\(fgEnable\);\n)(.*\n)", r"\2\1")],
              "PMX_SetCVBSSetup", "order: PMX_SetCVBSSetup: TVE_CVBSSetup_En"),
    "missing call": ("pmx_picture.cpp", [(r"    TVE_CVBSSetup_En\(fgEnable\);\n", "")],
                     "PMX_SetCVBSSetup", "order: PMX_SetCVBSSetup: TVE_CVBSSetup_En"),
    "text": ("pmx_picture.cpp", [(r"TVE_CVBSPal60_En = %d ", "TVE_CVBSPal60_En = %d")],
             "PMX_SetCVBSPal60", "text: PMX_SetCVBSPal60: PMX_IsLog szFormat"),
    "level": ("pmx_picture.cpp", [(r'PMX_IsLog\(8, "TVE_CVBSPal60_En', 'PMX_IsLog(9, "TVE_CVBSPal60_En')],
              "PMX_SetCVBSPal60", "argument: PMX_SetCVBSPal60: PMX_IsLog i4Level"),
    "value of a text": ("pmx_picture.cpp", [(r"(TVE_CVBSPal60_En = %d \\n\", )fgEnable", r"\1!fgEnable")],
                        "PMX_SetCVBSPal60", "argument: PMX_SetCVBSPal60: PMX_IsLog value 1"),
    "bytes": ("pmx_geometry.cpp", [(r"fgUiResAuto = fgIsAuto;", "fgUiResAuto = !fgIsAuto;")],
              "PMX_RecordUiResAuto", "bytes: PMX_RecordUiResAuto: fgPmxDrvSetAvd pvParameter"),
    "padding": ("pmx_geometry.cpp", [(r"(?=fgPmxDrvSetAvd\(PMX_SET_UI_TV_SYSTEM, &rTvSys, 1\);)",
                                      "((volatile UINT8*)&rTvSys)[3] = 7; ")],
                "PMX_SetTVSystem", "padding: PMX_SetTVSystem: fgPmxDrvSetAvd pvParameter"),
    "store behind a call": ("pmx_plane_order.cpp", [(r"(    prPmxConf\(\)->u4BgColor = u4BgColor;\n)(.*\n)", r"\2\1")],
                            "PMX_SetBg", "store: PMX_SetBg: u4BgColor at PMX_HalSetBg"),
    "state": ("pmx_picture.cpp", [(r"_fg2DCap = uc2D != 0;", "_fg2DCap = uc2D;")],
              "d_PMX_Set2DSmooth", "state after: d_PMX_Set2DSmooth: _fg2DCap"),
    "result": ("pmx_swap_bar_mute.cpp", [(r"(PMX_HalSetDelay\(.*\n    return) 1;", r"\1 2;")],
               "PMX_SetDelay", "result: PMX_SetDelay: "),
}
UNSEEN_WITHOUT_NEIGHBOUR = {
    "read before a call": ("pmx_arb_order.cpp",
                           [(r"(?=    memset\(u1PlnSel, 0)", "    const UINT32 u4Early = prConf->u4PlaneOrder;\n"),
                            (r"\*pu4PlaneOrder = prConf->u4PlaneOrder;", "*pu4PlaneOrder = u4Early;")],
                           "PMX_GetArbPlaneOrder", "output: PMX_GetArbPlaneOrder: the first result"),
}


class Built:
    """The layer as it is, and the programs' common half; made once."""

    objects = None
    layer = None
    harness = None

    @classmethod
    def make(cls, program=layers.HERE / "revisions.cpp"):
        if cls.layer is None:
            shutil.rmtree(MADE, ignore_errors=True)   # nothing follows from what was there
            cls.objects = layers.compile_layer(layers.ROOT, layers.sources_of(layers.ROOT), MADE / "layer")
            cls.layer = layers.combine(cls.objects, MADE / "layer")
            cls.harness = layers.build_harness(MADE, program)


def planted_layer(source, substitutions, made):
    """The layer with a change in one source."""
    tree = made / "tree"
    shutil.rmtree(tree, ignore_errors=True)
    for directory in ("src", "cmake", "examples"):  # whose flags the compiler takes
        shutil.copytree(layers.ROOT / directory, tree / directory)
    path = tree / LAYER / source
    text = path.read_text(encoding="utf-8")
    for pattern, replacement in substitutions:
        text, fitting = re.subn(pattern, replacement, text)
        if fitting != 1:
            raise AssertionError(f"{source}: {pattern} fits {fitting} times: plant something else")
    path.write_text(text, encoding="utf-8")
    changed, = layers.compile_layer(tree, [LAYER / source], made / "layer")
    others = [path for path in Built.objects if path.name != changed.name]
    return layers.combine([changed, *others], made / "layer")


def run_pair(first, second, *options, made=None):
    made = made or MADE
    program = layers.link(Built.harness, first, second, made)
    return subprocess.run([program, *options], capture_output=True, text=True, check=False)


class Revisions(unittest.TestCase):
    def setUp(self):
        Built.make()

    def rows(self, plant):
        """(undisturbed, disturbed) of each difference that is told, by its text."""
        source, substitutions, operation, _ = plant
        second = planted_layer(source, substitutions, MADE / "plant")
        done = run_pair(Built.layer, second, "--count", "4000", "--operation", operation)
        self.assertEqual(1, done.returncode, done.stdout + done.stderr)
        found = re.findall(r"^ *(\d+) +(\d+)  (.*)$", done.stdout, re.M)
        self.assertIn("\nthe first:\noperation ", done.stdout)
        return {text: (int(undisturbed), int(disturbed)) for undisturbed, disturbed, text in found}

    def test_a_layer_is_like_itself(self):
        done = run_pair(Built.layer, Built.layer, "--count", "100000")
        self.assertEqual(0, done.returncode, done.stdout + done.stderr)
        self.assertIn("\nno difference\n", done.stdout)
        calls = int(re.search(r"; (\d+) calls compared", done.stdout)[1])
        self.assertGreater(calls, 300000)

    def test_every_kind_of_difference_is_told(self):
        for name, plant in PLANTS.items():
            with self.subTest(name):
                rows = self.rows(plant)
                self.assertIn(plant[3], rows)
                self.assertGreater(rows[plant[3]][0], 0)

    def test_a_neighbour_shows_what_is_read_too_early(self):
        for name, plant in UNSEEN_WITHOUT_NEIGHBOUR.items():
            with self.subTest(name):
                rows = self.rows(plant)
                self.assertEqual([plant[3]], list(rows))
                self.assertEqual(0, rows[plant[3]][0])
                self.assertGreater(rows[plant[3]][1], 0)

    def test_padding_may_be_left_out(self):
        source, substitutions, operation, _ = PLANTS["padding"]
        second = planted_layer(source, substitutions, MADE / "plant")
        done = run_pair(Built.layer, second, "--count", "4000", "--operation", operation, "--no-padding")
        self.assertEqual(0, done.returncode, done.stdout)

    def test_the_same_seed_finds_the_same(self):
        source, substitutions, operation, _ = PLANTS["argument"]
        second = planted_layer(source, substitutions, MADE / "plant")
        outputs = [run_pair(Built.layer, second, "--count", "500", "--seed", seed, "--operation", operation).stdout
                   for seed in ("5", "5", "6")]
        self.assertEqual(outputs[0], outputs[1])
        self.assertNotEqual(outputs[0], outputs[2])

    def test_wrong_options_are_refused(self):
        for options in (["--count"], ["--count", "many"], ["--seed", "-1"], ["--operation", "PMX_Nothing"], ["--what"],
                        ["--names", "one"]):
            with self.subTest(options):
                done = run_pair(Built.layer, Built.layer, *options)
                self.assertEqual(2, done.returncode, done.stdout)
                self.assertNotEqual("", done.stderr)

    def test_state_that_is_not_compared_is_refused(self):
        made = MADE / "plant"
        second = planted_layer("pmx_picture.cpp", [(r"_fg2DCap = uc2D != 0;",
                                                    "static volatile BOOL fgOnce; fgOnce = 1; _fg2DCap = uc2D != 0;")],
                               made)
        with self.assertRaisesRegex(layers.Unlike, "fgOnce"):
            layers.hold_state_alike(second)

    def test_operations_of_another_form_are_refused(self):
        made = MADE / "plant"
        planted_layer("pmx_picture.cpp", [], made)
        header = made / "tree" / layers.signatures.platform_functions.LAYER_HEADER
        text = header.read_text(encoding="utf-8")
        header.write_text(text.replace("PMX_SetDigitalOutDrv(UINT32", "PMX_SetDigitalOutDrv(UINT16"), encoding="utf-8")
        with self.assertRaisesRegex(layers.Unlike, "PMX_SetDigitalOutDrv"):
            compare_revisions.hold_alike(made / "tree", Built.layer, Built.layer)


if __name__ == "__main__":
    unittest.main()
