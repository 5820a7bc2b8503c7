// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The explored handshake as a drawing. */
#pragma once

#include <string>

#include "tests/support/handshake_explorer.h"

namespace handshake
{

/** A DOT graph with one node for each name of a state and one edge for each pair of names, labelled with the events
 *  that lead along it. What a node leaves open (T, the video plane driver waiting) is written with an event where it
 *  decides the way. Events that do not leave a node are not drawn. */
std::string dot(const Graph& graph);

} // namespace handshake
