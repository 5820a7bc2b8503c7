// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A scenario that plays on the board what a recording has. */
#pragma once

#include <string>

#include "tools/pmxboard/recording/recording.h"

namespace pmxboard
{

struct PlayedScenario
{
    std::string lines;
    bool plays_the_same = false; ///< it was recorded, and all of it was in that recording, too
};

/** Writes a scenario, records what it does on the board, and adds what that lacks, until nothing is lacking or a line
 *  cannot say it: then that is a comment, and the end. */
PlayedScenario scenario_of(const Recording& recording, const std::string& name);

/** Why the layer refuses the n-th operation that nobody calls from within it, as it was recorded, in its own reasons;
 *  empty when it does not, or when that cannot be played on the board. */
std::string refusal_of(const Recording& recording, std::size_t operation);

} // namespace pmxboard
