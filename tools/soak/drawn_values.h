// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Arguments that are drawn: any value can come, and those that have names, or stand at an edge, come often. */
#pragma once

#include "tools/pmxboard/functions/operation.h"
#include "tools/soak/choices.h"

namespace soak
{

/** A number of the family, or any that fits. */
std::int64_t draw_number(Choices& choices, board::names::Family family, unsigned bits);

/** One value for each parameter. A pointer that the operation tests may be null. */
pmxboard::Values draw_arguments(Choices& choices, const pmxboard::Operation& operation);

} // namespace soak
