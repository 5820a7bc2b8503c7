// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Kinds of arguments, and how a person writes a value of each:
 *
 *      12  0x0C  -1  0b1100  RES_1080P60HZ  TRUE        a number
 *      "text\n"                                         a text
 *      [7, 6, 5, 4, 3, 2, 1, 0]                         a list of so many items
 *      {fgOutputEnable=1, eResMode=RES_480P}            a record by field; fields left out are 0
 *      {1, RES_480P}  [1, RES_480P]                     a record in the order of its fields */
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "board/names.h"
#include "board/value.h"

namespace pmxboard
{

struct Kind
{
    enum class Form
    {
        Number,
        Text,
        List,
        Record
    };

    Form form = Form::Number;
    unsigned bits = 32;
    bool is_signed = false;
    board::names::Family family = board::names::Family::None;
    std::size_t count = 0;          ///< a list's number of items
    std::vector<std::string> names; ///< a record's fields
    std::vector<Kind> members;      ///< their kinds; a list: the kind of its items
};

/** Read a value; `what` is what the message calls it ("ucMode"). Throws LineError. */
board::Value read_value(const Kind& kind, std::string_view token, const std::string& what);

/** A text in quotes, without them. Throws LineError. */
std::string read_text(std::string_view token, const std::string& what);

/** The number that a token stands for, by itself or by a name of the family. A name of another family is refused:
 *  it would silently be something else. Throws LineError. */
std::int64_t read_number(board::names::Family family, std::string_view token, const std::string& what);

/** The number of a name that belongs to no family and so goes with any number: TRUE, FALSE, OSR_OK, PMX_SET_OK, … */
std::optional<std::int64_t> general_constant(std::string_view token);

/** The names of a family, by number. */
std::vector<std::string_view> names_in(board::names::Family family);

} // namespace pmxboard
