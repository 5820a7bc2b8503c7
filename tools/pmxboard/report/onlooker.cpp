// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/onlooker.h"

#include <algorithm>
#include <utility>

#include "board/board.h"
#include "tools/pmxboard/files/ending.h"
#include "tools/pmxboard/report/base64.h"
#include "tools/pmxboard/state/diff.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/status.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{
namespace
{

using board::Json;

// Of what people have written, and of sentences: as much as anybody reads.
constexpr std::size_t longest_command = 600;
constexpr std::size_t longest_place = 300;
constexpr std::size_t longest_sentence = 200;
/** What a step takes at most without what may be left out, even if each of those bytes is written as six. */
constexpr std::size_t bare_step = 8000;
/** What a bar takes without its text. */
constexpr std::size_t bare_span = 200;

std::int64_t now_us()
{
    return static_cast<std::int64_t>(board::now().count());
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
std::string beginning_of(const std::string& text, std::size_t most, const char* behind = "…")
{
    if (text.size() <= most)
        return text;
    while (most > 0 && (static_cast<unsigned char>(text[most]) & 0xC0) == 0x80)
        --most;
    return text.substr(0, most) + behind;
}

std::string place_now()
{
    return beginning_of(printable(current_place()), longest_place);
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

/** The sentence behind the word "Graphics". */
std::string graphics_of(const Status& status)
{
    constexpr unsigned unbroken = 10000;
    const std::string text = to_text(status, StatusPart::Graphics, Look{ unbroken, false });
    const std::size_t begin = text.find_first_not_of(' ', text.find(' '));
    return beginning_of(text.substr(begin, text.find('\n') - begin), longest_sentence);
}

/** What the page shows of an entry. */
Json event_of(const board::TraceEntry& entry, std::int64_t power_on_us)
{
    const Json whole = Json::parse(entry.to_json());
    Json event = { { "is", "entry" } };
    for (const char* const read : { "sequence", "time_us", "kind", "function", "text", "depth", "faulted" })
        if (whole.contains(read))
            event[read] = whole.at(read);
    event["time_us"] = power_on_us + static_cast<std::int64_t>(entry.time_us);
    event["brief"] = printable_lines(entry.brief());
    return event;
}

/** What may bring graphics back, where the board tells of it; else empty. */
std::string end_of_wait(const board::TraceEntry& entry)
{
    if (entry.kind != board::TraceEntry::Kind::Notice)
        return {};
    if (entry.function == "expiry" && entry.text.ends_with("_PMX_TmrIsr"))
    {
        static const record_view::Field is_changing("status.fgPmxFormatChangeFlag");
        return std::string("the display timer ran out") +
               (is_changing.number() != 0 ? "; the display part had not answered" : "");
    }
    if (entry.function == "display_part" || entry.function == "video_plane")
        return std::string("the ") + (entry.function == "display_part" ? "display part " : "video plane ") +
               printable(entry.text);
    return {};
}

/** What the bars that begin now take. */
std::size_t size_of_new(const States& states, const States* before)
{
    std::size_t size = 0;
    for (const auto& [lane, text] : states)
    {
        if (before == nullptr || !before->contains(lane) || before->at(lane) != text)
            size += bare_span + text.size();
    }
    return size;
}

} // namespace

Onlooker::Onlooker(std::function<void(const Json&)> tell, const PageLimits& limits)
    : m_tell(std::move(tell)), m_limits(limits), m_room(limits)
{
}

void Onlooker::scenario(const std::string& name)
{
    m_tell({ { "is", "scenario" }, { "name", beginning_of(name, longest_place) } });
}

Moment Onlooker::moment() const
{
    return { m_is_powered ? m_offset_us + now_us() : 0, m_steps == 0 ? 0 : m_steps - 1, m_sequence };
}

/** The first line of a scenario may expect something of a board that it has not powered on. */
void Onlooker::need_step()
{
    if (!m_in_step)
        begin_step("");
}

void Onlooker::begin_step(std::string_view line)
{
    m_in_step = true;
    m_left_out = {};
    m_heard.clear();
    m_step_told = 0;
    m_step_from_us = moment().us;
    if (is_behind_page() || m_steps == m_limits.steps || m_room.texts < bare_step)
    {
        if (++m_steps_left_out == 1)
            m_tell({ { "is", "end of page" }, { "at", json_of(moment()) } });
        return;
    }
    const Json begun = { { "is", "step" },
                         { "command", beginning_of(printable_lines(line), longest_command) },
                         { "place", place_now() },
                         { "from_us", m_step_from_us } };
    m_room.texts -= size_on_page(begun);
    m_tell(begun);
    ++m_steps;
}

void Onlooker::command(std::string_view line)
{
    end_step();
    begin_step(line);
    m_heard_place = current_place();
}

void Onlooker::powered_on()
{
    need_step();
    // The clock has begun anew: what held until now ends where the step began.
    m_tell({ { "is", "power on" },
             { "at", json_of(Moment{ m_step_from_us, moment().step, m_sequence }) },
             { "board", board::description().name } });
    m_offset_us = m_step_from_us - now_us(); // a restored board's clock has not begun at 0
    m_is_powered = true;
    m_sequence = 0;
    m_before = whole_state();
    m_states.reset();
    follow_lanes();
}

/** Of the step that runs, where there is room for it. */
void Onlooker::tell_text(const Json& event)
{
    if (is_behind_page())
        return;
    if (take(m_room.texts, size_on_page(event)))
        m_tell(event);
    else
        ++m_left_out.texts;
}

void Onlooker::expectation(std::string_view line)
{
    need_step();
    tell_text({ { "is", "expectation" }, { "line", printable_lines(line) }, { "place", place_now() } });
    m_heard_place = current_place();
}

void Onlooker::told(const std::string& text)
{
    if (!m_in_step || m_step_told > m_limits.told)
        return;
    const std::string beginning = beginning_of(printable_lines(text), m_limits.told - m_step_told, "…\n");
    m_step_told += beginning.size();
    tell_text({ { "is", "told" }, { "text", beginning } });
}

/** A line of which nothing was heard belongs to no step: it could not be read, or it only ends the scenario. */
void Onlooker::failure(const std::string& message)
{
    const bool is_of_step = m_in_step && !is_behind_page() && current_place() == m_heard_place;
    m_tell({ { "is", "failure" }, { "text", message }, { "step", is_of_step ? Json(m_steps - 1) : Json() } });
}

void Onlooker::explanation(const std::string& json)
{
    need_step();
    tell_text({ { "is", "explanation" }, { "of", Json::parse(json) } });
}

void Onlooker::operation_ends(const Outcome& outcome)
{
    need_step();
    if (const Json lines = lines_of(outcome); !lines.empty())
        tell_text({ { "is", "results" }, { "lines", lines } });
    follow_lanes();
}

void Onlooker::settle()
{
    if (m_in_step)
        follow_lanes();
}

std::string Onlooker::entry(const board::TraceEntry& entry, bool)
{
    m_sequence = std::max(m_sequence, entry.sequence); // what runs inside a call ends before it
    need_step();
    if (is_behind_page())
        return {};
    if (const std::string heard = end_of_wait(entry); !heard.empty())
        m_heard = heard;
    const Json event = event_of(entry, m_offset_us);
    if (take(m_room.entries, size_on_page(event)))
        m_tell(event);
    else
        ++m_left_out.entries;
    follow_lanes();
    return {};
}

void Onlooker::follow_lanes()
{
    if (!m_is_powered || is_behind_page() || m_time_line_is_full)
        return;
    const auto states = states_now();
    if (states == m_states)
        return;
    if (!take(m_room.spans, size_of_new(*states, m_states.get())))
    {
        m_time_line_is_full = true;
        m_tell({ { "is", "end of time line" }, { "at", json_of(moment()) } });
        return;
    }
    m_states = states;
    Json all = Json::array();
    for (const auto& [lane, text] : *states)
        all.push_back({ lane, text });
    m_tell({ { "is", "states" }, { "at", json_of(moment()) }, { "states", all }, { "heard", m_heard } });
}

void Onlooker::end_step()
{
    if (!std::exchange(m_in_step, false) || is_behind_page())
        return;
    if (m_is_powered)
        follow_lanes();
    tell_end_of_step();
}

void Onlooker::tell_end_of_step()
{
    Json event = { { "is", "end of step" }, { "to_us", moment().us } };
    if (m_is_powered)
    {
        board::Value after = whole_state();
        event["changes"] = told_changes(after);
        const Status status = status_of(after, board::description().name);
        event["graphics"] = graphics_of(status);
        event["graphics_state"] = name_of(status);
        event["power_on_us"] = m_offset_us;
        event["outputs"] = told_outputs();
        m_before = std::move(after);
        const Json changes = std::exchange(event["changes"], Json());
        m_room.texts -= std::min(m_room.texts, size_on_page(event));
        event["changes"] = changes;
        event["status"] = told_status(to_text(status, StatusPart::All, Look{}));
    }
    event["left_out"] = { { "texts", m_left_out.texts },
                          { "entries", m_left_out.entries },
                          { "changes", m_left_out.changes },
                          { "pictures", m_left_out.pictures } };
    m_tell(event);
}

Json Onlooker::told_changes(const board::Value& after)
{
    Json told = Json::array();
    for (const Change& change : m_before ? changes(*m_before, after) : std::vector<Change>())
    {
        Json json = json_of(change);
        if (take(m_room.changes, size_on_page(json)))
            told.push_back(std::move(json));
        else
            ++m_left_out.changes;
    }
    return told;
}

/** Null where they are as before. */
Json Onlooker::told_outputs()
{
    Json outputs = Json::array();
    for (const SeenOutput& seen : m_pictures.look())
        outputs.push_back({ { "output", seen.name },
                            { "description", seen.description },
                            { "picture", told_picture(seen.picture) } });
    return outputs == std::exchange(m_outputs, outputs) ? Json() : outputs;
}

/** Its place on the page; null where that has no room for it. */
Json Onlooker::told_picture(std::size_t png)
{
    for (std::size_t next = m_told_pictures.size(); next < m_pictures.all().size(); ++next)
    {
        const Json event = { { "is", "picture" },
                             { "data", "data:image/png;base64," + base64(m_pictures.all().at(next)) } };
        const bool is_told = take(m_room.pictures, size_on_page(event));
        m_told_pictures.push_back(is_told ? std::optional(m_pictures_told++) : std::nullopt);
        if (is_told)
            m_tell(event);
    }
    const auto place = m_told_pictures.at(png);
    m_left_out.pictures += place ? 0 : 1;
    return place ? Json(*place) : Json();
}

/** What the state means; null where that is as before. */
Json Onlooker::told_status(const std::string& text)
{
    if (text == m_status)
        return nullptr;
    m_status.clear(); // where there is no room for it, it is not known on the next step either
    if (!take(m_room.texts, size_on_page(text)))
    {
        ++m_left_out.texts;
        return "";
    }
    m_status = text;
    return text;
}

void Onlooker::end_scenario(const std::string& unreadable)
{
    end_step();
    if (!unreadable.empty())
        m_tell({ { "is", "failure" }, { "text", unreadable }, { "step", nullptr } });
    m_tell({ { "is", "end" }, { "at", json_of(moment()) }, { "steps_left_out", m_steps_left_out } });
}

} // namespace pmxboard
