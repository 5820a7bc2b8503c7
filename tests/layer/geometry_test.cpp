// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** What the current mode is reported as: progressive, HD; that nothing is remembered from an earlier mode. */
#include "tests/layer/mode_facts.h"
#include "tests/support/layer_fixture.h"

using ProgressiveOut = LayerTest;
using HdOutput = LayerTest;

using mode_facts::facts_of;

TEST_F(ProgressiveOut, ProgressiveOut_EveryModeNumber)
{
    started();
    unsigned number = 0;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        set_record("ucMode", mode);
        EXPECT_EQ(facts_of(mode).is(mode_facts::progressive) ? 1 : 0, PMX_ProgressiveOut(0)) << mode;
        number += PMX_ProgressiveOut(0);
    }
    EXPECT_EQ(mode_facts::modes_with(mode_facts::progressive).size(), number);
    EXPECT_NO_TRACE();
}

TEST_F(ProgressiveOut, ProgressiveOut_480IAnd576IAndEveryModeAboveThePanel_Zero)
{
    started();
    set_record("ucMode", RES_480I);
    EXPECT_EQ(0, PMX_ProgressiveOut(0));
    set_record("ucMode", RES_576I);
    EXPECT_EQ(0, PMX_ProgressiveOut(0));
    set_record("ucMode", RES_PANEL_AUO_B089AW01);
    EXPECT_EQ(1, PMX_ProgressiveOut(0));
    for (unsigned mode = RES_PANEL_AUO_B089AW01 + 1; mode < 256; ++mode)
    {
        set_record("ucMode", mode);
        EXPECT_EQ(0, PMX_ProgressiveOut(0)) << mode;
    }
}

TEST_F(ProgressiveOut, ProgressiveOut_23_976And29_97Hertz_AreNotThough24Is)
{
    started();
    for (const auto& [mode, expected] :
         { std::pair{ RES_1080P23_976HZ, 0 }, { RES_1080P29_97HZ, 0 }, { RES_1080P24HZ, 1 }, { RES_1080P30HZ, 1 } })
    {
        set_record("ucMode", mode);
        EXPECT_EQ(expected, PMX_ProgressiveOut(0)) << mode;
    }
}

TEST_F(ProgressiveOut, ProgressiveOut_TopAndBottomModes_AreNotThoughTheirFramePackedTwinsAre)
{
    started();
    for (const auto& [mode, expected] : { std::pair{ RES_3D_720P60HZ_TB, 0 },
                                          { RES_3D_720P50HZ_TB, 0 },
                                          { RES_3D_1080P23HZ_TB, 0 },
                                          { RES_3D_1080P24HZ_TB, 0 },
                                          { RES_3D_720P60HZ, 1 },
                                          { RES_3D_720P50HZ, 1 },
                                          { RES_3D_1080P23HZ, 1 },
                                          { RES_3D_1080P24HZ, 1 } })
    {
        set_record("ucMode", mode);
        EXPECT_EQ(expected, PMX_ProgressiveOut(0)) << mode;
    }
}

TEST_F(ProgressiveOut, ProgressiveOut_OtherMixerId_Zero)
{
    started();
    set_record("ucMode", RES_1080P60HZ);
    EXPECT_EQ(1, PMX_ProgressiveOut(0));
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0, PMX_ProgressiveOut(static_cast<UCHAR>(id))) << id;
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(HdOutput, FmtHDOutput_EveryModeNumber)
{
    started();
    unsigned number = 0;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        set_record("ucMode", mode);
        EXPECT_EQ(facts_of(mode).is(mode_facts::hd_out) ? 1 : 0, fgPmxFmtHDOutput(0)) << mode;
        number += fgPmxFmtHDOutput(0);
    }
    EXPECT_EQ(256u - mode_facts::known + mode_facts::modes_with(mode_facts::hd_out).size(), number);
    EXPECT_NO_TRACE();
}

TEST_F(HdOutput, FmtHDOutput_MoreThanTheTvEncodersHdFormats)
{
    started();
    unsigned more = 0;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        set_record("ucMode", mode);
        const bool is_more = mode == RES_1080P29_97HZ || mode == RES_2D_576I50HZ || mode >= mode_facts::known;
        EXPECT_EQ(is_more || facts_of(mode).is(mode_facts::tve_hd) ? 1 : 0, fgPmxFmtHDOutput(0)) << mode;
        more += is_more ? 1 : 0;
    }
    EXPECT_EQ(2u + 256 - mode_facts::known, more);
}

TEST_F(HdOutput, FmtHDOutput_2D576I_IsHdAndOf1920x1080)
{
    started();
    set_record("ucMode", RES_2D_576I50HZ);
    UINT32 width = 0;
    UINT32 height = 0;
    EXPECT_EQ(1u, PMX_GetOutSize(0, &width, &height));
    EXPECT_EQ(1920u, width);
    EXPECT_EQ(1080u, height);
    EXPECT_EQ(TRUE, fgPmxFmtHDOutput(0));
    EXPECT_EQ(0, PMX_ProgressiveOut(0));
}

TEST_F(HdOutput, FmtHDOutput_MixerIdIsNotChecked)
{
    started();
    const RecordSnapshot before;
    for (unsigned id = 0; id < 256; ++id)
    {
        set_record("ucMode", RES_720P60HZ);
        EXPECT_EQ(TRUE, fgPmxFmtHDOutput(static_cast<UCHAR>(id))) << id;
        set_record("ucMode", RES_480P);
        EXPECT_EQ(FALSE, fgPmxFmtHDOutput(static_cast<UCHAR>(id))) << id;
    }
    set_record("ucMode", RES_1080P60HZ);
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(HdOutput, Geometry_FollowsTheModeThatWasSetLast)
{
    started();
    struct Expected
    {
        unsigned mode;
        UINT32 width;
        UINT32 height;
        int progressive;
        int hd;
    };
    for (const Expected& expected :
         { Expected{ RES_720P50HZ, 1280, 720, 1, 1 }, Expected{ RES_576I, 720, 576, 0, 0 },
           Expected{ RES_2D_640x480HZ, 640, 480, 1, 0 }, Expected{ RES_PANEL_AUO_B089AW01, 1024, 600, 1, 1 },
           Expected{ RES_1080I50HZ, 1920, 1080, 0, 1 } })
    {
        EXPECT_EQ(1u, PMX_SetMode(0, static_cast<UCHAR>(expected.mode), 50, 0));
        EXPECT_EQ(0u, PMX_SetMode(0, RES_2160P, 50, 0)); // refused: changes nothing
        UINT32 width = 0;
        UINT32 height = 0;
        EXPECT_EQ(1u, PMX_GetOutSize(0, &width, &height));
        EXPECT_EQ(expected.width, width) << expected.mode;
        EXPECT_EQ(expected.height, height) << expected.mode;
        EXPECT_EQ(expected.progressive, PMX_ProgressiveOut(0)) << expected.mode;
        EXPECT_EQ(expected.hd, fgPmxFmtHDOutput(0)) << expected.mode;
    }
}

TEST_F(HdOutput, Geometry_BeforeTheFirstReset_TheModeIs480I)
{
    UINT32 width = 0;
    UINT32 height = 0;
    EXPECT_EQ(1u, PMX_GetOutSize(0, &width, &height));
    EXPECT_EQ(720u, width);
    EXPECT_EQ(480u, height);
    EXPECT_EQ(0, PMX_ProgressiveOut(0));
    EXPECT_EQ(FALSE, fgPmxFmtHDOutput(0));
    EXPECT_NO_TRACE();
}
