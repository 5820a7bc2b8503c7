// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Candidates for paths into board and layer, for what stands there, and for outputs.
#include <algorithm>

#include "board/board.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/prompt/completion_values.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/paths.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{

using board::Value;
using board::names::Family;

namespace
{

/** The next step below a value, along what has been written; `path` leads to the value. */
void collect_steps(const Value& value, const std::string& path, std::string_view begun, Candidates& into)
{
    const bool is_list = value.kind() == Value::Kind::List;
    for (std::size_t i = 0; i < value.items().size(); ++i)
    {
        const Value& item = value.items()[i];
        const std::string step = is_list ? "[" + std::to_string(i) + "]" : (path.empty() ? "" : ".") + value.keys()[i];
        const std::string here = path + step;
        const bool goes_on = !item.items().empty();
        const char* const onwards = !goes_on || is_list ? "" : item.kind() == Value::Kind::List ? "[" : ".";
        if (here.starts_with(begun))
            into.push_back(here + onwards);
        // An item of a list is whole, and yet its members may follow.
        if (goes_on && begun.starts_with(here) && (begun.size() > here.size() || is_list))
            collect_steps(item, here, begun, into);
    }
}

/** Candidates for a path, which begin as the user has written it. */
template <typename Collect>
Candidates steps_of(std::string_view begun, const Collect& collect)
{
    const std::string path = plain_path(std::string(begun));
    Candidates candidates;
    collect(path, candidates);
    for (std::string& candidate : candidates)
    {
        if (candidate.starts_with(path))
            candidate.replace(0, path.size(), begun);
    }
    return candidates;
}

void collect_fields(std::string_view begun, Candidates& candidates)
{
    const Value layer = record_view::state();
    collect_steps(*layer.find("record"), "", begun, candidates);
    collect_steps(*layer.find("module"), "", begun, candidates);
    if (begun.starts_with("status") || begun.starts_with("record") || begun.starts_with("module"))
        collect_steps(layer, "", begun, candidates);
}

} // namespace

Candidates path_candidates(std::string_view begun)
{
    return steps_of(begun, [](const std::string& path, Candidates& into) {
        collect_steps(whole_state(), "", path, into);
        collect_fields(path, into);
    });
}

Candidates field_candidates(std::string_view begun)
{
    return steps_of(begun, [](const std::string& path, Candidates& into) { collect_fields(path, into); });
}

Candidates field_value_names(const std::string& path)
{
    try
    {
        const record_view::FieldType type = record_view::type_of(path);
        return number_names(board::names::family_of(type.record, type.member), type.member);
    }
    catch (const record_view::FieldError&)
    {
        // The board's state: what stands there now has a name, or none is known.
        const Value all = board::state();
        const Value* const found = all.find(path);
        if (found == nullptr)
            return {};
        const std::string leaf = path.substr(path.find_last_of(".]") + 1);
        Candidates names = leaf == "mode" || leaf.ends_with("_mode") ? number_names(Family::ResolutionMode, leaf)
                           : leaf == "tv_type"                       ? number_names(Family::TvType, leaf)
                           : found->string().empty()                 ? Candidates{}
                                                                     : Candidates{ found->string() };
        if (found->kind() == Value::Kind::Null)
            names.emplace_back("null");
        return names;
    }
}

Candidates output_names()
{
    Candidates names;
    for (const auto* const table : { &operations(), &ipmx_slots() })
    {
        for (const Operation& operation : *table)
        {
            for (const Parameter& parameter : operation.parameters)
            {
                if (parameter.is_output)
                    names.push_back(parameter.name);
            }
        }
    }
    std::sort(names.begin(), names.end());
    return names;
}

Candidates output_value_names(const std::string& output)
{
    Candidates candidates = { "untouched" };
    for (const Operation& operation : operations())
    {
        for (const Parameter& parameter : operation.parameters)
        {
            if (!parameter.is_output || parameter.name != output)
                continue;
            const Candidates names = number_names(parameter.kind.family, parameter.name);
            candidates.insert(candidates.end(), names.begin(), names.end());
            return candidates;
        }
    }
    return candidates;
}

} // namespace pmxboard
