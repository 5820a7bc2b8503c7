// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Numbers that look random and follow from a seed alone. */
#pragma once

#include <cstddef>
#include <cstdint>

namespace lockstep
{

/** The bits of a number, stirred. */
inline std::uint64_t mixed(std::uint64_t number)
{
    number = (number ^ (number >> 30)) * 0xBF58476D1CE4E5B9;
    number = (number ^ (number >> 27)) * 0x94D049BB133111EB;
    return number ^ (number >> 31);
}

class Random
{
public:
    explicit Random(std::uint64_t seed) : m_state(mixed(seed + 1)) {}

    std::uint64_t next()
    {
        m_state += 0x9E3779B97F4A7C15;
        return mixed(m_state);
    }
    /** 0 to `count` - 1. */
    std::uint64_t below(std::uint64_t count) { return next() % count; }
    /** True once in so many times. */
    bool once_in(std::uint64_t times) { return below(times) == 0; }

    template <typename T, std::size_t count>
    T one_of(const T (&values)[count])
    {
        return values[below(count)];
    }

private:
    std::uint64_t m_state;
};

} // namespace lockstep
