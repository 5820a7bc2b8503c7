// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/board.h"

#include "board/devices.h"
#include "board/layer_state.h"
#include "board/replaced.h"
#include "board/threads.h"

namespace board
{
namespace
{

struct Device
{
    std::string_view name;
    void (*power_on)(const Description&);
    Value (*state)();
};

constexpr Device devices[] = {
    { "os", os::power_on, os::state },
    { "console", console::power_on, console::state },
    { "flash", flash::power_on, flash::state },
    { "registers", registers::power_on, registers::state },
    { "interface_manager", interface_manager::power_on, interface_manager::state },
    { "power", power::power_on, power::state },
    { "mixer", mixer::power_on, mixer::state },
    { "tv_encoder", tv_encoder::power_on, tv_encoder::state },
    { "video_planes", video_planes::power_on, video_planes::state },
    { "osd_planes", osd_planes::power_on, osd_planes::state },
    { "sources", sources::power_on, sources::state },
    { "hdmi_av", hdmi_av::power_on, hdmi_av::state },
    { "display_part", display_part::power_on, display_part::state },
    { "display_control", display_control::power_on, display_control::state },
    { "faults", faults::power_on, faults::state }, // behind the clock, which they may last by
};

struct Board
{
    Description description;
    unsigned misuses = 0;
};

Board board_state;

} // namespace

void power_on(const Description& wanted)
{
    const Description given = wanted; // it may be the one in force
    for (const mixer::Arrangement& arrangement : given.arrangements)
        mixer::check_order(arrangement.order);
    threads::end_all();
    meanwhiles::forget_all();
    faults::check_all(given.faults);
    layer_state::restore();
    board_state = { given, 0 };
    for (const Device& device : devices)
        device.power_on(given);
    trace::power_on();
}

const Description& description()
{
    return board_state.description;
}

Value state()
{
    Value value;
    for (const Device& device : devices)
        value.add(std::string(device.name), device.state());
    std::vector<Value> replaced;
    for (std::string& function : replaced_functions())
        replaced.push_back(Value::symbol(std::move(function)));
    if (!replaced.empty())
        value.add("replaced", Value::list(std::move(replaced)));
    return value;
}

std::vector<std::string> replaced_functions()
{
    std::vector<std::string> replaced;
    for (const replaced::Function& function : replaced::functions())
    {
        if (function.linked != function.own)
            replaced.emplace_back(function.name);
    }
    return replaced;
}

unsigned misuses()
{
    return board_state.misuses;
}

void report_misuse(std::string text)
{
    ++board_state.misuses;
    console::print("BOARD misuse: " + text + "\n");
    trace::notice("misuse", std::move(text));
}

} // namespace board
