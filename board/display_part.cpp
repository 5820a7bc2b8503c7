// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The display part, which switches the sink: raises and lowers the mixer's format-change flag, after a set time or
// never.
#include "board/display_part.h"

#include <stdexcept>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/duration.h"
#include "board/trace.h"
#include "drv_pmx.h"

namespace
{

using board::display_part::Behaviour;
using std::chrono::microseconds;

struct DisplayPart
{
    Behaviour behaviour;
    bool switching = false;            ///< as it told the mixer last
    std::optional<microseconds> due{}; ///< when it answers
    unsigned changes = 0;              ///< resolution changes that it was given, whether it took notice or not
};

DisplayPart display_part_state;

void tell(bool is_switching, const char* what)
{
    const board::trace::Operation scope("PMX_SetFormatChangeFlag");
    board::trace::notice("display_part", what);
    display_part_state.switching = is_switching;
    PMX_SetFormatChangeFlag(is_switching ? TRUE : FALSE);
}

void cancel()
{
    display_part_state.due = {};
    board::timers::clear_alarm();
}

void answer()
{
    display_part_state.due = {};
    tell(false, "has switched");
}

} // namespace

namespace board::display_part
{

void power_on(const Description& description)
{
    display_part_state = {};
    display_part_state.behaviour = description.display_part;
}

Value state()
{
    const DisplayPart& part = display_part_state;
    return Value::record({ { "answer", Value::text(to_text(part.behaviour)) },
                           { "resolution_changes", Value::number(part.changes) },
                           { "switching", flag(part.switching) },
                           { "answer_due_us", part.due ? Value::number(part.due->count()) : Value::null() } });
}

Behaviour read_behaviour(std::string_view written)
{
    if (written == "off")
        return {};
    if (written == "never")
        return { true, {} };
    if (const auto time = read_duration(written))
        return { true, time };
    throw std::invalid_argument("the display part's answer is off, never, or the time it takes: 3s, 500ms or 2us");
}

std::string to_text(const Behaviour& behaviour)
{
    if (!behaviour.raises)
        return "off";
    if (!behaviour.answer)
        return "never";
    const auto count = behaviour.answer->count();
    if (count % 1000000 == 0)
        return std::to_string(count / 1000000) + "s";
    if (count % 1000 == 0)
        return std::to_string(count / 1000) + "ms";
    return std::to_string(count) + "us";
}

void behave(const Behaviour& behaviour)
{
    display_part_state.behaviour = behaviour;
    if (!behaviour.raises)
        cancel();
}

void raise()
{
    tell(true, "begins to switch");
}

void lower()
{
    cancel();
    tell(false, "has switched");
}

void resolution_change()
{
    ++display_part_state.changes;
    const Behaviour& behaviour = display_part_state.behaviour;
    if (!behaviour.raises)
        return;
    cancel();
    tell(true, "begins to switch");
    if (!behaviour.answer)
        return;
    display_part_state.due = now() + *behaviour.answer;
    timers::set_alarm(*display_part_state.due, answer);
}

} // namespace board::display_part
