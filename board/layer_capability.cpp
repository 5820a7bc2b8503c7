// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The one field of the layer's record that a board file says. A source of its own: the layer's header declares what the
// C library's does as well.
#include "board/executable_symbols.h"
#include "board/layer_state.h"
#include "src/driver/pmx/pmx_if.h"

namespace board::layer_state
{

void set_capability(std::uint32_t word)
{
    if (const auto record = executable_symbols::find("_arPmxConf"))
        static_cast<PMX_CONF_T*>(record->address)->u4Capability = word;
}

} // namespace board::layer_state
