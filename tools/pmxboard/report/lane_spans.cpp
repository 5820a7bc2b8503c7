// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/lane_spans.h"

namespace pmxboard
{

board::Json json_of(const Moment& moment)
{
    return { { "us", moment.us }, { "step", moment.step }, { "sequence", moment.sequence } };
}

Moment moment_of(const board::Json& json)
{
    return { json.at("us"), json.at("step"), json.at("sequence") };
}

void LaneSpans::follow(const std::map<int, std::string>& states, const Moment& now, const std::string& told)
{
    for (auto open = m_open.begin(); open != m_open.end();)
    {
        const auto state = states.find(open->first);
        if (state != states.end() && state->second == open->second.text)
        {
            ++open;
            continue;
        }
        open->second.to = now;
        open->second.ended_by = told;
        m_ended.push_back(open->second);
        open = m_open.erase(open);
    }
    for (const auto& [lane, text] : states)
        m_open.try_emplace(lane, LaneSpan{ lane, text, now, now, false, {} });
}

void LaneSpans::end(const Moment& now, bool run_is_over)
{
    for (auto& [lane, span] : m_open)
    {
        span.to = now;
        span.is_open = run_is_over;
        m_ended.push_back(span);
    }
    m_open.clear();
}

} // namespace pmxboard
