// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Resolution modes as people call them: 720p50, 480i, 1080p23.976. */
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace pmxboard
{

/** Pictures or fields a second as the mode's name tells, "23.976"; empty when it does not. */
std::string refresh_of(std::string_view mode);

/** The short name of a mode: 720p50 of RES_720P50HZ. */
std::string short_name_of(std::string_view mode);
/** The full name of a mode: RES_720P50HZ; its number when it has none. */
std::string full_name_of(unsigned mode);
/** The short name of every mode, by number. */
std::vector<std::string> short_mode_names();

/** The mode of a short name, with or without its refresh where there is no other, in small or capital letters; of its
 *  full name, or of its number. Throws LineError with the nearest short names. */
unsigned read_mode(std::string_view written);

} // namespace pmxboard
