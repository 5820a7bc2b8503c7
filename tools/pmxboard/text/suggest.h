// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What somebody may have meant who has written something else. */
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace pmxboard
{

/** "; did you mean X, Y?", or nothing when no candidate is near. */
std::string did_you_mean(std::string_view wrong, const std::vector<std::string_view>& candidates);

} // namespace pmxboard
