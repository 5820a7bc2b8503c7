// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The layer's own state: kept as it was at load, so that a board that is powered on again starts the layer afresh. */
#pragma once

#include <cstdint>

namespace board::layer_state
{

/** Put the layer's changeable objects back to what they were at load. Without a layer in the executable nothing is
 *  done. Throws std::runtime_error when one of them cannot be found. */
void restore();

/** Put a product's capability word into the layer's record, as a port to that product would have it there. Without a
 *  layer nothing is done. */
void set_capability(std::uint32_t word);

} // namespace board::layer_state
