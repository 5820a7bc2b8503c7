// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The board for C programs.
#include "board/board_c.h"

#include <chrono>
#include <cstdio>
#include <exception>

#include "board/board.h"

int board_c_power_on(const char* szBoard)
{
    try
    {
        board::power_on(board::load_description(szBoard));
        return 0;
    }
    catch (const std::exception& error)
    {
        std::fprintf(stderr, "%s\n", error.what());
        return -1;
    }
}

void board_c_show_console(int iShown)
{
    if (iShown != 0)
        board::set_console([](std::string_view text) { std::fwrite(text.data(), 1, text.size(), stdout); });
    else
        board::set_console({});
}

void board_c_console_level(int iLevel)
{
    board::set_console_level(iLevel);
}

void board_c_advance(unsigned uMilliseconds)
{
    board::advance(std::chrono::milliseconds(uMilliseconds));
}

unsigned board_c_asserts(void)
{
    return board::asserts();
}
