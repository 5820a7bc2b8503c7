// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/functions/operation.h"

#include <algorithm>

#include "record_fields.h"
#include "tools/pmxboard/functions/errors.h"

namespace pmxboard
{

using board::Value;
using board::names::Family;

Values read_arguments(const Operation& operation, std::span<const std::string> words)
{
    Values values;
    std::size_t next = 0;
    for (const Parameter& parameter : operation.parameters)
    {
        const bool written = next < words.size();
        if (parameter.may_be_null && written && words[next] == "null")
        {
            values.push_back(Value::null());
            ++next;
        }
        else if (parameter.is_output && written && words[next] == "null")
            throw LineError(parameter.name + " may not be null: " + operation.name + " does not test it");
        else if (parameter.is_output)
            values.push_back(Value::number(0));
        else if (written)
            values.push_back(read_value(parameter.kind, words[next++], parameter.name));
        else
            throw LineError(parameter.name + " is missing: " + usage(operation));
    }
    if (next < words.size())
        throw LineError(words[next] + " is too much: " + usage(operation));
    if (operation.check)
        operation.check(values);
    return values;
}

std::string usage(const Operation& operation)
{
    std::string text = operation.name;
    for (const Parameter& parameter : operation.parameters)
    {
        if (!parameter.is_output)
            text += " " + parameter.name;
    }
    return text;
}

std::string to_json(const Outcome& outcome)
{
    std::string json = "{";
    if (outcome.result)
        json.append("\"result\":").append(outcome.result->to_json());
    for (const OutputValue& output : outcome.outputs)
    {
        const bool is_first = &output == &outcome.outputs.front();
        json.append(is_first && outcome.result ? "," : "").append(is_first ? "\"outputs\":{" : ",");
        json.append(Value::text(output.name).to_json()).append(":");
        json.append(output.value ? output.value->to_json() : "\"untouched\"");
    }
    return json.append(outcome.outputs.empty() ? "}" : "}}");
}

const Operation* find(const std::vector<Operation>& table, std::string_view name)
{
    for (const Operation& operation : table)
    {
        if (operation.name == name)
            return &operation;
    }
    return nullptr;
}

std::vector<std::string_view> names_of(const std::vector<Operation>& table)
{
    std::vector<std::string_view> names;
    for (const Operation& operation : table)
        names.push_back(operation.name);
    return names;
}

namespace
{

std::vector<std::span<PMX_RESOLUTION_T>>& lent_outputs()
{
    static std::vector<std::span<PMX_RESOLUTION_T>> all;
    return all;
}

/** Of a record: its fields by name, with their kinds. */
template <typename Record>
Kind record_kind()
{
    Kind kind{ Kind::Form::Record, 0, false, Family::None, 0, {}, {} };
    const Record record{};
    records::each_field(record, [&kind](std::string_view owner, const char* name, const auto& field) {
        using Field = std::remove_cvref_t<decltype(field)>;
        kind.names.emplace_back(name);
        if constexpr (std::is_class_v<Field>)
            kind.members.push_back(record_kind<Field>());
        else
            kind.members.push_back(Argument<Field>::describe(owner, name).kind);
    });
    return kind;
}

template <typename Record>
Record filled(const Value& value)
{
    Record record{};
    records::each_field(record, [&value](std::string_view, std::string_view name, auto& field) {
        using Field = std::remove_cvref_t<decltype(field)>;
        if constexpr (std::is_class_v<Field>)
            field = filled<Field>(*value.find(name));
        else
            field = static_cast<Field>(value.find(name)->as_number());
    });
    return record;
}

} // namespace

Parameter Argument<const char*>::describe(std::string_view, const ParameterName& name)
{
    Parameter parameter{ .name = name.name, .is_output = false, .may_be_null = false, .kind = {} };
    parameter.kind.form = Kind::Form::Text;
    return parameter;
}

LentOutputs::LentOutputs(std::span<PMX_RESOLUTION_T> outputs) : m_outputs(outputs)
{
    if (!outputs.empty())
        lent_outputs().push_back(outputs);
}

LentOutputs::~LentOutputs()
{
    // Not the last one when threads end in another order than they began.
    std::erase_if(lent_outputs(), [this](const auto& lent) { return lent.data() == m_outputs.data(); });
}

std::span<PMX_RESOLUTION_T> LentOutputs::innermost()
{
    return lent_outputs().empty() ? std::span<PMX_RESOLUTION_T>() : lent_outputs().back();
}

Kind RecordKind<PMX_RESOLUTION_T>::kind()
{
    return record_kind<PMX_RESOLUTION_T>();
}

PMX_RESOLUTION_T RecordKind<PMX_RESOLUTION_T>::from(const Value& value)
{
    return filled<PMX_RESOLUTION_T>(value);
}

board::Value yielded(board::names::Family family, std::int64_t number)
{
    constexpr std::int64_t large = 0xFFFF;
    std::string_view name = board::names::name_of(family, number);
    for (const std::string_view general : board::names::all())
    {
        if (name.empty() && number > large && board::names::number_of(general) == number && general_constant(general))
            name = general;
    }
    return board::Value::number(number, name, number > large ? board::Value::Base::Hex : board::Value::Base::Decimal);
}

} // namespace pmxboard
