// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A recording as one thing after the other, whoever did it and when: what a scenario has to do once more. */
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "tools/pmxboard/recording/recording.h"
#include "tools/pmxboard/recording/replayed.h"

namespace pmxboard
{

struct RecordedStep
{
    enum class Kind
    {
        Operation,
        OperationEnds,
        Call,
        CallEnds,
        Change
    };

    Kind kind = Kind::Operation;
    const Described* function = nullptr;
    std::vector<std::uint32_t> words; ///< arguments; what was written behind pointers; the state, or its head
    std::uint32_t answer = 0;
    std::size_t command = 0; ///< which of the operations that nobody calls from within it belongs to, from 1
    unsigned nth = 0;        ///< of a call and its end: of this function, within that operation
    std::string within;      ///< of what happens within a call: whose, and
    unsigned within_nth = 0; ///< which
};

struct RecordedSteps
{
    std::vector<std::uint32_t> state; ///< before the first operation
    std::vector<RecordedStep> steps;
};

/** What an operation's caller has in the places for its outputs says nothing, and is left out. */
RecordedSteps recorded_steps(const Recording& recording);

/** Whether both are the same. */
bool same(const RecordedStep& one, const RecordedStep& other);

} // namespace pmxboard
