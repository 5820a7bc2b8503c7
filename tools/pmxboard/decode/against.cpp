// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/against.h"

#include <algorithm>
#include <cstdint>
#include <span>
#include <utility>

#include "tools/pmxboard/decode/words.h"

namespace pmxboard::decode
{
namespace
{

// An alignment's cost. A line of the log that goes unused weighs more than one that the log may not have begun with, or
// else a gap would make what stands before it look foreign to the scenario.
using Cost = std::uint32_t;
constexpr Cost cost_missing = 1;
constexpr Cost cost_extra = 2;
constexpr Cost cost_value = 2;

constexpr std::size_t most_lines = 100000;    ///< of either side
constexpr std::size_t most_departures = 1000; ///< who has more compares with another scenario
constexpr std::size_t most_aligned = 256;     ///< lines of both sides that are aligned at once
constexpr std::size_t enough_agree = 4;       ///< lines in a row, and both go on together

bool is_cut(const Item& found)
{
    return found.cut != Item::Cut::None;
}

bool same_text(const Item& expected, const Item& found)
{
    if (found.cut == Item::Cut::End)
        return expected.shown.starts_with(found.shown.substr(0, found.shown.find_last_not_of(' ') + 1));
    if (found.cut == Item::Cut::Begin)
        return expected.shown.ends_with(found.shown);
    return expected.text == found.text;
}

bool same(const Item& expected, const Item& found)
{
    if (!same_text(expected, found))
        return false;
    if (is_cut(found))
        return true;
    if (expected.text->level == level_assertion) // its line number changes when code moves, and its file may be cut off
        return found.values.empty() || expected.values.front() == found.values.front();
    return expected.values == found.values;
}

constexpr Cost impossible = 1u << 20;

Cost cost_of_extra(const Item& found)
{
    return is_cut(found) ? 0 : cost_extra;
}

Cost cost_of_pair(const Item& expected, const Item& found)
{
    if (same(expected, found))
        return 0;
    return same_text(expected, found) ? cost_value : impossible;
}

using Found = std::span<const Item* const>;
using Printed = std::span<const Expected* const>;

/** The cheapest alignment of some lines with some that a scenario prints, from where both begin. */
class Alignment
{
public:
    Alignment(Found found, Printed expected);

    bool agree(std::size_t i, std::size_t j) const;
    bool is_left_out(std::size_t i, std::size_t j) const;
    Departure departure(std::size_t i, std::size_t j) const;
    /** How many lines of both sides a departure takes. */
    static std::pair<std::size_t, std::size_t> taken_by(const Departure& departure);

private:
    Cost& at(std::size_t i, std::size_t j) { return m_cost[i * (m_expected.size() + 1) + j]; }
    Cost at(std::size_t i, std::size_t j) const { return m_cost[i * (m_expected.size() + 1) + j]; }
    Cost pair(std::size_t i, std::size_t j) const;
    bool comes_later(std::size_t i, std::size_t j) const;

    Found m_found;
    Printed m_expected;
    std::vector<Cost> m_cost; ///< of aligning what follows both
};

Alignment::Alignment(Found found, Printed expected)
    : m_found(found), m_expected(expected), m_cost((m_found.size() + 1) * (m_expected.size() + 1), 0)
{
    for (std::size_t i = m_found.size(); i-- > 0;)
    {
        const Cost extra = cost_of_extra(*m_found[i]);
        at(i, m_expected.size()) = at(i + 1, m_expected.size()) + extra;
        for (std::size_t j = m_expected.size(); j-- > 0;)
            at(i, j) = std::min({ pair(i, j), at(i, j + 1) + cost_missing, at(i + 1, j) + extra });
    }
}

bool Alignment::agree(std::size_t i, std::size_t j) const
{
    return j < m_expected.size() && same(m_expected[j]->item, *m_found[i]) && at(i, j) == at(i + 1, j + 1);
}

/** Whether too little is left of a line to tell. */
bool Alignment::is_left_out(std::size_t i, std::size_t j) const
{
    return is_cut(*m_found[i]) && at(i, j) == at(i + 1, j);
}

Cost Alignment::pair(std::size_t i, std::size_t j) const
{
    return at(i + 1, j + 1) + cost_of_pair(m_expected[j]->item, *m_found[i]);
}

std::vector<ValueDifference> differences(const Item& expected, const Item& found)
{
    std::vector<ValueDifference> all;
    const std::vector<std::string_view> names = split(expected.text->values);
    for (std::size_t i = 0; i < found.values.size(); ++i)
    {
        if (expected.values[i] == found.values[i])
            continue;
        const std::string_view name = names[i];
        const auto shown = [&](const std::string& printed) {
            const std::string words = value_words(name, printed);
            return words == printed ? printed : printed + " (" + words + ")";
        };
        all.push_back({ std::string(name), shown(expected.values[i]), shown(found.values[i]) });
    }
    return all;
}

/** Whether the scenario prints later what the log has here, and the log nowhere what the scenario prints here: then too
 *  much is missing for the alignment, not a line too many. */
bool Alignment::comes_later(std::size_t i, std::size_t j) const
{
    const auto is_found = [&](const Expected* one) { return same(one->item, *m_found[i]); };
    const auto is_expected = [&](const Item* one) { return same(m_expected[j]->item, *one); };
    const auto next_expected = m_expected.begin() + static_cast<std::ptrdiff_t>(j);
    const auto next_found = m_found.begin() + static_cast<std::ptrdiff_t>(i);
    return std::any_of(next_expected, m_expected.end(), is_found) &&
           std::none_of(next_found, m_found.end(), is_expected);
}

Departure Alignment::departure(std::size_t i, std::size_t j) const
{
    Departure found;
    found.found = *m_found[i];
    if (j >= m_expected.size())
    {
        found.kind = Departure::Kind::Extra;
        return found;
    }
    found.expected = *m_expected[j];
    const auto are_same = [&](std::size_t one, std::size_t other) {
        return one < m_found.size() && other < m_expected.size() && same(m_expected[other]->item, *m_found[one]);
    };
    const bool is_missing = at(i, j) == at(i, j + 1) + cost_missing;
    if (at(i, j) == pair(i, j))
    {
        found.kind = Departure::Kind::Value;
        found.values = differences(m_expected[j]->item, *m_found[i]);
    }
    else if (are_same(i, j + 1) && are_same(i + 1, j))
    {
        found.kind = Departure::Kind::Swapped;
    }
    else if (at(i, j) == at(i + 1, j + 1) + cost_missing + cost_of_extra(*m_found[i]))
    {
        found.kind = Departure::Kind::Different;
    }
    else
    {
        found.kind = is_missing || comes_later(i, j) ? Departure::Kind::Missing : Departure::Kind::Extra;
    }
    return found;
}

std::pair<std::size_t, std::size_t> Alignment::taken_by(const Departure& departure)
{
    switch (departure.kind)
    {
    case Departure::Kind::Missing: return { 0, 1 };
    case Departure::Kind::Extra: return { 1, 0 };
    case Departure::Kind::Swapped: return { 2, 2 };
    default: return { 1, 1 };
    }
}

/** Goes through both sides together, and aligns them where they part. */
class Walk
{
public:
    Walk(Found found, Printed expected) : m_found(found), m_expected(expected) {}
    Comparison go();

private:
    std::size_t begin() const;
    void agree();
    void align();
    void tell(Departure departure);
    std::size_t agreed() const { return m_said.agreeing + m_said.agreeing_behind; }

    Found m_found;
    Printed m_expected;
    std::size_t m_i = 0;
    std::size_t m_j = 0;
    Comparison m_said;
    Departure* m_last = nullptr;
    std::size_t m_agreed = 0; ///< lines, when it was told
};

/** Where the scenario is when the log begins: what its first lines fit best. */
std::size_t Walk::begin() const
{
    const Found first = m_found.first(std::min(m_found.size(), most_aligned));
    std::vector<Cost> below(m_expected.size() + 1, 0);
    std::vector<Cost> row(below.size());
    for (std::size_t i = first.size(); i-- > 0; std::swap(row, below))
    {
        const Cost extra = cost_of_extra(*first[i]);
        row.back() = below.back() + extra;
        for (std::size_t j = m_expected.size(); j-- > 0;)
            row[j] = std::min({ below[j + 1] + cost_of_pair(m_expected[j]->item, *first[i]), row[j + 1] + cost_missing,
                                below[j] + extra });
    }
    return static_cast<std::size_t>(std::min_element(below.begin(), below.end()) - below.begin());
}

Comparison Walk::go()
{
    m_j = begin();
    m_said.skipped = m_j;
    while (m_i < m_found.size() && m_said.is_whole)
    {
        const bool together =
            m_j < m_expected.size() && !is_cut(*m_found[m_i]) && same(m_expected[m_j]->item, *m_found[m_i]);
        if (together)
            agree();
        else
            align();
    }
    m_said.left = m_expected.size() - m_j;
    return std::move(m_said);
}

void Walk::agree()
{
    const Item& found = *m_found[m_i++];
    ++m_j;
    ++(m_said.departure ? m_said.agreeing_behind : m_said.agreeing);
    if (m_said.departure)
        return;
    m_said.first_line = m_said.first_line == 0 ? found.line : m_said.first_line;
    m_said.last_line = std::max(m_said.last_line, found.last_line);
}

/** Goes on until both go on together, or most of the lines that were aligned are done. */
void Walk::align()
{
    constexpr std::size_t enough = most_aligned - most_aligned / 4;
    const std::size_t i = m_i;
    const std::size_t j = m_j;
    const Found found = m_found.subspan(i, std::min(most_aligned, m_found.size() - i));
    const Printed expected = m_expected.subspan(j, std::min(most_aligned, m_expected.size() - j));
    const Alignment alignment(found, expected);
    for (std::size_t agreeing = 0; m_i - i < found.size() && agreeing < enough_agree && m_said.is_whole;)
    {
        const bool most_done = (m_i - i >= enough && i + found.size() < m_found.size()) ||
                               (m_j - j >= enough && j + expected.size() < m_expected.size());
        if (most_done)
            return;
        if (alignment.agree(m_i - i, m_j - j))
        {
            agree();
            ++agreeing;
        }
        else if (alignment.is_left_out(m_i - i, m_j - j))
        {
            ++m_i;
        }
        else
        {
            Departure departure = alignment.departure(m_i - i, m_j - j);
            const auto [lines, printed] = Alignment::taken_by(departure);
            m_i += lines;
            m_j += printed;
            agreeing = 0;
            tell(std::move(departure));
        }
    }
}

/** What goes on with the departure before is part of it. */
void Walk::tell(Departure departure)
{
    using Kind = Departure::Kind;
    const bool is_run = departure.kind == Kind::Missing || departure.kind == Kind::Extra;
    const bool goes_on = is_run && m_last != nullptr && m_last->kind == departure.kind && m_agreed == agreed();
    if (goes_on)
    {
        ++m_last->count;
        return;
    }
    m_agreed = agreed();
    if (!m_said.departure)
    {
        m_said.departure = std::move(departure);
        m_last = &*m_said.departure;
        return;
    }
    m_said.further.push_back(std::move(departure));
    m_last = &m_said.further.back();
    m_said.is_whole = m_said.further.size() + 1 < most_departures;
}

} // namespace

std::string operation_of(const Departure& departure)
{
    const Text* const text = departure.expected ? departure.expected->item.text : departure.found.text;
    if (departure.expected && has(text->operations, departure.expected->operation))
        return departure.expected->operation;
    return std::string(split(text->operations).front());
}

Comparison compare(const Log& log, const std::vector<Expected>& expected, int level)
{
    std::vector<const Expected*> printed;
    for (const Expected& one : expected)
    {
        if (one.item.text->level <= level && printed.size() < most_lines)
            printed.push_back(&one);
    }
    std::vector<const Item*> found;
    for (const std::size_t item : log.order)
    {
        if (log.items[item].text->level <= level && found.size() < most_lines)
            found.push_back(&log.items[item]);
    }
    Comparison comparison = Walk(found, printed).go();
    comparison.level = level;
    return comparison;
}

} // namespace pmxboard::decode
