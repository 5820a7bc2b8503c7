// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The printable names of the resolution modes.

#include <iterator>

#include <gtest/gtest.h>

#include "tests/layer/mode_facts.h"

TEST(ModeNames, EveryEntry)
{
    static_assert(std::size(szResStr) == RES_MODE_NUM);
    for (UINT32 mode = 0; mode < RES_MODE_NUM; ++mode)
        EXPECT_STREQ(mode_facts::printable(mode), szResStr[mode]) << "mode " << mode;
}

TEST(ModeNames, StandAtTheirEnumerators)
{
    EXPECT_STREQ("RES_480I", szResStr[RES_480I]);
    EXPECT_STREQ("RES_1080P60HZ", szResStr[RES_1080P60HZ]);
    EXPECT_STREQ("RES_3D_1080P24HZ_TB", szResStr[RES_3D_1080P24HZ_TB]);
}

TEST(ModeNames, RES_2D_640x480HZ_IsPrintedWithoutHz)
{
    EXPECT_STREQ("RES_2D_640x480", szResStr[RES_2D_640x480HZ]);
}

TEST(ModeNames, ModesWithoutARowHaveNone)
{
    for (UINT32 mode = mode_facts::known; mode < RES_MODE_NUM; ++mode)
        EXPECT_EQ(nullptr, szResStr[mode]) << "mode " << mode;
}
