// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Bytes as characters that may stand in a page (RFC 4648). */
#pragma once

#include <string>
#include <string_view>

namespace pmxboard
{

std::string base64(std::string_view bytes);

} // namespace pmxboard
