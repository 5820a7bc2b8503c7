// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Source events that are refused, and those of the mixer's interface table, which are inert. */
#include "tests/layer/source_events.h"

using SourceRefused = SourceTest;

TEST_F(SourceRefused, VdpEnabled_UnconnectedPort_RefusedInSilence)
{
    set_record("eMasterColorSpace", 0);
    set_record("arPortInfo[1].fgEnabled", 1);
    const RecordSnapshot before;
    for (UCHAR plane = 0; plane < 4; ++plane)
        EXPECT_EQ(0u, PMX_VdpEnabled(0, plane, 1920, 1080, 7)) << +plane;
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(0, device("osd_planes.full_range_conversion"));
}

TEST_F(SourceRefused, VdpEnabled_AfterDisconnection_Refused)
{
    connect(main_video);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 1920, 1080, 0));
    EXPECT_EQ(0x71000000u, i4Pmx_Disconnect(66, 0, PMX_COMP_TYPE_VDP, 0));
    EXPECT_EQ(0u, PMX_VdpEnabled(0, 0, 1920, 1080, 0));
    EXPECT_EQ(0, record("arPortInfo[0].fgEnabled"));
}

TEST_F(SourceRefused, VdpEnabledAndDisabled_PlaneWithoutAPort_RefusedInSilence)
{
    for (const Plane& plane : { main_video, second_video })
        connect(plane);
    const RecordSnapshot before;
    for (unsigned plane = 4; plane < 256; ++plane)
    {
        EXPECT_EQ(0u, PMX_VdpEnabled(0, static_cast<UCHAR>(plane), 720, 480, 7)) << plane;
        EXPECT_EQ(0u, PMX_VdpDisabled(0, static_cast<UCHAR>(plane))) << plane;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SourceRefused, OsdEnabledAndDisabled_PlaneWithoutAPort_RefusedInSilence)
{
    set_record("eMasterColorSpace", 0);
    for (unsigned number = 0; number < 8; ++number)
        set_record("arPortInfo[" + std::to_string(number) + "].fgEnabled", 1);
    const RecordSnapshot before;
    for (unsigned plane = 6; plane < 256; ++plane)
    {
        for (const DRV_GFX_COLOR_MODE_T mode : { DRV_GFX_COLOR_MODE_YCBCR, DRV_GFX_COLOR_MODE_RGB })
            EXPECT_EQ(0u, PMX_OsdEnabled(0, static_cast<UCHAR>(plane), 1920, 1080, mode)) << plane;
        EXPECT_EQ(0u, PMX_OsdDisabled(0, static_cast<UCHAR>(plane))) << plane;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SourceRefused, PmxInterface_EventsChangeNothingOfConnectedAndEnabledSources)
{
    for (const Plane& plane : { main_video, second_video })
        connect(plane);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 1920, 1080, 0));
    EXPECT_EQ(1u, PMX_OsdEnabled(0, 0, 1920, 1080, DRV_GFX_COLOR_MODE_YCBCR));
    board::trace::clear();
    const RecordSnapshot before;
    for (const std::uintptr_t number : { 0, 1, 2, 255 })
    {
        void* const tag = reinterpret_cast<void*>(number);
        EXPECT_EQ(1, _rPMXIF.pi4OsdEnabled(tag, 720, 480, DRV_GFX_COLOR_MODE_YCBCR));
        EXPECT_EQ(1, _rPMXIF.pi4OsdDisabled(tag));
        EXPECT_EQ(1, _rPMXIF.pi4VdpEnabled(tag, 720, 480));
        EXPECT_EQ(1, _rPMXIF.pi4VdpDisabled(tag));
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}
