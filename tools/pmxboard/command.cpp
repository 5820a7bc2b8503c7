#include "tools/pmxboard/command.h"

#include <unistd.h>

#include <cstdlib>
#include <iostream>

namespace pmxboard
{

int usage_error(const std::string& message)
{
    std::cerr << "pmxboard: " << message << '\n';
    return exit_usage;
}

bool wants_colour()
{
    const char* const refused = std::getenv("NO_COLOR");
    return (refused == nullptr || *refused == '\0') && isatty(STDOUT_FILENO) == 1;
}

} // namespace pmxboard
