// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  One path through one operation, on a board that is as good as new, with a disturbance; and what that has left. */
#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "board/board.h"

namespace disturbed
{

/** A call as a scenario has it, and what comes before it. */
struct Path
{
    std::string line;
    std::vector<std::string> before;

    std::string operation() const { return line.substr(0, line.find(' ')); }
};

/** Every operation as its example has it, and the other paths of those that have several. */
const std::vector<Path>& every_path();

/** Whether all is asked for, or what fits between two meals. */
bool all_of_it();

/** A call of the platform within a run. */
struct Point
{
    std::string function;
    unsigned n = 0;      ///< which of its calls, from 1
    std::size_t at = 0;  ///< which of lines()
    std::int64_t answer; ///< that it gave
};

/** What a run was like. */
struct Played
{
    std::string outcome;              ///< result and outputs
    std::size_t calls = 0;            ///< of the platform, console lines and assertions included
    std::vector<std::string> asserts; ///< their texts
    std::vector<Point> points;        ///< calls that answer
    unsigned misuses = 0;             ///< from the beginning of the path on
    bool prints_alone = true;         ///< nothing but console lines
    bool lock_held = false;           ///< afterwards
};

/** Power the board on and do what comes before a path. */
void prepare(const Path& path);

/** Run a path that is prepared, once the disturbance is. */
Played run(const Path& path, const std::function<void()>& disturb = {});

/** The calls and console lines since the trace was cleared, without what was answered; no assertions. */
std::vector<std::string> lines();

/** The layer's objects now. */
std::string record();

/** Whether the mixer's mutex is held now. */
bool lock_held();

/** The display part answers and the video plane driver has its sync: graphics are back then. What is wrong, one text
 *  for each. */
std::vector<std::string> release();

/** The next mode change, with a display part that begins: graphics are held back, and released. What is wrong is added.
 *  @return what that mode change called, and its result */
std::vector<std::string> recover(std::vector<std::string>& wrong);

/** Planes 3 to 7 that are out of the mix. */
std::string planes_out();

/** Whether graphics are out of the mix and neither owed nor waited for. */
bool forgotten();

} // namespace disturbed
