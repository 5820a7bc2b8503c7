// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What two layers did differently. */
#pragma once

#include <optional>
#include <string>

#include "tests/lockstep/lockstep.h"

namespace lockstep
{

/** How layers are called in texts, and what may differ between them. */
struct Comparison
{
    const char* names[2] = { "first", "second" };
    bool padding = true;          ///< padding of records behind pointers counts
    bool places_of_checks = true; ///< the file that an assertion names counts; its line never does
};

struct Difference
{
    std::string kind;  ///< order, argument, bytes, padding, text, store, result, output, state after
    std::string where; ///< function and argument, or field
    std::string text;  ///< what either did
};

/** The first difference of the calls, or behind them of result, output and state. */
std::optional<Difference> compare_calls(const Operation& operation, const Trace& first, const Trace& second,
                                        const Comparison& comparison);

/** The first difference of the state at a call. */
std::optional<Difference> compare_stores(const Operation& operation, const Trace& first, const Trace& second,
                                         const Comparison& comparison);

/** An operation as it was called. */
std::string shown_operation(const Operation& operation, const Arguments& arguments, const Image& before);

/** A layer's calls, one a line; `mark` is the number of one to point at. */
std::string shown_calls(const Trace& trace, unsigned mark);

} // namespace lockstep
