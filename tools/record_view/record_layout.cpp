// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/record_view/record_layout.h"

#include <cstdint>
#include <type_traits>

#include "layer_record_fields.h"
#include "record_fields.h"

namespace record_view
{
namespace
{

template <typename T>
Node single(std::string name, std::size_t offset, std::string owner)
{
    static_assert(std::is_integral_v<T> || std::is_enum_v<T> || std::is_pointer_v<T>);
    return { .name = std::move(name),
             .form = std::is_pointer_v<T> ? Node::Form::Pointer : Node::Form::Number,
             .offset = offset,
             .size = sizeof(T),
             .is_signed = std::is_signed_v<T>,
             .owner = std::move(owner),
             .children = {} };
}

Node record(std::string name, std::size_t offset, std::size_t size, std::vector<Node> children)
{
    return { .name = std::move(name),
             .form = Node::Form::Record,
             .offset = offset,
             .size = size,
             .is_signed = false,
             .owner = {},
             .children = std::move(children) };
}

Node list(std::string name, std::size_t offset, std::size_t count, const Node& item)
{
    Node node = record(std::move(name), offset, count * item.size, std::vector<Node>(count, item));
    node.form = Node::Form::List;
    for (std::size_t i = 0; i < count; ++i)
        node.children[i].offset = i * item.size;
    return node;
}

template <typename Record>
std::vector<Node> fields();

/** What stands at an offset: a number, a pointer, an array, or a record with its fields. */
template <typename T>
Node node(const std::string& name, std::size_t offset, const std::string& owner)
{
    if constexpr (std::is_array_v<T>)
        return list(name, offset, std::extent_v<T>, node<std::remove_extent_t<T>>(name, 0, owner));
    else if constexpr (std::is_class_v<T>)
        return record(name, offset, sizeof(T), fields<T>());
    else
        return single<T>(name, offset, owner);
}

template <typename Record>
std::vector<Node> fields()
{
    std::vector<Node> nodes;
    const Record record{};
    const auto start = reinterpret_cast<std::uintptr_t>(&record);
    records::each_field(record, [&](const char* owner, const char* name, const auto& field) {
        using Field = std::remove_cv_t<std::remove_reference_t<decltype(field)>>;
        nodes.push_back(node<Field>(name, reinterpret_cast<std::uintptr_t>(&field) - start, owner));
    });
    return nodes;
}

#define VARIABLE(object)                                              \
    Object                                                            \
    {                                                                 \
#object, "module", single < decltype(object)>(#object, 0, "") \
    }

} // namespace

bool is_single(const Node& node)
{
    return node.form == Node::Form::Number || node.form == Node::Form::Pointer;
}

std::string path_of_child(const Node& node, std::size_t index, const std::string& path)
{
    if (node.form == Node::Form::List)
        return path + "[" + std::to_string(index) + "]";
    const std::string& name = node.children[index].name;
    return path.empty() ? name : path + "." + name;
}

const std::vector<Object>& objects()
{
    static const std::vector<Object> all = {
        { "_arPmxConf", "record", node<PMX_CONF_T>("", 0, "") },
        { "_arPmxDispPartStatus", "status", node<PMX_DISPLAY_PART_STATUS_T>("", 0, "") },
        VARIABLE(bComp0OnTop),
        VARIABLE(MutexPMX),
        VARIABLE(_PmxInitiated),
        VARIABLE(_fgBootUp),
        VARIABLE(_PmxTestOsd),
        VARIABLE(_fg2DCap),
        VARIABLE(PMX_debug_level),
    };
    return all;
}

} // namespace record_view
