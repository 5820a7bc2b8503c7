// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What became of scenarios, in the XML in which JUnit tells it and in which build servers read it. */
#pragma once

#include <string>
#include <vector>

namespace pmxboard
{

struct Verdict
{
    std::string scenario;
    std::vector<std::string> failures; ///< as they were told; none: all went well
};

std::string to_junit(const std::vector<Verdict>& verdicts);

} // namespace pmxboard
