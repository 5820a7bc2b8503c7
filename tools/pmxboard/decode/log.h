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
#include "tools/pmxboard/decode/timeline.h"

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
    std::optional<Moment> moment;    ///< the same as a number
    std::size_t boot = 0;            ///< how often the system had begun anew before
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

/** Where the system began anew. */
struct Boot
{
    std::size_t line = 0;
    std::string time;
    std::size_t item = 0; ///< the first behind it
};

struct Log
{
    /** What the bytes are. */
    enum class Form
    {
        Console,
        Trace ///< JSON lines of a run
    };

    Form form = Form::Console;
    std::vector<Item> items;
    std::vector<std::size_t> order; ///< of the items, as they were printed, without those that stand twice
    std::vector<Boot> boots;        ///< apart from what it begins with
    std::size_t twice = 0;          ///< items that stand once more
    std::size_t displaced = 0;      ///< items that stand behind younger ones
    std::vector<Shown> shown;
    std::size_t lines = 0;
    std::size_t foreign = 0; ///< lines without any text of the layer, empty ones apart
    std::size_t cut = 0;
    std::optional<int> level;  ///< the highest level of PMX_IsLog that it shows
    std::optional<Moment> end; ///< the last moment that a line tells, of whomever it is
    std::size_t end_boot = 0;  ///< how often the system has begun anew
};

/** Any bytes are a log, and a trace in JSON lines is read as what it is. The work grows with their number, however they
 *  are divided into lines. */
Log read_log(std::string_view bytes);

/** A text of the layer as it was printed, alone on its line. Nothing: it is not one of the table. */
std::optional<Item> read_text(std::string_view printed);

/** A number as the layer prints it. */
std::optional<std::int64_t> number_of(std::string_view digits, int base = 10);

} // namespace pmxboard::decode
