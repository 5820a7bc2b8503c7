// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Operating system: semaphores, timers, delay, formatted print. Every object stands in one table by its handle, so that
 * a wrong handle is refused, and what the layer has lost is found when the module goes. */
#include <linux/delay.h>
#include <linux/hrtimer.h>
#include <linux/ktime.h>
#include <linux/mutex.h>
#include <linux/printk.h>
#include <linux/sched.h>
#include <linux/semaphore.h>
#include <linux/slab.h>
#include <linux/xarray.h>

#include "pmx_port.h"
#include "u_os.h"

#define REFUSED (-1)
#define DELAY_SLACK_US 200 /* lets the kernel wake others in the same interrupt */

enum object_kind
{
    OBJECT_MUTEX,
    OBJECT_COUNTER, /* a binary or a counting semaphore */
    OBJECT_TIMER
};

struct timer
{
    struct hrtimer clock;
    HANDLE_T handle;
    x_timer_cb_fct callback;
    void* argument;
    ktime_t interval;
    bool repeats;
};

struct object
{
    enum object_kind kind;
    bool is_binary;
    struct task_struct* holder; /* of a mutex */
    union
    {
        struct mutex mutex;
        struct semaphore counter;
        struct timer timer;
    };
};

static DEFINE_XARRAY_ALLOC1(objects);
static u32 next_handle = 1;

static struct object* object_of(HANDLE_T handle)
{
    return handle ? xa_load(&objects, handle) : NULL;
}

static struct object* semaphore_of(HANDLE_T handle)
{
    struct object* object = object_of(handle);

    return object && object->kind != OBJECT_TIMER ? object : NULL;
}

static struct timer* timer_of(HANDLE_T handle)
{
    struct object* object = object_of(handle);

    return object && object->kind == OBJECT_TIMER ? &object->timer : NULL;
}

/* Handles go up for long before one comes again, so that a stale one is refused and does not hit another object. */
static INT32 keep(struct object* object, HANDLE_T* handle)
{
    u32 given;

    if (xa_alloc_cyclic(&objects, &given, object, xa_limit_31b, &next_handle, GFP_KERNEL) < 0)
    {
        kfree(object);
        return REFUSED;
    }
    if (object->kind == OBJECT_TIMER)
        object->timer.handle = given;
    *handle = given;
    return OSR_OK;
}

static void forget(HANDLE_T handle)
{
    kfree(xa_erase(&objects, handle));
}

INT32 x_sema_create(HANDLE_T* phSema, X_SEMA_TYPE_T eType, UINT32 u4InitValue)
{
    struct object* object;

    if (!phSema || eType > X_SEMA_TYPE_MUTEX || (eType != X_SEMA_TYPE_COUNTING && u4InitValue > 1))
        return REFUSED;
    object = kzalloc(sizeof(*object), GFP_KERNEL);
    if (!object)
        return REFUSED;
    object->kind = eType == X_SEMA_TYPE_MUTEX ? OBJECT_MUTEX : OBJECT_COUNTER;
    object->is_binary = eType == X_SEMA_TYPE_BINARY;
    if (object->kind == OBJECT_COUNTER)
        sema_init(&object->counter, u4InitValue);
    else
        mutex_init(&object->mutex);
    if (object->kind == OBJECT_MUTEX && u4InitValue == 0)
    {
        mutex_lock(&object->mutex);
        object->holder = current;
    }
    return keep(object, phSema);
}

/* Whoever holds the mutex and wants it again would wait for itself: that is refused, and the layer reports it. The
 * holder is looked at without the mutex: a thread finds itself there only when it has stored that itself. */
static INT32 lock_mutex(struct object* object, X_SEMA_OPTION_T eOption)
{
    if (READ_ONCE(object->holder) == current)
        return REFUSED;
    if (eOption != X_SEMA_OPTION_NOWAIT)
        mutex_lock(&object->mutex);
    else if (!mutex_trylock(&object->mutex))
        return REFUSED;
    WRITE_ONCE(object->holder, current);
    return OSR_OK;
}

INT32 x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption)
{
    struct object* object = semaphore_of(hSema);

    if (!object)
        return REFUSED;
    if (object->kind == OBJECT_MUTEX)
        return lock_mutex(object, eOption);
    if (eOption == X_SEMA_OPTION_NOWAIT)
        return down_trylock(&object->counter) ? REFUSED : OSR_OK;
    down(&object->counter);
    return OSR_OK;
}

INT32 x_sema_unlock(HANDLE_T hSema)
{
    struct object* object = semaphore_of(hSema);

    if (!object)
        return REFUSED;
    if (object->kind == OBJECT_MUTEX)
    {
        if (READ_ONCE(object->holder) != current)
            return REFUSED;
        WRITE_ONCE(object->holder, NULL);
        mutex_unlock(&object->mutex);
        return OSR_OK;
    }
    /* A binary semaphore that is free stays at one. */
    if (object->is_binary && !down_trylock(&object->counter))
        pr_debug("pmx: semaphore %u was free already\n", hSema);
    up(&object->counter);
    return OSR_OK;
}

INT32 x_sema_delete(HANDLE_T hSema)
{
    struct object* object = semaphore_of(hSema);

    if (!object || (object->kind == OBJECT_MUTEX && mutex_is_locked(&object->mutex)))
        return REFUSED;
    if (object->kind == OBJECT_MUTEX)
        mutex_destroy(&object->mutex);
    forget(hSema);
    return OSR_OK;
}

static enum hrtimer_restart expire(struct hrtimer* clock)
{
    struct timer* timer = container_of(clock, struct timer, clock);

    timer->callback(timer->handle, timer->argument);
    if (!timer->repeats)
        return HRTIMER_NORESTART;
    hrtimer_forward_now(clock, timer->interval);
    return HRTIMER_RESTART;
}

/* In soft interrupts, where the layer's expiry function belongs, and on time: a timer of the wheel comes up to an
 * eighth of its interval late. */
INT32 x_timer_create(HANDLE_T* phTimer)
{
    struct object* object = phTimer ? kzalloc(sizeof(*object), GFP_KERNEL) : NULL;

    if (!object)
        return REFUSED;
    object->kind = OBJECT_TIMER;
    hrtimer_init(&object->timer.clock, CLOCK_MONOTONIC, HRTIMER_MODE_REL_SOFT);
    object->timer.clock.function = expire;
    return keep(object, phTimer);
}

INT32 x_timer_start(HANDLE_T hTimer, UINT32 u4DelayMs, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback, void* pvArg)
{
    struct timer* timer = timer_of(hTimer);

    if (!timer || !pfCallback)
        return REFUSED;
    timer->callback = pfCallback;
    timer->argument = pvArg;
    timer->interval = ms_to_ktime(u4DelayMs);
    timer->repeats = eFlag == X_TIMER_FLAG_REPEAT;
    hrtimer_start(&timer->clock, timer->interval, HRTIMER_MODE_REL_SOFT);
    return OSR_OK;
}

/* Without waiting: it may be called by the expiry itself. */
INT32 x_timer_stop(HANDLE_T hTimer)
{
    struct timer* timer = timer_of(hTimer);

    if (!timer)
        return REFUSED;
    hrtimer_try_to_cancel(&timer->clock);
    return OSR_OK;
}

INT32 x_timer_delete(HANDLE_T hTimer)
{
    struct timer* timer = timer_of(hTimer);

    if (!timer)
        return REFUSED;
    hrtimer_cancel(&timer->clock);
    forget(hTimer);
    return OSR_OK;
}

/* PMX_Reset of a started layer, and PMX_Init behind PMX_Stop, lose the handles of a timer and a mutex. An expiry after
 * this would call code that is gone. */
void pmx_os_end(void)
{
    struct object* object;
    unsigned long handle;
    unsigned int left = 0;

    xa_for_each(&objects, handle, object)
    {
        if (object->kind == OBJECT_TIMER && hrtimer_cancel(&object->timer.clock))
            pr_info("pmx: timer %lu was still running\n", handle);
        forget(handle);
        left++;
    }
    if (left)
        pr_info("pmx: %u objects that the layer had lost were deleted\n", left);
    xa_destroy(&objects);
}

void x_thread_delay(UINT32 u4DelayMs)
{
    usleep_range(u4DelayMs * USEC_PER_MSEC, u4DelayMs * USEC_PER_MSEC + DELAY_SLACK_US);
}

INT32 x_vsnprintf(CHAR* szBuffer, size_t zSize, const CHAR* szFormat, va_list rArgs)
{
    return vsnprintf(szBuffer, zSize, szFormat, rArgs);
}
