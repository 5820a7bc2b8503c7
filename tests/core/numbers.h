// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Enumerators and constants against the numbers that they must have. */
#pragma once

#include <type_traits>
#include <vector>

#include <gtest/gtest.h>

#include "x_typedef.h"

namespace numbers
{

struct Number
{
    const char* name;
    UINT32 actual;
    UINT32 expected;
};

#define NUMBER(name, expected)                       \
    {                                                \
#name, static_cast < UINT32>(name), expected \
    }

inline void expect_numbers(const std::vector<Number>& numbers)
{
    for (const Number& number : numbers)
        EXPECT_EQ(number.expected, number.actual) << number.name;
}

template <typename... Enumerations>
constexpr bool all_are_32_bits_wide = ((sizeof(Enumerations) == 4 && std::is_enum_v<Enumerations>)&&...);

} // namespace numbers
