// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The two kinds of files that pictures are read from: see image.h, which tells them apart. */
#pragma once

#include <string_view>

#include "board/picture/image.h"

namespace board::picture
{

bool is_png(std::string_view bytes);
Image read_png(std::string_view bytes);

bool is_y4m(std::string_view bytes);
Image read_y4m(std::string_view bytes);

} // namespace board::picture
