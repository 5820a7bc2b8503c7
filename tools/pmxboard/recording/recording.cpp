// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/recording/recording.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <map>
#include <optional>

#include "recorder/encoding.h"
#include "tools/pmxboard/recording/foreign_state.h"
#include "tools/pmxboard/recording/replayed.h"

namespace pmxboard
{
namespace
{

constexpr std::uint32_t magic[] = { PMX_RECORDER_MAGIC_0, PMX_RECORDER_MAGIC_1, PMX_RECORDER_MAGIC_2 };

std::string_view bytes_of(const std::uint32_t (&words)[3])
{
    return { reinterpret_cast<const char*>(words), sizeof words };
}

[[noreturn]] void refuse_without_magic(std::string_view bytes)
{
    std::uint32_t swapped[3];
    for (std::size_t i = 0; i < 3; ++i)
        swapped[i] = __builtin_bswap32(magic[i]);
    throw RecordingError(bytes.find(bytes_of(swapped)) == bytes.npos
                             ? "there is no recording in it"
                             : "the recording was made on a processor with the other order of bytes");
}

void hold(bool fits, const std::string& what)
{
    if (!fits)
        throw RecordingError(what);
}

PMX_RECORDER_T header_of(std::string_view bytes)
{
    PMX_RECORDER_T header;
    hold(bytes.size() >= sizeof header, "the recording ends within its header");
    std::memcpy(&header, bytes.data(), sizeof header);
    hold(header.u4Version == PMX_RECORDER_VERSION, "the recording has version " + std::to_string(header.u4Version) +
                                                       "; this tool reads version " +
                                                       std::to_string(PMX_RECORDER_VERSION));
    hold(header.u4PointerSize == 4 || header.u4PointerSize == 8,
         "the recording was made where pointers have " + std::to_string(header.u4PointerSize) + " bytes");
    const ForeignState state(header.u4PointerSize);
    hold(header.u4Interface == replayed_layer().interface && header.u4ExportedSize == state.exported_size() &&
             header.u4StateSize == state.size(),
         "the recording was made with another version of the layer's interface");
    hold(std::has_single_bit(header.u4RingWords) && header.u4RingWords >= PMX_RECORDER_LEAST_WORDS,
         "the recording's ring has an impossible size");
    hold(bytes.size() / 4 >= PMX_RECORDER_MEMORY(4 * std::uint64_t{ header.u4RingWords }) / 4,
         "the recording ends within its ring");
    return header;
}

/** Where the oldest snapshot begins that is still whole, counted back from the end. */
std::optional<std::uint32_t> oldest_snapshot(const PMX_RECORDER_T& header)
{
    std::optional<std::uint32_t> oldest;
    const std::uint32_t kept = std::min(header.u4SnapshotCount, PMX_RECORDER_SNAPSHOTS);
    for (std::uint32_t i = 0; i < kept; ++i)
    {
        const std::uint32_t back = header.u4Head - header.au4Snapshot[i];
        if (back != 0 && back <= header.u4RingWords && back > oldest.value_or(0))
            oldest = back;
    }
    return oldest;
}

/** What an event must have, by its kind; empty when it has. */
std::string wrong_with(const Event& event, const PMX_RECORDER_T& header)
{
    const ReplayedLayer& layer = replayed_layer();
    switch (event.kind)
    {
    case PMX_RECORDER_OPERATION:
        return event.function >= layer.operations.size() ? "no such operation"
               : event.words.empty()                     ? "it is too short"
                                                         : "";
    case PMX_RECORDER_CALL:
        return event.function >= layer.functions.size() ? "no such function"
               : event.words.empty()                    ? "it is too short"
                                                        : "";
    case PMX_RECORDER_RETURN: return event.words.size() < 2 ? "it is too short" : "";
    case PMX_RECORDER_CHANGE:
        return event.words.size() != (header.u4ExportedSize + 3) / 4 &&
                       event.words.size() != (header.u4StateSize + 3) / 4
                   ? "it is no state"
                   : "";
    case PMX_RECORDER_SNAPSHOT: return event.words.size() != (header.u4StateSize + 3) / 4 ? "it is no state" : "";
    case PMX_RECORDER_NOTHING: return "";
    }
    return "no such kind of event";
}

/** Reads the events of a ring one after the other. */
class Reader
{
public:
    Reader(std::string_view ring, Recording& recording)
        : m_ring(ring), m_recording(recording), m_state(recording.header.u4PointerSize)
    {
        const char* from = ring.data() + 4 * (recording.header.u4RingWords + std::size_t{ PMX_RECORDER_LONGEST } + 1);
        for (std::size_t i = 0; i < PMX_RECORDER_TEXTS; ++i, from += sizeof(PMX_RECORDER_TEXT_T))
        {
            PMX_RECORDER_TEXT_T text;
            std::memcpy(&text, from, sizeof text);
            if (text.u4Key != 0)
                m_texts[text.u4Key ^ text.u4Code] = { text.u4Sum, text.u4Code };
        }
    }

    /** So many words, up to the head. What a crash has left half filled costs nothing that stands before it. */
    void read(std::uint32_t back)
    {
        try
        {
            for (std::uint32_t left = back; left != 0;)
                left -= read_event(m_recording.header.u4Head - left, left);
        }
        catch (const RecordingError& error)
        {
            if (!has_operation())
                throw;
            m_recording.damaged = error.what();
        }
        hold(m_recording.events.front().kind == PMX_RECORDER_SNAPSHOT, "the recording has no snapshot where it says");
    }

private:
    struct Text
    {
        std::uint32_t sum;
        std::uint32_t code;
    };

    bool has_operation() const
    {
        const auto& events = m_recording.events;
        return std::any_of(events.begin(), events.end(),
                           [](const Event& event) { return event.kind == PMX_RECORDER_OPERATION; });
    }

    std::uint32_t read_event(std::uint32_t at, std::uint32_t left)
    {
        m_place = "event " + std::to_string(m_recording.events.size() + 1);
        const char* const from = m_ring.data() + 4 * std::size_t{ at & (m_recording.header.u4RingWords - 1) };
        std::uint32_t head = 0;
        std::memcpy(&head, from, sizeof head);
        const std::uint32_t count = head & 0xFF;
        hold(count >= 2 && count <= left, m_place + " is damaged: it has an impossible length");
        std::vector<std::uint32_t> words(count);
        std::memcpy(words.data(), from, 4 * std::size_t{ count });
        const std::span<const std::uint32_t> behind = std::span(words).subspan(2);
        Event event{ static_cast<PMX_RECORDER_KIND_T>(head >> 8 & 0x7F),
                     (head >> 8 & PMX_RECORDER_ANSWERED) != 0,
                     head >> 16 & 0xFF,
                     head >> 24,
                     at,
                     microseconds(words[1]),
                     behind };
        const std::string wrong = wrong_with(event, m_recording.header);
        hold(wrong.empty(), m_place + " is damaged: " + wrong);
        keep(event, std::vector(behind.begin(), behind.end()));
        return count;
    }

    /** Ticks are told modulo 2^32; what another thread began to record before may have a place behind. */
    std::uint64_t microseconds(std::uint32_t ticks)
    {
        const auto since = static_cast<std::int32_t>(ticks - static_cast<std::uint32_t>(m_ticks));
        m_ticks = m_recording.events.empty() ? ticks : std::max<std::int64_t>(0, m_ticks + since);
        return static_cast<std::uint64_t>(m_ticks) * m_recording.header.u4TickNs / 1000;
    }

    void keep(Event event, std::vector<std::uint32_t> words)
    {
        if (event.kind == PMX_RECORDER_CALL)
            name_texts(replayed_layer().functions[event.function], std::span(words).subspan(1));
        else if (event.kind == PMX_RECORDER_CHANGE || event.kind == PMX_RECORDER_SNAPSHOT)
            words = m_state.as_here(words);
        event.words = m_recording.words.emplace_back(std::move(words));
        m_recording.events.push_back(event);
    }

    /** Where a text stood becomes its check sum. */
    Text name_text(std::uint32_t& word) const
    {
        if (word == 0)
            return { 0, 0 };
        const auto found = m_texts.find(word);
        hold(found != m_texts.end(), m_place + " is damaged: it has a text that was not told");
        word = found->second.sum;
        return found->second;
    }

    void name_texts(const Described& function, std::span<std::uint32_t> words) const
    {
        std::size_t at = 0;
        std::uint32_t code = 0;
        for (const DescribedParameter& parameter : function.parameters)
        {
            if (!function.tells_texts || at >= words.size())
                return;
            if (parameter.kind == "data" && (words[at] & PMX_PRESENT) != 0)
                at += PMX_WORDS(PMX_KEPT(words[at]));
            else if (parameter.kind == "text")
                code = name_text(words[at]).code;
            else if (parameter.kind == "values")
                name_values(code, words.subspan(at));
            ++at;
        }
    }

    void name_values(std::uint32_t code, std::span<std::uint32_t> words) const
    {
        for (std::size_t i = 0; i < words.size() && i < PMX_CODE_COUNT(code); ++i)
        {
            if ((PMX_CODE_TEXTS(code) >> i & 1) != 0)
                name_text(words[i]);
        }
    }

    std::string_view m_ring;
    Recording& m_recording;
    ForeignState m_state;
    std::map<std::uint32_t, Text> m_texts;
    std::string m_place;
    std::int64_t m_ticks = 0;
};

/** Where the first recording begins. Its first words stand in a dump elsewhere, too: as constants of programs, and
 *  before what is left of an older recording. */
std::size_t find_recording(std::string_view bytes)
{
    std::optional<std::string> first;
    for (std::size_t at = 0; (at = bytes.find(bytes_of(magic), at)) != bytes.npos; ++at)
    {
        try
        {
            header_of(bytes.substr(at));
            return at;
        }
        catch (const RecordingError& error)
        {
            if (!first)
                first = error.what();
        }
    }
    if (!first)
        refuse_without_magic(bytes);
    throw RecordingError(*first);
}

} // namespace

Recording read_recording(std::string_view bytes)
{
    bytes.remove_prefix(find_recording(bytes));
    Recording recording{ header_of(bytes), {}, {}, 0, {} };
    const auto back = oldest_snapshot(recording.header);
    hold(back.has_value(), "the recording has no snapshot to begin with");
    recording.lost = recording.header.u4Head - *back;
    Reader(bytes.substr(sizeof recording.header), recording).read(*back);
    return recording;
}

} // namespace pmxboard
