// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Whether a board file is what it was. */
#pragma once

#include <filesystem>
#include <string>

#include "board/board.h"

namespace board
{

struct CheckedDescription
{
    Description description;
    std::string check; ///< a few characters for what the file says, however it is laid out and commented
};

/** As load_description. */
CheckedDescription load_checked(const std::filesystem::path& board);

} // namespace board
