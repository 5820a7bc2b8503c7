/** @file
 *  What the sub-commands share: how they end, and what they may use of the terminal. */
#pragma once

#include <string>
#include <string_view>

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

/** Whether the standard output gets colour. `when` is what --color says: "always", "never", or "auto", which is on a
 *  terminal that can and whose user has not refused it by NO_COLOR. */
bool wants_colour(std::string_view when = "auto");

} // namespace pmxboard
