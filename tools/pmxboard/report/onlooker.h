// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Looks at a scenario that runs, and tells what a page is to show of it, event by event: so what it saw is known even
 *  when the next step breaks the program down. */
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "board/json.h"
#include "board/value.h"
#include "tools/pmxboard/report/lane_spans.h"
#include "tools/pmxboard/report/page_limits.h"
#include "tools/pmxboard/report/seen_pictures.h"
#include "tools/pmxboard/view/lanes.h"
#include "tools/pmxboard/view/trace_sink.h"

namespace pmxboard
{

/** Of one scenario. */
class Onlooker : public TraceSink
{
public:
    /** @param tell  hears each event, as Storyboard::hear() reads it */
    explicit Onlooker(std::function<void(const board::Json& event)> tell, const PageLimits& limits = {});

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

private:
    /** What of a step has found no room. */
    struct LeftOut
    {
        std::size_t texts = 0;
        std::size_t entries = 0;
        std::size_t changes = 0;
        std::size_t pictures = 0;
    };

    Moment moment() const;
    void need_step();
    void begin_step(std::string_view line);
    void end_step();
    void tell_end_of_step();
    board::Json told_changes(const board::Value& after);
    board::Json told_outputs();
    board::Json told_picture(std::size_t png);
    board::Json told_status(const std::string& text);
    void tell_text(const board::Json& event);
    void follow_lanes();
    bool is_behind_page() const { return m_steps_left_out > 0; }

    std::function<void(const board::Json&)> m_tell;
    PageLimits m_limits;
    PageLimits m_room; ///< what is left
    SeenPictures m_pictures;
    std::vector<std::optional<std::size_t>> m_told_pictures; ///< their places on the page; nothing: there was no room
    std::size_t m_pictures_told = 0;
    std::size_t m_steps = 0; ///< that have begun
    std::size_t m_steps_left_out = 0;
    LeftOut m_left_out;
    std::size_t m_step_told = 0;
    bool m_in_step = false;
    bool m_is_powered = false;
    std::int64_t m_offset_us = 0; ///< where the last power-on stands on the time line
    std::int64_t m_step_from_us = 0;
    std::uint64_t m_sequence = 0;
    std::optional<board::Value> m_before; ///< what the step found, or the power-on within it
    std::string m_heard_place;            ///< of the last line that was heard of
    std::string m_heard;                  ///< what the board told in this step that may end a wait
    std::shared_ptr<const States> m_states;
    bool m_time_line_is_full = false;
    std::string m_status;  ///< of the step before, which is not told again
    board::Json m_outputs; ///< as well
};

} // namespace pmxboard
