// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  `pmxboard decode`: what a captured console log tells. */
#pragma once

#include <optional>
#include <string>

namespace pmxboard
{

struct DecodeOptions
{
    std::string file; ///< "-" is the standard input
    std::string against;
    std::string board;
    std::optional<int> level;
    std::string colour = "auto";
    bool texts = false;
    bool to_scenario = false;
    bool json = false;
    bool quiet = false;
    bool verbose = false;
};

/** The exit code: 1 for a departure from the scenario. */
int decode_log(const DecodeOptions& options);

} // namespace pmxboard
