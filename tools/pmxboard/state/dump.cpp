// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/state/dump.h"

#include <algorithm>
#include <cstdint>
#include <limits>

#include "board/json.h"

namespace pmxboard
{
namespace
{

using board::Json;
using board::json_of;
using board::Value;

constexpr const char* state_schema = "pmxboard-state";
constexpr const char* diff_schema = "pmxboard-diff";
constexpr unsigned deepest = 64;

Json json_of(const std::vector<Change>& changes)
{
    Json list = Json::array();
    for (const Change& change : changes)
    {
        Json one = { { "path", change.path } };
        if (change.older)
            one["old"] = json_of(*change.older);
        if (change.newer)
            one["new"] = json_of(*change.newer);
        list.push_back(std::move(one));
    }
    return list;
}

[[noreturn]] void no_value(const std::string& path, const Json& json)
{
    throw DumpError(path + ": " + board::written(json).substr(0, 60) + " is no value of a state");
}

/** {"value": 12, "name": …, "hex": …}, and nothing else in it. */
bool is_number(const Json& json)
{
    const auto plain = [&](const char* key) { return !json.contains(key) || json.at(key).is_string(); };
    const std::size_t parts = json.contains("name") + json.contains("hex");
    return parts != 0 && json.size() == 1 + parts && json.contains("value") && json.at("value").is_number_integer() &&
           plain("name") && plain("hex");
}

std::int64_t integer(const Json& json, const std::string& path)
{
    if (json.is_number_unsigned() &&
        json.get<std::uint64_t>() > static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max()))
        no_value(path, json);
    return json.get<std::int64_t>();
}

Value value_of(const Json& json, const std::string& path, unsigned depth = 0)
{
    if (depth > deepest)
        throw DumpError(path.substr(0, 60) + "…: a state is not nested so deeply");
    if (json.is_null())
        return Value::null();
    if (json.is_number_integer())
        return Value::number(integer(json, path));
    if (json.is_string())
        return Value::text(json.get<std::string>());
    if (json.is_array())
    {
        std::vector<Value> items;
        for (const Json& item : json)
            items.push_back(value_of(item, path + "[" + std::to_string(items.size()) + "]", depth + 1));
        return Value::list(std::move(items));
    }
    if (!json.is_object())
        no_value(path, json);
    if (is_number(json))
        return Value::number(integer(json.at("value"), path), json.value("name", ""),
                             json.contains("hex") ? Value::Base::Hex : Value::Base::Decimal);
    if (json.size() == 1 && json.contains("symbol") && json.at("symbol").is_string())
        return Value::symbol(json.at("symbol").get<std::string>());
    Value record = Value::record({});
    for (const auto& [key, member] : json.items())
        record.add(key, value_of(member, path + "." + key, depth + 1));
    return record;
}

/** Line and column of a byte, both counted from 1. */
std::string place_of(std::string_view text, std::size_t byte)
{
    const std::string_view before = text.substr(0, byte == 0 ? 0 : byte - 1);
    const auto line = 1 + std::count(before.begin(), before.end(), '\n');
    const std::size_t begin = before.find_last_of('\n');
    const std::size_t column = before.size() - (begin == before.npos ? 0 : begin + 1) + 1;
    return "line " + std::to_string(line) + ", column " + std::to_string(column);
}

Json parsed(std::string_view text)
{
    try
    {
        return Json::parse(text.begin(), text.end());
    }
    catch (const Json::parse_error& error)
    {
        throw DumpError((error.byte > text.size() ? "it ends in the middle, at " : "it is no JSON from ") +
                        place_of(text, error.byte) + (error.byte > text.size() ? "" : " on"));
    }
}

void check_schema(const Json& json)
{
    const std::string what = "; a dump is written by \"save FILE\" or \"state --json\"";
    if (!json.is_object() || !json.contains("schema") || json.at("schema") != state_schema)
        throw DumpError(std::string("it has no \"schema\": \"") + state_schema + "\"" + what);
    if (!json.contains("version") || json.at("version") != state_schema_version)
        throw DumpError("it has version " +
                        (json.contains("version") ? board::written(json.at("version")).substr(0, 20) : "no number") +
                        " of its schema, and this pmxboard reads " + std::to_string(state_schema_version));
    if (json.contains("values"))
        throw DumpError("it holds a few values, and no whole state" + what);
    if (!json.contains("state") || !json.at("state").is_object())
        throw DumpError("it has no record \"state\"" + what);
}

Json envelope(const char* schema)
{
    return { { "schema", schema }, { "version", state_schema_version } };
}

} // namespace

std::string to_json(const StateDump& dump)
{
    Json json = envelope(state_schema);
    json["board"] = dump.board;
    json["state"] = json_of(dump.state);
    return board::written(json, 2);
}

StateDump read_dump(std::string_view json)
{
    const Json all = parsed(json);
    check_schema(all);
    const bool has_name = all.contains("board") && all.at("board").is_string();
    return { has_name ? all.at("board").get<std::string>() : std::string(), value_of(all.at("state"), "state") };
}

std::string to_json(const std::string& board, const std::vector<std::pair<std::string, Value>>& values)
{
    Json json = envelope(state_schema);
    json["board"] = board;
    json["values"] = Json::object();
    for (const auto& [path, value] : values)
        json["values"][path] = json_of(value);
    return board::written(json, 2);
}

std::string to_json(const std::vector<Change>& changes)
{
    Json json = envelope(diff_schema);
    json["changes"] = json_of(changes);
    return board::written(json, 2);
}

std::string to_json_list(const std::vector<Change>& changes)
{
    return board::written(json_of(changes));
}

} // namespace pmxboard
