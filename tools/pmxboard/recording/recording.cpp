// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/recording/recording.h"

#include <bit>
#include <cstring>
#include <optional>

#include "tools/pmxboard/recording/replayed.h"

namespace pmxboard
{
namespace
{

constexpr std::uint32_t magic[] = { PMX_RECORDER_MAGIC_0, PMX_RECORDER_MAGIC_1, PMX_RECORDER_MAGIC_2 };

/** Where a recording begins. */
std::size_t find_magic(std::string_view bytes)
{
    std::uint32_t swapped[3];
    for (std::size_t i = 0; i < 3; ++i)
        swapped[i] = __builtin_bswap32(magic[i]);
    const std::string_view wanted(reinterpret_cast<const char*>(magic), sizeof magic);
    const std::string_view other(reinterpret_cast<const char*>(swapped), sizeof swapped);
    const std::size_t at = bytes.find(wanted);
    if (at == bytes.npos && bytes.find(other) != bytes.npos)
        throw RecordingError("the recording was made on a processor with the other order of bytes");
    if (at == bytes.npos)
        throw RecordingError("there is no recording in it");
    return at;
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
    const ReplayedLayer& layer = replayed_layer();
    hold(header.u4Version == PMX_RECORDER_VERSION, "the recording has version " + std::to_string(header.u4Version) +
                                                       "; this tool reads version " +
                                                       std::to_string(PMX_RECORDER_VERSION));
    hold(header.u4PointerSize == sizeof(void*), "the recording was made where pointers have " +
                                                    std::to_string(header.u4PointerSize) + " bytes; here they have " +
                                                    std::to_string(sizeof(void*)));
    hold(header.u4Interface == layer.interface && header.u4ExportedSize == layer.exported_size &&
             header.u4StateSize == layer.state_size,
         "the recording was made with another version of the layer's interface");
    hold(std::has_single_bit(header.u4RingWords) && header.u4RingWords >= PMX_RECORDER_LEAST_WORDS,
         "the recording's ring has an impossible size");
    hold((bytes.size() - sizeof header) / 4 >= header.u4RingWords, "the recording ends within its ring");
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

std::vector<std::uint32_t> words_of(std::string_view ring, const PMX_RECORDER_T& header, std::uint32_t back)
{
    std::vector<std::uint32_t> words(back);
    for (std::uint32_t i = 0; i < back; ++i)
    {
        const std::size_t at = (header.u4Head - back + i) & (header.u4RingWords - 1);
        std::memcpy(&words[i], ring.data() + 4 * at, 4);
    }
    return words;
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
    }
    return "no such kind of event";
}

void read_events(Recording& recording)
{
    const std::span<const std::uint32_t> words = recording.words;
    const std::uint32_t first = recording.header.u4Head - static_cast<std::uint32_t>(words.size());
    for (std::size_t i = 0; i < words.size();)
    {
        const std::uint32_t head = words[i];
        const std::size_t count = head & 0xFF;
        const std::string place = "event " + std::to_string(recording.events.size() + 1);
        hold(count >= 2 && count <= words.size() - i, place + " is damaged: it has an impossible length");
        const Event event{ static_cast<PMX_RECORDER_KIND_T>(head >> 8 & 0x7F),
                           (head >> 8 & PMX_RECORDER_ANSWERED) != 0,
                           head >> 16 & 0xFF,
                           head >> 24,
                           first + static_cast<std::uint32_t>(i),
                           words[i + 1],
                           words.subspan(i + 2, count - 2) };
        const std::string wrong = wrong_with(event, recording.header);
        hold(wrong.empty(), place + " is damaged: " + wrong);
        recording.events.push_back(event);
        i += count;
    }
    hold(!recording.events.empty() && recording.events.front().kind == PMX_RECORDER_SNAPSHOT,
         "the recording has no snapshot where it says");
}

} // namespace

Recording read_recording(std::string_view bytes)
{
    bytes.remove_prefix(find_magic(bytes));
    Recording recording{ header_of(bytes), {}, {}, 0 };
    const auto back = oldest_snapshot(recording.header);
    hold(back.has_value(), "the recording has no snapshot to begin with");
    recording.words = words_of(bytes.substr(sizeof recording.header), recording.header, *back);
    recording.lost = recording.header.u4Head - *back;
    read_events(recording);
    return recording;
}

} // namespace pmxboard
