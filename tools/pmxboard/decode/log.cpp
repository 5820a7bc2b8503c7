// SPDX-License-Identifier: MIT OR GPL-2.0-only
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

/** A text that stands whole. */
struct Whole
{
    const Pattern* pattern = nullptr;
    Match match;
};

/** The longest text that stands whole at the beginning. */
Whole longest_at_begin(std::string_view line)
{
    Whole best;
    if (line.empty())
        return best;
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
    for (const Text& text : texts())
    {
        const std::size_t stands = lead.rfind(text.format);
        if (text.level != level_assertion || text.file != file.file || stands == lead.npos)
            continue;
        const std::size_t end = stands + text.format.size();
        if ((stands == 0 || !is_word(lead[stands - 1])) && (end == lead.size() || !is_word(lead[end])))
            return text;
    }
    return file;
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

    bool segment(const std::string& text);
    std::size_t mend(const std::string& text);
    std::size_t scan(std::string_view line, std::size_t from);
    void take_assertion(std::string_view line, std::size_t at, std::size_t end, const Text& file);
    void find_cut_end(std::string_view line, std::size_t from);
    void find_cut_begin(std::string_view line);
    Item& add(const Text& text, std::string_view shown);
    void take_whole(Item& item, const Whole& whole);

    Log m_log;
    std::optional<Broken> m_broken;
    bool m_first = true;
    std::string_view m_segment; ///< that is read
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

/** Whether a piece between two carriage returns has anything of the layer. */
bool Reader::segment(const std::string& text)
{
    const std::size_t items_before = m_log.items.size();
    const std::string_view line = std::string_view(text).substr(0, text.find_last_not_of(' ') + 1);
    bool found = false;
    if (!line.starts_with(command_echo) && line.substr(0, longest_text).find(traced_assertion) == line.npos)
    {
        m_segment = line;
        const std::size_t from = mend(text);
        const std::size_t end = scan(line, from);
        if (m_first && m_log.items.empty())
            find_cut_begin(line);
        find_cut_end(text, end);
        found = from != 0 || m_log.items.size() > items_before;
    }
    m_first = false;
    if (!found)
        m_log.shown.push_back({ m_log.lines, {}, std::string(line.substr(0, longest_text)) });
    return found;
}

Item& Reader::add(const Text& text, std::string_view shown)
{
    const Stamp stamp = stamp_of(m_segment);
    m_log.shown.push_back({ m_log.lines, m_log.items.size(), {} });
    Item& item = m_log.items.emplace_back();
    item.text = &text;
    item.line = m_log.lines;
    item.last_line = m_log.lines;
    item.time = stamp.text;
    item.seconds = stamp.seconds;
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
    const std::vector<std::string_view> names = split(text->values);
    const auto found = std::find(names.begin(), names.end(), name);
    const auto index = static_cast<std::size_t>(found - names.begin());
    return index < values.size() ? values[index] : "";
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

std::optional<std::int64_t> number_of(std::string_view printed, int base)
{
    std::int64_t number = 0;
    const auto [end, error] = std::from_chars(printed.data(), printed.data() + printed.size(), number, base);
    if (error != std::errc{} || end != printed.data() + printed.size())
        return {};
    return number;
}

} // namespace pmxboard::decode
