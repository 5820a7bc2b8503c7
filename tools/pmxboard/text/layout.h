// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Texts in the columns of a screen. */
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/text/paint.h"

namespace pmxboard
{

/** Where there is no terminal. */
inline constexpr unsigned usual_width = 80;

/** How a text is to look. */
struct Look
{
    unsigned width = usual_width;
    bool colour = false;

    std::string bold(std::string_view text) const { return Paint{ colour }(text, Colour::Bold); }
};

/** Columns for texts: those of the terminal, 100 at most, and 80 where there is none. */
unsigned text_width();
/** Columns that a text takes. */
std::size_t columns_of(std::string_view text);
/** The text in lines of this width, the first indented by `indent`, the others by `hanging`. A word that is longer
 *  stands alone. Runs of blanks within a line stay. */
std::string wrapped(std::string_view text, unsigned width, unsigned indent, unsigned hanging);
/** Words in columns, downwards, as a directory is listed. */
std::string in_columns(const std::vector<std::string>& words, unsigned width);
/** A call's or a value's line broken behind commas where it is longer than this; texts stay whole. What follows is
 *  indented. */
std::string folded(const std::string& line, std::size_t indent, unsigned width);
/** Whether a person reads the standard output on a screen, and no program or file gets it. */
bool is_on_screen();

} // namespace pmxboard
