// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  `pmxboard state`: saved states, looked at and compared. */
#pragma once

#include <string>
#include <vector>

namespace pmxboard
{

struct StatusOptions
{
    std::string file;
    bool json = false;
    std::string colour = "auto";
};

/** `pmxboard status`: what a saved state means. The exit code. */
int show_status(const StatusOptions& options);

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
