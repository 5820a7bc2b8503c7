// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Recorded events as people read them. */
#pragma once

#include <cstdint>
#include <iosfwd>
#include <map>
#include <span>
#include <string>

#include "tools/pmxboard/recording/recording.h"
#include "tools/pmxboard/recording/replayed.h"

namespace pmxboard
{

/** Texts of the layer by the check sums that stand for them. */
using TextNames = std::map<std::uint32_t, std::string>;

/** The check sum that a recording has of a text. */
std::uint32_t check_sum_of(const std::string& text);

/** "PMX_HalSetMode(0, RES_480P)": a call by its words. */
std::string described(const Described& function, std::span<const std::uint32_t> words, const TextNames& texts);

/** "RES_480P", "TRUE", "-1": what a function answers. */
std::string described_answer(const Described& function, std::uint32_t answer);

/** What an event says on one line; `begin` is the one that it ends, or null. */
std::string described(const Event& event, const Event* begin, const TextNames& texts);

/** How all events are shown. */
enum class EventForm
{
    Text,  ///< a line each: its number, time and thread, and what it says, deeper within calls
    Json,  ///< a JSON object each
    Chrome ///< for a viewer of traces: a lane for each thread
};

void show_events(std::ostream& out, const Recording& recording, const TextNames& texts, EventForm form);

} // namespace pmxboard
