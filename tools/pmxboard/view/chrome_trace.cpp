// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/chrome_trace.h"

#include <algorithm>
#include <cstdio>
#include <ostream>
#include <utility>

#include "board/board.h"
#include "tools/pmxboard/view/lanes.h"

namespace pmxboard
{
namespace
{

using board::TraceEntry;
using board::Value;

std::string text(std::string_view content)
{
    return Value::text(std::string(content)).to_json();
}

std::string without_line_end(std::string message)
{
    while (message.ends_with('\n'))
        message.pop_back();
    return message;
}

std::string arguments_of(const TraceEntry& entry)
{
    Value arguments = Value::record({});
    for (const board::TraceArgument& argument : entry.arguments)
        arguments.add(argument.name, argument.value);
    std::string json = "{\"sequence\":" + std::to_string(entry.sequence) + ",\"operation\":" + text(entry.operation);
    if (entry.thread != 0)
        json += ",\"thread\":" + std::to_string(entry.thread);
    if (entry.kind == TraceEntry::Kind::Store)
        json += ",\"by\":" + text(entry.by);
    if (!entry.arguments.empty())
        json += ",\"arguments\":" + arguments.to_json();
    if (entry.result)
        json += ",\"result\":" + entry.result->to_json();
    if (entry.faulted)
        json += ",\"scripted\":true";
    if (entry.kind == TraceEntry::Kind::Log && entry.function == "PMX_IsLog")
        json += ",\"level\":" + std::to_string(entry.level);
    return json + "}";
}

} // namespace

ChromeTrace::ChromeTrace(std::ostream& to) : m_to(to)
{
    m_to << "{\"displayTimeUnit\":\"ms\",\"traceEvents\":[\n";
}

ChromeTrace::~ChromeTrace()
{
    close_process();
    m_to << "\n]}\n" << std::flush;
}

void ChromeTrace::scenario(const std::string& name)
{
    m_scenario = name;
    m_power_ons = 0;
}

void ChromeTrace::powered_on()
{
    close_process();
    ++m_process;
    ++m_power_ons;
    m_tick = 0;
    m_stores_named = false;
    name_lanes();
    show(states_now());
}

void ChromeTrace::operation_begins(const std::string& name)
{
    release();
    end_operation("{}");
    advance_to(static_cast<std::uint64_t>(board::now().count()));
    span_begins(lane_operations, name, "{\"command\":" + text(m_command) + "}");
    m_operation = name;
    m_operation_told = true;
}

void ChromeTrace::operation_ends(const Outcome& outcome)
{
    if (!m_operation_told)
        return;
    release();
    show(states_now());
    advance_to(static_cast<std::uint64_t>(board::now().count()));
    std::string arguments = to_json(outcome);
    if (!m_refusal.empty())
    {
        arguments.pop_back();
        arguments +=
            (arguments.size() > 1 ? "," : "") + ("\"reason\":" + board::Value::text(m_refusal).to_json()) + "}";
    }
    m_refusal.clear();
    end_operation(arguments);
}

void ChromeTrace::settle()
{
    if (m_process == 0)
        return;
    release();
    show(states_now());
    end_operation("{}");
}

std::string ChromeTrace::entry(const TraceEntry& entry, bool shown)
{
    if (m_process == 0)
        powered_on();
    m_waiting.push_back({ entry, static_cast<std::uint64_t>(board::now().count()), shown, states_now() });
    if (entry.depth == 0)
        release();
    return {};
}

/** What waits, which came in the order of ending, is written in the order of beginning. */
void ChromeTrace::release()
{
    std::vector<Finished> waiting = std::move(m_waiting);
    m_waiting.clear();
    std::sort(waiting.begin(), waiting.end(),
              [](const Finished& one, const Finished& other) { return one.entry.sequence < other.entry.sequence; });
    for (const Finished& finished : waiting)
    {
        close_deeper_than(finished.entry.depth);
        begin(finished);
        m_open.push_back(&finished);
    }
    close_deeper_than(0);
}

/** Closes the calls that are open at this depth and deeper. */
void ChromeTrace::close_deeper_than(unsigned depth)
{
    while (!m_open.empty() && m_open.back()->entry.depth >= depth)
    {
        end(*m_open.back());
        m_open.pop_back();
    }
}

void ChromeTrace::begin(const Finished& finished)
{
    const TraceEntry& entry = finished.entry;
    follow_operation(entry);
    advance_to(entry.time_us);
    if (!finished.shown)
        return;
    switch (entry.kind)
    {
    case TraceEntry::Kind::Call: span_begins(lane_calls, entry.function, arguments_of(entry)); break;
    case TraceEntry::Kind::Log: instant(lane_console, without_line_end(entry.text), arguments_of(entry)); break;
    case TraceEntry::Kind::Assert: instant(lane_console, entry.brief(), arguments_of(entry)); break;
    case TraceEntry::Kind::Notice:
        instant(lane_board, entry.function + ": " + without_line_end(entry.text), arguments_of(entry));
        break;
    case TraceEntry::Kind::Store:
        if (!std::exchange(m_stores_named, true))
            name_lane(lane_stores, "stores");
        instant(lane_stores, entry.brief().substr(std::string_view("SET ").size()), arguments_of(entry));
        break;
    }
}

void ChromeTrace::end(const Finished& finished)
{
    advance_to(finished.end_us);
    if (finished.shown && finished.entry.kind == TraceEntry::Kind::Call)
        span_ends(lane_calls, "{}");
    show(finished.states);
}

/** What neighbours, sources and timers call is told by nobody; the entries say it. */
void ChromeTrace::follow_operation(const TraceEntry& entry)
{
    const bool begins_anew = entry.kind == TraceEntry::Kind::Notice && entry.function == "expiry";
    if (m_operation_told || (entry.operation == m_operation && !begins_anew))
        return;
    end_operation("{}");
    if (entry.operation.empty())
        return;
    advance_to(entry.time_us);
    span_begins(lane_operations, entry.operation, "{\"command\":" + text(m_command) + "}");
    m_operation = entry.operation;
}

void ChromeTrace::end_operation(const std::string& arguments)
{
    if (!m_operation.empty())
        span_ends(lane_operations, arguments);
    m_operation.clear();
    m_operation_told = false;
}

void ChromeTrace::show(const std::shared_ptr<const States>& states)
{
    if (states == m_states)
        return;
    for (int lane = first_lane_of_states; lane <= last_lane_of_states; ++lane)
    {
        const auto before = m_states->find(lane);
        const auto after = states->find(lane);
        const bool was = before != m_states->end();
        const bool is = after != states->end();
        if (was && is && before->second == after->second)
            continue;
        if (was)
            span_ends(lane, "{}");
        if (is)
            span_begins(lane, after->second, "{}");
    }
    m_states = states;
}

void ChromeTrace::close_process()
{
    if (m_process == 0)
        return;
    release();
    end_operation("{}");
    show(std::make_shared<const States>());
}

void ChromeTrace::advance_to(std::uint64_t time_us)
{
    m_tick = std::max(m_tick, time_us * 1000);
}

void ChromeTrace::span_begins(int lane, const std::string& name, const std::string& arguments)
{
    write("B", lane, ",\"name\":" + text(name) + ",\"args\":" + arguments);
}

void ChromeTrace::span_ends(int lane, const std::string& arguments)
{
    write("E", lane, ",\"args\":" + arguments);
}

void ChromeTrace::instant(int lane, const std::string& name, const std::string& arguments)
{
    write("i", lane, ",\"s\":\"t\",\"name\":" + text(name) + ",\"args\":" + arguments);
}

void ChromeTrace::name_lanes()
{
    const std::string process = m_scenario + (m_power_ons > 1 ? ", power-on " + std::to_string(m_power_ons) : "");
    metadata(lane_process, "process_name", "\"name\":" + text(process));
    metadata(lane_process, "process_sort_index", "\"sort_index\":" + std::to_string(m_process));
    for (const auto& [lane, name] : lane_names())
        name_lane(lane, name);
}

void ChromeTrace::name_lane(int lane, const std::string& name)
{
    metadata(lane, "thread_name", "\"name\":" + text(name));
    metadata(lane, "thread_sort_index", "\"sort_index\":" + std::to_string(lane));
}

void ChromeTrace::metadata(int lane, const std::string& kind, const std::string& value)
{
    write("M", lane, ",\"name\":\"" + kind + "\",\"args\":{" + value + "}");
}

void ChromeTrace::write(std::string_view phase, int lane, const std::string& rest)
{
    char head[96];
    // Metadata has no time of its own.
    const std::uint64_t tick = phase == "M" ? m_tick : m_tick++;
    std::snprintf(head, sizeof head, "{\"ph\":\"%.1s\",\"pid\":%u,\"tid\":%d,\"ts\":%llu.%03u", phase.data(), m_process,
                  lane, static_cast<unsigned long long>(tick / 1000), static_cast<unsigned>(tick % 1000));
    m_to << (m_first ? "" : ",\n") << head << rest << "}";
    m_first = false;
}

} // namespace pmxboard
