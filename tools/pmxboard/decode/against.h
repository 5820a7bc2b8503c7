// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A log against what the layer prints in a scenario: where they part, and where they meet again. */
#pragma once

#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "tools/pmxboard/decode/log.h"

namespace pmxboard::decode
{

/** A text that the layer printed while a scenario ran. */
struct Expected
{
    Item item;
    std::string operation; ///< that ran; empty: none, something happened by itself
    std::size_t line = 0;  ///< of the scenario
    std::string command;   ///< what stands there
};

struct ValueDifference
{
    std::string name;
    std::string expected;
    std::string found;
};

struct Departure
{
    enum class Kind
    {
        Value,     ///< the same text with other values
        Missing,   ///< the layer would have printed a line that is not there
        Extra,     ///< the layer would not have printed this line here
        Different, ///< another text stands in place of it
        Swapped    ///< two lines stand in the wrong order
    };

    Kind kind = Kind::Value;
    std::optional<Expected> expected; ///< nothing: the scenario is over
    Item found;                       ///< what stands there; of a missing line what stands in its place
    std::vector<ValueDifference> values;
    std::size_t count = 1; ///< lines in a row that are missing, or too many
};

/** The operation that it lies in: the one that ran in the scenario, or the one that prints such a text. */
std::string operation_of(const Departure& departure);

struct Comparison
{
    std::string scenario;
    int level = 0;
    std::size_t agreeing = 0;   ///< lines before the departure, or all
    std::size_t first_line = 0; ///< of the log, that agree; 0: none
    std::size_t last_line = 0;
    std::size_t skipped = 0;            ///< lines that the scenario prints before the log begins
    std::size_t left = 0;               ///< lines that it prints after the log ends
    std::optional<Departure> departure; ///< the first
    std::vector<Departure> further;     ///< those behind it
    std::size_t agreeing_behind = 0;    ///< lines that agree behind the first departure
    bool is_whole = true;               ///< false: there are more departures than are looked for
};

/** Compare up to a level of PMX_IsLog: only what both can show. Where both agree the work grows with the lines; each of
 *  the departures, of which at most a thousand are looked for, may cost an alignment of 256 lines with as many. */
Comparison compare(const Log& log, const std::vector<Expected>& expected, int level);

/** A scenario that cannot be run to its end. */
class ScenarioFailed : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/** What the layer prints in a scenario, whatever the console's level is. Throws ScenarioFailed. */
std::vector<Expected> run_for_texts(const std::string& scenario, const std::string& board);

} // namespace pmxboard::decode
