// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What is noted of an operation that a scenario calls. */
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace lockstep
{

/** A variable of the layer. */
struct StateObject
{
    const char* name;
    const void* address;
};
extern const StateObject gathered_state[];
extern const std::size_t gathered_state_count;

/** One call, noted argument by argument. */
class Gathered
{
public:
    explicit Gathered(const char* operation) : m_line(operation), m_array() {}

    void number(std::uint64_t value) { m_line += " " + std::to_string(value); }
    void place(const void* place) { m_line += place == nullptr ? " 0" : " p"; }
    void array(const void* first, std::size_t size);
    /** All is noted but the state. */
    void write() const;

private:
    std::string m_line;
    std::vector<unsigned char> m_array;
};

} // namespace lockstep
