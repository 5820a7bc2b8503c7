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
    value.m_items = std::move(items);
    return value;
}

Value Value::record(std::vector<std::pair<std::string, Value>> members)
{
    Value value;
    value.m_kind = Kind::Record;
    for (auto& [key, member] : members)
        value.add(std::move(key), std::move(member));
    return value;
}

Value& Value::add(std::string key, Value value)
{
    if (m_kind == Kind::Null)
        m_kind = Kind::Record;
    if (m_kind != Kind::Record)
        throw std::logic_error("a member was added to a value that is not a record: " + key);
    if (std::find(m_keys.begin(), m_keys.end(), key) != m_keys.end())
        throw std::logic_error("a record has two members of one name: " + key);
    m_keys.push_back(std::move(key));
    m_items.push_back(std::move(value));
    return *this;
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
            if (error != std::errc{} || stop != end || index >= value->m_items.size())
                return nullptr;
            value = &value->m_items[index];
            path.remove_prefix(close + 1);
        }
        else
        {
            const std::string_view key = path.substr(0, path.find_first_of(".["));
            const auto found = std::find(value->m_keys.begin(), value->m_keys.end(), key);
            if (value->m_kind != Kind::Record || found == value->m_keys.end())
                return nullptr;
            value = &value->m_items[static_cast<std::size_t>(found - value->m_keys.begin())];
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
    for (std::size_t i = 0; i < m_items.size(); ++i)
    {
        if (i != 0)
            text += ", ";
        if (m_kind == Kind::Record)
            text += m_keys[i] + "=";
        text += m_items[i].to_text();
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
        const auto items = tokens::split(tokens::inside(token, '[', ']'));
        return items.size() == m_items.size() &&
               std::equal(m_items.begin(), m_items.end(), items.begin(),
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
    if (members.size() > m_items.size() || (members.size() < m_items.size() && !leaves_out))
        return false;
    return std::all_of(members.begin(), members.end(), [this](std::string_view member) {
        const std::size_t equals = member.find('=');
        if (equals == member.npos)
            throw std::invalid_argument("a record's member is written NAME=VALUE, not " + std::string(member));
        const auto key = std::find(m_keys.begin(), m_keys.end(), tokens::trim(member.substr(0, equals)));
        return key != m_keys.end() &&
               m_items[static_cast<std::size_t>(key - m_keys.begin())].matches(member.substr(equals + 1));
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
