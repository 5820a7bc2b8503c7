// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Runs as a storyboard: step by step what was typed, what came of it, and what one would see then. It listens to a run
 *  as a form of the trace does, and keeps everything until the page is written. */
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "board/json.h"
#include "board/value.h"
#include "tools/pmxboard/report/lane_spans.h"
#include "tools/pmxboard/report/seen_pictures.h"
#include "tools/pmxboard/view/trace_sink.h"

namespace pmxboard
{

/** A page of more would open slowly, or not at all. What is beyond is counted, and the page says so. */
struct PageLimits
{
    std::size_t steps = 500;     ///< of each run
    std::size_t entries = 20000; ///< of each run's trace
    std::size_t told = 20000;    ///< letters that a step shows
};

class Storyboard : public TraceSink
{
public:
    explicit Storyboard(const PageLimits& limits = {}) : m_limits(limits) {}

    void scenario(const std::string& name) override;
    void powered_on() override;
    void command(std::string_view line) override;
    void expectation(std::string_view line) override;
    void explanation(const std::string& json) override;
    void operation_ends(const Outcome& outcome) override;
    void told(const std::string& text) override;
    void failure(const std::string& message) override;
    void settle() override;
    std::string entry(const board::TraceEntry& entry, bool shown) override;

    /** The scenario is over.
     *  @param unreadable  why its lines could not be read to the end; empty when they could */
    void end_scenario(const std::string& unreadable = {});

    /** {"runs": […], "pictures": […]}: what the page's script reads, and nobody else. */
    std::string to_json() const;

private:
    board::Json& step();
    Moment moment() const;
    void begin_step(std::string_view line);
    void end_of_page();
    bool is_left_out() const { return m_steps_left_out > 0; }
    void end_step();
    void follow_lanes();
    board::Json lanes() const;

    PageLimits m_limits;
    SeenPictures m_pictures;
    board::Json m_runs = board::Json::array();

    /* Of the scenario that runs */
    board::Json m_steps = board::Json::array();
    std::size_t m_entries = 0;
    std::size_t m_steps_left_out = 0;
    board::Json m_left_out; ///< the step that runs, where it is one too many
    bool m_in_step = false;
    bool m_is_powered = false;
    std::int64_t m_offset_us = 0; ///< where the last power-on stands on the time line
    std::uint64_t m_sequence = 0;
    std::optional<board::Value> m_before; ///< what the step found, or the power-on within it
    board::Json m_failures = board::Json::array();
    std::string m_heard_place; ///< of the last line that was heard of
    LaneSpans m_lanes;
};

} // namespace pmxboard
