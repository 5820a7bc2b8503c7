// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/digest.h"

#include <charconv>
#include <cstdint>
#include <iterator>

namespace board
{

/** FNV-1a, to tell contents apart: nobody forges an image here. */
std::string digest_of(std::string_view content)
{
    std::uint64_t digest = 0xCBF29CE484222325;
    for (const char byte : content)
        digest = (digest ^ static_cast<unsigned char>(byte)) * 0x100000001B3;
    char digits[16];
    const auto written = std::to_chars(std::begin(digits), std::end(digits), digest, 16);
    return { digits, written.ptr };
}

} // namespace board
