// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/line.h"

#include "tools/pmxboard/functions/errors.h"

namespace pmxboard
{
namespace
{

constexpr std::string_view blanks = " \t\r\n\v\f";
constexpr std::size_t most_words = 1000;
constexpr std::size_t deepest = 32; ///< brackets within brackets

char closing_of(char open)
{
    return open == '[' ? ']' : open == '{' ? '}' : ')';
}

/** Index behind the quote that closes the one at `open`. */
std::size_t behind_quotes(std::string_view text, std::size_t open)
{
    for (std::size_t i = open + 1; i < text.size(); ++i)
    {
        if (text[i] == '\\')
            ++i;
        else if (text[i] == '"')
            return i + 1;
    }
    throw LineError("a quote does not close: " + std::string(text.substr(open)));
}

/** Index behind the word that begins at `start`. */
std::size_t behind_word(std::string_view text, std::size_t start)
{
    std::string open;
    std::size_t i = start;
    while (i < text.size())
    {
        const char c = text[i];
        if (open.empty() && (blanks.find(c) != blanks.npos || c == '#'))
            break;
        if (c == '"')
        {
            i = behind_quotes(text, i);
            continue;
        }
        if (c == '[' || c == '{' || c == '(')
        {
            if (open.size() == deepest)
                throw LineError("brackets stand more than " + std::to_string(deepest) + " deep in each other");
            open += c;
        }
        else if (c == ']' || c == '}' || c == ')')
        {
            if (open.empty() || closing_of(open.back()) != c)
                throw LineError(std::string("a '") + c + "' closes nothing: " + std::string(text.substr(start)));
            open.pop_back();
        }
        ++i;
    }
    if (!open.empty())
        throw LineError(std::string("a '") + open.back() + "' does not close: " + std::string(text.substr(start)));
    return i;
}

} // namespace

Line::Line(std::string_view text)
{
    std::size_t i = 0;
    std::size_t end = 0;
    while ((i = text.find_first_not_of(blanks, i)) != text.npos && text[i] != '#')
    {
        if (m_words.size() == most_words)
            throw LineError("a line has more than " + std::to_string(most_words) + " words");
        end = behind_word(text, i);
        m_words.emplace_back(text.substr(i, end - i));
        m_starts.push_back(i);
        i = end;
    }
    m_text = text.substr(0, end);
}

std::string Line::from(std::size_t index) const
{
    return index < m_starts.size() ? m_text.substr(m_starts[index]) : std::string();
}

} // namespace pmxboard
