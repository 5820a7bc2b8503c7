// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/json.h"

#include <algorithm>
#include <charconv>
#include <vector>

#include "board/trace.h"

namespace board
{

Json json_of(const Value& value)
{
    switch (value.kind())
    {
    case Value::Kind::Null: return nullptr;
    case Value::Kind::Number:
    {
        const bool hex = value.base() == Value::Base::Hex;
        if (value.string().empty() && !hex)
            return value.as_number();
        Json number = { { "value", value.as_number() } };
        if (!value.string().empty())
            number["name"] = value.string();
        if (hex)
            number["hex"] = Value::number(value.as_number(), {}, Value::Base::Hex).to_text();
        return number;
    }
    case Value::Kind::Text: return value.string();
    case Value::Kind::Symbol: return { { "symbol", value.string() } };
    case Value::Kind::List:
    {
        Json list = Json::array();
        for (const Value& item : value.items())
            list.push_back(json_of(item));
        return list;
    }
    case Value::Kind::Record: break;
    }
    Json record = Json::object();
    for (std::size_t i = 0; i < value.keys().size(); ++i)
        record[value.keys()[i]] = json_of(value.items()[i]);
    return record;
}

namespace
{

/** "\\u007f" */
std::string escaped_code(unsigned char code)
{
    constexpr std::string_view hex = "0123456789abcdef";
    return std::string("\\u00") + hex[code >> 4] + hex[code & 0xF];
}

} // namespace

std::string written(const Json& json, int indent)
{
    const std::string text = json.dump(indent, ' ', false, Json::error_handler_t::replace);
    std::string safe;
    safe.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i)
    {
        const auto byte = static_cast<unsigned char>(text[i]);
        const auto next = static_cast<unsigned char>(i + 1 < text.size() ? text[i + 1] : '\0');
        const bool is_second_control = byte == 0xC2 && next < 0xA0; // U+0080 to U+009F: it is UTF-8 by now
        if (byte == 0x7F || is_second_control)
            safe += escaped_code(is_second_control ? next : byte);
        else
            safe += text[i];
        i += is_second_control;
    }
    return safe;
}

namespace
{

/** Line and column of a byte, both counted from 1. */
std::string place_of(std::string_view text, std::size_t byte)
{
    const std::string_view before = text.substr(0, byte - 1);
    const auto line = 1 + std::count(before.begin(), before.end(), '\n');
    const std::size_t begin = before.find_last_of('\n');
    const std::size_t column = before.size() - (begin == before.npos ? 0 : begin + 1) + 1;
    return "line " + std::to_string(line) + ", column " + std::to_string(column);
}

/** Goes through a text before the library does, which builds whatever it finds: a tree that is too deep cannot be taken
 *  down again, and members are looked up one after the other. */
class Guard
{
public:
    explicit Guard(std::string_view text) : m_text(text) {}

    void check()
    {
        for (m_at = 0; m_at < m_text.size(); ++m_at)
        {
            const char c = m_text[m_at];
            if (c == '"')
                skip_text();
            else if (c == '{' || c == '[')
                open(c == '{');
            else if (c == ',')
                count();
            else if ((c == '}' || c == ']') && !m_open.empty())
                m_open.pop_back();
            else if (c == '-' || (c >= '0' && c <= '9'))
                skip_number();
        }
    }

private:
    static constexpr std::size_t deepest = 64;
    static constexpr std::size_t most_members = 1024;
    static constexpr std::size_t most_values = 200'000;

    struct Open
    {
        bool is_record = false;
        std::size_t commas = 0;
    };

    [[noreturn]] void refuse(const std::string& what) const
    {
        throw JsonError(place_of(m_text, m_at + 1) + ": " + what);
    }

    void skip_text()
    {
        for (++m_at; m_at < m_text.size() && m_text[m_at] != '"'; ++m_at)
            m_at += m_text[m_at] == '\\';
    }

    void skip_number()
    {
        double number = 0;
        const auto read = std::from_chars(m_text.data() + m_at, m_text.data() + m_text.size(), number);
        if (read.ec == std::errc::result_out_of_range)
            refuse("a number is too large, or too small");
        if (read.ec == std::errc())
            m_at = static_cast<std::size_t>(read.ptr - m_text.data()) - 1;
    }

    void open(bool is_record)
    {
        if (m_open.size() == deepest)
            refuse("values are nested more than " + std::to_string(deepest) + " deep");
        m_open.push_back({ is_record });
        count_value();
    }

    void count()
    {
        count_value();
        if (!m_open.empty() && ++m_open.back().commas >= most_members && m_open.back().is_record)
            refuse("a record has more than " + std::to_string(most_members) + " members");
    }

    void count_value()
    {
        if (++m_values > most_values)
            refuse("there are more than " + std::to_string(most_values) + " values");
    }

    std::string_view m_text;
    std::size_t m_at = 0;
    std::size_t m_values = 0;
    std::vector<Open> m_open;
};

} // namespace

Json read_json(std::string_view text)
{
    Guard(text).check();
    try
    {
        return Json::parse(text.begin(), text.end());
    }
    catch (const Json::parse_error& error)
    {
        throw JsonError((error.byte > text.size() ? "it ends in the middle, at " : "it is no JSON from ") +
                        place_of(text, error.byte) + (error.byte > text.size() ? "" : " on"));
    }
    catch (const Json::exception& error)
    {
        throw JsonError(error.what());
    }
}

namespace
{

const char* kind_name(TraceEntry::Kind kind)
{
    switch (kind)
    {
    case TraceEntry::Kind::Call: return "call";
    case TraceEntry::Kind::Log: return "log";
    case TraceEntry::Kind::Assert: return "assert";
    case TraceEntry::Kind::Notice: return "notice";
    case TraceEntry::Kind::Store: break;
    }
    return "store";
}

} // namespace

std::string Value::to_json(int indent) const
{
    return written(json_of(*this), indent);
}

std::string TraceEntry::to_json() const
{
    Json json;
    json["sequence"] = sequence;
    json["time_us"] = time_us;
    json["kind"] = kind_name(kind);
    if (kind != Kind::Store)
        json["function"] = function;
    json["operation"] = operation;
    json["depth"] = depth;
    if (thread != 0)
        json["thread"] = thread;
    switch (kind)
    {
    case Kind::Call:
    case Kind::Assert:
        json["arguments"] = Json::object();
        for (const TraceArgument& argument : arguments)
            json["arguments"][argument.name] = json_of(argument.value);
        if (result)
            json["result"] = json_of(*result);
        if (kind == Kind::Call)
            json["faulted"] = faulted;
        break;
    case Kind::Log:
        if (function == "PMX_IsLog")
            json["level"] = level;
        json["shown"] = shown;
        json["text"] = text;
        break;
    case Kind::Notice: json["text"] = text; break;
    case Kind::Store:
        json["field"] = function;
        for (const TraceArgument& argument : arguments)
            json[argument.name] = json_of(argument.value);
        json["by"] = by;
        break;
    }
    return written(json, -1);
}

} // namespace board
