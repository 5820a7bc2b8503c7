// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/clean.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <optional>

#include "tools/pmxboard/decode/pattern.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::size_t longest_sequence = 64; ///< what is longer is rubbish, and is not searched for its end
constexpr std::size_t stamps_within = 96;    ///< of a line: several may stand there, with names between them

constexpr char escape = '\x1b';
constexpr char bell = '\a';

// Every line of a log comes through here, and nearly every one has a time stamp: regular expressions would take longer
// than the recognition of all texts.

bool is_between(char c, char first, char last)
{
    return c >= first && c <= last;
}

/** The length of the terminal sequence at the beginning, which is an escape. */
std::size_t sequence_length(std::string_view text)
{
    text = text.substr(0, longest_sequence);
    const char kind = text.size() > 1 ? text[1] : bell;
    if (kind == '[')
    {
        const auto is_parameter = [](char c) { return is_between(c, ' ', '?'); };
        const auto end = std::find_if_not(text.begin() + 2, text.end(), is_parameter);
        return end != text.end() && is_between(*end, '@', '~') ? static_cast<std::size_t>(end - text.begin()) + 1 : 2;
    }
    if (const std::size_t end = text.find(bell); kind == ']' && end != text.npos)
        return end + 1;
    return is_between(kind, ' ', '~') ? 2 : 1;
}

/** How many digits stand at the beginning. */
std::size_t digits_in(std::string_view text)
{
    return std::min(text.find_first_not_of(digits), text.size());
}

/** The length of a fraction at the beginning, with its point, which is one of these characters; 0 for none. */
std::size_t fraction_length(std::string_view text, std::string_view points)
{
    if (text.empty() || points.find(text.front()) == points.npos)
        return 0;
    const std::size_t count = digits_in(text.substr(1));
    return count == 0 ? 0 : 1 + count;
}

double number_in(std::string_view text)
{
    double number = 0;
    std::from_chars(text.data(), text.data() + text.size(), number);
    return number;
}

unsigned decimals_of(std::string_view number)
{
    const std::size_t point = number.find_first_of(".,");
    return point == number.npos ? 0 : static_cast<unsigned>(number.size() - point - 1);
}

/** Twelve hours that stand behind a clock's time: 12 is the first of them. */
double half_day(std::string_view behind, double hour)
{
    constexpr double hours = 12;
    if (behind.starts_with(" PM"))
        return hour < hours ? hour + hours : hour;
    return behind.starts_with(" AM") && hour == hours ? 0 : hour;
}

/** A clock's time at the beginning: 12:30:45, with or without a fraction. */
std::optional<Stamp> clock_at(std::string_view text)
{
    constexpr std::string_view shape = "00:00:00";
    if (text.size() < shape.size() || text[2] != ':' || text[5] != ':' || digits_in(text) != 2 ||
        digits_in(text.substr(3)) != 2 || digits_in(text.substr(6)) < 2)
        return {};
    std::string clock(text.substr(0, shape.size() + fraction_length(text.substr(shape.size()), ".,")));
    const std::string_view written = clock;
    std::string seconds(written.substr(6));
    std::replace(seconds.begin(), seconds.end(), ',', '.');
    const double hour = half_day(text.substr(clock.size()), number_in(written.substr(0, 2)));
    const unsigned decimals = decimals_of(seconds);
    return Stamp{ clock, hour * 3600 + number_in(written.substr(3, 2)) * 60 + number_in(seconds), Clock::Day,
                  decimals };
}

/** Seconds at the beginning: a decimal number that nothing goes on with. */
std::optional<Stamp> seconds_at(std::string_view text)
{
    const std::size_t whole = digits_in(text);
    const std::size_t length = whole + fraction_length(text.substr(whole), ".");
    const bool is_alone = length == text.size() || std::string_view(" ]):").find(text[length]) != text.npos;
    if (length == whole || !is_alone)
        return {};
    return Stamp{ std::string(text.substr(0, length)), number_in(text.substr(0, length)), Clock::Seconds,
                  decimals_of(text.substr(0, length)) };
}

/** Whether such a number may stand behind this: at the beginning of a line, or in a bracket of its own; behind a name a
 *  bracket has a process's number. */
bool is_before_seconds(std::string_view before)
{
    const std::size_t last = before.find_last_not_of(' ');
    if (last == before.npos || before[last] == '>')
        return true;
    return (before[last] == '[' || before[last] == '(') &&
           (last == 0 || before[last - 1] == ' ' || before[last - 1] == '>');
}

/** The trace of `pmxboard run` shows a text in quotes, with its line end written out. */
void unquote_trace(std::string& line)
{
    if (!line.ends_with('"') || (line.find("LOG") == line.npos && line.find("rintf \"") == line.npos))
        return;
    const std::size_t end = line.find_last_not_of(" \""); // there are letters, and not at the beginning alone
    if (line[end] == 'n' && line[end - 1] == '\\')
        line.resize(end - 1);
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

Stamp stamp_of(std::string_view lead)
{
    lead = lead.substr(0, stamps_within);
    if (lead.find("  LOG") != lead.npos) // a trace, whose console lines have no times
        return {};
    Stamp finest;
    for (std::size_t at = lead.find_first_of(digits); at < lead.size(); at = lead.find_first_of(digits, at))
    {
        const std::string_view number = lead.substr(at);
        const std::string_view before = lead.substr(0, at);
        std::optional<Stamp> found = before.ends_with('.') ? std::nullopt : clock_at(number);
        if (!found && is_before_seconds(before))
            found = seconds_at(number);
        at += found ? found->text.size() : digits_in(number);
        if (found && found->decimals >= finest.decimals)
            finest = std::move(*found);
    }
    return finest;
}

bool is_prefix(std::string_view before)
{
    const std::size_t last = before.find_last_not_of(' ');
    if (last == before.npos)
        return true;
    if (before.ends_with("AM ") || before.ends_with("PM "))
        return true;
    return std::isdigit(static_cast<unsigned char>(before[last])) != 0 ? last + 1 < before.size()
                                                                       : !is_word(before[last]);
}

} // namespace pmxboard::decode
