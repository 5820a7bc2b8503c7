// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include "board/board.h"
#include "scenario_run.h"

namespace
{

using tool_test::diagnostics;

constexpr const char* SOURCE_USAGE =
    "here.pmx:1: write: source NAME connect, source NAME disconnect, source VDP start SIZE [luma N], source OSD start "
    "SIZE ycbcr|rgb, source NAME size SIZE, source NAME stop, source NAME picture FILE, source NAME picture "
    "bars|ramp|checker|card, source NAME picture solid R,G,B, or source NAME connects-back on|off; SIZE is 1920x1080 "
    "or the like; NAME is vdp0…vdp3 or osd0…osd5; VDP is vdp0…vdp3; OSD is osd0…osd5; R,G,B is a colour, such as "
    "255,128,0\n";
constexpr const char* DELAY_USAGE =
    "here.pmx:1: write: plane-delay D D D D D D D D, or plane-delay order ORDER D D D D D D D D; ORDER is an order of "
    "planes, such as 0x76543210; D is the delay of a plane, plane 1 first\n";

TEST(SourceVerbs, VideoPlane_FromConnectToDisconnect)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nsource vdp0 connect\nexpect result 0x71000000\n"
                              "expect state arPortInfo[0].fgConnected 1\nexpect state sources.vdp0.connected 1\n"
                              "source vdp0 start 1920x1080\nexpect result 1\nexpect state sources.vdp0.luma_key 0\n"
                              "expect next NOTICE source \"vdp0 starts, 1920x1080, luma key 0\"\n"
                              "source vdp0 size 720x576\nexpect result 1\n"
                              "expect state sources.vdp0.size {width=720, height=576}\n"
                              "expect state eMasterColorSpace DRV_PMX_CS_YCBCR_601\n"
                              "source vdp0 stop\nexpect result 1\nexpect state arPortInfo[0].fgEnabled 0\n"
                              "source vdp0 disconnect\nexpect result 0x71000000\n"
                              "expect state arPortInfo[0].fgConnected 0"));
}

TEST(SourceVerbs, VideoPlane_WithLumaKey)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nsource vdp1 start 720x480 luma 255\nexpect result 1\n"
                              "expect state arPortInfo[1].ucLumaKey 255\n"
                              "source vdp1 start 720x480 luma 0x10\nexpect state arPortInfo[1].ucLumaKey 16"));
}

TEST(SourceVerbs, OsdPlane_InBothColourModes)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nsource osd3 start 720x576 ycbcr\nexpect result 1\n"
                              "expect state eMasterColorSpace DRV_PMX_CS_YCBCR_601\n"
                              "expect state sources.osd3.colour_mode DRV_GFX_COLOR_MODE_YCBCR\n"
                              "source osd5 start 1280x720 rgb\nexpect state arPortInfo[7].fgEnabled 1\n"
                              "expect state eMasterColorSpace DRV_PMX_CS_YCBCR_601\n"
                              "source osd3 stop\nexpect result 1\nsource osd3 disconnect\nexpect result 0x71000000"));
}

TEST(SourceVerbs, Sizes_CanBeAnything32BitsHold)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nsource osd0 start -2147483648x2147483647 ycbcr\n"
                              "expect state sources.osd0.size {width=-2147483648, height=2147483647}\n"
                              "expect state arPortInfo[2].eSrcColorSpace DRV_PMX_CS_YCBCR_709\n"
                              "source osd0 size 0x0\nexpect state arPortInfo[2].eSrcColorSpace DRV_PMX_CS_YCBCR_601"));
}

TEST(SourceVerbs, ConnectsBack_IsAMisuseThatNoLineExpected)
{
    const std::string lines = "PMX_Init\nsource vdp0 connect\nsource vdp0 connects-back on\n"
                              "expect state sources.vdp0.connects_back 1\nsource osd0 start 720x576 ycbcr\n";
    EXPECT_EQ("here.pmx:5: the platform was misused 3 times, and 0 were expected; the last: x_sema_unlock: unlock "
              "without lock, handle 1\nrepeat: pmxboard run here.pmx\n",
              diagnostics(lines));
    EXPECT_EQ("", diagnostics(lines + "expect misuses 3\nsource vdp0 connects-back off\n"
                                      "source osd0 size 1280x720\nexpect misuses 3"));
}

TEST(SourceVerbs, Resize_OfAStoppedSource_IsAFailedStep)
{
    EXPECT_EQ("here.pmx:1: vdp2 is stopped: its size comes when it starts\nrepeat: pmxboard run here.pmx\n",
              diagnostics("source vdp2 size 1x1"));
}

TEST(SourceVerbs, Source_WrittenWrong_IsRefused)
{
    for (const char* const wrong : { "source",
                                     "source vdp0",
                                     "source vdp0 go",
                                     "source vdp0 connect now",
                                     "source vdp0 start",
                                     "source vdp0 start 1920",
                                     "source vdp0 start 1920x",
                                     "source vdp0 start x1080",
                                     "source vdp0 start 1920x1080x",
                                     "source vdp0 start 1920*1080",
                                     "source vdp0 start 4294967296x1",
                                     "source vdp0 start 1x2147483648",
                                     "source vdp0 start 1920x1080 luma",
                                     "source vdp0 start 1920x1080 key 1",
                                     "source vdp0 start 1x1 rgb",
                                     "source osd0 start 1920x1080",
                                     "source osd0 start 1920x1080 yuv",
                                     "source osd0 start 1x1 luma 1",
                                     "source osd0 start 1x1 rgb rgb",
                                     "source vdp0 size",
                                     "source vdp0 size 1x1 1",
                                     "source vdp0 stop 1",
                                     "source vdp0 connects-back",
                                     "source vdp0 connects-back 1",
                                     "source osd0 connects-back maybe" })
        EXPECT_EQ(SOURCE_USAGE, diagnostics(wrong)) << wrong;
    EXPECT_EQ("here.pmx:1: there is no source vdp4; did you mean vdp0, vdp1, vdp2?\n",
              diagnostics("source vdp4 connect"));
    EXPECT_EQ("here.pmx:1: an OSD plane is told nothing, and so has no place to connect back from\n",
              diagnostics("source osd0 connects-back on"));
    EXPECT_EQ("here.pmx:1: the luma key is 0 to 255, not 256\n", diagnostics("source vdp0 start 1x1 luma 256"));
}

TEST(SourceVerbs, PlaneDelay_OfAllArrangementsAndOfOne)
{
    EXPECT_EQ("",
              diagnostics("plane-delay 1 -2 3 4 5 6 7 0x8\nexpect state mixer.plane_delay [1, -2, 3, 4, 5, 6, 7, 8]\n"
                          "plane-delay order 0x01234567 9 9 9 9 9 9 9 9\n"
                          "expect state mixer.arrangements[0].order 0x01234567\n"
                          "expect state mixer.arrangements[0].delay [9, 9, 9, 9, 9, 9, 9, 9]\n"
                          "PMX_SetArbPlaneOrder 0 0x76543210\nexpect call DCM_SetVideoPlaneDelay(1, -2)\n"
                          "PMX_SetArbPlaneOrder 0 0x01234567\nexpect call DCM_SetVideoPlaneDelay(9, 9)"));
}

TEST(SourceVerbs, PlaneDelay_WrittenWrong_IsRefused)
{
    for (const char* const wrong :
         { "plane-delay", "plane-delay 1", "plane-delay 1 2 3 4 5 6 7", "plane-delay 1 2 3 4 5 6 7 8 9",
           "plane-delay order 0x76543210", "plane-delay order 1 2 3 4 5 6 7 8",
           "plane-delay order 0x76543210 1 2 3 4 5 6 7" })
        EXPECT_EQ(DELAY_USAGE, diagnostics(wrong)) << wrong;
    EXPECT_EQ("here.pmx:1: a plane's delay is -2147483648 to 2147483647, not 2147483648\n",
              diagnostics("plane-delay 1 2 3 4 5 6 7 2147483648"));
    EXPECT_EQ("here.pmx:1: the order is 0 to 4294967295, not 0x100000000\n",
              diagnostics("plane-delay order 0x100000000 1 2 3 4 5 6 7 8"));
    EXPECT_EQ("here.pmx:1: the order of an arrangement names each source 0 to 7 once, plane 1 in the lowest four bits; "
              "plane 2 has source 1, which another one has\n",
              diagnostics("plane-delay order 0x76543211 1 2 3 4 5 6 7 8"));
}

} // namespace
