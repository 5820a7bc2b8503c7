// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Runs as a storyboard: step by step what was typed, what came of it, and what one would see then. It is put together
 *  of what onlookers tell, and knows nothing of the board. */
#pragma once

#include <cstddef>
#include <map>
#include <string>
#include <vector>

#include "board/json.h"
#include "tools/pmxboard/report/lane_spans.h"

namespace pmxboard
{

class Storyboard
{
public:
    /** What an onlooker tells. Each scenario begins with one that says so, and ends with one or with broke_down(). */
    void hear(const board::Json& event);
    /** The scenario has ended in the middle of a step; the message, with the place in front.
     *  @param how  "Segmentation fault" */
    std::string broke_down(const std::string& how);

    /** Whether a scenario has begun and not ended. */
    bool is_in_run() const { return !m_run.is_null(); }

    /** {"runs": […], "pictures": […], "sees": …}: what the page's script reads, and nobody else. */
    std::string to_json() const;

private:
    using Json = board::Json;

    void begin_run(const Json& event);
    void begin_step(const Json& event);
    void end_step(const Json& event);
    void end_run(const Json& event);
    void hear_entry(const Json& event);
    void hear_expectation(const Json& event);
    void hear_explanation(const Json& event);
    void hear_results(const Json& event);
    void hear_told(const Json& event);
    void hear_failure(const Json& event);
    void hear_picture(const Json& event);
    void hear_power_on(const Json& event);
    void hear_states(const Json& event);
    void end_of_page(const Json& event);
    void end_of_time_line(const Json& event);
    void close(const Moment& at);
    bool is_behind_page() const { return m_run.at("steps_left_out") != 0; }
    Json& step() { return m_run.at("steps").back(); }
    Json placed(const Json& outputs) const;

    Json m_runs = Json::array();
    std::map<std::string, std::size_t> m_places; ///< of the pictures
    std::vector<std::string> m_pictures;

    /* Of the scenario that is told */
    Json m_run;                               ///< null between two of them
    std::vector<std::size_t> m_told_pictures; ///< in the run's order: their places
    Moment m_now;                             ///< of what was told last
    LaneSpans m_lanes;
    std::string m_place; ///< of what was told last
};

} // namespace pmxboard
