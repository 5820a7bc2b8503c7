// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A recording is run once more: the layer gets the recorded calls, and the recorded answers of the platform, in the
 *  recorded order, each thread's in a thread of its own. What it does must be what was recorded. */
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>

#include "tools/pmxboard/recording/described.h"
#include "tools/pmxboard/recording/recording.h"

namespace pmxboard
{

/** Where the layer did something else than was recorded. */
struct Departure
{
    std::size_t event = 0; ///< counted from 1
    std::uint64_t time = 0;
    unsigned thread = 0;
    std::string operation;     ///< that ran there; empty between operations
    std::size_t outermost = 0; ///< how many operations that nobody calls from within had begun
    std::string recorded;
    std::string computed;
    std::string why;
    std::string record; ///< the layer's record as it was computed
};

struct ReplayVerdict
{
    std::optional<Departure> departure;
    std::size_t events = 0; ///< that were held against each other
    std::size_t operations = 0;
    std::size_t calls = 0;
};

/** Not for two threads at once: there is one layer to replay with. */
ReplayVerdict replay(const Recording& recording, const TextNames& texts = {});

} // namespace pmxboard
