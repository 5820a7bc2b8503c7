// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the tool tells about the words of the language: operations, platform functions, verbs, constants. */
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/text/layout.h"

namespace pmxboard
{

/** Help on a word: an operation, a platform function, a verb, a constant. Throws LineError with the nearest words. */
std::string help_on(const std::string& word, const Look& look);
/** What the words are that help_on() knows. */
std::vector<std::string_view> help_words();
/** The tables of verbs and of expectations for the guide, in Markdown. */
std::string guide_tables();
/** Help on the shell as a whole. */
std::string shell_help(const Look& look);

} // namespace pmxboard
