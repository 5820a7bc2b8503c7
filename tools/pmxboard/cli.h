/** @file
 *  The command line. */
#pragma once

namespace pmxboard
{

/** What a shell sees of a run. */
enum ExitCode
{
    exit_done = 0,
    exit_failed = 1, ///< a step failed
    exit_usage = 2   ///< the command line cannot be meant
};

int run_command_line(int count, const char* const* arguments);

} // namespace pmxboard
