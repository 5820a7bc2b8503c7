// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Random operations in a row, each in the state that the one before it left. */
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "tests/lockstep/findings.h"
#include "tests/lockstep/options.h"

namespace lockstep
{

/** The operations that both layers have, or the wanted one alone; one that is not in both is told. */
std::vector<unsigned> common_operations(const std::string& wanted);

/** Run as many as the options say; who is told of each run looks at what Findings keeps of it. */
void run_random(const Options& options, const std::vector<unsigned>& offered, Findings& findings,
                const std::function<void(const Trial&)>& told = {});

} // namespace lockstep
