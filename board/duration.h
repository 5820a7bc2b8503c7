// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Lengths of time as people write them: "10s", "500ms", "2us". */
#pragma once

#include <chrono>
#include <optional>
#include <string_view>

namespace board
{

/** Read one; nothing when it is not written so. Throws std::invalid_argument when it is longer than a year. */
std::optional<std::chrono::microseconds> read_duration(std::string_view written);

} // namespace board
