// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/pattern.h"

#include <algorithm>
#include <cctype>

namespace pmxboard::decode
{
namespace
{

constexpr std::string_view null_name = "(null)";

// More than the layer ever prints, so that rubbish cannot keep a match busy.
constexpr std::size_t most_digits = 20;
constexpr std::size_t most_blanks = 8;
constexpr std::size_t longest_name = 40;

constexpr std::size_t weak_literal = 30;
constexpr std::size_t short_expression = 20;

bool is_digit(char c)
{
    return std::isdigit(static_cast<unsigned char>(c)) != 0;
}

bool is_hex(char c)
{
    return std::isxdigit(static_cast<unsigned char>(c)) != 0;
}

/** How many characters at the beginning are of a kind, at most so many. */
std::size_t run_length(std::string_view text, bool (*is_of_kind)(char), std::size_t most)
{
    text = text.substr(0, most);
    return static_cast<std::size_t>(std::find_if_not(text.begin(), text.end(), is_of_kind) - text.begin());
}

/** The length of what a conversion prints at the beginning of a line; 0 for nothing of it. */
std::size_t value_length(char conversion, std::string_view line)
{
    if (conversion == 's')
        return line.starts_with(null_name) ? null_name.size() : run_length(line, is_word, longest_name);
    const bool hex = conversion == 'x';
    const std::size_t lead = hex ? std::min(line.find_first_not_of(' '), most_blanks) : line.starts_with('-');
    const std::size_t begin = std::min(lead, line.size());
    const std::size_t length = run_length(line.substr(begin), hex ? is_hex : is_digit, most_digits);
    return length == 0 ? 0 : begin + length;
}

/** Whether a line may have ended within a value. */
bool is_begin_of_value(std::string_view line)
{
    return line.size() <= most_blanks && (line.find_first_not_of(" -") == line.npos || null_name.starts_with(line));
}

bool is_weak(const Text& text, std::string_view format)
{
    std::size_t literal = format.size();
    for (std::size_t at = format.find('%'); at != format.npos; at = format.find('%', at + 1))
        literal -= conversion_length(format.substr(at));
    return text.level != level_assertion && literal < weak_literal && is_word(format.front());
}

std::vector<Pattern> compile_all()
{
    std::vector<Pattern> all;
    for (const Text& text : texts())
    {
        const std::string_view format = visible(text.format);
        const bool told_by_its_file = text.level == level_assertion && text.format.size() < short_expression;
        const bool twin = !all.empty() && all.back().format == format;
        if (!told_by_its_file && !twin)
            all.push_back({ &text, format, format.substr(0, format.find('%')), is_weak(text, format) });
    }
    return all;
}

} // namespace

std::string_view visible(std::string_view format)
{
    return format.substr(0, format.find_last_not_of(" \n") + 1);
}

bool is_word(char c)
{
    return std::isalnum(static_cast<unsigned char>(c)) != 0 || c == '_';
}

std::size_t conversion_length(std::string_view format)
{
    return format.starts_with('%') ? format.find_first_of("dxs") + 1 : 0;
}

const std::vector<Pattern>& patterns()
{
    static const std::vector<Pattern> all = compile_all();
    return all;
}

std::span<const Pattern* const> patterns_of(char first)
{
    static const auto by_first = [] {
        std::array<std::vector<const Pattern*>, 256> lists;
        for (const Pattern& pattern : patterns())
            lists[static_cast<unsigned char>(pattern.format.front())].push_back(&pattern);
        return lists;
    }();
    return by_first[static_cast<unsigned char>(first)];
}

Match match(std::string_view format, std::string_view line)
{
    Match found;
    while (!format.empty())
    {
        const std::string_view rest = line.substr(found.end);
        const std::size_t conversion = conversion_length(format);
        const std::size_t length =
            conversion == 0 ? rest.starts_with(format.front()) : value_length(format[conversion - 1], rest);
        if (length == 0)
        {
            const bool ran_out = conversion == 0 ? rest.empty() : is_begin_of_value(rest);
            found.state = ran_out ? Match::State::RanOut : Match::State::No;
            return found;
        }
        if (conversion == 0)
            ++found.literal;
        else
            found.values.at(found.count++) = board::tokens::trim(rest.substr(0, length));
        found.end += length;
        format.remove_prefix(std::max<std::size_t>(conversion, 1));
    }
    found.state = Match::State::Whole;
    return found;
}

} // namespace pmxboard::decode
