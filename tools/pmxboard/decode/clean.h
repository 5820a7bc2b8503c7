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

struct Stamp
{
    std::string text; ///< as written
    std::optional<double> seconds;
};

/** The time stamp at the beginning of a line: `[   12.345678]`, `12:34:56.789`, `12.345`. */
Stamp stamp_of(std::string_view line);

/** Whether what stands before a text looks like what a console or a capturing program writes there: nothing that ends
 *  in a word. */
bool is_prefix(std::string_view before);

} // namespace pmxboard::decode
