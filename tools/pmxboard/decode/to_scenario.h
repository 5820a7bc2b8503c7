// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A scenario that prints what a log holds, as far as the log determines it. */
#pragma once

#include <iosfwd>
#include <string>

#include "tools/pmxboard/decode/log.h"

namespace pmxboard::decode
{

/** Writes it, with comments where the log leaves something open. `name` is the log's. */
void write_scenario(std::ostream& out, const Log& log, const std::string& name);

} // namespace pmxboard::decode
