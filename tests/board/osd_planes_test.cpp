// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"
#include "drv_osd.h"

namespace
{

constexpr const char* OSD_AS_NEW = "{display_mode=null, resolution_changes_done=0, colour_space=null, "
                                   "full_range_conversion=0, position_offsets=null, osd5=null}";

class OsdPlanes : public DeviceTest
{
protected:
    static std::string now(std::string_view path) { return member(board::osd_planes::state(), path); }
};

TEST_F(OsdPlanes, PowerOn_NothingWasSet)
{
    EXPECT_EQ(OSD_AS_NEW, board::osd_planes::state().to_text());
}

TEST_F(OsdPlanes, PowerOn_ForgetsEverything)
{
    INT32 offsets[5] = { 1, 2, 3, 4, 5 };
    OSD_BASE_SetDisplayMode(12);
    OSD_BASE_SetFlag_PMXChangeResDone();
    OSDSetColorSpace(2);
    OSD_RNG_Set_Xvycc_En(1);
    _i4OSD_SetPosOffset(offsets);
    _i4Osd5Out(1, 0);
    EXPECT_NE(OSD_AS_NEW, board::osd_planes::state().to_text());
    power_on({});
    EXPECT_EQ(OSD_AS_NEW, board::osd_planes::state().to_text());
}

TEST_F(OsdPlanes, SetDisplayMode_KeepsTheMode)
{
    OSD_BASE_SetDisplayMode(12);
    EXPECT_EQ("OSD_BASE_SetDisplayMode(RES_1080P60HZ)", last_call());
    EXPECT_EQ("RES_1080P60HZ", now("display_mode"));

    OSD_BASE_SetDisplayMode(200);
    EXPECT_EQ("OSD_BASE_SetDisplayMode(200)", last_call());
    EXPECT_EQ("200", now("display_mode"));
}

TEST_F(OsdPlanes, PmxChangeResDone_IsCounted)
{
    OSD_BASE_SetFlag_PMXChangeResDone();
    EXPECT_EQ("OSD_BASE_SetFlag_PMXChangeResDone()", last_call());
    EXPECT_EQ("1", now("resolution_changes_done"));
    OSD_BASE_SetFlag_PMXChangeResDone();
    EXPECT_EQ("2", now("resolution_changes_done"));
}

TEST_F(OsdPlanes, SetColorSpace_KeepsTheColourSpace)
{
    OSDSetColorSpace(0);
    EXPECT_EQ("OSDSetColorSpace(DRV_PMX_CS_YCBCR_601)", last_call());
    EXPECT_EQ("DRV_PMX_CS_YCBCR_601", now("colour_space"));
    OSDSetColorSpace(1);
    EXPECT_EQ("DRV_PMX_CS_YCBCR_709", now("colour_space"));
    OSDSetColorSpace(2);
    EXPECT_EQ("DRV_PMX_CS_RGB", now("colour_space"));
    OSDSetColorSpace(3);
    EXPECT_EQ("OSDSetColorSpace(3)", last_call());
    EXPECT_EQ("3", now("colour_space"));
}

TEST_F(OsdPlanes, FullRangeConversion_IsSwitchedOnAndOff)
{
    OSD_RNG_Set_Xvycc_En(1);
    EXPECT_EQ("OSD_RNG_Set_Xvycc_En(1)", last_call());
    EXPECT_EQ("1", now("full_range_conversion"));
    OSD_RNG_Set_Xvycc_En(0);
    EXPECT_EQ("OSD_RNG_Set_Xvycc_En(0)", last_call());
    EXPECT_EQ("0", now("full_range_conversion"));
}

TEST_F(OsdPlanes, SetPosOffset_TakesACopyOfFive)
{
    INT32 offsets[5] = { 0, 6, -8, 2147483647, 1 };
    EXPECT_EQ(0, _i4OSD_SetPosOffset(offsets));
    EXPECT_EQ("_i4OSD_SetPosOffset([0, 6, -8, 2147483647, 1]) = 0", last_call());
    offsets[0] = 99;
    EXPECT_EQ("[0, 6, -8, 2147483647, 1]", now("position_offsets"));
}

TEST_F(OsdPlanes, SetPosOffset_OfNothing_IsRefused)
{
    EXPECT_EQ(-1, _i4OSD_SetPosOffset(nullptr));
    EXPECT_EQ("_i4OSD_SetPosOffset(null) = -1", last_call());
    EXPECT_EQ("null", now("position_offsets"));
}

TEST_F(OsdPlanes, Osd5Out_RoutesToBothAnalogueOutputsOrNone)
{
    EXPECT_EQ(0, _i4Osd5Out(1, 0));
    EXPECT_EQ("_i4Osd5Out(1, RES_480I) = 0", last_call());
    EXPECT_EQ("{on=1, composite_mode=RES_480I, composite_only=0}", now("osd5"));
    EXPECT_EQ(0, _i4Osd5Out(0, 1));
    EXPECT_EQ("_i4Osd5Out(0, RES_576I) = 0", last_call());
    EXPECT_EQ("{on=0, composite_mode=RES_576I, composite_only=0}", now("osd5"));
}

TEST_F(OsdPlanes, Osd5OutCvbsOnly_RoutesToCompositeAlone)
{
    EXPECT_EQ(0, _i4Osd5Out_CVBSOnly(1, 1));
    EXPECT_EQ("_i4Osd5Out_CVBSOnly(1, RES_576I) = 0", last_call());
    EXPECT_EQ("{on=1, composite_mode=RES_576I, composite_only=1}", now("osd5"));
    EXPECT_EQ(0, _i4Osd5Out(1, 1));
    EXPECT_EQ("0", now("osd5.composite_only"));
}

TEST_F(OsdPlanes, Fault_AnswersInsteadOfActing)
{
    INT32 offsets[5] = { 1, 2, 3, 4, 5 };
    answer_always("_i4OSD_SetPosOffset", -7);
    answer_always("_i4Osd5Out", -8);
    answer_always("_i4Osd5Out_CVBSOnly", -9);
    EXPECT_EQ(-7, _i4OSD_SetPosOffset(offsets));
    EXPECT_EQ(-8, _i4Osd5Out(1, 0));
    EXPECT_EQ(-9, _i4Osd5Out_CVBSOnly(1, 0));
    EXPECT_EQ("_i4Osd5Out_CVBSOnly(1, RES_480I) = -9", last_call());
    EXPECT_EQ(OSD_AS_NEW, board::osd_planes::state().to_text());
}

} // namespace
