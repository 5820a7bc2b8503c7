// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  `pmxboard state`: saved states, looked at and compared. */
#pragma once

#include <string>
#include <vector>

namespace pmxboard
{

struct StateOptions
{
    std::string file;
    std::vector<std::string> words; ///< a second file to compare with, and paths
    bool json = false;
    bool quiet = false;
    std::string colour = "auto";
};

/** The exit code: as with diff(1), 1 when two states differ. */
int show_state(const StateOptions& options);

} // namespace pmxboard
