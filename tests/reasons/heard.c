// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Two requests that are refused, made by a stack whose layer tells its reasons. */
#include "board/board_c.h"
#include "drv_pmx.h"

int main(void)
{
    if (board_c_power_on("boards/default") != 0)
        return 1;
    board_c_show_console(0);
    PMX_Init();
    if (PMX_SetTvType(3, PMX_TV_TYPE_PAL) != 0 || PMX_SetMode(0, RES_2160P, 60, 0) != 0)
        return 1;
    return 0;
}
