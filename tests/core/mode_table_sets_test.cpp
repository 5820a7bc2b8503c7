// The mode table's sets: which modes are HD for the TV encoder, which capability bit admits a mode, which standard's
// colours it carries, how wide the colour bar is. The expectations are lists of modes by name, typed here anew.

#include <gtest/gtest.h>

#include "mode_numbers.h"
#include "pmx_if.h"

using namespace mode_numbers;

namespace
{

// What tells the TV encoder of an HD format, in mode setting.
const Modes tveHdOfModeSetting = modes({
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
    RES_PANEL_AUO_B089AW01,
    RES_3D_720P60HZ_TB,
    RES_3D_720P50HZ_TB,
    RES_3D_1080I60HZ_SBS_HALF,
    RES_3D_1080I50HZ_SBS_HALF,
    RES_3D_1080P23HZ_TB,
    RES_3D_1080P24HZ_TB,
});

// What gets the larger plane offsets.
const Modes hdOfPlaneDelays = modes({
    RES_PANEL_AUO_B089AW01,
    RES_720P60HZ,
    RES_720P50HZ,
    RES_3D_720P60HZ,
    RES_3D_720P50HZ,
    RES_3D_720P30HZ,
    RES_3D_720P25HZ,
    RES_3D_720P60HZ_TB,
    RES_3D_720P50HZ_TB,
    RES_1080I60HZ,
    RES_1080I50HZ,
    RES_3D_1080I60HZ,
    RES_3D_1080I50HZ,
    RES_3D_1080I30HZ,
    RES_3D_1080I25HZ,
    RES_3D_1080I60HZ_SBS_HALF,
    RES_3D_1080I50HZ_SBS_HALF,
    RES_1080P60HZ,
    RES_1080P50HZ,
    RES_1080P30HZ,
    RES_1080P25HZ,
    RES_1080P24HZ,
    RES_1080P23_976HZ,
    RES_3D_1080P23HZ,
    RES_3D_1080P24HZ,
    RES_3D_1080P23HZ_TB,
    RES_3D_1080P24HZ_TB,
});

bool is_tve_hd(UINT32 mode)
{
    return (prPmxModeRow(mode)->u1Flags & PMX_MODE_TVE_HD) != 0;
}

unsigned cap_bit(UINT32 mode)
{
    return prPmxModeRow(mode)->u1CapBit;
}

unsigned colour(UINT32 mode)
{
    return prPmxModeRow(mode)->u1Colour;
}

// The capability word that admits a mode when one of its bits is set; ~0 for always, 0 for never.
UINT32 cap_mask(UINT32 mode)
{
    const unsigned bit = cap_bit(mode);
    if (bit == PMX_CAP_ALWAYS)
        return ~0u;
    if (bit == PMX_CAP_NEVER)
        return 0;
    EXPECT_LE(bit, 16u) << "mode " << mode;
    return 1u << bit;
}

} // namespace

TEST(ModeTable, TveHd_IsTheSetOfModeSetting)
{
    EXPECT_EQ(27u, tveHdOfModeSetting.size());
    for (UINT32 mode : all())
        EXPECT_EQ(tveHdOfModeSetting.contains(mode), is_tve_hd(mode)) << "mode " << mode;
}

TEST(ModeTable, TveHd_IsTheSetOfPlaneDelaysToo)
{
    EXPECT_EQ(27u, hdOfPlaneDelays.size());
    for (UINT32 mode : all())
        EXPECT_EQ(hdOfPlaneDelays.contains(mode), is_tve_hd(mode)) << "mode " << mode;
}

TEST(ModeTable, TveHd_Not1080P29_97Hz)
{
    EXPECT_FALSE(is_tve_hd(RES_1080P29_97HZ));
    EXPECT_TRUE(is_tve_hd(RES_1080P23_976HZ));
    EXPECT_TRUE(is_tve_hd(RES_PANEL_AUO_B089AW01));
}

TEST(ModeTable, TveHd_IsHdOutWithout1080P29_97HzAnd2D576I50HzAndTheUnknown)
{
    for (UINT32 mode : all())
    {
        const bool onlyHdOut = mode == RES_1080P29_97HZ || mode == RES_2D_576I50HZ || mode >= known;
        const bool hdOut = (prPmxModeRow(mode)->u1Flags & PMX_MODE_HD_OUT) != 0;
        EXPECT_EQ(hdOut && !onlyHdOut, is_tve_hd(mode)) << "mode " << mode;
    }
}

TEST(ModeTable, CapBit)
{
    const auto bits = by_mode<unsigned>({
        { 0, { RES_480I, RES_2D_480I60HZ } },
        { 1, { RES_576I } },
        { 2, { RES_480P } },
        { 3, { RES_576P } },
        { 4, { RES_720P60HZ, RES_3D_720P60HZ_TB } },
        { 5, { RES_720P50HZ, RES_3D_720P50HZ_TB } },
        { 6, { RES_1080I60HZ, RES_3D_1080I60HZ_SBS_HALF } },
        { 7, { RES_1080I50HZ, RES_3D_1080I50HZ_SBS_HALF } },
        { 8, { RES_1080P60HZ } },
        { 9, { RES_1080P50HZ } },
        { 10, { RES_1080P30HZ } },
        { 11, { RES_1080P25HZ } },
        { 12, { RES_1080P24HZ, RES_3D_1080P24HZ_TB } },
        { 13, { RES_1080P23_976HZ } },
        { 14, { RES_1080P29_97HZ, RES_3D_1080P23HZ_TB } },
        { 15,
          { RES_3D_1080P23HZ, RES_3D_1080P24HZ, RES_3D_720P60HZ, RES_3D_720P50HZ, RES_3D_720P30HZ, RES_3D_720P25HZ,
            RES_3D_576P50HZ, RES_3D_480P60HZ, RES_3D_1080I60HZ, RES_3D_1080I50HZ, RES_3D_1080I30HZ, RES_3D_1080I25HZ,
            RES_3D_576I25HZ, RES_3D_480I30HZ, RES_3D_576I50HZ, RES_3D_480I60HZ } },
        { 16, { RES_2D_640x480HZ } },
        { PMX_CAP_ALWAYS,
          { RES_480P_1440, RES_576P_1440, RES_480P_2880, RES_576P_2880, RES_480I_2880, RES_576I_2880,
            RES_PANEL_AUO_B089AW01 } },
        { PMX_CAP_NEVER, { RES_2D_576I50HZ } },
    });
    for (const auto& [mode, bit] : bits)
        EXPECT_EQ(bit, cap_bit(mode)) << "mode " << mode;
}

TEST(ModeTable, CapBit_NumberWithoutARow_IsNeverAdmitted)
{
    for (UINT32 number : unknown())
        EXPECT_EQ(static_cast<unsigned>(PMX_CAP_NEVER), cap_bit(number)) << "number " << number;
}

// The same by the word's masks, as mode setting tests them.
TEST(ModeTable, CapMask)
{
    const auto masks = by_mode<UINT32>({
        { 0x1, { RES_480I, RES_2D_480I60HZ } },
        { 0x2, { RES_576I } },
        { 0x4, { RES_480P } },
        { 0x8, { RES_576P } },
        { 0x10, { RES_720P60HZ, RES_3D_720P60HZ_TB } },
        { 0x20, { RES_720P50HZ, RES_3D_720P50HZ_TB } },
        { 0x40, { RES_1080I60HZ, RES_3D_1080I60HZ_SBS_HALF } },
        { 0x80, { RES_1080I50HZ, RES_3D_1080I50HZ_SBS_HALF } },
        { 0x100, { RES_1080P60HZ } },
        { 0x200, { RES_1080P50HZ } },
        { 0x400, { RES_1080P30HZ } },
        { 0x800, { RES_1080P25HZ } },
        { 0x1000, { RES_1080P24HZ, RES_3D_1080P24HZ_TB } },
        { 0x2000, { RES_1080P23_976HZ } },
        { 0x4000, { RES_1080P29_97HZ, RES_3D_1080P23HZ_TB } },
        { 0x8000, { 21, 22, 23, 24, 25, 26, 27, 28, 29, 30, 31, 32, 33, 34, 35, 36 } },
        { 0x10000, { RES_2D_640x480HZ } },
        { 0xFFFFFFFF,
          { RES_480P_1440, RES_576P_1440, RES_480P_2880, RES_576P_2880, RES_480I_2880, RES_576I_2880,
            RES_PANEL_AUO_B089AW01 } },
        { 0, { RES_2D_576I50HZ } },
    });
    for (const auto& [mode, mask] : masks)
        EXPECT_EQ(mask, cap_mask(mode)) << "mode " << mode;
}

TEST(ModeTable, CapMask_DefaultWordAdmitsEveryModeThatHasABit)
{
    const UINT32 word = _arPmxConfDefault.u4Capability;
    for (UINT32 mode = 0; mode < known; ++mode)
        EXPECT_EQ(mode != RES_2D_576I50HZ, (word & cap_mask(mode)) != 0) << "mode " << mode;
    for (UINT32 mode : { RES_4K2K23976HZ, RES_4K2K24HZ, RES_2160P, RES_2160P_4096, RES_MODE_NUM, RES_AUTO })
        EXPECT_EQ(0u, word & cap_mask(mode)) << "mode " << mode;
}

TEST(ModeTable, CapBit_TopAndBottom23HzGoesWith29_97Hz)
{
    EXPECT_EQ(cap_bit(RES_1080P29_97HZ), cap_bit(RES_3D_1080P23HZ_TB));
    EXPECT_NE(cap_bit(RES_1080P23_976HZ), cap_bit(RES_3D_1080P23HZ_TB));
    EXPECT_EQ(cap_bit(RES_1080P24HZ), cap_bit(RES_3D_1080P24HZ_TB));
}

TEST(ModeTable, Colour)
{
    const auto groups = by_mode<unsigned>({
        { PMX_COLOUR_SD,
          { RES_480I, RES_576I, RES_480P, RES_576P, RES_480P_1440, RES_576P_1440, RES_480P_2880, RES_576P_2880,
            RES_480I_2880, RES_576I_2880, RES_3D_576P50HZ, RES_3D_480P60HZ, RES_3D_576I25HZ, RES_3D_480I30HZ,
            RES_3D_576I50HZ, RES_3D_480I60HZ, RES_2D_480I60HZ, RES_2D_640x480HZ, RES_PANEL_AUO_B089AW01 } },
        { PMX_COLOUR_HD,
          { RES_720P60HZ,
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
            RES_3D_720P60HZ_TB,
            RES_3D_720P50HZ_TB,
            RES_3D_1080I60HZ_SBS_HALF,
            RES_3D_1080I50HZ_SBS_HALF,
            RES_3D_1080P23HZ_TB,
            RES_3D_1080P24HZ_TB } },
        { PMX_COLOUR_NONE, { RES_2D_576I50HZ } },
    });
    for (const auto& [mode, group] : groups)
        EXPECT_EQ(group, colour(mode)) << "mode " << mode;
}

TEST(ModeTable, Colour_NumberWithoutARow_LeavesTheConvertersAlone)
{
    for (UINT32 number : unknown())
        EXPECT_EQ(static_cast<unsigned>(PMX_COLOUR_NONE), colour(number)) << "number " << number;
}

TEST(ModeTable, Colour_GroupsAreThreeDifferentNumbers)
{
    EXPECT_NE(PMX_COLOUR_NONE, PMX_COLOUR_SD);
    EXPECT_NE(PMX_COLOUR_NONE, PMX_COLOUR_HD);
    EXPECT_NE(PMX_COLOUR_SD, PMX_COLOUR_HD);
}

TEST(ModeTable, ColourBarWidth)
{
    const std::map<UINT32, unsigned> widths = {
        { RES_480I, 22 }, { RES_576I, 22 },     { RES_480P, 22 },
        { RES_576P, 22 }, { RES_720P60HZ, 20 }, { RES_720P50HZ, 20 },
    };
    for (UINT32 mode : all())
    {
        const auto found = widths.find(mode);
        EXPECT_EQ(found == widths.end() ? 30u : found->second, prPmxModeRow(mode)->u1CBWidth) << "mode " << mode;
    }
}
