// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Runs two layers side by side over random operations, and counts by kind what they do differently. */
#include <iostream>
#include <vector>

#include "tests/lockstep/random_runs.h"

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
    run_random(options, offered, findings);
    std::cout << options.count << " operations, " << findings.disturbed() << " of them again with a neighbour; "
              << findings.calls() << " calls compared\n"
              << findings.report(options.all);
    return findings.empty() ? 0 : 1;
}
