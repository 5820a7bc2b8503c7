// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Where what is drawn comes from: a seed, or a fuzzer's bytes. */
#pragma once

#include <cstddef>
#include <cstdint>
#include <iterator>

namespace soak
{

class Choices
{
public:
    Choices() = default;
    virtual ~Choices() = default;
    Choices(const Choices&) = delete;
    Choices& operator=(const Choices&) = delete;

    /** Any number of 64 bits. */
    virtual std::uint64_t any() = 0;
    /** 0 to `count` - 1. */
    virtual std::uint64_t below(std::uint64_t count) = 0;

    /** True once in so many times. */
    bool once_in(std::uint64_t times) { return below(times) == 0; }
    template <typename List>
    const auto& one_of(const List& list)
    {
        return *(std::begin(list) + static_cast<std::ptrdiff_t>(below(std::size(list))));
    }
};

} // namespace soak
