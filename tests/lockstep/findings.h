// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Runs trials in both layers, and keeps what they did differently, counted by kind. */
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "tests/lockstep/compare.h"

namespace lockstep
{

/** Everything that a run follows from. */
struct Trial
{
    const Operation* operation = nullptr;
    Arguments arguments{};
    Image before;
    Surroundings surroundings;
};

class Findings
{
public:
    explicit Findings(const Comparison& comparison);

    /** Run a trial in both layers; `name` leads the report of what differs. */
    void run(const Trial& trial, const std::string& name);

    /** What a layer did in the last trial. */
    const Trace& trace(unsigned layer) const { return m_traces[layer]; }

    /** Runs of each operation, of them those with a neighbour, and calls that were compared. */
    const std::vector<std::uint64_t>& runs() const { return m_runs; }
    std::uint64_t disturbed() const { return m_disturbed; }
    std::uint64_t calls() const { return m_calls; }

    bool empty() const { return m_found.empty(); }

    /** A table of the differences and the first in full; with `all` one of every kind. */
    std::string report(bool all) const;

private:
    struct Found
    {
        std::uint64_t undisturbed = 0;
        std::uint64_t disturbed = 0;
        std::string example;
    };

    void note(const Trial& trial, const std::string& name, const Difference& difference);

    Comparison m_comparison;
    Trace m_traces[2];
    std::vector<std::uint64_t> m_runs;
    std::uint64_t m_disturbed = 0;
    std::uint64_t m_calls = 0;
    std::map<std::string, Found> m_found;
    std::string m_first;
};

} // namespace lockstep
