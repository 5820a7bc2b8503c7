// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A recording as it is read: from a file that `pmxboard record` wrote, or out of a memory dump. Any bytes may be
 *  handed over. */
#pragma once

#include <cstdint>
#include <deque>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "recorder/pmx_recorder.h"

namespace pmxboard
{

/** What is wrong with a recording. */
class RecordingError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

struct Event
{
    PMX_RECORDER_KIND_T kind;
    bool is_answered;
    unsigned function;
    unsigned thread;
    std::uint32_t at;                     ///< counted in words since the recording began, modulo 2^32
    std::uint64_t time;                   ///< microseconds
    std::span<const std::uint32_t> words; ///< behind the time
};

/** In its events texts are check sums, wherever they stood, and states are laid out as in the layer that replays. */
struct Recording
{
    PMX_RECORDER_T header;
    std::vector<Event> events;                    ///< from the first snapshot that is still whole
    std::deque<std::vector<std::uint32_t>> words; ///< of each event
    std::uint32_t lost = 0;                       ///< words that were overwritten, or stand before that snapshot
    std::string damaged; ///< what is wrong with the event behind the last one; empty when that is the end
};

/** The first recording in these bytes. Throws RecordingError. */
Recording read_recording(std::string_view bytes);

} // namespace pmxboard
