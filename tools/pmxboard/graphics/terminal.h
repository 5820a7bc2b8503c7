// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What pictures the user's terminal can show. It says so itself when it is asked. */
#pragma once

#include <string>
#include <string_view>

namespace pmxboard
{

/** What came from a terminal that was asked. */
struct TerminalAnswer
{
    bool kitty = false;     ///< it takes kitty's graphics
    bool sixel = false;     ///< and sixels
    bool complete = false;  ///< nothing more will come of it
    std::string typed = {}; ///< what somebody typed meanwhile
};

/** Tell the answer from the keys among which it came. A report that breaks off is none of them, either. */
TerminalAnswer answer_in(std::string_view received);

/** Ask the terminal that is standard input and standard output, and give it a moment to answer.
 *  @param kitty  about kitty's graphics, too */
TerminalAnswer ask_terminal(bool kitty);

/** How wide so many columns of the standard output are, in pixels. */
int pixels_of_columns(int columns);

} // namespace pmxboard
