// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  One number for all that was seen, the same wherever the same was seen: of calls, results and the record. */
#pragma once

#include <cstdint>
#include <string_view>

#include "board/board.h"
#include "tools/pmxboard/functions/operation.h"

namespace soak
{

class Witness
{
public:
    void see(std::uint64_t number);
    void see(std::string_view text);
    void see(const board::Value& value);
    void see(const board::TraceEntry& entry);
    void see(const pmxboard::Outcome& outcome);

    std::uint64_t hash() const { return m_hash; }

private:
    std::uint64_t m_hash = 0;
};

} // namespace soak
