// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How long each state of the lanes held: what a time line shows as bars. */
#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "board/json.h"

namespace pmxboard
{

/** A moment of a run. Virtual time begins anew with each power-on: on the time line they stand one behind the other. */
struct Moment
{
    std::int64_t us = 0;        ///< on the time line
    std::size_t step = 0;       ///< the step that runs, from 0
    std::uint64_t sequence = 0; ///< the last entry of the trace until then
};

board::Json json_of(const Moment& moment);
Moment moment_of(const board::Json& json);

struct LaneSpan
{
    int lane = 0;
    std::string text;
    Moment from;
    Moment to;
    bool is_open = false; ///< it held when the run ended
    std::string ended_by; ///< what the board told of before; empty where it told nothing
};

class LaneSpans
{
public:
    /** What holds from now on; what held and does no more ends now, by what was told of before. */
    void follow(const std::map<int, std::string>& states, const Moment& now, const std::string& told = {});
    /** Everything ends: the board loses its power, or the run is over. */
    void end(const Moment& now, bool run_is_over);

    /** Those that have ended, in that order. */
    const std::vector<LaneSpan>& ended() const { return m_ended; }

private:
    std::map<int, LaneSpan> m_open;
    std::vector<LaneSpan> m_ended;
};

} // namespace pmxboard
