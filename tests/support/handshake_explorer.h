// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The handshake with the display part, explored: the layer on a board, brought from state to state by the events that
 *  a stack knows, until no new state appears. */
#pragma once

#include <array>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <map>
#include <span>
#include <string>
#include <vector>

#include "drv_pmx.h"

namespace handshake
{

/** The OSD planes of the mixer, 2 to 6, as bits. */
inline constexpr std::uint8_t osd_planes = 0x7C;

/** What of layer and board decides how the handshake goes on. */
struct State
{
    bool flag = false;      ///< F: raised by the display part and not lowered yet
    bool owed = false;      ///< E: the OSD planes are owed their return to the mix
    bool timer_set = false; ///< T: the layer takes its timer for armed
    bool armed = false;     ///< the display timer that the layer knows is running
    bool waiting = false;   ///< the video plane driver waits for its sync control
    std::uint8_t mixed = osd_planes;
    bool has_timer = true; ///< the layer knows its timer; a reset forgets it
    bool mode_set = true;  ///< a mode was set since the last reset
    /** Display timers are running that the layer no longer knows. What each of them does is the same, so that the last
     *  one decides: they run out together. */
    bool old_armed = false;
    bool started = true;

    auto operator<=>(const State&) const = default;
};

/** A state's name by flags and planes: "Held back". */
std::string name(const State& state);
/** The same with what it leaves open: "Held back, T, video plane waiting". */
std::string full_name(const State& state);

enum class Event
{
    FlagRaised,
    FlagLowered,
    ModeHdmiChanged,   ///< PMX_SetModeEx with another HDMI resolution, sink plugged in
    ModeHdmiUnchanged, ///< PMX_SetModeEx as the last time, sink plugged in
    ModeNoSink,        ///< PMX_SetModeEx with another HDMI resolution, no sink
    ModeFlagClear,     ///< as ModeHdmiChanged, and the display part lowers the flag before the call asks for it
    ModeRefused,       ///< PMX_SetModeEx with a format that no mixer has
    TimerRunsOut,      ///< only while one is armed; those that the layer no longer knows were started earlier
    WaitForSync,
    SyncThere,
    SetOsdEnable,
    Reset,
    ShutDown,           ///< PMX_Uninit
    ShutDownWithResult, ///< i4PMX_Uninit
    Stop,
    Start, ///< PMX_Init
    OsdEnableFlagSet,
    OsdEnableFlagCleared
};
std::string name(Event event);

/** What a stack does to the handshake in its ordinary work: all up to SetOsdEnable. */
std::vector<Event> ordinary_events();
/** The same with resets, and with shutting down and starting: all up to Start. */
std::vector<Event> events_with_lifecycle();
std::vector<Event> all_events();

/** A started mixer on a board of its own, with a first mode set. */
class Bench
{
public:
    Bench();
    ~Bench();
    Bench(const Bench&) = delete;
    Bench& operator=(const Bench&) = delete;

    State state() const;
    /** Whether the event can happen now. */
    bool possible(Event event) const;
    /** Whether a timer will have run out by then, if nobody stops it. */
    bool runs_out_within(std::chrono::microseconds duration) const;
    /** Let it happen. @return whether a plane besides 2 to 6 was put into or taken out of the mix */
    bool run(Event event);
    void run(std::span<const Event> events);
    /** Back to Ready, no timer running, record as after the first mode. */
    void restart();
    /** Make a state without the events that lead to it: much faster. */
    void put(const State& state);

    /** What the first mode was asked for: HDMI and component in RES_480P, composite in RES_480I, no digital port. */
    using Outputs = std::array<PMX_RESOLUTION_T, PMX_OUTPUT_NUM>;
    static Outputs first_outputs();

private:
    void set_mode(Event event);
    void undo_lifecycle();
    void restart_with(std::uint8_t mixed);

    Outputs m_outputs;
    HANDLE_T m_timer = 0;
    std::span<std::byte> m_record;
    std::vector<std::byte> m_first_record;
};

struct Transition
{
    State from;
    Event event;
    State to;
    bool other_planes = false; ///< a plane besides 2 to 6 was mixed or not mixed

    auto operator<=>(const Transition&) const = default;
};

struct Graph
{
    std::vector<State> states; ///< nearest to Ready first
    std::vector<Transition> transitions;
    std::map<State, std::vector<Event>> paths; ///< a shortest one from Ready to each state
};

/** All that can be reached from Ready by these events, breadth first. */
Graph explore(std::span<const Event> events);
/** The same taken out of a graph that was explored with these events and others: what an event does depends on the
 *  state alone. */
Graph part_of(const Graph& whole, std::span<const Event> events);

/** What an observer may rely on between operations; the letters of the rules that do not hold in this state, "" for
 *  none: (a) an OSD plane is out of the mix only while F or E is set; (b) out with E clear: F and T are set and the
 *  timer is armed; (c) T is set exactly while the timer is armed. */
std::string broken_rules(const State& state);
/** Graphics are out, no timer is running, and no PMX_SetOsdEnable is owed that would bring them back: lowering the flag
 *  alone does, if somebody does it. */
bool left_alone(const State& state);
/** The same of a state and of how it was reached: (d) no other plane is touched. */
std::string broken_rules(const Transition& transition);

/** All transitions in the order of their text, a line each: "F1 E0 T1 A1 W0 M0 H1 S1 O0 I1 | PMX_Uninit | F1 ...", with
 *  A for armed, W waiting, M mixed, H has_timer, S mode_set, O old_armed, I started. */
std::string table(const Graph& graph);

/** A shortest sequence of events from Ready after which a rule does not hold: "flag raised > PMX_Reset"; "" when it
 *  always holds. */
std::string witness(const Graph& graph, char rule);

} // namespace handshake
