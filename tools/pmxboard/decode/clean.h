// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What a serial console puts around and into lines: terminal sequences, time stamps. */
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace pmxboard::decode
{

constexpr std::string_view digits = "0123456789";

/** A line without terminal sequences and control characters. */
std::string clean(std::string_view line);

/** What the time on a line counts from. */
enum class Clock
{
    None,
    Day,    ///< hours, minutes and seconds: it begins again at midnight
    Seconds ///< since something, mostly since the kernel has run
};

struct Stamp
{
    std::string text; ///< as written
    std::optional<double> seconds;
    Clock clock = Clock::None;
    unsigned decimals = 0; ///< of the seconds
};

/** The time stamp in what leads to a text: `[   12.345678] `, `12:34:56.789 `, `01:02:03 PM `, `12.345 `. Where a
 *  capturing program and a kernel have written one each, the finer; of two that are as fine, the one nearer to the
 *  text, which was written sooner. */
Stamp stamp_of(std::string_view lead);

/** Whether what stands before a text looks like what a console or a capturing program writes there: nothing that ends
 *  in a word. */
bool is_prefix(std::string_view before);

} // namespace pmxboard::decode
