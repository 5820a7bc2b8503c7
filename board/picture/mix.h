// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the mixer makes of its planes. */
#pragma once

#include <vector>

#include "board/picture/hardware.h"
#include "board/picture/pixels.h"

namespace board::picture
{

/** The planes that are mixed, by their indices, the lowest first. */
std::vector<unsigned> planes_from_below(const MixerState& mixer);
/** The input that feeds a plane, by selectors and swaps; plane_count and more: none. */
unsigned input_of(const MixerState& mixer, unsigned plane);

/** A picture that is laid over others: where, and by which conversions on the way. */
struct Layer
{
    std::shared_ptr<const Image> image; ///< of the size of its place
    Box place;
    std::vector<Conversion> steps;
    unsigned luma_key = 0; ///< what is darker is transparent
    bool opaque = false;
};
/** An OSD plane that fills a picture of this size, in a space; nothing where it delivers none. */
std::optional<Layer> graphics_layer(const SourceState& source, int width, int height, const Space& into,
                                    unsigned threads);
/** Lay it over a picture of any size. */
void lay_over(Image& image, const Layer& layer);

/** The mixer's picture, in the codes of whatever its planes convert into; the size is that of its mode.
 *  @param only_main_video  what the digital port shows that is fed in front of the mixer: on black, and untouched */
Image mixed_picture(const Hardware& hardware, const Raster& raster, unsigned threads, bool only_main_video = false);

} // namespace board::picture
