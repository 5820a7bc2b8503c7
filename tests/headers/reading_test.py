#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Changes one thing in a copy of the headers, and looks at what the scripts of cmake/ write, or refuse, and whether
check_reading.py sees what they misread.

usage: reading_test.py CLANG++
"""

import pathlib
import shutil
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import check_reading  # noqa: E402  (finds cmake/)
import declarations  # noqa: E402
import names  # noqa: E402
import operations  # noqa: E402

ROOT = pathlib.Path(__file__).resolve().parents[2]
CLANG = []
LAYER = "src/driver/private_inc/drv_pmx.h"
SLOTS = "src/driver/private_inc/drv_if_pmx.h"
ENCODER = "src/driver/private_inc/drv_tve.h"
RECORD = "src/driver/pmx/pmx_if.h"
COPIED = (*names.HEADER_DIRECTORIES, "src/driver/pmx", "board")


class Reading(unittest.TestCase):
    def setUp(self):
        self.directory = tempfile.TemporaryDirectory()
        self.addCleanup(self.directory.cleanup)
        self.root = pathlib.Path(self.directory.name)
        for name in COPIED:
            shutil.copytree(ROOT / name, self.root / name, ignore=lambda _, found: {
                one for one in found if not one.endswith(".h")})

    def change(self, header, old, new):
        path = self.root / header
        text = path.read_text(encoding="utf-8")
        self.assertIn(old, text)
        text = text.replace(old, new, 1)
        path.write_text(text, encoding="utf-8")
        return text.count("\n", 0, text.index(new)) + 1

    def add(self, header, declaration):
        """In front of the closing extern "C"."""
        end = "#ifdef __cplusplus\n}\n#endif\n"
        return self.change(header, end, declaration + "\n" + end)

    def refused(self, message, write):
        with self.assertRaises(declarations.Unclear) as raised:
            write()
        self.assertIn(message, str(raised.exception))

    def names(self):
        return names.table(names.Names(self.root))

    def operations(self):
        return operations.table(self.root)

    def test_an_operation_is_told_by_the_header_alone(self):
        self.add(LAYER, "/** Try.\n *  @param      ucMode  a PMX_RESOLUTION_MODE_T value\n"
                        " *  @param[out] pucOne  receives one; not tested for null\n"
                        " *  @param[out] pucTwo  receives two, a PMX_TV_TYPE_ value\n"
                        " *  @param[in]  pu4Many [3] some\n *  @return a DRV_PMX_PLANE_T value\n *  @context any */\n"
                        "PMX_API UINT32 PMX_Try(UCHAR ucMode, UCHAR* pucOne, UCHAR* pucTwo, const UINT32* pu4Many);")
        self.assertIn('OPERATION(PMX_Try, "ucMode", never_null("pucOne"), "pucTwo", { "pu4Many", 3 }),',
                      self.operations())
        table = self.names()
        for use in ('"PMX_Try", "ucMode", Family::ResolutionMode', '"PMX_Try", "pucTwo", Family::TvType',
                    '"PMX_Try", "result", Family::Plane'):
            self.assertIn(f"    {{ {use} }},", table)

    def test_pointers_that_say_nothing(self):
        line = self.add(LAYER, "/** Try.\n *  @param pucOne  what?\n *  @context any */\n"
                               "PMX_API void PMX_Try(UCHAR* pucOne);")
        self.refused(f"{LAYER}:{line + 3}: PMX_Try: pucOne is a pointer: @param[in], @param[out] or @param[in,out]",
                     self.operations)

    def test_pointers_that_a_scenario_cannot_write(self):
        for parameter, declared in (("[in,out] pucOne", "UCHAR* pucOne"), ("[out] pucOne  [4]", "UCHAR* pucOne"),
                                    ("[in] pucOne", "UCHAR* pucOne"), ("[in] pvOne  [symbol]", "void* pvOne"),
                                    ("[out] szOne  [text of u4Size]", "CHAR* szOne, UINT32 u4Size")):
            with self.subTest(parameter):
                line = self.add(LAYER, f"/** Try.\n *  @param{parameter}  it\n *  @context any */\n"
                                       f"PMX_API void PMX_Try({declared});")
                self.refused(f"{LAYER}:{line + 3}: PMX_Try: ", self.operations)
                self.refused("a scenario has no way to write it: it writes numbers", self.operations)
                self.setUp()

    def test_a_neighbour_calls_what_takes_numbers_and_answers_nothing(self):
        self.add(ENCODER, "/** Try.\n *  @param u4One  one */\nvoid TVE_Try(UINT32 u4One);\n"
                          "/** Ask.\n *  @param u4One  one\n *  @return two */\nUINT32 TVE_Ask(UINT32 u4One);\n"
                          "/** Say.\n *  @param[in] szOne  [text] one */\nvoid TVE_Say(const CHAR* szOne);")
        table = self.operations()
        self.assertIn('OPERATION(TVE_Try, "u4One"),', table)
        self.assertNotIn("TVE_Ask", table)
        self.assertNotIn("TVE_Say", table)

    def test_slots_are_like_a_function_of_the_layer(self):
        line = self.change(SLOTS, "/**< as i4PmxOsdDisabled */", "/**< inert */")
        self.refused(f"{SLOTS}:{line}: pi4OsdDisabled: /**< as FUNCTION */", self.operations)

    def test_slots_like_a_function_with_other_parameters(self):
        self.change(SLOTS, "/**< as i4PmxOsdDisabled */", "/**< as i4PmxVdpEnabled */")
        self.refused("pi4OsdDisabled: /**< as FUNCTION */", self.operations)

    def test_an_enumerator_has_its_name(self):
        self.change(SLOTS, "    RES_480I = 0,\n", "    RES_TRY = 200,\n    RES_480I = 0,\n")
        self.assertIn('{ Family::ResolutionMode, static_cast<std::int64_t>(RES_TRY), "RES_TRY" },', self.names())

    def test_a_constant_of_a_family_has_its_name(self):
        self.change(LAYER, "#define PMX_TV_TYPE_PAL 3\n", "#define PMX_TV_TYPE_PAL 3\n#define PMX_TV_TYPE_TRY 4u\n")
        self.assertIn('{ Family::TvType, static_cast<std::int64_t>(PMX_TV_TYPE_TRY), "PMX_TV_TYPE_TRY" },',
                      self.names())

    def test_enumerations_belong_to_a_family(self):
        line = self.add(ENCODER, "typedef DRV_ENUM(TVE_TRY_T)\n{\n    TVE_TRY = 1\n} TVE_TRY_T;")
        self.refused(f"{ENCODER}:{line}: TVE_TRY_T: its names belong to no family; a line in enum class Family of "
                     "board/names.h", self.names)

    def test_families_say_where_their_names_come_from(self):
        line = self.change("board/names.h", "///< PMX_TV_TYPE_: TV types", "///< NTSC and PAL")
        self.refused(f"board/names.h:{line}: TvType", self.names)

    def test_families_without_names(self):
        line = self.change("board/names.h", "///< PMX_TV_TYPE_: TV types", "///< PMX_TV_KIND_: TV types")
        self.refused(f"board/names.h:{line}: TvType: no header declares PMX_TV_KIND_", self.names)

    def test_names_of_nothing(self):
        self.change(LAYER, "ucTvType  a PMX_TV_TYPE_ value", "ucTvType  a PMX_TV_KIND_ value")
        self.refused("PMX_SetTvType: ucTvType: PMX_TV_KIND_ is neither an enumeration", self.names)

    def test_names_of_two_families(self):
        line = self.change(RECORD, "/* an ASPECT_RATIO_T value */",
                           "/* an ASPECT_RATIO_T value, or a PMX_TV_TYPE_ value */")
        self.refused(f"{RECORD}:{line}: PMX_CONF_T.u4AspectRatio: one thing has its names from", self.names)

    def test_enumerators_without_a_number(self):
        line = self.change(ENCODER, "ASPECT_RATIO_4_3 = 0,", "ASPECT_RATIO_4_3,")
        self.refused(f"{ENCODER}:{line}: ASPECT_RATIO_4_3: one line, and a decimal number", self.names)

    def test_the_compiler_finds_what_is_misread(self):
        self.assertEqual([], check_reading.differences(CLANG[0], self.root)[0])
        self.change(ENCODER, "ASPECT_RATIO_16_9_FULL_FORMAT = 1\n", "ASPECT_RATIO_16_9_FULL_FORMAT = 010\n")
        self.add(ENCODER, "void TVE_Try(UINT32(u4One));")
        self.change(RECORD, "UCHAR ucGamma; ", "UCHAR ucGamma, ucTry; ")
        found = [line[:line.index(": not ")] for line in check_reading.differences(CLANG[0], self.root)[0]]
        self.assertEqual([f"{ENCODER}: enumeration TVE_ASPECT_RATIO_T"] * 2,
                         [line for line in found if "enumeration" in line])
        self.assertIn(f"{ENCODER}: function TVE_Try", found)
        self.assertIn(f"{RECORD}: record PMX_CONF_T", found)


if __name__ == "__main__":
    CLANG.append(sys.argv.pop())
    unittest.main()
