// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Between any two calls of every operation something else happens: the display timer runs out, the display part begins
 *  or answers, the sink goes or comes, the video plane driver waits for its sync or has it. No lock is left, the
 *  platform is not misused, and graphics that are out of the mix have somebody who brings them back. */
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <functional>
#include <map>
#include <set>

#include "board/devices.h"
#include "board/video_planes.h"
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "tests/disturbed/ground.h"

using disturbed::Path;
using disturbed::Played;

namespace
{

constexpr std::chrono::seconds timer_interval{ 10 };

struct Neighbour
{
    const char* name;
    void (*act)();
};

const std::vector<Neighbour> neighbours{
    { "timer runs out", [] { board::advance(timer_interval); } },
    { "display part begins", [] { board::display_part::raise(); } },
    { "display part answers", [] { board::display_part::lower(); } },
    { "sink goes or comes", [] { board::hdmi_av::plug(i4GetHotPlugStatus() != 1); } },
    { "video plane waits", [] { board::video_planes::set_waiting_for_sync(true); } },
    { "video plane has its sync", [] { board::video_planes::release_graphics(); } },
};

/** What the handshake is like when the operation begins. */
struct Situation
{
    const char* name;
    void (*arrange)();
};

void hold_back()
{
    PMX_SetFormatChangeTimer(10000);
    for (UCHAR plane = DRV_PMX_PLANE_3; plane <= DRV_PMX_PLANE_7; ++plane)
        vPmxNotMixPlane(0, plane);
    _arPmxDispPartStatus.fgPmxFormatChangeFlag = TRUE;
    _arPmxDispPartStatus.fgTimerAlreadySet = TRUE;
}

const std::vector<Situation> situations{
    { "ready", [] {} },
    { "held back", hold_back },
    { "held back, video plane waiting, no sink",
      [] {
          hold_back();
          board::hdmi_av::plug(false);
          board::video_planes::set_waiting_for_sync(true);
      } },
};

/** Run a path from a situation; the neighbour acts after the n-th call. @return that call's function; empty when there
 *  are fewer */
std::string disturb(const Path& path, const Situation& situation, const Neighbour& neighbour, std::size_t n,
                    Played& run)
{
    std::string point;
    std::size_t calls = 0;
    disturbed::prepare(path);
    situation.arrange();
    board::trace::clear();
    run = disturbed::run(path, [&] {
        board::at_every_call([&, n](const board::TraceEntry& entry) {
            if (calls++ != n)
                return;
            point = entry.function;
            neighbour.act();
        });
    });
    return point;
}

/** Graphics that nobody brings back until the timer or the display part comes: which operation under which neighbour,
 *  and after which of its calls that acted. */
using Forgetting = std::map<std::string, std::set<std::string>>;

class AtEachCall : public testing::Test
{
protected:
    std::size_t runs = 0;
    Forgetting forgetting;

    /** Undisturbed in every situation, then disturbed after each call: by every neighbour, in one situation each. */
    void walk(const Path& path)
    {
        for (const Situation& situation : situations)
            take_clean(path, situation);
        for (std::size_t k = 0; k < neighbours.size(); ++k)
        {
            for (std::size_t n = 0; n < calls; ++n)
            {
                for (std::size_t s = 0; s < situations.size(); ++s)
                {
                    if (disturbed::all_of_it() || is_its_turn(n, k, s))
                        check(path, s, neighbours[k], n);
                }
            }
        }
        clean.clear();
        forgets.clear();
        calls = 0;
    }

private:
    /** Each call sees every neighbour, and one situation with each. A report's lines see one neighbour each. */
    bool is_its_turn(std::size_t n, std::size_t k, std::size_t s) const
    {
        const bool neighbours_turn = !clean[s].prints_alone || n % neighbours.size() == k;
        return neighbours_turn && (n + k) % situations.size() == s;
    }

    std::vector<Played> clean; ///< for each situation
    std::vector<bool> forgets; ///< whether graphics are forgotten by the operation alone
    std::size_t calls = 0;

    void take_clean(const Path& path, const Situation& situation)
    {
        disturb(path, situation, neighbours[0], ~std::size_t{ 0 }, clean.emplace_back());
        forgets.push_back(disturbed::forgotten());
        calls = std::max(calls, clean.back().calls);
    }

    void check(const Path& path, std::size_t s, const Neighbour& neighbour, std::size_t n)
    {
        Played run;
        const std::string point = disturb(path, situations[s], neighbour, n, run);
        if (point.empty())
            return; // in this situation it has fewer calls
        ++runs;
        const std::string where = path.line + ", " + situations[s].name + ", " + neighbour.name + " after call " +
                                  std::to_string(n) + ", " + point;
        EXPECT_FALSE(run.lock_held) << where;
        EXPECT_EQ(clean[s].misuses, run.misuses) << where;
        EXPECT_EQ(clean[s].asserts, run.asserts) << where;
        // What is asked is how things are: the answer is younger than the console line in front of it.
        EXPECT_TRUE(clean[s].outcome == run.outcome || path.operation() == "fgPMX_DisplayModeReady") << where;
        if (disturbed::forgotten() && !forgets[s])
            forgetting[path.operation() + ", " + neighbour.name].insert(point);
        board::advance(2 * timer_interval);
        EXPECT_TRUE(forgets[s] || _arPmxDispPartStatus.fgPmxEnabeOsdFlag != FALSE || disturbed::planes_out().empty())
            << where;
        EXPECT_EQ(std::vector<std::string>{}, disturbed::release()) << where;
    }
};

} // namespace

TEST_F(AtEachCall, NeighboursActBetweenAnyTwoCallsOfEachOperation_NothingIsLeftBehind)
{
    for (const Path& path : disturbed::every_path())
    {
        if (path.line != "PMX_Init" || path.before.empty()) // a restart calls what a start calls
            walk(path);
    }
    // Who answers while a mode change already takes graphics out is too early: its timer brings them back.
    const std::set<std::string> taking_out{ "PMX_IsLog", "VDP_SetClearVideo", "vPmxNotMixPlane" };
    std::set<std::string> who;
    for (const auto& [operation_and_neighbour, points] : forgetting)
    {
        who.insert(operation_and_neighbour);
        EXPECT_TRUE(std::includes(taking_out.begin(), taking_out.end(), points.begin(), points.end()))
            << operation_and_neighbour << " " << testing::PrintToString(points);
    }
    EXPECT_EQ((std::set<std::string>{ "PMX_SetModeEx, display part answers", "PMX_SetModeEx, timer runs out" }), who);
    RecordProperty("runs", static_cast<int>(runs));
    EXPECT_LE(4500u, runs);
}
