// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The mixer's operations written a second time, as literally as can be: one step, one line or two, in the order in
 *  which a neighbour would see them. What a step takes from the record, from another object or from a driver is taken
 *  there; what it stores is stored there. Nothing is shared between operations that they do not call each other for,
 *  nothing is computed ahead, and no fact comes from the layer: of its private header the types alone are used. */
#pragma once

#include <cstdint>
#include <cstring>

#include "drv_av_d.h"
#include "drv_if.h"
#include "drv_if_pmx.h"
#include "drv_if_vdp.h"
#include "drv_osd.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "src/driver/pmx/pmx_if.h"
#include "tests/layer/mode_facts.h"
#include "u_os.h"
#include "x_avd.h"
#include "x_plane_mxr.h"
#include "x_vid_dec.h"

/* The one record, which every mixer id names, and the handshake's status. */
static constexpr PMX_CONF_T& conf = _arPmxConf[0];
static constexpr PMX_DISPLAY_PART_STATUS_T& status = _arPmxDispPartStatus;

/* The mixer id that a tag carries. */
static inline UCHAR id_of(void* pvTag)
{
    return static_cast<UCHAR>(reinterpret_cast<std::uintptr_t>(pvTag) & 0xFF);
}

/* How the console names a mode; a number without a name is a null text, which the console may get and the compiler need
 * not see. */
[[gnu::noinline]] static inline const CHAR* name_of(UINT32 mode)
{
    return mode_facts::printable(mode);
}
