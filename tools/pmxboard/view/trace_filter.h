// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Which entries of the trace are shown. What expectations look at is always the whole trace. */
#pragma once

#include <string>
#include <vector>

#include "board/trace.h"

namespace pmxboard
{

struct TraceFilter
{
    std::vector<std::string> only;       ///< beginnings of platform functions' names, SET for stores; empty: everything
    std::vector<std::string> operations; ///< what these caused; empty: whatever caused it

    bool shows(const board::TraceEntry& entry) const;
    /** What cannot be meant: a beginning that no platform function has, an operation that does not exist. Empty when
     *  nothing is wrong. */
    std::string complaint() const;
};

} // namespace pmxboard
