// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The lanes of a Chrome trace, and what those of states show. */
#pragma once

#include <map>
#include <string>

namespace pmxboard
{

/** Lanes, from top to bottom. */
enum Lane
{
    lane_process, ///< what belongs to no lane
    lane_operations,
    lane_calls,
    lane_console,
    lane_board,
    lane_format_change_flag,
    lane_osd_enable_flag,
    lane_timer_set_flag,
    lane_timer,
    lane_osd_plane_3, ///< planes are counted from 1 here; the first two are of video
    lane_osd_plane_8 = lane_osd_plane_3 + 5,
    lane_stores ///< only where there is one
};

/** What each lane is called, but for that of the stores. */
std::map<int, std::string> lane_names();

/** Lanes of states on which something holds now, and what: a raised flag, the running timer, a mixed plane. */
std::map<int, std::string> states_now();

} // namespace pmxboard
