// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What people write: numbers, lists and records as tokens of one line. */
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

namespace board::tokens
{

/** Without blanks and tabs at both ends. */
std::string_view trim(std::string_view text);

/** A decimal, 0x…, 0o… or 0b… number with an optional sign; nothing when the token is no number or does not fit. */
std::optional<std::int64_t> number(std::string_view token);

/** The parts between the commas that stand outside of brackets and quotes, trimmed; none of a blank text.
 *  Throws std::invalid_argument when brackets or quotes do not close, or a part is empty. */
std::vector<std::string_view> split(std::string_view text);

/** What stands between the brackets that open and close the token; throws std::invalid_argument when they do not. */
std::string_view inside(std::string_view token, char open, char close);

/** Where the bracket at `open` closes, quotes and inner brackets skipped; throws std::invalid_argument when it does
 *  not. */
std::size_t closing(std::string_view text, std::size_t open);

} // namespace board::tokens
