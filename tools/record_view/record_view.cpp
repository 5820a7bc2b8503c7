// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/record_view/record_view.h"

#include <cstring>
#include <optional>

#include "board/executable_symbols.h"
#include "board/names.h"
#include "board/tokens.h"
#include "tools/record_view/record_layout.h"

namespace record_view
{
namespace
{

using board::Value;

/** One node of one object. */
struct Place
{
    const Node* node = nullptr;
    const Object* object = nullptr;
    std::size_t offset = 0; ///< in the object
    std::string path;       ///< as fields() writes it
};

/** How fields() begins the names below an object: those of the record stand alone. */
std::string prefix_of(const Object& object)
{
    return object.group == "record" ? "" : object.symbol;
}

void collect(const Node& node, const std::string& path, std::vector<std::string>& into)
{
    if (is_single(node))
        into.push_back(path);
    for (std::size_t i = 0; i < node.children.size(); ++i)
        collect(node.children[i], path_of_child(node, i, path), into);
}

/** Go from a record or array to what `step` names, "name" or "[index]"; the index may be a symbolic name. */
bool descend(Place& place, std::string_view step)
{
    const Node* next = nullptr;
    if (step.starts_with('['))
    {
        const std::string_view written = step.substr(1, step.size() - 2);
        auto index = board::tokens::number(written);
        if (!index)
            index = board::names::number_of(written);
        const auto& items = place.node->children;
        if (place.node->form != Node::Form::List || !index || *index < 0 ||
            static_cast<std::size_t>(*index) >= items.size())
            return false;
        next = &items[static_cast<std::size_t>(*index)];
        place.path.append("[").append(std::to_string(*index)).append("]");
    }
    else
    {
        if (place.node->form != Node::Form::Record)
            return false;
        for (const Node& child : place.node->children)
        {
            if (child.name == step)
                next = &child;
        }
        place.path.append(place.path.empty() ? "" : ".").append(step);
    }
    if (next == nullptr)
        return false;
    place.node = next;
    place.offset += next->offset;
    return true;
}

/** Go down along "name[index].name…"; nothing when it leads nowhere. */
std::optional<Place> walk(Place place, std::string_view path)
{
    while (!path.empty())
    {
        std::size_t length = path.find_first_of(".[");
        if (length == 0 && path.front() == '[')
        {
            length = path.find(']');
            length = length == std::string_view::npos ? length : length + 1;
        }
        const std::string_view step = path.substr(0, length);
        if (step.empty() || (step.front() == '[' && step.back() != ']') || !descend(place, step))
            return std::nullopt;
        path.remove_prefix(step.size());
        if (path.starts_with('.'))
        {
            path.remove_prefix(1);
            if (path.empty())
                return std::nullopt;
        }
    }
    return place;
}

/** Take a beginning away; whether it was there. */
bool take(std::string_view& path, std::string_view beginning)
{
    if (!path.starts_with(beginning))
        return false;
    path.remove_prefix(beginning.size());
    return true;
}

bool names_object(std::string_view path, const Object& object)
{
    return path == object.symbol || (take(path, object.group) && take(path, ".") && path == object.symbol);
}

/** What stands behind "group.", "symbol." or "symbol[0]."; empty when the path begins otherwise. */
std::string_view path_below(std::string_view path, const Object& object)
{
    if (!take(path, object.group))
    {
        if (!take(path, object.symbol))
            return {};
        take(path, "[0]");
    }
    return take(path, ".") ? path : std::string_view();
}

std::optional<Place> find(std::string_view path)
{
    const auto root = [](const Object& object) { return Place{ &object.node, &object, 0, prefix_of(object) }; };
    const Object* record = nullptr;
    for (const Object& object : objects())
    {
        if (object.group == "record")
            record = &object;
        if (names_object(path, object))
            return root(object);
        if (object.group == "module")
            continue;
        if (path == object.group)
            return root(object);
        if (const std::string_view below = path_below(path, object); !below.empty())
            return walk(root(object), below);
    }
    return path.empty() ? std::nullopt : walk({ &record->node, record, 0, "" }, path);
}

[[noreturn]] void no_such_field(std::string_view path)
{
    std::vector<std::string> known = fields();
    for (const Object& object : objects())
    {
        for (const Node& child : object.node.children)
        {
            if (!is_single(child))
                known.push_back(child.name);
        }
    }
    std::string message = "no field " + std::string(path);
    const auto nearest = board::names::nearest(path, { known.begin(), known.end() });
    for (std::size_t i = 0; i < nearest.size(); ++i)
        message += (i == 0 ? "; did you mean " : ", ") + nearest[i];
    throw FieldError(message + (nearest.empty() ? "" : "?"));
}

Place place_of(std::string_view path)
{
    if (const auto place = find(path))
        return *place;
    no_such_field(path);
}

Place single_place_of(std::string_view path)
{
    const Place place = place_of(path);
    if (is_single(*place.node))
        return place;
    std::vector<std::string> below;
    collect(*place.node, place.path, below);
    throw FieldError(std::string(path) + " is not a single field; did you mean " + below.front() + "?");
}

} // namespace

Value state()
{
    Value all;
    Value module;
    for (const Object& object : objects())
    {
        Value value = value_at(object.node, address_of(object));
        if (object.group == "module")
            module.add(object.symbol, std::move(value));
        else
            all.add(object.group, std::move(value));
    }
    all.add("module", std::move(module));
    return all;
}

Value get(std::string_view path)
{
    if (path == "module")
        return *state().find(path);
    const Place place = place_of(path);
    return value_at(*place.node, address_of(*place.object) + place.offset);
}

Field::Field(std::string_view path)
{
    const Place place = single_place_of(path);
    m_object = place.object;
    m_node = place.node;
    m_offset = place.offset;
}

std::int64_t Field::number() const
{
    return plain_number_at(*m_node, address_of(*m_object) + m_offset);
}

bool has(std::string_view path)
{
    return path == "module" || find(path).has_value();
}

void set(std::string_view path, std::int64_t number)
{
    const Place place = single_place_of(path);
    const Range range = type_of(path).range();
    if (number < range.lowest || number > range.highest)
        throw FieldError(place.path + " holds " + std::to_string(range.lowest) + " to " +
                         std::to_string(range.highest) + ", not " + std::to_string(number));
    std::memcpy(address_of(*place.object) + place.offset, &number, place.node->size);
}

FieldType type_of(std::string_view path)
{
    const Place place = single_place_of(path);
    return { place.path, place.node->owner, place.node->name, static_cast<unsigned>(8 * place.node->size),
             place.node->is_signed };
}

Range FieldType::range() const
{
    const unsigned magnitude = is_signed || bits == 64 ? bits - 1 : bits;
    const auto highest = static_cast<std::int64_t>((std::uint64_t{ 1 } << magnitude) - 1);
    return { is_signed ? -highest - 1 : 0, highest };
}

std::vector<std::string> fields()
{
    std::vector<std::string> all;
    for (const Object& object : objects())
        collect(object.node, prefix_of(object), all);
    return all;
}

} // namespace record_view
