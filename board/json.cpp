// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/json.h"

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

std::string written(const Json& json, int indent)
{
    return json.dump(indent, ' ', false, Json::error_handler_t::replace);
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
