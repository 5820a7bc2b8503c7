// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** A video plane stops: the mixer forgets that it runs, and decides nothing. */
#include "tests/layer/source_events.h"

using source_events::change;
using source_events::log8;

class SourceVdpDisabled : public SourceTest
{
protected:
    static bool full_range() { return device("osd_planes.full_range_conversion") != 0; }
};

TEST_F(SourceVdpDisabled, VdpDisabled_EachPlane_ClearsItsPortAlone)
{
    for (UCHAR plane = 0; plane < 4; ++plane)
    {
        const std::string port = plane == 0 ? "arPortInfo[0]" : "arPortInfo[1]";
        for (const char* every : { "arPortInfo[0].fgEnabled", "arPortInfo[1].fgEnabled" })
            set_record(every, 1);
        const RecordSnapshot before;
        EXPECT_EQ(1u, PMX_VdpDisabled(0, plane));
        EXPECT_TRACE(log8("VDP_%d Disabled", plane) + (plane == 2 ? R"(LOG8 "Turn off OSD full range conversion\n"
            OSD_RNG_Set_Xvycc_En(0)
        )"
                                                                  : ""));
        EXPECT_RECORD_CHANGED(before, port + ".fgEnabled");
        EXPECT_EQ(0, record(port + ".fgEnabled"));
    }
}

TEST_F(SourceVdpDisabled, VdpDisabled_ConnectedOrNot_TheSame)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 0));
    EXPECT_TRACE(log8("VDP_%d Disabled", 0));
    EXPECT_RECORD_UNCHANGED(before);
    connect(main_video);
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 0));
    EXPECT_TRACE(log8("VDP_%d Disabled", 0));
    EXPECT_EQ(1, record("arPortInfo[0].fgConnected"));
    EXPECT_EQ(0, record("arPortInfo[0].u2CompId"));
    EXPECT_EQ(PMX_COMP_TYPE_VDP, record("arPortInfo[0].u2CompType"));
}

TEST_F(SourceVdpDisabled, VdpDisabled_MainVideo_MasterStaysUntilAnotherDecision)
{
    for (const Plane& plane : { main_video, second_video })
        connect(plane);
    mix_second_video(true);
    set_record("arPortInfo[1].fgEnabled", 1);
    set_record("arPortInfo[1].ucLumaKey", 1); // BT.709, and out of the decision as long as it is not asked for
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 720, 480, 0));
    set_record("eMasterColorSpace", DRV_PMX_CS_YCBCR_601);
    board::trace::clear();

    EXPECT_EQ(1u, PMX_VdpDisabled(0, 0));
    EXPECT_TRACE(log8("VDP_%d Disabled", 0));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("eMasterColorSpace"));

    EXPECT_EQ(1u, PMX_OsdDisabled(0, 3));
    EXPECT_TRACE(log8("OSD_%d Disabled", 3) + "fgPmxHalMixPlane(0, 1) = 1\n" +
                 log8("[PMX] VDP_COMP_2 enabled and Color Space is %d.", 1) +
                 change(0, 1, { main_video, second_video }));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, record("eMasterColorSpace"));
}

TEST_F(SourceVdpDisabled, VdpDisabled_SecondVideo_FullRangeIsNotSwitchedBackOn)
{
    connect(background);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 2, 720, 480, 0));
    EXPECT_TRUE(full_range());
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 1, 720, 480, 0));
    EXPECT_FALSE(full_range());
    board::trace::clear();
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 1));
    EXPECT_TRACE(log8("VDP_%d Disabled", 1));
    EXPECT_FALSE(full_range());
}

TEST_F(SourceVdpDisabled, VdpDisabled_Background_FullRangeOff)
{
    connect(background);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 2, 720, 480, 0));
    EXPECT_TRUE(full_range());
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 2));
    EXPECT_FALSE(full_range());
}

TEST_F(SourceVdpDisabled, VdpDisabled_OneOfTheSharedPort_TheOtherIsNotEnabledAnyMoreEither)
{
    connect(second_video);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 1, 720, 480, 0));
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 3));
    EXPECT_EQ(0, record("arPortInfo[1].fgEnabled"));
}

TEST_F(SourceVdpDisabled, VdpDisabled_WhatIsKnownOfTheSourceStays)
{
    connect(second_video);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 1, 720, 480, 33));
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 1));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("arPortInfo[1].eSrcColorSpace"));
    EXPECT_EQ(33, record("arPortInfo[1].ucLumaKey"));
}
