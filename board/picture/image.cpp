// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/image.h"

namespace board::picture
{
namespace
{

std::size_t checked_count(int width, int height)
{
    if (!is_picture_size(width, height))
        throw PictureError("no picture is " + std::to_string(width) + "x" + std::to_string(height) +
                           ": sides are 1 to 8192 pixels, and there are at most 2^24 of them");
    return static_cast<std::size_t>(width) * static_cast<std::size_t>(height);
}

} // namespace

bool is_picture_size(int width, int height)
{
    return width >= 1 && height >= 1 && width <= longest_side && height <= longest_side &&
           static_cast<std::size_t>(width) * static_cast<std::size_t>(height) <= most_pixels;
}

Image::Image(int width, int height, Space space, Pixel filled)
    : m_width(width), m_height(height), m_space(space), m_opaque(opacity(filled) == 255),
      m_pixels(checked_count(width, height), filled)
{
}

Image converted(const Image& image, const Space& to)
{
    Image result = image;
    result.set_space(to);
    if (!(image.space() == to))
        convert(image.pixels(), result.pixels(), conversion(image.space(), to));
    return result;
}

} // namespace board::picture
