// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  `pmxboard report`: scenarios as a storyboard in one page. */
#pragma once

#include <string>
#include <vector>

namespace pmxboard
{

struct ReportOptions
{
    std::vector<std::string> files;
    std::string page;                ///< the file that is written
    std::vector<std::string> boards; ///< each scenario runs on each of them; none: on the usual one
};

/** The exit code. A scenario that fails is in the page, too, as far as it came. */
int report_scenarios(const ReportOptions& options);

} // namespace pmxboard
