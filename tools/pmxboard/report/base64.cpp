// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/base64.h"

#include <cstdint>

namespace pmxboard
{

std::string base64(std::string_view bytes)
{
    constexpr std::string_view letters = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string text;
    text.reserve((bytes.size() + 2) / 3 * 4);
    for (std::size_t begin = 0; begin < bytes.size(); begin += 3)
    {
        const std::string_view group = bytes.substr(begin, 3);
        std::uint32_t bits = 0;
        for (std::size_t i = 0; i < 3; ++i)
            bits = bits << 8 | (i < group.size() ? static_cast<unsigned char>(group[i]) : 0u);
        for (std::size_t i = 0; i < 4; ++i)
            text += i <= group.size() ? letters[bits >> (18 - 6 * i) & 63] : '=';
    }
    return text;
}

} // namespace pmxboard
