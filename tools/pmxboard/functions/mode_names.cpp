// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/functions/mode_names.h"

#include <algorithm>
#include <cctype>

#include "board/names.h"
#include "board/tokens.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/kind.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

using board::names::Family;

constexpr std::string_view lead = "RES_";

bool is_digit(char c)
{
    return std::isdigit(static_cast<unsigned char>(c)) != 0;
}

std::string in_small_letters(std::string_view text)
{
    std::string small(text);
    std::transform(small.begin(), small.end(), small.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return small;
}

/** The number in front of HZ: "60", "23_976"; empty where none is, or where it is a height: 640x480HZ. */
std::string_view number_before_hz(std::string_view mode)
{
    const std::size_t end = mode.find("HZ");
    std::size_t begin = end == mode.npos ? 0 : end;
    while (begin > 0 && end != mode.npos && (is_digit(mode[begin - 1]) || mode[begin - 1] == '_'))
        --begin;
    const bool is_height = begin > 0 && mode[begin - 1] == 'x';
    return end == mode.npos || is_height ? std::string_view() : mode.substr(begin, end - begin);
}

/** What somebody may have written for a mode, without what all names have in common. */
std::string plain(std::string_view written)
{
    std::string text = in_small_letters(written);
    if (text.starts_with(in_small_letters(lead)))
        text.erase(0, lead.size());
    if (const std::size_t hz = text.rfind("hz"); hz != text.npos)
        text.erase(hz, 2);
    std::replace(text.begin(), text.end(), '_', '.');
    return text;
}

} // namespace

std::string refresh_of(std::string_view mode)
{
    std::string number(number_before_hz(mode));
    std::replace(number.begin(), number.end(), '_', '.');
    if (number.empty())
        return mode.find("480") != mode.npos ? "60" : mode.find("576") != mode.npos ? "50" : "";
    if (number.size() > 3 && number.find('.') == number.npos) // 23976
        number.insert(2, ".");
    return number;
}

std::string short_name_of(std::string_view mode)
{
    std::string name = in_small_letters(mode.substr(mode.starts_with(lead) ? lead.size() : 0));
    if (const std::size_t hz = name.rfind("hz"); hz != name.npos)
        name.erase(hz, 2);
    return name;
}

std::string full_name_of(unsigned mode)
{
    const std::string_view name = board::names::name_of(Family::ResolutionMode, mode);
    return name.empty() ? std::to_string(mode) : std::string(name);
}

std::vector<std::string> short_mode_names()
{
    std::vector<std::string> names;
    for (const std::string_view mode : names_in(Family::ResolutionMode))
        names.push_back(short_name_of(mode));
    return names;
}

unsigned read_mode(std::string_view written)
{
    const std::string wanted = plain(written);
    for (const std::string_view mode : names_in(Family::ResolutionMode))
    {
        const bool has_refresh = !number_before_hz(mode).empty();
        if (plain(mode) == wanted || (!has_refresh && plain(mode) + refresh_of(mode) == wanted))
            return static_cast<unsigned>(board::names::number_of(mode).value());
    }
    const bool is_full = written.starts_with(lead) || board::tokens::number(written) ||
                         std::all_of(written.begin(), written.end(), is_digit);
    const std::vector<std::string> known = short_mode_names();
    if (!is_full && !board::names::number_of(written))
        throw LineError("no mode is called " + std::string(written) +
                        did_you_mean(in_small_letters(written), { known.begin(), known.end() }));
    const Kind kind{ .bits = 8, .family = Family::ResolutionMode, .names = {}, .members = {} };
    return static_cast<unsigned>(read_value(kind, written, "mode").as_number());
}

} // namespace pmxboard
