// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The trace as it is kept: what trace.cpp and trace_call.cpp share. */
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include "board/trace.h"

namespace board
{

struct Recorder
{
    std::vector<TraceEntry> entries;
    std::uint64_t sequence = 0;
    std::uint64_t power_on = 0;      ///< calls that began before it are not recorded any more
    unsigned operations_running = 0; ///< outermost ones, one in each thread at most
    std::function<void(const TraceEntry&)> sink;
    trace::StoreWatch watch;
    std::map<const void*, std::string> objects;
};

Recorder& recorder();

/** The entry of a sequence number; null when it was cleared away. */
TraceEntry* entry_of(std::uint64_t sequence);

/** Begin an entry, in the thread that runs. */
TraceEntry& add_entry(TraceEntry::Kind kind, std::string function);

/** Hand an entry to the sink. */
void finished(const TraceEntry& entry);

namespace meanwhiles
{
/** A call is about to return: do what is armed for it. */
void call_ends(std::string_view function, std::uint64_t sequence);
} // namespace meanwhiles

} // namespace board
