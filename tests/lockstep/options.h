// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Options of the lockstep programs. */
#pragma once

#include <cstdint>
#include <string>

#include "tests/lockstep/compare.h"

namespace lockstep
{

struct Options
{
    std::uint64_t count = 1000000;
    std::uint64_t seed = 1;
    std::string operation; ///< this one alone; empty for all
    std::string bases;     ///< a file
    std::uint64_t part = 0;
    std::uint64_t parts = 1;
    bool disturbed = true;
    bool all = false;
    Comparison comparison;
};

/** The options that a program was started with. Ends the program when they are wrong, showing `usage`, whose words
 *  are the options that it takes. */
Options options_of(int count, char** words, const char* usage);

} // namespace lockstep
