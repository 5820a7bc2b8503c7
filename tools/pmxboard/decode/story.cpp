#include "tools/pmxboard/decode/story.h"

#include <algorithm>
#include <cstdio>

#include "tools/pmxboard/decode/words.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::string_view mode_ex = "PMX_SetModeEx";
constexpr std::string_view status_report = "PMX_QueryStatus";
constexpr std::string_view ready_query = "fgPMX_DisplayModeReady";
constexpr double one_call = 0.1; ///< seconds that a slow console may take between two lines of one call
constexpr int detailed = 9;      ///< the level at which a mode setting logs what was asked for

/** Takes the items one after the other, and folds them into events. */
class Teller
{
public:
    explicit Teller(const Log& log) : m_log(log) {}
    Story tell();

private:
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
        std::vector<std::string_view> seen; ///< formats of the lines, each of which stands once in a request
        std::string fifth;
    };

    void take(const Item& item);
    void take_request(const Item& item);
    void take_handshake(const Item& item);
    void take_flag(const Item& item);
    void take_ready(const Item& item);
    void take_report(const Item& item);
    void take_assertion(const Item& item);
    void take_part(const Item& item);

    bool is_open(std::string_view operation) const { return m_open && m_candidates.front() == operation; }
    bool joins(const Item& item) const;
    void open(const Item& item, std::vector<std::string_view> candidates, std::string title);
    void join(const Item& item, std::string detail);
    void join_or_open(const Item& item, std::string detail);
    void close();
    std::string held_for(const Item& item) const;
    bool is_next(Role role) const;
    bool is_later(const Item& item) const;
    Event& event() { return m_story.events.back(); }

    const Log& m_log;
    Story m_story;
    bool m_open = false;
    std::vector<std::string_view> m_candidates; ///< which operations the open event may be
    std::vector<std::size_t> m_event_items;
    std::size_t m_index = 0;
    Role m_last = Role::Part;
    Request m_request;
    std::optional<Held> m_held;
    bool m_return_asked = false; ///< the open event says that graphics may return, and has not let them yet
    unsigned m_asked = 0;        ///< how often in a row somebody asked whether graphics may be shown
};

bool Teller::joins(const Item& item) const
{
    return m_open && std::any_of(m_candidates.begin(), m_candidates.end(),
                                 [&](std::string_view one) { return has(item.text->operations, one); });
}

void Teller::open(const Item& item, std::vector<std::string_view> candidates, std::string title)
{
    close();
    m_open = true;
    m_candidates = std::move(candidates);
    m_story.events.push_back(
        { {}, item.line, item.last_line, item.time, std::move(title), {}, item.text->problem, {} });
    m_event_items = { m_index };
    m_request = {};
    m_return_asked = false;
    m_asked = 0;
}

void Teller::join(const Item& item, std::string detail)
{
    if (joins(item))
        std::erase_if(m_candidates, [&](std::string_view one) { return !has(item.text->operations, one); });
    event().last_line = std::max(event().last_line, item.last_line);
    event().problem = event().problem || item.text->problem;
    m_event_items.push_back(m_index);
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

std::string listed(const std::vector<std::string>& items)
{
    std::string list;
    for (const std::string& item : items)
        list += (list.empty() ? "" : ", ") + item;
    return list;
}

void Teller::close()
{
    if (!m_open)
        return;
    m_open = false;
    Event& closed = event();
    closed.operation = m_candidates.front();
    for (const std::size_t index : m_event_items)
    {
        if (has(m_log.items[index].text->operations, closed.operation))
            m_story.operations[index] = m_candidates.front();
    }
    if (closed.operation == mode_ex && closed.title.empty())
    {
        closed.title = "mode change requested";
        if (!m_request.outputs.empty())
            closed.title += ": " + listed(m_request.outputs);
        else if (m_log.level.value_or(0) < detailed)
            closed.title += " (its outputs are logged at level 9)";
        if (!m_request.fifth.empty())
            closed.title += "; fifth OSD " + m_request.fifth;
    }
    else if (closed.operation == "PMX_SetMode" && closed.details.empty() && m_index < m_log.items.size())
    {
        closed.details.push_back("no set-up follows: refused by the capability word, or set already");
    }
    if (m_return_asked && m_held)
        closed.details.push_back("graphics go on waiting, for the video plane driver");
}

std::string Teller::held_for(const Item& item) const
{
    if (!m_held || !m_held->seconds || !item.seconds || *item.seconds < *m_held->seconds)
        return {};
    char text[32];
    std::snprintf(text, sizeof text, " after %.1f s", *item.seconds - *m_held->seconds);
    return text;
}

/** Whether the item behind this one has a role. */
bool Teller::is_next(Role role) const
{
    return m_index + 1 < m_log.items.size() && m_log.items[m_index + 1].text->role == role;
}

/** Whether so much time lies before an item that it was another call. */
bool Teller::is_later(const Item& item) const
{
    const std::optional<double> last = m_index == 0 ? std::nullopt : m_log.items[m_index - 1].seconds;
    return last && item.seconds && *item.seconds - *last > one_call;
}

void Teller::take_request(const Item& item)
{
    const auto& seen = m_request.seen;
    const bool again = std::find(seen.begin(), seen.end(), item.text->format) != seen.end();
    if (item.text->role == Role::ModeEx || !is_open(mode_ex) || again)
    {
        open(item, { mode_ex }, {});
        if (item.text->role != Role::ModeEx)
            event().details.push_back("the log begins within it");
    }
    else
    {
        join(item, {});
    }
    m_request.seen.push_back(item.text->format);
    if (item.text->role == Role::Output)
        m_request.outputs.push_back(std::string(item.text->tale) + " " +
                                    (item.value("fgOutputEnable") == "0" ? "off" : mode_words(item.value("eResMode"))));
    else if (item.text->role == Role::Fifth)
        m_request.fifth = item.value("fgOSD5");
    else if (item.text->role == Role::Port && item.shown.find_first_of("123456789") != std::string::npos)
        event().details.push_back(tale_of(item));
}

void Teller::take_flag(const Item& item)
{
    if (item.value("fgPmxFormatChangeFlag") != "0")
    {
        if (is_open(mode_ex) && !m_held)
            join(item, "the display part begins to switch");
        else
            open(item, { "PMX_SetFormatChangeFlag" }, "the display part begins to switch: its flag is raised");
    }
    else if ((is_open(mode_ex) && m_last == Role::NotWait) || (is_open("_PMX_TmrIsr") && m_last == Role::TimedOut))
    {
        join(item, {});
    }
    else
    {
        open(item, { "PMX_SetFormatChangeFlag" },
             m_held ? "the display part has switched" + held_for(item) : "the display part's flag is lowered");
    }
}

void Teller::take_handshake(const Item& item)
{
    switch (item.text->role)
    {
    case Role::Flag: take_flag(item); break;
    case Role::HeldBack:
        join_or_open(item, tale_of(item));
        m_held = Held{ item.line, item.seconds };
        break;
    case Role::TimedOut:
        open(item, { "_PMX_TmrIsr" },
             m_held ? "the timer runs out" + held_for(item) + ": the display part has not answered"
                    : "the timer of an earlier mode change runs out; graphics are back already");
        event().problem = m_held.has_value();
        break;
    case Role::OsdFlag:
        join_or_open(item, {});
        m_return_asked = item.value("fgPmxEnabeOsdFlag") != "0";
        break;
    case Role::OsdBack:
        if (joins(item) && !is_later(item))
            join(item, m_held ? "graphics are back" : "");
        else
            open(item, { "PMX_SetOsdEnable" },
                 m_held ? "graphics are back" + held_for(item) + ": the video plane driver let them"
                        : "graphics may return, if they wait for it");
        m_held.reset();
        m_return_asked = false;
        break;
    default:
        join_or_open(item, tale_of(item));
        if (is_open(mode_ex)) // nothing of the call comes behind the timer
            close();
        break;
    }
}

void Teller::take_ready(const Item& item)
{
    const bool ready = item.value("fgPmxFormatChangeFlag") == "0";
    if (is_open(mode_ex))
    {
        join(item, {});
        if (ready)
            close();
        return;
    }
    const std::string title = std::string("somebody asks whether graphics may be shown: ") +
                              (ready ? "yes" : "no, the display part switches");
    if (!ready && is_next(Role::HeldBack)) // nobody but a mode change goes on so
    {
        open(item, { mode_ex }, "a mode change, of which the log has the end");
        return;
    }
    if (is_open(ready_query) && event().title.starts_with(title))
    {
        join(item, {});
        event().title = title + " (" + std::to_string(++m_asked) + " times)";
        return;
    }
    open(item, { ready_query }, title);
    m_asked = 1;
}

void Teller::take_report(const Item& item)
{
    if (is_open(status_report) && event().report->wants(item))
        join(item, {});
    else
    {
        open(item, { status_report }, "status report");
        event().report.emplace();
    }
    event().report->add(item);
}

void Teller::take_assertion(const Item& item)
{
    std::string detail = "ASSERTION: " + std::string(item.text->tale);
    if (item.text->role == Role::Assertion && item.text->format.size() > 1)
        detail += ": " + std::string(item.text->format);
    join_or_open(item, detail);
}

void Teller::take_part(const Item& item)
{
    const std::vector<std::string_view> operations = split(item.text->operations);
    const auto within = [&](std::string_view one) {
        return std::find(m_candidates.begin(), m_candidates.end(), one) != m_candidates.end();
    };
    const bool connects = has(item.text->operations, "i4Pmx_Connect");
    if (item.text->role == Role::Opens && !connects)
        open(item, { operations.front() }, tale_of(item));
    else if (item.text->role == Role::Opens ||
             (item.text->role == Role::Head && (!joins(item) || within(operations.front()))))
        open(item, operations, tale_of(item));
    else
        join_or_open(item, tale_of(item));
    if (item.text->format.find("create a timer") != std::string_view::npos) // start-up logs no more
        close();
}

void Teller::take(const Item& item)
{
    switch (item.text->role)
    {
    case Role::ModeEx:
    case Role::Output:
    case Role::Port:
    case Role::Fifth: take_request(item); break;
    case Role::HeldBack:
    case Role::Flag:
    case Role::OsdFlag:
    case Role::OsdBack:
    case Role::TimedOut:
    case Role::TimerSet: take_handshake(item); break;
    case Role::Ready: take_ready(item); break;
    case Role::Report: take_report(item); break;
    case Role::Assertion:
    case Role::SourceFile: take_assertion(item); break;
    default: take_part(item); break;
    }
    m_last = item.text->role;
}

Story Teller::tell()
{
    m_story.operations.reserve(m_log.items.size());
    for (const Item& item : m_log.items)
        m_story.operations.push_back(item.text->operations);
    for (m_index = 0; m_index < m_log.items.size(); ++m_index)
    {
        if (m_log.items[m_index].cut == Item::Cut::None)
            take(m_log.items[m_index]);
    }
    m_index = m_log.items.size();
    close();
    if (m_held)
    {
        Event left;
        left.operation = mode_ex;
        left.first_line = m_held->line;
        left.last_line = m_log.lines;
        left.title = "graphics are still held back where the log ends";
        left.problem = true;
        m_story.events.push_back(std::move(left));
    }
    return std::move(m_story);
}

} // namespace

Story tell(const Log& log)
{
    return Teller(log).tell();
}

} // namespace pmxboard::decode
