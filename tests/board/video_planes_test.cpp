// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/video_planes.h"

#include <stdexcept>

#include "device_test.h"
#include "drv_pmx.h"

namespace
{

constexpr const char* VIDEO_AS_NEW = "{tv_format=null, output_changes=0, planes=["
                                     "{hw_enable=VDP_ENABLED, commands=[], clear_video=null}, "
                                     "{hw_enable=VDP_DISABLED, commands=[], clear_video=null}, "
                                     "{hw_enable=VDP_DISABLED, commands=[], clear_video=null}], "
                                     "closed_caption=0, waiting_for_sync=0}";

class VideoPlanes : public DeviceTest
{
protected:
    static std::string now(std::string_view path) { return member(board::video_planes::state(), path); }
};

TEST_F(VideoPlanes, PowerOn_TheFirstPlaneAloneIsEnabled)
{
    EXPECT_EQ(VIDEO_AS_NEW, board::video_planes::state().to_text());
}

TEST_F(VideoPlanes, PowerOn_ForgetsEverything)
{
    VDP_SetTvFormat(12, 1);
    VDP_GlobalOutputChange();
    VDP_VsyncSendCmd(0, 2);
    VDP_SetClearVideo(0, 0, 0x80, 0x80);
    VDP_EnableCC(1);
    board::video_planes::set_hw_enable(1, VDP_HIDDEN);
    board::video_planes::set_waiting_for_sync(true);
    EXPECT_NE(VIDEO_AS_NEW, board::video_planes::state().to_text());
    power_on({});
    EXPECT_EQ(VIDEO_AS_NEW, board::video_planes::state().to_text());
}

TEST_F(VideoPlanes, SetTvFormat_KeepsModeAndWhetherItChanged)
{
    VDP_SetTvFormat(12, 1);
    EXPECT_EQ("VDP_SetTvFormat(RES_1080P60HZ, 1)", last_call());
    EXPECT_EQ("{mode=RES_1080P60HZ, changed=1}", now("tv_format"));
    VDP_SetTvFormat(12, 0);
    EXPECT_EQ("VDP_SetTvFormat(RES_1080P60HZ, 0)", last_call());
    EXPECT_EQ("{mode=RES_1080P60HZ, changed=0}", now("tv_format"));
    VDP_SetTvFormat(255, 1);
    EXPECT_EQ("{mode=255, changed=1}", now("tv_format"));
}

TEST_F(VideoPlanes, GlobalOutputChange_IsCounted)
{
    VDP_GlobalOutputChange();
    EXPECT_EQ("VDP_GlobalOutputChange()", last_call());
    EXPECT_EQ("1", now("output_changes"));
    VDP_GlobalOutputChange();
    EXPECT_EQ("2", now("output_changes"));
}

TEST_F(VideoPlanes, VsyncSendCmd_QueuesForItsPlane)
{
    VDP_VsyncSendCmd(0, 2);
    EXPECT_EQ("VDP_VsyncSendCmd(0, 2)", last_call());
    VDP_VsyncSendCmd(2, 2);
    VDP_VsyncSendCmd(0, 17);
    EXPECT_EQ("VDP_VsyncSendCmd(0, 17)", last_call());
    EXPECT_EQ("[2, 17]", now("planes[0].commands"));
    EXPECT_EQ("[]", now("planes[1].commands"));
    EXPECT_EQ("[2]", now("planes[2].commands"));
}

TEST_F(VideoPlanes, SetClearVideo_KeepsTheColourOfItsPlane)
{
    VDP_SetClearVideo(0, 0, 0x80, 0x81);
    EXPECT_EQ("VDP_SetClearVideo(0, 0, 128, 129)", last_call());
    EXPECT_EQ("{y=0, u=128, v=129}", now("planes[0].clear_video"));
    EXPECT_EQ("null", now("planes[1].clear_video"));
    EXPECT_EQ("null", now("planes[2].clear_video"));
}

TEST_F(VideoPlanes, PlaneThatDoesNotExist_DoesNoHarm)
{
    const board::Value before = board::video_planes::state();
    VDP_VsyncSendCmd(3, 2);
    EXPECT_EQ("VDP_VsyncSendCmd(3, 2)", last_call());
    VDP_VsyncSendCmd(0xFFFFFFFFu, 2);
    EXPECT_EQ("VDP_VsyncSendCmd(4294967295, 2)", last_call());
    VDP_SetClearVideo(3, 1, 2, 3);
    EXPECT_EQ("VDP_SetClearVideo(3, 1, 2, 3)", last_call());
    EXPECT_EQ(VDP_DISABLED, VDP_GetHwEnable(3));
    EXPECT_EQ("VDP_GetHwEnable(3) = VDP_DISABLED", last_call());
    EXPECT_EQ(VDP_DISABLED, VDP_GetHwEnable(255));
    EXPECT_EQ(before, board::video_planes::state());
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(VideoPlanes, GetHwEnable_AnswersWhatWasSetFromOutside)
{
    EXPECT_EQ(VDP_ENABLED, VDP_GetHwEnable(0));
    EXPECT_EQ("VDP_GetHwEnable(0) = VDP_ENABLED", last_call());
    EXPECT_EQ(VDP_DISABLED, VDP_GetHwEnable(1));
    EXPECT_EQ("VDP_GetHwEnable(1) = VDP_DISABLED", last_call());
    board::video_planes::set_hw_enable(0, VDP_DISABLED);
    board::video_planes::set_hw_enable(1, VDP_HIDDEN);
    board::video_planes::set_hw_enable(2, VDP_ENABLED);
    EXPECT_EQ(VDP_DISABLED, VDP_GetHwEnable(0));
    EXPECT_EQ(VDP_HIDDEN, VDP_GetHwEnable(1));
    EXPECT_EQ("VDP_GetHwEnable(1) = VDP_HIDDEN", last_call());
    EXPECT_EQ(VDP_ENABLED, VDP_GetHwEnable(2));
    EXPECT_EQ("VDP_HIDDEN", now("planes[1].hw_enable"));
}

TEST_F(VideoPlanes, SetHwEnable_OfAPlaneThatDoesNotExist_Throws)
{
    const board::Value before = board::video_planes::state();
    try
    {
        board::video_planes::set_hw_enable(3, VDP_ENABLED);
        FAIL() << "nothing was thrown";
    }
    catch (const std::invalid_argument& error)
    {
        EXPECT_STREQ("there is no video plane 3", error.what());
    }
    EXPECT_EQ(before, board::video_planes::state());
}

TEST_F(VideoPlanes, EnableCC_SwitchesCaptions)
{
    VDP_EnableCC(1);
    EXPECT_EQ("VDP_EnableCC(1)", last_call());
    EXPECT_EQ("1", now("closed_caption"));
    VDP_EnableCC(0);
    EXPECT_EQ("VDP_EnableCC(0)", last_call());
    EXPECT_EQ("0", now("closed_caption"));
}

TEST_F(VideoPlanes, IsWaitforSyncCtrl_AnswersWhatWasSetFromOutside)
{
    EXPECT_EQ(FALSE, fgVdpIsWaitforSyncCtrl());
    EXPECT_EQ("fgVdpIsWaitforSyncCtrl() = 0", last_call());
    board::video_planes::set_waiting_for_sync(true);
    EXPECT_EQ(TRUE, fgVdpIsWaitforSyncCtrl());
    EXPECT_EQ("fgVdpIsWaitforSyncCtrl() = 1", last_call());
    EXPECT_EQ("1", now("waiting_for_sync"));
    board::video_planes::set_waiting_for_sync(false);
    EXPECT_EQ(FALSE, fgVdpIsWaitforSyncCtrl());
    EXPECT_EQ("0", now("waiting_for_sync"));
}

std::vector<std::string> trace_lines()
{
    std::vector<std::string> lines;
    for (const board::TraceEntry& entry : board::trace::entries())
        lines.push_back(entry.brief());
    return lines;
}

TEST_F(VideoPlanes, ReleaseGraphics_EndsTheWaitAndTellsTheMixer)
{
    board::video_planes::set_waiting_for_sync(true);
    PMX_SetFormatChangeFlag(FALSE);
    EXPECT_EQ("fgVdpIsWaitforSyncCtrl() = 1", last_call());
    board::trace::clear();
    board::video_planes::release_graphics();
    EXPECT_EQ((std::vector<std::string>{ "NOTICE video_plane \"has its sync control\"", "LOG0 \"PMX_SetOsdEnable.\\n\"",
                                         "vPmxMixPlane(0, DRV_PMX_PLANE_3)", "vPmxMixPlane(0, DRV_PMX_PLANE_4)",
                                         "vPmxMixPlane(0, DRV_PMX_PLANE_5)", "vPmxMixPlane(0, DRV_PMX_PLANE_6)",
                                         "vPmxMixPlane(0, DRV_PMX_PLANE_7)", "LOG0 \"Set Osd Enable :0.\\n\"" }),
              trace_lines());
    EXPECT_EQ("PMX_SetOsdEnable", board::trace::entries().back().operation);
    EXPECT_EQ("0", now("waiting_for_sync"));
}

TEST_F(VideoPlanes, ReleaseGraphics_OfADriverThatDidNotWait_TellsTheMixerAllTheSame)
{
    board::video_planes::release_graphics();
    EXPECT_EQ("LOG0 \"PMX_SetOsdEnable.\\n\"", last_call());
}

TEST_F(VideoPlanes, Fault_AnswersInsteadOfTheDriver)
{
    answer_always("VDP_GetHwEnable", VDP_HIDDEN);
    answer_always("fgVdpIsWaitforSyncCtrl", 1);
    EXPECT_EQ(VDP_HIDDEN, VDP_GetHwEnable(0));
    EXPECT_EQ("VDP_GetHwEnable(0) = VDP_HIDDEN", last_call());
    EXPECT_EQ(TRUE, fgVdpIsWaitforSyncCtrl());
    EXPECT_EQ(VIDEO_AS_NEW, board::video_planes::state().to_text());
}

} // namespace
