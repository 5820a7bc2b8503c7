// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What tools and tests may do to the board's HDMI side. Scripted refusals are faults of fgPmxDrvSetAvd and
 *  fgPmxDrvGetAvdInfo. */
#pragma once

#include <optional>

#include "x_typedef.h"

namespace board::hdmi_av
{

/** Plug a sink in or pull it out. */
void plug(bool plugged);

/** Let a hot-plug event want the HDMI resolution sent again, or not any more. It stays so until it is said
 *  otherwise. */
void request_resolution(bool wanted);

/** A resolution mode and its vertical frequency in Hz. */
struct Resolution
{
    UINT32 mode;
    UINT16 frequency;
};

/** What the driver would choose whatever resolution it is asked about; nothing: the one it is asked about. */
void choose_resolution(std::optional<Resolution> resolution);

} // namespace board::hdmi_av
