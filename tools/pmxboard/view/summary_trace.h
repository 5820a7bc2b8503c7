// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A run in short: what each command made the layer do, in a line or two. */
#pragma once

#include <cstdint>
#include <iosfwd>
#include <map>
#include <string>

#include "tools/pmxboard/view/trace_sink.h"

namespace pmxboard
{

class SummaryTrace : public TraceSink
{
public:
    SummaryTrace(const TraceOptions& options, std::ostream& to);

    /** Counted; told when the command is done. */
    std::string entry(const board::TraceEntry& entry, bool shown) override;
    void settle() override;

    bool is_for_programs() const override { return false; }
    bool stands_for_console() const override { return !m_options.apart; }

private:
    /** Those of one neighbour. */
    struct Calls
    {
        std::uint64_t first = 0; ///< the call that it begins with
        unsigned count = 0;
    };

    std::string in_short() const;

    TraceOptions m_options;
    std::ostream& m_to;
    std::map<std::string, Calls> m_calls; ///< by neighbour
    unsigned m_count = 0;
    std::uint64_t m_begin_us = 0;
    std::uint64_t m_end_us = 0;
    std::string m_events; ///< what the board did by itself
};

} // namespace pmxboard
