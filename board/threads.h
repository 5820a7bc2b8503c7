// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Threads of the board's world, beside the one that tools and tests run in. A thread runs until it is done or waits
 *  for a semaphore that another one holds; only then does the one that let it run go on. So exactly one runs at any
 *  time, and every run is the same. */
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace board::threads
{

/** What a thread is in the midst of. */
struct Context
{
    unsigned number = 0;             ///< 0: the one that tools and tests run in
    unsigned depth = 0;              ///< platform calls that it is inside of
    std::string operation;           ///< of the layer, the outermost one
    bool operation_running = false;  ///< between the beginning and the end of that operation
    std::string_view by = "outside"; ///< who stores now: an operation, a platform function, …
    unsigned expiry_functions = 0;   ///< of timers, that run in it
    bool in_hook = false;            ///< of every call
    std::string_view replacement{};  ///< the platform function in whose place a program's own one runs
};

/** The context of the thread that runs. */
Context& context();

/** Run a function as a thread of its own; returns when that is done, or waits. The name is for reports. Throws
 *  std::system_error when the system has no thread to give; what the function throws is contained, see contained.h. */
void run(std::string name, std::function<void()> function);

/** The running thread, which is not number 0, waits until somebody gives this semaphore. False when nobody ever will:
 *  the wait was ended. */
bool wait_for(std::uint32_t semaphore);

/** A semaphore was given: the first thread that waits for it runs, until it is done or waits again. */
void given(std::uint32_t semaphore);

/** Threads that wait, one line each, such as "i4Pmx_Connect waits for mutex 1". */
std::vector<std::string> waiting();

/** Report every thread that still waits as a misuse, and let it run to its end: its wait fails. Throws std::logic_error
 *  in a thread other than number 0. */
void end_all();

} // namespace board::threads
