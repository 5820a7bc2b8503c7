// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Recorded events as people read them. */
#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "tools/pmxboard/recording/recording.h"
#include "tools/pmxboard/recording/replayed.h"

namespace pmxboard
{

/** "PMX_HalSetMode(0, RES_480P)": a call by its words. */
std::string described(const Described& function, std::span<const std::uint32_t> words);

/** "RES_480P", "TRUE", "-1": what a function answers. */
std::string described_answer(const Described& function, std::uint32_t answer);

/** What an event says on one line; `began` are the calls that it may end. */
std::string described(const Event& event, std::span<const Event> began);

} // namespace pmxboard
