// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Whether a picture is the one that was expected. */
#pragma once

#include <optional>
#include <string>

#include "board/picture/image.h"

namespace board::picture
{

/** Where two pictures of the same size differ by more than a tolerance in a code. */
struct Difference
{
    int x = 0; ///< where they differ most
    int y = 0;
    unsigned most = 0;
    std::size_t pixels = 0; ///< how many differ by more than the tolerance
    Image shown;            ///< what is the same dark, what differs the lighter the more
};

/** Nothing: they are the same. Both are of the same size. */
std::optional<Difference> difference(const Image& one, const Image& other, unsigned tolerance);

/** By how much two pixels differ in a code, at most. */
unsigned distance(Pixel one, Pixel other);

} // namespace board::picture
