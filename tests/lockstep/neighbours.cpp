// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Holds the layer against a literal writing of its steps: every call of an operation, and while the layer is inside
 * that call a neighbour that changes any one field of what the layer may look at. What follows must be what the steps
 * say. */
#include <iostream>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "tests/lockstep/bases.h"
#include "tests/lockstep/draw.h"
#include "tests/lockstep/options.h"

namespace
{

using namespace lockstep;

constexpr const char* usage =
    R"(usage: neighbours [--bases FILE] [--part I N] [--operation NAME] [--undisturbed] [--all] [--names FIRST SECOND]

Runs calls of every operation in both layers: many drawn ones as they are, and some, chosen for the ways that they
take, once more for every platform call and every field that a neighbour changes inside it.
  --bases FILE         calls that the gathering program wrote, besides those that are drawn
  --part I N           one of N parts of the trials, counted from 0
  --operation NAME     this operation alone
  --undisturbed        no neighbour
  --all                show every kind of difference in full, not the first one alone
)";

constexpr unsigned undisturbed_for_each = 1500;

/* What has been reached, so that nobody takes a run of nothing for a proof. */
struct Reached
{
    std::set<unsigned> functions;
    std::set<std::pair<unsigned, unsigned>> calls;      // operation, function
    std::set<std::pair<unsigned, std::size_t>> changes; // operation, offset of the field
    std::size_t bases = 0;
};

/* Other values for a field: none if there was one and one if there was none, a drawn one, and one that the operation
 * was given. */
std::vector<std::uint64_t> other_values(const Trial& trial, const Field& field, std::uint64_t value, Random random)
{
    const std::uint64_t mask = field.size < 8 ? (1ull << 8 * field.size) - 1 : ~0ull;
    const unsigned argument_count = trial.operation->function.count;
    std::vector<std::uint64_t> values;
    const auto add = [&](std::uint64_t other) {
        other &= mask;
        if (other != value && (values.empty() || (other != values.front() && other != values.back())))
            values.push_back(other);
    };
    add(value == 0 ? 1 : 0);
    add(draw_value(random, field));
    if (argument_count != 0)
        add(trial.arguments[random.below(argument_count)]);
    return values;
}

class Neighbours
{
public:
    Neighbours(const Options& options, Findings& findings) : m_options(options), m_findings(findings) {}

    void run_base(Trial trial)
    {
        const std::string name = "base " + std::to_string(m_reached.bases++);
        m_findings.run(trial, name);
        const Trace before = m_findings.trace(0);
        const auto number = static_cast<unsigned>(trial.operation - operations);
        for (unsigned call = 0; call < before.calls.size(); ++call)
        {
            m_reached.functions.insert(before.calls[call].function);
            m_reached.calls.insert({ number, before.calls[call].function });
            if (!m_options.disturbed)
                continue;
            trial.surroundings.disturbance.call = call;
            const unsigned char* const image = before.images.data() + call * image_size();
            for (const std::vector<Field>* fields : { &state_fields(), &array_fields(*trial.operation) })
            {
                for (const Field& field : *fields)
                    change(trial, name, field, image);
            }
        }
    }

    const Reached& reached() const { return m_reached; }

private:
    void change(Trial& trial, const std::string& name, const Field& field, const unsigned char* image)
    {
        const std::uint64_t turn = m_turn++;
        if (turn % m_options.parts != m_options.part)
            return;
        const std::uint64_t value = get(image, field);
        m_reached.changes.insert({ static_cast<unsigned>(trial.operation - operations), field.offset });
        for (const std::uint64_t other : other_values(trial, field, value, Random(turn)))
        {
            const unsigned call = trial.surroundings.disturbance.call;
            trial.surroundings.disturbance = { call, field.offset, field.size, other };
            m_findings.run(trial, name);
        }
    }

    const Options& m_options;
    Findings& m_findings;
    Reached m_reached;
    std::uint64_t m_turn = 0;
};

bool wanted(const Options& options, const Operation& operation)
{
    return (options.operation.empty() || options.operation == operation.function.name) &&
           operation.entries[0] != nullptr && operation.entries[1] != nullptr;
}

/* What would make the run worthless; empty for none. */
std::string missing(const Options& options, const Findings& findings, const Reached& reached)
{
    std::string text;
    if (!options.operation.empty())
        return text;
    for (unsigned i = 0; i < operation_count; ++i)
    {
        if (findings.runs()[i] == 0)
            text += std::string(operations[i].function.name) + " was not run\n";
    }
    for (unsigned i = 0; i < platform_count; ++i)
    {
        if (!reached.functions.contains(i))
            text += std::string(platform[i].name) + " was not called\n";
    }
    if (options.disturbed && findings.disturbed() == 0)
        text += "no neighbour changed anything\n";
    return text;
}

} // namespace

int main(int count, char** words)
{
    Options options = options_of(count, words, usage);
    options.comparison.places_of_checks = false;
    const std::vector<Trial> gathered = options.bases.empty() ? std::vector<Trial>{} : gathered_bases(options.bases);
    Findings findings(options.comparison);
    Neighbours neighbours(options, findings);
    Random random(options.part);
    for (unsigned i = 0; i < operation_count; ++i)
    {
        const Operation& operation = operations[i];
        if (!wanted(options, operation))
            continue;
        for (unsigned k = 0; k < undisturbed_for_each; ++k)
            findings.run(drawn_trial(operation, random), "drawn");
        for (const Trial& base : drawn_bases(operation))
            neighbours.run_base(base);
    }
    const std::size_t drawn = neighbours.reached().bases;
    for (const Trial& base : gathered)
    {
        if (wanted(options, *base.operation))
            neighbours.run_base(base);
    }

    const Reached& reached = neighbours.reached();
    std::size_t operations_run = 0;
    std::uint64_t runs = 0;
    for (const std::uint64_t of_one : findings.runs())
    {
        operations_run += of_one != 0;
        runs += of_one;
    }
    std::cout << operations_run << " operations, " << runs - findings.disturbed() << " runs without a neighbour; "
              << reached.bases << " bases, " << drawn << " drawn and " << reached.bases - drawn << " gathered\n"
              << reached.functions.size() << " platform functions; " << reached.calls.size()
              << " pairs of operation and function called, " << reached.changes.size()
              << " pairs of operation and field changed\n"
              << findings.disturbed() << " trials with a neighbour, " << findings.calls() << " calls compared\n"
              << findings.report(options.all);
    const std::string lacking = missing(options, findings, reached);
    std::cerr << lacking;
    return findings.empty() && lacking.empty() ? 0 : 1;
}
