// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What a source delivers: its picture in its own colour space. */
#pragma once

#include <memory>
#include <string_view>

#include "board/picture/hardware.h"

namespace board::picture
{

/** Whether the second of the video ports shows it in a window. */
bool is_second_video(const SourceState& source);

/** The colour space in which a source lives that delivers something: video BT.601 or BT.709 by its size, photographs
 *  full BT.601 at any size, graphics R'G'B' or Y'C'BC'R by their size. */
Space own_space(const SourceState& source);

/** Its picture, in that space or in R'G'B', and of any size; a null pointer where it delivers nothing, or pictures of a
 *  size that no picture has. */
std::shared_ptr<const Image> content_of(const SourceState& source);

/** The name of a picture of one colour. */
std::string solid_name(unsigned red, unsigned green, unsigned blue);

} // namespace board::picture
