// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/duration.h"

#include <cstdint>
#include <stdexcept>
#include <string>

#include "board/tokens.h"

namespace board
{

std::optional<std::chrono::microseconds> read_duration(std::string_view written)
{
    const std::size_t unit_at = written.find_first_not_of("0123456789");
    if (unit_at == 0 || unit_at == written.npos)
        return std::nullopt;
    const std::string_view unit = written.substr(unit_at);
    const std::int64_t scale = unit == "s" ? 1000000 : unit == "ms" ? 1000 : unit == "us" ? 1 : 0;
    if (scale == 0)
        return std::nullopt;
    const std::string digits(written.substr(0, unit_at));
    if (digits.size() > 1 && digits[0] == '0')
        return std::nullopt;
    constexpr std::int64_t year = std::int64_t{ 366 } * 24 * 3600 * 1000000;
    const auto count = tokens::number(digits);
    if (!count || *count > year / scale)
        throw std::invalid_argument("the time in " + std::string(unit) + " is 0 to " + std::to_string(year / scale) +
                                    ", not " + digits);
    return std::chrono::microseconds(*count * scale);
}

} // namespace board
