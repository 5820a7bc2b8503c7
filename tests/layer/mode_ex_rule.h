// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What per-output mode setting does, said a second time, for tests that go through many combinations: the record
 *  before, the request and the board give the whole list of platform calls and the record afterwards. Knows the modes
 *  that the combinations use, the mixer's colour space BT.709, and frequencies of 50 and 60 Hz. */
#pragma once

#include <array>
#include <string>
#include <vector>

#include "board/trace.h"

namespace mode_ex
{

struct OutputState
{
    bool on = false;
    unsigned mode = 0;

    bool operator==(const OutputState&) const = default;
};

/** What the operation is asked for; outputs by PMX_OUTPUT_CCIR to PMX_OUTPUT_CVBS. */
struct Wanted
{
    std::array<OutputState, 4> outputs;
    unsigned frequency = 60;
    unsigned chip = 0;
    unsigned osd5 = 0;

    bool operator==(const Wanted&) const = default;
};

/** What the layer remembers. */
struct Memory
{
    Wanted last; ///< what was stored of it
    unsigned format = 0;
    unsigned tv_type = 0;
    bool set_before = true;
    bool first_after_load = false;
    bool format_change = false;
    bool osd_owed = false;
    bool timer_set = false;

    bool operator==(const Memory&) const = default;
};

struct Surroundings
{
    bool sink = true;
    bool resolution_wanted = false;
    bool video_plane_waits = false;
};

/** The calls, one a line: numbers only, log lines as they are. `memory` becomes what it is afterwards. */
std::string expected_lines(Memory& memory, const Wanted& wanted, const Surroundings& board);

/** A finished trace in the same form. */
std::string observed_lines(const std::vector<board::TraceEntry>& entries);

} // namespace mode_ex
