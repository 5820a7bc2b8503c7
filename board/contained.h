// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Where an exception ends that must not go on: in a function that the layer or a C program has called, for those have
 *  no unwind tables, and in a destructor. Whoever had the call made asks for it: meanwhiles::rethrow_failure(). */
#pragma once

#include <type_traits>

namespace board
{

/** While an exception is handled: keep it, unless an earlier one is kept.
 *  @param function  that could not do its work; null: what it throws says enough */
void keep_failure(const char* function) noexcept;

/** Carry an action out; what it throws is kept. */
template <typename Action>
void contained(const Action& action) noexcept
{
    try
    {
        action();
    }
    catch (...)
    {
        keep_failure(nullptr);
    }
}

/** What a platform function answers that could not do its work: as a device that fails. */
template <typename Result>
Result failed_answer() noexcept
{
    if constexpr (std::is_same_v<Result, int>)
        return -1;
    else
        return Result();
}

} // namespace board
