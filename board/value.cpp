// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/value.h"

#include <algorithm>
#include <charconv>
#include <stdexcept>

#include "board/names.h"
#include "board/tokens.h"

namespace board
{

Value Value::number(std::int64_t number, std::string_view name, Base base)
{
    Value value;
    value.m_kind = Kind::Number;
    value.m_base = base;
    value.m_number = number;
    value.m_string = name;
    return value;
}

Value Value::text(std::string text)
{
    Value value;
    value.m_kind = Kind::Text;
    value.m_string = std::move(text);
    return value;
}

Value Value::symbol(std::string name)
{
    Value value;
    value.m_kind = Kind::Symbol;
    value.m_string = std::move(name);
    return value;
}

Value Value::list(std::vector<Value> items)
{
    Value value;
    value.m_kind = Kind::List;
    if (!items.empty())
        value.held_alone().items = std::move(items);
    return value;
}

Value::Names::Names(std::vector<std::string> names)
    : m_names(std::make_shared<std::vector<std::string>>(std::move(names)))
{
    std::vector<std::string_view> sorted(m_names->begin(), m_names->end());
    std::sort(sorted.begin(), sorted.end());
    const auto twice = std::adjacent_find(sorted.begin(), sorted.end());
    if (twice != sorted.end())
        throw std::logic_error("a record has two members of one name: " + std::string(*twice));
}

Value Value::record(const Names& names, std::vector<Value> items)
{
    if (names.m_names->size() != items.size())
        throw std::logic_error("a record has another number of members than of names");
    Value value;
    value.m_kind = Kind::Record;
    if (!items.empty())
    {
        Held& held = value.held_alone();
        held.items = std::move(items);
        held.keys = names.m_names;
    }
    return value;
}

Value Value::record(std::vector<std::pair<std::string, Value>> members)
{
    std::vector<std::string> names;
    std::vector<Value> items;
    names.reserve(members.size());
    items.reserve(members.size());
    for (auto& [key, member] : members)
    {
        names.push_back(std::move(key));
        items.push_back(std::move(member));
    }
    return record(Names(std::move(names)), std::move(items));
}

const std::vector<Value>& Value::items() const
{
    static const std::vector<Value> none;
    return m_held ? m_held->items : none;
}

const std::vector<std::string>& Value::keys() const
{
    static const std::vector<std::string> none;
    return m_held && m_held->keys ? *m_held->keys : none;
}

/** What this value holds, and no other one: to be changed. */
Value::Held& Value::held_alone()
{
    if (!m_held)
        m_held = std::make_shared<Held>();
    else if (m_held.use_count() != 1)
        m_held = std::make_shared<Held>(*m_held);
    return *m_held;
}

Value& Value::add(std::string key, Value value)
{
    if (m_kind == Kind::Null)
        m_kind = Kind::Record;
    if (m_kind != Kind::Record)
        throw std::logic_error("a member was added to a value that is not a record: " + key);
    if (std::find(keys().begin(), keys().end(), key) != keys().end())
        throw std::logic_error("a record has two members of one name: " + key);
    Held& held = held_alone();
    if (held.keys.use_count() != 1)
        held.keys = std::make_shared<std::vector<std::string>>(keys());
    held.keys->push_back(std::move(key));
    held.items.push_back(std::move(value));
    return *this;
}

bool Value::operator==(const Value& other) const
{
    return m_kind == other.m_kind && m_base == other.m_base && m_number == other.m_number &&
           m_string == other.m_string &&
           (m_held == other.m_held || (keys() == other.keys() && items() == other.items()));
}

const Value* Value::find(std::string_view path) const
{
    const Value* value = this;
    while (!path.empty())
    {
        if (path.front() == '[')
        {
            const std::size_t close = path.find(']');
            std::size_t index = 0;
            if (value->m_kind != Kind::List || close == path.npos)
                return nullptr;
            const char* const end = path.data() + close;
            const auto [stop, error] = std::from_chars(path.data() + 1, end, index);
            if (error != std::errc{} || stop != end || index >= value->items().size())
                return nullptr;
            value = &value->items()[index];
            path.remove_prefix(close + 1);
        }
        else
        {
            const std::string_view key = path.substr(0, path.find_first_of(".["));
            const auto found = std::find(value->keys().begin(), value->keys().end(), key);
            if (value->m_kind != Kind::Record || found == value->keys().end())
                return nullptr;
            value = &value->items()[static_cast<std::size_t>(found - value->keys().begin())];
            path.remove_prefix(key.size());
        }
        if (path.empty() || path.front() == '[')
            continue;
        if (path.front() != '.' || path.size() == 1)
            return nullptr;
        path.remove_prefix(1);
    }
    return value;
}

namespace
{

std::string number_text(std::int64_t number, Value::Base base)
{
    if (base == Value::Base::Decimal)
        return std::to_string(number);
    char digits[24];
    const auto magnitude = number < 0 ? 0 - static_cast<std::uint64_t>(number) : static_cast<std::uint64_t>(number);
    const auto end = std::to_chars(std::begin(digits), std::end(digits), magnitude, 16).ptr;
    std::string text = number < 0 ? "-0x" : "0x";
    for (const char* digit = digits; digit != end; ++digit)
        text += *digit >= 'a' ? static_cast<char>(*digit - 'a' + 'A') : *digit;
    return text;
}

bool number_matches(const Value& value, std::string_view token)
{
    if (const auto number = tokens::number(token))
        return *number == value.as_number();
    if (!value.string().empty() && token == value.string())
        return true;
    // A number without a name of its own may be written by any name of that number.
    return value.string().empty() && names::number_of(token) == value.as_number();
}

} // namespace

std::string Value::to_text() const
{
    switch (m_kind)
    {
    case Kind::Null: return "null";
    case Kind::Number: return m_string.empty() ? number_text(m_number, m_base) : m_string;
    case Kind::Text: return quote(m_string);
    case Kind::Symbol: return m_string;
    case Kind::List:
    case Kind::Record: break;
    }
    std::string text(1, m_kind == Kind::List ? '[' : '{');
    for (std::size_t i = 0; i < items().size(); ++i)
    {
        if (i != 0)
            text += ", ";
        if (m_kind == Kind::Record)
            text += keys()[i] + "=";
        text += items()[i].to_text();
    }
    return text + (m_kind == Kind::List ? ']' : '}');
}

bool Value::matches(std::string_view token) const
{
    token = tokens::trim(token);
    if (token == "*")
        return true;
    switch (m_kind)
    {
    case Kind::Null: return token == "null";
    case Kind::Number: return number_matches(*this, token);
    case Kind::Symbol: return token == m_string;
    case Kind::Text: return token.starts_with('"') && unquote(token) == m_string;
    case Kind::List:
    {
        if (!token.starts_with('['))
            return false;
        const auto written_items = tokens::split(tokens::inside(token, '[', ']'));
        return written_items.size() == items().size() &&
               std::equal(items().begin(), items().end(), written_items.begin(),
                          [](const Value& item, std::string_view written) { return item.matches(written); });
    }
    case Kind::Record: break;
    }
    if (!token.starts_with('{'))
        return false;
    auto members = tokens::split(tokens::inside(token, '{', '}'));
    const bool leaves_out = std::erase_if(members, [](std::string_view member) {
                                return member == "…" || member == "..." || member == "as before";
                            }) != 0;
    if (members.size() > items().size() || (members.size() < items().size() && !leaves_out))
        return false;
    return std::all_of(members.begin(), members.end(), [this](std::string_view member) {
        const std::size_t equals = member.find('=');
        if (equals == member.npos)
            throw std::invalid_argument("a record's member is written NAME=VALUE, not " + std::string(member));
        const auto key = std::find(keys().begin(), keys().end(), tokens::trim(member.substr(0, equals)));
        return key != keys().end() &&
               items()[static_cast<std::size_t>(key - keys().begin())].matches(member.substr(equals + 1));
    });
}

std::string quote(std::string_view text)
{
    static constexpr std::string_view hex = "0123456789abcdef";
    std::string quoted = "\"";
    for (const char character : text)
    {
        const auto byte = static_cast<unsigned char>(character);
        if (character == '\n')
            quoted += "\\n";
        else if (character == '\t')
            quoted += "\\t";
        else if (character == '"' || character == '\\')
            (quoted += '\\') += character;
        else if (byte < 0x20 || byte >= 0x7F)
            ((quoted += "\\x") += hex[byte >> 4]) += hex[byte & 0xF];
        else
            quoted += character;
    }
    return quoted + '"';
}

std::string unquote(std::string_view quoted)
{
    if (quoted.size() < 2 || quoted.front() != '"' || quoted.back() != '"')
        throw std::invalid_argument("a text stands in double quotes: " + std::string(quoted));
    const std::string_view body = quoted.substr(1, quoted.size() - 2);
    std::string text;
    for (std::size_t i = 0; i < body.size(); ++i)
    {
        if (body[i] == '"')
            throw std::invalid_argument("a double quote inside a text is written \\\": " + std::string(quoted));
        if (body[i] != '\\')
        {
            text += body[i];
            continue;
        }
        if (++i == body.size())
            throw std::invalid_argument("a text ends in a lone backslash: " + std::string(quoted));
        unsigned code = 0;
        switch (body[i])
        {
        case 'n': text += '\n'; break;
        case 't': text += '\t'; break;
        case '"':
        case '\\': text += body[i]; break;
        case 'x':
        {
            const char* const first = body.data() + i + 1;
            if (i + 2 >= body.size() || std::from_chars(first, first + 2, code, 16).ptr != first + 2)
                throw std::invalid_argument("\\x takes two hexadecimal digits: " + std::string(quoted));
            text += static_cast<char>(code);
            i += 2;
            break;
        }
        default: throw std::invalid_argument(std::string("no such escape in a text: \\") + body[i]);
        }
    }
    return text;
}

} // namespace board
