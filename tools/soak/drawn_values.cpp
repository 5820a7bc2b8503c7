// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/soak/drawn_values.h"

#include <map>

namespace soak
{
namespace
{

using board::Value;
using board::names::Family;
using pmxboard::Kind;

std::vector<std::int64_t> numbers_of(Family family)
{
    std::vector<std::int64_t> numbers;
    for (const std::string_view name : pmxboard::names_in(family))
        numbers.push_back(board::names::number_of(name).value());
    return numbers;
}

const std::vector<std::int64_t>& named_numbers(Family family)
{
    static std::map<Family, std::vector<std::int64_t>> known;
    const auto found = known.find(family);
    return found != known.end() ? found->second : known.emplace(family, numbers_of(family)).first->second;
}

std::int64_t cut(std::uint64_t number, unsigned bits)
{
    return static_cast<std::int64_t>(bits < 64 ? number & ((std::uint64_t{ 1 } << bits) - 1) : number);
}

Value draw_value(Choices& choices, const Kind& kind);

Value draw_list(Choices& choices, const Kind& kind)
{
    std::vector<Value> items;
    for (std::size_t i = 0; i < kind.count; ++i)
        items.push_back(draw_value(choices, kind.members.front()));
    return Value::list(std::move(items));
}

Value draw_record(Choices& choices, const Kind& kind)
{
    std::vector<std::pair<std::string, Value>> members;
    for (std::size_t i = 0; i < kind.names.size(); ++i)
        members.emplace_back(kind.names[i], draw_value(choices, kind.members[i]));
    return Value::record(std::move(members));
}

Value draw_value(Choices& choices, const Kind& kind)
{
    // None wants a value: a caller who hands over too few has broken down before the layer could do anything.
    static constexpr const char* texts[] = { "", "text\n", "100%%\n" };
    switch (kind.form)
    {
    case Kind::Form::Text: return Value::text(choices.one_of(texts));
    case Kind::Form::List: return draw_list(choices, kind);
    case Kind::Form::Record: return draw_record(choices, kind);
    case Kind::Form::Number: break;
    }
    return Value::number(draw_number(choices, kind.family, kind.bits));
}

Value draw_argument(Choices& choices, const pmxboard::Parameter& parameter)
{
    if (parameter.may_be_null && choices.once_in(16))
        return Value::null();
    if (parameter.is_output)
        return Value::number(0);
    // There is one mixer.
    if (parameter.name == "ucPmxId" && !choices.once_in(16))
        return Value::number(0);
    return draw_value(choices, parameter.kind);
}

} // namespace

std::int64_t draw_number(Choices& choices, Family family, unsigned bits)
{
    static constexpr std::uint64_t edges[] = { 0, 1, 2, 3, 50, 60, 127, 128, 255, 256, 0x7FFFFFFF, 0x80000000, ~0ull };
    const std::uint64_t way = choices.below(8);
    if (way == 0)
        return cut(choices.any(), bits);
    if (way < 3)
        return cut(choices.one_of(edges), bits);
    const auto& named = named_numbers(family);
    if (family == Family::None || named.empty())
        return static_cast<std::int64_t>(choices.below(8));
    return cut(static_cast<std::uint64_t>(choices.one_of(named)), bits);
}

pmxboard::Values draw_arguments(Choices& choices, const pmxboard::Operation& operation)
{
    pmxboard::Values values;
    for (const pmxboard::Parameter& parameter : operation.parameters)
        values.push_back(draw_argument(choices, parameter));
    return values;
}

} // namespace soak
