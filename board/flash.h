// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Flash partitions without an image file. */
#pragma once

#include <cstdint>
#include <string>

namespace board
{

/** Replace or add a flash partition that holds four bytes: a little-endian word. Throws std::invalid_argument when it
 *  has no name. */
void set_flash_word(std::string partition, std::uint32_t word);

} // namespace board
