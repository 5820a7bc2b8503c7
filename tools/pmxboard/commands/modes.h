// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  `pmxboard modes`: the resolution modes and all that the layer decides from them. */
#pragma once

#include <iosfwd>
#include <string>
#include <vector>

namespace pmxboard
{

struct ModesOptions
{
    std::vector<std::string> modes; ///< numbers and names; none: all
    bool json = false;
    std::string colour = "auto";
};

/** The exit code. */
int show_modes(const ModesOptions& options, std::ostream& to);

} // namespace pmxboard
