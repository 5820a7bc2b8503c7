// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/state/paths.h"

#include <string_view>

#include "board/names.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/text/layout.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

using board::Value;

/** As many as a state of the board has, many times over; a stranger's may have more. */
void collect_paths(const Value& value, const std::string& path, std::vector<std::string>& into)
{
    constexpr std::size_t most = 20'000;
    if (into.size() == most)
        return;
    if (!path.empty())
        into.push_back(path);
    for (std::size_t i = 0; i < value.items().size(); ++i)
    {
        const std::string step = value.kind() == Value::Kind::List ? item_step(i)
                                 : path.empty()                    ? value.keys()[i]
                                                                   : "." + value.keys()[i];
        collect_paths(value.items()[i], path + step, into);
    }
}

/** A value as an indented tree, members that fit into a line on one. */
std::string tree(const board::Value& value, std::size_t indent)
{
    std::string text;
    const bool is_list = value.kind() == board::Value::Kind::List;
    for (std::size_t i = 0; i < value.items().size(); ++i)
    {
        const board::Value& member = value.items()[i];
        const std::string head = std::string(indent, ' ') + (is_list ? item_step(i) : value.keys()[i]);
        const std::string line = head + " = " + member.to_text();
        if (member.items().empty() || line.size() <= text_width())
            text += line + "\n";
        else
            text += head + "\n" + tree(member, indent + 2);
    }
    return text;
}

/** For a path that begins as a member of the state does: what that has. */
std::string members_like(const Value& state, std::string_view path)
{
    const std::string_view first = path.substr(0, path.find_first_of(".["));
    for (std::size_t i = 0; i < state.keys().size() && !first.empty(); ++i)
    {
        if (!state.keys()[i].starts_with(first) || state.items()[i].keys().empty())
            continue;
        std::string text;
        for (const std::string& key : state.items()[i].keys())
            text += (text.empty() ? "; " + state.keys()[i] + " has " : ", ") + key;
        return text;
    }
    return {};
}

} // namespace

std::string item_step(std::size_t index)
{
    return std::string("[").append(std::to_string(index)).append("]");
}

std::string plain_path(std::string path)
{
    for (std::size_t open = path.find('['); open != path.npos; open = path.find('[', open + 1))
    {
        const std::size_t close = path.find(']', open);
        if (close == path.npos)
            break;
        const std::string name = path.substr(open + 1, close - open - 1);
        if (const auto number = board::names::number_of(name))
            path.replace(open + 1, name.size(), std::to_string(*number));
    }
    return path;
}

Value part_of(const Value& state, const std::string& written)
{
    const std::string path = plain_path(written);
    if (const Value* const found = path.empty() ? nullptr : state.find(path))
        return *found;
    for (const std::string_view group : layer_groups)
    {
        if (const Value* const found = path.empty() ? nullptr : state.find(std::string(group) + "." + path))
            return *found;
    }
    std::vector<std::string> paths;
    collect_paths(state, {}, paths);
    for (const std::string_view group : layer_groups)
    {
        if (const Value* const members = state.find(group))
            collect_paths(*members, {}, paths);
    }
    const std::string near = did_you_mean(path, { paths.begin(), paths.end() });
    throw LineError("no state " + written + (near.empty() ? members_like(state, path) : near));
}

std::string to_text(const NamedValues& values)
{
    std::string text;
    for (const auto& [path, value] : values)
    {
        const bool is_tree = !value.items().empty();
        const bool is_alone = values.size() == 1;
        if (!is_tree)
            text += "  " + (path.empty() ? "" : path + " = ") + value.to_text() + "\n";
        else
            text += (is_alone ? "" : "  " + path + "\n") + tree(value, is_alone ? 2 : 4);
    }
    return text;
}

} // namespace pmxboard
