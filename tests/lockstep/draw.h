// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Drawn states and arguments: any value can come, and those that decide something come often. */
#pragma once

#include "tests/lockstep/lockstep.h"
#include "tests/lockstep/random.h"

namespace lockstep
{

/** A value for a field of the state or of a caller's array. */
inline std::uint64_t draw_value(Random& random, const Field& field)
{
    return field.draw(random, field.size);
}

/** What a layer holds once it runs: the default record, an idle handshake, a mutex. */
const Image& started_state();

/** Some of the state's fields drawn anew. */
void draw_state(Random& random, Image& state);

/** Arguments for an operation, its array and its places; now and then the state is made to agree with them, for
 *  what is asked for may be there already. */
Arguments draw_arguments(Random& random, const Operation& operation, Image& state);

/** The operation's array and places within an image, as its arguments. */
Arguments caller_arguments(const Operation& operation);

/** A field of the state or of the operation's array, and another value for it. */
Disturbance draw_disturbance(Random& random, const Operation& operation, unsigned call_count);

} // namespace lockstep
