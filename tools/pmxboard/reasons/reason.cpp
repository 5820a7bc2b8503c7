// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/reasons/reason.h"

#include <array>
#include <cstdio>
#include <stdexcept>

#include "board/names.h"
#include "drv_if_pmx.h"
#include "tools/pmxboard/reasons/place.h"
#include "tools/record_view/mode_table.h"

namespace pmxboard
{
namespace
{

using board::Value;
using board::names::Family;

constexpr std::string_view advice_of(PMX_REASON_CLASS_T class_of)
{
    switch (class_of)
    {
#define PMX_REASON_ROW(Number, Name, Advice) \
    case PMX_REASON_CLASS_##Name: return Advice;
        PMX_REASON_CLASSES(PMX_REASON_ROW)
#undef PMX_REASON_ROW
    }
    return {};
}

constexpr ReasonRow rows[] = {
#define PMX_REASON_ROW(Number, Name, Class, A, B, Sentence)                                              \
    { PMX_REASON_##Name, #Name,   PMX_REASON_CLASS_##Class, #Class, advice_of(PMX_REASON_CLASS_##Class), \
      { #A, #B },        Sentence },
    PMX_REASONS_KNOWN(PMX_REASON_ROW)
#undef PMX_REASON_ROW
};

std::vector<Reason>& gathered()
{
    static std::vector<Reason> reasons;
    return reasons;
}

std::function<void(const Reason&)>& listener_of_reasons()
{
    static std::function<void(const Reason&)> listener;
    return listener;
}

std::string with_number(std::string_view name, std::uint32_t value)
{
    const std::string number = std::to_string(value);
    return name.empty() ? number : std::string(name) + " (" + number + ")";
}

/** What hangs on a bit: a feature, or modes, of which the first few say it. */
std::string name_of_capability(std::uint32_t bit)
{
    constexpr unsigned most = 2;
    const auto features = record_view::capability_features();
    if (const auto feature = features.find(bit); feature != features.end())
        return feature->second;
    std::string names;
    unsigned count = 0;
    for (const record_view::ModeRow& row : record_view::mode_rows())
    {
        if (row.capability != bit)
            continue;
        if (++count > most)
            return names + ", ...";
        names.append(names.empty() ? "" : ", ").append(row.name);
    }
    return names;
}

std::string hexadecimal(std::string_view conversion, std::uint32_t value)
{
    char text[16];
    std::snprintf(text, sizeof text, conversion.find("08") != conversion.npos ? "0x%08X" : "0x%X", value);
    return text;
}

/** A value in the place of its conversion, "%u" or "%08X", by its name where it has one. */
std::string shown(std::string_view kind, std::string_view conversion, std::uint32_t value)
{
    if (kind == "MODE")
        return with_number(board::names::name_of(Family::ResolutionMode, value), value);
    if (kind == "OUTPUT")
        return with_number(board::names::name_of(Family::Output, value), value);
    if (kind == "COLOUR_SPACE")
        return with_number(board::names::name_of(Family::ColorSpace, value), value);
    if (kind == "COMP_TYPE")
        return with_number(board::names::name_of(Family::ComponentType, value), value);
    if (kind == "HDMI_COMMAND")
        return with_number(board::names::name_of(Family::AvdCommand, value), value);
    if (kind == "CAP_BIT")
    {
        const std::string name = name_of_capability(value);
        return std::to_string(value) + (name.empty() ? "" : " (" + name + ")");
    }
    if (kind == "PORT")
        return std::to_string(value) + (value == 0   ? " (main video)"
                                        : value == 1 ? " (second video)"
                                                     : " (OSD " + std::to_string(value - 2) + ")");
    if (kind == "SIGNED")
        return std::to_string(static_cast<std::int32_t>(value));
    if (kind == "PLANES")
        return std::to_string(value >> 4) + " and " + std::to_string(value & 15);
    return conversion.ends_with('X') ? hexadecimal(conversion, value) : std::to_string(value);
}

/** A sentence with what `of_value` yields in the place of each value. */
template <typename OfValue>
std::string filled(const ReasonRow& row, const OfValue& of_value)
{
    std::string text;
    std::size_t next = 0;
    for (std::size_t i = 0; i < row.sentence.size(); ++i)
    {
        if (row.sentence[i] != '%')
        {
            text += row.sentence[i];
            continue;
        }
        const std::size_t end = row.sentence.find_first_of("udX", i);
        const std::string_view conversion = row.sentence.substr(i, end + 1 - i);
        // What is read in hexadecimal has its own mark, or is told by names.
        if (conversion.ends_with('X') && text.ends_with("0x"))
            text.resize(text.size() - 2);
        text += of_value(next++, conversion);
        i = end;
    }
    return text;
}

} // namespace

std::span<const ReasonRow> reason_rows()
{
    return rows;
}

const ReasonRow& row_of(PMX_REASON_T reason)
{
    for (const ReasonRow& row : rows)
    {
        if (row.number == reason)
            return row;
    }
    throw std::out_of_range("no reason has the number " + std::to_string(static_cast<int>(reason)));
}

bool is_refusal(const Reason& reason)
{
    return row_of(reason.number).class_of != PMX_REASON_CLASS_NOTE;
}

std::string sentence_of(PMX_REASON_T reason, const ReasonValues& values, std::string_view unknown)
{
    const ReasonRow& row = row_of(reason);
    return filled(row, [&](std::size_t i, std::string_view conversion) {
        return values.at(i) ? shown(row.kinds.at(i), conversion, *values.at(i)) : std::string(unknown);
    });
}

std::string sentence_of(const Reason& reason)
{
    return sentence_of(reason.number, { reason.a, reason.b });
}

std::string general_sentence_of(const ReasonRow& row)
{
    return filled(row, [&](std::size_t i, std::string_view) {
        const std::string_view kind = row.kinds.at(i);
        const bool is_plain = kind != "MODE" && kind != "WORD" && kind != "PLANES";
        return kind == "PLANES" ? std::string("N and N") : is_plain ? std::string("N") : std::string(kind);
    });
}

std::string place_of(const Reason& reason)
{
    return reason.function + ", " + reason.file + ":" + std::to_string(reason.line);
}

Value json_of(const Reason& reason)
{
    const ReasonRow& row = row_of(reason.number);
    std::vector<Value> values;
    const std::uint32_t numbers[] = { reason.a, reason.b };
    for (std::size_t i = 0; i < row.kinds.size() && row.kinds[i] != "NONE"; ++i)
        values.push_back(row.kinds[i] == "SIGNED" ? Value::number(static_cast<std::int32_t>(numbers[i]))
                                                  : Value::number(numbers[i]));
    return Value::record({ { "id", Value::number(reason.number) },
                           { "name", Value::text(std::string(row.name)) },
                           { "class", Value::text(std::string(row.class_name)) },
                           { "values", Value::list(std::move(values)) },
                           { "text", Value::text(sentence_of(reason)) },
                           { "function", Value::text(reason.function) },
                           { "place", Value::text(reason.file + ":" + std::to_string(reason.line)) } });
}

const std::vector<Reason>& told_reasons()
{
    return gathered();
}

void forget_told_reasons()
{
    gathered().clear();
}

void on_told_reason(std::function<void(const Reason&)> listener)
{
    listener_of_reasons() = std::move(listener);
}

} // namespace pmxboard

/* The twin's hook. */
void pmx_twin_reason(PMX_REASON_T eReason, UINT32 u4A, UINT32 u4B, const CHAR* szFile, INT32 i4Line,
                     const CHAR* szFunction)
{
    pmxboard::gathered().push_back({ eReason, u4A, u4B, szFile, static_cast<unsigned>(i4Line), szFunction });
    if (const auto& listener = pmxboard::listener_of_reasons())
        listener(pmxboard::gathered().back());
}
