// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What might be accepted instead of a request that was refused: of a mode the fewest outputs changed, then the same
// size and scan, then the nearest frequency, then the lower number; of another argument the nearest value.
#include <algorithm>
#include <cstdlib>
#include <iterator>
#include <set>
#include <span>
#include <tuple>

#include "drv_pmx.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/mode_names.h"
#include "tools/pmxboard/functions/operation_examples.h"
#include "tools/pmxboard/language/explanation.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/record_view/mode_table.h"

namespace pmxboard
{
namespace
{

using board::Value;
using board::names::Family;
using Requests = std::vector<std::vector<std::string>>;

/** A call as it was written, with what each of its words stands for. */
struct WrittenCall
{
    const Operation* operation = nullptr;
    std::vector<std::string> words;                   ///< behind the name
    Values values;                                    ///< by parameter
    std::vector<std::optional<std::size_t>> word_for; ///< by parameter; nothing for an output that is not written
};

WrittenCall written_call(const Operation& operation, const Line& line)
{
    WrittenCall call{
        .operation = &operation, .words = { line.words().begin() + 1, line.words().end() }, .values = {}, .word_for = {}
    };
    call.values = read_arguments(operation, call.words);
    std::size_t next = 0;
    for (std::size_t i = 0; i < operation.parameters.size(); ++i)
    {
        const bool is_written = !operation.parameters[i].is_output || call.values[i].kind() == Value::Kind::Null;
        call.word_for.push_back(is_written ? std::optional(next++) : std::nullopt);
    }
    return call;
}

/** The call with other words for some parameters; an empty one is left out. */
std::string with(const WrittenCall& call, const std::vector<std::pair<std::size_t, std::string>>& changed)
{
    std::vector<std::string> words = call.words;
    for (const auto& [parameter, word] : changed)
        words[call.word_for[parameter].value()] = word;
    std::string text = call.operation->name;
    for (const std::string& word : words)
        text += word.empty() ? "" : " " + word;
    return text;
}

std::optional<std::size_t> parameter_called(const Operation& operation, std::string_view name)
{
    for (std::size_t i = 0; i < operation.parameters.size(); ++i)
    {
        if (operation.parameters[i].name == name)
            return i;
    }
    return std::nullopt;
}

/* Modes */

constexpr double usual_frequency = 60;

/** 0 where the name does not tell it. */
double refresh(unsigned mode)
{
    return std::strtod(refresh_of(record_view::mode_row(mode).name).c_str(), nullptr);
}

/** No other word in the modes' names has that letter. */
bool is_interlaced(std::string_view name)
{
    return name.find('I') != name.npos;
}

/** All modes but one, those nearest to it first; `asked` is the frequency where its name has none. */
std::vector<unsigned> modes_near(unsigned mode, double asked = usual_frequency)
{
    constexpr std::string_view stereo = "RES_3D_";
    const record_view::ModeRow wanted = record_view::mode_row(mode);
    const double named = refresh(mode);
    const double frequency = named != 0 ? named : asked;
    const auto distance = [&](unsigned other) {
        const record_view::ModeRow row = record_view::mode_row(other);
        const bool is_alike = row.width == wanted.width && row.height == wanted.height &&
                              is_interlaced(row.name) == is_interlaced(wanted.name) &&
                              row.name.starts_with(stereo) == wanted.name.starts_with(stereo);
        return std::tuple(!is_alike, std::abs(refresh(other) - frequency), other);
    };
    std::vector<unsigned> near;
    for (const record_view::ModeRow& row : record_view::mode_rows())
    {
        if (row.number != mode)
            near.push_back(row.number);
    }
    std::sort(near.begin(), near.end(), [&](unsigned a, unsigned b) { return distance(a) < distance(b); });
    return near;
}

std::string whole_refresh(unsigned mode)
{
    const std::string text = refresh_of(record_view::mode_row(mode).name);
    return text.substr(0, text.find('.'));
}

/** A frequency that was the mode's goes with it, and so does one that its name does not tell. */
std::vector<std::pair<std::size_t, std::string>> with_frequency(const WrittenCall& call, unsigned from, unsigned to)
{
    const auto frequency = parameter_called(*call.operation, "ucVFreq");
    const std::string before = whole_refresh(from);
    if (!frequency || whole_refresh(to).empty() ||
        (!before.empty() && std::to_string(call.values[*frequency].as_number()) != before))
        return {};
    return { { *frequency, whole_refresh(to) } };
}

/** Which output gave the mixer its mode, of a setting of all outputs. */
std::size_t deciding_output(const Explanation& explanation)
{
    for (const Reason& reason : explanation.reasons)
    {
        if (reason.number == PMX_REASON_FORMAT_FROM_OUTPUT)
            return reason.a;
    }
    return PMX_OUTPUT_HDMI;
}

/** What need not be written, because fields that are left out are 0. */
bool is_nothing(const Value& value)
{
    return value.as_number() == 0 && std::all_of(value.items().begin(), value.items().end(), is_nothing);
}

/** The outputs with another mode for one of them. */
std::string with_mode(const Value& outputs, std::size_t output, unsigned mode)
{
    std::vector<Value> items;
    for (std::size_t i = 0; i < outputs.items().size(); ++i)
    {
        const Value& item = outputs.items()[i];
        std::vector<std::pair<std::string, Value>> members;
        for (const std::string& key : item.keys())
        {
            const Value& field = *item.find(key);
            if (i == output && key == "eResMode")
                members.emplace_back(key, Value::number(mode, full_name_of(mode)));
            else if (key == "fgOutputEnable" || !is_nothing(field))
                members.emplace_back(key, field);
        }
        items.push_back(Value::record(std::move(members)));
    }
    return Value::list(std::move(items)).to_text();
}

Requests calls_with_other_modes(const WrittenCall& call, const Explanation& explanation)
{
    Requests requests;
    const auto frequency = parameter_called(*call.operation, "ucVFreq");
    const double asked = frequency ? static_cast<double>(call.values[*frequency].as_number()) : usual_frequency;
    const auto add = [&](std::size_t parameter, unsigned from, const auto& word_of) {
        for (const unsigned mode : modes_near(from, asked))
        {
            auto changed = with_frequency(call, from, mode);
            changed.emplace_back(parameter, word_of(mode));
            requests.push_back({ with(call, changed) });
        }
    };
    for (std::size_t i = 0; i < call.values.size(); ++i)
    {
        const Parameter& parameter = call.operation->parameters[i];
        if (parameter.is_output)
            continue;
        if (parameter.kind.family == Family::ResolutionMode)
            add(i, static_cast<unsigned>(call.values[i].as_number()), full_name_of);
        else if (parameter.name == "prOutConf" && call.values[i].kind() == Value::Kind::List)
        {
            const std::size_t output = deciding_output(explanation);
            const Value* const mode = call.values[i].items().at(output).find("eResMode");
            add(i, static_cast<unsigned>(mode->as_number()),
                [&](unsigned other) { return with_mode(call.values[i], output, other); });
        }
    }
    return requests;
}

/** The same of `outputs hdmi=…`. */
Requests settings_with_other_modes(const Line& line, const Explanation& explanation)
{
    Requests requests;
    const std::size_t output = deciding_output(explanation);
    for (std::size_t i = 1; i < line.size(); ++i)
    {
        const std::string& setting = line.word(i);
        const std::string name = setting.substr(0, setting.find('='));
        const std::string mode = setting.substr(std::min(name.size() + 1, setting.size()));
        if (mode == "off" || output_called(name) != output)
            continue;
        for (const unsigned other : modes_near(read_mode(mode)))
        {
            std::string text = line.word(0);
            for (std::size_t j = 1; j < line.size(); ++j)
                text += " " + (j == i ? name + "=" + short_name_of(full_name_of(other)) : line.word(j));
            requests.push_back({ text });
        }
    }
    return requests;
}

/* Other arguments */

/** Numbers near one, within what an argument can hold, the nearest first: neighbours, small numbers, and those that
 *  have names. */
std::vector<std::int64_t> numbers_near(std::int64_t number, const Kind& kind)
{
    constexpr std::int64_t neighbours = 64;
    const std::int64_t lowest = kind.is_signed ? -(std::int64_t{ 1 } << (kind.bits - 1)) : 0;
    const std::int64_t highest = (std::int64_t{ 1 } << (kind.is_signed ? kind.bits - 1 : kind.bits)) - 1;
    std::set<std::int64_t> all;
    for (std::int64_t distance = 0; distance <= neighbours; ++distance)
        all.insert({ number - distance, number + distance, distance });
    for (const std::string_view name : names_in(kind.family))
        all.insert(board::names::number_of(name).value_or(0));
    std::vector<std::int64_t> near;
    std::copy_if(all.begin(), all.end(), std::back_inserter(near),
                 [&](std::int64_t other) { return other != number && other >= lowest && other <= highest; });
    std::stable_sort(near.begin(), near.end(),
                     [&](std::int64_t a, std::int64_t b) { return std::abs(a - number) < std::abs(b - number); });
    return near;
}

/** Whether the wrong number is an amount, or one of a kind, of which another one serves as well. Another plane, port or
 *  component is another thing. */
bool is_replaceable(PMX_REASON_T reason)
{
    return reason == PMX_REASON_MIXER_ID || reason == PMX_REASON_POSITION || reason == PMX_REASON_TV_SYSTEM ||
           reason == PMX_REASON_COLOUR_FORMAT || reason == PMX_REASON_COLOUR_SPACE;
}

/** Another number in the place of the argument that the reason tells of. */
Requests calls_with_other_numbers(const WrittenCall& call, const Reason& refusal)
{
    Requests requests;
    for (std::size_t i = 0; i < call.values.size(); ++i)
    {
        const Parameter& parameter = call.operation->parameters[i];
        const bool is_id = parameter.name == "ucPmxId";
        if (parameter.is_output || parameter.kind.form != Kind::Form::Number ||
            is_id != (refusal.number == PMX_REASON_MIXER_ID) ||
            static_cast<std::uint32_t>(call.values[i].as_number()) != refusal.a)
            continue;
        for (const std::int64_t other :
             is_id ? std::vector<std::int64_t>{ 0 } : numbers_near(call.values[i].as_number(), parameter.kind))
        {
            const std::string_view name = board::names::name_of(parameter.kind.family, other);
            requests.push_back({ with(call, { { i, name.empty() ? std::to_string(other) : std::string(name) } }) });
        }
    }
    return requests;
}

/** Something where there was a null pointer. */
Requests calls_with_a_pointer(const WrittenCall& call, const Reason& refusal)
{
    const std::size_t parameter = refusal.a - 1;
    if (parameter >= call.values.size() || call.values[parameter].kind() != Value::Kind::Null)
        return {};
    if (call.operation->parameters[parameter].is_output)
        return { { with(call, { { parameter, "" } }) } };
    const OperationExample* const example = example_of(call.operation->name);
    if (example == nullptr)
        return {};
    const WrittenCall other = written_call(*call.operation, Line(example->line));
    return { { with(call, { { parameter, other.words[other.word_for[parameter].value()] } }) } };
}

/** A plane order in which each source that stands there again makes room for one that is missing. */
Requests orders_without_doubles(const WrittenCall& call)
{
    const auto parameter = parameter_called(*call.operation, "u4PlaneOrder");
    if (!parameter)
        return {};
    const auto given = static_cast<std::uint32_t>(call.values[*parameter].as_number());
    std::set<std::uint32_t> missing = { 0, 1, 2, 3, 4, 5, 6, 7 };
    for (unsigned plane = 0; plane < 8; ++plane)
        missing.erase(given >> (4 * plane) & 7);
    std::set<std::uint32_t> used;
    std::uint32_t order = 0;
    for (unsigned plane = 0; plane < 8; ++plane)
    {
        std::uint32_t source = given >> (4 * plane) & 7;
        if (!used.insert(source).second)
            source = missing.extract(missing.begin()).value();
        order |= source << (4 * plane);
    }
    return { { with(call, { { *parameter, Value::number(order, {}, Value::Base::Hex).to_text() } }) } };
}

Requests near_of_call(const WrittenCall& call, const Explanation& explanation, const Reason& refusal)
{
    switch (row_of(refusal.number).class_of)
    {
    case PMX_REASON_CLASS_MODE: return calls_with_other_modes(call, explanation);
    case PMX_REASON_CLASS_CONNECT:
        return { { "i4Pmx_Connect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_VDP " + std::to_string(refusal.a),
                   explanation.command } };
    case PMX_REASON_CLASS_ARGUMENT:
        if (refusal.number == PMX_REASON_NULL_POINTER)
            return calls_with_a_pointer(call, refusal);
        if (refusal.number == PMX_REASON_SOURCE_TWICE)
            return orders_without_doubles(call);
        return is_replaceable(refusal.number) ? calls_with_other_numbers(call, refusal) : Requests();
    case PMX_REASON_CLASS_NOTE:
    case PMX_REASON_CLASS_START: // who finds that out wants to end it
    case PMX_REASON_CLASS_SAME:
    case PMX_REASON_CLASS_FEATURE:
    case PMX_REASON_CLASS_NEIGHBOUR: break;
    }
    return {};
}

} // namespace

Requests requests_near(const Explanation& explanation)
{
    const Reason* const refusal = explanation.refusal();
    if (refusal == nullptr)
        return {};
    const Line line(explanation.command);
    const Command command = find_command(line.word(0));
    if (command.operation != nullptr)
        return near_of_call(written_call(*command.operation, line), explanation, *refusal);
    if (line.word(0) == "outputs" && row_of(refusal->number).class_of == PMX_REASON_CLASS_MODE)
        return settings_with_other_modes(line, explanation);
    return {};
}

} // namespace pmxboard
