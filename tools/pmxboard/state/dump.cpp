// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/state/dump.h"

#include <cstdint>
#include <limits>

#include "board/json.h"
#include "tools/pmxboard/state/paths.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

using board::Json;
using board::json_of;
using board::Value;

constexpr const char* state_schema = "pmxboard-state";
constexpr const char* diff_schema = "pmxboard-diff";

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
    throw DumpError(path + ": " + printable(board::written(json), 60) + " is no value of a state");
}

/** A name is shown as it stands. */
std::string name_in(const std::string& name, const std::string& path)
{
    constexpr std::size_t longest = 200;
    if (name.size() > longest || printable(name) != name)
        throw DumpError(path + ": a name in it is too long, or no terminal shows it: " + printable(name, 60));
    return name;
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

Value value_of(const Json& json, const std::string& path)
{
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
            items.push_back(value_of(item, path + "[" + std::to_string(items.size()) + "]"));
        return Value::list(std::move(items));
    }
    if (!json.is_object())
        no_value(path, json);
    if (is_number(json))
        return Value::number(integer(json.at("value"), path), name_in(json.value("name", ""), path),
                             json.contains("hex") ? Value::Base::Hex : Value::Base::Decimal);
    if (json.size() == 1 && json.contains("symbol") && json.at("symbol").is_string())
        return Value::symbol(name_in(json.at("symbol").get<std::string>(), path));
    Value record = Value::record({});
    for (const auto& [key, member] : json.items())
        record.add(name_in(key, path), value_of(member, path + "." + key));
    return record;
}

Json parsed(std::string_view text)
try
{
    return board::read_json(text);
}
catch (const board::JsonError& error)
{
    throw DumpError(error.what());
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

Json json_of(const Steps& steps)
{
    Json json = { { "version", steps_version } };
    if (!steps.lost().empty())
    {
        json["lost"] = steps.lost();
        return json;
    }
    json["commands"] = Json::array();
    for (const Step& step : steps.all())
    {
        Json one = Json::object();
        if (!step.directory.empty())
            one["in"] = step.directory;
        one["line"] = step.line;
        if (step.failed)
            one["failed"] = 1;
        if (json["commands"].empty() && !steps.board().empty())
            one["board"] = steps.board();
        json["commands"].push_back(std::move(one));
    }
    return json;
}

Step step_of(const Json& json, std::size_t number)
{
    const auto is_text = [&json](const char* key) { return !json.contains(key) || json.at(key).is_string(); };
    const bool is_step = json.is_object() && json.contains("line") && is_text("line") && is_text("in") &&
                         is_text("board") && (!json.contains("failed") || json.at("failed").is_number_integer());
    if (!is_step)
        throw DumpError("steps.commands" + item_step(number) + ": " + printable(board::written(json), 60) +
                        " is no command");
    return { json.value("in", ""), json.at("line").get<std::string>(), json.value("failed", 0) != 0 };
}

/** Those that are kept in another way do not keep the state from being looked at. */
Steps steps_of(const Json& all)
{
    Steps steps;
    steps.begin({});
    if (!all.contains("steps"))
    {
        steps.lose("it was saved without the commands that led to it");
        return steps;
    }
    const Json& json = all.at("steps");
    if (!json.is_object() || !json.contains("version") || !json.at("version").is_number_integer())
        throw DumpError("steps: " + printable(board::written(json), 60) + " has no version");
    if (json.at("version") != steps_version)
    {
        steps.lose("its commands are of version " + printable(board::written(json.at("version")), 20) +
                   ", and this pmxboard reads " + std::to_string(steps_version));
        return steps;
    }
    if (json.contains("lost") && json.at("lost").is_string())
    {
        steps.lose(printable(json.at("lost").get<std::string>(), 200));
        return steps;
    }
    if (!json.contains("commands") || !json.at("commands").is_array() || json.at("commands").empty())
        throw DumpError("steps: it has neither a list \"commands\" nor a text \"lost\"");
    for (std::size_t i = 0; i < json.at("commands").size(); ++i)
    {
        Step step = step_of(json.at("commands")[i], i);
        if (i == 0)
            steps.begin(std::move(step), json.at("commands")[i].value("board", ""));
        else
            steps.add(std::move(step));
    }
    return steps;
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
    json["steps"] = json_of(dump.steps);
    return board::written(json, 2);
}

StateDump read_dump(std::string_view json)
{
    const Json all = parsed(json);
    check_schema(all);
    const bool has_name = all.contains("board") && all.at("board").is_string();
    return { has_name ? all.at("board").get<std::string>() : std::string(), value_of(all.at("state"), "state"),
             steps_of(all) };
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
