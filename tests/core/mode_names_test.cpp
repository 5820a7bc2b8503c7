// The printable names of the resolution modes.

#include <array>
#include <cstddef>

#include <gtest/gtest.h>

#include "drv_if_pmx.h"

namespace
{

constexpr std::array<const char*, 51> names = {
    /*  0 */ "RES_480I",
    /*  1 */ "RES_576I",
    /*  2 */ "RES_480P",
    /*  3 */ "RES_576P",
    /*  4 */ "RES_480P_1440",
    /*  5 */ "RES_576P_1440",
    /*  6 */ "RES_480P_2880",
    /*  7 */ "RES_576P_2880",
    /*  8 */ "RES_720P60HZ",
    /*  9 */ "RES_720P50HZ",
    /* 10 */ "RES_1080I60HZ",
    /* 11 */ "RES_1080I50HZ",
    /* 12 */ "RES_1080P60HZ",
    /* 13 */ "RES_1080P50HZ",
    /* 14 */ "RES_1080P30HZ",
    /* 15 */ "RES_1080P25HZ",
    /* 16 */ "RES_480I_2880",
    /* 17 */ "RES_576I_2880",
    /* 18 */ "RES_1080P24HZ",
    /* 19 */ "RES_1080P23_976HZ",
    /* 20 */ "RES_1080P29_97HZ",
    /* 21 */ "RES_3D_1080P23HZ",
    /* 22 */ "RES_3D_1080P24HZ",
    /* 23 */ "RES_3D_720P60HZ",
    /* 24 */ "RES_3D_720P50HZ",
    /* 25 */ "RES_3D_720P30HZ",
    /* 26 */ "RES_3D_720P25HZ",
    /* 27 */ "RES_3D_576P50HZ",
    /* 28 */ "RES_3D_480P60HZ",
    /* 29 */ "RES_3D_1080I60HZ",
    /* 30 */ "RES_3D_1080I50HZ",
    /* 31 */ "RES_3D_1080I30HZ",
    /* 32 */ "RES_3D_1080I25HZ",
    /* 33 */ "RES_3D_576I25HZ",
    /* 34 */ "RES_3D_480I30HZ",
    /* 35 */ "RES_3D_576I50HZ",
    /* 36 */ "RES_3D_480I60HZ",
    /* 37 */ "RES_2D_480I60HZ",
    /* 38 */ "RES_2D_576I50HZ",
    /* 39 */ "RES_2D_640x480", // without the enumerator's HZ: the field's log tools expect it so
    /* 40 */ "RES_PANEL_AUO_B089AW01",
    /* 41 */ "RES_3D_720P60HZ_TB",
    /* 42 */ "RES_3D_720P50HZ_TB",
    /* 43 */ "RES_3D_1080I60HZ_SBS_HALF",
    /* 44 */ "RES_3D_1080I50HZ_SBS_HALF",
    /* 45 */ "RES_3D_1080P23HZ_TB",
    /* 46 */ "RES_3D_1080P24HZ_TB",
    /* 47 */ nullptr,
    /* 48 */ nullptr,
    /* 49 */ nullptr,
    /* 50 */ nullptr,
};

} // namespace

TEST(ModeNames, EveryEntry)
{
    static_assert(std::size(szResStr) == names.size());
    for (std::size_t mode = 0; mode < names.size(); ++mode)
        EXPECT_STREQ(names[mode], szResStr[mode]) << "mode " << mode;
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

TEST(ModeNames, The4KModesHaveNone)
{
    for (UINT32 mode : { RES_4K2K23976HZ, RES_4K2K24HZ, RES_2160P, RES_2160P_4096 })
        EXPECT_EQ(nullptr, szResStr[mode]) << "mode " << mode;
}
