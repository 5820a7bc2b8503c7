// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/state/diff.h"

#include <algorithm>
#include <string_view>

#include "tools/pmxboard/state/paths.h"
#include "tools/pmxboard/text/layout.h"

namespace pmxboard
{
namespace
{

using board::Value;

std::string joined(const std::string& path, const std::string& key)
{
    return path.empty() ? key : path + "." + key;
}

void compare(const std::string& path, const Value& older, const Value& newer, std::vector<Change>& found);

void compare_records(const std::string& path, const Value& older, const Value& newer, std::vector<Change>& found)
{
    const auto& keys = newer.keys();
    for (std::size_t i = 0; i < older.keys().size(); ++i)
    {
        const std::string& key = older.keys()[i];
        const auto same = std::find(keys.begin(), keys.end(), key);
        if (same == keys.end())
            found.push_back({ joined(path, key), older.items()[i], std::nullopt });
        else
            compare(joined(path, key), older.items()[i], newer.items()[static_cast<std::size_t>(same - keys.begin())],
                    found);
    }
    for (std::size_t i = 0; i < keys.size(); ++i)
    {
        if (std::find(older.keys().begin(), older.keys().end(), keys[i]) == older.keys().end())
            found.push_back({ joined(path, keys[i]), std::nullopt, newer.items()[i] });
    }
}

void compare_lists(const std::string& path, const Value& older, const Value& newer, std::vector<Change>& found)
{
    const std::size_t longer = std::max(older.items().size(), newer.items().size());
    for (std::size_t i = 0; i < longer; ++i)
    {
        const std::string item = path + item_step(i);
        if (i >= newer.items().size())
            found.push_back({ item, older.items()[i], std::nullopt });
        else if (i >= older.items().size())
            found.push_back({ item, std::nullopt, newer.items()[i] });
        else
            compare(item, older.items()[i], newer.items()[i], found);
    }
}

void compare(const std::string& path, const Value& older, const Value& newer, std::vector<Change>& found)
{
    if (older == newer)
        return;
    if (older.kind() == newer.kind() && older.kind() == Value::Kind::Record)
        compare_records(path, older, newer, found);
    else if (older.kind() == newer.kind() && older.kind() == Value::Kind::List)
        compare_lists(path, older, newer, found);
    else
        found.push_back({ path, older, newer });
}

bool is_of_layer(const std::string& path)
{
    return std::any_of(std::begin(layer_groups), std::end(layer_groups), [&](std::string_view group) {
        return path.starts_with(group) && path.substr(group.size()).starts_with('.');
    });
}

bool is_at(const std::string& path, std::string_view wanted)
{
    const auto below = [&](std::string_view part) {
        return part.starts_with(wanted) &&
               (part.size() == wanted.size() || part[wanted.size()] == '.' || part[wanted.size()] == '[');
    };
    return below(path) || (is_of_layer(path) && below(std::string_view(path).substr(path.find('.') + 1)));
}

std::string text_of(const std::optional<Value>& value)
{
    return value ? value->to_text() : "(nothing)";
}

} // namespace

bool is_counter(const std::string& path)
{
    const std::string last = path.substr(path.find_last_of('.') + 1);
    return last == "now_us" || last == "reads" || last == "writes";
}

std::vector<Change> changes(const Value& older, const Value& newer)
{
    std::vector<Change> found;
    compare({}, older, newer, found);
    const auto rank = [](const Change& change) {
        return is_counter(change.path) ? 2 : is_of_layer(change.path) ? 0 : 1;
    };
    std::stable_sort(found.begin(), found.end(),
                     [&](const Change& one, const Change& other) { return rank(one) < rank(other); });
    return found;
}

std::vector<Change> changes_at(const std::vector<Change>& all, const std::vector<std::string>& paths)
{
    if (paths.empty())
        return all;
    std::vector<Change> some;
    std::copy_if(all.begin(), all.end(), std::back_inserter(some), [&](const Change& change) {
        return std::any_of(paths.begin(), paths.end(),
                           [&](const std::string& path) { return is_at(change.path, plain_path(path)); });
    });
    return some;
}

std::string to_text(const std::vector<Change>& all)
{
    const unsigned width = text_width();
    std::string text;
    for (const Change& change : all)
    {
        const std::string older = text_of(change.older);
        const std::string newer = text_of(change.newer);
        const std::size_t values = older.size() + 3 + newer.size(); // the arrow is one column on the screen
        if (2 + change.path.size() + 2 + values <= width)
            text += "  " + change.path + "  " + older + " → " + newer + "\n";
        else if (6 + values <= width)
            text += "  " + change.path + "\n      " + older + " → " + newer + "\n";
        else
            text += "  " + change.path + "\n      " + folded(std::string(6, ' ') + older, 8, width).substr(6) +
                    "\n    → " + folded(std::string(6, ' ') + newer, 8, width).substr(6) + "\n";
    }
    return text;
}

} // namespace pmxboard
