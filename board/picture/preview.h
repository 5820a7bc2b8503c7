// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A picture as far as characters can show one. */
#pragma once

#include <string>

#include "board/picture/image.h"

namespace board::picture
{

/** As many as fit any terminal. */
inline constexpr int preview_columns = 64;

/** Lines of so many columns, each ending with a line feed: in colour, two pixels one above the other in each character
 *  of a terminal; without it, how light the picture is there. */
std::string preview(const Image& image, int columns, bool colour);

} // namespace board::picture
