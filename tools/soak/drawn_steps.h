// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What happens to a mixer in its life, drawn: operations with any arguments, neighbours that call, sources that come
 *  and go, drivers that fail, time. */
#pragma once

#include <optional>
#include <string>

#include "tools/pmxboard/functions/operation.h"
#include "tools/soak/choices.h"

namespace soak
{

enum class Life
{
    Calm,  ///< all drivers do what their contracts say; callers may hand over anything
    Unruly ///< drivers fail, and neighbours turn what the mixer has set, or hand over what they must not
};

/** A board that is as good as new. */
void begin_life(Choices& choices);

struct Step
{
    std::string what;
    bool is_operation = false;
    pmxboard::Outcome outcome{};
};

/** Let something happen. */
Step draw_step(Choices& choices, Life life);

} // namespace soak
