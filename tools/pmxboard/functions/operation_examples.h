// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A line for every operation that works as it stands. */
#pragma once

#include <string_view>
#include <vector>

namespace pmxboard
{

/** A line that works on the default board, and the lines that it needs before it. */
struct OperationExample
{
    std::string_view line;
    std::vector<std::string_view> before = { "PMX_Init" };
};

/** Null pointer when there is none, which is a gap. */
const OperationExample* example_of(std::string_view operation);

} // namespace pmxboard
