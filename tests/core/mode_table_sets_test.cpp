// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The mode table's sets: which modes are HD for the TV encoder, which capability bit admits a mode, which standard's
// colours it carries, how wide the colour bar is.

#include <gtest/gtest.h>

#include "pmx_if.h"
#include "tests/layer/mode_facts.h"

using namespace mode_facts;

namespace
{

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
    EXPECT_LT(bit, static_cast<unsigned>(PMX_CAP_BIT_GAMMA)) << "mode " << mode;
    return 1u << bit;
}

} // namespace

TEST(ModeTable, TveHd)
{
    for (UINT32 mode : all_numbers())
        EXPECT_EQ(facts_of(mode).is(tve_hd), is_tve_hd(mode)) << "mode " << mode;
}

TEST(ModeTable, TveHd_Not1080P29_97Hz)
{
    EXPECT_FALSE(is_tve_hd(RES_1080P29_97HZ));
    EXPECT_TRUE(is_tve_hd(RES_1080P23_976HZ));
    EXPECT_TRUE(is_tve_hd(RES_PANEL_AUO_B089AW01));
}

TEST(ModeTable, TveHd_IsHdOutWithout1080P29_97HzAnd2D576I50HzAndTheUnknown)
{
    for (UINT32 mode : all_numbers())
    {
        const bool onlyHdOut = mode == RES_1080P29_97HZ || mode == RES_2D_576I50HZ || mode >= known;
        const bool hdOut = (prPmxModeRow(mode)->u1Flags & PMX_MODE_HD_OUT) != 0;
        EXPECT_EQ(hdOut && !onlyHdOut, is_tve_hd(mode)) << "mode " << mode;
    }
}

TEST(ModeTable, CapBit)
{
    for (const Mode& mode : all_modes)
    {
        const unsigned expected = mode.capability == always  ? PMX_CAP_ALWAYS
                                  : mode.capability == never ? PMX_CAP_NEVER
                                                             : static_cast<unsigned>(mode.capability);
        EXPECT_EQ(expected, cap_bit(mode.mode)) << mode.enumerator;
    }
}

TEST(ModeTable, CapBit_NumberWithoutARow_IsNeverAdmitted)
{
    for (UINT32 number : unknown())
        EXPECT_EQ(static_cast<unsigned>(PMX_CAP_NEVER), cap_bit(number)) << "number " << number;
}

// The same by words with one bit, as mode setting tests them.
TEST(ModeTable, CapMask)
{
    for (const Mode& mode : all_modes)
    {
        for (unsigned bit = 0; bit < 32; ++bit)
            EXPECT_EQ(admitted(mode.mode, 1u << bit), (cap_mask(mode.mode) & 1u << bit) != 0) << mode.enumerator;
    }
}

TEST(ModeTable, CapMask_DefaultWordAdmitsEveryModeThatHasABit)
{
    const UINT32 word = _arPmxConfDefault.u4Capability;
    for (const Mode& mode : all_modes)
        EXPECT_EQ(mode.capability != never, (word & cap_mask(mode.mode)) != 0) << mode.enumerator;
    for (const mode_facts::Number& other : other_enumerators)
        EXPECT_EQ(0u, word & cap_mask(other.mode)) << other.enumerator;
}

TEST(ModeTable, CapBit_TopAndBottom23HzGoesWith29_97Hz)
{
    EXPECT_EQ(cap_bit(RES_1080P29_97HZ), cap_bit(RES_3D_1080P23HZ_TB));
    EXPECT_NE(cap_bit(RES_1080P23_976HZ), cap_bit(RES_3D_1080P23HZ_TB));
    EXPECT_EQ(cap_bit(RES_1080P24HZ), cap_bit(RES_3D_1080P24HZ_TB));
}

TEST(ModeTable, Colour)
{
    for (const Mode& mode : all_modes)
    {
        const unsigned expected = mode.colours == Colours::Sd   ? PMX_COLOUR_SD
                                  : mode.colours == Colours::Hd ? PMX_COLOUR_HD
                                                                : PMX_COLOUR_NONE;
        EXPECT_EQ(expected, colour(mode.mode)) << mode.enumerator;
    }
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
    for (UINT32 mode : all_numbers())
        EXPECT_EQ(facts_of(mode).bar, prPmxModeRow(mode)->u1CBWidth) << "mode " << mode;
}
