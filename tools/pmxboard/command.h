/** @file
 *  What the sub-commands share: how they end, and what they may use of the terminal. */
#pragma once

#include <string>

namespace pmxboard
{

/** What a shell sees of a run. */
enum ExitCode
{
    exit_done = 0,
    exit_failed = 1, ///< a step failed
    exit_usage = 2   ///< the command line cannot be meant
};

/** Say what cannot be meant on the diagnostic stream; the exit code. */
int usage_error(const std::string& message);

/** Whether the standard output is a terminal whose user has not refused colour. */
bool wants_colour();

} // namespace pmxboard
