// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/clean.h"

#include <algorithm>
#include <cctype>
#include <regex>

#include "tools/pmxboard/decode/pattern.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::size_t longest_sequence = 64; ///< what is longer is rubbish, and is not searched for its end
constexpr std::size_t stamp_within = 48;

constexpr char escape = '\x1b';

/** The length of the terminal sequence at the beginning, which is an escape. */
std::size_t sequence_length(std::string_view text)
{
    static const std::regex sequence("\x1b(?:\\[[ -?]*[@-~]|\\][^\a]*\a|[ -~])?");
    text = text.substr(0, longest_sequence);
    std::cmatch found;
    std::regex_search(text.data(), text.data() + text.size(), found, sequence, std::regex_constants::match_continuous);
    return static_cast<std::size_t>(found.length());
}

/** The trace of `pmxboard run` shows a text in quotes, with its line end written out. */
void unquote_trace(std::string& line)
{
    if (!line.ends_with('"') || (line.find("LOG") == line.npos && line.find("rintf \"") == line.npos))
        return;
    const std::size_t end = line.find_last_not_of(" \"");
    if (end != line.npos && end != 0 && line[end] == 'n' && line[end - 1] == '\\')
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

Stamp stamp_of(std::string_view line)
{
    // A clock's time anywhere; a decimal number at the beginning or in a bracket.
    static const std::regex time("(?:^|[^0-9.])(([0-9]{2}):([0-9]{2}):([0-9]{2}(?:[.,][0-9]+)?))|"
                                 "(?:^|[\\[(>]) *([0-9]+\\.[0-9]+)(?=[ \\]):]|$)");
    line = line.substr(0, stamp_within);
    std::cmatch found;
    if (line.find("  LOG") != line.npos || // a trace, whose console lines have no times
        !std::regex_search(line.data(), line.data() + line.size(), found, time))
        return {};
    if (found[5].matched)
        return { found.str(5), std::stod(found.str(5)) };
    std::string seconds = found.str(4);
    std::replace(seconds.begin(), seconds.end(), ',', '.');
    return { found.str(1), std::stod(found.str(2)) * 3600 + std::stod(found.str(3)) * 60 + std::stod(seconds) };
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
