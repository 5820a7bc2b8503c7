// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/storyboard.h"

#include <algorithm>
#include <cstdint>
#include <string_view>
#include <utility>

#include "tools/pmxboard/report/seen_pictures.h"
#include "tools/pmxboard/view/lanes.h"

namespace pmxboard
{
namespace
{

using board::Json;

Json json_of(const LaneSpan& span)
{
    return { { "text", span.text },
             { "from", json_of(span.from) },
             { "to", json_of(span.to) },
             { "open", span.is_open },
             { "ended_by", span.ended_by } };
}

/** Between two stores of a release both reasons to wait hold, for no time. */
bool is_no_wait(const LaneSpan& span)
{
    return span.from.us == span.to.us && span.from.step == span.to.step && !span.is_open;
}

Json json_of(const LaneSpans& of)
{
    Json lanes = Json::array();
    for (const auto& [lane, name] : lane_names())
    {
        if (lane < first_lane_of_states)
            continue;
        Json spans = Json::array();
        for (const LaneSpan& span : of.ended())
            if (span.lane == lane && !(lane == lane_graphics && is_no_wait(span)))
                spans.push_back(json_of(span));
        lanes.push_back({ { "name", name }, { "kind", kind_of_lane(lane) }, { "spans", spans } });
    }
    return lanes;
}

std::size_t count_of(const Json& json)
{
    return json.get<std::size_t>();
}

/** What runs inside a call ends before it, and stands behind it. */
void sort_entries(Json& step)
{
    auto& entries = step.at("entries").get_ref<Json::array_t&>();
    std::stable_sort(entries.begin(), entries.end(),
                     [](const Json& one, const Json& other) { return one.at("sequence") < other.at("sequence"); });
}

} // namespace

void Storyboard::hear(const Json& event)
{
    static const std::map<std::string_view, void (Storyboard::*)(const Json&)> hearing = {
        { "scenario", &Storyboard::begin_run },
        { "step", &Storyboard::begin_step },
        { "end of step", &Storyboard::end_step },
        { "end", &Storyboard::end_run },
        { "entry", &Storyboard::hear_entry },
        { "failure", &Storyboard::hear_failure },
        { "picture", &Storyboard::hear_picture },
        { "power on", &Storyboard::hear_power_on },
        { "states", &Storyboard::hear_states },
        { "end of page", &Storyboard::end_of_page },
        { "end of time line", &Storyboard::end_of_time_line },
        { "expectation", &Storyboard::hear_expectation },
        { "told", &Storyboard::hear_told },
        { "explanation", &Storyboard::hear_explanation },
        { "results", &Storyboard::hear_results },
    };
    (this->*hearing.at(event.at("is").get_ref<const std::string&>()))(event);
}

void Storyboard::begin_run(const Json& event)
{
    m_run = { { "name", event.at("name") }, { "boards", Json::array() }, { "failures", Json::array() },
              { "steps_left_out", 0 },      { "lasted_us", 0 },          { "to_us", 0 },
              { "lanes_end_us", nullptr },  { "lanes", Json::array() },  { "steps", Json::array() } };
    m_told_pictures.clear();
    m_now = {};
    m_lanes = {};
    m_place = event.at("name");
}

void Storyboard::begin_step(const Json& event)
{
    Json& steps = m_run.at("steps");
    const Json& from_us = event.at("from_us");
    steps.push_back({ { "command", event.at("command") },
                      { "place", event.at("place") },
                      { "from_us", from_us },
                      { "to_us", from_us },
                      { "results", Json::array() },
                      { "told", "" },
                      { "explanation", nullptr },
                      { "expectations", Json::array() },
                      { "entries", Json::array() },
                      { "changes", Json::array() },
                      { "outputs", Json::array() },
                      { "status", "" } });
    m_now.us = from_us;
    m_now.step = steps.size() - 1;
    m_place = event.at("place");
}

void Storyboard::end_step(const Json& event)
{
    Json& ended = step();
    for (const auto& [name, value] : event.items())
    {
        if (name != "is")
            ended[name] = name == "outputs" ? placed(value) : value;
    }
    m_now.us = event.at("to_us");
}

/** With the pictures' places on this page. */
Json Storyboard::placed(const Json& outputs) const
{
    Json placed = outputs;
    for (Json& output : placed)
    {
        if (!output.at("picture").is_null())
            output["picture"] = m_told_pictures.at(count_of(output.at("picture")));
    }
    return placed;
}

void Storyboard::hear_entry(const Json& event)
{
    Json entry = event;
    entry.erase("is");
    m_now.us = std::max<std::int64_t>(m_now.us, entry.at("time_us")); // a call is told behind what ran within it
    m_now.sequence = std::max<std::uint64_t>(m_now.sequence, entry.at("sequence"));
    step().at("entries").push_back(std::move(entry));
}

void Storyboard::hear_expectation(const Json& event)
{
    m_place = event.at("place");
    step().at("expectations").push_back({ { "line", event.at("line") }, { "place", m_place } });
}

void Storyboard::hear_told(const Json& event)
{
    step()["told"] = step().at("told").get<std::string>() + event.at("text").get<std::string>();
}

void Storyboard::hear_explanation(const Json& event)
{
    step()["explanation"] = event.at("of");
}

void Storyboard::hear_results(const Json& event)
{
    for (const Json& line : event.at("lines"))
        step().at("results").push_back(line);
}

void Storyboard::hear_failure(const Json& event)
{
    m_run.at("failures").push_back({ { "text", event.at("text") }, { "step", event.at("step") } });
}

void Storyboard::hear_picture(const Json& event)
{
    const std::string& data = event.at("data").get_ref<const std::string&>();
    const auto [found, is_new] = m_places.try_emplace(data, m_pictures.size());
    if (is_new)
        m_pictures.push_back(data);
    m_told_pictures.push_back(found->second);
}

void Storyboard::hear_power_on(const Json& event)
{
    Json& boards = m_run.at("boards");
    if (std::find(boards.begin(), boards.end(), event.at("board")) == boards.end())
        boards.push_back(event.at("board"));
    if (is_behind_page())
        return;
    m_now = moment_of(event.at("at"));
    m_lanes.end(m_now, false);
    m_now.sequence = 0;
}

void Storyboard::hear_states(const Json& event)
{
    m_now = moment_of(event.at("at"));
    States states;
    for (const Json& state : event.at("states"))
        states[state.at(0)] = state.at(1);
    m_lanes.follow(states, m_now, event.at("heard"));
}

/** What holds here goes on where nobody sees it. */
void Storyboard::end_of_page(const Json& event)
{
    m_now = moment_of(event.at("at"));
    m_run["steps_left_out"] = 1;
    m_run["to_us"] = m_now.us;
    m_lanes.end(m_now, true);
}

void Storyboard::end_of_time_line(const Json& event)
{
    m_now = moment_of(event.at("at"));
    m_run["lanes_end_us"] = m_now.us;
    m_lanes.end(m_now, true);
}

void Storyboard::end_run(const Json& event)
{
    if (is_behind_page())
        m_run["steps_left_out"] = event.at("steps_left_out");
    close(moment_of(event.at("at")));
}

void Storyboard::close(const Moment& at)
{
    m_lanes.end(at, true);
    m_run["lasted_us"] = at.us;
    if (!is_behind_page())
        m_run["to_us"] = at.us;
    m_run["lanes"] = json_of(m_lanes);
    for (Json& step : m_run.at("steps"))
        sort_entries(step);
    m_runs.push_back(std::exchange(m_run, Json()));
}

std::string Storyboard::broke_down(const std::string& how)
{
    const std::string message = m_place + ": the step broke the program down: " + how;
    const bool is_of_step = !m_run.at("steps").empty() && !is_behind_page();
    hear_failure({ { "text", message }, { "step", is_of_step ? Json(m_now.step) : Json() } });
    if (is_of_step)
        step()["to_us"] = m_now.us;
    close(m_now);
    return message;
}

std::string Storyboard::to_json() const
{
    return board::written({ { "runs", m_runs }, { "pictures", m_pictures }, { "sees", SeenPictures::can_look() } });
}

} // namespace pmxboard
