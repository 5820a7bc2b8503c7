// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The recorder around the layer of this program. */
#pragma once

#include <cstdint>
#include <functional>
#include <string>

namespace pmxboard
{

/** The recording of what the layer does meanwhile, on the board, in a recorder's memory of so many bytes; a ring that
 *  did not become full is cut. Throws std::runtime_error in a program that was linked without a recorder. */
std::string recorded(std::uint32_t size, const std::function<void()>& meanwhile);

} // namespace pmxboard
