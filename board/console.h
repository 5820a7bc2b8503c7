// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the serial console has printed, for those who look at it piece by piece. board.h has the rest. */
#pragma once

#include <cstddef>
#include <string>

namespace board::console
{

/** How much it has printed since power-on or since it was forgotten. */
std::size_t printed();
/** A part of that. */
std::string printed(std::size_t begin, std::size_t end);
/** Forget it, so that a long run needs no more memory than a short one. */
void forget();

} // namespace board::console
