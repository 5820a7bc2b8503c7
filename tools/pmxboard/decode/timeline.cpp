// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/timeline.h"

#include <algorithm>
#include <cmath>

namespace pmxboard::decode
{
namespace
{

constexpr double day = 24.0 * 60 * 60;
constexpr double disorder = 1; ///< seconds that a buffer may put lines out of order

} // namespace

std::optional<double> between(const std::optional<Moment>& one, const std::optional<Moment>& other)
{
    if (!one || !other || one->base != other->base)
        return {};
    return other->seconds - one->seconds;
}

std::optional<Moment> Timeline::take(const Stamp& stamp)
{
    m_began_anew = false;
    if (!stamp.seconds)
        return {};
    const std::size_t decimals = std::min<std::size_t>(stamp.decimals, kinds / 2 - 1);
    auto& running = m_running[2 * decimals + (stamp.clock == Clock::Day ? 1 : 0)];
    if (!running)
        running = Running{ *stamp.seconds, 0, ++m_bases };
    const double fallen = running->seconds - *stamp.seconds;
    if (stamp.clock == Clock::Day && fallen > day / 2)
    {
        running->past += day;
    }
    else if (fallen > disorder)
    {
        m_began_anew = stamp.clock == Clock::Seconds;
        running = Running{ *stamp.seconds, 0, ++m_bases };
    }
    running->seconds = fallen > 0 && fallen <= disorder ? running->seconds : *stamp.seconds;
    return Moment{ *stamp.seconds + running->past, std::pow(0.1, static_cast<double>(decimals)), running->base };
}

bool is_banner(std::string_view line)
{
    constexpr std::string_view banners[] = { "U-Boot 2", "U-Boot SPL 2", "Linux version ", "Booting Linux on " };
    return line == "> power-on" || line.starts_with("> power-on ") ||
           std::any_of(std::begin(banners), std::end(banners), [&](std::string_view banner) {
               const std::size_t at = line.find(banner);
               return at != line.npos && is_prefix(line.substr(0, at));
           });
}

} // namespace pmxboard::decode
