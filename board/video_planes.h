// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What tools and tests may do to the board's video planes. Planes 0 and 1 show video, plane 2 the background
 *  picture. */
#pragma once

#include "drv_vdp.h"

namespace board::video_planes
{

/** Set what a plane reports as its hardware enable state. At power-on plane 0 is enabled, the others are not.
 *  Throws std::invalid_argument for a plane that the board does not have. */
void set_hw_enable(unsigned plane, VDP_ENABLE_T enable);

/** Let the driver wait for its sync control, or have it. While it waits it has not released graphics; whoever ends the
 *  wait so owes the mixer a PMX_SetOsdEnable. */
void set_waiting_for_sync(bool waiting);

/** The driver has its sync control: it waits no more and releases graphics by PMX_SetOsdEnable, also when it did not
 *  wait. */
void release_graphics();

} // namespace board::video_planes
