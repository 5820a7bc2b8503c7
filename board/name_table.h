// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The tables of names, written from the headers when the board is built. */
#pragma once

#include <span>

#include "board/names.h"

namespace board::names
{

struct Row
{
    Family family;
    std::int64_t number;
    std::string_view name;
};

/** A parameter, a result or a field that takes the names of a family. */
struct Use
{
    std::string_view owner;    ///< function or record
    std::string_view argument; ///< "result", too
    Family family;
};

/** In the order of the families. */
std::span<const Row> rows();
/** Sorted by owner and argument. */
std::span<const Use> uses();

} // namespace board::names
