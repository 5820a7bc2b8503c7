// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/page_limits.h"

#include <algorithm>
#include <string>

namespace pmxboard
{

std::size_t size_on_page(const board::Json& json)
{
    constexpr std::size_t more_for_an_angle = 5; // it stands there as \u003c
    const std::string text = board::written(json);
    return text.size() + more_for_an_angle * static_cast<std::size_t>(std::count(text.begin(), text.end(), '<'));
}

bool take(std::size_t& room, std::size_t size)
{
    if (size > room)
        return false;
    room -= size;
    return true;
}

} // namespace pmxboard
