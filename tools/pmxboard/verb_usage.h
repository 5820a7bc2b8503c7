/** @file
 *  The usage of a verb, read as the grammar that it is for a reader. */
#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace pmxboard
{

struct UsageWord
{
    std::string text;            ///< "plug", or "MODE"
    bool is_placeholder = false; ///< stands for something: written in capitals
};

/** What may follow the words of a line that begin with the verb, by its usage: `sink valid MODE HZ, or sink unplug`.
 *  [words] may be left out, a|b is a choice, a…  at the end repeats. Prose ends what is understood. */
std::vector<UsageWord> next_words(std::string_view usage, std::span<const std::string> before);

/** Whether the usage has a form that these words, the verb among them, may be; a form that ends in prose takes any
 *  words behind what is understood. */
bool fits(std::string_view usage, std::span<const std::string> words);

} // namespace pmxboard
