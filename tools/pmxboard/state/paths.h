// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Where in the state a path leads, in that of the running board or in a saved one. */
#pragma once

#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "board/value.h"

namespace pmxboard
{

/** The groups of the state that are the layer's own. */
constexpr std::string_view layer_groups[] = { "record", "status", "module" };

/** A path whose indices are numbers: arOutputConf[PMX_OUTPUT_HDMI] is arOutputConf[1]. */
std::string plain_path(std::string path);

/** A part of a state; the groups of the layer ("record.", …) may be left out. Throws LineError with the nearest
 *  paths. */
board::Value part_of(const board::Value& state, const std::string& path);

/** How a path names an item of a list: "[3]". */
std::string item_step(std::size_t index);

using NamedValues = std::vector<std::pair<std::string, board::Value>>;

/** Values as people read them, each under its path when there are several; a path "" is the whole state. */
std::string to_text(const NamedValues& values);

} // namespace pmxboard
