// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What lines do that have to do with pictures. */
#pragma once

#include "tools/pmxboard/language/grammar.h"

namespace pmxboard
{

class Session;

/** `source NAME picture …`. */
void show_file(Session& session, const Words& words);
void show_pattern(Session& session, const Words& words);
void show_solid(Session& session, const Words& words);

/** `shot …`. */
void take_shot(Session& session, const Words& words);

/** `expect picture …`. */
void expect_colour(Session& session, const Words& words);
void expect_file(Session& session, const Words& words);

} // namespace pmxboard
