// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the sub-commands share: how they end. */
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

/** The exit code of a sub-command, unless what it printed did not arrive: then that is told. */
int with_all_printed(int code);

} // namespace pmxboard
