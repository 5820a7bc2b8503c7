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

bool wants_colour(std::string_view when)
{
    if (when != "auto")
        return when == "always";
    const char* const refused = std::getenv("NO_COLOR");
    const char* const terminal = std::getenv("TERM");
    const bool can = terminal == nullptr || std::string_view(terminal) != "dumb";
    return can && (refused == nullptr || *refused == '\0') && isatty(STDOUT_FILENO) == 1;
}

} // namespace pmxboard
