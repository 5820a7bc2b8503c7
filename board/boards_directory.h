// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Where the named boards lie, unless somebody says so. */
#pragma once

#include <filesystem>

namespace board
{

/** The folder share/pmx/boards of the installation with whose headers the program was compiled; else that of a folder
 *  above the program: of the prefix that an installed program lies in, or of the folder that it was built in. */
std::filesystem::path found_boards_directory();

} // namespace board
