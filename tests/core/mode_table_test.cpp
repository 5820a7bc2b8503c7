// The mode table, column by column: what each mode decides. The expectations are lists of modes by name, typed here
// anew.

#include <utility>

#include <gtest/gtest.h>

#include "mode_numbers.h"
#include "pmx_if.h"

using namespace mode_numbers;

namespace
{

bool has_flag(UINT32 mode, unsigned flag)
{
    return (prPmxModeRow(mode)->u1Flags & flag) != 0;
}

void expect_flag(unsigned flag, const Modes& expected)
{
    for (UINT32 mode : all())
        EXPECT_EQ(expected.contains(mode), has_flag(mode, flag)) << "mode " << mode;
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
    for (UINT32 mode : all())
        EXPECT_EQ(0u, prPmxModeRow(mode)->u1Flags & ~together) << "mode " << mode;
}

TEST(ModeTable, Pll60HzFamily)
{
    const Modes family = modes({
        RES_480I,
        RES_480P,
        RES_480P_1440,
        RES_480P_2880,
        RES_480I_2880,
        RES_720P60HZ,
        RES_1080I60HZ,
        RES_1080P60HZ,
        RES_1080P30HZ,
        RES_1080P23_976HZ,
        RES_1080P29_97HZ,
        RES_3D_1080P23HZ,
        RES_3D_720P60HZ,
        RES_3D_720P30HZ,
        RES_3D_480P60HZ,
        RES_3D_1080I60HZ,
        RES_3D_1080I30HZ,
        RES_3D_480I30HZ,
        RES_3D_480I60HZ,
        RES_2D_480I60HZ,
        RES_2D_640x480HZ,
        RES_PANEL_AUO_B089AW01,
        RES_3D_720P60HZ_TB,
        RES_3D_1080I60HZ_SBS_HALF,
        RES_3D_1080P23HZ_TB,
    });
    EXPECT_EQ(25u, family.size());
    expect_flag(PMX_MODE_PLL_60, family);
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
    expect_flag(PMX_MODE_BOOT_60, modes({ RES_480I, RES_480P, RES_720P60HZ, RES_1080I60HZ, RES_1080P60HZ }));
}

TEST(ModeTable, BootModesOf50HzSystems)
{
    expect_flag(PMX_MODE_BOOT_50, modes({ RES_576I, RES_576P, RES_720P50HZ, RES_1080I50HZ, RES_1080P50HZ }));
}

TEST(ModeTable, Size)
{
    const auto sizes = by_mode<Size>({
        { { 720, 480 },
          { RES_480I, RES_480P, RES_480P_1440, RES_480P_2880, RES_480I_2880, RES_3D_480P60HZ, RES_3D_480I30HZ,
            RES_3D_480I60HZ, RES_2D_480I60HZ } },
        { { 720, 576 },
          { RES_576I, RES_576P, RES_576P_1440, RES_576P_2880, RES_576I_2880, RES_3D_576P50HZ, RES_3D_576I25HZ,
            RES_3D_576I50HZ } },
        { { 640, 480 }, { RES_2D_640x480HZ } },
        { { 1024, 600 }, { RES_PANEL_AUO_B089AW01 } },
        { { 1280, 720 },
          { RES_720P60HZ, RES_720P50HZ, RES_3D_720P60HZ, RES_3D_720P50HZ, RES_3D_720P30HZ, RES_3D_720P25HZ,
            RES_3D_720P60HZ_TB, RES_3D_720P50HZ_TB } },
        { { 1920, 1080 },
          { RES_1080I60HZ,
            RES_1080I50HZ,
            RES_1080P60HZ,
            RES_1080P50HZ,
            RES_1080P30HZ,
            RES_1080P25HZ,
            RES_1080P24HZ,
            RES_1080P23_976HZ,
            RES_1080P29_97HZ,
            RES_3D_1080P23HZ,
            RES_3D_1080P24HZ,
            RES_3D_1080I60HZ,
            RES_3D_1080I50HZ,
            RES_3D_1080I30HZ,
            RES_3D_1080I25HZ,
            RES_3D_1080I60HZ_SBS_HALF,
            RES_3D_1080I50HZ_SBS_HALF,
            RES_3D_1080P23HZ_TB,
            RES_3D_1080P24HZ_TB,
            RES_2D_576I50HZ /* not 720 x 576: kept so */ } },
    });
    for (const auto& [mode, size] : sizes)
        EXPECT_EQ(size, size_of(mode)) << "mode " << mode;
}

TEST(ModeTable, Size_NumberWithoutARow_Is1920x1080)
{
    for (UINT32 number : unknown())
        EXPECT_EQ(Size(1920, 1080), size_of(number)) << "number " << number;
}

TEST(ModeTable, Progressive)
{
    expect_flag(PMX_MODE_PROGRESSIVE,
                modes({
                    RES_480P,        RES_576P,         RES_480P_1440,          RES_576P_1440,    RES_480P_2880,
                    RES_576P_2880,   RES_720P60HZ,     RES_720P50HZ,           RES_1080P60HZ,    RES_1080P50HZ,
                    RES_1080P30HZ,   RES_1080P25HZ,    RES_1080P24HZ,          RES_3D_1080P23HZ, RES_3D_1080P24HZ,
                    RES_3D_720P60HZ, RES_3D_720P50HZ,  RES_3D_720P30HZ,        RES_3D_720P25HZ,  RES_3D_576P50HZ,
                    RES_3D_480P60HZ, RES_2D_640x480HZ, RES_PANEL_AUO_B089AW01,
                }));
}

TEST(ModeTable, Progressive_NotThe23_976And29_97HzModesNorAnyTopAndBottomMode)
{
    for (UINT32 mode : { RES_1080P23_976HZ, RES_1080P29_97HZ, RES_3D_720P60HZ_TB, RES_3D_720P50HZ_TB,
                         RES_3D_1080P23HZ_TB, RES_3D_1080P24HZ_TB })
        EXPECT_FALSE(has_flag(mode, PMX_MODE_PROGRESSIVE)) << "mode " << mode;
}

TEST(ModeTable, HdOut)
{
    Modes expected = modes({
        RES_720P60HZ,
        RES_720P50HZ,
        RES_1080I60HZ,
        RES_1080I50HZ,
        RES_1080P60HZ,
        RES_1080P50HZ,
        RES_1080P30HZ,
        RES_1080P25HZ,
        RES_1080P24HZ,
        RES_1080P23_976HZ,
        RES_1080P29_97HZ,
        RES_3D_1080P23HZ,
        RES_3D_1080P24HZ,
        RES_3D_720P60HZ,
        RES_3D_720P50HZ,
        RES_3D_720P30HZ,
        RES_3D_720P25HZ,
        RES_3D_1080I60HZ,
        RES_3D_1080I50HZ,
        RES_3D_1080I30HZ,
        RES_3D_1080I25HZ,
        RES_2D_576I50HZ,
        RES_PANEL_AUO_B089AW01,
        RES_3D_720P60HZ_TB,
        RES_3D_720P50HZ_TB,
        RES_3D_1080I60HZ_SBS_HALF,
        RES_3D_1080I50HZ_SBS_HALF,
        RES_3D_1080P23HZ_TB,
        RES_3D_1080P24HZ_TB,
    });
    for (UINT32 number : unknown())
        expected.insert(number);
    expect_flag(PMX_MODE_HD_OUT, expected);
}

TEST(ModeTable, NumberWithoutARow_IsOnlyHdOut)
{
    for (UINT32 number : unknown())
        EXPECT_EQ(PMX_MODE_HD_OUT, prPmxModeRow(number)->u1Flags) << "number " << number;
}
