#include "tools/pmxboard/decode/log.h"

#include <algorithm>
#include <charconv>

#include "tools/pmxboard/decode/clean.h"
#include "tools/pmxboard/decode/pattern.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::size_t longest_text = 200; ///< no text of the layer is longer, with its values
constexpr std::size_t look_back = 64;
constexpr std::size_t cut_literal = 8; ///< so many characters of a text tell which one was cut
constexpr unsigned broken_within = 2;  ///< foreign lines that may stand within a text

constexpr std::string_view command_echo = "> ";
constexpr std::string_view traced_assertion = "  Assert(\""; ///< the console shows it, too

std::string_view before(std::string_view line, std::size_t from, std::size_t at)
{
    const std::size_t begin = std::max(from, at > look_back ? at - look_back : 0);
    return line.substr(begin, at - begin);
}

/** Reads one line after the other. */
class Reader
{
public:
    void line(std::string_view bytes);
    Log take() { return std::move(m_log); }

private:
    struct Broken
    {
        std::size_t item;
        std::string begin;
        unsigned age = 0;
    };

    void segment(const std::string& text);
    bool begins_text(std::string_view line) const;
    const Pattern* find_at(std::string_view line, std::size_t from, std::size_t at, Match& match) const;
    std::size_t mend(const std::string& text);
    std::size_t scan(std::string_view line, std::size_t from);
    void take_assertion(std::string_view line, std::size_t at, const Match& match, const Text& file);
    void find_cut_end(std::string_view line, std::size_t from);
    void find_cut_begin(std::string_view line);
    Item& add(const Text& text, std::string_view shown);

    Log m_log;
    std::optional<Broken> m_broken;
    std::size_t m_number = 0;
    bool m_first = true;
    Stamp m_stamp;
    std::size_t m_line_items = 0; ///< items before this line
};

void take_values(Item& item, const Match& match)
{
    item.values.assign(match.values.begin(), match.values.begin() + static_cast<std::ptrdiff_t>(match.count));
}

void Reader::line(std::string_view bytes)
{
    ++m_number;
    ++m_log.lines;
    const std::size_t items_before = m_log.items.size();
    const bool joined_before = m_broken.has_value();
    bool seen = false;
    while (!bytes.empty())
    {
        const std::size_t end = std::min(bytes.find('\r'), bytes.size());
        const std::string text = clean(bytes.substr(0, end));
        bytes.remove_prefix(std::min(end + 1, bytes.size()));
        if (text.find_first_not_of(' ') == text.npos)
            continue;
        seen = true;
        segment(text);
    }
    const bool joined = joined_before && !m_broken && m_log.items.size() == items_before && !m_log.shown.empty() &&
                        m_log.shown.back().line == m_number && m_log.shown.back().item;
    if (seen && m_log.items.size() == items_before && !joined)
        ++m_log.foreign;
}

void Reader::segment(const std::string& text)
{
    m_line_items = m_log.items.size();
    const std::string_view line = std::string_view(text).substr(0, text.find_last_not_of(' ') + 1);
    bool found = false;
    if (!line.starts_with(command_echo) && line.substr(0, longest_text).find(traced_assertion) == line.npos)
    {
        m_stamp = stamp_of(line);
        const std::size_t from = mend(text);
        const std::size_t end = scan(line, from);
        if (m_first && m_log.items.empty())
            find_cut_begin(line);
        find_cut_end(text, end);
        found = from != 0 || m_log.items.size() > m_line_items;
    }
    m_first = false;
    if (!found)
        m_log.shown.push_back({ m_number, {}, std::string(line.substr(0, longest_text)) });
}

Item& Reader::add(const Text& text, std::string_view shown)
{
    Item item;
    item.text = &text;
    item.line = m_number;
    item.last_line = m_number;
    item.time = m_stamp.text;
    item.seconds = m_stamp.seconds;
    item.shown = shown;
    m_log.shown.push_back({ m_number, m_log.items.size(), {} });
    m_log.items.push_back(std::move(item));
    return m_log.items.back();
}

/** Whether some text stands whole at the beginning. */
bool Reader::begins_text(std::string_view line) const
{
    if (line.empty())
        return false;
    const auto candidates = patterns_of(line.front());
    return std::any_of(candidates.begin(), candidates.end(),
                       [line](const Pattern* pattern) { return match(*pattern, line).state == Match::State::Whole; });
}

/** The longest text that stands whole at a place where it may stand. */
const Pattern* Reader::find_at(std::string_view line, std::size_t from, std::size_t at, Match& found) const
{
    const Pattern* best = nullptr;
    for (const Pattern* const pattern : patterns_of(line[at]))
    {
        const Match match = decode::match(*pattern, line.substr(at, longest_text));
        if (match.state != Match::State::Whole || (best != nullptr && match.end <= found.end))
            continue;
        best = pattern;
        found = match;
    }
    if (best == nullptr || (at > from && is_word(line[at]) && is_word(line[at - 1])))
        return nullptr;
    if (!best->weak)
        return best;
    std::size_t next = at + found.end;
    while (next < line.size() && next < at + longest_text && line[next] == ' ')
        ++next;
    const bool names_line = best->text->role == Role::SourceFile && next + 1 < line.size() && line[next] == ':' &&
                            line[next + 1] >= '0' && line[next + 1] <= '9';
    const bool ends = next >= line.size() || names_line || begins_text(line.substr(next, longest_text));
    return ends && is_prefix(before(line, from, at)) ? best : nullptr;
}

/** Puts a text together that something foreign broke in two; how much of this line belongs to it. */
std::size_t Reader::mend(const std::string& text)
{
    if (!m_broken)
        return 0;
    const std::string whole = m_broken->begin + text.substr(0, longest_text);
    const Pattern* best = nullptr;
    Match found;
    for (const Pattern* const pattern : patterns_of(whole.front()))
    {
        const Match match = decode::match(*pattern, whole);
        if (match.state == Match::State::Whole && match.end > m_broken->begin.size() && match.end > found.end)
        {
            best = pattern;
            found = match;
        }
    }
    if (best == nullptr)
    {
        if (++m_broken->age > broken_within)
            m_broken.reset();
        return 0;
    }
    Item& item = m_log.items[m_broken->item];
    item.text = best->text;
    item.cut = Item::Cut::None;
    item.last_line = m_number;
    item.shown = whole.substr(0, found.end);
    take_values(item, found);
    --m_log.cut;
    m_log.level = std::max(m_log.level.value_or(level_plain), best->text->level);
    m_log.shown.push_back({ m_number, m_broken->item, {} });
    const std::size_t used = found.end - m_broken->begin.size();
    m_broken.reset();
    return used;
}

/** Takes every text that stands whole; where the last one ends. */
std::size_t Reader::scan(std::string_view line, std::size_t from)
{
    for (std::size_t at = from; at < line.size();)
    {
        Match match;
        const Pattern* const pattern = find_at(line, from, at, match);
        if (pattern == nullptr)
        {
            ++at;
            continue;
        }
        const Text& text = *pattern->text;
        if (text.role == Role::SourceFile)
        {
            take_assertion(line, at, match, text);
        }
        else
        {
            Item& item = add(text, line.substr(at, match.end));
            take_values(item, match);
            if (text.level > level_plain || !m_log.level)
                m_log.level = std::max(m_log.level.value_or(level_plain), text.level);
        }
        at += match.end;
        from = at;
    }
    return from;
}

/** The layer's source files are named by assertions alone. The expression stands before, if anywhere. */
void Reader::take_assertion(std::string_view line, std::size_t at, const Match& match, const Text& file)
{
    const std::string_view name = file.format.substr(file.format.rfind('/') + 1);
    std::string_view number = line.substr(at + match.end, longest_text);
    number = number.starts_with(':') ? number.substr(1) : std::string_view();
    const std::size_t digits = std::min(number.find_first_not_of("0123456789"), number.size());

    if (m_log.items.size() == m_line_items || m_log.items.back().text->role != Role::Assertion ||
        !m_log.items.back().values.empty())
    {
        const std::string_view lead = line.substr(0, at).substr(at > look_back ? at - look_back : 0);
        const Text* meant = &file;
        for (const Text& text : texts())
        {
            const std::size_t stands = lead.rfind(text.format);
            if (text.role == Role::Assertion && has(text.values, name) && stands != lead.npos &&
                (stands == 0 || !is_word(lead[stands - 1])) &&
                (stands + text.format.size() == lead.size() || !is_word(lead[stands + text.format.size()])))
            {
                meant = &text;
                break;
            }
        }
        add(*meant, meant->format);
    }
    Item& item = m_log.items.back();
    item.values = { std::string(name), std::string(number.substr(0, std::min<std::size_t>(digits, 9))) };
    if (item.text->role == Role::Assertion)
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
            const Match match = decode::match(*pattern, line.substr(at));
            if (match.state != Match::State::RanOut || match.literal < cut_literal)
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
        for (std::size_t piece = 0; piece < pattern.pieces.size(); ++piece)
        {
            for (std::size_t skip = 0; skip <= pattern.pieces[piece].literal.size(); ++skip)
            {
                const Match match = match_rest(pattern, piece, skip, line.substr(0, longest_text));
                if (match.state != Match::State::Whole || match.literal < cut_literal || match.end != line.size())
                    continue;
                add(*pattern.text, line).cut = Item::Cut::Begin;
                ++m_log.cut;
                return;
            }
        }
    }
}

} // namespace

std::string Item::value(std::string_view name) const
{
    if (text->role == Role::Assertion || text->role == Role::SourceFile)
        return {};
    const std::vector<std::string_view> names = split(text->values);
    for (std::size_t i = 0; i < names.size() && i < values.size(); ++i)
    {
        if (names[i] == name)
            return values[i];
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
    while (!bytes.empty())
    {
        const std::size_t end = std::min(bytes.find('\n'), bytes.size());
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

std::optional<std::int64_t> number_of(std::string_view digits, int base)
{
    std::int64_t number = 0;
    const auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number, base);
    if (error != std::errc{} || end != digits.data() + digits.size())
        return {};
    return number;
}

} // namespace pmxboard::decode
