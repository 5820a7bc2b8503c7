// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** From state to state of the handshake with the display part, by the calls that lead there. */
#include <chrono>

#include "board/hdmi_av.h"
#include "board/video_planes.h"
#include "pmx_hal.h"
#include "tests/layer/mode_ex.h"

using namespace std::chrono_literals;
using namespace mode_ex;

namespace
{

/** A state as a caller can see it: the three flags, and "mixed", "out" or a list of the planes 2 to 6 that are mixed.
 *  Planes 0, 1 and 7 must be as start-up left them. */
std::string state()
{
    std::string planes;
    for (UCHAR plane = 2; plane <= 6; ++plane)
    {
        if (fgPmxHalMixPlane(0, plane))
            planes += std::to_string(plane);
    }
    const std::string osd = planes == "23456" ? "mixed" : planes.empty() ? "out" : planes;
    const bool others = fgPmxHalMixPlane(0, 0) && !fgPmxHalMixPlane(0, 1) && fgPmxHalMixPlane(0, 7);
    board::trace::clear();
    return "F" + std::to_string(LayerTest::record("status.fgPmxFormatChangeFlag")) + " E" +
           std::to_string(LayerTest::record("status.fgPmxEnabeOsdFlag")) + " T" +
           std::to_string(LayerTest::record("status.fgTimerAlreadySet")) + " " + osd +
           (others ? "" : ", other planes touched");
}

Request of_mode(UINT32 mode)
{
    return { .digital_port = on(mode), .hdmi = on(mode), .component = on(mode), .composite = on(RES_480I) };
}

const Request first_request = of_mode(RES_1080P60HZ);
const Request second_request = of_mode(RES_720P60HZ);
const Request refused_request = of_mode(RES_2160P);

constexpr const char* when_ready = "F0 E0 T0 mixed";
constexpr const char* ready_timer_running = "F0 E0 T1 mixed";
constexpr const char* when_switching = "F1 E0 T0 mixed";
constexpr const char* switching_timer_running = "F1 E0 T1 mixed";
constexpr const char* held = "F1 E0 T1 out";
constexpr const char* waiting = "F0 E1 T0 out";
constexpr const char* waiting_timer_running = "F0 E1 T1 out";

} // namespace

class Handshake : public mode_ex::Test
{
protected:
    static void be_ready() { running(first_request); }
    static void be_switching()
    {
        be_ready();
        PMX_SetFormatChangeFlag(TRUE);
    }
    /** The display part switches, ten seconds to go. */
    static void be_held_back()
    {
        be_switching();
        EXPECT_EQ(1u, set_mode(second_request));
        ASSERT_EQ(held, state());
    }
    /** The display part has answered, the timer runs on. */
    static void be_ready_with_timer()
    {
        be_held_back();
        PMX_SetFormatChangeFlag(FALSE);
    }
    static void be_switching_with_timer()
    {
        be_ready_with_timer();
        PMX_SetFormatChangeFlag(TRUE);
    }
    static void be_waiting()
    {
        be_held_back();
        board::video_planes::set_waiting_for_sync(true);
        PMX_SetFormatChangeFlag(FALSE);
    }
};

TEST_F(Handshake, Ready_AtStartAndAfterAModeSetting)
{
    started();
    EXPECT_EQ(when_ready, state());
    EXPECT_EQ(1u, set_mode(first_request));
    EXPECT_EQ(when_ready, state());
}

TEST_F(Handshake, SetFormatChangeFlag_RaisedFromReady_Switching)
{
    be_ready();
    PMX_SetFormatChangeFlag(TRUE);
    EXPECT_EQ(when_switching, state());
}

TEST_F(Handshake, SetFormatChangeFlag_RaisedFromReadyWithTheTimerRunning_Switching)
{
    be_ready_with_timer();
    EXPECT_EQ(ready_timer_running, state());
    PMX_SetFormatChangeFlag(TRUE);
    EXPECT_EQ(switching_timer_running, state());
}

TEST_F(Handshake, SetFormatChangeFlag_RaisedWhileSwitching_StaysSwitching)
{
    be_switching();
    PMX_SetFormatChangeFlag(TRUE);
    EXPECT_EQ(when_switching, state());
}

TEST_F(Handshake, SetFormatChangeFlag_RaisedWhileHeldBack_StaysHeldBack)
{
    be_held_back();
    PMX_SetFormatChangeFlag(TRUE);
    EXPECT_EQ(held, state());
}

TEST_F(Handshake, SetFormatChangeFlag_RaisedWhileTheReleaseIsOwed_StaysOwed)
{
    be_waiting();
    EXPECT_EQ(waiting_timer_running, state());
    PMX_SetFormatChangeFlag(TRUE);
    EXPECT_EQ("F1 E1 T1 out", state());
}

TEST_F(Handshake, SetModeEx_WhileSwitching_HeldBackForTenSeconds)
{
    be_switching();
    EXPECT_EQ(1u, set_mode(second_request));
    EXPECT_EQ(held, state());
    board::advance(10s - 1us);
    EXPECT_EQ(held, state());
    board::advance(1us);
    EXPECT_EQ(when_ready, state());
}

TEST_F(Handshake, SetFormatChangeFlag_LoweredWhileSwitching_Ready)
{
    be_switching();
    PMX_SetFormatChangeFlag(FALSE);
    EXPECT_EQ(when_ready, state());
}

TEST_F(Handshake, SetFormatChangeFlag_LoweredWhileHeldBack_Ready)
{
    be_held_back();
    PMX_SetFormatChangeFlag(FALSE);
    EXPECT_EQ(ready_timer_running, state());
}

TEST_F(Handshake, SetFormatChangeFlag_LoweredWhileHeldBackAndTheVideoPlaneWaits_Released)
{
    be_held_back();
    board::video_planes::set_waiting_for_sync(true);
    PMX_SetFormatChangeFlag(FALSE);
    EXPECT_EQ(waiting_timer_running, state());
}

TEST_F(Handshake, SetFormatChangeFlag_LoweredWhileSwitchingAndTheVideoPlaneWaits_ReleaseIsOwed)
{
    be_switching();
    board::video_planes::set_waiting_for_sync(true);
    PMX_SetFormatChangeFlag(FALSE);
    EXPECT_EQ("F0 E1 T0 mixed", state());
}

TEST_F(Handshake, TmrIsr_WhileHeldBack_Ready)
{
    be_held_back();
    board::advance(10s);
    EXPECT_EQ(when_ready, state());
}

TEST_F(Handshake, TmrIsr_WhileHeldBackAndTheVideoPlaneWaits_Released)
{
    be_held_back();
    board::video_planes::set_waiting_for_sync(true);
    board::advance(10s);
    EXPECT_EQ(waiting, state());
}

TEST_F(Handshake, TmrIsr_WhileSwitching_Ready)
{
    be_switching_with_timer();
    EXPECT_EQ(switching_timer_running, state());
    board::advance(10s);
    EXPECT_EQ(when_ready, state());
}

TEST_F(Handshake, TmrIsr_WhileReady_StaysReadyAndMixesOnceMore)
{
    be_ready_with_timer();
    board::advance(3s);
    vPmxNotMixPlane(0, 4);
    EXPECT_EQ("F0 E0 T1 2356", state());
    board::advance(7s);
    EXPECT_EQ(when_ready, state());
}

TEST_F(Handshake, TmrIsr_WhileTheReleaseIsOwed_StaysOwed)
{
    be_waiting();
    board::advance(10s);
    EXPECT_EQ(waiting, state());
}

TEST_F(Handshake, SetModeEx_NotWaitingWhileHeldBack_Ready)
{
    be_held_back();
    board::hdmi_av::plug(false);
    EXPECT_EQ(1u, set_mode(first_request));
    EXPECT_EQ(ready_timer_running, state());
}

TEST_F(Handshake, SetModeEx_NotWaitingWhileHeldBackAndTheVideoPlaneWaits_Released)
{
    be_held_back();
    board::hdmi_av::plug(false);
    board::video_planes::set_waiting_for_sync(true);
    EXPECT_EQ(1u, set_mode(first_request));
    EXPECT_EQ(waiting_timer_running, state());
}

TEST_F(Handshake, SetModeEx_NotWaitingWhileSwitching_Ready)
{
    be_switching();
    EXPECT_EQ(1u, set_mode(first_request));
    EXPECT_EQ(when_ready, state());
}

TEST_F(Handshake, SetModeEx_RefusedWhileHeldBack_Ready)
{
    be_held_back();
    EXPECT_EQ(0u, set_mode(refused_request));
    EXPECT_EQ(ready_timer_running, state());
}

TEST_F(Handshake, SetModeEx_RefusedWhileHeldBackAndTheVideoPlaneWaits_Released)
{
    be_held_back();
    board::video_planes::set_waiting_for_sync(true);
    EXPECT_EQ(0u, set_mode(refused_request));
    EXPECT_EQ(waiting_timer_running, state());
}

TEST_F(Handshake, SetModeEx_RefusedWhileSwitching_Ready)
{
    be_switching();
    EXPECT_EQ(0u, set_mode(refused_request));
    EXPECT_EQ(when_ready, state());
}

TEST_F(Handshake, SetOsdEnable_WhileTheReleaseIsOwed_Ready)
{
    be_waiting();
    board::video_planes::set_waiting_for_sync(false);
    EXPECT_EQ(waiting_timer_running, state());
    PMX_SetOsdEnable();
    EXPECT_EQ(ready_timer_running, state());
}

TEST_F(Handshake, SetOsdEnable_WhileHeldBack_StaysHeldBack)
{
    be_held_back();
    PMX_SetOsdEnable();
    EXPECT_EQ(held, state());
}

TEST_F(Handshake, SetFormatChangeFlag_Lowered_NeverStopsTheTimer)
{
    be_held_back();
    board::advance(3s);
    board::trace::clear();
    PMX_SetFormatChangeFlag(FALSE);
    EXPECT_TRACE(lowered);
    board::advance(7s - 1us);
    EXPECT_NO_TRACE();
    board::advance(1us);
    EXPECT_TRACE(std::string("LOG0 \"PMX timeout.\\n\"\n") + lowered);
    EXPECT_EQ(when_ready, state());
}

TEST_F(Handshake, SetModeEx_HeldBackAgain_StartsTheFullIntervalAnew)
{
    be_held_back();
    board::advance(6s);
    EXPECT_EQ(1u, set_mode(first_request));
    EXPECT_EQ(held, state());
    board::advance(10s - 1us);
    EXPECT_EQ(held, state());
    board::advance(1us);
    EXPECT_EQ(when_ready, state());
    board::advance(100s);
    EXPECT_NO_TRACE();
}
