// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Runs two layers side by side over random operations, and counts by kind what they do differently. */
#include <iostream>
#include <string>
#include <vector>

#include "tests/lockstep/draw.h"
#include "tests/lockstep/findings.h"
#include "tests/lockstep/options.h"

namespace
{

using namespace lockstep;

constexpr const char* usage =
    R"(usage: revisions [--count N] [--seed S] [--operation NAME] [--undisturbed] [--no-padding] [--no-files] [--all]
                 [--names FIRST SECOND]

Runs N random operations in both layers; many once more with a neighbour that changes one field inside a platform call.
  --count N            operations to run (1000000)
  --seed S             another seed, other operations (1)
  --operation NAME     this operation alone
  --undisturbed        no neighbour
  --no-padding         padding of records behind pointers may differ
  --no-files           the file that an assertion names may differ
  --all                show every kind of difference in full, not the first one alone
)";

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

void run_all(const Options& options, const std::vector<unsigned>& offered, Findings& findings)
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
        const auto calls = static_cast<unsigned>(findings.trace(0).calls.size());
        if (options.disturbed && calls != 0 && random.once_in(2))
        {
            trial.surroundings.disturbance = draw_disturbance(random, *trial.operation, calls);
            findings.run(trial, name);
        }
        state = findings.trace(1).after;
    }
}

} // namespace

int main(int count, char** words)
{
    const Options options = options_of(count, words, usage);
    const std::vector<unsigned> offered = common_operations(options.operation);
    if (offered.empty() || options.count == 0)
    {
        std::cerr << "nothing to compare\n";
        return 2;
    }
    Findings findings(options.comparison);
    run_all(options, offered, findings);
    std::cout << options.count << " operations, " << findings.disturbed() << " of them again with a neighbour; "
              << findings.calls() << " calls compared\n"
              << findings.report(options.all);
    return findings.empty() ? 0 : 1;
}
