// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What is done to pictures as a whole: laying one over another, and scaling. pixman does both: codes of Y'C'BC'R are
 *  mixed as those of R'G'B' are. */
#pragma once

#include <functional>

#include "board/picture/image.h"

namespace board::picture
{

/** A rectangle of whole pixels. */
struct Box
{
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;

    bool operator==(const Box&) const = default;
};

/** Part of a picture, scaled in so many threads as in_bands(). Throws PictureError for a size that no picture has. */
Image scaled(const Image& image, const Box& part, int width, int height, unsigned threads = 0);
Image scaled(const Image& image, int width, int height, unsigned threads = 0);

/** Lay rows of pixels, so many in a row, over others. Opaque pixels simply take their place. */
void lay_over(const Pixel* above, int above_pitch, Pixel* below, int below_pitch, int width, int height);

/** So many rows at a time fit into a processor's cache, with what is made of them. */
inline constexpr int rows_in_band = 16;
/** Do something to all rows, a band at a time, in so many threads; 0: as many as the machine runs at once. Bands come
 *  in any order. What the work throws is thrown. */
void in_bands(int height, unsigned threads, const std::function<void(int from, int to)>& work);

} // namespace board::picture
