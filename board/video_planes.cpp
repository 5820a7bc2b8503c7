// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The video plane driver: what the mixer told it, and what it answers.
#include "board/video_planes.h"

#include <array>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/trace.h"
#include "drv_pmx.h"

namespace
{

using board::Value;
using board::names::Family;

struct Colour
{
    UCHAR y;
    UCHAR u;
    UCHAR v;
};

struct Plane
{
    VDP_ENABLE_T hw_enable = VDP_DISABLED;
    std::vector<UINT32> commands;
    std::optional<Colour> clear_video;
};

struct TvFormat
{
    UCHAR mode;
    bool changed;
};

struct VideoPlanes
{
    std::array<Plane, 3> planes{ Plane{ VDP_ENABLED, {}, {} }, Plane{}, Plane{} };
    std::optional<TvFormat> tv_format;
    unsigned output_changes = 0;
    bool closed_caption = false;
    bool waiting_for_sync = false;
};

VideoPlanes video_planes_state;

Plane* plane_at(UINT32 number)
{
    return number < video_planes_state.planes.size() ? &video_planes_state.planes[number] : nullptr;
}

Value reported(const std::optional<Colour>& colour)
{
    if (!colour)
        return Value::null();
    return Value::record(
        { { "y", Value::number(colour->y) }, { "u", Value::number(colour->u) }, { "v", Value::number(colour->v) } });
}

Value reported(const std::optional<TvFormat>& format)
{
    if (!format)
        return Value::null();
    return Value::record({ { "mode", board::named(Family::ResolutionMode, format->mode) },
                           { "changed", board::flag(format->changed) } });
}

Value reported(const Plane& plane)
{
    return Value::record({ { "hw_enable", board::named(Family::VdpEnable, plane.hw_enable) },
                           { "commands", board::numbers(plane.commands) },
                           { "clear_video", reported(plane.clear_video) } });
}

} // namespace

namespace board::video_planes
{

void power_on(const Description& description)
{
    video_planes_state = {};
    video_planes_state.waiting_for_sync = description.waiting_for_sync;
}

Value state()
{
    std::vector<Value> planes;
    for (const Plane& plane : video_planes_state.planes)
        planes.push_back(reported(plane));
    return Value::record({ { "tv_format", reported(video_planes_state.tv_format) },
                           { "output_changes", Value::number(video_planes_state.output_changes) },
                           { "planes", Value::list(std::move(planes)) },
                           { "closed_caption", flag(video_planes_state.closed_caption) },
                           { "waiting_for_sync", flag(video_planes_state.waiting_for_sync) } });
}

void set_hw_enable(unsigned plane, VDP_ENABLE_T enable)
{
    Plane* target = plane_at(plane);
    if (target == nullptr)
        throw std::invalid_argument("there is no video plane " + std::to_string(plane));
    target->hw_enable = enable;
}

void set_waiting_for_sync(bool waiting)
{
    video_planes_state.waiting_for_sync = waiting;
}

void release_graphics()
{
    const trace::Operation scope("PMX_SetOsdEnable");
    trace::notice("video_plane", "has its sync control");
    video_planes_state.waiting_for_sync = false;
    PMX_SetOsdEnable();
}

} // namespace board::video_planes

void VDP_SetTvFormat(UCHAR ucMode, BOOL fgChanged)
try
{
    BOARD_CALL(VDP_SetTvFormat, ucMode, fgChanged);
    video_planes_state.tv_format = TvFormat{ ucMode, fgChanged != 0 };
}
BOARD_CALL_END(VDP_SetTvFormat)

void VDP_GlobalOutputChange(void)
try
{
    BOARD_CALL(VDP_GlobalOutputChange);
    ++video_planes_state.output_changes;
}
BOARD_CALL_END(VDP_GlobalOutputChange)

void VDP_VsyncSendCmd(UINT32 u4VdpIdx, UINT32 u4Cmd)
try
{
    BOARD_CALL(VDP_VsyncSendCmd, u4VdpIdx, u4Cmd);
    if (Plane* target = plane_at(u4VdpIdx))
        target->commands.push_back(u4Cmd);
}
BOARD_CALL_END(VDP_VsyncSendCmd)

void VDP_SetClearVideo(UCHAR ucVdpId, UCHAR ucY, UCHAR ucU, UCHAR ucV)
try
{
    BOARD_CALL(VDP_SetClearVideo, ucVdpId, ucY, ucU, ucV);
    if (Plane* target = plane_at(ucVdpId))
        target->clear_video = Colour{ ucY, ucU, ucV };
}
BOARD_CALL_END(VDP_SetClearVideo)

VDP_ENABLE_T VDP_GetHwEnable(UCHAR ucVdpId)
try
{
    BOARD_CALL_R(VDP_GetHwEnable, ucVdpId);
    const Plane* target = plane_at(ucVdpId);
    return boardCall.answer(target != nullptr ? target->hw_enable : VDP_DISABLED);
}
BOARD_CALL_END(VDP_GetHwEnable)

void VDP_EnableCC(BOOL fgEnable)
try
{
    BOARD_CALL(VDP_EnableCC, fgEnable);
    video_planes_state.closed_caption = fgEnable != 0;
}
BOARD_CALL_END(VDP_EnableCC)

BOOL fgVdpIsWaitforSyncCtrl(void)
try
{
    BOARD_CALL_R(fgVdpIsWaitforSyncCtrl);
    return boardCall.answer(video_planes_state.waiting_for_sync ? TRUE : FALSE);
}
BOARD_CALL_END(fgVdpIsWaitforSyncCtrl)
