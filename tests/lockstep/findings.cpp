// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/findings.h"

#include <iomanip>
#include <sstream>

namespace lockstep
{

Findings::Findings(const Comparison& comparison) : m_comparison(comparison), m_runs(operation_count, 0)
{
}

void Findings::run(const Trial& trial, const std::string& name)
{
    for (unsigned layer = 0; layer < 2; ++layer)
        lockstep::run(*trial.operation, layer, trial.arguments, trial.before, trial.surroundings, m_traces[layer]);
    ++m_runs[static_cast<std::size_t>(trial.operation - operations)];
    m_disturbed += trial.surroundings.disturbance.call != never;
    m_calls += m_traces[0].calls.size();
    if (const auto difference = compare_calls(*trial.operation, m_traces[0], m_traces[1], m_comparison))
        note(trial, name, *difference);
    if (const auto difference = compare_stores(*trial.operation, m_traces[0], m_traces[1], m_comparison))
        note(trial, name, *difference);
}

void Findings::note(const Trial& trial, const std::string& name, const Difference& difference)
{
    const Operation& operation = *trial.operation;
    const Disturbance& disturbance = trial.surroundings.disturbance;
    Found& found = m_found[difference.kind + ": " + operation.function.name + ": " + difference.where];
    ++(disturbance.call == never ? found.undisturbed : found.disturbed);
    if (!found.example.empty())
        return;
    found.example = name + ": " + shown_operation(operation, trial.arguments, trial.before) + "\n";
    if (disturbance.call != never)
        found.example += "  " + field_at(operation, disturbance.offset) + " becomes " +
                         std::to_string(disturbance.value) + " inside call " + std::to_string(disturbance.call) + "\n";
    found.example += difference.text;
    if (!m_first.empty())
        return;
    m_first = found.example;
    for (unsigned layer = 0; layer < 2; ++layer)
        m_first += std::string("  all calls of ") + m_comparison.names[layer] + ":\n" +
                   shown_calls(m_traces[layer], disturbance.call);
}

std::string Findings::report(bool all) const
{
    if (m_found.empty())
        return "no difference\n";
    std::ostringstream text;
    text << "undisturbed  disturbed  difference\n";
    for (const auto& [kind, found] : m_found)
        text << std::setw(11) << found.undisturbed << std::setw(11) << found.disturbed << "  " << kind << '\n';
    text << "\nthe first:\n" << m_first;
    for (const auto& [kind, found] : m_found)
    {
        if (all)
            text << '\n' << kind << ":\n" << found.example;
    }
    return text.str();
}

} // namespace lockstep
