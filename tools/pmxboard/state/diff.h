// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What differs between two states. */
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "board/value.h"

namespace pmxboard
{

struct Change
{
    std::string path;                  ///< "record.ucMode", "os.mutexes[0].held"
    std::optional<board::Value> older; ///< absent: there was no such thing
    std::optional<board::Value> newer; ///< absent: it is gone
};

/** Clocks and counters change with nearly every command, and are seldom what one looks for. */
bool is_counter(const std::string& path);

/** The changed leaves: first the layer's, then the devices', then clocks and counters of calls, each in the order of
 *  the state. What is there on one side alone is one change, with all that is in it. */
std::vector<Change> changes(const board::Value& older, const board::Value& newer);

/** Those at or below one of the paths; a path of the layer goes with and without its group's name ("ucMode",
 *  "record.ucMode"). No paths: all of them. */
std::vector<Change> changes_at(const std::vector<Change>& all, const std::vector<std::string>& paths);

/** One line each, "  record.ucMode  RES_480P → RES_1080I60HZ"; what is too long for the screen on several. */
std::string to_text(const std::vector<Change>& all);

} // namespace pmxboard
