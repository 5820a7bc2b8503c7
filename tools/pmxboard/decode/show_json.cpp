// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <ostream>

#include "board/json.h"
#include "tools/pmxboard/decode/show.h"
#include "tools/pmxboard/decode/words.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard::decode
{
namespace
{

using board::Json;
using board::written;

Json or_null(const std::string& text)
{
    return text.empty() ? Json() : Json(text);
}

Json level_of(const Text& text)
{
    return text.level >= 0 ? Json(text.level) : Json();
}

Json json_of(const Determined& reason)
{
    const ReasonRow& row = row_of(reason.number);
    Json values = Json::array();
    for (std::size_t i = 0; i < row.kinds.size() && row.kinds[i] != "NONE"; ++i)
        values.push_back(reason.values.at(i) ? Json(*reason.values.at(i)) : Json());
    return { { "id", reason.number },
             { "name", row.name },
             { "class", row.class_name },
             { "values", values },
             { "text", sentence_of(reason.number, reason.values, reason.unknown) },
             { "line", reason.line } };
}

Json json_of(const Event& event)
{
    constexpr const char* kinds[] = { "call", "gap", "start" };
    Json json;
    json["operation"] = event.operation;
    json["first_line"] = event.first_line;
    json["last_line"] = event.last_line;
    json["lines"] = event.lines;
    json["time"] = or_null(event.time);
    json["title"] = event.title;
    json["details"] = event.report ? event.report->words() : event.details;
    json["assumed"] = event.assumed;
    json["reasons"] = Json::array();
    for (const Determined& reason : event.reasons)
        json["reasons"].push_back(json_of(reason));
    json["problem"] = event.problem ? 1 : 0;
    json["kind"] = kinds[static_cast<std::size_t>(event.kind)];
    if (event.report)
        json["report"] = event.report->json();
    return json;
}

Json values_of(const Item& item)
{
    Json values = Json::object();
    const std::vector<std::string_view> names = split(item.text->values);
    for (std::size_t i = 0; i < item.values.size(); ++i)
    {
        const auto number = number_of(item.values[i]);
        values[std::string(names[i])] = number ? Json(*number) : Json(item.values[i]);
    }
    return values;
}

Json json_of(const Item& item, std::string_view operations)
{
    constexpr const char* cuts[] = { "no", "begin", "end" };
    Json json;
    json["line"] = item.line;
    json["last_line"] = item.last_line;
    json["time"] = or_null(item.time);
    json["text"] = item.shown;
    json["cut"] = cuts[static_cast<std::size_t>(item.cut)];
    json["source"] = source_of(*item.text);
    json["level"] = level_of(*item.text);
    json["operations"] = split(operations);
    json["step"] = item.text->step;
    json["values"] = values_of(item);
    return json;
}

Json json_of(const Departure& departure)
{
    constexpr const char* kinds[] = { "value", "missing", "extra", "different", "swapped" };
    Json json;
    json["kind"] = kinds[static_cast<std::size_t>(departure.kind)];
    json["line"] = departure.found.line;
    json["found"] = departure.found.shown;
    json["expected"] = departure.expected ? Json(departure.expected->item.shown) : Json();
    json["operation"] = operation_of(departure);
    json["scenario_line"] = departure.expected ? Json(departure.expected->line) : Json();
    json["count"] = departure.count;
    json["values"] = Json::array();
    for (const ValueDifference& one : departure.values)
        json["values"].push_back({ { "name", one.name }, { "expected", one.expected }, { "found", one.found } });
    return json;
}

Json json_of(const Comparison& comparison)
{
    Json json;
    json["scenario"] = printable(comparison.scenario, comparison.scenario.size() * 4);
    json["level"] = comparison.level;
    json["agreeing"] = comparison.agreeing;
    json["skipped"] = comparison.skipped;
    json["left"] = comparison.left;
    json["departure"] = comparison.departure ? json_of(*comparison.departure) : Json();
    json["further"] = Json::array();
    for (const Departure& one : comparison.further)
        json["further"].push_back(json_of(one));
    json["agreeing_behind"] = comparison.agreeing_behind;
    json["whole"] = comparison.is_whole ? 1 : 0;
    return json;
}

} // namespace

void show_json(std::ostream& out, const Log& log, const Story& story, const std::optional<Comparison>& comparison,
               const std::string& name)
{
    out << "{\"log\":" << written(printable(name, name.size() * 4)) << ",\"lines\":" << log.lines
        << ",\"foreign\":" << log.foreign << ",\"cut\":" << log.cut << ",\"twice\":" << log.twice
        << ",\"displaced\":" << log.displaced << ",\"starts\":" << log.boots.size()
        << ",\"form\":" << (log.form == Log::Form::Trace ? "\"trace\"" : "\"console\"")
        << ",\"level\":" << (log.level ? std::to_string(*log.level) : "null") << ",\n\"events\":[";
    for (std::size_t i = 0; i < story.events.size(); ++i)
        out << (i == 0 ? "\n" : ",\n") << written(json_of(story.events[i]));
    out << "],\n\"texts\":[";
    for (std::size_t i = 0; i < log.items.size(); ++i)
        out << (i == 0 ? "\n" : ",\n") << written(json_of(log.items[i], story.operations[i]));
    out << "],\n\"against\":" << (comparison ? written(json_of(*comparison)) : "null") << "}\n";
}

void show_texts_json(std::ostream& out)
{
    const char* lead = "[\n";
    const auto show = [&](const Json& json) {
        out << lead << written(json);
        lead = ",\n";
    };
    for (const Text& text : texts())
    {
        Json json = { { "format", text.format }, { "source", source_of(text) } };
        json["level"] = level_of(text);
        json["values"] = split(text.values);
        json["operations"] = split(text.operations);
        json["step"] = text.step;
        show(json);
    }
    for (const std::string& name : printed_names())
        show({ { "format", name }, { "source", "value" } });
    show({ { "format", "fast_init_param" }, { "source", "other" } }); // what the layer looks up in flash
    out << "\n]\n";
}

} // namespace pmxboard::decode
