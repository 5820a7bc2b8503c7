// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The layer's memory as it was recorded where pointers have another width. */
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace pmxboard
{

/** How a state is laid out there; variables, and fields in them, stand in the same order everywhere. */
class ForeignState
{
public:
    explicit ForeignState(std::size_t pointer_size);

    std::size_t exported_size() const { return m_exported_size; }
    std::size_t size() const { return m_size; }

    /** The recorded state, or the exported objects at its head, laid out as in the layer that replays. */
    std::vector<std::uint32_t> as_here(std::span<const std::uint32_t> recorded) const;

private:
    std::size_t m_pointer_size;
    std::size_t m_exported_size = 0;
    std::size_t m_size = 0;
};

} // namespace pmxboard
