// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/recording/foreign_state.h"

#include <algorithm>
#include <cstring>

#include "recorder/encoding.h"
#include "tools/pmxboard/recording/replayed.h"
#include "tools/record_view/record_layout.h"

namespace pmxboard
{
namespace
{

using record_view::Node;

struct Shape
{
    std::size_t size = 0;
    std::size_t alignment = 1;
};

std::size_t aligned(std::size_t size, std::size_t alignment)
{
    return (size + alignment - 1) / alignment * alignment;
}

Shape shape_of(const Node& node, std::size_t pointer_size)
{
    if (node.form == Node::Form::Pointer)
        return { pointer_size, pointer_size };
    if (record_view::is_single(node))
        return { node.size, node.size };
    Shape shape;
    for (const Node& child : node.children)
    {
        const Shape inner = shape_of(child, pointer_size);
        shape.alignment = std::max(shape.alignment, inner.alignment);
        shape.size = aligned(shape.size, inner.alignment) + inner.size;
    }
    return { aligned(shape.size, shape.alignment), shape.alignment };
}

/** Field by field: pointers of another width keep their low bits. */
void copy_fields(const Node& node, std::size_t pointer_size, unsigned char* to, const unsigned char* from)
{
    if (record_view::is_single(node))
    {
        const std::size_t size = shape_of(node, pointer_size).size;
        std::memcpy(to, from, std::min(size, node.size)); // the low bits stand first on both sides
        return;
    }
    std::size_t at = 0;
    for (const Node& child : node.children)
    {
        const Shape shape = shape_of(child, pointer_size);
        at = aligned(at, shape.alignment);
        copy_fields(child, pointer_size, to + child.offset, from + at);
        at += shape.size;
    }
}

const Node* node_of(const Variable& variable)
{
    const auto& all = record_view::objects();
    const auto found =
        std::find_if(all.begin(), all.end(), [&](const auto& object) { return object.symbol == variable.name; });
    return found == all.end() ? nullptr : &found->node;
}

std::size_t size_of(const Variable& variable, std::size_t pointer_size)
{
    const Node* const node = node_of(variable);
    return node == nullptr ? variable.size : shape_of(*node, pointer_size).size;
}

} // namespace

ForeignState::ForeignState(std::size_t pointer_size) : m_pointer_size(pointer_size)
{
    for (const Variable& variable : replayed_layer().variables)
    {
        if (variable.offset >= replayed_layer().exported_size && m_exported_size == 0)
            m_exported_size = m_size = aligned(m_size, 4);
        m_size += size_of(variable, pointer_size);
    }
    m_size = aligned(m_size, 4);
}

std::vector<std::uint32_t> ForeignState::as_here(std::span<const std::uint32_t> recorded) const
{
    const ReplayedLayer& layer = replayed_layer();
    const bool is_whole = recorded.size_bytes() > m_exported_size;
    std::vector<std::uint32_t> state(PMX_WORDS(is_whole ? layer.state_size : layer.exported_size));
    auto* const to = reinterpret_cast<unsigned char*>(state.data());
    const auto* from = reinterpret_cast<const unsigned char*>(recorded.data());
    for (const Variable& variable : layer.variables)
    {
        const bool is_exported = variable.offset < layer.exported_size;
        if (!is_exported && !is_whole)
            break;
        if (variable.offset == layer.exported_size)
            from = reinterpret_cast<const unsigned char*>(recorded.data()) + m_exported_size;
        if (const Node* const node = node_of(variable))
            copy_fields(*node, m_pointer_size, to + variable.offset, from);
        else
            std::memcpy(to + variable.offset, from, variable.size);
        from += size_of(variable, m_pointer_size);
    }
    return state;
}

} // namespace pmxboard
