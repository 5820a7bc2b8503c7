#include "tools/pmxboard/decode/show.h"

#include <algorithm>
#include <ostream>

#include "board/value.h"
#include "tools/pmxboard/decode/words.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::size_t columns = 80;
constexpr std::size_t step_indent = 10;

constexpr std::string_view bold = "1";
constexpr std::string_view yellow = "33";
constexpr std::string_view grey = "90";

std::string painted(std::string_view text, std::string_view code, const ShowOptions& options)
{
    return options.colour ? "\x1b[" + std::string(code) + "m" + std::string(text) + "\x1b[0m" : std::string(text);
}

std::string padded_left(const std::string& text, std::size_t width)
{
    return std::string(width - std::min(width, text.size()), ' ') + text;
}

std::string line_range(std::size_t first, std::size_t last)
{
    return first == last ? std::to_string(first) : std::to_string(first) + "-" + std::to_string(last);
}

void show_summary(std::ostream& out, const Log& log, const ShowOptions& options)
{
    std::string text = printable(options.name, columns) + ": " + counted(log.lines, "line") + ", " +
                       counted(log.items.size(), "text") + " of the mixer layer";
    if (log.level && *log.level >= 0)
        text += " up to level " + std::to_string(*log.level);
    text += ", " + std::to_string(log.foreign) + " foreign";
    if (log.cut != 0)
        text += ", " + std::to_string(log.cut) + " cut";
    out << folded(text, 0, 2) << '\n';
    if (log.items.empty())
        out << "Nothing in it comes from the mixer layer.\n";
}

void show_event(std::ostream& out, const Event& event, std::size_t range_width, std::size_t time_width,
                const ShowOptions& options)
{
    std::string lead = padded_left(line_range(event.first_line, event.last_line), range_width) + "  ";
    if (time_width != 0)
        lead += padded_left(event.time, time_width) + "  ";
    const std::string mark = event.problem ? "! " : "";
    const std::string head = folded(mark + event.operation + ": " + event.title, lead.size(), lead.size() + 2);
    out << painted(lead, grey, options) << painted(head, event.problem ? yellow : bold, options) << '\n';

    const std::string indent(lead.size() + 2, ' ');
    std::vector<std::string> paragraphs;
    if (event.report)
        paragraphs = event.report->words();
    if (!event.details.empty())
        paragraphs.push_back(joined(event.details, "; "));
    for (const std::string& paragraph : paragraphs)
        out << indent << folded(paragraph, indent.size(), indent.size() + 2) << '\n';
}

void show_story(std::ostream& out, const Story& story, const ShowOptions& options)
{
    std::size_t range_width = 0;
    std::size_t time_width = 0;
    for (const Event& event : story.events)
    {
        range_width = std::max(range_width, line_range(event.first_line, event.last_line).size());
        time_width = std::max(time_width, event.time.size());
    }
    bool shown = false;
    for (const Event& event : story.events)
    {
        if (options.quiet && !event.problem)
            continue;
        if (!shown)
            out << '\n';
        shown = true;
        show_event(out, event, range_width + 2, time_width, options);
    }
    if (options.quiet && !shown && !story.events.empty())
        out << "No problems in it.\n";
}

/** Every line, with the operation and the step of those that are the layer's. */
void show_lines(std::ostream& out, const Log& log, const Story& story, const ShowOptions& options)
{
    out << '\n';
    for (const Shown& shown : log.shown)
    {
        const std::string lead = padded_left(std::to_string(shown.line), 6) + "  ";
        if (!shown.item)
        {
            out << painted(lead + printable(shown.foreign, columns - lead.size()), grey, options) << '\n';
            continue;
        }
        const Item& item = log.items[*shown.item];
        out << painted(lead, grey, options)
            << painted(folded(printable(item.shown, 4 * columns), lead.size(), lead.size()), bold, options) << '\n';
        if (item.last_line == shown.line && item.line != shown.line)
        {
            out << std::string(step_indent, ' ') << "the rest of line " << item.line << '\n';
            continue;
        }
        const std::vector<std::string_view> operations = split(story.operations[*shown.item]);
        std::string where =
            joined({ operations.begin(), operations.end() }, " or ") + ": " + std::string(item.text->step);
        if (item.cut == Item::Cut::Begin)
            where = "cut: ends like a line of " + where;
        else if (item.cut == Item::Cut::End)
            where = "cut: begins like a line of " + where;
        if (item.text->level >= 0)
            where += " [level " + std::to_string(item.text->level) + "]";
        out << std::string(step_indent, ' ') << folded(where, step_indent, step_indent + 2) << '\n';
    }
}

std::string_view kind_words(Departure::Kind kind)
{
    switch (kind)
    {
    case Departure::Kind::Value: return "other values";
    case Departure::Kind::Missing: return "a line is missing";
    case Departure::Kind::Extra: return "a line too many";
    case Departure::Kind::Different: return "another line";
    case Departure::Kind::Swapped: return "two lines are swapped";
    }
    return "";
}

void show_field(std::ostream& out, std::string_view name, std::string_view text)
{
    constexpr std::size_t width = 13;
    const std::string lead = "  " + std::string(name) + std::string(width - 2 - name.size(), ' ');
    out << lead << folded(printable(text, 6 * columns), width, width) << '\n';
}

} // namespace

std::string folded(std::string_view text, std::size_t begin, std::size_t indent)
{
    std::string lines;
    std::size_t column = begin;
    bool first = true;
    while (!text.empty())
    {
        const std::size_t blank = std::min(text.find(' '), text.size());
        const std::string_view word = text.substr(0, blank);
        text.remove_prefix(std::min(blank + 1, text.size()));
        if (!first && column + 1 + word.size() > columns)
        {
            lines += "\n" + std::string(indent, ' ');
            column = indent;
        }
        else if (!first)
        {
            lines += ' ';
            ++column;
        }
        lines += word;
        column += word.size();
        first = false;
    }
    return lines;
}

void show_texts(std::ostream& out)
{
    for (const Text& text : texts())
    {
        const std::string source =
            text.level >= 0 ? "level " + std::to_string(text.level) : std::string(source_of(text));
        const std::string printer(split(text.operations).front());
        out << board::quote(text.format) << "\n  "
            << folded(source + ", " + printer + ": " + std::string(text.step), 2, 4) << '\n';
    }
}

void show_log(std::ostream& out, const Log& log, const Story& story, const ShowOptions& options)
{
    show_summary(out, log, options);
    if (options.verbose)
        show_lines(out, log, story, options);
    show_story(out, story, options);
}

void show_comparison(std::ostream& out, const Comparison& comparison, const ShowOptions& options)
{
    const std::string against =
        printable(options.name, columns) + " against " + printable(comparison.scenario, columns);
    std::string agreement = "no line agrees";
    if (comparison.agreeing != 0)
        agreement = counted(comparison.agreeing, "line") + (comparison.agreeing == 1 ? " agrees" : " agree") +
                    ", from line " + std::to_string(comparison.first_line) + " of the log to line " +
                    std::to_string(comparison.last_line);
    agreement += comparison.level >= 0 ? "; compared up to level " + std::to_string(comparison.level) : "";
    if (comparison.skipped != 0)
        agreement += "; the log begins " + counted(comparison.skipped, "line") + " into the scenario";
    if (!comparison.departure)
    {
        if (comparison.left != 0)
            agreement += "; it ends " + counted(comparison.left, "line") + " before the scenario does";
        out << folded(painted(against + ": no departure", bold, options), 0, 2) << '\n';
        show_field(out, "agreement", agreement);
        return;
    }
    const Departure& departure = *comparison.departure;
    std::string where = departure.found ? "line " + std::to_string(departure.found->line) : "its end";
    out << painted(folded(against + " departs at " + where + ": " + std::string(kind_words(departure.kind)), 0, 2),
                   yellow, options)
        << '\n';
    show_field(out, "agreement", agreement);
    show_field(out, "expected",
               departure.expected ? departure.expected->item.shown : "nothing more: the scenario is over");
    if (departure.found)
        show_field(out, departure.kind == Departure::Kind::Missing ? "instead" : "found", departure.found->shown);
    for (const ValueDifference& value : departure.values)
        show_field(out, "differs", value.name + ": " + value.expected + " expected, " + value.found + " found");
    const Text* const text = departure.expected ? departure.expected->item.text : departure.found->text;
    show_field(out, "operation", operation_of(departure) + ": " + std::string(text->step));
    if (departure.expected)
        show_field(out, "scenario",
                   comparison.scenario + ":" + std::to_string(departure.expected->line) + ": " +
                       departure.expected->command);
}

} // namespace pmxboard::decode
