// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/functions/format_check.h"

#include "tools/pmxboard/functions/errors.h"

namespace pmxboard
{
namespace
{

/** The first conversion in a format that wants a value; empty when there is none. A percent sign at the end counts. */
std::string conversion_in(std::string_view format)
{
    for (std::size_t i = format.find('%'); i != format.npos; i = format.find('%', i + 2))
    {
        if (i + 1 == format.size() || format[i + 1] != '%')
            return std::string(format.substr(i, 2));
    }
    return {};
}

std::string once_formatted(std::string_view format)
{
    std::string text;
    for (std::size_t i = 0; i < format.size(); ++i)
    {
        text += format[i];
        if (format[i] == '%')
            ++i;
    }
    return text;
}

} // namespace

// It is a format a second time when it reaches the console.
void check_format(std::string_view name, const std::string& format)
{
    const std::string what(name);
    if (format.find('\0') != format.npos)
        throw LineError(what + " ends at its \\x00; leave it out");
    const std::string first = conversion_in(format);
    if (!first.empty())
        throw LineError(what + " wants a value for \"" + first +
                        "\", and values cannot be given here; write %% for a percent sign");
    const std::string second = conversion_in(once_formatted(format));
    if (!second.empty())
        throw LineError(what + " is formatted twice on its way to the console, and the second time \"" + second +
                        "\" wants a value; write %%%% for a percent sign");
}

} // namespace pmxboard
