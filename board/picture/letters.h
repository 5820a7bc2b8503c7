// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Letters of five by seven dots, for cards that tell their names. */
#pragma once

#include <string_view>

#include "board/picture/image.h"

namespace board::picture
{

/** What a line takes in dots, the gap behind its last letter left out. */
constexpr int letter_height = 7;
constexpr int letter_pitch = 6;
constexpr int width_of(std::string_view line)
{
    return line.empty() ? 0 : letter_pitch * static_cast<int>(line.size()) - 1;
}

/** Draw a line with its upper left corner there, each dot so many pixels wide and tall. What lies outside of the
 *  picture is left out; a character without a letter is a box. */
void draw_letters(Image& image, int x, int y, int dot, Pixel colour, std::string_view line);

} // namespace board::picture
