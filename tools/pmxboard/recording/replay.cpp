// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/recording/replay.h"

#include <algorithm>
#include <condition_variable>
#include <cstring>
#include <mutex>
#include <set>
#include <system_error>
#include <thread>
#include <vector>

#include "tools/pmxboard/recording/described.h"
#include "tools/pmxboard/recording/replayed.h"
#include "tools/record_view/record_layout.h"

namespace pmxboard
{
namespace
{

/** The layer's memory as it is now. */
std::vector<unsigned char> state_now()
{
    std::vector<unsigned char> state(replayed_layer().state_size);
    for (const Variable& variable : replayed_layer().variables)
        std::memcpy(&state[variable.offset], variable.address, variable.size);
    return state;
}

/** The first so many bytes of it become what was recorded. */
void set_state(std::span<const std::uint32_t> words)
{
    for (const Variable& variable : replayed_layer().variables)
    {
        if (variable.offset + variable.size <= words.size_bytes())
            std::memcpy(variable.address, reinterpret_cast<const unsigned char*>(words.data()) + variable.offset,
                        variable.size);
    }
}

/** The path of the first single field that differs; empty when none does. */
std::string differing_field(const record_view::Node& node, const std::string& path, const unsigned char* one,
                            const unsigned char* other)
{
    if (record_view::is_single(node))
    {
        if (std::memcmp(one, other, node.size) == 0)
            return {};
        return path + ": " + record_view::value_at(node, one).to_text() + " was recorded, " +
               record_view::value_at(node, other).to_text() + " computed";
    }
    for (std::size_t i = 0; i < node.children.size(); ++i)
    {
        const record_view::Node& child = node.children[i];
        const std::string found =
            differing_field(child, record_view::path_of_child(node, i, path), one + child.offset, other + child.offset);
        if (!found.empty())
            return found;
    }
    return {};
}

const Variable* variable_of(const record_view::Object& object)
{
    const auto& all = replayed_layer().variables;
    const auto found = std::find_if(all.begin(), all.end(),
                                    [&object](const Variable& variable) { return variable.name == object.symbol; });
    return found == all.end() ? nullptr : &*found;
}

/** Nobody looks at what lies between fields. */
std::string difference(std::span<const std::uint32_t> recorded)
{
    const std::vector<unsigned char> computed = state_now();
    const auto* const bytes = reinterpret_cast<const unsigned char*>(recorded.data());
    std::string found;
    for (const record_view::Object& object : record_view::objects())
    {
        const Variable* const variable = variable_of(object);
        if (found.empty() && variable != nullptr && object.node.size <= variable->size)
            found = differing_field(object.node, object.symbol, bytes + variable->offset, &computed[variable->offset]);
    }
    return found;
}

std::string record_text()
{
    for (const record_view::Object& object : record_view::objects())
    {
        const Variable* const variable = variable_of(object);
        if (object.group == "record" && variable != nullptr)
            return record_view::value_at(object.node, variable->address).to_text();
    }
    return {};
}

bool happens_in_a_thread(const Event& event)
{
    return event.kind == PMX_RECORDER_OPERATION || event.kind == PMX_RECORDER_CALL || event.kind == PMX_RECORDER_RETURN;
}

class Performance
{
public:
    Performance(const Recording& recording, const TextNames& texts) : m_events(recording.events), m_texts(texts) {}

    ReplayVerdict run();
    Answer call(unsigned function, std::span<const UINT32> words, std::size_t reserved);
    void go_on();

private:
    using Lock = std::unique_lock<std::mutex>;

    void perform(unsigned thread);
    void run_operation(Lock& lock);
    Answer answered(const Described& function, std::uint32_t answer, std::span<const std::uint32_t> written);
    void lose(const Event& begin, std::string_view parameter);
    void end_operation(Lock& lock, const Event& begin, std::uint32_t answer, const std::vector<UINT32>& written);
    const Event& take();
    bool is_my_turn() const;
    bool wait_for_turn(Lock& lock);
    void settle();
    void depart(std::string recorded, std::string computed, std::string why);
    std::string next_text() const;

    const std::vector<Event>& m_events;
    const TextNames& m_texts;
    std::size_t m_next = 0;
    bool m_is_over = false;
    bool m_runs_alone = false; ///< the operation that runs ends before anything else begins
    std::size_t m_open = 0;    ///< operations that have begun and not ended, in all threads
    std::size_t m_outermost = 0;
    ReplayVerdict m_verdict;
    std::mutex m_mutex;
    std::condition_variable m_turn;
};

/** Operations within calls within operations: a product's stack has room for a few. */
constexpr std::size_t deepest = 64;

Performance* performance;
thread_local unsigned my_thread;
thread_local std::vector<std::string> my_operations;
thread_local bool my_operation_calls_nobody; // the innermost one, as it was recorded

std::string Performance::next_text() const
{
    const Event& event = m_events[m_next];
    const auto ends = [&event](const Event& other) {
        const bool begins = other.kind == PMX_RECORDER_OPERATION || other.kind == PMX_RECORDER_CALL;
        return begins && event.kind == PMX_RECORDER_RETURN && other.at == event.words[1];
    };
    const auto begin = std::find_if(m_events.begin(), m_events.begin() + static_cast<std::ptrdiff_t>(m_next), ends);
    const bool is_known = begin != m_events.begin() + static_cast<std::ptrdiff_t>(m_next);
    return described(event, is_known ? &*begin : nullptr, m_texts);
}

void Performance::depart(std::string recorded, std::string computed, std::string why)
{
    m_is_over = true;
    if (!m_verdict.departure)
    {
        Departure& found = m_verdict.departure.emplace();
        found.event = std::min(m_next + 1, m_events.size());
        found.time = m_events[std::min(m_next, m_events.size() - 1)].time;
        found.thread = my_thread;
        found.operation = my_operations.empty() ? "" : my_operations.front();
        found.outermost = m_outermost;
        found.recorded = std::move(recorded);
        found.computed = std::move(computed);
        found.why = std::move(why);
        found.record = record_text();
    }
    m_turn.notify_all();
}

/** What belongs to no thread happens as soon as what stands before it has happened. */
void Performance::settle()
{
    for (; !m_is_over && m_next < m_events.size(); ++m_next)
    {
        const Event& event = m_events[m_next];
        if (event.kind == PMX_RECORDER_CHANGE || m_next == 0)
            set_state(event.words);
        else if (happens_in_a_thread(event))
            break;
        else if (event.kind == PMX_RECORDER_SNAPSHOT)
        {
            if (const std::string found = difference(event.words); !found.empty())
                return depart("snapshot", "another record", found);
        }
        ++m_verdict.events;
    }
    m_is_over = m_is_over || m_next == m_events.size();
    m_turn.notify_all();
}

/** The next event has come to pass. An operation that is answered in its own event runs before anything else does. */
const Event& Performance::take()
{
    const Event& taken = m_events[m_next++];
    ++m_verdict.events;
    m_verdict.operations += taken.kind == PMX_RECORDER_OPERATION;
    m_verdict.calls += taken.kind == PMX_RECORDER_CALL;
    m_runs_alone = taken.kind == PMX_RECORDER_OPERATION && taken.is_answered;
    if (!m_runs_alone)
        settle();
    return taken;
}

/** What belongs to no thread has happened by now. */
bool Performance::is_my_turn() const
{
    if (m_next == m_events.size())
        return false;
    return !m_runs_alone && m_events[m_next].thread == my_thread;
}

/** False when there is nothing left to do. */
bool Performance::wait_for_turn(Lock& lock)
{
    m_turn.wait(lock, [this] { return m_is_over || is_my_turn(); });
    return !m_is_over;
}

Answer Performance::call(unsigned function, std::span<const UINT32> words, std::size_t reserved)
{
    Lock lock(m_mutex);
    const Described& called = replayed_layer().functions[function];
    if (my_operation_calls_nobody && !m_is_over)
        depart("end of " + my_operations.back(), described(called, words, m_texts), "another call");
    if (!wait_for_turn(lock))
        return {};
    const Event& begin = m_events[m_next];
    if (begin.kind != PMX_RECORDER_CALL || begin.function != function)
    {
        depart(next_text(), described(called, words, m_texts), "another call");
        return {};
    }
    const auto given = begin.words.subspan(1);
    if (given.size() != words.size() + reserved || !std::equal(words.begin(), words.end(), given.begin()))
    {
        depart(next_text(), described(called, words, m_texts), "other arguments");
        return {};
    }
    take();
    if (begin.is_answered)
        return answered(called, begin.words[0], given.subspan(words.size()));
    while (wait_for_turn(lock))
    {
        const Event& event = m_events[m_next];
        if (event.kind == PMX_RECORDER_RETURN && event.words[1] == begin.at)
        {
            take();
            return answered(called, event.words[0], event.words.subspan(2));
        }
        if (event.kind == PMX_RECORDER_OPERATION && my_operations.size() < deepest)
            run_operation(lock);
        else
            depart(next_text(), "nothing: " + called.name + " has not returned", "the recording contradicts itself");
    }
    return {};
}

/** What another thread did next comes before what the layer does behind a call: what it had stored by then, and others
 *  see, was recorded as a change. */
void Performance::go_on()
{
    Lock lock(m_mutex);
    wait_for_turn(lock);
}

/** Without a table in it the layer would call nothing. */
Answer Performance::answered(const Described& function, std::uint32_t answer, std::span<const std::uint32_t> written)
{
    const bool lacks_table = static_cast<INT32>(answer) >= 0 && (written.empty() || written.front() == 0);
    if (!lacks_table || !hands_out_table(function))
        return { answer, written };
    depart("end of " + function.name + " = " + described_answer(function, answer), "nothing: no table was handed out",
           "the recording contradicts itself");
    return {};
}

/** The next event is an operation's beginning. */
void Performance::run_operation(Lock& lock)
{
    const Event& begin = take();
    const ReplayedOperation& operation = replayed_layer().operations[begin.function];
    m_outermost += m_open == 0;
    ++m_open;
    my_operations.push_back(operation.described.name);
    std::vector<UINT32> written;
    Given given(begin.words.subspan(1));
    if (!begin.is_answered)
        wait_for_turn(lock);
    lock.unlock();
    my_operation_calls_nobody = begin.is_answered;
    const std::uint32_t answer = operation.run(given, written);
    my_operation_calls_nobody = false; // whoever called it out of an operation is one that calls
    lock.lock();
    if (!given.loss().empty())
        lose(begin, given.loss());
    end_operation(lock, begin, answer, written);
    --m_open;
    my_operations.pop_back();
}

/** A product has nothing there: it stops, and what is recorded behind it is not of this layer. */
void Performance::lose(const Event& begin, std::string_view parameter)
{
    const Described& operation = replayed_layer().operations[begin.function].described;
    const std::string name(parameter);
    std::string recorded = "nothing more";
    if (begin.is_answered)
        recorded = "end of " + operation.name + " = " + described_answer(operation, begin.words[0]);
    else if (m_next < m_events.size())
        recorded = next_text();
    depart(std::move(recorded), "a write behind " + name + ", which is null",
           operation.name + " does not test " + name + " for null: its caller must");
}

void Performance::end_operation(Lock& lock, const Event& begin, std::uint32_t answer,
                                const std::vector<UINT32>& written)
{
    const Described& operation = replayed_layer().operations[begin.function].described;
    const std::string computed = "end of " + operation.name + " = " + described_answer(operation, answer);
    std::uint32_t expected = begin.words[0];
    std::span<const std::uint32_t> outputs = begin.words.last(std::min(written.size(), begin.words.size()));
    if (!begin.is_answered)
    {
        if (!wait_for_turn(lock))
            return;
        const Event& end = m_events[m_next];
        if (end.kind != PMX_RECORDER_RETURN || end.words[1] != begin.at)
            return depart(next_text(), computed, "the operation ends too early");
        expected = end.words[0];
        outputs = end.words.subspan(2);
    }
    const bool is_equal =
        expected == answer && std::equal(written.begin(), written.end(), outputs.begin(), outputs.end());
    if (!is_equal && !m_verdict.departure)
        return depart("end of " + operation.name + " = " + described_answer(operation, expected), computed,
                      expected == answer ? "another output" : "another result");
    m_runs_alone = false;
    if (begin.is_answered)
        settle();
    else
        take();
}

void Performance::perform(unsigned thread)
{
    my_thread = thread;
    Lock lock(m_mutex);
    while (wait_for_turn(lock))
    {
        if (m_events[m_next].kind == PMX_RECORDER_OPERATION)
            run_operation(lock);
        else
            depart(next_text(), "nothing: no operation runs", "the recording contradicts itself");
    }
}

ReplayVerdict Performance::run()
{
    std::set<unsigned> numbers;
    for (const Event& event : m_events)
        numbers.insert(event.thread);
    settle();
    std::vector<std::thread> threads;
    std::string lacking;
    try
    {
        for (const unsigned number : numbers)
            threads.emplace_back([this, number] { perform(number); });
    }
    catch (const std::system_error& error)
    {
        lacking = error.what();
        const Lock lock(m_mutex);
        m_is_over = true;
        m_turn.notify_all();
    }
    for (std::thread& thread : threads)
        thread.join();
    if (!lacking.empty())
        throw RecordingError("its " + std::to_string(numbers.size()) + " threads cannot be run: " + lacking);
    return m_verdict;
}

} // namespace

Answer Replay::call(unsigned function, const UINT32* words, unsigned count, unsigned reserved)
{
    return performance->call(function, { words + 3, words + count }, reserved);
}

void Replay::go_on()
{
    performance->go_on();
}

ReplayVerdict replay(const Recording& recording, const TextNames& texts)
{
    Performance now(recording, texts);
    performance = &now;
    const ReplayVerdict verdict = now.run();
    performance = nullptr;
    return verdict;
}

} // namespace pmxboard
