// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/prompt/completion_values.h"

#include <algorithm>

#include "board/board.h"
#include "board/sources.h"
#include "tools/pmxboard/functions/contracts.h"
#include "tools/pmxboard/prompt/help.h"

namespace pmxboard
{
namespace
{

using board::Value;
using board::names::Family;

/** Whether the name of an argument or field says that it is yes or no: fgEnable, bSetTVE. */
bool is_boolean(std::string_view name)
{
    const auto upper_at = [&](std::size_t i) { return name.size() > i && name[i] >= 'A' && name[i] <= 'Z'; };
    return (name.starts_with("fg") && upper_at(2)) || (name.starts_with("b") && upper_at(1) && name != "bResIndex");
}

/** The kind and name of what is written where a partly written value ends. */
struct Open
{
    const Kind* kind;
    std::string name;
    std::size_t index = 0; ///< of the item that is being written
};

const Kind* kind_of_item(const Open& open, std::string& name)
{
    if (open.kind == nullptr)
        return nullptr;
    if (open.kind->form == Kind::Form::List && open.index < open.kind->count)
        return &open.kind->members[0];
    if (open.kind->form != Kind::Form::Record || open.index >= open.kind->members.size())
        return nullptr;
    name = open.kind->names[open.index];
    return &open.kind->members[open.index];
}

/** A place that holds a value of its own: all that may be written there. */
Candidates for_kind(const Kind* kind, const std::string& name, bool may_be_null)
{
    if (kind == nullptr)
        return {};
    Candidates candidates;
    if (kind->form == Kind::Form::Number)
        candidates = number_names(kind->family, name);
    if (kind->form == Kind::Form::List)
        candidates = { "[" };
    if (kind->form == Kind::Form::Record)
        candidates = { "{", "[" };
    if (may_be_null)
        candidates.emplace_back("null");
    return candidates;
}

std::string path_to(const Parameter& parameter, const std::vector<Open>& opened)
{
    std::string path = parameter.name;
    for (const Open& open : opened)
    {
        if (open.kind == nullptr)
            break;
        if (open.kind->form == Kind::Form::List)
            path += "[" + std::to_string(open.index) + "]";
        else if (open.index < open.kind->names.size())
            path += "." + open.kind->names[open.index];
    }
    return path;
}

std::string what_is(const Kind* kind)
{
    if (kind == nullptr)
        return "there is no more of it";
    if (kind->form == Kind::Form::Text)
        return "a text in quotes";
    if (kind->form == Kind::Form::List)
        return "a list of " + std::to_string(kind->count);
    if (kind->form == Kind::Form::Record)
        return "a record";
    for (const auto& [family, title] : board::names::families())
    {
        if (family == kind->family)
            return "one of the " + std::string(title);
    }
    return "a number of " + std::to_string(kind->bits) + " bits";
}

} // namespace

Candidates number_names(Family family, std::string_view name)
{
    if (name == "ucPmxId")
        return { "0" };
    const auto names = names_in(family);
    Candidates candidates(names.begin(), names.end());
    if (candidates.empty() && is_boolean(name))
        candidates = { "TRUE", "FALSE" };
    return candidates;
}

ValuePart value_candidates(const Parameter& parameter, std::string_view word)
{
    std::vector<Open> open;
    const Kind* kind = &parameter.kind;
    std::string name = parameter.name;
    std::size_t begin = 0;
    bool is_named = false; // the field's name stands before the value
    for (std::size_t i = 0; i < word.size(); ++i)
    {
        const char c = word[i];
        if (c == '[' || c == '{')
            open.push_back({ kind, name });
        else if (c == ',' && !open.empty())
            ++open.back().index;
        else if ((c == ']' || c == '}') && !open.empty())
            open.pop_back();
        else if (c == '=' && !open.empty() && open.back().kind != nullptr)
        {
            const auto& names = open.back().kind->names;
            const auto found = std::find(names.begin(), names.end(), word.substr(begin, i - begin));
            open.back().index = static_cast<std::size_t>(found - names.begin());
        }
        else if (c != ' ')
            continue;
        begin = i + 1;
        is_named = c == '=' || (is_named && c == ' ');
        if (!open.empty())
            kind = kind_of_item(open.back(), name);
    }
    ValuePart part{ begin, for_kind(kind, name, open.empty() && parameter.may_be_null),
                    path_to(parameter, open) + ": " + what_is(kind) };
    if (!open.empty() && open.back().kind != nullptr && !is_named && open.back().kind->form == Kind::Form::Record)
    {
        for (const std::string& field : open.back().kind->names)
            part.candidates.push_back(field + "=");
    }
    return part;
}

Candidates platform_names()
{
    Candidates names;
    for (const auto& function : board::platform_functions())
        names.emplace_back(function.name);
    return names;
}

Candidates faultable_names()
{
    Candidates names;
    for (const auto& function : board::platform_functions())
    {
        if (function.has_result)
            names.emplace_back(function.name);
    }
    return names;
}

Candidates settable_outputs(std::string_view function)
{
    Candidates names;
    for (const auto& known : board::platform_functions())
    {
        for (const auto& parameter : known.parameters)
        {
            if (known.name == function && parameter.check != nullptr)
                names.push_back(std::string(parameter.name) + "=");
        }
    }
    return names;
}

Candidates neighbour_names()
{
    const auto names = names_of(neighbours());
    return { names.begin(), names.end() };
}

Candidates board_names()
{
    return board::boards_by_name();
}

Candidates partition_names()
{
    Candidates names = { "fast_init_param" };
    const Value state = board::state();
    if (const Value* const partitions = state.find("flash.partitions"))
    {
        for (const Value& partition : partitions->items())
        {
            if (const Value* const name = partition.find("name"))
                names.push_back(name->string());
        }
        names.insert(names.end(), partitions->keys().begin(), partitions->keys().end());
    }
    return names;
}

Candidates source_names(std::string_view beginning)
{
    Candidates names;
    for (const std::string_view name : board::sources::names())
    {
        if (name.starts_with(beginning))
            names.emplace_back(name);
    }
    return names;
}

Candidates file_candidates(const std::filesystem::path& directory, std::string_view begun)
{
    const std::size_t slash = begun.rfind('/');
    const std::string lead(slash == begun.npos ? std::string_view() : begun.substr(0, slash + 1));
    Candidates names;
    std::error_code error;
    for (const auto& entry : std::filesystem::directory_iterator(directory / lead, error))
    {
        const std::string name = entry.path().filename().string();
        const bool is_hidden = name.starts_with('.') && !begun.substr(lead.size()).starts_with('.');
        // A name with a blank cannot be written in a line.
        if (!is_hidden && name.find_first_of(" #\"[](){}") == name.npos)
            names.push_back(lead + name + (entry.is_directory(error) ? "/" : ""));
    }
    std::sort(names.begin(), names.end());
    return names;
}

Candidates names_and_general(Family family)
{
    const auto names = names_in(family);
    Candidates candidates(names.begin(), names.end());
    for (const std::string_view name : board::names::all())
    {
        if (general_constant(name))
            candidates.emplace_back(name);
    }
    return candidates;
}

Candidates platform_argument_names(std::string_view function, std::size_t index)
{
    const Contract* const contract = contract_of(function);
    if (contract == nullptr || index >= contract->parameters.size())
        return {};
    const std::string_view name = contract->parameters[index].name;
    return number_names(board::names::family_of(function, name), name);
}

} // namespace pmxboard
