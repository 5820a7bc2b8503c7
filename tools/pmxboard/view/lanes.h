// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What holds over a time of a run, in lanes: raised flags, the timer, the master enable, the mixer's mode and planes,
 *  what the outputs show. */
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <string_view>

namespace pmxboard
{

/** Lanes, from top to bottom. Those in front of the states belong to traces that show calls, too. */
enum Lane
{
    lane_process, ///< what belongs to no lane
    lane_operations,
    lane_calls,
    lane_console,
    lane_board,
    lane_graphics,
    lane_format_change_flag,
    lane_osd_enable_flag,
    lane_timer_set_flag,
    lane_timer,
    lane_enable,
    lane_mixer_mode,
    lane_plane_1, ///< planes are counted from 1 here; the first two are of video
    lane_plane_8 = lane_plane_1 + 7,
    lane_sink,
    lane_mute,
    lane_digital, ///< the outputs, in the layer's order
    lane_composite = lane_digital + 3,
    lane_stores, ///< only where there is one

    first_lane_of_states = lane_graphics,
    last_lane_of_states = lane_composite
};

/** What each lane is called, but for that of the stores. */
std::map<int, std::string> lane_names();

/** What a lane of states is about: "graphics", "flag", "timer", "plane" or "output". */
std::string_view kind_of_lane(int lane);

/** Lanes of states on which something holds, and what: a raised flag, the running timer, a mixed plane, graphics that
 *  are held back, the mixer's mode or an output's. */
using States = std::map<int, std::string>;

/** As it is now; the same object as before where nothing has changed. */
std::shared_ptr<const States> states_now();

/** The numbers of the modes that hold now, by lane: the mixer's, and of each output that is on. */
std::map<int, std::uint32_t> modes_now();

} // namespace pmxboard
