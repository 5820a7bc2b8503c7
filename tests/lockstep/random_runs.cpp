// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/random_runs.h"

#include <iostream>

#include "tests/lockstep/draw.h"

namespace lockstep
{

std::vector<unsigned> common_operations(const std::string& wanted)
{
    std::vector<unsigned> common;
    for (unsigned i = 0; i < operation_count; ++i)
    {
        const Operation& operation = operations[i];
        if (!wanted.empty() && operation.function.name != wanted)
            continue;
        if (operation.entries[0] != nullptr && operation.entries[1] != nullptr)
            common.push_back(i);
        else
            std::cout << operation.function.name << " is not in both layers\n";
    }
    return common;
}

void run_random(const Options& options, const std::vector<unsigned>& offered, Findings& findings,
                const std::function<void(const Trial&)>& told)
{
    Random random(options.seed);
    Image state = started_state();
    for (std::uint64_t i = 0; i < options.count; ++i)
    {
        if (random.once_in(4))
            state = started_state();
        if (!random.once_in(4))
            draw_state(random, state);
        Trial trial;
        trial.operation = &operations[offered[random.below(offered.size())]];
        trial.arguments = draw_arguments(random, *trial.operation, state);
        trial.before = state;
        trial.surroundings.seed = random.next();
        trial.surroundings.calm = random.once_in(2);
        const std::string name = "operation " + std::to_string(i);
        findings.run(trial, name);
        if (told)
            told(trial);
        const auto calls = static_cast<unsigned>(findings.trace(0).calls.size());
        if (options.disturbed && calls != 0 && random.once_in(2))
        {
            trial.surroundings.disturbance = draw_disturbance(random, *trial.operation, calls);
            findings.run(trial, name);
            if (told)
                told(trial);
        }
        state = findings.trace(1).after;
    }
}

} // namespace lockstep
