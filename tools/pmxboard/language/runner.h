// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Run a scenario from its first line to its last, or to the first that is wrong or fails. */
#pragma once

#include <iosfwd>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/view/output.h"

namespace pmxboard
{

struct Scenario
{
    std::string name;                             ///< as the user wrote it; "-" for the standard input
    std::string board;                            ///< for `power-on` without a name
    std::string repeat;                           ///< the command that runs it again
    bool keep_going = false;                      ///< what is wrong or fails is told, and the next line carried out
    bool explain = false;                         ///< what is refused is explained, whatever becomes of it
    std::vector<std::string>* failures = nullptr; ///< where each is told as well
};

/** Whether every line was carried out and every expectation met. What was not is said on `diagnostics`, with file and
 *  line. Throws board::files::FileError when the lines cannot be read. */
bool run_scenario(std::istream& lines, const Scenario& scenario, const OutputOptions& options,
                  std::ostream& diagnostics);

/** A message that quotes a scenario, fit for a terminal: one line of bearable length, without control characters. */
std::string presentable(std::string_view message);

} // namespace pmxboard
