// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Calls of operations to start trials from: with their arguments, and the state that they find. */
#pragma once

#include <string>
#include <vector>

#include "tests/lockstep/findings.h"
#include "tests/lockstep/random.h"

namespace lockstep
{

/** A call with drawn state, arguments and answers. */
Trial drawn_trial(const Operation& operation, Random& random);

/** Drawn calls of an operation, chosen so that every call of the platform that it can make is made by one of them, and
 *  that they take different ways through it. The second layer tells which way a call takes. */
std::vector<Trial> drawn_bases(const Operation& operation);

/** The calls of a file that the gathering program wrote, half of them with the platform's usual answers. Fails the
 *  program when the file has another form. */
std::vector<Trial> gathered_bases(const std::string& path);

} // namespace lockstep
