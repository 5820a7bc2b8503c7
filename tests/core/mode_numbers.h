/** @file
 *  What the tests of the mode table ask about: every mode number, and groups of modes that are typed by name. */
#pragma once

#include <algorithm>
#include <initializer_list>
#include <map>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

#include "drv_if_pmx.h"

namespace mode_numbers
{

using Modes = std::set<UINT32>;

/** Number of modes that have facts of their own: RES_480I (0) to RES_3D_1080P24HZ_TB (46). */
inline constexpr UINT32 known = 47;

/** Every number that a byte holds, and some that it does not: the low byte of many of those names a mode, which must
 *  not count. */
inline std::vector<UINT32> all()
{
    std::vector<UINT32> numbers;
    for (UINT32 number = 0; number <= 256 + 2 * known; ++number)
        numbers.push_back(number);
    for (UINT32 number : { 0x00010000u, 0x0001000Au, 0x7FFFFFFFu, 0x80000000u, 0x8000000Cu, 0xFFFFFF00u, 0xFFFFFFFFu })
        numbers.push_back(number);
    return numbers;
}

/** The numbers of all() that have no facts of their own. */
inline std::vector<UINT32> unknown()
{
    std::vector<UINT32> numbers = all();
    std::erase_if(numbers, [](UINT32 number) { return number < known; });
    return numbers;
}

/** Modes of a list, each of which must be in it once. */
inline Modes modes(std::initializer_list<UINT32> list)
{
    Modes set;
    for (UINT32 mode : list)
        if (!set.insert(mode).second)
            throw std::logic_error("mode " + std::to_string(mode) + " is typed twice");
    return set;
}

/** A fact, and the modes that it holds for. */
template <typename Fact>
struct Group
{
    Fact fact;
    std::initializer_list<UINT32> modes;
};

/** Fact of each known mode. The groups name every mode, and none twice. */
template <typename Fact>
std::map<UINT32, Fact> by_mode(std::initializer_list<Group<Fact>> groups)
{
    std::map<UINT32, Fact> facts;
    for (const Group<Fact>& group : groups)
        for (UINT32 mode : group.modes)
            if (!facts.emplace(mode, group.fact).second)
                throw std::logic_error("mode " + std::to_string(mode) + " is typed twice");
    for (UINT32 mode = 0; mode < known; ++mode)
        if (!facts.contains(mode))
            throw std::logic_error("mode " + std::to_string(mode) + " is missing");
    if (facts.size() != known)
        throw std::logic_error("a number above the known modes is typed");
    return facts;
}

} // namespace mode_numbers
