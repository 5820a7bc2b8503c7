// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A text that the layer takes for a format, and that no values go with. */
#pragma once

#include <string>
#include <string_view>

namespace pmxboard
{

/** Throws LineError when the format wants values; `name` is what the message calls it. */
void check_format(std::string_view name, const std::string& format);

} // namespace pmxboard
