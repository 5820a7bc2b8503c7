// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What somebody else does while the layer is inside a platform call: a neighbour's thread, an interrupt. It is done at
 *  the end of the call: the device has acted and its answer is settled, but the layer does not have it yet. */
#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "board/trace.h"

namespace board
{

/** How a meanwhile is carried out. */
struct MeanwhileAs
{
    bool thread = false; ///< as a thread of its own, which can wait for the mutex; else nested in the thread that calls
    std::string name{};  ///< for reports
};

/** Carry an action out, once, inside the n-th call of a platform function from now. Any number of them may be armed;
 *  those that are due at one call are carried out in the order of arming. An exception that leaves the action ends
 *  there, for it must not pass through the layer; see meanwhiles::rethrow_failure. Power-on takes back what is armed.
 *  Throws std::invalid_argument when there is no such function or n is 0; the message names the nearest functions. */
void meanwhile(std::string function, unsigned n, std::function<void()> action, MeanwhileAs as = {});

/** Carry an action out at every platform call from now on, but for those that the action itself makes. There is one; an
 *  empty function takes it back. */
void at_every_call(std::function<void(const TraceEntry&)> action);

namespace meanwhiles
{

struct Armed
{
    std::string function;
    unsigned n = 1;
    unsigned calls = 0; ///< of the function, since it was armed
    std::string name;
};

/** What has not been done yet, in the order of arming. */
std::vector<Armed> armed();
void forget(std::string_view function);
void forget_all();

/** Throw what the first action that failed threw, or the first platform function that could not do its work, and forget
 *  all such failures. */
void rethrow_failure();
void forget_failures();

} // namespace meanwhiles
} // namespace board
