// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The numbers of the mixer's own enumerations and constants: other drivers, flash images and middleware were built
// with them.

#include <gtest/gtest.h>

#include "drv_if.h"
#include "drv_pmx.h"
#include "numbers.h"
#include "pmx_if.h"
#include "tests/layer/mode_facts.h"

using namespace numbers;

TEST(Enumerators, ResolutionModes)
{
    for (const mode_facts::Mode& mode : mode_facts::all_modes)
        EXPECT_EQ(mode.number, mode.mode) << mode.enumerator;
    // Facts are looked up by number.
    for (UINT32 number = 0; number < mode_facts::known; ++number)
        EXPECT_EQ(number, mode_facts::all_modes[number].number);
    for (const auto& [mode, number, enumerator] : mode_facts::other_enumerators)
        EXPECT_EQ(number, mode) << enumerator;
}

TEST(Enumerators, DigitalPort)
{
    expect_numbers({
        NUMBER(CCIR_INVALID, 0),
        NUMBER(CCIR_601_MODE, 1),
        NUMBER(CCIR_656_MODE, 2),

        NUMBER(CCIR_NON_USED, 0),
        NUMBER(CCIR_YCMIX_8BIT, 1),
        NUMBER(CCIR_YCMIX_10BIT, 2),
        NUMBER(CCIR_YCMIX_12BIT, 3),
        NUMBER(CCIR_YC422_16BIT, 4),
        NUMBER(CCIR_YC422_20BIT, 5),
        NUMBER(CCIR_YC422_24BIT, 6),
        NUMBER(CCIR_YC444_24BIT, 7),
        NUMBER(CCIR_YC444_30BIT, 8),
        NUMBER(CCIR_YC444_36BIT, 9),
    });
}

TEST(Enumerators, Colours)
{
    expect_numbers({
        NUMBER(DRV_GFX_COLOR_MODE_YCBCR, 0),
        NUMBER(DRV_GFX_COLOR_MODE_RGB, 1),

        NUMBER(DRV_PMX_CS_YCBCR_601, 0),
        NUMBER(DRV_PMX_CS_YCBCR_709, 1),
        NUMBER(DRV_PMX_CS_RGB, 2),
    });
}

TEST(Enumerators, Planes_NamesCountFrom1ValuesFrom0)
{
    expect_numbers({
        NUMBER(DRV_PMX_PLANE_1, 0),
        NUMBER(DRV_PMX_PLANE_2, 1),
        NUMBER(DRV_PMX_PLANE_3, 2),
        NUMBER(DRV_PMX_PLANE_4, 3),
        NUMBER(DRV_PMX_PLANE_5, 4),
        NUMBER(DRV_PMX_PLANE_6, 5),
        NUMBER(DRV_PMX_PLANE_7, 6),
        NUMBER(DRV_PMX_PLANE_8, 7),
    });
}

TEST(Enumerators, Outputs)
{
    expect_numbers({
        NUMBER(PMX_OUTPUT_CCIR, 0),
        NUMBER(PMX_OUTPUT_HDMI, 1),
        NUMBER(PMX_OUTPUT_CAV, 2),
        NUMBER(PMX_OUTPUT_CVBS, 3),
        NUMBER(PMX_OUTPUT_NUM, 4),
    });
}

TEST(Enumerators, ExternalChipUsage)
{
    expect_numbers({
        NUMBER(DRV_NON_EXT_CHIP, 0),
        NUMBER(DRV_EXT_SCL_EXT_TX, 1),
        NUMBER(DRV_EXT_SCL_INT_TX, 2),
        NUMBER(DRV_RX_BYPASS_TX, 3),
    });
}

TEST(Constants, ComponentsAndInterfaces)
{
    expect_numbers({
        NUMBER(PMX_COMP_TYPE_VDP, 65),
        NUMBER(PMX_COMP_TYPE_PMX, 66),
        NUMBER(PMX_COMP_TYPE_OSD, 176),
        NUMBER(IID_IVdp, 6),
        NUMBER(IID_IPMX, 9),
    });
}

TEST(Constants, TvTypesAndResult)
{
    expect_numbers({
        NUMBER(PMX_TV_TYPE_NTSC, 0),
        NUMBER(PMX_TV_TYPE_PAL, 3),
        NUMBER(PMX_SET_OK, 1),
    });
}

TEST(Constants, Ports)
{
    expect_numbers({ NUMBER(PMX_PORT_NUM, 8), NUMBER(PMX_PLANE_NUM, 8) });
}

TEST(Enumerators, Are32BitsWide)
{
    EXPECT_TRUE((all_are_32_bits_wide<PMX_RESOLUTION_MODE_T, CCIR_IN_OUT_MODE_T, CCIR_IN_OUT_FORMAT_T>));
    EXPECT_TRUE((all_are_32_bits_wide<DRV_GFX_COLOR_MODE_T, DRV_PMX_COLOR_SPACE_T, DRV_PMX_PLANE_T>));
    EXPECT_TRUE((all_are_32_bits_wide<DRV_EXT_CHIP_USAGE_T, decltype(PMX_OUTPUT_CCIR)>));
}

TEST(Enumerators, HoldEvery32BitNumber)
{
    EXPECT_EQ(0xFFFFFFFFu, static_cast<UINT32>(static_cast<PMX_RESOLUTION_MODE_T>(0xFFFFFFFFu)));
    EXPECT_EQ(0x80000001u, static_cast<UINT32>(static_cast<DRV_PMX_COLOR_SPACE_T>(0x80000001u)));
}
