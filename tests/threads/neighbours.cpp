// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The neighbouring drivers: the interface manager with four video planes, and the hardware's mixing and swapping. */
#include "stand_ins.h"

#include "drv_av_d.h"
#include "drv_if.h"
#include "drv_if_vdp.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "pmx_hal.h"

#include <atomic>

namespace stand_ins
{
namespace
{

constexpr UINT16 VIDEO_PLANES = 4;
constexpr INT32 NO_INTERFACE = -1;

char tags[VIDEO_PLANES]; // a plane's tag is the address of its element
std::atomic<unsigned> mode_calls;
std::atomic<int> held;
std::atomic<UINT32> mixed_planes{ 0xFF };
std::atomic<bool> planes_swapped;

UINT32 set_colour_mode(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace)
{
    if (!holds_mutex())
        breach("pu4SetColorMode called without the mutex");
    if (eColorSpace != DRV_PMX_CS_YCBCR_601 && eColorSpace != DRV_PMX_CS_YCBCR_709)
        breach("pu4SetColorMode with a colour space that no source has");
    mode_calls.fetch_add(1, std::memory_order_relaxed);
    if (faults().connect_inside)
        i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, static_cast<UINT16>(static_cast<char*>(pvTag) - tags));
    return 0;
}

UINT32 not_for_the_mixer(void*)
{
    breach("a member of IVdp called that is not the mixer's");
    return 0;
}

constexpr IVdp video_plane = {
    .pu4SetPlaybackMode = not_for_the_mixer,
    .pu4AssignSyncCtrl = not_for_the_mixer,
    .pu4StcIsValid = not_for_the_mixer,
    .pu4SetFrameAccurateStartPts = not_for_the_mixer,
    .pu4SetFrameAccurateEndPts = not_for_the_mixer,
    .pu4Flush = not_for_the_mixer,
    .pu4AssignVdecCallback = not_for_the_mixer,
    .pu4DesiredResolution = not_for_the_mixer,
    .pu4SetColorMode = set_colour_mode,
    .pu4GetCurrPictureInfo = not_for_the_mixer,
    .pu4PictureSent = not_for_the_mixer,
};

bool is_video_plane(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId)
{
    return u2CompType == PMX_COMP_TYPE_VDP && u2CompId < VIDEO_PLANES && u4IfId == IID_IVdp;
}

} // namespace

unsigned colour_modes_set()
{
    return mode_calls.load(std::memory_order_relaxed);
}

int interfaces_held()
{
    return held.load(std::memory_order_relaxed);
}

} // namespace stand_ins

using namespace stand_ins;

/* A port whose type and id were read while another thread changed them names no video plane here: the mixer reports the
 * failed query by Assert, which is a breach. */
INT32 i4ImQueryInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void** ppvIf, void** ppvTag)
{
    if (!holds_mutex())
        breach("i4ImQueryInterface called without the mutex");
    if (!is_video_plane(u2CompType, u2CompId, u4IfId))
        return NO_INTERFACE;
    *ppvIf = const_cast<IVdp*>(&video_plane);
    *ppvTag = &tags[u2CompId];
    held.fetch_add(1, std::memory_order_relaxed);
    return 0;
}

INT32 i4ImReleaseInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void* pvTag)
{
    if (!holds_mutex())
        breach("i4ImReleaseInterface called without the mutex");
    if (!is_video_plane(u2CompType, u2CompId, u4IfId) || pvTag != &tags[u2CompId])
        breach("i4ImReleaseInterface of an interface that was not fetched");
    held.fetch_sub(1, std::memory_order_relaxed);
    return 0;
}

void vPmxMixPlane(UCHAR, UCHAR ucPlane)
{
    mixed_planes.fetch_or(1u << ucPlane, std::memory_order_relaxed);
}

void vPmxNotMixPlane(UCHAR, UCHAR ucPlane)
{
    mixed_planes.fetch_and(~(1u << ucPlane), std::memory_order_relaxed);
}

BOOL fgPmxHalMixPlane(UCHAR, UCHAR ucPlane)
{
    return (mixed_planes.load(std::memory_order_relaxed) >> ucPlane) & 1;
}

void PMX_HalSwapPlane1_2(UCHAR, UINT32 u4Swap)
{
    planes_swapped.store(u4Swap != 0, std::memory_order_relaxed);
}

BOOL fgPmxHalSwapPlane1_2(UCHAR)
{
    return planes_swapped.load(std::memory_order_relaxed);
}

BOOL fgPmxDrvSetAvd(UINT32, void*, UINT32)
{
    return TRUE;
}

INT32 i4GetHotPlugStatus(void)
{
    return 1; // a sink is there, so that mode changes wait for the display part
}

UINT32 TVE_SetFmtEx(UINT32, UCHAR, UCHAR, UCHAR, BOOL, BOOL, UINT8)
{
    return TVE_SET_OK;
}
