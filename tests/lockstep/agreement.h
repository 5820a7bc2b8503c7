// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Drawn values seldom agree with each other. What a layer decides by comparing is reached by making them agree, and
 *  then by making them differ in one place. */
#pragma once

#include "tests/lockstep/lockstep.h"
#include "tests/lockstep/random.h"

namespace lockstep
{

/** Give the record what an operation that sets modes is asked for. */
void agree(const Operation& operation, const Arguments& arguments, Image& state);

/** Change one field by which such operations decide. */
void disagree(Random& random, Image& state);

} // namespace lockstep
