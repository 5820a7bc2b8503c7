// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The handshake with the display part in every state that it can reach: the layer is brought there on the board, and
 *  every event is tried from each. */
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <string>
#include <vector>

#include "board/board.h"
#include "tests/support/handshake_explorer.h"

using handshake::Bench;
using handshake::Event;
using handshake::Graph;
using handshake::State;
using handshake::Transition;

namespace
{

/** All that can be reached by any event: explored once, for it takes seconds. */
const Graph& whole_graph()
{
    static const Graph graph = handshake::explore(handshake::all_events());
    return graph;
}

Graph ordinary_graph()
{
    return part_of(whole_graph(), handshake::ordinary_events());
}

Graph graph_with(std::vector<Event> others)
{
    std::vector<Event> events = handshake::ordinary_events();
    events.insert(events.end(), others.begin(), others.end());
    return part_of(whole_graph(), events);
}

const Graph& graph_with_lifecycle()
{
    static const Graph graph = part_of(whole_graph(), handshake::events_with_lifecycle());
    return graph;
}

struct NamedState
{
    std::string name;
    bool flag;
    bool owed;
    bool mixed;
    std::set<bool> timer; ///< T, and whether the timer runs
};

/** Each of them both while the video plane driver waits for its sync control and while it does not. */
const std::vector<NamedState> reachable{
    { "Ready", false, false, true, { false, true } },
    { "Display part switching", true, false, true, { false, true } },
    { "Held back", true, false, false, { true } },
    { "Released, video plane waiting", false, true, false, { false, true } },
    // A release that had nothing to release, kept from it by a waiting video plane driver; and the display part
    // switching again before a release came to its end.
    { "Ready, return owed", false, true, true, { false, true } },
    { "Display part switching, return owed", true, true, true, { false, true } },
    { "Held back, return owed", true, true, false, { false, true } },
};

/** What the handshake is meant to do, on the state alone. */
void mix(State& state)
{
    state.mixed = handshake::osd_planes;
    state.owed = false;
}

void lower(State& state)
{
    state.flag = false;
    state.owed = true;
    if (!state.waiting)
        mix(state);
}

/** The timer that the layer forgets runs on. */
void reset(State& state)
{
    state.old_armed = state.old_armed || state.armed;
    state.flag = state.owed = state.timer_set = state.armed = state.has_timer = state.mode_set = false;
}

void set_mode(State& state, bool hdmi_changed, bool sink)
{
    const bool everything = !state.mode_set; // the first mode after a reset
    state.mode_set = true;
    if (!((hdmi_changed || everything || state.timer_set) && sink))
        lower(state);
    if (!state.flag)
        return;
    state.mixed = 0;
    state.timer_set = true;
    state.armed = state.armed || state.has_timer;
}

State meant(State state, Event event)
{
    switch (event)
    {
    case Event::FlagRaised: state.flag = true; break;
    case Event::FlagLowered:
    case Event::ModeRefused: lower(state); break;
    case Event::ModeHdmiChanged: set_mode(state, true, true); break;
    case Event::ModeHdmiUnchanged: set_mode(state, false, true); break;
    case Event::ModeNoSink: set_mode(state, true, false); break;
    case Event::ModeFlagClear:
        lower(state);
        set_mode(state, true, true);
        break;
    case Event::TimerRunsOut:
        (state.old_armed ? state.old_armed : state.armed) = false;
        state.timer_set = false;
        lower(state);
        break;
    case Event::WaitForSync: state.waiting = true; break;
    case Event::SyncThere: state.waiting = false; break;
    case Event::SetOsdEnable:
        if (state.owed)
            mix(state);
        break;
    case Event::Reset: reset(state); break;
    case Event::ShutDown:
    case Event::ShutDownWithResult:
        if (state.started)
            state.armed = state.has_timer = false; // its timer is deleted
        state.started = false;
        break;
    case Event::Stop: state.started = false; break;
    case Event::Start:
        if (!state.started)
        {
            reset(state);
            state.has_timer = state.started = true;
        }
        break;
    case Event::OsdEnableFlagSet:
    case Event::OsdEnableFlagCleared: state.owed = event == Event::OsdEnableFlagSet; break;
    }
    return state;
}

void expect_as_meant(const Graph& graph)
{
    for (const Transition& transition : graph.transitions)
        EXPECT_EQ(full_name(meant(transition.from, transition.event)), full_name(transition.to))
            << name(transition.event) << " in " << full_name(transition.from);
}

} // namespace

TEST(HandshakeStates, OrdinaryEvents_ReachTheseAndNoOthers)
{
    std::set<State> expected;
    for (const NamedState& named : reachable)
    {
        for (const bool timer : named.timer)
        {
            for (const bool waiting : { false, true })
            {
                const std::uint8_t planes = named.mixed ? handshake::osd_planes : std::uint8_t{ 0 };
                const State state{ named.flag, named.owed, timer, timer, waiting, planes };
                EXPECT_EQ(named.name, name(state));
                expected.insert(state);
            }
        }
    }
    const Graph graph = handshake::explore(handshake::ordinary_events());
    EXPECT_EQ(expected, std::set<State>(graph.states.begin(), graph.states.end()));
    EXPECT_EQ(0u, board::asserts());
    EXPECT_EQ(0u, board::misuses());
    const Graph taken_out = ordinary_graph();
    EXPECT_EQ(graph.states, taken_out.states);
    EXPECT_EQ(graph.paths, taken_out.paths);
    EXPECT_TRUE(graph.transitions == taken_out.transitions) << "an event's way depends on more than the state";
}

TEST(HandshakeStates, OrdinaryEvents_KeepTheRules)
{
    const Graph graph = ordinary_graph();
    for (const State& state : graph.states)
        EXPECT_EQ("", broken_rules(state)) << full_name(state);
    for (const Transition& transition : graph.transitions)
        EXPECT_EQ("", broken_rules(transition)) << name(transition.event) << " in " << full_name(transition.from);
}

TEST(HandshakeStates, OrdinaryEvents_LeadWhereTheyAreMeantTo)
{
    const Graph graph = ordinary_graph();
    // Ten events everywhere, and the timer where it runs: in 14 of the 26 states.
    EXPECT_EQ(10u * 26 + 14, graph.transitions.size());
    expect_as_meant(graph);
}

TEST(HandshakeStates, OrdinaryEvents_FromStatesReachedByEventsAlone_LeadToTheSame)
{
    const Graph graph = ordinary_graph();
    Bench bench;
    for (const Transition& transition : graph.transitions)
    {
        bench.restart();
        bench.run(graph.paths.at(transition.from));
        ASSERT_EQ(full_name(transition.from), full_name(bench.state()));
        bench.run(transition.event);
        EXPECT_EQ(full_name(transition.to), full_name(bench.state()))
            << name(transition.event) << " in " << full_name(transition.from);
    }
}

TEST(HandshakeStates, EveryState_WithoutTheDisplayPart_GraphicsComeBack)
{
    const Graph graph = ordinary_graph();
    Bench bench;
    for (const State& state : graph.states)
    {
        bench.put(state);
        bench.run(Event::TimerRunsOut);
        bench.run(Event::SyncThere);
        bench.run(Event::SetOsdEnable);
        EXPECT_EQ(handshake::osd_planes, bench.state().mixed) << full_name(state);
    }
}

// What follows is how it is, not how it should be: callers know it, and nobody repairs it.

TEST(HandshakeStates, SetOsdEnableFlag_Set_BreaksNoRule)
{
    const Graph graph = graph_with({ Event::OsdEnableFlagSet });
    EXPECT_EQ(26u, graph.states.size());
    expect_as_meant(graph);
    for (const char rule : std::string("abcd"))
        EXPECT_EQ("", witness(graph, rule)) << rule;
}

TEST(HandshakeStates, SetOsdEnableFlag_Cleared_LeavesPlanesOutThatNobodyOwesAnything)
{
    const Graph graph = graph_with({ Event::OsdEnableFlagCleared });
    expect_as_meant(graph);
    const std::string released_then_cleared = "flag raised > mode: HDMI changed > video plane waits for sync > "
                                              "flag lowered > PMX_SetOsdEnableFlag(FALSE)";
    EXPECT_EQ(released_then_cleared, witness(graph, 'a'));
    EXPECT_EQ(released_then_cleared, witness(graph, 'b'));
    EXPECT_EQ("", witness(graph, 'c'));
    EXPECT_EQ("", witness(graph, 'd'));
}

TEST(HandshakeStates, Reset_BreaksEveryRule)
{
    const Graph graph = graph_with({ Event::Reset });
    expect_as_meant(graph);
    EXPECT_EQ("flag raised > mode: HDMI changed > PMX_Reset", witness(graph, 'a'));
    EXPECT_EQ("flag raised > mode: HDMI changed > PMX_Reset", witness(graph, 'b'));
    EXPECT_EQ("flag raised > mode: HDMI changed > PMX_Reset", witness(graph, 'c'));
    EXPECT_EQ("PMX_Reset", witness(graph, 'd')) << "it takes the second video plane out of the mix";
}

TEST(HandshakeStates, Reset_WhileHeldBack_OnlyTheForgottenTimerBringsGraphicsBackByItself)
{
    Bench bench;
    bench.run({ { Event::FlagRaised, Event::ModeHdmiChanged, Event::Reset } });
    EXPECT_EQ("Forgotten, old timer armed, no timer, no mode set", full_name(bench.state()));
    bench.run(Event::SetOsdEnable);
    EXPECT_EQ("Forgotten, old timer armed, no timer, no mode set", full_name(bench.state()));
    bench.run(Event::TimerRunsOut);
    EXPECT_EQ("Ready, no timer, no mode set", full_name(bench.state()));
}

TEST(HandshakeStates, Reset_ThenHeldBack_NoTimerEndsTheWait)
{
    Bench bench;
    bench.run({ { Event::Reset, Event::FlagRaised, Event::ModeHdmiChanged } });
    EXPECT_EQ(2u, board::asserts()) << "the timer can be neither stopped nor started";
    board::advance(std::chrono::hours(1));
    EXPECT_EQ("Held back, T, timer not armed, no timer", full_name(bench.state()));
    bench.run(Event::FlagLowered);
    EXPECT_EQ("Ready, T, timer not armed, no timer", full_name(bench.state()));
}

TEST(HandshakeStates, Reset_WhileTheReturnIsOwedAndNoTimerRuns_NobodyBringsGraphicsBack)
{
    Bench bench;
    bench.run({ { Event::FlagRaised, Event::ModeHdmiChanged, Event::WaitForSync, Event::TimerRunsOut, Event::Reset,
                  Event::SyncThere, Event::SetOsdEnable } });
    board::advance(std::chrono::hours(1));
    EXPECT_EQ("Forgotten, no timer, no mode set", full_name(bench.state()));
}

TEST(HandshakeStates, ShutDown_WhileHeldBack_TheTimerGoesAndOnlyTheDisplayPartIsLeft)
{
    for (const Event way : { Event::ShutDown, Event::ShutDownWithResult })
    {
        Bench bench;
        bench.run({ { Event::FlagRaised, Event::ModeHdmiChanged, way } });
        board::advance(std::chrono::hours(1));
        EXPECT_EQ("Held back, T, timer not armed, no timer, not started", full_name(bench.state())) << name(way);
        bench.run(Event::FlagLowered);
        EXPECT_EQ(handshake::osd_planes, bench.state().mixed) << name(way);
    }
}

TEST(HandshakeStates, StartAfterAShutDownWhileHeldBack_NobodyBringsGraphicsBack)
{
    for (const Event way : { Event::ShutDown, Event::ShutDownWithResult })
    {
        Bench bench;
        bench.run({ { Event::FlagRaised, Event::ModeHdmiChanged, way, Event::Start, Event::SetOsdEnable } });
        board::advance(std::chrono::hours(1));
        EXPECT_EQ("Forgotten, no mode set", full_name(bench.state())) << name(way);
        // Nor does a change that nobody announces.
        bench.run(Event::ModeHdmiChanged);
        EXPECT_EQ("Forgotten", full_name(bench.state())) << name(way);
        // One that the display part announces does, when it ends, however that is.
        bench.run({ { Event::FlagRaised, Event::ModeHdmiChanged, Event::TimerRunsOut } });
        EXPECT_EQ("Ready", full_name(bench.state())) << name(way);
    }
}

TEST(HandshakeStates, StartAfterStopWhileHeldBack_TheTimerBeforeBringsGraphicsBack)
{
    Bench bench;
    bench.run({ { Event::FlagRaised, Event::ModeHdmiChanged, Event::Stop, Event::Start } });
    EXPECT_EQ("Forgotten, old timer armed, no mode set", full_name(bench.state()));
    bench.run(Event::TimerRunsOut);
    EXPECT_EQ("Ready, no mode set", full_name(bench.state()));
}

TEST(HandshakeStates, Lifecycle_LeadsWhereItIsMeantTo)
{
    expect_as_meant(whole_graph());
    const Graph graph = graph_with({ Event::ShutDown, Event::Start });
    EXPECT_EQ("flag raised > mode: HDMI changed > PMX_Uninit > PMX_Init", witness(graph, 'a'));
}

TEST(HandshakeStates, Lifecycle_WithoutTheDisplayPart_GraphicsComeBackUnlessTheyAreLeftAlone)
{
    const Graph& graph = graph_with_lifecycle();
    Bench bench;
    for (const State& state : graph.states)
    {
        bench.put(state);
        while (bench.possible(Event::TimerRunsOut))
            bench.run(Event::TimerRunsOut);
        bench.run(Event::SyncThere);
        bench.run(Event::SetOsdEnable);
        EXPECT_EQ(left_alone(state) ? 0 : handshake::osd_planes, bench.state().mixed) << full_name(state);
        bench.run(Event::FlagLowered);
        EXPECT_EQ(handshake::osd_planes, bench.state().mixed) << full_name(state);
    }
}

TEST(HandshakeStates, Lifecycle_FromStatesReachedByEventsAlone_LeadsToTheSame)
{
    const Graph& graph = graph_with_lifecycle();
    Bench bench;
    std::size_t compared = 0;
    for (std::size_t i = 0; i < graph.transitions.size(); i += 13) // every event, from many states
    {
        const Transition& transition = graph.transitions[i];
        bench.restart();
        bench.run(graph.paths.at(transition.from));
        ASSERT_EQ(full_name(transition.from), full_name(bench.state()));
        // Started just behind one that has run out by now, a timer may run out within the next operation, which sleeps.
        if (bench.runs_out_within(std::chrono::milliseconds(10)))
            continue;
        bench.run(transition.event);
        EXPECT_EQ(full_name(transition.to), full_name(bench.state()))
            << name(transition.event) << " in " << full_name(transition.from);
        ++compared;
    }
    EXPECT_LT(graph.transitions.size() / 20, compared);
}

TEST(HandshakeStates, GraphicsAreLeftAlone_ByTheseEventsAndNoOthers)
{
    std::set<std::string> causes;
    for (const Transition& transition : graph_with_lifecycle().transitions)
    {
        if (!left_alone(transition.from) && left_alone(transition.to))
            causes.insert(name(transition.event) + " in " + name(transition.from));
    }
    EXPECT_EQ((std::set<std::string>{
                  "PMX_Init in Held back, return owed",
                  "PMX_Init in Released, video plane waiting",
                  "PMX_Reset in Held back, return owed",
                  "PMX_Reset in Released, video plane waiting",
                  "PMX_Uninit in Held back",
                  "i4PMX_Uninit in Held back",
                  "mode: HDMI changed in Display part switching",
                  "mode: HDMI unchanged in Display part switching",
              }),
              causes);
}
