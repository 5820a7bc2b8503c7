// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A run as a value change dump (IEEE 1364), for viewers of waveforms such as GTKWave: a wire for each lane of states,
 *  which is high while something holds there, one for the board's power, and a number for the mode of the mixer and of
 *  each output, which is unknown while there is none.
 *
 *  A mode is a number, where its name would read better: texts are no part of the format. One viewer takes them all the
 *  same, and the file is for any. */
#pragma once

#include <cstdint>
#include <iosfwd>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "tools/pmxboard/view/lanes.h"
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
    struct Signal
    {
        int lane = 0;
        bool is_mode = false;
        std::string code;  ///< what changes call it
        std::string value; ///< as it was written last
    };

    /** All that values come from. */
    struct Seen
    {
        bool has_power = false;
        std::shared_ptr<const States> states = std::make_shared<const States>();
        std::map<int, std::uint32_t> modes = {};

        bool operator==(const Seen&) const = default;
    };

    void declare(int lane, bool is_mode, std::string name);
    void follow();
    void write(const Seen& seen);
    static std::string value_of(const Signal& signal, const Seen& seen);

    std::ostream& m_to;
    std::vector<Signal> m_signals;
    Seen m_seen;
    bool m_is_powered = false;
    std::uint64_t m_tick = 0;               ///< nanoseconds; what happens in one microsecond keeps its order
    std::int64_t m_clock_began = 0;         ///< the tick of the board's time 0; before the first where it was restored
    std::optional<std::uint64_t> m_written; ///< the tick that was written last
};

} // namespace pmxboard
