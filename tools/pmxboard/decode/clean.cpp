#include "tools/pmxboard/decode/clean.h"

#include <algorithm>
#include <cstdlib>

#include "tools/pmxboard/decode/pattern.h"

namespace pmxboard::decode
{
namespace
{

// Longer sequences are rubbish, and are not searched for their end.
constexpr std::size_t longest_sequence = 64;
constexpr std::size_t stamp_within = 48;

constexpr char escape = '\x1b';
constexpr char bell = '\a';

bool is_digit(char c)
{
    return c >= '0' && c <= '9';
}

/** The length of the terminal sequence at the beginning, which is an escape. */
std::size_t sequence_length(std::string_view text)
{
    if (text.size() < 2)
        return 1;
    const std::string_view head = text.substr(0, longest_sequence);
    if (head[1] == '[')
    {
        std::size_t at = 2;
        while (at < head.size() && head[at] >= 0x20 && head[at] <= 0x3F)
            ++at;
        return at < head.size() && head[at] >= 0x40 && head[at] <= 0x7E ? at + 1 : 2;
    }
    if (head[1] == ']')
    {
        const std::size_t end = head.find(bell);
        return end == head.npos ? 2 : end + 1;
    }
    return head[1] >= 0x20 && head[1] <= 0x7E ? 2 : 1;
}

/** The trace of `pmxboard run` shows a text in quotes, with its line end written out. */
void unquote_trace(std::string& line)
{
    if (!line.ends_with('"') || (line.find("LOG") == line.npos && line.find("rintf \"") == line.npos))
        return;
    std::size_t end = line.find_last_not_of(" \"");
    if (end == line.npos || end == 0 || line[end] != 'n' || line[end - 1] != '\\')
        return;
    line.resize(end - 1);
}

/** The length of digits and a fraction at the beginning; 0 for none. */
std::size_t decimal_length(std::string_view text)
{
    std::size_t at = 0;
    while (at < text.size() && is_digit(text[at]))
        ++at;
    if (at == 0 || at + 1 >= text.size() || text[at] != '.' || !is_digit(text[at + 1]))
        return 0;
    ++at;
    while (at < text.size() && is_digit(text[at]))
        ++at;
    return at;
}

/** The length of hh:mm:ss with or without a fraction at the beginning; 0 for none. */
std::size_t clock_length(std::string_view text)
{
    constexpr std::string_view shape = "00:00:00";
    if (text.size() < shape.size())
        return 0;
    for (std::size_t i = 0; i < shape.size(); ++i)
    {
        if (shape[i] == ':' ? text[i] != ':' : !is_digit(text[i]))
            return 0;
    }
    std::size_t at = shape.size();
    if (at + 1 < text.size() && (text[at] == '.' || text[at] == ',') && is_digit(text[at + 1]))
    {
        ++at;
        while (at < text.size() && is_digit(text[at]))
            ++at;
    }
    return at;
}

double number(std::string_view text)
{
    std::string digits(text);
    std::replace(digits.begin(), digits.end(), ',', '.');
    return std::strtod(digits.c_str(), nullptr);
}

} // namespace

std::string clean(std::string_view line)
{
    std::string text;
    text.reserve(line.size());
    for (std::size_t at = 0; at < line.size();)
    {
        if (line[at] == escape)
        {
            at += sequence_length(line.substr(at));
            continue;
        }
        const auto byte = static_cast<unsigned char>(line[at++]);
        if (byte == '\t')
            text += ' ';
        else if (byte >= 0x20 && byte != 0x7F)
            text += static_cast<char>(byte);
    }
    unquote_trace(text);
    return text;
}

Stamp stamp_of(std::string_view line)
{
    line = line.substr(0, stamp_within);
    if (line.find("  LOG") != line.npos) // a trace, whose console lines have no times
        return {};
    for (std::size_t at = 0; at < line.size(); ++at)
    {
        if (!is_digit(line[at]) || (at > 0 && (is_digit(line[at - 1]) || line[at - 1] == '.')))
            continue;
        if (const std::size_t length = clock_length(line.substr(at)); length != 0)
        {
            const std::string_view clock = line.substr(at, length);
            return { std::string(clock),
                     number(clock.substr(0, 2)) * 3600 + number(clock.substr(3, 2)) * 60 + number(clock.substr(6)) };
        }
        const std::size_t length = decimal_length(line.substr(at));
        const std::size_t before = at == 0 ? line.npos : line.find_last_not_of(' ', at - 1);
        const char behind = at + length < line.size() ? line[at + length] : ' ';
        const bool alone = before == line.npos || line[before] == '[' || line[before] == '(' || line[before] == '>';
        if (length != 0 && alone && (behind == ' ' || behind == ']' || behind == ')' || behind == ':'))
        {
            return { std::string(line.substr(at, length)), number(line.substr(at, length)) };
        }
    }
    return {};
}

bool is_prefix(std::string_view before)
{
    const std::size_t last = before.find_last_not_of(' ');
    if (last == before.npos)
        return true;
    if (before.ends_with("AM ") || before.ends_with("PM "))
        return true;
    return is_digit(before[last]) ? last + 1 < before.size() : !is_word(before[last]);
}

} // namespace pmxboard::decode
