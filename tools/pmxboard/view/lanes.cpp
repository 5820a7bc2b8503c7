// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/lanes.h"

#include "board/devices.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{
namespace
{

using board::Value;

constexpr int first_osd_plane = 3;
constexpr int last_osd_plane = 8;

std::string flag_field(int lane)
{
    switch (lane)
    {
    case lane_format_change_flag: return "fgPmxFormatChangeFlag";
    case lane_osd_enable_flag: return "fgPmxEnabeOsdFlag";
    default: return "fgTimerAlreadySet";
    }
}

/** The layer's timer, while it runs: by the function that it will call. */
std::string running_timer()
{
    const std::int64_t handle = record_view::get("status.hPMXTimer").as_number();
    const Value timers = board::timers::state();
    for (const Value& timer : timers.items())
    {
        if (timer.find("handle")->as_number() == handle && timer.find("running")->as_number() != 0)
            return timer.find("callback")->to_text();
    }
    return {};
}

} // namespace

std::map<int, std::string> lane_names()
{
    std::map<int, std::string> names = { { lane_operations, "operations" },
                                         { lane_calls, "platform calls" },
                                         { lane_console, "console" },
                                         { lane_board, "board" },
                                         { lane_timer, "display timer" } };
    for (const int lane : { lane_format_change_flag, lane_osd_enable_flag, lane_timer_set_flag })
        names[lane] = "flag " + flag_field(lane);
    for (int plane = first_osd_plane; plane <= last_osd_plane; ++plane)
        names[lane_osd_plane_3 + plane - first_osd_plane] = "OSD plane " + std::to_string(plane);
    return names;
}

std::map<int, std::string> states_now()
{
    std::map<int, std::string> states;
    for (const int lane : { lane_format_change_flag, lane_osd_enable_flag, lane_timer_set_flag })
    {
        if (record_view::get("status." + flag_field(lane)).as_number() != 0)
            states[lane] = flag_field(lane);
    }
    if (const std::string timer = running_timer(); !timer.empty())
        states[lane_timer] = timer;
    const Value mixer = board::mixer::state();
    const Value* const mixed = mixer.find("mixed");
    for (int plane = first_osd_plane; mixed != nullptr && plane <= last_osd_plane; ++plane)
    {
        if (mixed->items().at(static_cast<std::size_t>(plane) - 1).as_number() != 0)
            states[lane_osd_plane_3 + plane - first_osd_plane] = "plane " + std::to_string(plane) + " mixed";
    }
    return states;
}

} // namespace pmxboard
