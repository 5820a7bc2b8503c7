// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/prompt/about_operation.h"

#include <algorithm>
#include <stdexcept>

#include "tools/pmxboard/functions/kind.h"
#include "tools/pmxboard/functions/operation_examples.h"
#include "tools/pmxboard/reasons/reason.h"

namespace pmxboard
{
namespace
{

using board::Value;

std::pair<std::int64_t, std::int64_t> range_of(const Kind& kind)
{
    const std::int64_t highest = (std::int64_t{ 1 } << (kind.is_signed ? kind.bits - 1 : kind.bits)) - 1;
    return { kind.is_signed ? -highest - 1 : 0, highest };
}

/** What may be written for a value of this kind. */
std::string kind_text(const Kind& kind)
{
    switch (kind.form)
    {
    case Kind::Form::Text: return "a text in quotes";
    case Kind::Form::List: return "a list of " + std::to_string(kind.count) + ", each " + kind_text(kind.members[0]);
    case Kind::Form::Record:
    {
        std::string fields;
        for (const std::string& name : kind.names)
            fields.append(fields.empty() ? "" : ", ").append(name);
        return "a record {" + fields + "}";
    }
    case Kind::Form::Number: break;
    }
    const auto [lowest, highest] = range_of(kind);
    const auto names = names_in(kind.family);
    const std::string numbers = std::to_string(lowest) + " to " + std::to_string(highest);
    if (names.empty())
        return numbers;
    if (names.size() > 4)
        return numbers + ", or a name: " + std::string(names[0]) + ", " + std::string(names[1]) + ", … " +
               std::string(names.back());
    std::string all;
    for (const std::string_view name : names)
        all.append(all.empty() ? "" : ", ").append(name);
    return numbers + ", or a name: " + all;
}

std::string argument_text(const Parameter& parameter, std::string_view meaning, std::size_t column, const Look& look)
{
    std::string lead = "  " + parameter.name;
    lead.append(column - lead.size(), ' ');
    const std::string kind =
        parameter.is_output ? "an output: not written, shown afterwards" : kind_text(parameter.kind);
    return wrapped(lead + std::string(meaning) + " [" + kind + "]", look.width, 0, static_cast<unsigned>(column));
}

std::string_view meaning_of(const Contract& contract, std::string_view parameter)
{
    for (const ContractParameter& entry : contract.parameters)
    {
        if (entry.name == parameter)
            return entry.text;
    }
    return {};
}

/** A declaration in lines that end behind a comma. */
std::string declaration_text(const Contract& contract, const Look& look)
{
    constexpr char glue = '\x01';
    std::string text(contract.declaration);
    for (std::size_t i = 1; i < text.size(); ++i)
    {
        if (text[i] == ' ' && text[i - 1] != ',')
            text[i] = glue;
    }
    text = wrapped(text + ";", look.width, 2, 6);
    std::replace(text.begin(), text.end(), glue, ' ');
    return text;
}

/** The end that a contract has in every text. */
std::string result_and_context(const Contract& contract, const Look& look)
{
    std::string text;
    if (!contract.result.empty())
        text += wrapped("Returns  " + std::string(contract.result), look.width, 0, 9);
    if (!contract.context.empty())
        text += wrapped("Called   from " + std::string(contract.context), look.width, 0, 9);
    return text;
}

/** Each reason once, by its first place. */
std::vector<ReasonPlace> different_reasons_of(std::string_view operation)
{
    std::vector<ReasonPlace> different;
    for (const ReasonPlace& place : reasons_of(operation))
    {
        if (std::none_of(different.begin(), different.end(),
                         [&](const ReasonPlace& other) { return other.number == place.number; }))
            different.push_back(place);
    }
    return different;
}

/** Why the operation may refuse, and what it may tell of its decisions. */
std::string reasons_text(std::string_view operation, const Look& look)
{
    constexpr unsigned column = 22;
    std::string refusals;
    std::string notes;
    for (const ReasonPlace& place : different_reasons_of(operation))
    {
        const ReasonRow& row = row_of(place.number);
        std::string line = "  " + std::string(row.name);
        line.append(column > line.size() ? column - line.size() : 1, ' ').append(general_sentence_of(row));
        (row.class_of == PMX_REASON_CLASS_NOTE ? notes : refusals) += wrapped(line, look.width, 0, column);
    }
    return (refusals.empty() ? "" : "\nMay do less, and explain why\n" + refusals) +
           (notes.empty() ? "" : "\nMay explain what it decides\n" + notes);
}

Value json_of(const Kind& kind)
{
    Value value;
    switch (kind.form)
    {
    case Kind::Form::Text: return value.add("kind", Value::text("text"));
    case Kind::Form::List:
        return value.add("kind", Value::text("list"))
            .add("items", Value::number(static_cast<std::int64_t>(kind.count)))
            .add("of", json_of(kind.members[0]));
    case Kind::Form::Record:
    {
        Value fields;
        for (std::size_t i = 0; i < kind.names.size(); ++i)
            fields.add(kind.names[i], json_of(kind.members[i]));
        return value.add("kind", Value::text("record")).add("fields", std::move(fields));
    }
    case Kind::Form::Number: break;
    }
    std::vector<Value> names;
    for (const std::string_view name : names_in(kind.family))
        names.push_back(Value::number(board::names::number_of(name).value_or(0), name));
    return value.add("kind", Value::text("number"))
        .add("lowest", Value::number(range_of(kind).first))
        .add("highest", Value::number(range_of(kind).second))
        .add("names", Value::list(std::move(names)));
}

Value reasons_json(std::string_view operation)
{
    std::vector<Value> list;
    for (const ReasonPlace& place : different_reasons_of(operation))
    {
        const ReasonRow& row = row_of(place.number);
        list.push_back(Value()
                           .add("id", Value::number(row.number))
                           .add("name", Value::text(std::string(row.name)))
                           .add("class", Value::text(std::string(row.class_name)))
                           .add("text", Value::text(general_sentence_of(row)))
                           .add("place", Value::text(std::string(place.file) + ":" + std::to_string(place.line))));
    }
    return Value::list(std::move(list));
}

Value text_or_null(std::string_view text)
{
    return text.empty() ? Value::null() : Value::text(std::string(text));
}

} // namespace

std::string operation_text(const Operation& operation, const Look& look)
{
    const Contract* const contract = contract_of(operation.name);
    if (contract == nullptr)
        throw std::logic_error(operation.name + " has no contract");
    std::string text = look.bold(usage(operation)) + "\n" + declaration_text(*contract, look) + "\n" +
                       wrapped(contract->brief, look.width, 0, 0);
    std::size_t column = 0;
    for (const Parameter& parameter : operation.parameters)
        column = std::max(column, parameter.name.size() + 4);
    text += operation.parameters.empty() ? "" : "\n";
    for (const Parameter& parameter : operation.parameters)
        text += argument_text(parameter, meaning_of(*contract, parameter.name), column, look);
    text += "\n" + result_and_context(*contract, look) + reasons_text(operation.name, look);
    if (const OperationExample* const example = example_of(operation.name))
    {
        text += "\nExample\n";
        for (const std::string_view line : example->before)
            text += "  " + std::string(line) + "\n";
        text += "  " + std::string(example->line) + "\n";
    }
    return text;
}

std::string platform_text(std::string_view function, const Look& look)
{
    const Contract* const contract = contract_of(function);
    if (contract == nullptr)
        throw std::logic_error(std::string(function) + " has no contract");
    std::string text = look.bold(contract->name) + ", a function of the platform: " + std::string(contract->header) +
                       "\n" + declaration_text(*contract, look) + "\n" + wrapped(contract->brief, look.width, 0, 0);
    std::size_t column = 0;
    for (const ContractParameter& parameter : contract->parameters)
        column = std::max(column, parameter.name.size() + 4);
    text += contract->parameters.empty() ? "" : "\n";
    for (const ContractParameter& parameter : contract->parameters)
    {
        std::string lead = "  " + std::string(parameter.name);
        lead.append(column - lead.size(), ' ').append(parameter.text);
        text += wrapped(lead, look.width, 0, static_cast<unsigned>(column));
    }
    const std::string end = result_and_context(*contract, look);
    return end.empty() ? text : text + "\n" + end;
}

Value json_of(const Contract& contract, const Operation* operation)
{
    std::vector<Value> arguments;
    for (std::size_t i = 0; i < contract.parameters.size(); ++i)
    {
        Value argument;
        argument.add("name", Value::text(std::string(contract.parameters[i].name)))
            .add("meaning", Value::text(std::string(contract.parameters[i].text)));
        if (operation != nullptr)
            argument.add("output", Value::number(operation->parameters[i].is_output))
                .add("value", json_of(operation->parameters[i].kind));
        arguments.push_back(std::move(argument));
    }
    const OperationExample* const example = operation != nullptr ? example_of(operation->name) : nullptr;
    std::vector<Value> before;
    for (const std::string_view line : example != nullptr ? example->before : std::vector<std::string_view>())
        before.push_back(Value::text(std::string(line)));
    Value record;
    record.add("name", Value::text(std::string(contract.name)))
        .add("owner", Value::text(operation != nullptr ? "layer" : "platform"))
        .add("usage", operation != nullptr ? Value::text(usage(*operation)) : Value::null())
        .add("declaration", Value::text(std::string(contract.declaration)))
        .add("header", Value::text(std::string(contract.header)))
        .add("section", text_or_null(contract.section))
        .add("brief", Value::text(std::string(contract.brief)))
        .add("arguments", Value::list(std::move(arguments)))
        .add("returns", text_or_null(contract.result))
        .add("context", text_or_null(contract.context))
        .add("reasons", reasons_json(contract.name))
        .add("example", example != nullptr ? Value::text(std::string(example->line)) : Value::null())
        .add("example_needs", Value::list(std::move(before)));
    return record;
}

} // namespace pmxboard
