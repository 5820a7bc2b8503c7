// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A captured console log: which of the layer's texts stand on which line, whatever else a serial console put there. */
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/decode/texts.h"

namespace pmxboard::decode
{

/** One of the layer's texts in a log. */
struct Item
{
    enum class Cut
    {
        None,
        Begin, ///< the capture lost its beginning
        End    ///< the capture lost its end
    };

    const Text* text = nullptr;
    std::vector<std::string> values; ///< as printed, without padding; of an assertion: its source file and line
    std::size_t line = 0;            ///< counted from 1
    std::size_t last_line = 0;       ///< where it ends, when something foreign broke it in two
    std::string time;                ///< the time stamp that stands before it, as written
    std::optional<double> seconds;   ///< the same as a number
    Cut cut = Cut::None;
    std::string shown; ///< what the console showed of it

    /** A value by its name; empty when there is none. */
    std::string value(std::string_view name) const;
    std::optional<std::int64_t> number(std::string_view name) const;
};

/** A line or a part of one, for people who want to see all of them. */
struct Shown
{
    std::size_t line = 0;
    std::optional<std::size_t> item; ///< its place among the items; nothing: foreign
    std::string foreign;             ///< its beginning, fit for a terminal
};

struct Log
{
    std::vector<Item> items;
    std::vector<Shown> shown;
    std::size_t lines = 0;
    std::size_t foreign = 0; ///< lines without any text of the layer, empty ones apart
    std::size_t cut = 0;
    std::optional<int> level; ///< the highest level of PMX_IsLog that it shows
};

/** Any bytes are a log. The work grows with their number, however they are divided into lines. */
Log read_log(std::string_view bytes);

/** A text of the layer as it was printed, alone on its line. Nothing: it is not one of the table. */
std::optional<Item> read_text(std::string_view printed);

/** A number as the layer prints it. */
std::optional<std::int64_t> number_of(std::string_view digits, int base = 10);

} // namespace pmxboard::decode
