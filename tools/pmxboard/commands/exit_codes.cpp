// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/exit_codes.h"

#include <iostream>

namespace pmxboard
{

int usage_error(const std::string& message)
{
    std::cerr << "pmxboard: " << message << '\n';
    return exit_usage;
}

} // namespace pmxboard
