/** @file
 *  What the tool tells about the words of the language: operations, platform functions, verbs, constants. */
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/operation.h"

namespace pmxboard
{

/** How a text is to look. */
struct Look
{
    unsigned width = 80;
    bool colour = false;

    std::string bold(std::string_view text) const;
};

/** Columns for texts: those of the terminal, 100 at most, and 80 where there is none. */
unsigned text_width();
/** Columns that a text takes. */
std::size_t columns_of(std::string_view text);
/** The text in lines of this width, the first indented by `indent`, the others by `hanging`. A word that is longer
 *  stands alone. Runs of blanks within a line stay. */
std::string wrapped(std::string_view text, unsigned width, unsigned indent, unsigned hanging);
/** Words in columns, downwards, as a directory is listed. */
std::string in_columns(const std::vector<std::string>& words, unsigned width);

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
