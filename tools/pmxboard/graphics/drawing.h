// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How pictures are drawn in a terminal: as the pictures that they are, where it takes such, else in characters. */
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "tools/pmxboard/view/output.h"

namespace pmxboard
{

/** Takes the keys back that somebody typed while the terminal was asked: they are the next to be read. */
using GiveBack = std::function<void(const std::string& keys)>;

/** The words of --graphics and of PMXBOARD_GRAPHICS. */
const std::vector<std::string>& ways_to_draw();

/** What pictures are drawn with; empty: characters without colour. What cannot be drawn with throws StepFailed at each
 *  picture, for who draws none need not care for the user's surroundings.
 *  @param how  what --graphics says: "none", "blocks", "sixel", "kitty", or "auto", which is as good as a terminal can
 *              that may get colour, and "none" otherwise; empty: what PMXBOARD_GRAPHICS says, or "auto"
 *  @param colour  what wants_colour() says
 *  @param give_back  empty: the terminal is not asked, for keys would be lost. It is asked at the first picture */
Drawing drawing(const std::string& how, bool colour, const GiveBack& give_back = {});

/** A PNG in pieces, as kitty's graphics protocol has them. */
std::string as_kitty_takes_it(const board::picture::Image& image);

/** In 256 colours at most, which are mixed from pixel to pixel. Throws std::runtime_error. */
std::string as_sixels(const board::picture::Image& image);

} // namespace pmxboard
