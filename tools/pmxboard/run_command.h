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
    std::string trace = "text";
    std::string trace_file;
    bool quiet = false;
    bool verbose = false;
};

/** The exit code. */
int run_files(const RunOptions& run);

} // namespace pmxboard
