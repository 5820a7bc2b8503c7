// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The board for C programs.
#include "board/board_c.h"

#include <chrono>
#include <cstdio>
#include <exception>

#include "board/board.h"

namespace
{

/** Whether the action was done; a C program has nobody who catches, so what went wrong is told here. */
template <typename Action>
bool is_done(const Action& action) noexcept
{
    try
    {
        action();
        board::meanwhiles::rethrow_failure();
        return true;
    }
    catch (const std::exception& error)
    {
        std::fprintf(stderr, "%s\n", error.what());
    }
    catch (...)
    {
        std::fputs("something unknown went wrong\n", stderr);
    }
    return false;
}

} // namespace

int board_c_power_on(const char* szBoard)
{
    if (szBoard == nullptr)
    {
        std::fputs("no board is named\n", stderr);
        return -1;
    }
    return is_done([szBoard] { board::power_on(board::load_description(szBoard)); }) ? 0 : -1;
}

void board_c_show_console(int iShown)
{
    is_done([iShown] {
        if (iShown != 0)
            board::set_console([](std::string_view text) { std::fwrite(text.data(), 1, text.size(), stdout); });
        else
            board::set_console({});
    });
}

void board_c_console_level(int iLevel)
{
    board::set_console_level(iLevel);
}

void board_c_advance(unsigned uMilliseconds)
{
    is_done([uMilliseconds] { board::advance(std::chrono::milliseconds(uMilliseconds)); });
}

unsigned board_c_asserts(void)
{
    return board::asserts();
}
