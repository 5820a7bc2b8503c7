// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A program may have platform functions of its own in place of the board's: a driver that is to be tested, or one
 *  function that looks on and hands on. The board's are weak, so that each of them gives way by itself. By the name
 *  board_FUNCTION (board_functions.h) the board's own is there all the same.
 *
 *  Linked with recorded_calls.txt, which CMake's pmx::board and pkg-config see to, calls of such functions are
 *  recorded, answered by faults and accompanied by meanwhiles as the board's are. Those of the console stand apart, for
 *  what they are given cannot be handed on: a function in the place of one of them is recorded as far as it calls the
 *  board's. */
#pragma once

#include <span>
#include <string_view>

#include "board/threads.h"

namespace board::replaced
{

/** A platform function, and who has it. */
struct Function
{
    std::string_view name;
    void (*linked)(); ///< what the layer calls
    void (*own)();    ///< the board's
};

/** All of them, generated from the headers when the board is built. */
std::span<const Function> functions();

/** A call of a program's own function, while it lives. When that hands on to the board's, the call is not recorded a
 *  second time. */
class Call
{
public:
    Call() : m_before(threads::context().replacement) { threads::context().replacement = {}; }
    ~Call() { threads::context().replacement = m_before; }
    Call(const Call&) = delete;
    Call& operator=(const Call&) = delete;

    /** It is recorded, and begins. */
    void begins(std::string_view function) { threads::context().replacement = function; }

private:
    std::string_view m_before;
};

} // namespace board::replaced
