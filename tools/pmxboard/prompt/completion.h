// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Completion of a line of the language: what may stand where the cursor is. Verbs are completed from their usage, so
 *  that a new verb needs nothing here. */
#pragma once

#include <cstddef>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace pmxboard
{

struct Completion
{
    std::size_t begin = 0;               ///< what stands from here to the cursor is replaced
    std::vector<std::string> candidates; ///< in order, none twice; each begins with what it replaces, or, where none
                                         ///< does, with the same letters, small or capital
    std::string argument;                ///< which argument is being written; empty where that is none

    /** What all candidates begin with. */
    std::string common() const;
};

struct CompletionPlace
{
    std::filesystem::path directory = "."; ///< what file names are relative to
    std::vector<std::string> words;        ///< what a line may begin with besides operations and verbs
};

/** Complete the line at the cursor, an offset in bytes. A candidate that ends in . [ or / goes on. */
Completion complete(std::string_view line, std::size_t cursor, const CompletionPlace& place = {});

/** Whether a blank follows a candidate. */
bool is_whole(std::string_view candidate);

} // namespace pmxboard
