// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The display timer runs out at every point of every operation that may be under way meanwhile: after each platform
 *  call, log lines and the last one included. Once a timer that was left running has run out too, graphics are back or
 *  owed. What shows in between is held here by the name of the point: callers live with it, and nobody repairs it. */
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "board/board.h"
#include "board/hdmi_av.h"
#include "drv_av_d.h"
#include "tests/support/handshake_explorer.h"

using handshake::Bench;
using handshake::State;

namespace
{

constexpr std::chrono::seconds timer_interval{ 10 };

/** A path of an operation; `arrange` and `restore` make and undo what decides that it is taken. */
struct Path
{
    std::string name;
    std::function<void()> run;
    std::function<void()> arrange = [] {};
    std::function<void()> restore = [] {};
    bool answered = false; ///< the display part lowers the flag when it is told of the new resolution
};

/** What is unusual after an operation, by the call after which the timer ran out: "ab: 2 3 out, T, armed". */
using Seen = std::map<std::string, std::string>;

/** A path that ends by holding graphics back, while the video plane driver does not wait and while it does. */
const Seen seen_when_held_back{
    { R"(LOG0 "[PMX] VDP_SetClearVideo & Not Mix OSD..\n")", "ab: 2 3 4 5 6 out, T, armed" },
    { "VDP_SetClearVideo(0, 0, 128, 128)", "ab: 2 3 4 5 6 out, T, armed" },
    { "vPmxNotMixPlane(0, DRV_PMX_PLANE_3)", "ab: 3 4 5 6 out, T, armed" },
    { "vPmxNotMixPlane(0, DRV_PMX_PLANE_4)", "ab: 4 5 6 out, T, armed" },
    { "vPmxNotMixPlane(0, DRV_PMX_PLANE_5)", "ab: 5 6 out, T, armed" },
    { "vPmxNotMixPlane(0, DRV_PMX_PLANE_6)", "ab: 6 out, T, armed" },
    { "x_timer_start(2, 10000, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = 0", "c: all mixed, T" },
};
const Seen seen_when_held_back_waiting{
    { "x_timer_start(2, 10000, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = 0", "c: 2 3 4 5 6 out, E, T" },
};

std::string shown(const State& state)
{
    std::string planes;
    for (unsigned plane = 2; plane <= 6; ++plane)
    {
        if ((state.mixed & 1u << plane) == 0)
            planes += std::to_string(plane) + " ";
    }
    return handshake::broken_rules(state) + ": " + (planes.empty() ? "all mixed" : planes + "out") +
           (state.flag ? ", F" : "") + (state.owed ? ", E" : "") + (state.timer_set ? ", T" : "") +
           (state.armed ? ", armed" : "");
}

std::vector<State> armed_states()
{
    std::vector<State> states;
    for (const bool flag : { false, true })
    {
        for (const bool owed : { false, true })
        {
            for (const std::uint8_t mixed : { std::uint8_t{ 0 }, handshake::osd_planes })
            {
                if (mixed == 0 && !flag && !owed)
                    continue; // nobody would bring the planes back: no state of ordinary work
                for (const bool waiting : { false, true })
                    states.push_back({ flag, owed, true, true, waiting, mixed });
            }
        }
    }
    return states;
}

const State state_held_back{ true, false, true, true, false, 0 };
const State state_held_back_waiting{ true, false, true, true, true, 0 };
const State switching{ true, false, true, true, false, handshake::osd_planes };
const State ready{ false, false, true, true, false, handshake::osd_planes };

std::function<void()> mode(const std::function<void(Bench::Outputs&)>& change, UCHAR frequency = 60, UINT8 fifth = 0)
{
    Bench::Outputs outputs = Bench::first_outputs();
    change(outputs);
    return
        [outputs, frequency, fifth]() mutable { PMX_SetModeEx(0, outputs.data(), frequency, DRV_NON_EXT_CHIP, fifth); };
}

void hd(Bench::Outputs& outputs)
{
    outputs[PMX_OUTPUT_HDMI].eResMode = RES_1080P60HZ;
}

void hdmi_off(Bench::Outputs& outputs)
{
    outputs[PMX_OUTPUT_HDMI].fgOutputEnable = FALSE;
}

void composite_off(Bench::Outputs& outputs)
{
    outputs[PMX_OUTPUT_CVBS].fgOutputEnable = FALSE;
}

void all_off(Bench::Outputs& outputs)
{
    for (PMX_RESOLUTION_T& output : outputs)
        output.fgOutputEnable = FALSE;
}

void beyond_capability(Bench::Outputs& outputs)
{
    outputs[PMX_OUTPUT_HDMI].eResMode = RES_2160P;
}

void unchanged(Bench::Outputs&)
{
}

std::function<void()> plug(bool plugged)
{
    return [plugged] { board::hdmi_av::plug(plugged); };
}

std::function<void()> fails(const std::string& function)
{
    return [function] { board::faults::set({ function, -1, board::Fault::When::On, 1 }); };
}

} // namespace

class HandshakeInjection : public testing::Test
{
protected:
    Bench bench;

    /** Inject at each point of a path from a state. @return what is unusual in between */
    Seen walk(const State& from, const Path& path)
    {
        Seen seen;
        for (std::size_t n = 0;; ++n)
        {
            bench.put(from);
            path.arrange();
            const std::optional<std::string> point = run_injected(path, n);
            path.restore();
            if (!point)
                return seen;
            const State between = bench.state();
            if (!handshake::broken_rules(between).empty())
                seen[*point] = shown(between);
            board::advance(timer_interval);
            const State after = bench.state();
            EXPECT_TRUE(after.mixed == handshake::osd_planes || after.owed)
                << path.name << " from " << handshake::full_name(from) << ", run out after " << *point;
        }
    }

    void expect_held_back(const Path& path, const std::vector<State>& from)
    {
        for (const State& state : from)
        {
            const Seen& expected = state.waiting ? seen_when_held_back_waiting : seen_when_held_back;
            EXPECT_EQ(state.flag ? expected : Seen{}, walk(state, path)) << path.name << " from " << full_name(state);
        }
    }

    void expect_nothing_unusual(const Path& path, const std::vector<State>& from)
    {
        for (const State& state : from)
            EXPECT_EQ(Seen{}, walk(state, path)) << path.name << " from " << full_name(state);
    }

    /** Run a path from a state; the timer runs out after the call of this name. */
    void run_out_after(const std::string& function, const Path& path, const State& from)
    {
        bench.put(from);
        board::at_every_call([&function](const board::TraceEntry& entry) {
            if (entry.function == function)
                board::advance(timer_interval);
        });
        path.run();
        board::at_every_call({});
    }

private:
    /** The timer runs out after the n-th platform call, from 0. @return that call; nothing when there are fewer */
    static std::optional<std::string> run_injected(const Path& path, std::size_t n)
    {
        std::optional<std::string> point;
        std::size_t calls = 0;
        board::at_every_call([&](const board::TraceEntry& entry) {
            if (path.answered && entry.function == "fgPmxDrvSetAvd" &&
                entry.arguments.at(0).value.as_number() == PMX_SET_HDMI_RES_CHG)
                PMX_SetFormatChangeFlag(FALSE);
            if (calls++ != n)
                return;
            point = entry.brief();
            if (entry.function == "x_timer_stop" && entry.result->as_number() == OSR_OK)
                _PMX_TmrIsr(_arPmxDispPartStatus.hPMXTimer, nullptr); // was on its way when it was stopped
            else
                board::advance(timer_interval);
        });
        path.run();
        board::at_every_call({});
        const auto& entries = board::trace::entries();
        const auto expiries = std::count_if(entries.begin(), entries.end(), [](const board::TraceEntry& entry) {
            return entry.text == "PMX timeout.\n";
        });
        EXPECT_EQ(point ? 1 : 0, expiries) << path.name << ", point " << n << " " << point.value_or("");
        return point;
    }
};

TEST_F(HandshakeInjection, SetModeEx_NewFormat_LeavesPlanesOutFromTheDecisionToHoldBackOn)
{
    expect_held_back({ "new format", mode(hd) }, { state_held_back, state_held_back_waiting, switching, ready });
}

TEST_F(HandshakeInjection, SetModeEx_SameFormatOtherHdmi_LeavesPlanesOutFromTheDecisionToHoldBackOn)
{
    expect_held_back({ "HDMI off", mode(hdmi_off) }, armed_states());
}

TEST_F(HandshakeInjection, SetModeEx_Unchanged_HoldsBackWhileTheTimerIsArmed)
{
    expect_held_back({ "unchanged", mode(unchanged) }, armed_states());
}

TEST_F(HandshakeInjection, SetModeEx_OtherPathsThatHoldBack_AreTheSame)
{
    const std::vector<State> from{ state_held_back };
    const auto no_faults = [] { board::faults::clear_all(); };
    expect_held_back({ "new frequency, PLL programmed", mode(unchanged, 50) }, from);
    expect_held_back({ "fifth OSD plane on composite", mode(unchanged, 60, 1) }, from);
    expect_held_back({ "fifth OSD plane on both, new format", mode(hd, 60, 2) }, from);
    expect_held_back({ "composite off", mode(composite_off) }, from);
    expect_held_back({ "all outputs off", mode(all_off) }, from);
    expect_held_back({ "resolution asked for by a hot plug", mode(unchanged),
                       [] { board::hdmi_av::request_resolution(true); },
                       [] { board::hdmi_av::request_resolution(false); } },
                     from);
    expect_held_back({ "first mode after load", mode(unchanged), [] { _fgBootUp = 1; } }, from);
    expect_held_back({ "OSD driver not told", mode(hd), [] { _PmxTestOsd = 1; }, [] { _PmxTestOsd = 0; } }, from);
    expect_held_back({ "encoder refuses", mode(hd), fails("TVE_SetFmtEx"), no_faults }, from);
    expect_held_back({ "timer cannot be stopped", mode(hd), fails("x_timer_stop"), no_faults }, from);
}

TEST_F(HandshakeInjection, SetModeEx_PathsThatDoNotHoldBack_LeaveNothingUnusual)
{
    expect_nothing_unusual({ "refused", mode(beyond_capability) }, armed_states());
    expect_nothing_unusual({ "no sink", mode(unchanged), plug(false), plug(true) }, armed_states());
    const std::vector<State> from{ state_held_back, state_held_back_waiting };
    expect_nothing_unusual({ "no sink, new format", mode(hd), plug(false), plug(true) }, from);
    expect_nothing_unusual({ "answered within the call", mode(hd), [] {}, [] {}, true }, from);
}

TEST_F(HandshakeInjection, SetFormatChangeFlag_LeavesNothingUnusual)
{
    expect_nothing_unusual({ "raised", [] { PMX_SetFormatChangeFlag(TRUE); } }, armed_states());
    expect_nothing_unusual({ "lowered", [] { PMX_SetFormatChangeFlag(FALSE); } }, armed_states());
}

TEST_F(HandshakeInjection, SetOsdEnable_LeavesNothingUnusual)
{
    expect_nothing_unusual({ "PMX_SetOsdEnable", [] { PMX_SetOsdEnable(); } }, armed_states());
}

TEST_F(HandshakeInjection, SetFormatChangeTimer_RunOutBeforeTheRestart_LeavesTheTimerArmedWithTClear)
{
    const Path path{ "PMX_SetFormatChangeTimer", [] { PMX_SetFormatChangeTimer(10000); } };
    for (const State& from : armed_states())
    {
        // The expiry brings the planes back, or leaves them as they are, owed, while the video plane driver waits.
        const std::string planes = from.waiting && from.mixed == 0 ? "2 3 4 5 6 out" : "all mixed";
        const std::string rest = "c: " + planes + (from.waiting ? ", E" : "") + ", armed";
        const Seen expected{ { R"(LOG0 "Display Format Change Timer Set.\n")", rest },
                             { "x_timer_stop(2) = 0", rest } };
        EXPECT_EQ(expected, walk(from, path)) << full_name(from);
    }
}

TEST_F(HandshakeInjection, SetModeEx_RunOutAtClearVideo_PlanesStayOutTenMoreSecondsWithBothFlagsClear)
{
    run_out_after("VDP_SetClearVideo", { "new format", mode(hd) }, state_held_back);
    board::advance(timer_interval - std::chrono::milliseconds(1));
    EXPECT_EQ("ab: 2 3 4 5 6 out, T, armed", shown(bench.state()));
    PMX_SetOsdEnable(); // nothing is owed
    EXPECT_EQ("ab: 2 3 4 5 6 out, T, armed", shown(bench.state()));
    board::advance(std::chrono::milliseconds(1));
    EXPECT_EQ(": all mixed", shown(bench.state()));
}

TEST_F(HandshakeInjection, SetModeEx_RunOutAtItsTimersStart_AnUnchangedModeHoldsBackOnceMore)
{
    run_out_after("x_timer_start", { "new format", mode(hd) }, state_held_back);
    EXPECT_EQ("c: all mixed, T", shown(bench.state()));
    board::advance(std::chrono::minutes(1));
    EXPECT_EQ("c: all mixed, T", shown(bench.state())) << "no timer is left that would clear T";
    PMX_SetFormatChangeFlag(TRUE);
    mode(hd)();
    EXPECT_EQ(": 2 3 4 5 6 out, F, T, armed", shown(bench.state()));
    board::advance(timer_interval);
    EXPECT_EQ(": all mixed", shown(bench.state()));
}
