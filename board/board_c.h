// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The virtual board for C programs: power it on, let time pass, see its console. Everything else is in board.h, for
 *  C++. */
#ifndef BOARD_C_H
#define BOARD_C_H

#include "board/installed_header.h"

#ifdef __cplusplus
extern "C" {
#endif

/** Make the board as good as new, any number of times in a process, and the layer as it is at load.
 *  @param szBoard  a board file, a directory that holds board.toml, or the name of a board ("default")
 *  @return 0; -1 when it cannot be used, with the reason on the standard error output */
int board_c_power_on(const char* szBoard);

/** Show the console on the standard output from now on, or stop showing it.
 *  @param iShown  0 stop, anything else show */
void board_c_show_console(int iShown);

/** Admit lines of PMX_IsLog up to this level.
 *  @param iLevel  0 to 9 */
void board_c_console_level(int iLevel);

/** Let virtual time pass: timers that run out call their expiry functions. What goes wrong with the board itself, since
 *  the last such call, too, is told on the standard error output.
 *  @param uMilliseconds  how much */
void board_c_advance(unsigned uMilliseconds);

/** Ask how often an invariant was reported as broken since power-on.
 *  @return the number of calls of Assert */
unsigned board_c_asserts(void);

#ifdef __cplusplus
}
#endif

#endif
