// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Pictures that a source shows whose user has none of his own. */
#pragma once

#include <array>
#include <string>
#include <string_view>
#include <vector>

#include "board/picture/image.h"

namespace board::picture
{

/** R', G', B' signals, 0 to 1. */
using Signals = std::array<double, 3>;

/** The codes of a colour, each rounded to the nearest. */
Pixel pixel_of(const Signals& colour, const Space& space);
/** The signals of codes of full range. */
Signals signals_of(unsigned red, unsigned green, unsigned blue);

/** Colour bars: white, yellow, cyan, green, magenta, red, blue of 75 in 100 of the height, and black. */
Image bars(int width, int height, const Space& space);
/** The same, as wide as asked for; they begin anew at the left as often as they fit. */
Image bars(int width, int height, const Space& space, double bar_width);
/** From black on the left to the whole height on the right: grey, red, green, blue, one below the other. */
Image ramp(int width, int height, const Space& space);
Image solid(int width, int height, const Space& space, const Signals& colour);
/** Black and white squares, one of them in the upper left corner black; 16 pixels a side. */
Image checker(int width, int height, const Space& space);

/** Which part of a picture a card covers, in parts of its sides. */
struct Place
{
    double left = 0;
    double top = 0;
    double right = 1;
    double bottom = 1;
};
/** A field's colour, how opaque it is, and where it is in its picture, which is transparent around it. */
struct CardStyle
{
    Signals colour;
    double how_opaque = 1;
    Place place{};
    int lines_in_picture = 10; ///< its letters are no larger than so many of them would be
};
/** A framed field that tells something. */
Image card(int width, int height, const Space& space, const CardStyle& style, const std::vector<std::string>& lines);

} // namespace board::picture
