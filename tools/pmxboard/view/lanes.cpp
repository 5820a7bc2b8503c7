// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/lanes.h"

#include <array>
#include <compare>
#include <cstdint>

#include "board/devices.h"
#include "board/shown.h"
#include "tools/pmxboard/state/status.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{
namespace
{

using board::Value;

constexpr unsigned first_osd_plane = 3;
constexpr unsigned last_osd_plane = 8;

std::string flag_field(int lane)
{
    switch (lane)
    {
    case lane_format_change_flag: return "fgPmxFormatChangeFlag";
    case lane_osd_enable_flag: return "fgPmxEnabeOsdFlag";
    default: return "fgTimerAlreadySet";
    }
}

int lane_of_plane(unsigned plane)
{
    return lane_plane_1 + static_cast<int>(plane - 1);
}

/** As much of the whole state as tells what mixer and outputs show and whether graphics wait. */
Value part_of_state()
{
    Value status = Value::record({});
    for (const char* const flag : { "fgPmxFormatChangeFlag", "fgPmxEnabeOsdFlag" })
        status.add(flag, record_view::get("status." + std::string(flag)));
    return Value::record({ { "mixer", board::mixer::state() },
                           { "tv_encoder", board::tv_encoder::state() },
                           { "hdmi_av", board::hdmi_av::state() },
                           { "os", Value::record({ { "timers", board::timers::state() } }) },
                           { "record", Value::record({ { "ucVfreq", record_view::get("ucVfreq") },
                                                       { "ucEnable", record_view::get("ucEnable") } }) },
                           { "status", status } });
}

/** The layer's timer, while it runs: by the function that it will call. */
std::string running_timer(const Value& timers)
{
    const std::int64_t handle = record_view::get("status.hPMXTimer").as_number();
    for (const Value& timer : timers.items())
    {
        if (timer.find("handle")->as_number() == handle && timer.find("running")->as_number() != 0)
            return timer.find("callback")->to_text();
    }
    return {};
}

std::string shown_graphics(const GraphicsStatus& graphics)
{
    switch (graphics.state)
    {
    case GraphicsStatus::State::Held: return "held back";
    case GraphicsStatus::State::AwaitsVideoPlane: return "held back by the video plane";
    default: return {};
    }
}

std::string shown_on(const OutputStatus& output)
{
    if (!output.on.value_or(false))
        return {};
    return output.mode.to_text() + " at " + output.frequency.to_text() + " Hz" +
           (output.remark.empty() ? "" : ", " + output.remark);
}

/** All that the states come from. */
struct Seen
{
    board::mixer::Shown mixer;
    std::array<board::tv_encoder::Shown, 2> tv_encoder;
    board::hdmi_av::Shown hdmi_av;
    const void* timer = nullptr; ///< what the layer's will call, while it runs
    std::int64_t format_change = 0;
    std::int64_t osd_enable = 0;
    std::int64_t timer_set = 0;
    std::int64_t frequency = 0;
    std::int64_t enable = 0;

    auto operator<=>(const Seen&) const = default;
};

Seen seen_now()
{
    using record_view::Field;
    static const Field timer("status.hPMXTimer");
    static const Field format_change("status.fgPmxFormatChangeFlag");
    static const Field osd_enable("status.fgPmxEnabeOsdFlag");
    static const Field timer_set("status.fgTimerAlreadySet");
    static const Field frequency("record.ucVfreq");
    static const Field enable("record.ucEnable");
    return { board::mixer::shown(),   board::tv_encoder::shown(),
             board::hdmi_av::shown(), board::timers::next_call_of(static_cast<std::uint32_t>(timer.number())),
             format_change.number(),  osd_enable.number(),
             timer_set.number(),      frequency.number(),
             enable.number() };
}

States states_by_name()
{
    const Value part = part_of_state();
    const Status status = status_of(part, {});
    States states;
    states[lane_graphics] = shown_graphics(status.graphics);
    for (const int lane : { lane_format_change_flag, lane_osd_enable_flag, lane_timer_set_flag })
        states[lane] = record_view::get("status." + flag_field(lane)).as_number() != 0 ? flag_field(lane) : "";
    states[lane_timer] = running_timer(*part.find("os.timers"));
    states[lane_enable] = status.enabled ? "on" : "";
    states[lane_mixer_mode] = status.mode.kind() == Value::Kind::Null ? "" : status.mode.to_text();
    for (const PlaneStatus& plane : status.planes)
    {
        if (plane.mixed)
            states[lane_of_plane(plane.plane)] = "plane " + std::to_string(plane.plane) + " mixed";
    }
    states[lane_sink] = status.sink.plugged ? "plugged in" : "";
    states[lane_mute] = status.muted ? "muted" : "";
    for (std::size_t output = 0; output < status.outputs.size(); ++output)
        states[lane_digital + static_cast<int>(output)] = shown_on(status.outputs[output]);
    std::erase_if(states, [](const auto& state) { return state.second.empty(); });
    return states;
}

} // namespace

std::map<int, std::string> lane_names()
{
    std::map<int, std::string> names = { { lane_operations, "operations" },
                                         { lane_calls, "platform calls" },
                                         { lane_console, "console" },
                                         { lane_board, "board" },
                                         { lane_graphics, "graphics" },
                                         { lane_timer, "display timer" },
                                         { lane_enable, "master enable" },
                                         { lane_mixer_mode, "mixer mode" },
                                         { lane_sink, "HDMI sink" },
                                         { lane_mute, "mute" },
                                         { lane_digital, "digital output" },
                                         { lane_digital + 1, "HDMI output" },
                                         { lane_digital + 2, "component output" },
                                         { lane_composite, "composite output" } };
    for (const int lane : { lane_format_change_flag, lane_osd_enable_flag, lane_timer_set_flag })
        names[lane] = "flag " + flag_field(lane);
    for (unsigned plane = 1; plane <= last_osd_plane; ++plane)
        names[lane_of_plane(plane)] = (plane < first_osd_plane ? "video plane " : "OSD plane ") + std::to_string(plane);
    return names;
}

std::string_view kind_of_lane(int lane)
{
    if (lane == lane_graphics)
        return "graphics";
    if (lane == lane_timer)
        return "timer";
    if (lane >= lane_format_change_flag && lane <= lane_timer_set_flag)
        return "flag";
    if (lane == lane_enable || lane == lane_mute || (lane >= lane_plane_1 && lane <= lane_plane_8))
        return "plane";
    return "output";
}

std::shared_ptr<const States> states_now()
{
    // A run goes to and fro between few of them.
    constexpr std::size_t most_known = 256;
    static std::map<Seen, std::shared_ptr<const States>> known;
    const Seen seen = seen_now();
    if (const auto before = known.find(seen); before != known.end())
        return before->second;
    if (known.size() == most_known)
        known.clear();
    return known[seen] = std::make_shared<const States>(states_by_name());
}

std::map<int, std::uint32_t> modes_now()
{
    std::map<int, std::uint32_t> modes;
    if (const auto mode = board::mixer::shown().mode)
        modes[lane_mixer_mode] = *mode;
    const board::hdmi_av::Shown told = board::hdmi_av::shown();
    int lane = lane_digital;
    for (const auto& output : { told.digital, told.hdmi })
    {
        if (output && output->enabled)
            modes[lane] = static_cast<std::uint32_t>(output->mode);
        ++lane;
    }
    for (const board::tv_encoder::Shown& encoder : board::tv_encoder::shown())
    {
        if (encoder.has_format && encoder.enabled)
            modes[lane] = encoder.target;
        ++lane;
    }
    return modes;
}

} // namespace pmxboard
