// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  `pmxboard shell`: the scenario language at a prompt, or from a pipe. `pmxboard complete`: its completion, for other
 *  shells. */
#pragma once

#include <filesystem>
#include <iosfwd>
#include <string>
#include <vector>

namespace pmxboard
{

struct ShellOptions
{
    std::string board;
    std::string colour = "auto";
    std::string graphics; ///< see drawing()
    std::vector<std::string> only;
    std::vector<std::string> operations;
    bool quiet = false;
    bool verbose = false;
};

/** The exit code. On a terminal errors are shown and that is all; from a pipe the code tells that there were some. */
int run_shell(const ShellOptions& options);

/** Print what completes the line at its end, one candidate a line; the exit code. */
int print_completions(const std::string& line, std::ostream& to);

/** The file that keeps the history: what PMXBOARD_HISTORY says, else pmxboard/history in the user's directory for
 *  such; empty when there is no such directory, or when the variable is empty. */
std::filesystem::path history_file();

} // namespace pmxboard
