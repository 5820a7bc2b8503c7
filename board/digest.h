// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A few characters for many: whether something is what it was. */
#pragma once

#include <string>
#include <string_view>

namespace board
{

std::string digest_of(std::string_view content);

} // namespace board
