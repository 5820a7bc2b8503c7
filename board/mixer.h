// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What tools and tests may do to the board's mixer hardware: the delays that it reports for its planes when their
 *  order is set. */
#pragma once

#include <array>
#include <cstdint>

namespace board::mixer
{

/** A delay for each mixer plane, plane 1 first, in the hardware's unit. */
using PlaneDelays = std::array<std::int32_t, 8>;

/** An arrangement of the planes that has delays of its own. */
struct Arrangement
{
    std::uint32_t order; ///< packed: bits 4k to 4k+3 hold the source of plane k+1, 0 to 7, each source once
    PlaneDelays delay;
};

/** Throws std::invalid_argument when an order does not put each source on one plane. */
void check_order(std::uint32_t order);

/** From the next order that is set: the delays of every arrangement that has none of its own. */
void set_plane_delay(const PlaneDelays& delay);
/** The delays of one arrangement, in place of those that it had. Throws std::invalid_argument as check_order does. */
void set_arrangement(const Arrangement& arrangement);

/** What stands in the selectors from now on, as another driver or a fault of the hardware would leave it: any byte. */
void set_selectors(const std::array<std::uint8_t, 8>& selectors);

} // namespace board::mixer
