// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The mode table, column by column: what each mode decides.

#include <utility>

#include <gtest/gtest.h>

#include "pmx_if.h"
#include "tests/layer/mode_facts.h"

using namespace mode_facts;

namespace
{

bool has_flag(UINT32 mode, unsigned flag)
{
    return (prPmxModeRow(mode)->u1Flags & flag) != 0;
}

void expect_flag(unsigned flag, Fact fact)
{
    for (UINT32 mode : all_numbers())
        EXPECT_EQ(facts_of(mode).is(fact), has_flag(mode, flag)) << "mode " << mode;
}

using Size = std::pair<unsigned, unsigned>;

Size size_of(UINT32 mode)
{
    return { prPmxModeRow(mode)->u2Width, prPmxModeRow(mode)->u2Height };
}

} // namespace

TEST(ModeTable, EveryKnownModeHasItsOwnRow)
{
    for (UINT32 mode = 0; mode < known; ++mode)
    {
        EXPECT_EQ(&_arPmxModeRow[mode], prPmxModeRow(mode)) << "mode " << mode;
        EXPECT_EQ(mode, prPmxModeRow(mode)->u1Mode);
    }
}

TEST(ModeTable, EveryOtherNumberHasTheOneRowBehindThem)
{
    EXPECT_EQ(known, static_cast<UINT32>(PMX_MODE_ROW_NUM));
    for (UINT32 number : unknown())
        EXPECT_EQ(&_arPmxModeRow[known], prPmxModeRow(number)) << "number " << number;
}

TEST(ModeTable, NumberAbove255_IsNotCutToTheModeInItsLowByte)
{
    EXPECT_NE(prPmxModeRow(RES_480P), prPmxModeRow(0x100 + RES_480P));
    EXPECT_NE(prPmxModeRow(RES_1080P60HZ), prPmxModeRow(0xFFFFFF00u + RES_1080P60HZ));
}

TEST(ModeTable, FlagsAreSixDifferentBitsAndRowsHoldNoOther)
{
    const unsigned flags[] = { PMX_MODE_PLL_60,      PMX_MODE_BOOT_60, PMX_MODE_BOOT_50,
                               PMX_MODE_PROGRESSIVE, PMX_MODE_HD_OUT,  PMX_MODE_TVE_HD };
    unsigned together = 0;
    for (unsigned flag : flags)
    {
        EXPECT_NE(0u, flag);
        EXPECT_EQ(0u, flag & (flag - 1)) << "one bit";
        EXPECT_EQ(0u, together & flag) << "used twice";
        together |= flag;
    }
    for (UINT32 mode : all_numbers())
        EXPECT_EQ(0u, prPmxModeRow(mode)->u1Flags & ~together) << "mode " << mode;
}

TEST(ModeTable, Pll60HzFamily)
{
    expect_flag(PMX_MODE_PLL_60, pll_60);
}

TEST(ModeTable, Pll_23_976And29_97And30HzRunWith60Hz_24HzDoesNot)
{
    for (UINT32 mode : { RES_1080P23_976HZ, RES_3D_1080P23HZ, RES_3D_1080P23HZ_TB, RES_1080P29_97HZ, RES_1080P30HZ })
        EXPECT_TRUE(has_flag(mode, PMX_MODE_PLL_60)) << "mode " << mode;
    for (UINT32 mode : { RES_1080P24HZ, RES_3D_1080P24HZ, RES_3D_1080P24HZ_TB })
        EXPECT_FALSE(has_flag(mode, PMX_MODE_PLL_60)) << "mode " << mode;
}

TEST(ModeTable, BootModesOf60HzSystems)
{
    expect_flag(PMX_MODE_BOOT_60, boot_60);
}

TEST(ModeTable, BootModesOf50HzSystems)
{
    expect_flag(PMX_MODE_BOOT_50, boot_50);
}

TEST(ModeTable, Size)
{
    for (const Mode& mode : all_modes)
        EXPECT_EQ(Size(mode.width, mode.height), size_of(mode.mode)) << mode.enumerator;
}

TEST(ModeTable, Size_NumberWithoutARow_Is1920x1080)
{
    for (UINT32 number : unknown())
        EXPECT_EQ(Size(1920, 1080), size_of(number)) << "number " << number;
}

TEST(ModeTable, Progressive)
{
    expect_flag(PMX_MODE_PROGRESSIVE, progressive);
}

TEST(ModeTable, Progressive_NotThe23_976And29_97HzModesNorAnyTopAndBottomMode)
{
    for (UINT32 mode : { RES_1080P23_976HZ, RES_1080P29_97HZ, RES_3D_720P60HZ_TB, RES_3D_720P50HZ_TB,
                         RES_3D_1080P23HZ_TB, RES_3D_1080P24HZ_TB })
        EXPECT_FALSE(has_flag(mode, PMX_MODE_PROGRESSIVE)) << "mode " << mode;
}

TEST(ModeTable, HdOut)
{
    expect_flag(PMX_MODE_HD_OUT, hd_out);
}

TEST(ModeTable, NumberWithoutARow_IsOnlyHdOut)
{
    for (UINT32 number : unknown())
        EXPECT_EQ(PMX_MODE_HD_OUT, prPmxModeRow(number)->u1Flags) << "number " << number;
}
