// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/format.h"

#include <fcntl.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <stdexcept>
#include <string_view>

namespace board
{
namespace
{

constexpr int widest = 4095;

/** One conversion of a format, taken apart. */
struct Conversion
{
    std::string flags;
    int width = -1;
    int precision = -1;
    std::string_view length;
    char letter = '\0';
};

/** A value list that can be handed on by reference. */
struct Values
{
    std::va_list list;
};

int number_or_star(std::string_view text, std::size_t& at, Values& values)
{
    if (at < text.size() && text[at] == '*')
    {
        ++at;
        return std::clamp(va_arg(values.list, int), -widest, widest);
    }
    int number = 0;
    for (; at < text.size() && text[at] >= '0' && text[at] <= '9'; ++at)
        number = std::min(number * 10 + (text[at] - '0'), widest);
    return number;
}

/** The conversion behind a percent sign; `at` is moved behind it. */
Conversion parse(std::string_view text, std::size_t& at, Values& values)
{
    Conversion conversion;
    for (; at < text.size() && std::string_view("-+ #0").find(text[at]) != std::string_view::npos; ++at)
        conversion.flags += text[at];
    conversion.width = number_or_star(text, at, values);
    if (conversion.width < 0)
    {
        conversion.flags += '-';
        conversion.width = -conversion.width;
    }
    if (at < text.size() && text[at] == '.')
        conversion.precision = number_or_star(text, ++at, values);
    for (const std::string_view length : { "hh", "h", "ll", "l", "j", "z", "t", "L" })
    {
        if (text.substr(at).starts_with(length))
        {
            conversion.length = length;
            at += length.size();
            break;
        }
    }
    if (at < text.size())
        conversion.letter = text[at++];
    return conversion;
}

template <typename T>
std::string print(const Conversion& conversion, std::string_view length, T value)
{
    std::string item = "%" + conversion.flags;
    item += conversion.width > 0 ? std::to_string(conversion.width) : std::string();
    if (conversion.precision >= 0)
        (item += '.') += std::to_string(conversion.precision);
    (item += length) += conversion.letter;
    char buffer[2 * widest + 512];
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
    const int printed = std::snprintf(buffer, sizeof buffer, item.c_str(), value);
#pragma GCC diagnostic pop
    return printed < 0
               ? std::string()
               : std::string(buffer, std::min<std::size_t>(static_cast<std::size_t>(printed), sizeof buffer - 1));
}

/** Copy from an address that may be anything; false when it is no readable memory. The kernel looks, as it fills a pipe
 *  from there. The call is made past the C library, whose sanitized form would look itself. */
bool copy_memory(const char* from, char* to, std::size_t count)
{
    static const std::array<int, 2> ends = [] {
        std::array<int, 2> made = {};
        if (pipe2(made.data(), O_CLOEXEC) != 0)
            throw std::runtime_error("no pipe for reading console texts");
        return made;
    }();
    const auto size = static_cast<ssize_t>(count);
    return syscall(SYS_write, ends[1], from, count) == size && ::read(ends[0], to, count) == size;
}

/** Read the text at an address that may be anything, at most `most` characters; false when it is no readable memory. */
bool read_text(const char* address, std::size_t most, std::string& text)
{
    constexpr std::size_t step = 256;
    while (text.size() < most)
    {
        // Never across a page's end in one go: the next page may be none of ours.
        const auto position = reinterpret_cast<std::uintptr_t>(address) + text.size();
        char part[step];
        const std::size_t count = std::min({ step, most - text.size(), step - position % step });
        if (!copy_memory(reinterpret_cast<const char*>(position), part, count))
            return false;
        const std::size_t length = strnlen(part, count);
        text.append(part, length);
        if (length < count)
            break;
    }
    return true;
}

std::string print_text(const Conversion& conversion, const char* value, std::string& complaint)
{
    constexpr std::size_t longest = std::size_t{ 1 } << 20;
    std::string text;
    if (value == nullptr)
        text = "(null)";
    else if (!read_text(value, conversion.precision >= 0 ? static_cast<std::size_t>(conversion.precision) : longest,
                        text))
    {
        text = "<bad text>";
        complaint = "a console text's %s points to no readable memory";
    }
    const auto width = static_cast<std::size_t>(conversion.width);
    if (text.size() < width)
    {
        const bool left = conversion.flags.find('-') != std::string::npos;
        text.insert(left ? text.size() : 0, width - text.size(), ' ');
    }
    return text;
}

std::string print_integer(const Conversion& conversion, Values& values)
{
    // Every narrower value comes as an int; the conversion itself cuts it.
    const std::string_view length = conversion.length;
    if (length == "ll" || length == "j" || length == "L")
        return print(conversion, "ll", va_arg(values.list, long long));
    if (length == "l" || length == "z" || length == "t")
        return print(conversion, "l", va_arg(values.list, long));
    return print(conversion, length, va_arg(values.list, int));
}

std::string print_conversion(const Conversion& conversion, std::string_view as_written, Values& values,
                             std::string& complaint)
{
    switch (conversion.letter)
    {
    case '%': return "%";
    case 'd':
    case 'i':
    case 'u':
    case 'o':
    case 'x':
    case 'X': return print_integer(conversion, values);
    case 'c': return print(conversion, "", va_arg(values.list, int));
    case 's': return print_text(conversion, va_arg(values.list, const char*), complaint);
    case 'p': return print(conversion, "", va_arg(values.list, void*));
    case 'f':
    case 'F':
    case 'e':
    case 'E':
    case 'g':
    case 'G':
    case 'a':
    case 'A':
        if (conversion.length == "L")
            return print(conversion, "L", va_arg(values.list, long double));
        return print(conversion, "", va_arg(values.list, double));
    case 'n':
        (void)va_arg(values.list, void*);
        complaint = "a console text has the conversion %n";
        return "<%n>";
    default: return std::string(as_written);
    }
}

} // namespace

Formatted format(const char* format, std::va_list values)
{
    if (format == nullptr)
        return { "(null)", {} };
    Formatted result;
    Values list;
    va_copy(list.list, values);
    const std::string_view text = format;
    for (std::size_t at = 0; at < text.size();)
    {
        if (text[at] != '%')
        {
            result.text += text[at++];
            continue;
        }
        const std::size_t begin = at++;
        const Conversion conversion = parse(text, at, list);
        result.text += print_conversion(conversion, text.substr(begin, at - begin), list, result.complaint);
    }
    va_end(list.list);
    return result;
}

} // namespace board
