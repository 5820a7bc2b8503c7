// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A short life of the mixer, without the language around it, which costs far more. */
#pragma once

#include "board/board.h"

namespace fuzz
{

/** Start the layer on this board, set a mode, let time pass until the display part is given up, suspend and resume,
 *  reset, and end. */
void run_layer(const board::Description& description);

} // namespace fuzz
