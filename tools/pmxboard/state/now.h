// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The state of the running board. */
#pragma once

#include <string>

#include "board/value.h"

namespace pmxboard
{

/** What the board and the layer hold, all of it. */
board::Value whole_state();
/** A part of it. Throws LineError with the nearest paths. */
board::Value state_at(const std::string& path);

} // namespace pmxboard
