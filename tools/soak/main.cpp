// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Random operations in a row on the board, which looks for misuses of the platform. Ten times on the way it tells, as a
// line of JSON, what it has seen until then, and the memory that the process holds.
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <exception>
#include <fstream>
#include <iostream>
#include <stdexcept>
#include <string>

#include "board/board.h"
#include "board/console.h"
#include "tests/lockstep/random.h"
#include "tools/record_view/record_view.h"
#include "tools/soak/drawn_steps.h"
#include "tools/soak/witness.h"

namespace
{

using namespace soak;

constexpr std::uint64_t told_times = 10;
/** The record is looked at whenever so many operations have passed: that costs more than most of them. */
constexpr std::uint64_t between_records = 64;
/** A life is long, so that what is not given back adds up, and short enough for the first moments to be seen often. */
constexpr std::uint64_t life_length = 10'000;

class Seeded : public Choices
{
public:
    explicit Seeded(std::uint64_t seed) : m_random(seed) {}
    std::uint64_t any() override { return m_random.next(); }
    std::uint64_t below(std::uint64_t count) override { return m_random.below(count); }

private:
    lockstep::Random m_random;
};

std::uint64_t memory_kib()
{
    std::ifstream file("/proc/self/statm");
    std::uint64_t all = 0;
    std::uint64_t held = 0;
    file >> all >> held;
    return held * static_cast<std::uint64_t>(sysconf(_SC_PAGESIZE)) / 1024;
}

class Soak
{
public:
    explicit Soak(std::uint64_t seed) : m_choices(seed) {}

    void run(std::uint64_t count)
    {
        const std::uint64_t between = std::max<std::uint64_t>(count / told_times, 1);
        for (std::uint64_t done = 0; done < count;)
        {
            if (done % life_length == 0)
            {
                m_life = m_choices.once_in(2) ? Life::Calm : Life::Unruly;
                begin_life(m_choices);
            }
            while (!step())
                continue;
            if (done % between_records == 0)
                m_witness.see(record_view::state());
            if (++done % between == 0 || done == count)
                tell(done);
        }
    }

    std::uint64_t misuses() const { return m_misuses; }

private:
    /** Whether it was an operation. */
    bool step()
    {
        const Step step = draw_step(m_choices, m_life);
        m_witness.see(step.what);
        m_witness.see(step.outcome);
        for (const board::TraceEntry& entry : board::trace::entries())
            look_at(entry, step);
        board::trace::clear();
        board::console::forget();
        return step.is_operation;
    }

    void look_at(const board::TraceEntry& entry, const Step& step)
    {
        constexpr std::uint64_t most_shown = 10;
        m_witness.see(entry);
        ++m_entries;
        if (m_life == Life::Calm && entry.kind == board::TraceEntry::Kind::Notice && entry.function == "misuse" &&
            ++m_misuses <= most_shown)
            std::cerr << "misuse in " << step.what << ": " << entry.text << '\n';
    }

    void tell(std::uint64_t done) const
    {
        std::cout << "{\"operations\": " << done << ", \"entries\": " << m_entries << ", \"misuses\": " << m_misuses
                  << ", \"hash\": \"" << std::hex << m_witness.hash() << std::dec
                  << "\", \"memory_kib\": " << memory_kib() << "}" << std::endl;
    }

    Seeded m_choices;
    Witness m_witness;
    Life m_life = Life::Calm;
    std::uint64_t m_entries = 0; ///< calls, log lines, assertions and notices
    std::uint64_t m_misuses = 0; ///< where every driver kept its contract
};

std::uint64_t number(const char* text)
{
    std::size_t end = 0;
    const std::uint64_t number = std::stoull(text, &end);
    if (*text == '-' || text[end] != '\0' || number == 0)
        throw std::invalid_argument(text);
    return number;
}

} // namespace

int main(int count, char** words)
try
{
    if (count != 3)
        throw std::invalid_argument(std::to_string(count - 1) + " arguments");
    Soak soak(number(words[2]));
    soak.run(number(words[1]));
    return soak.misuses() == 0 ? 0 : 1;
}
catch (const std::exception& error)
{
    std::cerr << error.what() << "\nusage: soak OPERATIONS SEED\n";
    return 2;
}
