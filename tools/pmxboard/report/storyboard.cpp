// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/storyboard.h"

#include <algorithm>
#include <utility>

#include "board/board.h"
#include "tools/pmxboard/files/ending.h"
#include "tools/pmxboard/report/base64.h"
#include "tools/pmxboard/state/diff.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/status.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/pmxboard/view/lanes.h"

namespace pmxboard
{
namespace
{

using board::Json;

std::int64_t now_us()
{
    return static_cast<std::int64_t>(board::now().count());
}

Json json_of(const Moment& moment)
{
    return { { "us", moment.us }, { "step", moment.step }, { "sequence", moment.sequence } };
}

Json json_of(const LaneSpan& span)
{
    return {
        { "text", span.text }, { "from", json_of(span.from) }, { "to", json_of(span.to) }, { "open", span.is_open }
    };
}

Json json_of(const SeenOutput& seen)
{
    return { { "output", seen.name },
             { "description", seen.description },
             { "picture", seen.picture ? Json(*seen.picture) : Json() } };
}

/** Between two stores of a release both reasons to wait hold, for no time. */
bool is_no_wait(const LaneSpan& span)
{
    return span.from.us == span.to.us && span.from.step == span.to.step && !span.is_open;
}

/** As people read it, a line each. */
Json lines_of(const Outcome& outcome)
{
    Json lines = Json::array();
    if (outcome.result)
        lines.push_back("= " + outcome.result->to_text());
    for (const OutputValue& output : outcome.outputs)
        lines.push_back("*" + output.name + (output.value ? " = " + output.value->to_text() : " untouched"));
    return lines;
}

Json json_of(const Change& change)
{
    const auto text = [](const std::optional<board::Value>& value) { return value ? Json(value->to_text()) : Json(); };
    return { { "path", change.path },
             { "older", text(change.older) },
             { "newer", text(change.newer) },
             { "counter", is_counter(change.path) } };
}

/** No more than so many bytes of a text, and no part of a letter. */
std::string beginning_of(const std::string& text, std::size_t most)
{
    if (text.size() <= most)
        return text;
    while (most > 0 && (static_cast<unsigned char>(text[most]) & 0xC0) == 0x80)
        --most;
    return text.substr(0, most) + "…\n";
}

std::string_view name_of(const Status& status)
{
    switch (status.graphics.state)
    {
    case GraphicsStatus::State::Shown: return "shown";
    case GraphicsStatus::State::Switching: return "switching";
    case GraphicsStatus::State::Held: return "held";
    case GraphicsStatus::State::AwaitsVideoPlane: return "awaits video plane";
    case GraphicsStatus::State::Out: break;
    }
    // Before the layer has begun nobody misses them.
    return status.initialised ? "out" : "shown";
}

/** What the page shows of an entry. */
Json json_of(const board::TraceEntry& entry, std::int64_t power_on_us)
{
    Json json = Json::parse(entry.to_json());
    for (const char* const unread : { "arguments", "result", "level", "by" })
        json.erase(unread);
    json["time_us"] = power_on_us + static_cast<std::int64_t>(entry.time_us);
    json["brief"] = printable_lines(entry.brief());
    return json;
}

/** The sentence behind the word "Graphics". */
std::string graphics_of(const Status& status)
{
    constexpr unsigned unbroken = 10000;
    const std::string text = to_text(status, StatusPart::Graphics, Look{ unbroken, false });
    const std::size_t begin = text.find_first_not_of(' ', text.find(' '));
    return text.substr(begin, text.find('\n') - begin);
}

} // namespace

void Storyboard::scenario(const std::string& name)
{
    m_runs.push_back({ { "name", name }, { "boards", Json::array() } });
    m_steps = Json::array();
    m_entries = 0;
    m_steps_left_out = 0;
    m_in_step = false;
    m_is_powered = false;
    m_offset_us = 0;
    m_sequence = 0;
    m_before.reset();
    m_lanes = {};
    m_failures = Json::array();
    m_heard_place.clear();
}

Moment Storyboard::moment() const
{
    return { m_is_powered ? m_offset_us + now_us() : 0, m_steps.empty() ? 0 : m_steps.size() - 1, m_sequence };
}

/** The step that runs. The first line of a scenario may expect something of a board that it has not powered on. */
Json& Storyboard::step()
{
    if (!m_in_step)
        begin_step("");
    return is_left_out() ? m_left_out : m_steps.back();
}

void Storyboard::begin_step(std::string_view line)
{
    m_in_step = true;
    Json begun = { { "command", printable_lines(line) }, { "place", printable(current_place()) },
                   { "from_us", moment().us },           { "to_us", 0 },
                   { "results", Json::array() },         { "told", "" },
                   { "explanation", nullptr },           { "expectations", Json::array() },
                   { "entries", Json::array() },         { "entries_left_out", 0 } };
    if (m_steps.size() == m_limits.steps)
    {
        if (!is_left_out())
            end_of_page();
        ++m_steps_left_out;
        m_left_out = std::move(begun);
    }
    else
        m_steps.push_back(std::move(begun));
}

void Storyboard::command(std::string_view line)
{
    end_step();
    begin_step(line);
    m_heard_place = current_place();
}

/** What holds here goes on where nobody sees it. */
void Storyboard::end_of_page()
{
    m_lanes.end(moment(), true);
    m_runs.back()["to_us"] = moment().us;
}

void Storyboard::powered_on()
{
    // The clock has begun anew: what held until now ends where the step began.
    Json& now = step();
    const std::int64_t end_us = now.at("from_us").get<std::int64_t>();
    m_lanes.end({ end_us, m_steps.size() - 1, m_sequence }, false);
    m_offset_us = end_us - now_us(); // a restored board's clock has not begun at 0
    m_is_powered = true;
    m_sequence = 0;
    m_before = whole_state();
    Json& boards = m_runs.back()["boards"];
    const std::string board = board::description().name;
    if (std::find(boards.begin(), boards.end(), board) == boards.end())
        boards.push_back(board);
    follow_lanes();
}

void Storyboard::expectation(std::string_view line)
{
    step()["expectations"].push_back({ { "line", printable_lines(line) }, { "place", printable(current_place()) } });
    m_heard_place = current_place();
}

void Storyboard::told(const std::string& text)
{
    if (!m_in_step)
        return;
    const std::string before = step().at("told").get<std::string>();
    step()["told"] = beginning_of(before + printable_lines(text), m_limits.told);
}

/** A line of which nothing was heard belongs to no step: it could not be read, or it only ends the scenario. */
void Storyboard::failure(const std::string& message)
{
    const bool is_of_step = m_in_step && !is_left_out() && current_place() == m_heard_place;
    m_failures.push_back({ { "text", message }, { "step", is_of_step ? Json(m_steps.size() - 1) : Json() } });
}

void Storyboard::explanation(const std::string& json)
{
    step()["explanation"] = Json::parse(json);
}

void Storyboard::operation_ends(const Outcome& outcome)
{
    for (const Json& line : lines_of(outcome))
        step()["results"].push_back(line);
    follow_lanes();
}

void Storyboard::settle()
{
    if (m_in_step)
        follow_lanes();
}

std::string Storyboard::entry(const board::TraceEntry& entry, bool)
{
    m_sequence = std::max(m_sequence, entry.sequence); // what runs inside a call ends before it
    Json& now = step();
    if (is_left_out() || m_entries == m_limits.entries)
        now["entries_left_out"] = now.at("entries_left_out").get<std::size_t>() + 1;
    else
    {
        now["entries"].push_back(json_of(entry, m_offset_us));
        ++m_entries;
    }
    follow_lanes();
    return {};
}

void Storyboard::follow_lanes()
{
    if (m_is_powered && !is_left_out())
        m_lanes.follow(*states_now(), moment());
}

void Storyboard::end_step()
{
    if (!std::exchange(m_in_step, false) || is_left_out())
        return;
    Json& ended = m_steps.back();
    ended["to_us"] = moment().us;
    ended["changes"] = Json::array();
    ended["outputs"] = Json::array();
    auto& entries = ended.at("entries").get_ref<Json::array_t&>();
    std::stable_sort(entries.begin(), entries.end(),
                     [](const Json& one, const Json& other) { return one.at("sequence") < other.at("sequence"); });
    if (!m_is_powered)
        return;
    follow_lanes();
    board::Value after = whole_state();
    if (m_before)
        for (const Change& change : changes(*m_before, after))
            ended["changes"].push_back(json_of(change));
    const Status status = status_of(after, board::description().name);
    ended["graphics"] = graphics_of(status);
    ended["graphics_state"] = name_of(status);
    ended["power_on_us"] = m_offset_us;
    ended["status"] = to_text(status, StatusPart::All, Look{});
    for (const SeenOutput& seen : m_pictures.look())
        ended["outputs"].push_back(json_of(seen));
    m_before = std::move(after);
}

Json Storyboard::lanes() const
{
    Json lanes = Json::array();
    for (const auto& [lane, name] : lane_names())
    {
        if (lane < first_lane_of_states)
            continue;
        Json spans = Json::array();
        for (const LaneSpan& span : m_lanes.ended())
            if (span.lane == lane && !(lane == lane_graphics && is_no_wait(span)))
                spans.push_back(json_of(span));
        lanes.push_back({ { "name", name }, { "kind", kind_of_lane(lane) }, { "spans", spans } });
    }
    return lanes;
}

void Storyboard::end_scenario(const std::string& unreadable)
{
    end_step();
    m_lanes.end(moment(), true);
    Json& run = m_runs.back();
    if (!unreadable.empty())
        m_failures.push_back({ { "text", unreadable }, { "step", nullptr } });
    run["failures"] = std::move(m_failures);
    run["steps_left_out"] = m_steps_left_out;
    run["lasted_us"] = moment().us;
    if (!is_left_out())
        run["to_us"] = moment().us;
    run["lanes"] = lanes();
    run["steps"] = std::move(m_steps);
}

std::string Storyboard::to_json() const
{
    Json pictures = Json::array();
    for (const std::string& png : m_pictures.all())
        pictures.push_back("data:image/png;base64," + base64(png));
    return board::written({ { "runs", m_runs }, { "pictures", pictures } });
}

} // namespace pmxboard
