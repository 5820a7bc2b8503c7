// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/story.h"

#include <algorithm>
#include <cstdio>

#include "tools/pmxboard/decode/words.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::string_view mode_change = "PMX_SetModeEx";
constexpr double one_call = 0.1; ///< seconds that a slow console may take between two lines of one call
constexpr int detailed = 9;      ///< the level at which a mode setting logs what was asked for

/** Graphics are out of the mix. */
struct Held
{
    std::size_t line;
    std::optional<double> seconds;
};

/** What a per-output mode setting asked for. */
struct Request
{
    std::vector<std::string> outputs;
    std::vector<const Text*> seen; ///< its lines, each of which stands once in a request
    std::string fifth;
};

} // namespace

/** Takes the items one after the other, and folds them into events. */
struct Teller
{
    explicit Teller(const Log& told) : log(told) {}
    Story tell();

    Event& event() { return story.events.back(); }
    bool is_open(std::string_view operation) const { return open_now && candidates.front() == operation; }
    bool joins(const Item& item) const;
    void open(const Item& item, std::vector<std::string_view> operations, std::string title);
    void join(const Item& item, std::string detail);
    void join_or_open(const Item& item, std::string detail);
    void close();

    bool is_next(Rule rule) const;
    bool is_later(const Item& item) const;
    std::string held_for(const Item& item) const;
    std::string requested() const;

    const Log& log;
    Story story;
    bool open_now = false;
    std::vector<std::string_view> candidates; ///< which operations the open event may be
    std::vector<std::size_t> event_items;
    std::size_t index = 0; ///< of the item that is taken
    Rule last = nullptr;   ///< of the item before
    Request request;
    std::optional<Held> held;
    bool return_asked = false; ///< the open event says that graphics may return, and has not let them yet
    unsigned asked = 0;        ///< how often in a row somebody asked whether graphics may be shown
};

bool Teller::joins(const Item& item) const
{
    return open_now && std::any_of(candidates.begin(), candidates.end(),
                                   [&](std::string_view one) { return has(item.text->operations, one); });
}

void Teller::open(const Item& item, std::vector<std::string_view> operations, std::string title)
{
    close();
    open_now = true;
    candidates = std::move(operations);
    story.events.push_back({ {}, item.line, item.last_line, item.time, std::move(title), {}, item.text->problem, {} });
    event_items = { index };
    request = {};
    return_asked = false;
    asked = 0;
}

void Teller::join(const Item& item, std::string detail)
{
    if (joins(item))
        std::erase_if(candidates, [&](std::string_view one) { return !has(item.text->operations, one); });
    event().last_line = std::max(event().last_line, item.last_line);
    event().problem = event().problem || item.text->problem;
    event_items.push_back(index);
    if (!detail.empty())
        event().details.push_back(std::move(detail));
}

void Teller::join_or_open(const Item& item, std::string detail)
{
    if (joins(item))
        join(item, std::move(detail));
    else
        open(item, split(item.text->operations), detail.empty() ? std::string(item.text->step) : std::move(detail));
}

void Teller::close()
{
    if (!open_now)
        return;
    open_now = false;
    Event& closed = event();
    closed.operation = candidates.front();
    for (const std::size_t item : event_items)
    {
        if (has(log.items[item].text->operations, closed.operation))
            story.operations[item] = candidates.front();
    }
    if (closed.operation == mode_change && closed.title.empty())
        closed.title = requested();
    else if (closed.operation == "PMX_SetMode" && closed.details.empty() && index < log.items.size())
        closed.details.push_back("no set-up follows: refused by the capability word, or set already");
    if (return_asked && held)
        closed.details.push_back("graphics go on waiting, for the video plane driver");
}

/** Whether the item behind this one has a rule. */
bool Teller::is_next(Rule rule) const
{
    return index + 1 < log.items.size() && log.items[index + 1].text->rule == rule;
}

/** Whether so much time lies before an item that it was another call. */
bool Teller::is_later(const Item& item) const
{
    const std::optional<double> before = index == 0 ? std::nullopt : log.items[index - 1].seconds;
    return before && item.seconds && *item.seconds - *before > one_call;
}

std::string Teller::held_for(const Item& item) const
{
    if (!held || !held->seconds || !item.seconds || *item.seconds < *held->seconds)
        return {};
    char text[32];
    std::snprintf(text, sizeof text, " after %.1f s", *item.seconds - *held->seconds);
    return text;
}

std::string Teller::requested() const
{
    std::string title = "mode change requested";
    if (!request.outputs.empty())
        title += ": " + joined(request.outputs, ", ");
    else if (log.level.value_or(0) < detailed)
        title += " (its outputs are logged at level 9)";
    return request.fifth.empty() ? title : title + "; fifth OSD " + request.fifth;
}

Story Teller::tell()
{
    for (const Item& item : log.items)
        story.operations.push_back(item.text->operations);
    for (; index < log.items.size(); ++index)
    {
        const Item& item = log.items[index];
        if (item.cut != Item::Cut::None)
            continue;
        item.text->rule(*this, item);
        last = item.text->rule;
    }
    close();
    if (held)
    {
        Event left;
        left.operation = mode_change;
        left.first_line = held->line;
        left.last_line = log.lines;
        left.title = "graphics are still held back where the log ends";
        left.problem = true;
        story.events.push_back(std::move(left));
    }
    return std::move(story);
}

Story tell(const Log& log)
{
    return Teller(log).tell();
}

void rules::opens(Teller& story, const Item& item)
{
    story.open(item, split(item.text->operations), tale_of(item));
}

void rules::heads(Teller& story, const Item& item)
{
    const std::string_view own = split(item.text->operations).front();
    const auto& running = story.candidates;
    if (std::find(running.begin(), running.end(), own) != running.end())
        opens(story, item);
    else
        goes_on(story, item);
}

void rules::goes_on(Teller& story, const Item& item)
{
    story.join_or_open(item, tale_of(item));
}

void rules::ends(Teller& story, const Item& item)
{
    goes_on(story, item);
    story.close();
}

namespace
{

void take_request(Teller& story, const Item& item)
{
    const auto& seen = story.request.seen;
    const bool again = std::find(seen.begin(), seen.end(), item.text) != seen.end();
    if (story.is_open(mode_change) && !again && item.text->rule != rules::mode_ex)
    {
        story.join(item, {});
    }
    else
    {
        story.open(item, { mode_change }, {});
        if (item.text->rule != rules::mode_ex)
            story.event().details.push_back("the log begins within it");
    }
    story.request.seen.push_back(item.text);
}

} // namespace

void rules::mode_ex(Teller& story, const Item& item)
{
    take_request(story, item);
}

void rules::output(Teller& story, const Item& item)
{
    take_request(story, item);
    const std::string mode = item.value("fgOutputEnable") == "0" ? "off" : mode_words(item.value("eResMode"));
    story.request.outputs.push_back(std::string(item.text->tale) + " " + mode);
}

void rules::digital_port(Teller& story, const Item& item)
{
    take_request(story, item);
    if (item.shown.find_first_of("123456789") != std::string::npos)
        story.event().details.push_back(tale_of(item));
}

void rules::fifth_osd(Teller& story, const Item& item)
{
    take_request(story, item);
    story.request.fifth = item.value("fgOSD5");
}

void rules::no_wait(Teller& story, const Item& item)
{
    goes_on(story, item);
}

void rules::flag(Teller& story, const Item& item)
{
    const bool raised = item.value("fgPmxFormatChangeFlag") != "0";
    const bool part_of_mode_change = raised && story.is_open(mode_change) && !story.held;
    if (part_of_mode_change)
        story.join(item, "the display part begins to switch");
    else if (raised)
        story.open(item, { "PMX_SetFormatChangeFlag" }, "the display part begins to switch: its flag is raised");
    else if (story.last == no_wait || story.last == timed_out)
        story.join(item, {});
    else
        story.open(item, { "PMX_SetFormatChangeFlag" },
                   story.held ? "the display part has switched" + story.held_for(item)
                              : "the display part's flag is lowered");
}

void rules::held_back(Teller& story, const Item& item)
{
    goes_on(story, item);
    story.held = Held{ item.line, item.seconds };
}

void rules::timer_set(Teller& story, const Item& item)
{
    goes_on(story, item);
    if (story.is_open(mode_change)) // nothing of the call comes behind the timer
        story.close();
}

void rules::timed_out(Teller& story, const Item& item)
{
    story.open(item, { "_PMX_TmrIsr" },
               story.held ? "the timer runs out" + story.held_for(item) + ": the display part has not answered"
                          : "the timer of an earlier mode change runs out; graphics are back already");
    story.event().problem = story.held.has_value();
}

void rules::osd_flag(Teller& story, const Item& item)
{
    story.join_or_open(item, {});
    story.return_asked = item.value("fgPmxEnabeOsdFlag") != "0";
}

void rules::osd_back(Teller& story, const Item& item)
{
    if (story.joins(item) && !story.is_later(item))
        story.join(item, story.held ? "graphics are back" : "");
    else
        story.open(item, { "PMX_SetOsdEnable" },
                   story.held ? "graphics are back" + story.held_for(item) + ": the video plane driver let them"
                              : "graphics may return, if they wait for it");
    story.held.reset();
    story.return_asked = false;
}

void rules::ready(Teller& story, const Item& item)
{
    const bool is_ready = item.value("fgPmxFormatChangeFlag") == "0";
    const std::string title = std::string("somebody asks whether graphics may be shown: ") +
                              (is_ready ? "yes" : "no, the display part switches");
    if (story.is_open(mode_change))
    {
        story.join(item, {});
        if (is_ready)
            story.close();
    }
    else if (!is_ready && story.is_next(held_back)) // nobody but a mode change goes on so
    {
        story.open(item, { mode_change }, "a mode change, of which the log has the end");
    }
    else if (story.is_open("fgPMX_DisplayModeReady") && story.event().title.starts_with(title))
    {
        story.join(item, {});
        story.event().title = title + " (" + std::to_string(++story.asked) + " times)";
    }
    else
    {
        story.open(item, { "fgPMX_DisplayModeReady" }, title);
        story.asked = 1;
    }
}

void rules::report(Teller& story, const Item& item)
{
    if (story.is_open("PMX_QueryStatus") && story.event().report->wants(item))
    {
        story.join(item, {});
    }
    else
    {
        story.open(item, { "PMX_QueryStatus" }, "status report");
        story.event().report.emplace();
    }
    story.event().report->add(item);
}

void rules::assertion(Teller& story, const Item& item)
{
    std::string detail = "ASSERTION: " + std::string(item.text->tale);
    if (item.text->level == level_assertion && item.text->format.size() > 1)
        detail += ": " + std::string(item.text->format);
    story.join_or_open(item, std::move(detail));
}

} // namespace pmxboard::decode
