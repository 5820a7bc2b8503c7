// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Every text that the layer writes to the console, each with what it means: the one table that recognition, the story
 *  and the comparison stand on. A test holds it against the texts in the layer's object. */
#pragma once

#include <span>
#include <string_view>
#include <vector>

#include "board/tokens.h"

namespace pmxboard::decode
{

struct Item;
struct Teller;

/** What the story makes of a text. */
using Rule = void (*)(Teller& story, const Item& item);

/** The rules that there are; the story has them. */
namespace rules
{
using Function = void(Teller& story, const Item& item);

Function opens;   ///< an operation begins
Function heads;   ///< begins an operation, unless it is part of the one that is running
Function goes_on; ///< goes on with an operation
Function starts;  ///< ends a start-up: what was before is over

Function mode_ex;      ///< a per-output mode setting begins
Function output;       ///< one of the four outputs that it asks for
Function digital_port; ///< the set-up of the digital port that it asks for
Function fifth_osd;    ///< the fifth OSD plane that it asks for
Function no_wait;      ///< it does not wait for the display part, and lowers its flag

Function flag;      ///< the display part's flag
Function held_back; ///< graphics leave the mix
Function timer_set;
Function timed_out;
Function osd_flag; ///< whether graphics wait for their return
Function osd_back; ///< graphics may return
Function ready;    ///< somebody asks whether the display part switches

Function report;    ///< a line of the status report
Function assertion; ///< an assertion's expression, or its source file
} // namespace rules

/** Levels of what PMX_IsLog does not print. */
constexpr int level_plain = -1;     ///< Printf, UTIL_Printf: whatever the console's level is
constexpr int level_assertion = -2; ///< the expression of an assertion, the same
constexpr int level_file = -3;      ///< the source file that an assertion names beside it

struct Text
{
    int level;
    std::string_view format;
    std::string_view values;     ///< their names, with commas between
    std::string_view operations; ///< the one that prints it, and then those that come there; with commas between
    std::string_view step;       ///< what it says of the operation's progress
    std::string_view tale;       ///< its sentence in the story, {name} standing for a value; empty: none of its own
    Rule rule = rules::goes_on;
    bool problem = false;       ///< says that something went wrong
    std::string_view file = {}; ///< that reports an assertion

    bool is_assertion() const { return level <= level_assertion; }
};

/** The table. Texts that differ in blanks at their end alone stand one after the other. */
std::span<const Text> texts();

using board::tokens::split;

/** Whether a list with commas has an item. */
bool has(std::string_view list, std::string_view item);

} // namespace pmxboard::decode
