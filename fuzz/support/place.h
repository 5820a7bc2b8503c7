// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Where a target finds files. */
#pragma once

#include <filesystem>
#include <string>
#include <string_view>

namespace fuzz
{

/** What the project has, boards and scenarios: `pmx` beside the program, or the tree that it was built from. */
const std::filesystem::path& project();

/** Power the default board on. */
void power_on();

/** A directory of this process, for what is read from files alone. It goes with the process. */
const std::filesystem::path& place();

/** A file there that holds these bytes; its name. */
std::string file_with(std::string_view bytes, std::string_view name);

} // namespace fuzz
