// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/play_steps.h"

#include <algorithm>
#include <map>

#include "recorder/encoding.h"

namespace pmxboard
{
namespace
{

/** How many of these words are a function's arguments. What a caller wants written is cleared. */
std::size_t take_arguments(const Described& function, bool is_operation, std::vector<std::uint32_t>& words)
{
    std::size_t at = 0;
    for (const DescribedParameter& parameter : function.parameters)
    {
        const bool has_bytes =
            parameter.kind == "data" || (is_operation && (parameter.kind == "place" || parameter.kind == "text"));
        if (parameter.kind == "values" || parameter.kind == "list")
            return words.size();
        if (at >= words.size())
            break;
        const std::size_t size = has_bytes && (words[at] & PMX_PRESENT) != 0 ? PMX_KEPT(words[at]) : 0;
        if (parameter.kind == "tag" && !is_operation) // whose it is, its owner knows
            words[at] = words[at] != 0;
        const std::size_t end = std::min(words.size(), at + 1 + PMX_WORDS(size));
        if (parameter.kind == "place")
            std::fill(words.begin() + static_cast<std::ptrdiff_t>(at) + 1,
                      words.begin() + static_cast<std::ptrdiff_t>(end), 0);
        at = end;
    }
    return at;
}

class StepReader
{
public:
    explicit StepReader(const Recording& recording) : m_recording(recording) {}

    RecordedSteps read()
    {
        for (const Event& event : m_recording.events)
        {
            if (event.kind == PMX_RECORDER_OPERATION || event.kind == PMX_RECORDER_CALL)
                begin(event);
            else if (event.kind == PMX_RECORDER_RETURN)
                end(event.words[1], event.words[0], { event.words.begin() + 2, event.words.end() });
            else if (event.kind == PMX_RECORDER_CHANGE && m_command != 0)
                change(event);
            else if (m_command == 0 && event.kind != PMX_RECORDER_NOTHING)
                begin_with(event);
        }
        return { std::move(m_state), std::move(m_steps) };
    }

private:
    void begin(const Event& event)
    {
        const bool is_operation = event.kind == PMX_RECORDER_OPERATION;
        RecordedStep step;
        step.kind = is_operation ? RecordedStep::Kind::Operation : RecordedStep::Kind::Call;
        step.function = is_operation ? &replayed_layer().operations[event.function].described
                                     : &replayed_layer().functions[event.function];
        step.words.assign(event.words.begin() + 1, event.words.end());
        const std::size_t used = take_arguments(*step.function, is_operation, step.words);
        std::vector<std::uint32_t> written(step.words.begin() + static_cast<std::ptrdiff_t>(used), step.words.end());
        step.words.resize(used);
        if (is_operation && m_open.empty())
        {
            ++m_command;
            m_counts.clear();
        }
        if (m_command == 0)
            throw RecordingError("the recording begins with a call and no operation that makes it");
        place(step);
        if (!is_operation)
            step.nth = ++m_counts[step.function->name];
        m_open.push_back({ event.at, step });
        m_steps.push_back(std::move(step));
        if (event.is_answered)
            end(event.at, event.words[0], std::move(written));
    }

    void end(std::uint32_t at, std::uint32_t answer, std::vector<std::uint32_t> written)
    {
        const auto found = std::find_if(m_open.rbegin(), m_open.rend(), [at](const auto& one) { return one.at == at; });
        if (found == m_open.rend())
            return;
        RecordedStep step = found->step;
        m_open.erase(std::next(found).base());
        step.kind = step.kind == RecordedStep::Kind::Operation ? RecordedStep::Kind::OperationEnds
                                                               : RecordedStep::Kind::CallEnds;
        step.words = step.kind == RecordedStep::Kind::CallEnds ? std::move(written) : std::vector<std::uint32_t>{};
        step.answer = step.function->has_result ? answer : 0;
        if (hands_out_table(*step.function))
            std::transform(step.words.begin(), step.words.end(), step.words.begin(),
                           [](std::uint32_t word) { return std::uint32_t{ word != 0 }; });
        m_steps.push_back(std::move(step));
    }

    void begin_with(const Event& event)
    {
        m_state.resize(std::max(m_state.size(), event.words.size()));
        std::copy(event.words.begin(), event.words.end(), m_state.begin());
    }

    void change(const Event& event)
    {
        RecordedStep step;
        step.kind = RecordedStep::Kind::Change;
        step.words.assign(event.words.begin(), event.words.end());
        place(step);
        m_steps.push_back(std::move(step));
    }

    void place(RecordedStep& step) const
    {
        step.command = m_command;
        if (m_open.empty())
            return;
        const RecordedStep& open = m_open.back().step;
        step.within = open.kind == RecordedStep::Kind::Call ? open.function->name : "";
        step.within_nth = open.nth;
    }

    struct Open
    {
        std::uint32_t at;
        RecordedStep step;
    };

    const Recording& m_recording;
    std::vector<std::uint32_t> m_state;
    std::vector<RecordedStep> m_steps;
    std::vector<Open> m_open;
    std::map<std::string, unsigned> m_counts;
    std::size_t m_command = 0;
};

} // namespace

RecordedSteps recorded_steps(const Recording& recording)
{
    return StepReader(recording).read();
}

bool same(const RecordedStep& one, const RecordedStep& other)
{
    if (one.kind == RecordedStep::Kind::Change && other.kind == one.kind) // of one of them the head may be known alone
        return std::equal(one.words.begin(),
                          one.words.begin() +
                              static_cast<std::ptrdiff_t>(std::min(one.words.size(), other.words.size())),
                          other.words.begin());
    return one.kind == other.kind && one.function == other.function && one.words == other.words &&
           one.answer == other.answer && one.within == other.within;
}

} // namespace pmxboard
