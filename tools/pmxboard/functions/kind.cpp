// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/functions/kind.h"

#include <algorithm>
#include <cctype>

#include "board/tokens.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

using board::Value;
using board::names::Family;

/** Whether a name is of this family alone. */
bool is_of(Family family, std::string_view name, std::int64_t number)
{
    return family != Family::None && board::names::name_of(family, number) == name;
}

bool has_leading_zero(std::string_view token)
{
    if (token.starts_with('-') || token.starts_with('+'))
        token.remove_prefix(1);
    return token.size() > 1 && token[0] == '0' && std::isdigit(static_cast<unsigned char>(token[1])) != 0;
}

std::vector<std::string_view> names_for(Family family)
{
    std::vector<std::string_view> names;
    for (const std::string_view name : board::names::all())
    {
        const auto number = board::names::number_of(name);
        if (number && (is_of(family, name, *number) || general_constant(name)))
            names.push_back(name);
    }
    return names;
}

Value read_number_value(const Kind& kind, std::string_view token, const std::string& what)
{
    const std::int64_t number = read_number(kind.family, token, what);
    const std::int64_t highest = (std::int64_t{ 1 } << (kind.is_signed ? kind.bits - 1 : kind.bits)) - 1;
    const std::int64_t lowest = kind.is_signed ? -highest - 1 : 0;
    if (number < lowest || number > highest)
        throw LineError(what + " takes " + std::to_string(lowest) + " to " + std::to_string(highest) + ", not " +
                        std::string(token));
    return Value::number(number, board::names::name_of(kind.family, number));
}

std::vector<std::string_view> parts_of(std::string_view token, char open, char close, const std::string& what,
                                       const char* form)
{
    try
    {
        if (token.starts_with(open) && token.ends_with(close))
            return board::tokens::split(board::tokens::inside(token, open, close));
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(what + ": " + error.what());
    }
    throw LineError(what + " takes " + form + ", not " + std::string(token));
}

Value read_list(const Kind& kind, std::string_view token, const std::string& what)
{
    const auto parts = parts_of(token, '[', ']', what, "a list [a, b, …]");
    if (parts.size() != kind.count)
        throw LineError(what + " takes " + std::to_string(kind.count) + " items, not " + std::to_string(parts.size()));
    std::vector<Value> items;
    for (std::size_t i = 0; i < parts.size(); ++i)
        items.push_back(read_value(kind.members[0], parts[i], what + "[" + std::to_string(i) + "]"));
    return Value::list(std::move(items));
}

/** The value that a field has when it is left out. */
Value zero_of(const Kind& kind)
{
    switch (kind.form)
    {
    case Kind::Form::Number: return Value::number(0, board::names::name_of(kind.family, 0));
    case Kind::Form::Text: return Value::text("");
    case Kind::Form::List: return Value::list(std::vector<Value>(kind.count, zero_of(kind.members[0])));
    case Kind::Form::Record: break;
    }
    Value record;
    for (std::size_t i = 0; i < kind.names.size(); ++i)
        record.add(kind.names[i], zero_of(kind.members[i]));
    return record;
}

/** The field that a part "name=value" names and the value's text; a part without "=" is the next in order. */
std::pair<std::size_t, std::string_view> field_of(const Kind& kind, std::string_view part, std::size_t position,
                                                  const std::string& what)
{
    const std::size_t equals = part.find_first_of("={[\"");
    if (equals == part.npos || part[equals] != '=')
    {
        if (position >= kind.names.size())
            throw LineError(what + " has " + std::to_string(kind.names.size()) + " fields, and there are more values");
        return { position, part };
    }
    const std::string_view name = board::tokens::trim(part.substr(0, equals));
    const auto found = std::find(kind.names.begin(), kind.names.end(), name);
    if (found == kind.names.end())
        throw LineError(what + " has no field " + std::string(name) +
                        did_you_mean(name, { kind.names.begin(), kind.names.end() }));
    return { static_cast<std::size_t>(found - kind.names.begin()), board::tokens::trim(part.substr(equals + 1)) };
}

Value read_record(const Kind& kind, std::string_view token, const std::string& what)
{
    std::vector<std::optional<Value>> values(kind.names.size());
    const bool is_bracketed = token.starts_with('[');
    const auto parts = parts_of(token, is_bracketed ? '[' : '{', is_bracketed ? ']' : '}', what,
                                "a record {field=value, …} or [value, …]");
    for (std::size_t position = 0; position < parts.size(); ++position)
    {
        const auto [field, text] = field_of(kind, parts[position], position, what);
        if (values[field])
            throw LineError(what + "." + kind.names[field] + " is given twice");
        values[field] = read_value(kind.members[field], text, what + "." + kind.names[field]);
    }
    Value record;
    for (std::size_t i = 0; i < values.size(); ++i)
        record.add(kind.names[i], values[i] ? *values[i] : zero_of(kind.members[i]));
    return record;
}

} // namespace

std::string read_text(std::string_view token, const std::string& what)
{
    if (!token.starts_with('"'))
        throw LineError(what + " takes a text in quotes, not " + std::string(token));
    try
    {
        return board::unquote(token);
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(what + ": " + error.what());
    }
}

Value read_value(const Kind& kind, std::string_view token, const std::string& what)
{
    switch (kind.form)
    {
    case Kind::Form::Number: return read_number_value(kind, token, what);
    case Kind::Form::Text: return Value::text(read_text(token, what));
    case Kind::Form::List: return read_list(kind, token, what);
    case Kind::Form::Record: break;
    }
    return read_record(kind, token, what);
}

std::int64_t read_number(Family family, std::string_view token, const std::string& what)
{
    if (has_leading_zero(token))
        throw LineError(what + ": is " + std::string(token) +
                        " decimal or octal? Write it without the leading 0, or as 0o…");
    if (const auto number = board::tokens::number(token))
        return *number;
    if (const auto constant = general_constant(token))
        return *constant;

    const auto named = board::names::number_of(token);
    if (named && is_of(family, token, *named))
        return *named;
    if (named && family == Family::None)
        throw LineError(what + " takes a plain number: " + std::string(token) + " is the name of something else");
    if (named)
        throw LineError(what + ": " + std::string(token) + " is the name of something else" +
                        did_you_mean(token, names_for(family)));
    const bool looks_like_number = !token.empty() && (std::isdigit(static_cast<unsigned char>(token[0])) != 0 ||
                                                      token[0] == '-' || token[0] == '+');
    throw LineError(what + ": " + std::string(token) +
                    (looks_like_number ? " is not a number, or too great" : " is neither a number nor a name") +
                    did_you_mean(token, names_for(family)));
}

std::optional<std::int64_t> general_constant(std::string_view token)
{
    const auto number = board::names::number_of(token);
    const auto families = board::names::families();
    const bool has_family = number && std::any_of(families.begin(), families.end(), [&](const auto& named) {
                                return is_of(named.family, token, *number);
                            });
    return has_family ? std::nullopt : number;
}

std::vector<std::string_view> names_in(Family family)
{
    std::vector<std::pair<std::int64_t, std::string_view>> found;
    for (const std::string_view name : board::names::all())
    {
        const auto number = board::names::number_of(name);
        if (family != Family::None && number && board::names::name_of(family, *number) == name)
            found.emplace_back(*number, name);
    }
    std::stable_sort(found.begin(), found.end(), [](const auto& a, const auto& b) { return a.first < b.first; });
    std::vector<std::string_view> names;
    for (const auto& [number, name] : found)
        names.push_back(name);
    return names;
}

} // namespace pmxboard
