// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The layer that tells its reasons. It sits beside the one that ships, in the same program, and is led in when
 *  somebody asks why: in a copy of the process, for there is no way back. */
#pragma once

namespace pmxboard
{

/** Look the twin up, so that copies of the process need not. Throws std::runtime_error where it cannot be led in. */
void find_twin();

/** Let the twin take the layer's place: it gets the layer's record and flags as they are, and every way into the layer
 *  leads to it: calls by name, pointers in tables, in timers and in what is registered. From then on reasons are
 *  gathered (told_reasons). Throws std::runtime_error on a machine for which no way is known. */
void lead_in_twin();

} // namespace pmxboard
