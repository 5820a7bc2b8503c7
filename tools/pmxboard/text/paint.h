// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Colours of a terminal. */
#pragma once

#include <string>
#include <string_view>

namespace pmxboard
{

enum class Colour
{
    Bold,
    Green,
    Magenta,
    Grey
};

/** Paints texts, or leaves them as they are. */
struct Paint
{
    bool on = false;

    /** Each line by itself: a pager may show the second one without the first. */
    std::string operator()(std::string_view text, Colour colour) const;
};

/** Whether the standard output gets colour. `when` is what --color says: "always", "never", or "auto", which is on a
 *  terminal that can and whose user has not refused it by NO_COLOR. */
bool wants_colour(std::string_view when = "auto");

} // namespace pmxboard
