// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Reasons that the lines of a log determine: those that a line says, or lines of one call together. That a line is
 *  missing determines nothing, for it may be lost. */
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/decode/log.h"
#include "tools/pmxboard/reasons/reason.h"

namespace pmxboard::decode
{

/** A reason as a log tells it. */
struct Determined
{
    PMX_REASON_T number;
    ReasonValues values;
    std::string unknown = "?"; ///< what stands in its sentence for a value that no line has
    std::size_t line = 0;      ///< that determines it, with those of its call before it
};

/** What the lines of a call have told so far. */
class CallSoFar
{
public:
    /** A call of this operation begins with the next line. */
    CallSoFar() = default;
    explicit CallSoFar(std::string_view operation) : m_operation(operation) {}

    /** Takes the call's next line, and tells the reasons that it determines. */
    std::vector<Determined> take(const Item& item);

    /* What the rows of reasons ask. */
    std::string_view operation() const { return m_operation; }
    bool is_behind(std::string_view text) const
    {
        return m_before != nullptr && m_before->text->format.starts_with(text);
    }
    /** A value of the line before, when that has the text. */
    std::optional<std::uint32_t> value_before(std::string_view text, std::string_view name) const;
    /** What feeds a plane, as the call has told. */
    std::optional<std::uint32_t> source_of_plane(std::optional<std::uint32_t> plane) const;
    /** The first output that is on, when the lines of all outputs before it are there. */
    std::optional<std::uint32_t> deciding_output() const { return m_decider; }
    /** The mode that the outputs give the mixer. */
    std::optional<std::uint32_t> format() const { return m_format; }
    /** In words, where its number is not known: its name is that of several modes, or it has none. */
    const std::string& format_words() const { return m_format_words; }

private:
    void take_output(const Item& item);
    void take_source(const Item& item);

    std::string_view m_operation;
    const Item* m_before = nullptr;
    std::array<std::optional<std::uint32_t>, 8> m_sources;
    std::uint32_t m_outputs = 0; ///< how many in a row, from the first on, are off
    std::optional<std::uint32_t> m_decider;
    std::optional<std::uint32_t> m_format;
    std::string m_format_words = "?";
};

} // namespace pmxboard::decode
