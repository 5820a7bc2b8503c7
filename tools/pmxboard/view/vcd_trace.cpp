// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/vcd_trace.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <ostream>
#include <utility>

#include "board/board.h"

namespace pmxboard
{
namespace
{

constexpr std::int64_t ns_per_us = 1000;
constexpr int lane_power = lane_process;
constexpr char first_code = '!';
/** With a number's blank in front of the code. */
constexpr const char* no_mode = "bx ";

std::int64_t now_ns()
{
    return static_cast<std::int64_t>(board::now().count()) * ns_per_us;
}

std::string binary(std::uint32_t number)
{
    std::array<char, 32> digits{};
    char* const end = std::to_chars(digits.data(), digits.data() + digits.size(), number, 2).ptr;
    return "b" + std::string(digits.data(), end) + " ";
}

bool is_of_mode(int lane)
{
    return lane == lane_mixer_mode || (lane >= lane_digital && lane <= lane_composite);
}

} // namespace

VcdTrace::VcdTrace(std::ostream& to) : m_to(to)
{
    m_to << "$version pmxboard $end\n$timescale 1 ns $end\n$scope module pmx $end\n";
    declare(lane_power, false, "power");
    for (const auto& [lane, name] : lane_names())
    {
        if (lane < first_lane_of_states)
            continue;
        if (lane != lane_mixer_mode)
            declare(lane, false, lane == lane_graphics ? "graphics held back" : name);
        if (is_of_mode(lane))
            declare(lane, true, lane == lane_mixer_mode ? name : name + " mode");
    }
    m_to << "$upscope $end\n$enddefinitions $end\n";
}

/** The last values hold until here. */
VcdTrace::~VcdTrace()
{
    if (!m_written)
        write({});
    m_to << '#' << m_tick + 1 << '\n' << std::flush;
}

void VcdTrace::declare(int lane, bool is_mode, std::string name)
{
    std::replace(name.begin(), name.end(), ' ', '_');
    const std::string code(1, static_cast<char>(first_code + m_signals.size()));
    m_to << "$var " << (is_mode ? "integer 32 " : "wire 1 ") << code << ' ' << name << " $end\n";
    m_signals.push_back({ lane, is_mode, code, {} });
}

void VcdTrace::scenario(const std::string& name)
{
    // A dollar sign could end the comment.
    std::string shown = name;
    std::replace(shown.begin(), shown.end(), '$', '_');
    m_to << "$comment " << shown << " $end\n";
    // The next one has a board of its own; what is left of this one is nobody's.
    m_is_powered = false;
}

void VcdTrace::powered_on()
{
    if (m_written)
    {
        m_tick += ns_per_us;
        write({});
        m_tick += ns_per_us;
    }
    m_clock_began = static_cast<std::int64_t>(m_tick) - now_ns();
    m_is_powered = true;
    follow();
}

void VcdTrace::operation_ends(const Outcome&)
{
    follow();
}

void VcdTrace::settle()
{
    follow();
}

std::string VcdTrace::entry(const board::TraceEntry&, bool)
{
    follow();
    return {};
}

void VcdTrace::follow()
{
    if (!m_is_powered)
        return;
    m_tick = std::max(m_tick, static_cast<std::uint64_t>(m_clock_began + now_ns()));
    write({ true, states_now(), modes_now() });
}

std::string VcdTrace::value_of(const Signal& signal, const Seen& seen)
{
    if (signal.is_mode)
    {
        const auto mode = seen.modes.find(signal.lane);
        return mode == seen.modes.end() ? no_mode : binary(mode->second);
    }
    const bool high = signal.lane == lane_power ? seen.has_power : seen.states->contains(signal.lane);
    return high ? "1" : "0";
}

/** What differs; the first time that is everything. */
void VcdTrace::write(const Seen& seen)
{
    if (m_written && seen == m_seen)
        return;
    m_seen = seen;
    std::string changes;
    for (Signal& signal : m_signals)
    {
        std::string value = value_of(signal, seen);
        if (signal.value == value)
            continue;
        changes += value + signal.code + '\n';
        signal.value = std::move(value);
    }
    if (changes.empty())
        return;
    if (m_written == m_tick)
        ++m_tick;
    m_to << '#' << m_tick << '\n' << (m_written ? changes : "$dumpvars\n" + changes + "$end\n");
    m_written = m_tick;
}

} // namespace pmxboard
