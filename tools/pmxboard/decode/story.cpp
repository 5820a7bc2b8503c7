// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/story.h"

#include <algorithm>
#include <cmath>
#include <cstdio>

#include "tools/pmxboard/decode/calls.h"
#include "tools/pmxboard/decode/knowledge.h"
#include "tools/pmxboard/decode/words.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::string_view mode_change = "PMX_SetModeEx";
constexpr double one_call = 0.1; ///< seconds that a slow console may take between two lines of one call
constexpr int detailed = 9;      ///< the level at which a mode setting logs what was asked for

/** Something that lasts: graphics are out of the mix, the timer runs. */
struct Lasting
{
    std::size_t line;
    std::optional<Moment> since;
    bool sure = true; ///< no lines are missing since
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
    explicit Teller(const Log& told) : log(told), calls(read_calls(told)) {}
    Story tell();

    Event& event() { return story.events.back(); }
    bool is_open(std::string_view operation) const { return open_now && candidates.front() == operation; }
    bool joins(const Item& item) const;
    void open(const Item& item, std::vector<std::string_view> operations, std::string title);
    void join(const Item& item, std::string detail);
    void join_or_open(const Item& item, std::string detail);
    bool go_on(const Item& item, const std::string& detail);
    void close();
    void tell_reasons(const Item& item);

    const Item& at(std::size_t other) const { return log.items[log.order[other]]; }
    bool is_next(Rule rule) const;
    bool is_later(const Item& item) const;
    static std::string since(const Lasting& begin, const Item& item);
    std::string requested() const;

    void take_damage();
    Event& tell_place(Event::Kind kind, std::size_t line, std::string title);
    void begin_anew(const Boot& boot);
    void tell_gap(const Gap& gap);
    void tell_left(std::size_t line, std::string title, bool problem);
    void tell_back(const Item& item);

    const Log& log;
    Calls calls;
    std::size_t gaps_told = 0;
    std::size_t gap_since = 0; ///< the place behind the last of them
    std::size_t twice_told = 0;
    std::size_t boots_told = 0;
    Story story;
    bool open_now = false;
    std::vector<std::string_view> candidates; ///< which operations the open event may be
    std::vector<std::size_t> event_items;
    std::size_t index = 0; ///< the place of the item that is taken
    Rule last = nullptr;   ///< of the item before
    Request request;
    CallSoFar call; ///< of the open event
    std::optional<Lasting> held;
    std::optional<Lasting> timer;
    bool return_asked = false; ///< the open event says that graphics wait for their return, and has not let them yet
    bool lets_return = false;  ///< the item before lets graphics return if they wait
    bool returning = false;    ///< this one does
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
    story.events.push_back({ {},
                             item.line,
                             item.last_line,
                             { item.line },
                             item.time,
                             std::move(title),
                             {},
                             item.text->problem,
                             Event::Kind::Call,
                             {},
                             {},
                             {} });
    call = CallSoFar(candidates.front());
    event_items = { log.order[index] };
    request = {};
    return_asked = false;
    asked = 0;
}

void Teller::join(const Item& item, std::string detail)
{
    std::erase_if(candidates, [&](std::string_view one) { return !has(item.text->operations, one); });
    event().first_line = std::min(event().first_line, item.line);
    event().lines.push_back(item.line);
    event().last_line = std::max(event().last_line, item.last_line);
    event().problem = event().problem || item.text->problem;
    event_items.push_back(log.order[index]);
    if (!detail.empty())
        event().details.push_back(std::move(detail));
}

void Teller::join_or_open(const Item& item, std::string detail)
{
    if (joins(item))
        join(item, std::move(detail));
    else if (!go_on(item, detail))
        open(item, split(item.text->operations), detail.empty() ? std::string(item.text->step) : std::move(detail));
}

/** Goes on with a call that another one has interrupted. */
bool Teller::go_on(const Item& item, const std::string& detail)
{
    const std::size_t begin = calls.begins[index];
    if (begin == index || gap_since > begin)
        return false;
    const Item& first = at(begin);
    open(item, { split(first.text->operations).front() },
         "goes on, as the call of line " + std::to_string(first.line) + " does");
    if (!detail.empty())
        event().details.push_back(detail);
    return true;
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
    else if (closed.operation == "PMX_SetMode" && closed.details.empty() && index < log.order.size())
        closed.details.push_back(
            "no set-up stands behind it, as when it is refused by the capability word or set already");
    if (return_asked && held)
        closed.details.push_back(index < log.order.size()
                                     ? "nothing here lets graphics back, as when the video plane driver does so later"
                                     : "the log ends before it tells whether graphics return");
}

/** What a line determines beside what its rule says. */
void Teller::tell_reasons(const Item& item)
{
    for (const Determined& determined : call.take(item))
    {
        event().reasons.push_back(determined);
        // Two are told by their rules, with how long after what.
        if (determined.number != PMX_REASON_TIMED_OUT && determined.number != PMX_REASON_MIXED_AGAIN)
            event().details.push_back(sentence_of(determined.number, determined.values, determined.unknown));
    }
}

/** Whether the item behind this one has a rule. */
bool Teller::is_next(Rule rule) const
{
    return index + 1 < log.order.size() && at(index + 1).text->rule == rule;
}

/** Whether so much time lies before an item that it was another call. */
bool Teller::is_later(const Item& item) const
{
    const std::optional<double> passed = between(at(index - 1).moment, item.moment);
    return passed && *passed > one_call + item.moment->exact;
}

/** How much later than what a line began: `, 2.5 s after line 5`. Stamps that are whole seconds tell no tenths. */
std::string Teller::since(const Lasting& begin, const Item& item)
{
    const std::optional<double> passed = between(begin.since, item.moment);
    const std::string after = " after line " + std::to_string(begin.line);
    if (!passed || *passed < 0)
        return "," + after;
    const double exact = std::max(begin.since->exact, item.moment->exact);
    char text[64];
    std::snprintf(text, sizeof text, exact >= 1 ? ", about %.0f s" : ", %.1f s", *passed);
    return text + after;
}

/** Graphics are mixed again. */
void Teller::tell_back(const Item& item)
{
    const std::string mixed = sentence_of(PMX_REASON_MIXED_AGAIN);
    event().details.push_back(mixed + (held && held->sure ? since(*held, item) : ""));
    if (held && !held->sure)
        event().assumed.push_back(mixed + since(*held, item));
    held.reset();
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

/** What stands on one line, and is no call. */
Event& Teller::tell_place(Event::Kind kind, std::size_t line, std::string title)
{
    close();
    Event told;
    told.kind = kind;
    told.first_line = line;
    told.last_line = line;
    told.lines = { line };
    told.title = std::move(title);
    story.events.push_back(std::move(told));
    return event();
}

void Teller::tell_gap(const Gap& gap)
{
    if (gap.is_end)
        tell_place(Event::Kind::Gap, at(gap.at - 1).line,
                   "its call has no end in the log: missing, or out of order, is " + gap.what);
    else if (gap.at >= log.order.size())
        tell_place(Event::Kind::Gap, log.lines, "before the end others are missing: " + gap.what);
    else
        tell_place(Event::Kind::Gap, at(gap.at).line,
                   "before this line others are missing, or out of order: " + gap.what)
            .time = at(gap.at).time;
    for (std::optional<Lasting>* lasting : { &held, &timer })
    {
        if (*lasting)
            (*lasting)->sure = false;
    }
    gap_since = gap.at;
    last = nullptr;
    returning = false;
}

/** Graphics that nothing brings back before something ends. */
void Teller::tell_left(std::size_t line, std::string title, bool problem)
{
    Event left;
    left.operation = mode_change;
    left.first_line = held->line;
    left.last_line = line;
    left.lines = { held->line };
    left.title = std::move(title);
    left.problem = problem;
    story.events.push_back(std::move(left));
    held.reset();
}

void Teller::begin_anew(const Boot& boot)
{
    close();
    if (held)
        tell_left(boot.line, "nothing before the new start brings these graphics back", false);
    timer.reset();
    last = nullptr;
    returning = false;
    tell_place(Event::Kind::Start, boot.line, "the system begins anew: nothing of what was lasts").time = boot.time;
}

/** What the log has, or has not, before the next item. */
void Teller::take_damage()
{
    const std::size_t boots = index < log.order.size() ? at(index).boot : log.end_boot;
    for (; boots_told < boots; ++boots_told)
        begin_anew(log.boots[boots_told]);
    for (; gaps_told < calls.gaps.size() && calls.gaps[gaps_told].at <= index; ++gaps_told)
        tell_gap(calls.gaps[gaps_told]);
}

Story Teller::tell()
{
    for (const Item& item : log.items)
        story.operations.push_back(item.text->operations);
    for (; index < log.order.size(); ++index)
    {
        const Item& item = at(index);
        take_damage();
        if (twice_told < calls.twice.size() && calls.twice[twice_told] == index)
        {
            ++twice_told;
            continue;
        }
        if (item.cut != Item::Cut::None)
            continue;
        lets_return = returning;
        returning = item.text->is_assertion() && lets_return; // which are from within the call
        item.text->rule(*this, item);
        tell_reasons(item);
        last = item.text->rule;
    }
    close();
    take_damage();
    if (held)
        tell_left(log.lines,
                  std::string(held->sure ? "" : "as far as its lines tell, ") + "nothing up to the log's end brings "
                                                                                "these graphics back",
                  true);
    if (calls.unfinished)
        tell_place(Event::Kind::Gap, log.lines, "the log ends within a call: next comes " + *calls.unfinished);
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
    // Without a sink is what a reason says; without a change there may be no sink, too.
    story.join_or_open(item, item.value("fgHdmiExist") == "1" ? "" : tale_of(item));
}

void rules::flag(Teller& story, const Item& item)
{
    const bool raised = item.value("fgPmxFormatChangeFlag") != "0";
    const bool part_of_mode_change = raised && story.is_open(mode_change) && !story.held;
    const bool goes_on = (story.last == no_wait || story.last == timed_out) && !story.is_later(item);
    if (part_of_mode_change)
        story.join(item, "the display part begins to switch");
    else if (raised)
        story.open(item, { "PMX_SetFormatChangeFlag" }, "the display part begins to switch: its flag is raised");
    else if (goes_on)
        story.join(item, {});
    else
        story.open(item, { "PMX_SetFormatChangeFlag" },
                   "the display part's flag is lowered, as when it has switched" +
                       (story.held && story.held->sure ? Teller::since(*story.held, item) : ""));
}

void rules::held_back(Teller& story, const Item& item)
{
    goes_on(story, item);
    story.held = Lasting{ item.line, item.moment };
}

void rules::timer_set(Teller& story, const Item& item)
{
    goes_on(story, item);
    story.timer = Lasting{ item.line, item.moment };
    if (story.is_open(mode_change)) // nothing of the call comes behind the timer
        story.close();
}

void rules::timed_out(Teller& story, const Item& item)
{
    std::string title = sentence_of(PMX_REASON_TIMED_OUT);
    const auto passed = story.timer ? between(story.timer->since, item.moment) : std::nullopt;
    if (passed && fits_timer(*passed, item.moment->exact))
        title += Teller::since(*story.timer, item);
    title += story.held ? ": no answer of the display part stands before it"
                        : ": no line before it has graphics wait for it";
    story.open(item, { "_PMX_TmrIsr" }, title);
    story.event().problem = story.held.has_value();
    story.timer.reset();
}

void rules::osd_flag(Teller& story, const Item& item)
{
    const bool waits = item.value("fgPmxEnabeOsdFlag") != "0";
    const bool are_back = story.lets_return && !waits;
    story.join_or_open(item, {});
    story.return_asked = waits;
    if (are_back)
        story.tell_back(item);
}

void rules::osd_back(Teller& story, const Item& item)
{
    if (story.joins(item) && !story.is_later(item))
        story.join(item, {});
    else
        story.open(item, { "PMX_SetOsdEnable" },
                   "graphics return if they wait for it: the video plane driver lets them");
    story.return_asked = false;
    story.returning = true;
}

void rules::starts(Teller& story, const Item& item)
{
    goes_on(story, item);
    story.close();
    if (story.held)
        story.tell_left(item.line, "nothing before this start-up brings these graphics back", false);
    story.timer.reset();
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
    else if (story.go_on(item, {}))
    {
        return;
    }
    else if (!is_ready && story.is_next(held_back)) // nobody but a mode change goes on so
    {
        story.open(item, { mode_change }, "a mode change, of which the log has the end");
    }
    else if (story.is_open("fgPMX_DisplayModeReady") && story.event().title.starts_with(title))
    {
        story.join(item, {});
        story.event().title = title + " (" + std::to_string(++story.asked) + " lines)";
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
