// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  `pmxboard run`: scenarios from files. */
#pragma once

#include <string>
#include <vector>

namespace pmxboard
{

struct RunOptions
{
    std::vector<std::string> files;
    std::string board;
    std::string trace_format = "text";
    std::string trace_file;
    std::string colour = "auto";
    std::string graphics; ///< see drawing()
    std::vector<std::string> only;
    std::vector<std::string> operations;
    std::string junit; ///< a file for the verdicts, as JUnit writes them
    bool keep_going = false;
    bool explain = false;
    bool stores = false;
    bool quiet = false;
    bool verbose = false;
};

/** The exit code. */
int run_files(const RunOptions& run);

} // namespace pmxboard
