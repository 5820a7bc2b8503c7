#include <ostream>

#include "board/value.h"
#include "tools/pmxboard/decode/show.h"
#include "tools/pmxboard/decode/words.h"

namespace pmxboard::decode
{
namespace
{

using board::Value;

Value number(std::size_t number)
{
    return Value::number(static_cast<std::int64_t>(number));
}

Value truth(bool yes)
{
    return Value::number(yes ? 1 : 0);
}

Value texts_of(const std::vector<std::string>& texts)
{
    std::vector<Value> list;
    for (const std::string& text : texts)
        list.push_back(Value::text(text));
    return Value::list(std::move(list));
}

Value names_of(std::string_view list)
{
    std::vector<Value> names;
    for (const std::string_view name : split(list))
        names.push_back(Value::text(std::string(name)));
    return Value::list(std::move(names));
}

std::string_view source_of(const Text& text)
{
    switch (text.role)
    {
    case Role::Assertion: return "assertion";
    case Role::SourceFile: return "file";
    default: return text.level == level_plain ? "print" : "log";
    }
}

Value value_of(const Event& event)
{
    Value value;
    value.add("operation", Value::text(event.operation));
    value.add("first_line", number(event.first_line));
    value.add("last_line", number(event.last_line));
    value.add("time", event.time.empty() ? Value::null() : Value::text(event.time));
    value.add("title", Value::text(event.title));
    value.add("details", texts_of(event.report ? event.report->words() : event.details));
    value.add("problem", truth(event.problem));
    if (event.report)
        value.add("report", event.report->value());
    return value;
}

Value values_of(const Item& item)
{
    Value values = Value::record({});
    if (item.cut != Item::Cut::None)
        return values;
    const bool is_assertion = item.text->role == Role::Assertion || item.text->role == Role::SourceFile;
    const std::vector<std::string_view> names = split(is_assertion ? "file,line" : item.text->values);
    for (std::size_t i = 0; i < names.size() && i < item.values.size(); ++i)
    {
        const auto plain = number_of(item.values[i]);
        values.add(std::string(names[i]), plain ? Value::number(*plain) : Value::text(item.values[i]));
    }
    return values;
}

Value value_of(const Item& item, std::string_view operations)
{
    constexpr const char* cuts[] = { "no", "begin", "end" };
    Value value;
    value.add("line", number(item.line));
    value.add("last_line", number(item.last_line));
    value.add("time", item.time.empty() ? Value::null() : Value::text(item.time));
    value.add("text", Value::text(item.shown));
    value.add("cut", Value::text(cuts[static_cast<std::size_t>(item.cut)]));
    value.add("source", Value::text(std::string(source_of(*item.text))));
    value.add("level", item.text->level >= 0 ? Value::number(item.text->level) : Value::null());
    value.add("operations", names_of(operations));
    value.add("step", Value::text(std::string(item.text->step)));
    value.add("values", values_of(item));
    return value;
}

Value value_of(const Departure& departure)
{
    constexpr const char* kinds[] = { "value", "missing", "extra", "different", "swapped" };
    Value value;
    value.add("kind", Value::text(kinds[static_cast<std::size_t>(departure.kind)]));
    value.add("line", departure.found ? number(departure.found->line) : Value::null());
    value.add("found", departure.found ? Value::text(departure.found->shown) : Value::null());
    value.add("expected", departure.expected ? Value::text(departure.expected->item.shown) : Value::null());
    value.add("operation", Value::text(operation_of(departure)));
    value.add("scenario_line", departure.expected ? number(departure.expected->line) : Value::null());
    std::vector<Value> values;
    for (const ValueDifference& one : departure.values)
        values.push_back(Value::record({ { "name", Value::text(one.name) },
                                         { "expected", Value::text(one.expected) },
                                         { "found", Value::text(one.found) } }));
    value.add("values", Value::list(std::move(values)));
    return value;
}

Value value_of(const Comparison& comparison)
{
    Value value;
    value.add("scenario", Value::text(printable(comparison.scenario, comparison.scenario.size() * 4)));
    value.add("level", Value::number(comparison.level));
    value.add("agreeing", number(comparison.agreeing));
    value.add("skipped", number(comparison.skipped));
    value.add("left", number(comparison.left));
    value.add("departure", comparison.departure ? value_of(*comparison.departure) : Value::null());
    return value;
}

} // namespace

void show_json(std::ostream& out, const Log& log, const Story& story, const std::optional<Comparison>& comparison,
               const std::string& name)
{
    out << "{\"log\":" << Value::text(printable(name, name.size() * 4)).to_json() << ",\"lines\":" << log.lines
        << ",\"foreign\":" << log.foreign << ",\"cut\":" << log.cut
        << ",\"level\":" << (log.level ? std::to_string(*log.level) : "null") << ",\n\"events\":[";
    for (std::size_t i = 0; i < story.events.size(); ++i)
        out << (i == 0 ? "\n" : ",\n") << value_of(story.events[i]).to_json();
    out << "],\n\"texts\":[";
    for (std::size_t i = 0; i < log.items.size(); ++i)
        out << (i == 0 ? "\n" : ",\n") << value_of(log.items[i], story.operations[i]).to_json();
    out << "],\n\"against\":" << (comparison ? value_of(*comparison).to_json() : "null") << "}\n";
}

void show_texts(std::ostream& out)
{
    for (const Text& text : texts())
    {
        const std::string source =
            text.level >= 0 ? "level " + std::to_string(text.level) : std::string(source_of(text));
        out << board::quote(text.format) << '\n'
            << "  "
            << folded(source + ", " + std::string(split(text.operations).front()) + ": " + std::string(text.step), 2, 4)
            << '\n';
    }
}

void show_texts_json(std::ostream& out)
{
    const char* lead = "[\n";
    const auto show = [&](std::string_view format, std::string_view source, const Text* text) {
        Value value;
        value.add("format", Value::text(std::string(format)));
        value.add("source", Value::text(std::string(source)));
        if (text != nullptr)
        {
            value.add("level", text->level >= 0 ? Value::number(text->level) : Value::null());
            value.add("values", names_of(text->role == Role::Assertion ? "file,line" : text->values));
            value.add("operations", names_of(text->operations));
            value.add("step", Value::text(std::string(text->step)));
        }
        out << lead << value.to_json();
        lead = ",\n";
    };
    for (const Text& text : texts())
        show(text.format, source_of(text), &text);
    for (const std::string_view name : value_texts())
        show(name, "value", nullptr);
    for (const std::string_view name : other_texts())
        show(name, "other", nullptr);
    out << "\n]\n";
}

} // namespace pmxboard::decode
