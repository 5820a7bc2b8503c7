// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the tests of own platform functions have in common. */
#pragma once

#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include "board/board.h"
#include "drv_pmx.h"

inline void demand(bool is_true, const std::string& what)
{
    if (is_true)
        return;
    for (const board::TraceEntry& entry : board::trace::entries())
        std::printf("%*s%s\n", static_cast<int>(2 * entry.depth), "", entry.brief().c_str());
    std::printf("%s\n", what.c_str());
    std::exit(1);
}

/** How many recorded calls a line means. */
inline unsigned recorded(std::string_view line)
{
    unsigned count = 0;
    for (const board::TraceEntry& entry : board::trace::entries())
        count += entry.matches(line);
    return count;
}

inline void power_on_and_start()
{
    board::power_on(board::load_description("default"));
    PMX_Init();
    board::trace::clear();
}

/** Component in 576p, composite in 576i. */
inline UINT32 set_mode()
{
    PMX_RESOLUTION_T outputs[PMX_OUTPUT_NUM]{};
    outputs[PMX_OUTPUT_CAV].fgOutputEnable = TRUE;
    outputs[PMX_OUTPUT_CAV].eResMode = RES_576P;
    outputs[PMX_OUTPUT_CVBS].fgOutputEnable = TRUE;
    outputs[PMX_OUTPUT_CVBS].eResMode = RES_576I;
    return PMX_SetModeEx(0, outputs, 50, DRV_NON_EXT_CHIP, 0);
}
