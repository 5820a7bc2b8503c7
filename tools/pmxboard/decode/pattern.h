// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The layer's texts as patterns: a format's own characters, with numbers and names between them. */
#pragma once

#include <array>
#include <span>
#include <string_view>
#include <vector>

#include "tools/pmxboard/decode/texts.h"

namespace pmxboard::decode
{

struct Pattern
{
    const Text* text;
    std::string_view format; ///< what the console shows of it
    std::string_view lead;   ///< its own characters before the first value: most lines fail there
    bool weak;               ///< so short or plain that a foreign line may hold it by chance
};

/** How far a pattern leads into a line. */
struct Match
{
    enum class State
    {
        No,
        RanOut, ///< the line ended within the text
        Whole
    };
    static constexpr std::size_t most_values = 12;

    State state = State::No;
    std::size_t end = 0;     ///< behind what matched
    std::size_t literal = 0; ///< characters of the format's own that matched
    std::size_t count = 0;   ///< values
    std::array<std::string_view, most_values> values;
};

/** Every pattern of the table; texts that look alike on a console have one, of the first of them. */
const std::vector<Pattern>& patterns();
/** Those that begin with a character. */
std::span<const Pattern* const> patterns_of(char first);

/** Match from the beginning of `line`. The work is bounded by the format's length. */
Match match(std::string_view format, std::string_view line);

/** The length of the conversion that a format begins with; 0 for none. */
std::size_t conversion_length(std::string_view format);

/** What the console shows of a format: without blanks and line ends behind it. */
std::string_view visible(std::string_view format);

/** Whether a character can stand within an identifier. */
bool is_word(char c);

} // namespace pmxboard::decode
