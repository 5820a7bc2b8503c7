// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* What comes before power-on fails, says so, and does no harm. */
#include <stdio.h>
#include <string.h>

#include "board/board_c.h"

static int iWrong;

static void vFails(const char* szWhat, int fgFailed)
{
    if (fgFailed && strstr(board_c_error(), "the board has no power: board_c_power_on comes first") != NULL)
        return;
    printf("%s: %s\n", szWhat, board_c_error());
    iWrong++;
}

static void vAction(void* pvArgument)
{
    (void)pvArgument;
}

int main(void)
{
    BOARD_C_ENTRY_T rEntry;
    long long i8Number = 0;

    if (*board_c_error() != '\0')
        iWrong++;
    vFails("finish", board_c_finish() == -1);
    vFails("do", board_c_do("sink unplug") == -1);
    vFails("advance", board_c_advance(1) == -1);
    vFails("meanwhile", board_c_meanwhile("x_thread_delay", 1, 0, vAction, NULL) == -1);
    vFails("forget", board_c_forget() == -1);
    vFails("expect", board_c_expect("no-more") == -1);
    vFails("count", board_c_count("x_thread_delay(*)") == -1);
    vFails("entries", board_c_entries() == 0);
    vFails("entry", board_c_entry(0, &rEntry) == -1);
    vFails("argument", board_c_argument(0, "u4Tve") == NULL);
    vFails("argument_number", board_c_argument_number(0, "u4Tve", &i8Number) == -1);
    vFails("print_entries", board_c_print_entries() == -1);
    vFails("state", board_c_state("ucMode") == NULL);
    vFails("state_number", board_c_state_number("ucMode", &i8Number) == -1);
    vFails("status", board_c_status() == NULL);
    vFails("console", board_c_console() == NULL);
    board_c_show_console(1);
    board_c_console_level(9);
    return iWrong + (int)board_c_asserts() + (int)board_c_misuses();
}
