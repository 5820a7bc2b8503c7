// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/text/paint.h"

#include <unistd.h>

#include <cstdlib>

namespace pmxboard
{
namespace
{

/** By Colour. Yellow is not seen on a light screen, grey not on a dark one. */
constexpr const char* codes[] = { "\x1b[1m", "\x1b[32m", "\x1b[35m", "\x1b[90m" };
constexpr const char* end_of_paint = "\x1b[0m";

} // namespace

std::string Paint::operator()(std::string_view text, Colour colour) const
{
    if (!on)
        return std::string(text);
    const std::string begin = codes[static_cast<std::size_t>(colour)];
    std::string lines = begin;
    for (const char c : text)
        lines += c == '\n' ? end_of_paint + ("\n" + begin) : std::string(1, c);
    return lines + end_of_paint;
}

bool wants_colour(std::string_view when)
{
    if (when != "auto")
        return when == "always";
    const char* const refused = std::getenv("NO_COLOR");
    const char* const terminal = std::getenv("TERM");
    const bool can = terminal == nullptr || std::string_view(terminal) != "dumb";
    return can && (refused == nullptr || *refused == '\0') && isatty(STDOUT_FILENO) == 1;
}

} // namespace pmxboard
