// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/trace.h"

#include <algorithm>
#include <utility>

#include "board/contained.h"
#include "board/devices.h"
#include "board/recorder.h"
#include "board/threads.h"

namespace board
{

Recorder& recorder()
{
    static Recorder instance;
    return instance;
}

TraceEntry* entry_of(std::uint64_t sequence)
{
    auto& entries = recorder().entries;
    const auto found =
        std::lower_bound(entries.begin(), entries.end(), sequence,
                         [](const TraceEntry& entry, std::uint64_t wanted) { return entry.sequence < wanted; });
    return found != entries.end() && found->sequence == sequence ? &*found : nullptr;
}

TraceEntry& add_entry(TraceEntry::Kind kind, std::string function)
{
    Recorder& state = recorder();
    const threads::Context& context = threads::context();
    TraceEntry& entry = state.entries.emplace_back();
    entry.sequence = ++state.sequence;
    entry.time_us = static_cast<std::uint64_t>(now().count());
    entry.kind = kind;
    entry.function = std::move(function);
    entry.operation = context.operation;
    entry.depth = context.depth;
    entry.thread = context.number;
    return entry;
}

void finished(const TraceEntry& entry)
{
    if (!recorder().sink)
        return;
    const TraceEntry copy = entry; // what is called now may make further entries
    recorder().sink(copy);
}

namespace trace
{

void power_on()
{
    Recorder& state = recorder();
    state.entries.clear();
    state.sequence = 0;
    ++state.power_on;
    threads::context().depth = 0;
    if (state.watch.begin_anew)
        state.watch.begin_anew();
}

const std::vector<TraceEntry>& entries()
{
    return recorder().entries;
}

void clear()
{
    look();
    recorder().entries.clear();
}

void set_sink(std::function<void(const TraceEntry&)> sink)
{
    recorder().sink = std::move(sink);
}

void set_store_watch(StoreWatch watch)
{
    recorder().watch = std::move(watch);
}

void look()
{
    if (recorder().watch.look)
        recorder().watch.look();
}

void store(std::string field, Value from, Value to)
{
    TraceEntry& entry = add_entry(TraceEntry::Kind::Store, std::move(field));
    entry.arguments = { { "from", std::move(from) }, { "to", std::move(to) } };
    entry.by = threads::context().by;
    finished(entry);
}

By::By(std::string name) : m_name(std::move(name)), m_before(threads::context().by)
{
    look();
    threads::context().by = m_name;
}

By::~By()
{
    contained(look);
    threads::context().by = m_before;
}

Operation::Operation(const std::string& name) : m_by(name), m_outermost(!threads::context().operation_running)
{
    if (!m_outermost)
        return;
    threads::context().operation = name;
    threads::context().operation_running = true;
    if (recorder().operations_running++ == 0)
        interface_manager::operation_begins();
}

Operation::~Operation()
{
    if (!m_outermost)
        return;
    contained(look);
    if (--recorder().operations_running == 0)
        contained([] { interface_manager::operation_ends(threads::context().operation); });
    threads::context().operation.clear();
    threads::context().operation_running = false;
}

void name_object(const void* object, std::string name)
{
    recorder().objects[object] = std::move(name);
}

void notice(std::string kind, std::string text)
{
    look();
    TraceEntry& entry = add_entry(TraceEntry::Kind::Notice, std::move(kind));
    entry.text = std::move(text);
    finished(entry);
}

} // namespace trace
} // namespace board
