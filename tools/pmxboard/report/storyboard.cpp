// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/storyboard.h"

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
    return { { "path", change.path }, { "older", text(change.older) }, { "newer", text(change.newer) } };
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
    m_runs.push_back({ { "name", name }, { "board", m_board } });
    m_steps = Json::array();
    m_entries = 0;
    m_steps_left_out = 0;
    m_in_step = false;
    m_is_powered = false;
    m_offset_us = 0;
    m_sequence = 0;
    m_before.reset();
    m_lanes = {};
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
    Json begun = { { "command", printable_lines(line) },
                   { "place", current_place() },
                   { "from_us", moment().us },
                   { "to_us", 0 },
                   { "results", Json::array() },
                   { "explanation", nullptr },
                   { "expectations", Json::array() },
                   { "entries", Json::array() },
                   { "entries_left_out", 0 } };
    if (m_steps.size() == m_limits.steps)
    {
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
}

void Storyboard::powered_on()
{
    // The clock has begun anew: what held until now ends where the step began.
    Json& now = step();
    const std::int64_t end_us = now.at("from_us").get<std::int64_t>();
    m_lanes.end({ end_us, m_steps.size() - 1, m_sequence }, false);
    m_offset_us = end_us - (m_is_powered ? 0 : now_us());
    m_is_powered = true;
    m_sequence = 0;
    m_before.reset();
    follow_lanes();
}

void Storyboard::expectation(std::string_view line)
{
    step()["expectations"].push_back({ { "line", printable_lines(line) }, { "place", current_place() } });
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
    m_sequence = entry.sequence;
    Json& now = step();
    if (is_left_out() || m_entries == m_limits.entries)
        now["entries_left_out"] = now.at("entries_left_out").get<std::size_t>() + 1;
    else
    {
        Json json = Json::parse(entry.to_json());
        json["brief"] = printable_lines(entry.brief());
        now["entries"].push_back(std::move(json));
        ++m_entries;
    }
    follow_lanes();
    return {};
}

void Storyboard::follow_lanes()
{
    if (m_is_powered)
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
    if (!m_is_powered)
        return;
    follow_lanes();
    board::Value after = whole_state();
    if (m_before)
        for (const Change& change : changes(*m_before, after))
            ended["changes"].push_back(json_of(change));
    const Status status = status_of(after, m_board);
    ended["graphics"] = graphics_of(status);
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
            if (span.lane == lane)
                spans.push_back(json_of(span));
        lanes.push_back({ { "name", name }, { "spans", spans } });
    }
    return lanes;
}

void Storyboard::end_scenario(const std::vector<std::string>& failures)
{
    end_step();
    m_lanes.end(moment(), true);
    Json& run = m_runs.back();
    run["failures"] = failures;
    run["steps_left_out"] = m_steps_left_out;
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
