// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/ops.h"

#include <algorithm>
#include <ostream>

#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/functions/contracts.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/prompt/about_operation.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

using board::Value;

/** Whether a name fits a pattern, in which * stands for anything. */
bool fits(std::string_view name, std::string_view pattern)
{
    const std::size_t star = pattern.find('*');
    if (star == pattern.npos)
        return name == pattern;
    if (!name.starts_with(pattern.substr(0, star)))
        return false;
    name.remove_prefix(star);
    pattern.remove_prefix(star + 1);
    for (std::size_t skipped = 0; skipped <= name.size(); ++skipped)
    {
        if (fits(name.substr(skipped), pattern))
            return true;
    }
    return false;
}

/** The contracts that the patterns ask for, in their order, none twice. Throws LineError. */
std::vector<const Contract*> chosen(const std::vector<std::string>& patterns)
{
    std::vector<const Contract*> found;
    for (const std::string& pattern : patterns)
    {
        bool any = false;
        for (const Contract& contract : contracts())
        {
            const bool wanted = fits(contract.name, pattern) &&
                                (pattern.find('*') == pattern.npos || find(operations(), contract.name) != nullptr);
            any = any || wanted;
            if (wanted && std::find(found.begin(), found.end(), &contract) == found.end())
                found.push_back(&contract);
        }
        std::vector<std::string_view> names;
        for (const Contract& contract : contracts())
            names.push_back(contract.name);
        if (!any)
            throw LineError("no operation " + pattern + did_you_mean(pattern, names));
    }
    return found;
}

/** Name and first sentence, one line each, under the headings of the header. */
std::string list_text(const std::vector<const Contract*>& listed, const Look& look)
{
    std::size_t longest = 0;
    for (const Contract* const contract : listed)
        longest = std::max(longest, contract->name.size());
    std::string text;
    std::string_view section;
    for (const Contract* const contract : listed)
    {
        if (contract->section != section)
            text += (text.empty() ? "" : "\n") + look.bold(contract->section) + "\n";
        section = contract->section;
        std::string line = "  " + std::string(contract->name);
        line.append(longest + 4 - line.size(), ' ').append(first_sentence(contract->brief));
        // Whoever searches through a pipe wants the line whole.
        text += is_on_screen() ? wrapped(line, look.width, 0, static_cast<unsigned>(longest + 4)) : line + "\n";
    }
    return text;
}

} // namespace

int show_operations(const OpsOptions& options, std::ostream& to)
{
    const Look look{ text_width(), wants_colour(options.colour) };
    std::vector<const Contract*> listed;
    try
    {
        listed = chosen(options.names.empty() ? std::vector<std::string>{ "*" } : options.names);
    }
    catch (const LineError& error)
    {
        return usage_error(error.what());
    }
    const bool is_list =
        options.names.empty() || std::any_of(options.names.begin(), options.names.end(),
                                             [](const auto& name) { return name.find('*') != name.npos; });
    if (options.json)
    {
        std::vector<Value> list;
        for (const Contract* const contract : listed)
            list.push_back(json_of(*contract, find(operations(), contract->name)));
        to << Value::list(std::move(list)).to_json(2) << '\n';
    }
    else if (is_list)
        to << list_text(listed, look);
    else
    {
        for (std::size_t i = 0; i < listed.size(); ++i)
        {
            const Operation* const operation = find(operations(), listed[i]->name);
            to << (i == 0 ? "" : "\n")
               << (operation != nullptr ? operation_text(*operation, look) : platform_text(listed[i]->name, look));
        }
    }
    return exit_done;
}

} // namespace pmxboard
