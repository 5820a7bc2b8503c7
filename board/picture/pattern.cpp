// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/pattern.h"

#include <algorithm>
#include <cmath>

#include "board/picture/letters.h"

namespace board::picture
{
namespace
{

constexpr Signals WHITE = { 1, 1, 1 };
constexpr Signals BLACK = { 0, 0, 0 };
constexpr double BAR_HEIGHT = 0.75;
constexpr std::array<Signals, 8> BARS = {
    { { 1, 1, 1 }, { 1, 1, 0 }, { 0, 1, 1 }, { 0, 1, 0 }, { 1, 0, 1 }, { 1, 0, 0 }, { 0, 0, 1 }, { 0, 0, 0 } }
};
constexpr std::array<Signals, 4> RAMPS = { { { 1, 1, 1 }, { 1, 0, 0 }, { 0, 1, 0 }, { 0, 0, 1 } } };
constexpr int SQUARE = 16;

Signals times(const Signals& colour, double height)
{
    return { colour[0] * height, colour[1] * height, colour[2] * height };
}

/** Rows that are all the same. */
void repeat_row(Image& image, int from, int to)
{
    for (int y = from + 1; y < to; ++y)
        std::copy(image.row(from).begin(), image.row(from).end(), image.row(y).begin());
}

/** Less opaque: each code counts as much less. */
Pixel faded(Pixel pixel, double how_opaque)
{
    Pixel result = 0;
    for (unsigned shift = 0; shift < 32; shift += 8)
        result |= static_cast<Pixel>(std::lround((pixel >> shift & 0xFF) * how_opaque)) << shift;
    return result;
}

/** A rectangle in pixels. */
struct Field
{
    int left;
    int top;
    int right;
    int bottom;
};

void fill(Image& image, const Field& field, Pixel colour)
{
    for (int y = std::max(field.top, 0); y < std::min(field.bottom, image.height()); ++y)
        std::fill(image.row(y).begin() + std::max(field.left, 0),
                  image.row(y).begin() + std::clamp(field.right, std::max(field.left, 0), image.width()), colour);
}

/** How many pixels a dot may have, so that the lines fit into the field, with a frame of a dot and some air. */
int dot_for(const Field& field, const std::vector<std::string>& lines, int largest)
{
    int longest = 1;
    for (const std::string& line : lines)
        longest = std::max(longest, width_of(line));
    const int tall = static_cast<int>(lines.size()) * (letter_height + 2);
    return std::max(
        1, std::min({ (field.right - field.left) / (longest + 6), (field.bottom - field.top) / (tall + 6), largest }));
}

} // namespace

Pixel pixel_of(const Signals& colour, const Space& space)
{
    const Transform transform = between(full_rgb, space);
    std::array<unsigned, 3> codes{};
    for (unsigned row = 0; row < 3; ++row)
    {
        double sum = transform.offset[row];
        for (unsigned column = 0; column < 3; ++column)
            sum += transform.factor[row][column] * 255 * colour[column];
        codes[row] = static_cast<unsigned>(std::clamp(std::floor(sum + 0.5), 0.0, 255.0));
    }
    return opaque(codes[0], codes[1], codes[2]);
}

Signals signals_of(unsigned red, unsigned green, unsigned blue)
{
    return { red / 255.0, green / 255.0, blue / 255.0 };
}

Image bars(int width, int height, const Space& space, double bar_width)
{
    Image image(width, height, space, opaque(0, 0, 0));
    for (int x = 0; x < width; ++x)
        image.at(x, 0) =
            pixel_of(times(BARS[static_cast<std::size_t>(x / bar_width) % BARS.size()], BAR_HEIGHT), space);
    repeat_row(image, 0, height);
    return image;
}

Image bars(int width, int height, const Space& space)
{
    Image image(width, height, space, opaque(0, 0, 0));
    for (int x = 0; x < width; ++x)
        image.at(x, 0) = pixel_of(
            times(BARS[static_cast<std::size_t>(x) * BARS.size() / static_cast<std::size_t>(width)], BAR_HEIGHT),
            space);
    repeat_row(image, 0, height);
    return image;
}

Image ramp(int width, int height, const Space& space)
{
    Image image(width, height, space, opaque(0, 0, 0));
    for (std::size_t i = 0; i < RAMPS.size(); ++i)
    {
        const int from = height * static_cast<int>(i) / static_cast<int>(RAMPS.size());
        const int to = height * static_cast<int>(i + 1) / static_cast<int>(RAMPS.size());
        for (int x = 0; x < width && from < to; ++x)
            image.at(x, from) = pixel_of(times(RAMPS[i], width == 1 ? 1 : static_cast<double>(x) / (width - 1)), space);
        repeat_row(image, from, to);
    }
    return image;
}

Image solid(int width, int height, const Space& space, const Signals& colour)
{
    return { width, height, space, pixel_of(colour, space) };
}

Image checker(int width, int height, const Space& space)
{
    Image image(width, height, space, opaque(0, 0, 0));
    const std::array<Pixel, 2> both = { pixel_of(BLACK, space), pixel_of(WHITE, space) };
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x)
            image.at(x, y) = both[static_cast<std::size_t>((x / SQUARE + y / SQUARE) % 2)];
    return image;
}

Image card(int width, int height, const Space& space, const CardStyle& style, const std::vector<std::string>& lines)
{
    Image image(width, height, space);
    const auto& [colour, how_opaque, place, lines_in_picture] = style;
    const Field field{ static_cast<int>(place.left * width), static_cast<int>(place.top * height),
                       static_cast<int>(place.right * width), static_cast<int>(place.bottom * height) };
    const int dot = dot_for(field, lines, height / (lines_in_picture * (letter_height + 2)));
    const bool is_light = 0.2126 * colour[0] + 0.7152 * colour[1] + 0.0722 * colour[2] > 0.4;
    const Pixel letters = pixel_of(is_light ? BLACK : WHITE, space);
    fill(image, field, letters);
    fill(image, { field.left + dot, field.top + dot, field.right - dot, field.bottom - dot },
         faded(pixel_of(colour, space), how_opaque));
    int y = (field.top + field.bottom - dot * (static_cast<int>(lines.size()) * (letter_height + 2) - 2)) / 2;
    for (const std::string& line : lines)
    {
        draw_letters(image, (field.left + field.right - dot * width_of(line)) / 2, y, dot, letters, line);
        y += dot * (letter_height + 2);
    }
    image.set_opaque(how_opaque == 1 && field.left <= 0 && field.top <= 0 && field.right >= width &&
                     field.bottom >= height);
    return image;
}

} // namespace board::picture
