// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "fuzz/support/life.h"

#include "drv_pmx.h"

namespace fuzz
{

void run_layer(const board::Description& description)
{
    constexpr UCHAR frequency = 60;
    board::power_on(description);
    PMX_Init();
    PMX_SetMode(0, RES_720P60HZ, frequency, FALSE);
    board::advance(std::chrono::seconds(20));
    board::suspend();
    board::resume();
    PMX_Reset(0);
    board::advance(std::chrono::seconds(20));
    PMX_Uninit();
}

} // namespace fuzz
