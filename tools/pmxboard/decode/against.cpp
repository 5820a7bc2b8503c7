// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/against.h"

#include <algorithm>
#include <cstdint>

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

// Enough for any scenario; what stands behind in a longer log is not needed to find the first departure.
constexpr std::size_t most_lines = 3000;
constexpr std::size_t lines_beyond = 64;

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
    if (expected.text->level == level_assertion) // its line number changes when code moves
        return expected.values.empty() || found.values.empty() || expected.values.front() == found.values.front();
    return expected.values == found.values;
}

/** The cheapest alignment of a log with a part of what a scenario prints. */
class Alignment
{
public:
    Alignment(std::vector<const Item*> found, std::vector<const Expected*> expected);
    Comparison walk() const;

private:
    Cost& at(std::size_t i, std::size_t j) { return m_cost[i * (m_expected.size() + 1) + j]; }
    Cost at(std::size_t i, std::size_t j) const { return m_cost[i * (m_expected.size() + 1) + j]; }
    Cost pair(std::size_t i, std::size_t j) const;
    Cost extra(std::size_t i) const { return is_cut(*m_found[i]) ? 0 : cost_extra; }
    bool comes_later(std::size_t i, std::size_t j) const;
    Departure departure(std::size_t i, std::size_t j) const;

    static constexpr Cost impossible = 1u << 30;
    std::vector<const Item*> m_found;
    std::vector<const Expected*> m_expected;
    std::vector<Cost> m_cost; ///< of aligning what follows both
};

Alignment::Alignment(std::vector<const Item*> found, std::vector<const Expected*> expected)
    : m_found(std::move(found)), m_expected(std::move(expected)),
      m_cost((m_found.size() + 1) * (m_expected.size() + 1), 0)
{
    for (std::size_t i = m_found.size(); i-- > 0;)
    {
        at(i, m_expected.size()) = at(i + 1, m_expected.size()) + extra(i);
        for (std::size_t j = m_expected.size(); j-- > 0;)
            at(i, j) = std::min({ pair(i, j), at(i, j + 1) + cost_missing, at(i + 1, j) + extra(i) });
    }
}

Cost Alignment::pair(std::size_t i, std::size_t j) const
{
    const Item& expected = m_expected[j]->item;
    if (same(expected, *m_found[i]))
        return at(i + 1, j + 1);
    return same_text(expected, *m_found[i]) ? at(i + 1, j + 1) + cost_value : impossible;
}

std::vector<ValueDifference> differences(const Item& expected, const Item& found)
{
    std::vector<ValueDifference> all;
    const std::vector<std::string_view> names = split(expected.text->values);
    for (std::size_t i = 0; i < expected.values.size() && i < found.values.size(); ++i)
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
    if (i >= m_found.size())
        return true;
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
    if (i < m_found.size())
        found.found = *m_found[i];
    if (j >= m_expected.size())
    {
        found.kind = Departure::Kind::Extra;
        return found;
    }
    found.expected = *m_expected[j];
    const auto agree = [&](std::size_t one, std::size_t other) {
        return one < m_found.size() && other < m_expected.size() && same(m_expected[other]->item, *m_found[one]);
    };
    const bool is_missing = at(i, j) == at(i, j + 1) + cost_missing;
    const bool is_extra = at(i, j) == at(i + 1, j) + extra(i);
    if (at(i, j) == pair(i, j))
    {
        found.kind = Departure::Kind::Value;
        found.values = differences(m_expected[j]->item, *m_found[i]);
    }
    else if (agree(i, j + 1) && agree(i + 1, j))
    {
        found.kind = Departure::Kind::Swapped;
    }
    else if ((is_missing && at(i, j + 1) == at(i + 1, j + 1) + extra(i)) ||
             (is_extra && at(i + 1, j) == at(i + 1, j + 1) + cost_missing))
    {
        found.kind = Departure::Kind::Different;
    }
    else
    {
        found.kind = is_missing || comes_later(i, j) ? Departure::Kind::Missing : Departure::Kind::Extra;
    }
    return found;
}

Comparison Alignment::walk() const
{
    Comparison comparison;
    std::size_t j = 0; // the log may begin anywhere
    for (std::size_t other = 1; other <= m_expected.size(); ++other)
    {
        if (at(0, other) < at(0, j))
            j = other;
    }
    comparison.skipped = j;
    for (std::size_t i = 0; i < m_found.size(); ++i)
    {
        const bool paired = j < m_expected.size() && same(m_expected[j]->item, *m_found[i]) && at(i, j) == pair(i, j);
        if (!paired && is_cut(*m_found[i]) && at(i, j) == at(i + 1, j))
            continue; // too little is left of it to tell
        if (!paired)
        {
            comparison.departure = departure(i, j);
            return comparison;
        }
        ++j;
        ++comparison.agreeing;
        comparison.first_line = comparison.first_line == 0 ? m_found[i]->line : comparison.first_line;
        comparison.last_line = m_found[i]->last_line;
    }
    comparison.left = m_expected.size() - j;
    return comparison;
}

} // namespace

std::string operation_of(const Departure& departure)
{
    const Text* const text = departure.expected ? departure.expected->item.text : departure.found->text;
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
    for (const Item& item : log.items)
    {
        if (item.text->level <= level && found.size() < printed.size() + lines_beyond)
            found.push_back(&item);
    }
    Comparison comparison = Alignment(std::move(found), std::move(printed)).walk();
    comparison.level = level;
    return comparison;
}

} // namespace pmxboard::decode
