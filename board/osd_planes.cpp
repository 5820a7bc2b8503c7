// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The OSD driver: display mode, colour space, full-range conversion, plane positions, routing of the fifth plane.
#include <algorithm>
#include <array>
#include <optional>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/trace.h"
#include "drv_osd.h"

namespace
{

using board::Value;
using board::names::Family;
using board::osd_planes::PLANES_WITH_OFFSET;

constexpr INT32 DONE = 0;
constexpr INT32 OSD_REFUSED = -1;

struct Osd5Route
{
    bool on;
    UCHAR composite_mode;
    bool composite_only;
};

struct OsdPlanes
{
    std::optional<UCHAR> display_mode;
    unsigned resolution_changes_done = 0;
    std::optional<UCHAR> colour_space;
    bool full_range_conversion = false;
    std::optional<std::array<INT32, PLANES_WITH_OFFSET>> position_offsets;
    std::optional<Osd5Route> osd5;
};

OsdPlanes osd_planes_state;

Value reported(const std::optional<Osd5Route>& route)
{
    if (!route)
        return Value::null();
    return Value::record({ { "on", board::flag(route->on) },
                           { "composite_mode", board::named(Family::ResolutionMode, route->composite_mode) },
                           { "composite_only", board::flag(route->composite_only) } });
}

} // namespace

namespace board::osd_planes
{

void power_on(const Description&)
{
    osd_planes_state = {};
}

Value state()
{
    const OsdPlanes& osd = osd_planes_state;
    return Value::record({ { "display_mode", setting(osd.display_mode, Family::ResolutionMode) },
                           { "resolution_changes_done", Value::number(osd.resolution_changes_done) },
                           { "colour_space", setting(osd.colour_space, Family::ColorSpace) },
                           { "full_range_conversion", flag(osd.full_range_conversion) },
                           { "position_offsets", numbers(osd.position_offsets) },
                           { "osd5", reported(osd.osd5) } });
}

} // namespace board::osd_planes

void OSD_BASE_SetDisplayMode(UCHAR ucMode)
try
{
    BOARD_CALL(OSD_BASE_SetDisplayMode, ucMode);
    osd_planes_state.display_mode = ucMode;
}
BOARD_CALL_END(OSD_BASE_SetDisplayMode)

void OSD_BASE_SetFlag_PMXChangeResDone(void)
try
{
    BOARD_CALL(OSD_BASE_SetFlag_PMXChangeResDone);
    ++osd_planes_state.resolution_changes_done;
}
BOARD_CALL_END(OSD_BASE_SetFlag_PMXChangeResDone)

void OSDSetColorSpace(UCHAR ucColorSpace)
try
{
    BOARD_CALL(OSDSetColorSpace, ucColorSpace);
    osd_planes_state.colour_space = ucColorSpace;
}
BOARD_CALL_END(OSDSetColorSpace)

void OSD_RNG_Set_Xvycc_En(BOOL fgEnable)
try
{
    BOARD_CALL(OSD_RNG_Set_Xvycc_En, fgEnable);
    osd_planes_state.full_range_conversion = fgEnable != 0;
}
BOARD_CALL_END(OSD_RNG_Set_Xvycc_En)

INT32 _i4OSD_SetPosOffset(INT32* pi4Offset)
try
{
    BOARD_CALL_R(_i4OSD_SetPosOffset, input(pi4Offset, PLANES_WITH_OFFSET));
    if (pi4Offset == nullptr)
        return boardCall.answer(OSD_REFUSED);
    std::copy_n(pi4Offset, PLANES_WITH_OFFSET, osd_planes_state.position_offsets.emplace().begin());
    return boardCall.answer(DONE);
}
BOARD_CALL_END(_i4OSD_SetPosOffset)

INT32 _i4Osd5Out(BOOL fgOn, UCHAR ucCvbsMode)
try
{
    BOARD_CALL_R(_i4Osd5Out, fgOn, ucCvbsMode);
    osd_planes_state.osd5 = Osd5Route{ fgOn != 0, ucCvbsMode, false };
    return boardCall.answer(DONE);
}
BOARD_CALL_END(_i4Osd5Out)

INT32 _i4Osd5Out_CVBSOnly(BOOL fgOn, UCHAR ucCvbsMode)
try
{
    BOARD_CALL_R(_i4Osd5Out_CVBSOnly, fgOn, ucCvbsMode);
    osd_planes_state.osd5 = Osd5Route{ fgOn != 0, ucCvbsMode, true };
    return boardCall.answer(DONE);
}
BOARD_CALL_END(_i4Osd5Out_CVBSOnly)
