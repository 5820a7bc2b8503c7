// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/state/paths.h"

#include <algorithm>
#include <string_view>
#include <utility>

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

/** What a board file calls otherwise than the state does. */
constexpr std::pair<std::string_view, std::string_view> keys_of_boards[] = {
    { "hdmi.plugged", "hdmi_av.sink_plugged" },    { "hdmi.request_resolution", "hdmi_av.resolution_requested" },
    { "hdmi.valid", "hdmi_av.chosen_resolution" }, { "hdmi.modes", "hdmi_av.sink_modes" },
    { "mixer.capability", "record.u4Capability" },
};

/** The state that a board file's key is about, whether the device is called as there or as in the state. */
std::string meant_by_key(std::string_view path)
{
    const std::string_view device = path.substr(0, path.find('.'));
    const std::string_view rest = path.substr(device.size());
    for (const auto& [key, state] : keys_of_boards)
    {
        const std::string_view key_device = key.substr(0, key.find('.'));
        if (device.starts_with(key_device) && rest == key.substr(key_device.size()))
            return "; did you mean " + std::string(state) + "?";
    }
    return {};
}

std::string_view last_step(std::string_view path)
{
    return path.substr(path.find_last_of('.') + 1);
}

/** The shortest paths that end with what was written, or with a name that holds it. */
std::string paths_that_end_so(std::string_view path, const std::vector<std::string>& paths)
{
    constexpr std::size_t least = 3;
    constexpr std::size_t most = 3;
    std::vector<std::string_view> found;
    for (const std::string& other : paths)
    {
        const bool is_end = other.ends_with("." + std::string(path));
        const bool holds = path.find('.') == path.npos && last_step(other).find(path) != other.npos;
        if (path.size() >= least && (is_end || holds))
            found.push_back(other);
    }
    std::stable_sort(found.begin(), found.end(),
                     [](std::string_view one, std::string_view other) { return one.size() < other.size(); });
    std::string text;
    for (std::size_t i = 0; i < std::min(found.size(), most); ++i)
        text.append(text.empty() ? "; did you mean " : ", ").append(found[i]);
    return text.empty() ? text : text + "?";
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
    std::string near = meant_by_key(path);
    if (near.empty())
        near = did_you_mean(path, { paths.begin(), paths.end() });
    if (near.empty())
        near = paths_that_end_so(path, paths);
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
