// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  One line of a scenario, taken apart. */
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace pmxboard
{

/** Words of a line: separated by blanks; quotes, […], {…} and (…) hold together. A `#` outside of quotes begins a
 *  comment. */
class Line
{
public:
    /** Throws LineError when quotes or brackets do not close. */
    explicit Line(std::string_view text);

    bool empty() const { return m_words.empty(); }
    std::size_t size() const { return m_words.size(); }
    const std::string& word(std::size_t index) const { return m_words.at(index); }
    const std::vector<std::string>& words() const { return m_words; }
    /** The line as written from a word on, without comment and outer blanks; empty when there is no such word. */
    std::string from(std::size_t index) const;

private:
    std::string m_text;
    std::vector<std::string> m_words;
    std::vector<std::size_t> m_starts;
};

} // namespace pmxboard
