// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  `pmxboard ops`: the operations of the layer, their contracts and an example of each. */
#pragma once

#include <iosfwd>
#include <string>
#include <vector>

namespace pmxboard
{

struct OpsOptions
{
    std::vector<std::string> names; ///< of operations and of the platform's functions; * stands for anything
    bool json = false;
    std::string colour = "auto";
};

/** The exit code. */
int show_operations(const OpsOptions& options, std::ostream& to);

} // namespace pmxboard
