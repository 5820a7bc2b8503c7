// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Display control: the delays of the two video planes.
#include <array>
#include <optional>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/trace.h"
#include "drv_osd.h"

namespace
{

struct DisplayControl
{
    std::optional<std::array<INT32, 2>> video_plane_delay;
};

DisplayControl display_control_state;

} // namespace

namespace board::display_control
{

void power_on(const Description&)
{
    display_control_state = {};
}

Value state()
{
    return Value::record({ { "video_plane_delay", numbers(display_control_state.video_plane_delay) } });
}

} // namespace board::display_control

void DCM_SetVideoPlaneDelay(INT32 i4Delay1, INT32 i4Delay2)
try
{
    BOARD_CALL(DCM_SetVideoPlaneDelay, i4Delay1, i4Delay2);
    display_control_state.video_plane_delay = { i4Delay1, i4Delay2 };
}
BOARD_CALL_END(DCM_SetVideoPlaneDelay)
