// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How devices report what they hold. A setting that nobody has made since power-on is reported as null, so that "never
 *  programmed" and "programmed with 0" stay apart. */
#pragma once

#include <optional>
#include <vector>

#include "board/names.h"
#include "board/value.h"

namespace board
{

/** A number with its name, where the family has one for it. */
inline Value named(names::Family family, std::int64_t number)
{
    return Value::number(number, names::name_of(family, number));
}

/** A switch: 0 or 1. */
inline Value flag(bool on)
{
    return Value::number(on ? 1 : 0);
}

/** A number that may never have been set. */
template <typename Number>
Value setting(const std::optional<Number>& number, names::Family family = names::Family::None)
{
    return number ? named(family, static_cast<std::int64_t>(*number)) : Value::null();
}

/** A list of numbers. */
template <typename Numbers>
Value numbers(const Numbers& items)
{
    std::vector<Value> values;
    for (const auto item : items)
        values.push_back(Value::number(static_cast<std::int64_t>(item)));
    return Value::list(std::move(values));
}

/** A list of numbers that may never have been set. */
template <typename Numbers>
Value numbers(const std::optional<Numbers>& items)
{
    return items ? numbers(*items) : Value::null();
}

} // namespace board
