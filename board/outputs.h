// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What somebody writes for an output of a platform function, and putting it there: a number or a name, a list, bytes,
 *  a text in quotes, a record by field. A null pointer takes nothing. Each throws std::invalid_argument with the reason
 *  when the text is none for that output. */
#pragma once

#include <climits>
#include <cstddef>
#include <cstdint>
#include <string_view>
#include <type_traits>
#include <vector>

#include "board/names.h"

namespace board::outputs
{

/** A number of so many bits, signed or not, or a name of the family or of none. */
std::int64_t read_number(std::string_view written, unsigned bits, names::Family family = names::Family::None);
/** The items of "[a, b]", each as a number of so many bits. */
std::vector<std::int64_t> read_list(std::string_view written, unsigned bits);

template <typename T>
void put_number(T* there, std::string_view written)
{
    const std::int64_t number = read_number(written, sizeof(T) * CHAR_BIT);
    if (there != nullptr)
        *there = static_cast<T>(number);
}

/** Exactly so many items. */
void check_count(std::size_t found, std::size_t wanted);

template <typename T>
void put_list(T* there, std::size_t count, std::string_view written)
{
    const std::vector<std::int64_t> items = read_list(written, sizeof(T) * CHAR_BIT);
    check_count(items.size(), count);
    for (std::size_t i = 0; there != nullptr && i < count; ++i)
        there[i] = static_cast<T>(items[i]);
}

/** As many of the bytes as there is room for. */
void put_bytes(void* there, std::size_t room, std::string_view written);
/** As much of the text as there is room for, and its end. */
void put_text(char* there, std::size_t room, std::string_view written);
/** A small number that travels in the pointer. */
void put_tag(void** there, std::string_view written);

/** The fields that are named; the others stay as they are. */
template <typename Record>
void put_record(Record* there, std::string_view written);

} // namespace board::outputs
