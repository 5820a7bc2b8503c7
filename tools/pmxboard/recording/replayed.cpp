// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/recording/replayed.h"

#include <algorithm>
#include <cstring>
#include <stdexcept>

#include "recorder/encoding.h"

// Written from the headers; not in every program that has the tool's library.
__attribute__((weak)) const pmxboard::ReplayedLayer& pmxboard_replayed_layer();

namespace pmxboard
{

/** What a spare place holds until it is written: no flag, no frequency, no order. */
constexpr UINT32 spare = 0xA5A5A5A5;

Bytes::Bytes(std::span<const UINT32> words, std::size_t size) : m_size(size), m_is_null(false)
{
    std::copy(words.begin(), words.end(), m_content.begin());
}

void* Bytes::pointer_or_spare()
{
    if (m_is_null)
        m_content.fill(spare);
    return m_content.data();
}

bool Bytes::is_spare_written() const
{
    return m_is_null && m_content.front() != spare;
}

void Bytes::put_into(std::vector<UINT32>& words) const
{
    if (!m_is_null)
        words.insert(words.end(), m_content.begin(), m_content.begin() + PMX_WORDS(m_size));
}

void Given::note_loss(std::string_view parameter, const Bytes& behind)
{
    if (behind.is_spare_written())
        m_loss = parameter;
}

UINT32 Given::number()
{
    return m_at < m_words.size() ? m_words[m_at++] : 0;
}

Bytes Given::bytes()
{
    const UINT32 present = number();
    if ((present & PMX_PRESENT) == 0)
        return {};
    const std::size_t size = std::min<std::size_t>(
        { PMX_KEPT(present), PMX_MOST_TEXT, 4 * (m_words.size() - std::min(m_at, m_words.size())) });
    const auto words = m_words.subspan(m_at, PMX_WORDS(size));
    m_at += words.size();
    return Bytes(words, size);
}

std::vector<long> Given::values(const char* format)
{
    std::vector<long> numbers;
    const UINT32 code = u4PmxCode(format);
    m_texts.reserve(PMX_MOST_VALUES);
    for (UINT32 i = 0; i < PMX_CODE_COUNT(code); ++i)
    {
        if ((PMX_CODE_TEXTS(code) >> i & 1) != 0)
            numbers.push_back(reinterpret_cast<long>(m_texts.emplace_back(bytes()).pointer()));
        else
            numbers.push_back(static_cast<INT32>(number()));
    }
    numbers.resize(PMX_MOST_VALUES);
    return numbers;
}

std::span<const UINT32> Answer::next(std::size_t words)
{
    const auto found = written.first(std::min(words, written.size()));
    written = written.subspan(found.size());
    return found;
}

void Answer::write(void* place, std::size_t size)
{
    const auto words = next(PMX_WORDS(size));
    if (place != nullptr && !words.empty())
        std::memcpy(place, words.data(), std::min(size, words.size_bytes()));
}

void Answer::write_text(char* place, std::size_t size)
{
    if (place == nullptr || size == 0)
        return;
    const auto present = next(1);
    const std::size_t length =
        present.empty() ? 0 : std::min<std::size_t>({ PMX_KEPT(present[0]), size - 1, written.size_bytes() });
    if (length != 0)
        std::memcpy(place, written.data(), length);
    place[length] = 0;
}

void Answer::write_table(void** place, const void* table)
{
    next(1);
    if (place != nullptr && static_cast<INT32>(number) >= 0)
        *place = const_cast<void*>(table);
}

void Answer::write_tag(void** place)
{
    const auto word = next(1);
    if (place != nullptr && !word.empty())
        *place = reinterpret_cast<void*>(std::uintptr_t{ word[0] });
}

bool hands_out_table(const Described& function)
{
    const auto& all = function.parameters;
    return std::any_of(all.begin(), all.end(), [](const auto& parameter) { return parameter.kind == "table"; });
}

const ReplayedLayer& replayed_layer()
{
    if (pmxboard_replayed_layer == nullptr)
        throw std::runtime_error("this program was linked without the layer that recordings are replayed with");
    return pmxboard_replayed_layer();
}

} // namespace pmxboard
