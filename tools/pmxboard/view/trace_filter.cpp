// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/trace_filter.h"

#include <algorithm>
#include <map>
#include <string_view>

#include "tools/pmxboard/functions/operation.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

/** Stands among the beginnings for the stores. */
constexpr std::string_view stores_name = "SET";

/** Everything that an entry may say caused it. */
std::vector<std::string_view> operation_names()
{
    std::vector<std::string_view> names = names_of(operations());
    for (const std::string_view slot : names_of(ipmx_slots()))
        names.push_back(slot);
    return names;
}

std::vector<std::string_view> names_of_platform()
{
    std::vector<std::string_view> names;
    for (const board::PlatformFunction& function : board::platform_functions())
        names.push_back(function.name);
    return names;
}

/** Compared with names cut to the same length: a whole name is never near to "TEV_". */
std::string nearest_beginnings(std::string_view beginning, const std::vector<std::string_view>& names)
{
    std::vector<std::string_view> beginnings;
    for (const std::string_view name : names)
    {
        const std::string_view cut = name.substr(0, beginning.size());
        if (std::find(beginnings.begin(), beginnings.end(), cut) == beginnings.end())
            beginnings.push_back(cut);
    }
    return did_you_mean(beginning, beginnings);
}

/** "TVE_", "VDP_": what several names begin with, up to their first underscore. */
std::string usual_beginnings(const std::vector<std::string_view>& names)
{
    std::map<std::string_view, unsigned> counts;
    for (const std::string_view name : names)
    {
        if (const std::size_t end = name.find('_', 1); end != name.npos && end > 1)
            ++counts[name.substr(0, end + 1)];
    }
    constexpr unsigned several = 3;
    std::string text;
    for (const auto& [beginning, count] : counts)
    {
        if (count > several)
            text.append(text.empty() ? "" : ", ").append(beginning);
    }
    return "; many begin with " + text;
}

bool is_so_called(const board::TraceEntry& entry, const std::string& beginning)
{
    switch (entry.kind)
    {
    case board::TraceEntry::Kind::Notice: return false;
    case board::TraceEntry::Kind::Store: return beginning == stores_name;
    default: return entry.function.starts_with(beginning);
    }
}

} // namespace

bool TraceFilter::shows(const board::TraceEntry& entry) const
{
    const bool of_these =
        operations.empty() || std::find(operations.begin(), operations.end(), entry.operation) != operations.end();
    const bool so_called = only.empty() || std::any_of(only.begin(), only.end(), [&](const std::string& beginning) {
                               return is_so_called(entry, beginning);
                           });
    return of_these && so_called;
}

std::string TraceFilter::complaint() const
{
    const auto functions = names_of_platform();
    for (const std::string& beginning : only)
    {
        if (beginning == stores_name)
            continue;
        const bool is_known = !beginning.empty() && std::any_of(functions.begin(), functions.end(),
                                                                [&](auto name) { return name.starts_with(beginning); });
        if (!is_known)
        {
            constexpr std::size_t telling = 4; // every three letters are near to some others
            return "no platform function begins with \"" + beginning + "\"" +
                   (beginning.empty()            ? std::string()
                    : beginning.size() < telling ? usual_beginnings(functions)
                                                 : nearest_beginnings(beginning, functions));
        }
    }
    const auto known = operation_names();
    for (const std::string& name : operations)
    {
        if (std::find(known.begin(), known.end(), name) == known.end())
            return "no operation " + name + did_you_mean(name, known);
    }
    return {};
}

} // namespace pmxboard
