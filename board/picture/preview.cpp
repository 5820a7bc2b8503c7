// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/preview.h"

#include <algorithm>
#include <array>
#include <string_view>

#include "board/picture/pixels.h"

namespace board::picture
{
namespace
{

constexpr std::array<std::string_view, 5> SHADES = { " ", "░", "▒", "▓", "█" };

std::string colour_code(const char* kind, Pixel pixel)
{
    return std::string("\x1b[") + kind + ";2;" + std::to_string(code(pixel, 0)) + ";" + std::to_string(code(pixel, 1)) +
           ";" + std::to_string(code(pixel, 2)) + "m";
}

/** The shade of two pixels one above the other. */
std::string_view shade_of(Pixel upper, Pixel lower)
{
    unsigned sum = 0;
    for (const Pixel pixel : { upper, lower })
        sum += 2 * code(pixel, 0) + 7 * code(pixel, 1) + code(pixel, 2);
    return SHADES[sum * SHADES.size() / (2UL * 10 * 256)];
}

} // namespace

std::string preview(const Image& image, int columns, bool colour)
{
    const int lines = std::max(1, columns * image.height() / image.width() / 2);
    const Image small = scaled(converted(image, full_rgb), columns, 2 * lines);
    std::string text;
    for (int line = 0; line < lines; ++line)
    {
        for (int x = 0; x < columns; ++x)
        {
            const Pixel upper = small.at(x, 2 * line);
            const Pixel lower = small.at(x, 2 * line + 1);
            if (colour)
                text += colour_code("38", upper) + colour_code("48", lower) + "▀";
            else
                text += shade_of(upper, lower);
        }
        text += colour ? "\x1b[0m\n" : "\n";
    }
    return text;
}

} // namespace board::picture
