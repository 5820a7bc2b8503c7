// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How much of a run a page holds. */
#pragma once

#include <cstddef>

#include "board/json.h"

namespace pmxboard
{

/** A page of more would open slowly, or not at all: together they stay below 2 MB for each of its runs. Whatever goes
 *  onto a page takes its room from one of them, in bytes as the page has it; what finds none is counted, and the page
 *  says so. */
struct PageLimits
{
    std::size_t steps = 500;
    std::size_t texts = 600'000;    ///< commands, results, what they show and mean, expectations, reasons
    std::size_t entries = 500'000;  ///< of the trace
    std::size_t changes = 150'000;  ///< of the state
    std::size_t spans = 150'000;    ///< bars of the time line
    std::size_t pictures = 450'000; ///< new ones
    std::size_t told = 20'000;      ///< bytes that one step shows
};

/** What it takes on a page. */
std::size_t size_on_page(const board::Json& json);

/** Take something's room, where there is as much. */
bool take(std::size_t& room, std::size_t size);

} // namespace pmxboard
