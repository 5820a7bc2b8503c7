// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/show.h"

#include <algorithm>
#include <array>
#include <ostream>
#include <span>

#include "board/value.h"
#include "tools/pmxboard/decode/words.h"
#include "tools/pmxboard/text/layout.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::size_t columns = usual_width;
constexpr unsigned step_indent = 10;

/** A text behind what leads to it on its first line; the lines below hang under it, with so many columns more. */
std::string behind(std::string_view lead, std::string_view text, std::size_t hanging)
{
    const auto indent = static_cast<unsigned>(lead.size());
    const std::string lines = wrapped(text, columns, indent, indent + static_cast<unsigned>(hanging));
    return lines.empty() ? lines : lines.substr(indent, lines.size() - indent - 1);
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
    if (log.twice != 0)
        text += ", " + std::to_string(log.twice) + " twice";
    if (log.displaced != 0)
        text += ", " + std::to_string(log.displaced) + " out of order";
    if (!log.boots.empty())
        text += ", " + counted(log.boots.size(), "new start");
    if (log.form == Log::Form::Trace)
        text += "; a trace in JSON lines, read as the console of its run";
    out << wrapped(text, columns, 0, 2);
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
    const std::string whose = event.operation.empty() ? "" : event.operation + ": ";
    const std::string head = behind(lead, mark + whose + event.title, 2);
    out << options.paint(lead, Colour::Grey) << options.paint(head, event.problem ? Colour::Magenta : Colour::Bold)
        << '\n';

    const auto indent = static_cast<unsigned>(lead.size() + 2);
    std::vector<std::string> paragraphs;
    if (event.report)
        paragraphs = event.report->words();
    if (!event.details.empty())
        paragraphs.push_back(joined(event.details, "; "));
    if (!event.assumed.empty())
        paragraphs.push_back("assumed, for lines are missing: " + joined(event.assumed, "; "));
    for (const std::string& paragraph : paragraphs)
        out << wrapped(paragraph, columns, indent, indent + 2);
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
            out << options.paint(lead + printable(shown.foreign, columns - lead.size()), Colour::Grey) << '\n';
            continue;
        }
        const Item& item = log.items[*shown.item];
        out << options.paint(lead, Colour::Grey)
            << options.paint(behind(lead, printable(item.shown, 4 * columns), 0), Colour::Bold) << '\n';
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
        out << wrapped(where, columns, step_indent, step_indent + 2);
    }
}

constexpr std::size_t most_shown = 40; ///< departures, unless somebody wants every line

constexpr std::string_view kinds[] = { "other values", "a line is missing", "a line too many", "another line",
                                       "two lines are swapped" };

std::string kind_words(const Departure& departure)
{
    if (departure.count == 1)
        return std::string(kinds[static_cast<std::size_t>(departure.kind)]);
    return counted(departure.count, "line") +
           (departure.kind == Departure::Kind::Missing ? " are missing" : " too many");
}

std::string place_of(const Departure& departure)
{
    return "line " + std::to_string(departure.found.line);
}

void show_field(std::ostream& out, std::string_view name, std::string_view text)
{
    constexpr std::size_t width = 13;
    const std::string lead = "  " + std::string(name) + std::string(width - 2 - name.size(), ' ');
    out << lead << behind(lead, printable(text, 6 * columns), 0) << '\n';
}

void show_departure(std::ostream& out, const Departure& departure, const std::string& scenario)
{
    show_field(out, "expected",
               departure.expected ? departure.expected->item.shown : "nothing more: the scenario is over");
    show_field(out, departure.kind == Departure::Kind::Missing ? "instead" : "found", departure.found.shown);
    for (const ValueDifference& value : departure.values)
        show_field(out, "differs", value.name + ": " + value.expected + " expected, " + value.found + " found");
    const Text* const text = departure.expected ? departure.expected->item.text : departure.found.text;
    show_field(out, "operation", operation_of(departure) + ": " + std::string(text->step));
    if (departure.expected)
        show_field(out, "scenario",
                   scenario + ":" + std::to_string(departure.expected->line) + ": " + departure.expected->command);
}

/** How many departures there are, of which kinds, and what agrees between them. */
void show_sum(std::ostream& out, const Comparison& comparison, std::size_t shown)
{
    std::array<std::size_t, std::size(kinds)> count{};
    ++count[static_cast<std::size_t>(comparison.departure->kind)];
    for (const Departure& one : comparison.further)
        ++count[static_cast<std::size_t>(one.kind)];
    std::vector<std::string> parts;
    for (std::size_t kind = 0; kind < count.size(); ++kind)
    {
        if (count[kind] != 0)
            parts.push_back(std::to_string(count[kind]) + " of " + std::string(kinds[kind]));
    }
    std::string sum = counted(comparison.further.size() + 1, "departure") + ": " + joined(parts, ", ") + "; " +
                      counted(comparison.agreeing + comparison.agreeing_behind, "line") + " agree";
    if (shown < comparison.further.size())
        sum += "; --verbose shows all";
    out << wrapped(comparison.is_whole ? sum : sum + "; further ones are not looked for", columns, 0, 2);
}

} // namespace

void show_texts(std::ostream& out)
{
    for (const Text& text : texts())
    {
        const std::string source =
            text.level >= 0 ? "level " + std::to_string(text.level) : std::string(source_of(text));
        const std::string printer(split(text.operations).front());
        out << board::quote(text.format) << '\n'
            << wrapped(source + ", " + printer + ": " + std::string(text.step), columns, 2, 4);
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
        out << options.paint(behind("", against + ": no departure", 2), Colour::Bold) << '\n';
        show_field(out, "agreement", agreement);
        return;
    }
    const std::string where = place_of(*comparison.departure);
    const std::string title = against + " departs at " + where + ": " + kind_words(*comparison.departure);
    out << options.paint(behind("", title, 2), Colour::Magenta) << '\n';
    show_field(out, "agreement", agreement);
    show_departure(out, *comparison.departure, comparison.scenario);
    const std::size_t shown =
        options.verbose ? comparison.further.size() : std::min(comparison.further.size(), most_shown);
    for (const Departure& one : std::span(comparison.further).first(shown))
    {
        out << options.paint(behind("", "and again at " + place_of(one) + ": " + kind_words(one), 2), Colour::Magenta)
            << '\n';
        show_departure(out, one, comparison.scenario);
    }
    if (!comparison.further.empty())
        show_sum(out, comparison, shown);
}

} // namespace pmxboard::decode
