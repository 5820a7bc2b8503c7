// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A run as a Chrome trace: the JSON that chrome://tracing and Perfetto's viewer open. Each power-on is a process of
 *  its own; what happens there goes by lanes: operations, platform calls, console, the board's own doings, and those of
 *  states.
 *
 *  Virtual time stands still while calls follow each other. So that their order can be seen, each beginning and each
 *  end is at least a nanosecond behind the one before. */
#pragma once

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "board/trace.h"
#include "tools/pmxboard/view/lanes.h"
#include "tools/pmxboard/view/trace_sink.h"

namespace pmxboard
{

class ChromeTrace : public TraceSink
{
public:
    explicit ChromeTrace(std::ostream& to);
    /** The trace ends; what is still open is closed. */
    ~ChromeTrace() override;

    void scenario(const std::string& name) override;
    void powered_on() override;
    void command(std::string_view line) override { m_command = line; }
    void refusal(const std::string& sentence) override { m_refusal = sentence; }
    void operation_begins(const std::string& name) override;
    void operation_ends(const Outcome& outcome) override;
    void settle() override;
    /** Written when what it is nested in is. One that is not shown only tells what it changed. */
    std::string entry(const board::TraceEntry& entry, bool shown) override;

private:
    struct Finished
    {
        board::TraceEntry entry;
        std::uint64_t end_us = 0;
        bool shown = true;
        std::shared_ptr<const States> states; ///< when it ended
    };

    void release();
    void close_deeper_than(unsigned depth);
    void begin(const Finished& finished);
    void end(const Finished& finished);
    void follow_operation(const board::TraceEntry& entry);
    void end_operation(const std::string& arguments);
    void show(const std::shared_ptr<const States>& states);
    void close_process();

    void advance_to(std::uint64_t time_us);
    void span_begins(int lane, const std::string& name, const std::string& arguments);
    void span_ends(int lane, const std::string& arguments);
    void instant(int lane, const std::string& name, const std::string& arguments);
    void name_lanes();
    void name_lane(int lane, const std::string& name);
    void metadata(int lane, const std::string& kind, const std::string& value);
    void write(std::string_view phase, int lane, const std::string& rest);

    std::ostream& m_to;
    bool m_first = true;
    std::string m_scenario = "pmxboard";
    unsigned m_power_ons = 0; ///< of this scenario
    unsigned m_process = 0;
    std::uint64_t m_tick = 0; ///< nanoseconds
    std::string m_command;
    std::string m_operation;
    std::string m_refusal;         ///< of the operation that runs, where it is known
    bool m_stores_named = false;   ///< their lane, in this process
    bool m_operation_told = false; ///< by operation_begins, not found out from an entry
    std::vector<Finished> m_waiting;
    std::vector<const Finished*> m_open; ///< while they are released
    std::shared_ptr<const States> m_states = std::make_shared<const States>();
};

} // namespace pmxboard
