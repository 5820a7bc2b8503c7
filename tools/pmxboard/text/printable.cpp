// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/text/printable.h"

#include <algorithm>

namespace pmxboard
{
namespace
{

struct Character
{
    char32_t code = 0;
    std::size_t length = 0; ///< bytes; 0: not UTF-8
};

Character first_character(std::string_view bytes)
{
    const auto lead = static_cast<unsigned char>(bytes[0]);
    if (lead < 0x80)
        return { lead, 1 };
    const std::size_t length = lead >= 0xF0 && lead <= 0xF4 ? 4 : lead >= 0xE0 && lead < 0xF0 ? 3 : 2;
    if (lead < 0xC2 || lead > 0xF4 || bytes.size() < length)
        return {};
    char32_t code = lead & (0xFFu >> (length + 1));
    for (std::size_t i = 1; i < length; ++i)
    {
        const auto byte = static_cast<unsigned char>(bytes[i]);
        if ((byte & 0xC0) != 0x80)
            return {};
        code = code << 6 | (byte & 0x3F);
    }
    const bool overlong = (length == 3 && code < 0x800) || (length == 4 && code < 0x10000);
    const bool surrogate = code >= 0xD800 && code <= 0xDFFF;
    return overlong || surrogate || code > 0x10FFFF ? Character{} : Character{ code, length };
}

/** Characters that a terminal acts on, that nobody sees, or that are none, which XML does not take. */
bool is_control(char32_t code)
{
    return code < 0x20 || (code >= 0x7F && code < 0xA0) || code == 0xAD || (code >= 0x200B && code <= 0x200F) ||
           (code >= 0x2028 && code <= 0x202E) || (code >= 0x2060 && code <= 0x206F) || code == 0xFEFF ||
           (code >= 0xFFF0 && code <= 0xFFFB) || (code & 0xFFFE) == 0xFFFE || (code >= 0xE0000 && code <= 0xE0FFF);
}

/** East Asian characters and pictures take two columns. */
bool is_wide(char32_t code)
{
    return (code >= 0x1100 && code <= 0x115F) || (code >= 0x2E80 && code <= 0xA4CF) ||
           (code >= 0xAC00 && code <= 0xD7A3) || (code >= 0xF900 && code <= 0xFAFF) ||
           (code >= 0xFE30 && code <= 0xFE6F) || (code >= 0xFF00 && code <= 0xFF60) ||
           (code >= 0x1F000 && code <= 0x1FAFF) || (code >= 0x20000 && code <= 0x3FFFD);
}

/** Characters of one byte and one column, as nearly all are. */
bool is_plain(char c)
{
    return c >= ' ' && c <= '~';
}

} // namespace

std::string printable(std::string_view bytes, std::size_t columns)
{
    if (bytes.size() <= columns && std::all_of(bytes.begin(), bytes.end(), is_plain))
        return std::string(bytes);
    constexpr std::string_view hex = "0123456789ABCDEF";
    std::string text;
    std::size_t kept = 0; // bytes of text that leave a column for the mark
    std::size_t width = 0;
    while (!bytes.empty())
    {
        const Character character = first_character(bytes);
        const std::size_t length = character.length == 0 ? 1 : character.length;
        std::string shown(bytes.substr(0, length));
        std::size_t shown_width = is_wide(character.code) ? 2 : 1;
        if (character.length == 0 || is_control(character.code))
        {
            shown.clear();
            for (const char c : bytes.substr(0, length))
            {
                const auto byte = static_cast<unsigned char>(c);
                shown.append("\\x").append(1, hex[byte >> 4]).append(1, hex[byte & 0xF]);
            }
            shown_width = shown.size();
        }
        if (width + shown_width > columns)
        {
            text.resize(kept);
            return columns == 0 ? text : text + "…";
        }
        width += shown_width;
        text += shown;
        if (width < columns)
            kept = text.size();
        bytes.remove_prefix(length);
    }
    return text;
}

std::string printable_lines(std::string_view text)
{
    std::string lines;
    while (!text.empty())
    {
        const std::size_t length = std::min(text.find_first_of("\n\t"), text.size());
        lines += printable(text.substr(0, length));
        text.remove_prefix(length);
        if (text.empty())
            break;
        lines += text.front();
        text.remove_prefix(1);
    }
    return lines;
}

} // namespace pmxboard
