// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/exit_codes.h"

#include <cstdio>
#include <iostream>

#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{

int usage_error(const std::string& message)
{
    std::cerr << "pmxboard: " << printable(message, longest_message) << '\n';
    return exit_usage;
}

int with_all_printed(int code)
{
    const bool is_written = std::cout.flush() && std::fflush(stdout) == 0 && std::ferror(stdout) == 0;
    return is_written ? code : usage_error("cannot write to the standard output");
}

} // namespace pmxboard
