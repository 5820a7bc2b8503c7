// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The display part: what switches the sink when the HDMI resolution changes. It raises the mixer's format-change flag
 *  when it begins and lowers it when it is done, so that graphics wait meanwhile. */
#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <string_view>

namespace board::display_part
{

/** What it does when it is given an HDMI resolution change. */
struct Behaviour
{
    bool raises = false;                             ///< it raises the flag, or takes no notice at all
    std::optional<std::chrono::microseconds> answer; ///< how long it takes until it lowers it; nothing: for ever
};

/** "off", "never" (it raises the flag and is not heard of again), or the time it takes: "3s", "500ms", "2us".
 *  Throws std::invalid_argument. */
Behaviour read_behaviour(std::string_view written);
/** The same the other way round. */
std::string to_text(const Behaviour& behaviour);

/** From now on. An answer that is due already comes all the same, unless the display part is switched off. */
void behave(const Behaviour& behaviour);

/** Raise the flag now, as at the beginning of a switch that nobody ordered; it is not lowered by itself. */
void raise();
/** Lower the flag now. An answer that was due later is not given any more. */
void lower();

/** The HDMI/AV driver hands over a resolution change. A switch that is under way begins anew. */
void resolution_change();

} // namespace board::display_part
