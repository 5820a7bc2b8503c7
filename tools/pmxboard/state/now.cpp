// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/state/now.h"

#include "board/board.h"
#include "tools/pmxboard/state/paths.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{

board::Value whole_state()
{
    board::Value all = board::state();
    const board::Value layer = record_view::state();
    for (std::size_t i = 0; i < layer.keys().size(); ++i)
        all.add(layer.keys()[i], layer.items()[i]);
    return all;
}

board::Value state_at(const std::string& path)
{
    // No field of the layer has a device's name, and the devices' states are made whole.
    if (record_view::has(path))
        return record_view::get(path);
    const board::Value board_state = board::state();
    if (const board::Value* const found = board_state.find(path); found != nullptr && !path.empty())
        return *found;
    return part_of(whole_state(), path);
}

} // namespace pmxboard
