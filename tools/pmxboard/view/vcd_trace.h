// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A run as a value change dump (IEEE 1364), for viewers of waveforms such as GTKWave: a wire for each lane of states,
 *  which is high while something holds there, and one for the board's power. */
#pragma once

#include <cstdint>
#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

#include "tools/pmxboard/view/trace_sink.h"

namespace pmxboard
{

class VcdTrace : public TraceSink
{
public:
    explicit VcdTrace(std::ostream& to);
    ~VcdTrace() override;

    void scenario(const std::string& name) override;
    void powered_on() override;
    void operation_ends(const Outcome& outcome) override;
    void settle() override;
    bool hears_stores() const override { return true; }
    std::string entry(const board::TraceEntry& entry, bool shown) override;

private:
    struct Wire
    {
        int lane = 0;
        std::string code; ///< what changes call it
        char level = 'x';
    };

    void follow();
    void set(Wire& wire, bool high);

    std::ostream& m_to;
    Wire m_power;
    std::vector<Wire> m_wires;
    bool m_is_powered = false;
    std::uint64_t m_tick = 0;               ///< nanoseconds; what happens in one microsecond keeps its order
    std::int64_t m_clock_began = 0;         ///< the tick of the board's time 0; before the first where it was restored
    std::optional<std::uint64_t> m_written; ///< the tick that was written last
};

} // namespace pmxboard
