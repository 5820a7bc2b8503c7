// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <algorithm>
#include <numeric>

#include "board/names.h"

namespace board::names
{
namespace
{

/** Names are of ASCII; the library's function asks for a locale at every letter. */
char lower(char letter)
{
    return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
}

bool same_letter(char a, char b)
{
    return lower(a) == lower(b);
}

/** Whether somebody stopped typing early. */
bool begins_with(std::string_view candidate, std::string_view beginning)
{
    return beginning.size() >= 3 && candidate.size() >= beginning.size() &&
           std::equal(beginning.begin(), beginning.end(), candidate.begin(), same_letter);
}

/** Number of letters to insert, delete, replace or exchange with their neighbour; case does not count. More than `most`
 *  are not counted to the end: it never gets less from row to row. */
std::size_t distance(std::string_view a, std::string_view b, std::size_t most)
{
    std::vector<std::size_t> before(b.size() + 1), above(b.size() + 1), row(b.size() + 1);
    std::iota(above.begin(), above.end(), std::size_t{ 0 });
    for (std::size_t i = 1; i <= a.size(); ++i)
    {
        row[0] = i;
        std::size_t least = i;
        for (std::size_t j = 1; j <= b.size(); ++j)
        {
            const bool same = same_letter(a[i - 1], b[j - 1]);
            row[j] = std::min(std::min(above[j], row[j - 1]) + 1, above[j - 1] + (same ? 0 : 1));
            if (i > 1 && j > 1 && same_letter(a[i - 1], b[j - 2]) && same_letter(a[i - 2], b[j - 1]))
                row[j] = std::min(row[j], before[j - 2] + 1);
            least = std::min(least, row[j]);
        }
        if (least > most)
            return least;
        before.swap(above);
        above.swap(row);
    }
    return above[b.size()];
}

} // namespace

std::vector<std::string> nearest(std::string_view wrong, const std::vector<std::string_view>& candidates,
                                 std::size_t count)
{
    std::vector<std::pair<std::size_t, std::string_view>> near;
    constexpr std::size_t longest = 200; // nobody means a name by more
    if (wrong.size() > longest)
        return {};
    const std::size_t most = std::max<std::size_t>(2, wrong.size() / 3);
    for (const std::string_view candidate : candidates)
    {
        const bool is_begun = begins_with(candidate, wrong);
        const std::size_t difference =
            std::max(candidate.size(), wrong.size()) - std::min(candidate.size(), wrong.size());
        if (!is_begun && difference > most)
            continue;
        const std::size_t changes = is_begun ? 0 : distance(wrong, candidate, most);
        if (changes <= most && changes < candidate.size())
            near.emplace_back(changes, candidate);
    }
    std::sort(near.begin(), near.end());
    near.erase(std::unique(near.begin(), near.end()), near.end());
    std::vector<std::string> names;
    for (const auto& [changes, candidate] : near)
    {
        // What is much further off than the best one only distracts.
        if (names.size() < count && changes <= near.front().first + 1)
            names.emplace_back(candidate);
    }
    return names;
}

} // namespace board::names
