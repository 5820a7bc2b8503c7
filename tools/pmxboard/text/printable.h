// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What came from elsewhere, fit for a terminal. */
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace pmxboard
{

inline constexpr std::size_t any_columns = static_cast<std::size_t>(-1);
/** Of a message that quotes what somebody has written. */
inline constexpr std::size_t longest_message = 500;

/** Bytes as text for a terminal: UTF-8, control characters and stray bytes as \xNN, at most so many columns. */
std::string printable(std::string_view bytes, std::size_t columns = any_columns);
/** The same for each line of a text; tabs stay, too. */
std::string printable_lines(std::string_view text);

} // namespace pmxboard
