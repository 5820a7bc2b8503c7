// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/names.h"

#include <algorithm>
#include <tuple>

#include "board/name_table.h"

namespace board::names
{

std::string_view name_of(Family family, std::int64_t number)
{
    if (family == Family::None)
        return {};
    for (const Row& row : rows())
    {
        if (row.family == family && row.number == number)
            return row.name;
    }
    return {};
}

std::optional<std::int64_t> number_of(std::string_view name)
{
    for (const Row& row : rows())
    {
        if (row.name == name)
            return row.number;
    }
    return std::nullopt;
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
