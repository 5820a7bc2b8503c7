// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The end of per-output mode setting: whether graphics wait for the display part. */
#include <chrono>

#include "board/hdmi_av.h"
#include "board/video_planes.h"
#include "tests/layer/mode_ex.h"

using namespace std::chrono_literals;
using namespace mode_ex;

namespace
{

/** A request that sends an HDMI change to a board that runs the default one. */
const Request hdmi_changed{ .hdmi = on(RES_720P60HZ) };

/** What comes before the decision; the sequence itself is told elsewhere. */
void forget_until(std::string_view function)
{
    board::at_every_call([function](const board::TraceEntry& entry) {
        if (entry.function == function)
            board::trace::clear();
    });
}

} // namespace

class Wait : public mode_ex::Test
{
protected:
    void raised()
    {
        running();
        PMX_SetFormatChangeFlag(TRUE);
        forget_until("PMX_HalScalerReset");
    }
};

TEST_F(Wait, SetModeEx_FlagRaisedAndHdmiChanged_GraphicsAreHeldBack)
{
    running();
    PMX_SetFormatChangeFlag(TRUE);
    board::trace::clear();
    const RecordSnapshot before;
    const Sent sent{ .hdmi_mode = RES_720P60HZ, .format = RES_1080P60HZ };
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(1, RES_1080P60HZ)\n"
        LOG9 "HDMI(1, RES_720P60HZ)\n"
        LOG9 "CAV (1, RES_1080P60HZ)\n"
        LOG9 "CVBS(1, RES_480I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(0)\n"
        LOG9 "HD Exist(1)\n"
        TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)
    )" + pll_and_port(sent) +
                 hdmi_change(sent) + R"(
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        PMX_HalScalerReset(0)
        i4GetHotPlugStatus() = 1
        LOG9 "[PMX] fgPMX_DisplayModeReady is 1.\n"
        LOG0 "[PMX] VDP_SetClearVideo & Not Mix OSD..\n"
        VDP_SetClearVideo(0, 0, 0x80, 0x80)
        vPmxNotMixPlane(0, 2)
        vPmxNotMixPlane(0, 3)
        vPmxNotMixPlane(0, 4)
        vPmxNotMixPlane(0, 5)
        vPmxNotMixPlane(0, 6)
        LOG0 "Display Format Change Timer Set.\n"
        x_timer_stop(2) = 0
        x_timer_start(2, 10000, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = 0
    )");
    EXPECT_RECORD_CHANGED(before, "arOutputConf[1].eResMode", "status.fgTimerAlreadySet");
    EXPECT_EQ(1, record("status.fgTimerAlreadySet"));
    EXPECT_EQ(1, record("status.fgPmxFormatChangeFlag"));
}

TEST_F(Wait, SetModeEx_TimersFlagIsSetBehindItsStart)
{
    raised();
    std::int64_t at_start = -1;
    at_call("x_timer_start", [&at_start] { at_start = record("status.fgTimerAlreadySet"); });
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_EQ(0, at_start);
    EXPECT_EQ(1, record("status.fgTimerAlreadySet"));
}

TEST_F(Wait, SetModeEx_TimerFails_AssertsAndGoesOnAsIfItRan)
{
    raised();
    board::faults::set({ "x_timer_start", -1 });
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_EQ(1, record("status.fgTimerAlreadySet"));
    expect_asserts(1);
}

TEST_F(Wait, SetModeEx_AnyNonZeroFlag_IsHeldBack)
{
    raised();
    for (const int flag : { 2, 255 })
    {
        set_record("status.fgPmxFormatChangeFlag", flag);
        EXPECT_EQ(1u, set_mode({ .hdmi = on(flag == 2 ? RES_720P60HZ : RES_1080I60HZ) }));
        std::string lines = "i4GetHotPlugStatus() = 1\n";
        lines += held_back;
        lines.replace(lines.find("Ready is 1"), 10, "Ready is " + std::to_string(flag));
        EXPECT_TRACE(lines);
    }
}

TEST_F(Wait, SetModeEx_HeldBack_TheTimerBringsGraphicsBackAfterTenSeconds)
{
    raised();
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_TRACE(std::string("i4GetHotPlugStatus() = 1\n") + held_back);
    board::advance(10s - 1us);
    EXPECT_NO_TRACE();
    board::advance(1us);
    EXPECT_TRACE(std::string("LOG0 \"PMX timeout.\\n\"\n") + lowered);
    EXPECT_EQ(0, record("status.fgTimerAlreadySet"));
}

TEST_F(Wait, SetModeEx_FlagRaisedDuringAFullChange_IsHeldBackToo)
{
    running();
    board::at_every_call([](const board::TraceEntry& entry) {
        if (entry.function == "OSD_BASE_SetFlag_PMXChangeResDone")
        {
            PMX_SetFormatChangeFlag(TRUE);
            board::trace::clear();
        }
    });
    EXPECT_EQ(1u, set_mode({ .frequency = 50 }));
    EXPECT_TRACE(std::string("i4GetHotPlugStatus() = 1\n") + held_back);
}

TEST_F(Wait, SetModeEx_NoHdmiChange_LowersARaisedFlagWithoutAskingForASink)
{
    raised();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({}));
    EXPECT_TRACE(not_waiting);
    EXPECT_RECORD_CHANGED(before, "status.fgPmxFormatChangeFlag");
}

TEST_F(Wait, SetModeEx_NoSink_NeverWaits)
{
    raised();
    board::hdmi_av::plug(false);
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_TRACE(std::string(R"(
        i4GetHotPlugStatus() = 0
        LOG0 "[PMX] fgHdmiExist:1, Not wait display part...\n"
    )") + lowered +
                 R"(LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n")");
    EXPECT_EQ(0, record("status.fgPmxFormatChangeFlag"));
    EXPECT_EQ(0, record("status.fgTimerAlreadySet"));
}

TEST_F(Wait, SetModeEx_NoSinkOnAFullChange_NeverWaits)
{
    running();
    board::hdmi_av::plug(false);
    PMX_SetFormatChangeFlag(TRUE);
    forget_until("OSD_BASE_SetFlag_PMXChangeResDone");
    EXPECT_EQ(1u, set_mode({ .chip = DRV_EXT_SCL_EXT_TX }));
    EXPECT_TRACE(std::string(R"(
        i4GetHotPlugStatus() = 0
        LOG0 "[PMX] fgHdmiExist:1, Not wait display part...\n"
    )") + lowered +
                 R"(LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n")");
}

TEST_F(Wait, SetModeEx_HotPlugStatusOtherThanOne_IsNoSink)
{
    raised();
    UINT32 mode = RES_480P;
    for (const int answer : { -1, 0, 2, 0x101 })
    {
        PMX_SetFormatChangeFlag(TRUE);
        board::faults::set({ "i4GetHotPlugStatus", answer });
        EXPECT_EQ(1u, set_mode({ .hdmi = on(mode++) }));
        EXPECT_TRACE("i4GetHotPlugStatus() = " + std::to_string(answer) + R"(
            LOG0 "[PMX] fgHdmiExist:1, Not wait display part...\n"
        )" + lowered +
                     R"(LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n")");
    }
}

TEST_F(Wait, SetModeEx_NoSinkButTheFlagIsRaisedAgainInBetween_IsHeldBack)
{
    raised();
    board::hdmi_av::plug(false);
    board::at_every_call([](const board::TraceEntry& entry) {
        if (entry.text == "Set Osd Enable :0.\n")
        {
            PMX_SetFormatChangeFlag(TRUE);
            board::trace::clear();
        }
    });
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_TRACE(held_back);
    EXPECT_EQ(1, record("status.fgTimerAlreadySet"));
}

TEST_F(Wait, SetModeEx_TimerRunningAndNoHdmiChange_WaitsOnWhileTheFlagIsRaised)
{
    raised();
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_TRACE(std::string("i4GetHotPlugStatus() = 1\n") + held_back);
}

TEST_F(Wait, SetModeEx_TimerRunningAndFlagLow_AsksForASinkAndIsReady)
{
    raised();
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    PMX_SetFormatChangeFlag(FALSE);
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_TRACE(R"(
        i4GetHotPlugStatus() = 1
        LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n"
    )");
    EXPECT_EQ(1, record("status.fgTimerAlreadySet"));
}

TEST_F(Wait, SetModeEx_TimerRunningAndTheSinkIsGone_LowersTheFlagWithoutAnHdmiChange)
{
    raised();
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    board::hdmi_av::plug(false);
    EXPECT_EQ(1u, set_mode(hdmi_changed));
    EXPECT_TRACE(std::string(R"(
        i4GetHotPlugStatus() = 0
        LOG0 "[PMX] fgHdmiExist:0, Not wait display part...\n"
    )") + lowered +
                 R"(LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n")");
    EXPECT_EQ(1, record("status.fgTimerAlreadySet"));
}

TEST_F(Wait, SetModeEx_NotWaitingWhileTheVideoPlaneDoes_OwesTheRelease)
{
    raised();
    board::video_planes::set_waiting_for_sync(true);
    EXPECT_EQ(1u, set_mode({}));
    EXPECT_TRACE(R"(
        LOG0 "[PMX] fgHdmiExist:0, Not wait display part...\n"
        LOG0 "Display Format Change :0.\n"
        LOG0 "Set Osd Enable :1.\n"
        fgVdpIsWaitforSyncCtrl() = 1
        LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n"
    )");
    EXPECT_EQ(1, record("status.fgPmxEnabeOsdFlag"));
}
