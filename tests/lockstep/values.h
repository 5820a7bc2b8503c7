// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What a name says of the values that are drawn for it. Names are asked once: millions of values are drawn. */
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "tests/lockstep/random.h"

namespace lockstep
{

/** Draws a value for something of so many bytes; the value may have more. */
using Draw = std::uint64_t (*)(Random& random, std::size_t size);

/** For a field of the state or of a caller's array. */
Draw draw_for_field(std::string_view name);

/** For an argument of an operation. */
Draw draw_for_argument(std::string_view name);

} // namespace lockstep
