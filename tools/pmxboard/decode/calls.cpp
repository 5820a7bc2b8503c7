// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/calls.h"

#include <algorithm>
#include <array>
#include <map>
#include <numeric>
#include <stdexcept>
#include <string_view>

#include "tools/pmxboard/decode/knowledge.h"
#include "tools/pmxboard/decode/pattern.h"
#include "tools/pmxboard/decode/words.h"

namespace pmxboard::decode
{
namespace
{

constexpr double longest_pause = 30;    ///< seconds that lie at most between two lines of one call
constexpr std::size_t most_running = 6; ///< calls that wait for another one's end: threads, and what drivers call back
constexpr std::string_view start_up = "PMX_Init";
constexpr std::string_view boot_mode = "PMX_Reset";
constexpr std::string_view reset = "[PMX]_arPmxConf[ucPmxId].ucMode="; ///< nothing else runs then

// What calls print, in their order. A text is given by its beginning in quotes, with its first value where that matters
// (~0 is any but 0); X? may be missing, X* may stand more than once, X | Y is one of both. A name stands for what its
// row says. Texts that no row has are calls of their own, or may come anywhere, as assertions and the status report do.

struct Part
{
    std::string_view name;
    std::string_view says;
    bool is_part = false; ///< of a call: hardly ever made for itself
};

constexpr Part parts[] = {
    { "BOOT_MODE", "'TESTPMX: Get pard' 'TESTPMX: Get Test'" },
    { "RESET", "BOOT_MODE '[PMX]_arPmxConf[ucPmxId].ucMode='" },
    { "RETURN", "'PMX_SetOsdEnable.' 'Set Osd Enable'=0" },
    { "LOWER", "'Display Format Change :'=0 'Set Osd Enable'=1 RETURN?" },
    { "CONVERTERS", "('CC_A disable' | 'CC_A enable, 709' | 'CC_A enable, 601') "
                    "('Scaler CC disable, ' | 'Scaler CC disable' | 'Scaler CC enable')" },
    { "COLOURS", "'Mode(%d), eMixerOutCS' ('Invalid Color' | CONVERTERS)?" },
    { "REQUEST", "'SetModeEx' 'CCIR(%d, %s' 'HDMI(' 'CAV (' 'CVBS(' 'CCIR(%d, %d' 'OSD5(' '[PMX] Warning: Disable'?" },
    { "FULL_CHANGE", "('PMX Start to' 'PMX Finished')? 'Adjust PMX' COLOURS" },
    { "WAIT", "'[PMX] VDP_SetClearVideo' 'Display Format Change Timer Set'" },
    { "INFORM", "('Inform Vdp' 'Query VDP'?)? ('Inform Vdp' 'Query VDP'?)?" },
    { "DECIDE", "'[PMX] VDP_COMP_1'? '[PMX] VDP_COMP_2'? '[PMX] Gfx enabled'* "
                "('[PMX] Master Color' INFORM COLOURS)?" },
};

constexpr Part call_shapes[] = {
    { "PMX_Init", "'PMX_Init' (RESET 'Fail to register'? '[PMX] create a timer')?" },
    { "PMX_Reset", "RESET" },
    { "PMX_GetHDMIDefaultRes", "BOOT_MODE" },
    { "PMX_Uninit", "'PMX_Uninit' 'Fail to register'?" },
    { "i4PMX_Uninit", "'i4PMX_Uninit u4Case' 'Fail to register'? 'i4PMX_Uninit return'" },
    { "i4PmxRegisterIM", "'Fail to register'" },
    { "PMX_SetMode", "'SetMode, ' COLOURS?" },
    { "PMX_SetModeEx", "REQUEST ('[PMX] PMX_SetModeEx, PMX_CheckCap' LOWER | 'HD Exist' FULL_CHANGE? "
                       "('[PMX] fgHdmiExist' LOWER)? ('[PMX] fgPMX_DisplayModeReady'=0 | "
                       "'[PMX] fgPMX_DisplayModeReady' WAIT))" },
    { "PMX_SetFormatChangeFlag", "LOWER | 'Display Format Change :'~0" },
    { "PMX_SetOsdEnableFlag", "'Set Osd Enable'" },
    { "PMX_SetOsdEnable", "'PMX_SetOsdEnable.' 'Set Osd Enable'=0?" },
    { "_PMX_TmrIsr", "'PMX timeout' LOWER" },
    { "PMX_SetFormatChangeTimer", "'Display Format Change Timer Set'", true },
    { "fgPMX_DisplayModeReady", "'[PMX] fgPMX_DisplayModeReady'" },
    { "PMX_ColorSpaceSetup", "COLOURS", true },
    { "i4Pmx_Connect", "'COMP ID to'? 'Tp,Id=' 'Comp(%d) connect'" },
    { "i4Pmx_Disconnect", "'COMP ID to'? 'Tp,Id=' 'Comp(%d) disconnect'" },
    { "u4PmxCompId2LocalId", "'COMP ID to'" },
    { "PMX_VdpEnabled", "'VDP_%d Enabled' ('Turn on OSD' | 'Turn off OSD full range conversion since')? "
                        "(\"VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_709\" | "
                        "\"VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_601\") \"VDP_%d's (JPG\"? DECIDE" },
    { "PMX_VdpDisabled", "'VDP_%d Disabled' 'Turn off OSD full range conversion'?" },
    { "PMX_OsdEnabled", "'OSD_%d Enabled' (\"OSD_%d's Src Color Space = DRV_PMX_CS_RGB\" | "
                        "(\"OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_709\" | "
                        "\"OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_601\") (INFORM COLOURS)?)" },
    { "PMX_OsdDisabled", "'OSD_%d Disabled' DECIDE" },
    { "PMX_DecideMasterColorSpace", "DECIDE", true },
    { "PMX_InformVdpColorSpace", "INFORM", true },
};

using Places = std::vector<std::uint16_t>; ///< sorted

/** One text of a call. */
struct Step
{
    const Text* text = nullptr;
    std::string_view value; ///< what its first value must be; empty: anything
    std::size_t call = 0;   ///< its place in the list
    Places next;            ///< steps that may follow
    bool last = false;      ///< the call may end here
};

const Text& text_of(std::string_view begin)
{
    const Text* best = nullptr;
    for (const Text& text : texts())
    {
        if (text.level <= level_assertion || !text.format.starts_with(begin))
            continue;
        if (visible(text.format) == visible(begin))
            return text;
        best = best == nullptr ? &text : best;
    }
    if (best == nullptr)
        throw std::logic_error("no text begins with " + std::string(begin));
    return *best;
}

/** Where a part of a call begins and ends, and whether it may be missing. */
struct Piece
{
    Places begins;
    Places ends;
    bool empty = false;
};

void merge(Places& places, const Places& more)
{
    Places both;
    std::set_union(places.begin(), places.end(), more.begin(), more.end(), std::back_inserter(both));
    places = std::move(both);
}

/** Reads the lists. */
class CallReader
{
public:
    explicit CallReader(std::vector<Step>& steps) : m_steps(steps) {}

    Piece read(std::string_view says, std::size_t call)
    {
        m_call = call;
        std::string_view rest = says;
        return choice(rest);
    }

private:
    static void skip(std::string_view& rest) { rest.remove_prefix(std::min(rest.find_first_not_of(' '), rest.size())); }

    void join(const Places& from, const Places& to)
    {
        for (const std::uint16_t one : from)
            merge(m_steps[one].next, to);
    }

    Piece choice(std::string_view& rest)
    {
        Piece whole = row(rest);
        for (skip(rest); rest.starts_with('|'); skip(rest))
        {
            rest.remove_prefix(1);
            const Piece other = row(rest);
            merge(whole.begins, other.begins);
            merge(whole.ends, other.ends);
            whole.empty = whole.empty || other.empty;
        }
        return whole;
    }

    Piece row(std::string_view& rest)
    {
        Piece whole{ {}, {}, true };
        for (skip(rest); !rest.empty() && !rest.starts_with('|') && !rest.starts_with(')'); skip(rest))
        {
            const Piece next = repeated(rest);
            join(whole.ends, next.begins);
            if (whole.empty)
                merge(whole.begins, next.begins);
            if (!next.empty)
                whole.ends.clear();
            merge(whole.ends, next.ends);
            whole.empty = whole.empty && next.empty;
        }
        return whole;
    }

    Piece repeated(std::string_view& rest)
    {
        Piece one = atom(rest);
        if (rest.starts_with('*'))
            join(one.ends, one.begins);
        if (rest.starts_with('*') || rest.starts_with('?'))
        {
            one.empty = true;
            rest.remove_prefix(1);
        }
        return one;
    }

    Piece atom(std::string_view& rest)
    {
        if (rest.starts_with('('))
        {
            rest.remove_prefix(1);
            const Piece inner = choice(rest);
            rest.remove_prefix(1);
            return inner;
        }
        if (const char quote = rest.front(); quote == '\'' || quote == '"')
            return step(rest, quote);
        const std::size_t length = std::min(rest.find_first_of(" ?*|)"), rest.size());
        const auto part = std::find_if(std::begin(parts), std::end(parts),
                                       [&](const Part& one) { return one.name == rest.substr(0, length); });
        rest.remove_prefix(length);
        std::string_view says = part->says;
        return choice(says);
    }

    Piece step(std::string_view& rest, char quote)
    {
        const std::size_t end = rest.find(quote, 1);
        Step made{ &text_of(rest.substr(1, end - 1)), {}, m_call, {}, false };
        rest.remove_prefix(end + 1);
        made.value = rest.substr(0, std::min(rest.find_first_of(" ?*|)"), rest.size()));
        rest.remove_prefix(made.value.size());
        const auto place = static_cast<std::uint16_t>(m_steps.size());
        m_steps.push_back(std::move(made));
        return { { place }, { place }, false };
    }

    std::vector<Step>& m_steps;
    std::size_t m_call = 0;
};

/** All calls, as a console shows them that prints at least some level: the rest may be passed over. */
class Grammar
{
public:
    explicit Grammar(int level);

    bool knows(const Item& item) const { return m_by_text.contains(item.text); }
    Places matching(const Places& of, const Item& item) const;
    const Places& begins() const { return m_begins; }
    /** Whether it begins a call that is hardly ever made for itself. */
    bool is_part(const Places& at) const { return call_shapes[m_steps[at.front()].call].is_part; }
    /** Places of an item that come later in a call, when lines between are missing. */
    Places later(const Places& at, const Item& item) const;
    Places every(const Item& item) const;
    bool may_end(const Places& at) const;
    /** What must follow, when somebody was there. */
    std::string next_of(const Places& at) const;
    std::string_view call_of(const Places& at) const { return call_shapes[m_steps[at.front()].call].name; }
    Places follow(const Places& at) const;
    /** Places of an item that may follow. */
    Places going_on(const Places& at, const Item& item) const;

private:
    void pass_over();
    bool is_silent(std::uint16_t place) const { return m_steps[place].text->level > m_level; }

    int m_level;
    std::vector<Step> m_steps;
    Places m_begins;
    std::map<const Text*, Places> m_by_text;
};

/** The steps of all calls, as they are printed at the highest level, and those that begin one. */
struct Written
{
    std::vector<Step> steps;
    Places begins;
};

Written read_shapes()
{
    Written written;
    CallReader reader(written.steps);
    for (std::size_t call = 0; call < std::size(call_shapes); ++call)
    {
        const Piece piece = reader.read(call_shapes[call].says, call);
        merge(written.begins, piece.begins);
        for (const std::uint16_t end : piece.ends)
            written.steps[end].last = true;
    }
    return written;
}

Grammar::Grammar(int level) : m_level(level)
{
    static const Written written = read_shapes();
    m_steps = written.steps;
    m_begins = written.begins;
    pass_over();
    for (std::size_t place = 0; place < m_steps.size(); ++place)
        m_by_text[m_steps[place].text].push_back(static_cast<std::uint16_t>(place));
}

/** The steps behind what need not be printed may come directly. Lists are in order, so that one way back through them
 *  is enough: only what repeats leads back, and that to itself. */
void Grammar::pass_over()
{
    const auto reached = [this](const Places& places) {
        Places all = places;
        for (const std::uint16_t place : places)
        {
            if (is_silent(place))
                merge(all, m_steps[place].next);
        }
        return all;
    };
    for (std::size_t back = m_steps.size(); back-- > 0;)
    {
        Step& step = m_steps[back];
        step.last = step.last || std::any_of(step.next.begin(), step.next.end(), [this](std::uint16_t next) {
                        return is_silent(next) && m_steps[next].last;
                    });
        step.next = reached(step.next);
    }
    m_begins = reached(m_begins);
}

/** Whether its first value is as a step wants it: `=1`, `~0`. */
bool has_value(const Item& item, std::string_view wanted)
{
    return wanted.empty() || (item.values.front() == wanted.substr(1)) == (wanted.front() == '=');
}

Places Grammar::matching(const Places& of, const Item& item) const
{
    Places found;
    for (const std::uint16_t place : of)
    {
        const Step& step = m_steps[place];
        if (step.text == item.text && has_value(item, step.value))
            found.push_back(place);
    }
    return found;
}

Places Grammar::every(const Item& item) const
{
    return matching(m_by_text.at(item.text), item);
}

Places Grammar::follow(const Places& at) const
{
    if (at.size() == 1)
        return m_steps[at.front()].next;
    Places next;
    for (const std::uint16_t place : at)
        merge(next, m_steps[place].next);
    return next;
}

Places Grammar::later(const Places& at, const Item& item) const
{
    Places reached = follow(at);
    for (std::size_t before = 0; before != reached.size();)
    {
        before = reached.size();
        merge(reached, follow(reached));
    }
    return matching(reached, item);
}

Places Grammar::going_on(const Places& at, const Item& item) const
{
    if (at.size() == 1)
        return matching(m_steps[at.front()].next, item);
    return matching(follow(at), item);
}

bool Grammar::may_end(const Places& at) const
{
    return std::any_of(at.begin(), at.end(), [this](std::uint16_t place) { return m_steps[place].last; });
}

std::string Grammar::next_of(const Places& at) const
{
    const auto call = m_steps[at.front()].call;
    const bool is_one = std::all_of(at.begin(), at.end(), [&](auto place) { return m_steps[place].call == call; });
    std::vector<std::string> shown;
    for (const std::uint16_t place : follow(at))
    {
        if (is_silent(place))
            continue;
        std::string text = "\"" + std::string(visible(m_steps[place].text->format)) + "\"";
        if (std::find(shown.begin(), shown.end(), text) == shown.end())
            shown.push_back(std::move(text));
    }
    constexpr std::size_t most = 3;
    const std::string of = is_one ? " of " + std::string(call_of(at)) : "";
    return (shown.size() > most ? "the rest" : joined(shown, " or ")) + of;
}

const Grammar& grammar_of(int level)
{
    static std::map<int, Grammar> known;
    const int highest = 9;
    level = std::min(level, highest);
    return known.try_emplace(level, level).first->second;
}

/** A call that has begun. */
struct Running
{
    Places at;             ///< where it may be
    std::size_t first = 0; ///< place of its first line
    std::size_t last = 0;  ///< place of its last line
    bool finished = false; ///< it may end there
};

/** Goes from line to line. */
class Follower
{
public:
    explicit Follower(const Log& log) : m_log(log), m_grammar(&grammar_of(level_plain)), m_knowledge(level_plain) {}
    Calls follow();

private:
    const Item& item(std::size_t place) const { return m_log.items[m_log.order[place]]; }
    void take(std::size_t place);
    bool goes_on(std::size_t place);
    bool stands_twice(std::size_t place) const;
    void begin(std::size_t place, Places at);
    void begin_within(std::size_t place);
    void go_on_later(std::size_t place, Places at);
    void begin_anywhere();
    void give_up(const Running& call);
    void give_up_all();
    void tell_gap(std::size_t place, std::string what);
    void look(std::size_t place);
    bool is_in_mode_change() const;
    void take_level(int level);

    const Log& m_log;
    int m_level = level_plain; ///< of the console, as far as the lines tell: who captures a log raises it
    const Grammar* m_grammar;
    const Grammar* m_lower = nullptr; ///< of the level that it had until this line
    Knowledge m_knowledge;
    std::vector<Running> m_running; ///< the one that printed last at the end
    Calls m_calls;
    std::size_t m_before = 0; ///< place of the line before that some call prints in a known order
    bool m_goes_on = false;   ///< the line that is looked at is known as not the first of its call
    bool m_anywhere = true;   ///< the next line may stand in the middle of a call: the capture begins there
    bool m_outer = true;      ///< a call may have been running there that has printed nothing since
};

void Follower::tell_gap(std::size_t place, std::string what)
{
    m_calls.gaps.push_back({ place, std::move(what), false });
    m_knowledge.forget();
}

bool Follower::is_in_mode_change() const
{
    if (m_running.empty())
        return false;
    const std::string_view call = m_grammar->call_of(m_running.back().at);
    return call == "PMX_SetModeEx" || call == "PMX_SetMode";
}

/** What a line says against what is known. */
void Follower::look(std::size_t place)
{
    const Item& one = item(place);
    m_anywhere = m_anywhere && one.text->is_assertion();
    m_outer = m_outer && !one.text->format.starts_with(reset);
    if (auto missing = m_knowledge.take_time(one.moment))
        tell_gap(place, std::move(*missing));
    if (auto missing = m_knowledge.take(one, m_goes_on, is_in_mode_change()))
    {
        const bool of_line_before = one.text->rule == rules::osd_flag; // which could not have been so
        tell_gap(place - (of_line_before ? 1 : 0), std::move(*missing));
        m_knowledge.take(one, m_goes_on, is_in_mode_change());
    }
}

void Follower::take_level(int level)
{
    m_lower = m_grammar;
    m_level = std::max(m_level, level);
    m_grammar = &grammar_of(m_level);
    m_knowledge.set_level(m_level);
}

Calls Follower::follow()
{
    std::size_t boot = 0;
    m_calls.is_known.resize(m_log.order.size());
    m_calls.begins.resize(m_log.order.size());
    std::iota(m_calls.begins.begin(), m_calls.begins.end(), std::size_t{ 0 });
    for (std::size_t place = 0; place < m_log.order.size(); ++place)
    {
        const Item& one = item(place);
        m_calls.is_known[place] = m_grammar->knows(one);
        if (one.boot != boot)
        {
            m_level = level_plain;
            m_running.clear(); // whatever ran is over
            m_knowledge.forget();
        }
        boot = one.boot;
        take_level(one.text->level);
        m_goes_on = false;
        if (one.cut != Item::Cut::None)
            begin_anywhere(); // it may be any of several
        else if (m_grammar->knows(one))
            take(place);
        if (m_grammar->knows(one))
            m_before = place;
        if (one.cut == Item::Cut::None)
            look(place);
    }
    if (m_log.end_boot == boot)
    {
        if (auto missing = m_knowledge.take_time(m_log.end))
            tell_gap(m_log.order.size(), std::move(*missing));
    }
    if (!m_running.empty() && !m_running.back().finished && m_log.end_boot == boot)
    {
        m_calls.unfinished = m_grammar->next_of(m_running.back().at);
        m_running.pop_back();
    }
    give_up_all();
    std::stable_sort(m_calls.gaps.begin(), m_calls.gaps.end(),
                     [](const Gap& one, const Gap& other) { return one.at < other.at; });
    return std::move(m_calls);
}

void Follower::take(std::size_t place)
{
    const Item& one = item(place);
    m_goes_on = goes_on(place);
    if (m_goes_on)
        return;
    const bool expects_another = !m_running.empty() && !m_running.back().finished;
    Places at = m_grammar->matching(m_grammar->begins(), one);
    Places later = expects_another && !at.empty() && m_grammar->is_part(at) ? m_grammar->later(m_running.back().at, one)
                                                                            : Places();
    if (stands_twice(place) && (expects_another || at.empty()))
        m_calls.twice.push_back(place);
    else if (!later.empty())
        go_on_later(place, std::move(later));
    else if (!at.empty() && !m_anywhere)
        begin(place, std::move(at));
    else
        begin_within(place);
}

/** Lines of the call that runs are not in the log. */
void Follower::go_on_later(std::size_t place, Places at)
{
    tell_gap(place, m_grammar->next_of(m_running.back().at));
    const bool finished = m_grammar->may_end(at);
    const std::size_t first = m_running.back().first;
    m_running.back() = { std::move(at), first, place, finished };
    m_calls.begins[place] = first;
}

/** The beginning of a call is not in the log. */
void Follower::begin_within(std::size_t place)
{
    const Item& one = item(place);
    Places at = m_grammar->every(one);
    if (at.empty())
        return;
    if (!m_anywhere && !m_outer)
        tell_gap(place, "what leads to \"" + one.shown + "\"");
    m_outer = m_outer && m_anywhere;
    give_up_all();
    const bool finished = m_grammar->may_end(at);
    m_running.push_back({ std::move(at), place, place, finished });
}

/** Whether a line goes on with a call that runs, the last one first. */
bool Follower::goes_on(std::size_t place)
{
    for (std::size_t back = m_running.size(); back-- > 0;)
    {
        const Running& call = m_running[back];
        const std::optional<double> passed = between(item(call.last).moment, item(place).moment);
        if (passed && *passed > longest_pause)
            continue;
        Places at = m_grammar->going_on(call.at, item(place));
        if (at.empty())
            at = m_lower->going_on(call.at, item(place));
        if (at.empty())
            continue;
        if (call.finished) // then it may be another one's, and is when others came between
        {
            const Places begins = m_grammar->matching(m_grammar->begins(), item(place));
            if (call.last != m_before && !begins.empty())
                continue;
            merge(at, begins);
        }
        const std::size_t first = call.first;
        m_running.erase(m_running.begin() + static_cast<std::ptrdiff_t>(back));
        const bool finished = m_grammar->may_end(at);
        m_running.push_back({ std::move(at), first, place, finished });
        m_calls.begins[place] = first;
        return true;
    }
    return false;
}

/** Whether it repeats the line before. */
bool Follower::stands_twice(std::size_t place) const
{
    if (place == 0)
        return false;
    const Item& one = item(place);
    const Item& before = item(place - 1);
    return one.text == before.text && one.values == before.values && one.line != before.line;
}

void Follower::begin(std::size_t place, Places at)
{
    const std::string_view call = m_grammar->call_of(at);
    if (call == start_up || call == boot_mode) // of another run, it may be: what ran was broken off
    {
        m_running.clear();
        m_outer = false;
    }
    for (std::size_t back = m_running.size(); back-- > 0;)
    {
        const std::optional<double> passed = between(item(m_running[back].last).moment, item(place).moment);
        if (m_grammar->call_of(m_running[back].at) != call && !(passed && *passed > longest_pause))
            continue;
        give_up(m_running[back]); // nobody calls it from two places at a time, and none takes so long
        m_running.erase(m_running.begin() + static_cast<std::ptrdiff_t>(back));
    }
    if (m_running.size() == most_running)
    {
        give_up(m_running.front());
        m_running.erase(m_running.begin());
    }
    const bool finished = m_grammar->may_end(at);
    m_running.push_back({ std::move(at), place, place, finished });
}

void Follower::begin_anywhere()
{
    m_running.clear();
    m_anywhere = true;
    m_outer = true;
}

void Follower::give_up(const Running& call)
{
    if (!call.finished)
    {
        tell_gap(call.last + 1, m_grammar->next_of(call.at));
        m_calls.gaps.back().is_end = true;
    }
}

void Follower::give_up_all()
{
    for (const Running& call : m_running)
        give_up(call);
    m_running.clear();
}

} // namespace

Calls read_calls(const Log& log)
{
    return Follower(log).follow();
}

} // namespace pmxboard::decode
