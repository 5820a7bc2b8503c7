/** @file
 *  What the tool tells about the words of the language: operations, platform functions, verbs, constants. */
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/operation.h"
#include "tools/pmxboard/text/layout.h"
#include "tools/pmxboard/text/paint.h"

namespace pmxboard
{

/** How a text is to look. */
struct Look
{
    unsigned width = 80;
    bool colour = false;

    std::string bold(std::string_view text) const;
};

/** How an operation is called, its contract and an example. */
std::string operation_text(const Operation& operation, const Look& look);
/** The contract of a function that the platform provides. */
std::string platform_text(std::string_view function, const Look& look);

/** Help on a word: an operation, a platform function, a verb, a constant. Throws LineError with the nearest words. */
std::string help_on(const std::string& word, const Look& look);
/** What the words are that help_on() knows. */
std::vector<std::string_view> help_words();
/** The tables of verbs and of expectations for the guide, in Markdown. */
std::string guide_tables();
/** Help on the shell as a whole. */
std::string shell_help(const Look& look);

/** The names of a family, by number. */
std::vector<std::string_view> names_in(board::names::Family family);

} // namespace pmxboard
