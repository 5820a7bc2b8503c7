// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The state as a file: JSON for programs, and to be looked at or compared later.
 *
 *      {"schema": "pmxboard-state", "version": 1, "board": "default", "state": {…}, "steps": {…}}
 *
 *  Values are in the form of board/json.h. The steps are what the state can be restored by:
 *
 *      {"version": 1, "commands": [{"in": "scenarios", "line": "power-on default", "board": "…"},
 *                                  {"line": "fault x_sema_creat 0", "failed": 1}, …]}
 *      {"version": 1, "lost": "why they do not lead there"} */
#pragma once

#include <cstddef>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "board/value.h"
#include "tools/pmxboard/state/diff.h"
#include "tools/pmxboard/state/steps.h"

namespace pmxboard
{

/** Counted up when the meaning of a key changes; keys may be added without that. */
inline constexpr int state_schema_version = 1;

/** A file has no more bytes. */
inline constexpr std::size_t largest_state = std::size_t{ 16 } << 20;

struct StateDump
{
    std::string board; ///< its name
    board::Value state;
    Steps steps{}; ///< that led there
};

/** A dump that cannot be used; the message says what is wrong, and where. */
class DumpError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

std::string to_json(const StateDump& dump);
/** Throws DumpError. */
StateDump read_dump(std::string_view json);

/** Parts of a state, by path: {"schema": …, "version": 1, "board": …, "values": {"ucMode": …}}. */
std::string to_json(const std::string& board, const std::vector<std::pair<std::string, board::Value>>& values);

/** {"schema": "pmxboard-diff", "version": 1, "changes": [{"path": …, "old": …, "new": …}]}; what is not there has no
 *  "old" or no "new". */
std::string to_json(const std::vector<Change>& changes);
/** The list of them alone, on one line. */
std::string to_json_list(const std::vector<Change>& changes);

} // namespace pmxboard
