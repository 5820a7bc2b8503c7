// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The command that carries a scenario out once more. */
#pragma once

#include <string>

namespace pmxboard
{

/** @param board  as it was named; empty where it was not */
std::string repeat_command(const std::string& board, const std::string& file);

} // namespace pmxboard
