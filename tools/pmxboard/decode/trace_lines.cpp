// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/trace_lines.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>

#include "board/json.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::string_view first_key = "{\"sequence\":";
constexpr std::string_view viewer_key = "\"traceEvents\"";
constexpr std::size_t viewer_within = 100;

/** The kernel's way to stamp a line. */
std::string stamped(std::uint64_t time_us, const std::string& text)
{
    constexpr std::uint64_t second = 1000000;
    char stamp[40];
    std::snprintf(stamp, sizeof stamp, "[%5llu.%06llu] ", static_cast<unsigned long long>(time_us / second),
                  static_cast<unsigned long long>(time_us % second));
    return stamp + text;
}

std::string text_in(const board::Json& json, const char* key)
{
    const auto found = json.find(key);
    return found != json.end() && found->is_string() ? found->get<std::string>() : std::string();
}

std::uint64_t unsigned_in(const board::Json& json, const char* key)
{
    const auto found = json.find(key);
    return found != json.end() && found->is_number_unsigned() ? found->get<std::uint64_t>() : 0;
}

std::optional<std::string> printed_by(const board::Json& entry)
{
    const std::string kind = text_in(entry, "kind");
    if (kind == "log")
        return stamped(unsigned_in(entry, "time_us"), text_in(entry, "text"));
    const auto arguments = entry.find("arguments");
    if (kind != "assert" || arguments == entry.end() || !arguments->is_object())
        return {};
    return stamped(unsigned_in(entry, "time_us"),
                   "ASSERT " + text_in(*arguments, "szExpression") + ", " + text_in(*arguments, "szFile"));
}

} // namespace

bool is_trace_lines(std::string_view bytes)
{
    constexpr int within = 3; // lines: the first may be cut, or somebody else's
    for (int line = 0; line < within && !bytes.empty(); ++line)
    {
        if (bytes.starts_with(first_key))
            return true;
        bytes.remove_prefix(std::min(bytes.find('\n'), bytes.size() - 1) + 1);
    }
    return false;
}

bool is_viewer_trace(std::string_view bytes)
{
    return bytes.starts_with('{') && bytes.substr(0, viewer_within).find(viewer_key) != bytes.npos;
}

TraceLine read_trace_line(std::string_view line)
{
    if (!line.starts_with(first_key))
        return {};
    try
    {
        const board::Json entry = board::read_json(line);
        return { printed_by(entry), unsigned_in(entry, "sequence") == 1 };
    }
    catch (const board::JsonError&)
    {
        return {}; // cut, or nobody's
    }
}

} // namespace pmxboard::decode
