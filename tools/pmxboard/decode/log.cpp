// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/log.h"

#include <algorithm>
#include <charconv>
#include <numeric>

#include "tools/pmxboard/decode/clean.h"
#include "tools/pmxboard/decode/pattern.h"
#include "tools/pmxboard/decode/trace_lines.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::size_t longest_text = 200; ///< no text of the layer is longer, with its values
constexpr std::size_t look_back = 64;
constexpr std::size_t cut_literal = 8; ///< so many characters of a text tell which one was cut
constexpr unsigned broken_within = 2;  ///< foreign lines that may stand within a text
constexpr double exact_enough = 1e-5;  ///< seconds: two lines of one text with one stamp are one line
constexpr std::size_t twice_within = 3;
constexpr std::ptrdiff_t most_displaced = 32; ///< lines that a buffer lets another pass

constexpr std::string_view command_echo = "> ";
constexpr std::string_view traced_assertion = "  Assert(\""; ///< the console shows it, too

std::string_view before(std::string_view line, std::size_t from, std::size_t at)
{
    const std::size_t begin = std::max(from, at > look_back ? at - look_back : 0);
    return line.substr(begin, at - begin);
}

/** A text that stands whole. */
struct Whole
{
    const Pattern* pattern = nullptr;
    Match match;
};

/** The longest text that stands whole at the beginning of a line that has one. */
Whole longest_at_begin(std::string_view line)
{
    Whole best;
    for (const Pattern* const pattern : patterns_of(line.front()))
    {
        if (!line.starts_with(pattern->lead))
            continue;
        const Match found = match(pattern->format, line);
        if (found.state == Match::State::Whole && found.end > best.match.end)
            best = { pattern, found };
    }
    return best;
}

/** The same, within a line: only where a text may stand. */
Whole find_at(std::string_view line, std::size_t from, std::size_t at)
{
    const Whole best = longest_at_begin(line.substr(at, longest_text));
    if (best.pattern == nullptr || (at > from && is_word(line[at]) && is_word(line[at - 1])))
        return {};
    if (!best.pattern->weak)
        return best;
    std::string_view behind = line.substr(at + best.match.end, longest_text);
    behind.remove_prefix(std::min(behind.find_first_not_of(' '), behind.size()));
    const bool names_line =
        best.pattern->text->level == level_file && behind.starts_with(':') && behind.find_first_of(digits) == 1;
    const bool ends = behind.empty() || names_line || longest_at_begin(behind).pattern != nullptr;
    return ends && is_prefix(before(line, from, at)) ? best : Whole{};
}

/** The assertion of a source file whose expression stands before the file's name; else the file itself. */
const Text& assertion_of(const Text& file, std::string_view lead)
{
    const std::string padded = " " + std::string(lead) + " ";
    for (const Text& text : texts())
    {
        const std::size_t stands = padded.rfind(text.format);
        if (text.level != level_assertion || text.file != file.file || stands == padded.npos)
            continue;
        if (!is_word(padded[stands - 1]) && !is_word(padded[stands + text.format.size()]))
            return text;
    }
    return file;
}

/** Reads one line after the other. */
class Reader
{
public:
    void line(std::string_view bytes);
    void is_trace() { m_log.form = Log::Form::Trace; }
    void trace_line(std::string_view bytes);
    Log take();

private:
    struct Broken
    {
        std::size_t item;
        std::string begin;
        unsigned age = 0;
    };

    bool segment(const std::string& text);
    std::size_t mend(const std::string& text);
    std::size_t scan(std::string_view line, std::size_t from);
    void take_assertion(std::string_view line, std::size_t at, std::size_t end, const Text& file);
    void find_cut_end(std::string_view line, std::size_t from);
    void find_cut_begin(std::string_view line);
    Item& add(const Text& text, std::string_view shown);
    void take_time(std::string_view line);
    void keep_end();
    void begin_anew();
    void put_in_order();
    void leave_out_what_stands_twice();
    void take_whole(Item& item, const Whole& whole);

    Log m_log;
    std::optional<Broken> m_broken;
    bool m_first = true;
    bool m_powers_on = false; ///< the entry of a trace that is read
    Timeline m_timeline;
    Stamp m_stamp; ///< of the line that is read
    std::optional<Moment> m_moment;
};

void Reader::line(std::string_view bytes)
{
    ++m_log.lines;
    bool seen = false;
    bool found = false;
    while (!bytes.empty())
    {
        const std::size_t end = std::min(bytes.find('\r'), bytes.size());
        const std::string text = clean(bytes.substr(0, end));
        bytes.remove_prefix(std::min(end + 1, bytes.size()));
        if (text.find_first_not_of(' ') == text.npos)
            continue;
        seen = true;
        found = segment(text) || found;
    }
    if (seen && !found)
        ++m_log.foreign;
}

/** An entry of a trace: what it printed stands there as on a console that shows every level. */
void Reader::trace_line(std::string_view bytes)
{
    const TraceLine entry = read_trace_line(bytes);
    m_powers_on = entry.powers_on;
    line(entry.printed ? *entry.printed : bytes);
}

/** Whether a piece between two carriage returns has anything of the layer. */
bool Reader::segment(const std::string& text)
{
    const std::size_t items_before = m_log.items.size();
    const std::string_view line = std::string_view(text).substr(0, text.find_last_not_of(' ') + 1);
    bool found = false;
    take_time(line);
    if (!line.starts_with(command_echo) && line.substr(0, longest_text).find(traced_assertion) == line.npos)
    {
        const std::size_t from = mend(text);
        const std::size_t end = scan(line, from);
        if (m_first && m_log.items.empty())
            find_cut_begin(line);
        find_cut_end(text, end);
        found = from != 0 || m_log.items.size() > items_before;
    }
    m_first = false;
    if (!found && is_banner(line.substr(0, longest_text)))
    {
        begin_anew();
        m_moment = m_timeline.take(m_stamp);
        keep_end();
    }
    if (!found)
        m_log.shown.push_back({ m_log.lines, {}, std::string(line.substr(0, longest_text)) });
    return found;
}

void Reader::take_time(std::string_view line)
{
    m_stamp = stamp_of(line);
    if (m_powers_on)
        begin_anew();
    m_powers_on = false;
    m_moment = m_timeline.take(m_stamp);
    if (m_timeline.began_anew())
    {
        begin_anew();
        m_moment = m_timeline.take(m_stamp);
    }
    keep_end();
}

void Reader::keep_end()
{
    if (m_moment)
        m_log.end = m_moment;
    m_log.end_boot = m_log.boots.size();
}

/** A boot shows in several ways, one behind the other. */
void Reader::begin_anew()
{
    m_timeline.begin_anew();
    const std::size_t first = m_log.boots.empty() ? 0 : m_log.boots.back().item;
    if (m_log.items.size() == first)
        return;
    m_log.boots.push_back({ m_log.lines, m_stamp.text, m_log.items.size() });
    m_broken.reset();
}

/** A buffer may have changed the order of lines; their stamps tell. */
void Reader::put_in_order()
{
    const auto is_older = [this](std::size_t one, std::size_t other) {
        const std::optional<double> time = between(m_log.items[one].moment, m_log.items[other].moment);
        return time && *time > 0;
    };
    std::vector<std::size_t>& order = m_log.order;
    for (std::size_t item = 0; item < m_log.items.size(); ++item)
    {
        auto place = order.end();
        while (place != order.begin() && order.end() - place < most_displaced && is_older(item, *(place - 1)))
            --place;
        m_log.displaced += place == order.end() ? 0 : 1;
        order.insert(place, item);
    }
}

void Reader::leave_out_what_stands_twice()
{
    std::vector<std::size_t> once;
    for (const std::size_t one : m_log.order)
    {
        const Item& item = m_log.items[one];
        const auto is_same = [&](std::size_t other) {
            const Item& before = m_log.items[other];
            return item.moment && item.moment->exact <= exact_enough && item.moment == before.moment &&
                   item.text == before.text && item.shown == before.shown && item.line != before.line;
        };
        const auto begin = once.end() - static_cast<std::ptrdiff_t>(std::min(once.size(), twice_within));
        if (std::none_of(begin, once.end(), is_same))
            once.push_back(one);
        else
            ++m_log.twice;
    }
    m_log.order = std::move(once);
}

Log Reader::take()
{
    if (m_log.form == Log::Form::Console)
    {
        put_in_order();
        leave_out_what_stands_twice();
    }
    else // nothing is lost there, and virtual time stands still
    {
        m_log.order.resize(m_log.items.size());
        std::iota(m_log.order.begin(), m_log.order.end(), std::size_t{ 0 });
    }
    return std::move(m_log);
}

Item& Reader::add(const Text& text, std::string_view shown)
{
    m_log.shown.push_back({ m_log.lines, m_log.items.size(), {} });
    Item& item = m_log.items.emplace_back();
    item.text = &text;
    item.line = m_log.lines;
    item.last_line = m_log.lines;
    item.time = m_stamp.text;
    item.moment = m_moment;
    item.boot = m_log.boots.size();
    item.shown = shown;
    return item;
}

void Reader::take_whole(Item& item, const Whole& whole)
{
    const auto& values = whole.match.values;
    item.text = whole.pattern->text;
    item.values.assign(values.begin(), values.begin() + static_cast<std::ptrdiff_t>(whole.match.count));
    m_log.level = std::max(m_log.level.value_or(level_plain), item.text->level);
}

/** Puts a text together that something foreign broke in two; how much of this line belongs to it. */
std::size_t Reader::mend(const std::string& text)
{
    if (!m_broken)
        return 0;
    const std::string together = m_broken->begin + text.substr(0, longest_text);
    const Whole whole = longest_at_begin(together);
    if (whole.match.end <= m_broken->begin.size())
    {
        if (++m_broken->age > broken_within)
            m_broken.reset();
        return 0;
    }
    Item& item = m_log.items[m_broken->item];
    item.cut = Item::Cut::None;
    item.last_line = m_log.lines;
    item.shown = together.substr(0, whole.match.end);
    take_whole(item, whole);
    --m_log.cut;
    m_log.shown.push_back({ m_log.lines, m_broken->item, {} });
    const std::size_t used = whole.match.end - m_broken->begin.size();
    m_broken.reset();
    return used;
}

/** Takes every text that stands whole; where the last one ends. */
std::size_t Reader::scan(std::string_view line, std::size_t from)
{
    for (std::size_t at = from; at < line.size();)
    {
        const Whole whole = find_at(line, from, at);
        if (whole.pattern == nullptr)
        {
            ++at;
            continue;
        }
        const std::size_t end = at + whole.match.end;
        if (whole.pattern->text->level == level_file)
            take_assertion(line, at, end, *whole.pattern->text);
        else
            take_whole(add(*whole.pattern->text, line.substr(at, whole.match.end)), whole);
        at = end;
        from = end;
    }
    return from;
}

/** The layer's source files are named by assertions alone. The expression stands before, if anywhere. */
void Reader::take_assertion(std::string_view line, std::size_t at, std::size_t end, const Text& file)
{
    const auto is_open = [&](const Item& item) {
        return item.text->level == level_assertion && item.values.empty() && item.line == m_log.lines;
    };
    if (m_log.items.empty() || !is_open(m_log.items.back()))
    {
        const Text& meant = assertion_of(file, before(line, 0, at));
        add(meant, meant.format);
    }
    std::string_view number = line.substr(end, longest_text);
    number = number.starts_with(':') ? number.substr(1, 9) : std::string_view();
    Item& item = m_log.items.back();
    item.values = { std::string(file.file), std::string(number.substr(0, number.find_first_not_of(digits))) };
    if (item.text->level == level_assertion)
        item.shown = std::string(item.text->format) + ", " + item.values.front();
}

/** A text whose end is missing. */
void Reader::find_cut_end(std::string_view line, std::size_t from)
{
    const std::size_t begin = std::max(from, line.size() > longest_text ? line.size() - longest_text : 0);
    for (std::size_t at = begin; at < line.size(); ++at)
    {
        if (at > from && !is_prefix(before(line, from, at)))
            continue;
        for (const Pattern* const pattern : patterns_of(line[at]))
        {
            const Match found = match(pattern->format, line.substr(at));
            if (found.state != Match::State::RanOut || found.literal < cut_literal)
                continue;
            add(*pattern->text, line.substr(at)).cut = Item::Cut::End;
            ++m_log.cut;
            m_broken = Broken{ m_log.items.size() - 1, std::string(line.substr(at)), 0 };
            return;
        }
    }
}

/** A text whose beginning is missing, which is to be expected where a log begins. */
void Reader::find_cut_begin(std::string_view line)
{
    for (const Pattern& pattern : patterns())
    {
        std::size_t step = 1;
        for (std::size_t at = 0; at < pattern.format.size(); at += step)
        {
            const std::string_view rest = pattern.format.substr(at);
            step = std::max<std::size_t>(conversion_length(rest), 1);
            const Match found = match(rest, line.substr(0, longest_text));
            if (found.state != Match::State::Whole || found.literal < cut_literal || found.end != line.size())
                continue;
            add(*pattern.text, line).cut = Item::Cut::Begin;
            ++m_log.cut;
            return;
        }
    }
}

} // namespace

std::string Item::value(std::string_view name) const
{
    std::string_view names = text->values;
    for (const std::string& one : values)
    {
        const std::size_t length = std::min(names.find(','), names.size());
        if (names.substr(0, length) == name)
            return one;
        names.remove_prefix(std::min(length + 1, names.size()));
    }
    return {};
}

std::optional<std::int64_t> Item::number(std::string_view name) const
{
    return number_of(value(name));
}

Log read_log(std::string_view bytes)
{
    Reader reader;
    const bool is_trace = is_trace_lines(bytes);
    if (is_trace)
        reader.is_trace();
    while (!bytes.empty())
    {
        const std::size_t end = std::min(bytes.find('\n'), bytes.size());
        if (is_trace)
            reader.trace_line(bytes.substr(0, end));
        else
            reader.line(bytes.substr(0, end));
        bytes.remove_prefix(std::min(end + 1, bytes.size()));
    }
    return reader.take();
}

std::optional<Item> read_text(std::string_view printed)
{
    Log log = read_log(visible(printed));
    if (log.items.size() != 1 || log.items.front().cut != Item::Cut::None)
        return {};
    return std::move(log.items.front());
}

std::optional<std::int64_t> number_of(std::string_view printed, int base)
{
    std::int64_t number = 0;
    const auto [end, error] = std::from_chars(printed.data(), printed.data() + printed.size(), number, base);
    if (error != std::errc{} || end != printed.data() + printed.size())
        return {};
    return number;
}

} // namespace pmxboard::decode
