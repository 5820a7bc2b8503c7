// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/names.h"

#include <algorithm>
#include <array>
#include <tuple>
#include <unordered_map>

#include "board/name_table.h"

namespace board::names
{

namespace
{

/** The rows of one family: every number that is traced is looked up among them. */
struct Rows
{
    const Row* first = nullptr;
    const Row* end = nullptr;
};

Rows rows_of(Family family)
{
    static const auto all = [] {
        std::array<Rows, static_cast<std::size_t>(Family::ClosedCaption) + 1> found;
        for (const Row& row : rows())
        {
            Rows& of_family = found.at(static_cast<std::size_t>(row.family));
            of_family.first = of_family.first == nullptr ? &row : of_family.first;
            of_family.end = &row + 1;
        }
        return found;
    }();
    return all[static_cast<std::size_t>(family)];
}

} // namespace

std::string_view name_of(Family family, std::int64_t number)
{
    if (family == Family::None)
        return {};
    const Rows of_family = rows_of(family);
    for (const Row* row = of_family.first; row != of_family.end; ++row)
    {
        if (row->number == number)
            return row->name;
    }
    return {};
}

std::optional<std::int64_t> number_of(std::string_view name)
{
    static const auto numbers = [] {
        std::unordered_map<std::string_view, std::int64_t> found;
        for (const Row& row : rows())
            found.emplace(row.name, row.number);
        return found;
    }();
    const auto found = numbers.find(name);
    return found != numbers.end() ? std::optional(found->second) : std::nullopt;
}

Family family_of(std::string_view owner, std::string_view argument)
{
    const auto all_uses = uses();
    const auto wanted = std::tie(owner, argument);
    const auto found = std::lower_bound(all_uses.begin(), all_uses.end(), wanted, [](const Use& use, const auto& key) {
        return std::tie(use.owner, use.argument) < key;
    });
    return found != all_uses.end() && std::tie(found->owner, found->argument) == wanted ? found->family : Family::None;
}

const std::vector<std::string_view>& all()
{
    static const std::vector<std::string_view> names = [] {
        std::vector<std::string_view> collected;
        for (const Row& row : rows())
            collected.push_back(row.name);
        return collected;
    }();
    return names;
}

} // namespace board::names
