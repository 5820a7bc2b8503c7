// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  When lines were printed: time stamps of several kinds, clocks that begin again, and systems that do. */
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string_view>

#include "tools/pmxboard/decode/clean.h"

namespace pmxboard::decode
{

/** A point in time. Two of them can be compared when they are of the same base. */
struct Moment
{
    double seconds = 0;
    double exact = 0;       ///< it may have been so much later
    std::uint64_t base = 0; ///< a clock as long as it runs on

    bool operator==(const Moment&) const = default;
};

/** How long after one moment another was; nothing when nobody can tell. */
std::optional<double> between(const std::optional<Moment>& one, const std::optional<Moment>& other);

/** Follows the time stamps of a log from line to line. */
class Timeline
{
public:
    /** The moment of a stamp. */
    std::optional<Moment> take(const Stamp& stamp);
    /** The system begins anew: no moment from before can be compared with one from now. */
    void begin_anew() { m_running = {}; }
    /** Whether the clock of the stamp that was taken last has begun anew: the system has. */
    bool began_anew() const { return m_began_anew; }

private:
    struct Running
    {
        double seconds = 0;
        double past = 0; ///< days that are over
        std::uint64_t base = 0;
    };

    static constexpr std::size_t kinds = 20; ///< of clocks: two, each with so many decimals or more
    std::array<std::optional<Running>, kinds> m_running;
    std::uint64_t m_bases = 0;
    bool m_began_anew = false;
};

/** Whether a line is what a boot loader or a kernel begins with, or what powers the virtual board on. */
bool is_banner(std::string_view line);

} // namespace pmxboard::decode
