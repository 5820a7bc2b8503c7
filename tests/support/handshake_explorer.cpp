// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/support/handshake_explorer.h"

#include <algorithm>
#include <set>
#include <stdexcept>

#include "board/board.h"
#include "board/devices.h"
#include "board/executable_symbols.h"
#include "board/hdmi_av.h"
#include "board/video_planes.h"
#include "drv_av_d.h"
#include "pmx_hal.h"
#include "tools/record_view/record_view.h"
#include "u_os.h"

namespace handshake
{
namespace
{

constexpr std::chrono::seconds timer_interval{ 10 };
constexpr UINT32 timer_interval_ms = 10000;

struct Timer
{
    HANDLE_T handle = 0;
    bool running = false;
    std::chrono::microseconds expiry{};
};

std::vector<Timer> timers()
{
    std::vector<Timer> found;
    const board::Value state = board::timers::state();
    for (const board::Value& timer : state.items())
    {
        const bool running = timer.find("running")->as_number() != 0;
        found.push_back({ static_cast<HANDLE_T>(timer.find("handle")->as_number()), running,
                          std::chrono::microseconds(running ? timer.find("expiry_us")->as_number() : 0) });
    }
    return found;
}

bool is_known(const Timer& timer)
{
    return timer.handle == _arPmxDispPartStatus.hPMXTimer;
}

bool timer_running()
{
    const std::vector<Timer> all = timers();
    return std::any_of(all.begin(), all.end(), [](const Timer& timer) { return timer.running; });
}

/** Let those run out that the layer no longer knows; when there are none, the one that it knows. */
void run_timers_out()
{
    std::chrono::microseconds old{};
    std::chrono::microseconds known{};
    for (const Timer& timer : timers())
    {
        if (timer.running)
            (is_known(timer) ? known : old) = std::max(is_known(timer) ? known : old, timer.expiry);
    }
    const std::chrono::microseconds last = old.count() != 0 ? old : known;
    if (last.count() != 0)
        board::advance(last - board::now());
}

bool touches_other_planes(const board::TraceEntry& entry)
{
    if (entry.function != "vPmxMixPlane" && entry.function != "vPmxNotMixPlane")
        return false;
    const std::int64_t plane = entry.arguments.at(1).value.as_number();
    return plane < DRV_PMX_PLANE_3 || plane > DRV_PMX_PLANE_7;
}

/** The layer's record, as raw as a debugger sees it. */
std::span<std::byte> find_record()
{
    const auto symbol = board::executable_symbols::find("_arPmxConf");
    if (!symbol)
        throw std::runtime_error("_arPmxConf is not in the symbol table");
    return { static_cast<std::byte*>(symbol->address), symbol->size };
}

/** The display part answers as soon as it is told of the new resolution. */
void answer_at_once(const board::TraceEntry& entry)
{
    if (entry.function == "fgPmxDrvSetAvd" && entry.arguments.at(0).value.as_number() == PMX_SET_HDMI_RES_CHG)
        PMX_SetFormatChangeFlag(FALSE);
}

std::vector<Event> events_up_to(Event last)
{
    std::vector<Event> events;
    for (int event = 0; event <= static_cast<int>(last); ++event)
        events.push_back(static_cast<Event>(event));
    return events;
}

std::string letters(const State& state)
{
    const std::pair<char, bool> letters[] = {
        { 'F', state.flag },      { 'E', state.owed },       { 'T', state.timer_set }, { 'A', state.armed },
        { 'W', state.waiting },   { 'M', state.mixed != 0 }, { 'H', state.has_timer }, { 'S', state.mode_set },
        { 'O', state.old_armed }, { 'I', state.started },
    };
    std::string text;
    for (const auto& [letter, is_set] : letters)
        text += (text.empty() ? "" : " ") + std::string(1, letter) + (is_set ? "1" : "0");
    return text;
}

} // namespace

std::string name(const State& state)
{
    if (state.mixed != 0 && state.mixed != osd_planes)
        return "Partly mixed";
    if (state.mixed == 0)
    {
        if (state.flag)
            return state.owed ? "Held back, return owed" : "Held back";
        return state.owed ? "Released, video plane waiting" : "Forgotten";
    }
    if (state.flag)
        return state.owed ? "Display part switching, return owed" : "Display part switching";
    return state.owed ? "Ready, return owed" : "Ready";
}

std::string full_name(const State& state)
{
    std::string text = name(state);
    if (state.timer_set)
        text += ", T";
    if (state.armed != state.timer_set)
        text += state.armed ? ", timer armed" : ", timer not armed";
    if (state.waiting)
        text += ", waiting";
    if (state.old_armed)
        text += ", old timer armed";
    if (!state.has_timer)
        text += ", no timer";
    if (!state.mode_set)
        text += ", no mode set";
    if (!state.started)
        text += ", not started";
    return text;
}

std::string name(Event event)
{
    static const std::map<Event, std::string> names{
        { Event::FlagRaised, "flag raised" },
        { Event::FlagLowered, "flag lowered" },
        { Event::ModeHdmiChanged, "mode: HDMI changed" },
        { Event::ModeHdmiUnchanged, "mode: HDMI unchanged" },
        { Event::ModeNoSink, "mode: no sink" },
        { Event::ModeFlagClear, "mode: answered within the call" },
        { Event::ModeRefused, "mode: refused" },
        { Event::TimerRunsOut, "timer runs out" },
        { Event::WaitForSync, "video plane waits for sync" },
        { Event::SyncThere, "video plane has its sync" },
        { Event::SetOsdEnable, "PMX_SetOsdEnable" },
        { Event::Reset, "PMX_Reset" },
        { Event::ShutDown, "PMX_Uninit" },
        { Event::ShutDownWithResult, "i4PMX_Uninit" },
        { Event::Stop, "PMX_Stop" },
        { Event::Start, "PMX_Init" },
        { Event::OsdEnableFlagSet, "PMX_SetOsdEnableFlag(TRUE)" },
        { Event::OsdEnableFlagCleared, "PMX_SetOsdEnableFlag(FALSE)" },
    };
    return names.at(event);
}

std::vector<Event> ordinary_events()
{
    return events_up_to(Event::SetOsdEnable);
}

std::vector<Event> events_with_lifecycle()
{
    return events_up_to(Event::Start);
}

std::vector<Event> all_events()
{
    return events_up_to(Event::OsdEnableFlagCleared);
}

Bench::Outputs Bench::first_outputs()
{
    Outputs outputs{};
    outputs[PMX_OUTPUT_HDMI] = { TRUE, RES_480P, 60, {} };
    outputs[PMX_OUTPUT_CAV] = { TRUE, RES_480P, 60, {} };
    outputs[PMX_OUTPUT_CVBS] = { TRUE, RES_480I, 60, {} };
    return outputs;
}

Bench::Bench() : m_outputs(first_outputs()), m_record(find_record())
{
    board::power_on({});
    PMX_Init();
    PMX_SetModeEx(0, m_outputs.data(), 60, DRV_NON_EXT_CHIP, 0);
    PMX_SetOsdEnable();
    m_timer = _arPmxDispPartStatus.hPMXTimer;
    m_first_record.assign(m_record.begin(), m_record.end());
    board::trace::clear();
}

Bench::~Bench()
{
    board::at_every_call({});
}

State Bench::state() const
{
    const PMX_DISPLAY_PART_STATUS_T& status = _arPmxDispPartStatus;
    State state;
    bool has_timer = false;
    state.flag = status.fgPmxFormatChangeFlag != 0;
    state.owed = status.fgPmxEnabeOsdFlag != 0;
    state.timer_set = status.fgTimerAlreadySet != 0;
    for (const Timer& timer : timers())
    {
        (is_known(timer) ? state.armed : state.old_armed) |= timer.running;
        has_timer |= is_known(timer);
    }
    state.waiting = fgVdpIsWaitforSyncCtrl() != 0;
    state.mixed = 0;
    for (UCHAR plane = DRV_PMX_PLANE_3; plane <= DRV_PMX_PLANE_7; ++plane)
        state.mixed |= static_cast<std::uint8_t>(fgPmxHalMixPlane(0, plane) != 0 ? 1u << plane : 0u);
    state.has_timer = has_timer;
    static const record_view::Field mode_called("fgSetModeCalled");
    static const record_view::Field initiated("_PmxInitiated");
    state.mode_set = mode_called.number() != 0;
    state.started = initiated.number() != 0;
    return state;
}

bool Bench::possible(Event event) const
{
    return event != Event::TimerRunsOut || timer_running();
}

bool Bench::runs_out_within(std::chrono::microseconds duration) const
{
    const std::vector<Timer> all = timers();
    return std::any_of(all.begin(), all.end(), [duration](const Timer& timer) {
        return timer.running && timer.expiry <= board::now() + duration;
    });
}

bool Bench::run(Event event)
{
    board::trace::clear();
    switch (event)
    {
    case Event::FlagRaised:
    case Event::FlagLowered: PMX_SetFormatChangeFlag(event == Event::FlagRaised ? TRUE : FALSE); break;
    case Event::ModeHdmiChanged:
    case Event::ModeHdmiUnchanged:
    case Event::ModeNoSink:
    case Event::ModeFlagClear:
    case Event::ModeRefused: set_mode(event); break;
    case Event::TimerRunsOut: run_timers_out(); break;
    case Event::WaitForSync:
    case Event::SyncThere: board::video_planes::set_waiting_for_sync(event == Event::WaitForSync); break;
    case Event::SetOsdEnable: PMX_SetOsdEnable(); break;
    case Event::Reset: PMX_Reset(0); break;
    case Event::ShutDown: PMX_Uninit(); break;
    case Event::ShutDownWithResult: i4PMX_Uninit(0); break;
    case Event::Stop: PMX_Stop(); break;
    case Event::Start: PMX_Init(); break;
    case Event::OsdEnableFlagSet:
    case Event::OsdEnableFlagCleared: PMX_SetOsdEnableFlag(event == Event::OsdEnableFlagSet ? TRUE : FALSE); break;
    }
    const auto& entries = board::trace::entries();
    return std::any_of(entries.begin(), entries.end(), touches_other_planes);
}

void Bench::run(std::span<const Event> events)
{
    for (const Event event : events)
        run(event);
}

void Bench::set_mode(Event event)
{
    Outputs outputs = m_outputs;
    PMX_RESOLUTION_MODE_T& hdmi = outputs[PMX_OUTPUT_HDMI].eResMode;
    if (event == Event::ModeRefused)
        hdmi = RES_2160P;
    else if (event != Event::ModeHdmiUnchanged)
        hdmi = hdmi == RES_480P ? RES_576P : RES_480P;
    if (event != Event::ModeRefused)
        m_outputs = outputs;
    board::hdmi_av::plug(event != Event::ModeNoSink);
    if (event == Event::ModeFlagClear)
        board::at_every_call(answer_at_once);
    PMX_SetModeEx(0, outputs.data(), 60, DRV_NON_EXT_CHIP, 0);
    board::at_every_call({});
    board::hdmi_av::plug(true);
}

/** What shutting down and starting again have deleted and created, as it was; starting would take much longer. */
void Bench::undo_lifecycle()
{
    bool has_timer = false;
    for (const Timer& timer : timers())
    {
        if (timer.handle == m_timer)
            has_timer = true;
        else
            x_timer_delete(timer.handle);
    }
    if (!has_timer)
        x_timer_create(&m_timer);
    if (MutexPMX == 0)
        x_sema_create(&MutexPMX, X_SEMA_TYPE_MUTEX, 1);
    record_view::set("_PmxInitiated", 1);
}

void Bench::restart()
{
    restart_with(osd_planes);
}

/** As Ready, but for what of the OSD planes is mixed. */
void Bench::restart_with(std::uint8_t mixed)
{
    undo_lifecycle();
    _arPmxDispPartStatus = { m_timer, FALSE, FALSE, FALSE };
    board::video_planes::set_waiting_for_sync(false);
    if (timer_running())
        board::advance(timer_interval);
    for (UCHAR plane = DRV_PMX_PLANE_3; plane <= DRV_PMX_PLANE_7; ++plane)
        ((mixed & 1u << plane) != 0 ? vPmxMixPlane : vPmxNotMixPlane)(0, plane);
    std::copy(m_first_record.begin(), m_first_record.end(), m_record.begin());
    m_outputs = first_outputs();
    board::trace::clear();
}

void Bench::put(const State& state)
{
    restart_with(state.mixed);
    if (state.old_armed)
    {
        x_timer_create(&_arPmxDispPartStatus.hPMXTimer);
        PMX_SetFormatChangeTimer(timer_interval_ms);
        _arPmxDispPartStatus.hPMXTimer = m_timer;
        board::advance(std::chrono::milliseconds(1)); // the layer's own is started later
    }
    if (state.armed)
        PMX_SetFormatChangeTimer(timer_interval_ms);
    board::video_planes::set_waiting_for_sync(state.waiting);
    _arPmxDispPartStatus.fgPmxFormatChangeFlag = state.flag ? TRUE : FALSE;
    _arPmxDispPartStatus.fgPmxEnabeOsdFlag = state.owed ? TRUE : FALSE;
    _arPmxDispPartStatus.fgTimerAlreadySet = state.timer_set ? TRUE : FALSE;
    if (!state.has_timer)
        _arPmxDispPartStatus.hPMXTimer = 0;
    if (!state.mode_set)
        record_view::set("fgSetModeCalled", 0);
    if (!state.started)
        record_view::set("_PmxInitiated", 0);
    board::trace::clear();
    if (this->state() != state)
        throw std::logic_error(full_name(state) + " cannot be made");
}

namespace
{

/** A transition, and the state that it leads to where none has led there before. */
void add(Graph& graph, const Transition& transition)
{
    graph.transitions.push_back(transition);
    if (graph.paths.contains(transition.to))
        return;
    std::vector<Event> path = graph.paths.at(transition.from);
    path.push_back(transition.event);
    graph.paths[transition.to] = std::move(path);
    graph.states.push_back(transition.to);
}

} // namespace

Graph explore(std::span<const Event> events)
{
    Bench bench;
    Graph graph;
    graph.states.push_back(bench.state());
    graph.paths[graph.states.front()] = {};
    for (std::size_t at = 0; at < graph.states.size(); ++at)
    {
        const State from = graph.states[at];
        State now = from;
        bench.put(from);
        for (const Event event : events)
        {
            if (now != from)
                bench.put(from);
            if (!bench.possible(event))
                continue;
            const bool other_planes = bench.run(event);
            now = bench.state();
            add(graph, { from, event, now, other_planes });
        }
    }
    return graph;
}

Graph part_of(const Graph& whole, std::span<const Event> events)
{
    std::map<State, std::map<Event, const Transition*>> ways;
    for (const Transition& transition : whole.transitions)
        ways[transition.from][transition.event] = &transition;
    Graph graph;
    graph.states.push_back(whole.states.front());
    graph.paths[graph.states.front()] = {};
    for (std::size_t at = 0; at < graph.states.size(); ++at)
    {
        const State from = graph.states[at];
        const auto& leading = ways.at(from);
        for (const Event event : events)
        {
            const auto way = leading.find(event);
            if (way != leading.end())
                add(graph, *way->second);
        }
    }
    return graph;
}

std::string broken_rules(const State& state)
{
    const bool out = state.mixed != osd_planes;
    std::string broken;
    if (out && !state.flag && !state.owed)
        broken += 'a';
    if (out && !state.owed && !(state.flag && state.timer_set && (state.armed || state.old_armed)))
        broken += 'b';
    if (state.timer_set != (state.armed || state.old_armed))
        broken += 'c';
    return broken;
}

bool left_alone(const State& state)
{
    return state.mixed != osd_planes && !state.owed && !state.armed && !state.old_armed;
}

std::string broken_rules(const Transition& transition)
{
    return broken_rules(transition.to) + (transition.other_planes ? "d" : "");
}

std::string table(const Graph& graph)
{
    std::set<std::string> lines;
    for (const Transition& transition : graph.transitions)
        lines.insert(letters(transition.from) + " | " + name(transition.event) + " | " + letters(transition.to) + "\n");
    std::string text;
    for (const std::string& line : lines)
        text += line;
    return text;
}

std::string witness(const Graph& graph, char rule)
{
    for (const Transition& transition : graph.transitions)
    {
        if (broken_rules(transition).find(rule) == std::string::npos)
            continue;
        std::string text;
        for (const Event event : graph.paths.at(transition.from))
            text += name(event) + " > ";
        return text + name(transition.event);
    }
    return {};
}

} // namespace handshake
