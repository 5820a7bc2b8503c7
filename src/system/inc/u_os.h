// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Operating-system layer, console, flash partitions, register access and power management of the stack.
 *  OSR_OK is the one success of an operating-system call. */
#ifndef U_OS_H
#define U_OS_H

#include "x_typedef.h"

/* Kernels before 5.15 have no header of their own for it, and take the compiler's. */
#if defined(__KERNEL__) && !defined(__cplusplus) && defined(__has_include)
#if __has_include(<linux/stdarg.h>)
#include <linux/stdarg.h>
#else
#include <stdarg.h>
#endif
#else
#include <stdarg.h>
#endif

#ifdef __cplusplus
extern "C" {
#endif

#define OSR_OK 0

typedef DRV_ENUM(X_SEMA_TYPE_T)
{
    X_SEMA_TYPE_BINARY = 0,
    X_SEMA_TYPE_COUNTING = 1,
    X_SEMA_TYPE_MUTEX = 2
} X_SEMA_TYPE_T;

typedef DRV_ENUM(X_SEMA_OPTION_T)
{
    X_SEMA_OPTION_WAIT = 1, /**< wait for ever */
    X_SEMA_OPTION_NOWAIT = 2
} X_SEMA_OPTION_T;

typedef DRV_ENUM(X_TIMER_FLAG_T)
{
    X_TIMER_FLAG_ONCE = 1,
    X_TIMER_FLAG_REPEAT = 2
} X_TIMER_FLAG_T;

DRV_STATIC_ASSERT(sizeof(X_SEMA_TYPE_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(X_SEMA_OPTION_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(X_TIMER_FLAG_T) == 4, "enumerations are 32 bits wide");

/** Expiry function of a timer; called where nobody may sleep.
 *  @param     hTimer  the timer that ran out
 *  @param[in] pvArg   [tag] the argument given to x_timer_start */
typedef void (*x_timer_cb_fct)(HANDLE_T hTimer, void* pvArg);

/** Create a semaphore.
 *  The stack guarantees that a failed creation leaves *phSema as it was.
 *  @param[out] phSema       receives the handle, never 0 on success
 *  @param      eType        binary, counting, or mutex (owned by the thread that locked it)
 *  @param      u4InitValue  1: free, 0: taken; a count for a counting semaphore
 *  @return OSR_OK or a failure
 *  @context a thread that may sleep */
INT32 x_sema_create(HANDLE_T* phSema, X_SEMA_TYPE_T eType, UINT32 u4InitValue);

/** Take a semaphore. The mixer waits for ever and never nests its mutex.
 *  @param hSema    handle from x_sema_create
 *  @param eOption  wait or not
 *  @return OSR_OK or a failure (a bad handle, for instance 0)
 *  @context a thread that may sleep */
INT32 x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption);

/** Give a semaphore back.
 *  The stack guarantees that the semaphore is free again even when a failure is reported to its holder.
 *  @param hSema  handle from x_sema_create
 *  @return OSR_OK or a failure
 *  @context the thread that holds it */
INT32 x_sema_unlock(HANDLE_T hSema);

/** Delete a semaphore. A failed deletion leaves it usable.
 *  @param hSema  handle from x_sema_create
 *  @return OSR_OK or a failure
 *  @context a thread that may sleep */
INT32 x_sema_delete(HANDLE_T hSema);

/** Create a timer, stopped.
 *  The stack guarantees that a failed creation leaves *phTimer as it was. It keeps a list of the timers that exist: the
 *  mixer can lose the handle of its own, running or not (PMX_Reset, PMX_Init behind PMX_Stop), and when the stack is
 *  unloaded it deletes, behind PMX_Uninit, what is left.
 *  @param[out] phTimer  receives the handle, never 0 on success
 *  @return OSR_OK or a failure
 *  @context a thread that may sleep */
INT32 x_timer_create(HANDLE_T* phTimer);

/** Start a timer, from its full interval when it is running.
 *  @param     hTimer      handle from x_timer_create
 *  @param     u4DelayMs   interval in milliseconds
 *  @param     eFlag       once or repeatedly
 *  @param[in] pfCallback  [symbol] expiry function, called in the timer's context
 *  @param[in] pvArg       [tag] handed to the expiry function
 *  @return OSR_OK or a failure (a bad handle, for instance 0)
 *  @context any thread */
INT32 x_timer_start(HANDLE_T hTimer, UINT32 u4DelayMs, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback, void* pvArg);

/** Stop a timer; succeeds also when it is not running.
 *  An expiry that has already begun is not waited for.
 *  @param hTimer  handle from x_timer_create
 *  @return OSR_OK or a failure (a bad handle, for instance 0)
 *  @context any thread */
INT32 x_timer_stop(HANDLE_T hTimer);

/** Stop and delete a timer. Lets an expiry that is under way come to its end: when it returns, the expiry function is
 *  not running and will not run again, and what it reaches may go. The mixer holds no lock meanwhile.
 *  @param hTimer  handle from x_timer_create
 *  @return OSR_OK or a failure (a bad handle, for instance 0)
 *  @context a thread that may sleep */
INT32 x_timer_delete(HANDLE_T hTimer);

/** Sleep.
 *  @param u4DelayMs  at least so many milliseconds
 *  @context a thread that may sleep */
void x_thread_delay(UINT32 u4DelayMs);

/** Format text; always terminates it.
 *  @param[out] szBuffer  [text of zSize] receives the text
 *  @param      zSize     its size in characters, terminator included
 *  @param[in]  szFormat  [text] printf format
 *  @param      rArgs     its values
 *  @return length that the whole text has, without the terminator; negative on a failure
 *  @context any */
INT32 x_vsnprintf(CHAR* szBuffer, size_t zSize, const CHAR* szFormat, va_list rArgs) DRV_PRINTF_FORMAT(3, 0);

/** Levelled console print: prints when the console's level admits i4Level.
 *  A null string argument is printed as (null).
 *  @param     i4Level   0 status report, warnings, handshake; 1 life cycle and display-mode progress; 5 errors; 8
 *                       source and plane events, refusals; 9 whatever else helps to follow the layer, and what the
 *                       interface manager refuses
 *  @param[in] szFormat  [text] printf format
 *  @context any, the timer's included */
void PMX_IsLog(INT32 i4Level, const CHAR* szFormat, ...) DRV_PRINTF_FORMAT(2, 3);

/** Unconditional console print. A null string argument is printed as (null).
 *  @param[in] szFormat  [text] printf format
 *  @context any */
void Printf(const CHAR* szFormat, ...) DRV_PRINTF_FORMAT(1, 2);

/** Unconditional console print of the utility layer. A null string argument is printed as (null).
 *  @param[in] szFormat  [text] printf format
 *  @context any */
void UTIL_Printf(const CHAR* szFormat, ...) DRV_PRINTF_FORMAT(1, 2);

/** Report a broken invariant and return: the caller goes on.
 *  @param[in] szExpression  [text] the invariant, or "0"
 *  @param[in] szFile        [text] source path relative to the project's root
 *  @param     i4Line        line in it
 *  @context any, the timer's included */
void Assert(const CHAR* szExpression, const CHAR* szFile, INT32 i4Line);

/** Find a flash partition.
 *  @param[in] szName  [text] its name
 *  @return its id; negative: no such partition
 *  @context a thread that may sleep */
INT32 get_part_id_by_name(const CHAR* szName);

/** Read from a flash partition.
 *  The stack guarantees that a negative id or a read past the end is answered by a failure; the caller does not look.
 *  @param      i4PartId  id from get_part_id_by_name
 *  @param      u4Offset  first byte
 *  @param[out] pvDest    [u4Count bytes] receives u4Count bytes; left as it was by a failed read
 *  @param      u4Count   number of bytes
 *  @return bytes read, negative on a failure
 *  @context a thread that may sleep */
INT32 i4NFBPartitionRead(INT32 i4PartId, UINT32 u4Offset, void* pvDest, UINT32 u4Count);

/** Read a register of the chip's I/O space, 32 bits in one access of device memory.
 *  @param u4Address  its address
 *  @return its value
 *  @context any */
UINT32 x_reg_read32(UINT32 u4Address);

/** Write a register of the chip's I/O space, 32 bits in one access of device memory, in program order.
 *  @param u4Address  its address
 *  @param u4Value    the new value
 *  @context any */
void x_reg_write32(UINT32 u4Address, UINT32 u4Value);

/** What the kernel calls when the system goes to sleep and wakes up; 0 is success. */
typedef struct
{
    int (*suspend)(void* param);
    int (*resume)(void* param);
} PM_OPERATIONS_T;

/** Register power-management operations.
 *  @param[in] prOps  [symbol] the operations; the object stays where it is until it is unregistered
 *  @return 0, negative on a failure
 *  @context a thread that may sleep */
int register_pm_ops(const PM_OPERATIONS_T* prOps);

/** Withdraw power-management operations.
 *  @param[in] prOps  [symbol] the object that was registered
 *  @return 0, negative on a failure
 *  @context a thread that may sleep */
int unregister_pm_ops(const PM_OPERATIONS_T* prOps);

#ifdef __cplusplus
}
#endif

#endif
