// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* One function in front of the board's: it looks on and hands on. */
#include "board/board_functions.h"
#include "own_encoder.h"

unsigned uBlackScreensHandedOn;

void TVE_SetBlackScreen(UINT32 u4Tve, BOOL fgOn)
{
    uBlackScreensHandedOn++;
    board_TVE_SetBlackScreen(u4Tve, fgOn);
}
