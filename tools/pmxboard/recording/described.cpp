// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/recording/described.h"

#include <algorithm>
#include <optional>
#include <ostream>

#include "board/names.h"
#include "board/value.h"
#include "recorder/encoding.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

/** Hexadecimal, as addresses, check sums and bytes are read. */
std::string hexadecimal(std::uint32_t word)
{
    return board::Value::number(word, {}, board::Value::Base::Hex).to_text();
}

std::string number_text(const std::string& owner, const std::string& name, std::uint32_t word)
{
    constexpr std::int32_t large = 0xFFFF;
    const auto number = static_cast<std::int32_t>(word);
    const auto known = board::names::name_of(board::names::family_of(owner, name), number);
    if (known.empty() && (number > large || number < -large))
        return hexadecimal(word);
    return board::Value::number(number, known).to_text();
}

std::string symbol_text(std::uint32_t word)
{
    static constexpr const char* names[] = { "null", "_PMX_TmrIsr", "_rPMXIF", "pmx_pm_ops" };
    return word < std::size(names) ? names[word] : "<elsewhere>";
}

/** Takes words one after the other. */
class RecordedWords
{
public:
    explicit RecordedWords(std::span<const std::uint32_t> words) : m_words(words) {}

    bool is_empty() const { return m_words.empty(); }
    std::uint32_t next()
    {
        const std::uint32_t word = is_empty() ? 0 : m_words.front();
        m_words = m_words.subspan(is_empty() ? 0 : 1);
        return word;
    }

    std::string bytes()
    {
        const auto kept = take();
        if (!kept)
            return "null";
        std::string list;
        for (const char byte : *kept)
            list.append(list.empty() ? "" : " ").append(hexadecimal(static_cast<unsigned char>(byte)).substr(2));
        return "[" + list + "]";
    }

    /** With three points behind it when there was more of it. */
    std::string text()
    {
        const bool is_cut = !is_empty() && (m_words.front() & PMX_CUT) != 0;
        const auto kept = take();
        if (!kept)
            return "null";
        return board::quote(*kept) + (is_cut ? "..." : "");
    }

    std::string format()
    {
        RecordedWords ahead = *this;
        m_format = ahead.take().value_or("");
        return text();
    }

    /** What goes with a format: of one that was kept it is known which of them are texts. */
    std::string values()
    {
        const std::uint32_t code = u4PmxCode(m_format.c_str());
        std::string list;
        for (unsigned i = 0; !is_empty(); ++i)
        {
            const bool is_text = i < PMX_CODE_COUNT(code) && (PMX_CODE_TEXTS(code) >> i & 1) != 0;
            list.append(list.empty() ? "" : ", ").append(is_text ? text() : hexadecimal(next()));
        }
        return list;
    }

private:
    /** The bytes that come next; nothing for a null pointer. */
    std::optional<std::string> take()
    {
        const std::uint32_t present = next();
        if ((present & PMX_PRESENT) == 0)
            return std::nullopt;
        const std::size_t size = std::min<std::size_t>(PMX_KEPT(present), m_words.size_bytes());
        const auto* const from = reinterpret_cast<const char*>(m_words.data());
        m_words = m_words.subspan(PMX_WORDS(size));
        return std::string(from, size);
    }

    std::span<const std::uint32_t> m_words;
    std::string m_format;
};

std::string text_of(std::uint32_t sum, const TextNames& texts)
{
    const auto found = texts.find(sum);
    if (sum == 0)
        return "null";
    return found == texts.end() ? "#" + hexadecimal(sum).substr(2) : board::quote(found->second);
}

std::string argument_text(const Described& function, const DescribedParameter& parameter, bool is_operation,
                          RecordedWords& words, const TextNames& texts)
{
    if (parameter.kind == "number")
        return number_text(function.name, parameter.name, words.next());
    if (parameter.kind == "symbol")
        return symbol_text(words.next());
    if (parameter.kind == "text" && !is_operation)
        return text_of(words.next(), texts);
    if (parameter.kind == "text")
        return words.format();
    if (parameter.kind == "data" || (is_operation && parameter.kind == "place"))
        return words.bytes();
    if (parameter.kind == "place" || parameter.kind == "table")
        return words.next() != 0 ? "<place>" : "null";
    if (parameter.kind == "tag")
        return hexadecimal(words.next());
    return words.values();
}

std::string described(const Described& function, bool is_operation, std::span<const std::uint32_t> given,
                      const TextNames& texts)
{
    RecordedWords words(given);
    std::string text;
    for (const DescribedParameter& parameter : function.parameters)
    {
        const std::string argument = argument_text(function, parameter, is_operation, words, texts);
        text += (text.empty() || argument.empty() ? "" : ", ") + argument;
    }
    return function.name + "(" + text + ")";
}

std::string with_answer(const Described& function, const std::string& call, std::uint32_t answer)
{
    return function.has_result ? call + " = " + described_answer(function, answer) : call;
}

bool begins(const Event& event)
{
    return event.kind == PMX_RECORDER_OPERATION || event.kind == PMX_RECORDER_CALL;
}

const Described& function_of(const Event& event)
{
    const ReplayedLayer& layer = replayed_layer();
    return event.kind == PMX_RECORDER_OPERATION ? layer.operations[event.function].described
                                                : layer.functions[event.function];
}

} // namespace

std::uint32_t check_sum_of(const std::string& text)
{
    return u4PmxText(text.c_str());
}

std::string described(const Described& function, std::span<const std::uint32_t> words, const TextNames& texts)
{
    return described(function, false, words, texts);
}

std::string described_answer(const Described& function, std::uint32_t answer)
{
    return number_text(function.name, "result", answer);
}

std::string described(const Event& event, const Event* begin, const TextNames& texts)
{
    if (event.kind == PMX_RECORDER_SNAPSHOT)
        return "snapshot";
    if (event.kind == PMX_RECORDER_CHANGE)
        return "changed from outside";
    if (event.kind == PMX_RECORDER_NOTHING)
        return "no snapshot: an operation began meanwhile";
    if (event.kind == PMX_RECORDER_RETURN && begin == nullptr)
        return "end of something before";
    if (event.kind == PMX_RECORDER_RETURN)
        return with_answer(function_of(*begin), "end of " + function_of(*begin).name, event.words[0]);
    const Described& function = function_of(event);
    const std::string call = described(function, event.kind == PMX_RECORDER_OPERATION, event.words.subspan(1), texts);
    return event.is_answered ? with_answer(function, call, event.words[0]) : call;
}

namespace
{

/** An event as it is shown. */
struct ShownEvent
{
    const Event& event;
    const Event* begin; ///< of an end: what ends; of others themselves, where they are no state
    std::size_t number;
    std::size_t depth;
    std::string text;
};

std::string quoted(const std::string& text)
{
    return board::Value::text(text).to_json();
}

const char* kind_name(const Event& event)
{
    static constexpr const char* names[] = { "", "operation", "call", "return", "change", "snapshot", "nothing" };
    return names[event.kind];
}

void show_line(std::ostream& out, const ShownEvent& shown)
{
    constexpr std::size_t deepest = 20;
    out << shown.number << '\t' << shown.event.time << '\t' << shown.event.thread << '\t'
        << std::string(2 * std::min(shown.depth, deepest), ' ') << printable(shown.text) << '\n';
}

void show_json(std::ostream& out, const ShownEvent& shown)
{
    out << "{\"event\":" << shown.number << ",\"time_us\":" << shown.event.time << ",\"thread\":" << shown.event.thread
        << ",\"depth\":" << shown.depth << ",\"kind\":\"" << kind_name(shown.event) << '"';
    if (shown.begin != nullptr)
        out << ",\"function\":" << quoted(function_of(*shown.begin).name);
    if (shown.event.is_answered || (shown.event.kind == PMX_RECORDER_RETURN && shown.begin != nullptr))
        out << ",\"answer\":" << static_cast<std::int32_t>(shown.event.words[0]);
    out << ",\"text\":" << quoted(shown.text) << "}\n";
}

/** What is answered at once has no length; what others do is a mark. */
void show_chrome(std::ostream& out, const ShownEvent& shown)
{
    const bool is_end = shown.event.kind == PMX_RECORDER_RETURN;
    const std::string phase = shown.begin == nullptr    ? "\"i\",\"s\":\"t\""
                              : is_end                  ? "\"E\""
                              : shown.event.is_answered ? "\"X\",\"dur\":0"
                                                        : "\"B\"";
    out << (shown.number == 1 ? "" : ",\n") << "{\"ph\":" << phase << ",\"pid\":1,\"tid\":" << shown.event.thread
        << ",\"ts\":" << shown.event.time
        << ",\"name\":" << quoted(shown.begin == nullptr ? shown.text : function_of(*shown.begin).name)
        << ",\"args\":{\"event\":" << shown.number << ",\"text\":" << quoted(shown.text) << "}}";
}

void show_event(std::ostream& out, const ShownEvent& shown, EventForm form)
{
    switch (form)
    {
    case EventForm::Text: return show_line(out, shown);
    case EventForm::Json: return show_json(out, shown);
    case EventForm::Chrome: return show_chrome(out, shown);
    }
}

} // namespace

void show_events(std::ostream& out, const Recording& recording, const TextNames& texts, EventForm form)
{
    std::map<unsigned, std::size_t> depths;
    std::map<std::uint32_t, const Event*> open;
    std::size_t number = 0;
    if (form == EventForm::Chrome)
        out << "{\"displayTimeUnit\":\"ms\",\"traceEvents\":[\n";
    for (const Event& event : recording.events)
    {
        std::size_t& depth = depths[event.thread];
        const bool is_return = event.kind == PMX_RECORDER_RETURN;
        const auto found = is_return ? open.find(event.words[1]) : open.end();
        const Event* const ended = found == open.end() ? nullptr : found->second;
        if (is_return && depth != 0)
            --depth;
        show_event(out, { event, begins(event) ? &event : ended, ++number, depth, described(event, ended, texts) },
                   form);
        if (found != open.end())
            open.erase(found);
        if (begins(event) && !event.is_answered)
        {
            ++depth;
            open[event.at] = &event;
        }
    }
    if (form == EventForm::Chrome)
        out << "\n]}\n";
}

} // namespace pmxboard
