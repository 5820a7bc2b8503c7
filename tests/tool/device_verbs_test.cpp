// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include "board/board.h"
#include "scenario_run.h"

namespace
{

using tool_test::diagnostics;

constexpr const char* MODE_EX =
    "PMX_SetModeEx 0 [ [0], [1, RES_720P60HZ], [1, RES_480P], [1, RES_480I] ] 60 DRV_NON_EXT_CHIP 0\n";

TEST(DeviceVerbs, Sink_PluggedAndUnplugged)
{
    EXPECT_EQ("", diagnostics("sink unplug\nexpect next NOTICE plug \"HDMI sink unplugged\"\nexpect no-more\n"
                              "expect state hdmi_av.sink_plugged 0\nsink plug\n"
                              "expect next NOTICE plug \"HDMI sink plugged in\"\nexpect state hdmi_av.sink_plugged 1"));
}

TEST(DeviceVerbs, Sink_RequestsTheResolution)
{
    EXPECT_EQ("", diagnostics("sink request-resolution\nexpect state hdmi_av.resolution_requested 1\n"
                              "sink request-resolution off\nexpect state hdmi_av.resolution_requested 0\n"
                              "sink request-resolution on\nexpect state hdmi_av.resolution_requested 1"));
}

TEST(DeviceVerbs, Sink_ChoosesAResolution)
{
    EXPECT_EQ("", diagnostics("sink valid RES_720P50HZ 50\n"
                              "expect state hdmi_av.chosen_resolution {mode=RES_720P50HZ, frequency=50}\n"
                              "PMX_ChkSupportedRes 0 RES_1080P60HZ 60\nexpect result 1\n"
                              "expect out ucSupportedAutoRes RES_720P50HZ\nexpect out ucSupportedAutoVsyncFreg 50\n"
                              "sink valid asked\nPMX_ChkSupportedRes 0 RES_1080P60HZ 60\n"
                              "expect out ucSupportedAutoRes RES_1080P60HZ\n"
                              "fault fgPmxDrvGetAvdInfo FALSE\nPMX_ChkSupportedRes 0 RES_1080P60HZ 60\n"
                              "expect result 0\nexpect out ucSupportedAutoRes untouched"));
}

TEST(DeviceVerbs, DisplayPart_AnswersAfterATime_NeverOrNotAtAll)
{
    const std::string change = MODE_EX;
    EXPECT_EQ("",
              diagnostics("PMX_Init\ndisplay-part answer 250ms\nexpect state display_part.answer \"250ms\"\n" + change +
                          "expect call vPmxNotMixPlane(0, 6)\nadvance 249ms\nexpect no-more\nadvance 1ms\n"
                          "expect next NOTICE display_part \"has switched\"\nexpect call vPmxMixPlane(0, 6)"));
    EXPECT_EQ("", diagnostics("PMX_Init\ndisplay-part never\n" + change +
                              "expect call vPmxNotMixPlane(0, 6)\nadvance 9999ms\nexpect no-more\nadvance 1ms\n"
                              "expect next NOTICE expiry *"));
    EXPECT_EQ("", diagnostics("PMX_Init\ndisplay-part never\ndisplay-part off\n" + change +
                              "expect none vPmxNotMixPlane\nexpect state display_part.resolution_changes 1"));
}

TEST(DeviceVerbs, DisplayPart_RaisesAndLowersAtOnce)
{
    EXPECT_EQ("", diagnostics("display-part raise\nexpect state status.fgPmxFormatChangeFlag 1\n"
                              "expect state display_part.switching 1\ndisplay-part lower\n"
                              "expect state status.fgPmxFormatChangeFlag 0\nexpect call vPmxMixPlane(0, 2)\n"
                              "expect state display_part.switching 0"));
}

TEST(DeviceVerbs, VideoPlane_WaitsAndReleasesGraphics)
{
    EXPECT_EQ("", diagnostics("video-plane waiting on\nexpect no-more\nexpect state video_planes.waiting_for_sync 1\n"
                              "display-part lower\nexpect none vPmxMixPlane\nvideo-plane waiting off\n"
                              "expect next NOTICE video_plane \"has its sync control\"\n"
                              "expect call vPmxMixPlane(0, 2)\nexpect state video_planes.waiting_for_sync 0"));
}

TEST(DeviceVerbs, VideoPlane_HardwareEnable)
{
    EXPECT_EQ("", diagnostics("video-plane hw-enable 1 VDP_HIDDEN\n"
                              "expect state video_planes.planes[1].hw_enable VDP_HIDDEN\n"
                              "video-plane hw-enable 0 0\nexpect state video_planes.planes[0].hw_enable VDP_DISABLED"));
}

TEST(DeviceVerbs, WrittenWrong_AreRefused)
{
    for (const char* const wrong : { "sink", "sink pull", "sink plug on", "sink unplug 1",
                                     "sink request-resolution yes", "sink request-resolution on on", "sink valid",
                                     "sink valid RES_480P", "sink valid asked 60", "sink valid RES_480P 60 60" })
    {
        const bool misread = std::string(wrong) == "sink valid asked 60";
        EXPECT_EQ(misread ? "here.pmx:1: the resolution: asked is neither a number nor a name\n"
                          : "here.pmx:1: write: sink plug, sink unplug, sink request-resolution [on|off], sink valid "
                            "MODE HZ, or sink valid asked\n",
                  diagnostics(wrong))
            << wrong;
    }
    for (const char* const wrong : { "display-part", "display-part on", "display-part answer", "display-part answer 3",
                                     "display-part answer never", "display-part raise 1", "display-part off 1s" })
        EXPECT_EQ("here.pmx:1: write: display-part off|never, display-part answer TIME, display-part raise, or "
                  "display-part lower; "
                  "TIME is 10s, 500ms or 2us\n",
                  diagnostics(wrong))
            << wrong;
    for (const char* const wrong : { "video-plane", "video-plane waiting", "video-plane waiting 1",
                                     "video-plane sync on", "video-plane waiting on 1", "video-plane hw-enable 1" })
        EXPECT_EQ("here.pmx:1: write: video-plane waiting on|off, or video-plane hw-enable PLANE STATE\n",
                  diagnostics(wrong))
            << wrong;
}

TEST(DeviceVerbs, ValuesThatDoNotFit_AreRefused)
{
    EXPECT_EQ("here.pmx:1: the frequency is 0 to 65535, not 65536\n", diagnostics("sink valid RES_480P 65536"));
    EXPECT_EQ("here.pmx:1: the time in s is 0 to 31622400, not 31622401\n",
              diagnostics("display-part answer 31622401s"));
    EXPECT_EQ("here.pmx:1: there is no video plane 200\n", diagnostics("video-plane hw-enable 200 VDP_ENABLED"));
    EXPECT_TRUE(diagnostics("video-plane hw-enable 0 VDP_ENABLE").starts_with("here.pmx:1: the enable state: "));
}

} // namespace
