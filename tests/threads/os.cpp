// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The operating-system layer on POSIX threads: one mutex, one timer, and no console. */
#include "stand_ins.h"

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <pthread.h>
#include <sched.h>
#include <unistd.h>

namespace stand_ins
{
namespace
{

constexpr HANDLE_T MUTEX_HANDLE = 1;
constexpr HANDLE_T TIMER_HANDLE = 2;
constexpr INT32 OSR_FAIL = -1;
constexpr unsigned MOST_PRINTED = 10;
constexpr unsigned YIELD_EVERY = 5; // odd, so that locks and unlocks take turns

pthread_mutex_t mutex;
bool mutex_exists; // changed while one thread runs
bool timer_exists;
std::atomic<x_timer_cb_fct> timer_callback; // null while the timer stands still
thread_local bool mutex_held;
std::atomic<unsigned> breach_count;

/* Let another thread run now and then right behind a lock or unlock: there a mistake shows, and the stretch in which it
 * does is short. */
void yield_at_times()
{
    thread_local unsigned times;
    if (++times % YIELD_EVERY == 0)
        sched_yield();
}

bool is_set(const char* name)
{
    const char* value = std::getenv(name);
    return value != nullptr && std::strcmp(value, "1") == 0;
}

const Faults active_faults = { .no_lock = is_set("PMX_THREADS_NO_LOCK"),
                               .connect_inside = is_set("PMX_THREADS_CONNECT_INSIDE") };

} // namespace

const Faults& faults()
{
    return active_faults;
}

/* Past the C library's streams, whose locks would order the threads; not to where ThreadSanitizer reports. */
void breach(const char* what)
{
    if (breach_count.fetch_add(1, std::memory_order_relaxed) >= MOST_PRINTED)
        return;
    char line[200];
    int length = std::snprintf(line, sizeof line, "breach: %s\n", what);
    if (write(STDOUT_FILENO, line, static_cast<size_t>(length)) != length)
        std::abort();
}

unsigned breaches()
{
    return breach_count.load(std::memory_order_relaxed);
}

bool holds_mutex()
{
    return mutex_held;
}

bool expire_timer()
{
    x_timer_cb_fct callback = timer_callback.exchange(nullptr, std::memory_order_relaxed);
    if (callback == nullptr)
        return false;
    callback(TIMER_HANDLE, nullptr);
    return true;
}

unsigned objects()
{
    return (mutex_exists ? 1u : 0u) + (timer_exists ? 1u : 0u);
}

} // namespace stand_ins

using namespace stand_ins;

INT32 x_sema_create(HANDLE_T* phSema, X_SEMA_TYPE_T eType, UINT32 u4InitValue)
{
    if (mutex_exists || eType != X_SEMA_TYPE_MUTEX || u4InitValue != 1)
        return OSR_FAIL;
    pthread_mutex_init(&mutex, nullptr);
    mutex_exists = true;
    *phSema = MUTEX_HANDLE;
    return OSR_OK;
}

/* A thread that locks what it holds waits for itself, as it would on a product. */
INT32 x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption)
{
    if (hSema != MUTEX_HANDLE || eOption != X_SEMA_OPTION_WAIT)
        return OSR_FAIL;
    if (faults().no_lock)
        return OSR_OK;
    if (mutex_held)
        breach("x_sema_lock by the thread that holds the mutex");
    if (pthread_mutex_lock(&mutex) != 0)
        return OSR_FAIL;
    mutex_held = true;
    yield_at_times();
    return OSR_OK;
}

INT32 x_sema_unlock(HANDLE_T hSema)
{
    if (hSema != MUTEX_HANDLE)
        return OSR_FAIL;
    if (faults().no_lock)
        return OSR_OK;
    if (!mutex_held)
        breach("x_sema_unlock by a thread that does not hold the mutex");
    mutex_held = false;
    if (pthread_mutex_unlock(&mutex) != 0)
        return OSR_FAIL;
    yield_at_times();
    return OSR_OK;
}

INT32 x_sema_delete(HANDLE_T hSema)
{
    if (hSema != MUTEX_HANDLE || !mutex_exists || pthread_mutex_destroy(&mutex) != 0)
        return OSR_FAIL;
    mutex_exists = false;
    return OSR_OK;
}

INT32 x_timer_create(HANDLE_T* phTimer)
{
    if (timer_exists)
        return OSR_FAIL;
    timer_exists = true;
    *phTimer = TIMER_HANDLE;
    return OSR_OK;
}

INT32 x_timer_start(HANDLE_T hTimer, UINT32, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback, void* pvArg)
{
    if (hTimer != TIMER_HANDLE || eFlag != X_TIMER_FLAG_ONCE || pvArg != nullptr)
        return OSR_FAIL;
    timer_callback.store(pfCallback, std::memory_order_relaxed);
    return OSR_OK;
}

INT32 x_timer_stop(HANDLE_T hTimer)
{
    if (hTimer != TIMER_HANDLE)
        return OSR_FAIL;
    timer_callback.store(nullptr, std::memory_order_relaxed);
    return OSR_OK;
}

INT32 x_timer_delete(HANDLE_T hTimer)
{
    if (hTimer != TIMER_HANDLE || !timer_exists)
        return OSR_FAIL;
    timer_exists = false;
    return x_timer_stop(hTimer);
}

void Assert(const CHAR* szExpression, const CHAR* szFile, INT32 i4Line)
{
    char text[160];
    std::snprintf(text, sizeof text, "Assert(\"%s\", %s, %d)", szExpression, szFile, i4Line);
    breach(text);
}
