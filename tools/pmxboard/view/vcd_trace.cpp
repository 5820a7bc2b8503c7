// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/vcd_trace.h"

#include <algorithm>
#include <ostream>

#include "board/board.h"
#include "tools/pmxboard/view/lanes.h"

namespace pmxboard
{
namespace
{

constexpr std::int64_t ns_per_us = 1000;

std::int64_t now_ns()
{
    return static_cast<std::int64_t>(board::now().count()) * ns_per_us;
}

/** A wire's name has no blanks. */
std::string wire_name(std::string name)
{
    std::replace(name.begin(), name.end(), ' ', '_');
    return name;
}

void declare(std::ostream& to, const std::string& code, const std::string& name)
{
    to << "$var wire 1 " << code << ' ' << wire_name(name) << " $end\n";
}

} // namespace

VcdTrace::VcdTrace(std::ostream& to) : m_to(to), m_power{ 0, "!" }
{
    m_to << "$version pmxboard $end\n$timescale 1 ns $end\n$scope module pmx $end\n";
    declare(m_to, m_power.code, "power");
    for (const auto& [lane, name] : lane_names())
    {
        if (lane < first_lane_of_states)
            continue;
        m_wires.push_back({ lane, std::string(1, static_cast<char>(m_power.code[0] + 1 + m_wires.size())) });
        declare(m_to, m_wires.back().code, lane == lane_graphics ? "graphics held back" : name);
    }
    m_to << "$upscope $end\n$enddefinitions $end\n";
}

/** The last levels hold until here. */
VcdTrace::~VcdTrace()
{
    m_to << '#' << m_tick + 1 << '\n' << std::flush;
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
        set(m_power, false);
        for (Wire& wire : m_wires)
            set(wire, false);
        m_tick += ns_per_us;
    }
    m_clock_began = static_cast<std::int64_t>(m_tick) - now_ns();
    m_is_powered = true;
    set(m_power, true);
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
    const std::shared_ptr<const States> states = states_now();
    m_tick = std::max(m_tick, static_cast<std::uint64_t>(m_clock_began + now_ns()));
    if (std::any_of(m_wires.begin(), m_wires.end(), [&](const Wire& wire) {
            return wire.level != 'x' && (wire.level == '1') != states->contains(wire.lane);
        }))
        m_tick = std::max(m_tick, *m_written + 1);
    for (Wire& wire : m_wires)
        set(wire, states->contains(wire.lane));
}

void VcdTrace::set(Wire& wire, bool high)
{
    const char level = high ? '1' : '0';
    if (wire.level == level)
        return;
    if (m_written != m_tick)
        m_to << '#' << m_tick << '\n';
    m_written = m_tick;
    m_to << level << wire.code << '\n';
    wire.level = level;
}

} // namespace pmxboard
