// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/tokens.h"

#include <charconv>
#include <stdexcept>
#include <string>

namespace board::tokens
{
namespace
{

char partner(char open)
{
    switch (open)
    {
    case '(': return ')';
    case '[': return ']';
    case '{': return '}';
    default: return '\0';
    }
}

/** Position of the quote that ends the text which begins at `quote`. */
std::size_t closing_quote(std::string_view text, std::size_t quote)
{
    for (std::size_t i = quote + 1; i < text.size(); ++i)
    {
        if (text[i] == '\\')
            ++i;
        else if (text[i] == '"')
            return i;
    }
    throw std::invalid_argument("a text is not closed: " + std::string(text.substr(quote)));
}

/** Where a bracket closes that stands in so many others. */
std::size_t closing_within(std::string_view text, std::size_t open, unsigned depth)
{
    constexpr unsigned deepest = 64;
    if (depth == deepest)
        throw std::invalid_argument("brackets stand more than " + std::to_string(deepest) + " deep in each other");
    const char close = partner(text[open]);
    for (std::size_t i = open + 1; i < text.size(); ++i)
    {
        if (text[i] == close)
            return i;
        if (text[i] == '"')
            i = closing_quote(text, i);
        else if (partner(text[i]) != '\0')
            i = closing_within(text, i, depth + 1);
        else if (text[i] == ')' || text[i] == ']' || text[i] == '}')
            break;
    }
    throw std::invalid_argument("a bracket is not closed: " + std::string(text.substr(open)));
}

} // namespace

std::string_view trim(std::string_view text)
{
    const std::size_t first = text.find_first_not_of(" \t");
    if (first == text.npos)
        return {};
    return text.substr(first, text.find_last_not_of(" \t") - first + 1);
}

std::optional<std::int64_t> number(std::string_view token)
{
    const bool negative = token.starts_with('-');
    if (negative || token.starts_with('+'))
        token.remove_prefix(1);
    int base = 10;
    if (token.size() > 2 && token[0] == '0')
    {
        const char letter = token[1];
        base = letter == 'x' || letter == 'X' ? 16 : letter == 'o' ? 8 : letter == 'b' ? 2 : 10;
        if (base != 10)
            token.remove_prefix(2);
    }
    std::uint64_t magnitude = 0;
    const char* const end = token.data() + token.size();
    const auto [stop, error] = std::from_chars(token.data(), end, magnitude, base);
    constexpr std::uint64_t most = std::uint64_t{ 1 } << 63;
    if (token.empty() || error != std::errc{} || stop != end || magnitude > most - (negative ? 0 : 1))
        return std::nullopt;
    return static_cast<std::int64_t>(negative ? 0 - magnitude : magnitude);
}

std::size_t closing(std::string_view text, std::size_t open)
{
    return closing_within(text, open, 0);
}

std::string_view inside(std::string_view token, char open, char close)
{
    if (token.size() < 2 || token.front() != open || closing(token, 0) != token.size() - 1)
        throw std::invalid_argument(std::string("this does not stand between ") + open + " and " + close + ": " +
                                    std::string(token));
    return token.substr(1, token.size() - 2);
}

std::vector<std::string_view> split(std::string_view text)
{
    std::vector<std::string_view> parts;
    if (trim(text).empty())
        return parts;
    std::size_t begin = 0;
    for (std::size_t i = 0; i <= text.size(); ++i)
    {
        if (i == text.size() || text[i] == ',')
        {
            parts.push_back(trim(text.substr(begin, i - begin)));
            if (parts.back().empty())
                throw std::invalid_argument("nothing stands before or behind a comma: " + std::string(text));
            begin = i + 1;
        }
        else if (text[i] == '"')
            i = closing_quote(text, i);
        else if (partner(text[i]) != '\0')
            i = closing(text, i);
        else if (text[i] == ')' || text[i] == ']' || text[i] == '}')
            throw std::invalid_argument("a bracket closes that was not opened: " + std::string(text));
    }
    return parts;
}

} // namespace board::tokens
