// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Console: text is put aside and a work item prints it, so that nobody waits for a serial line, the timer's context
 * least of all. */
#include <linux/atomic.h>
#include <linux/kfifo.h>
#include <linux/module.h>
#include <linux/printk.h>
#include <linux/spinlock.h>
#include <linux/workqueue.h>

#include "pmx_port.h"
#include "u_os.h"

#define LONGEST_TEXT 512 /* as PMX_Printf makes them at most */
#define ASIDE 16384      /* a whole status report, and some */

static int loglevel = 1;
module_param(loglevel, int, 0644);
MODULE_PARM_DESC(loglevel, "the highest level of PMX_IsLog that is printed; -1: none");

static STRUCT_KFIFO_REC_2(ASIDE) aside;
static DEFINE_SPINLOCK(aside_lock);
static atomic_t lost;

static void print_aside(struct work_struct* work)
{
    char text[LONGEST_TEXT];
    unsigned int length;

    while ((length = kfifo_out(&aside, text, sizeof(text) - 1)) != 0)
    {
        text[length] = '\0';
        printk(KERN_INFO "pmx: %s", text);
    }
    length = atomic_xchg(&lost, 0);
    if (length)
        pr_warn("pmx: %u lines found no room and are lost\n", length);
}

static DECLARE_WORK(print_work, print_aside);

static void put_aside(const CHAR* format, va_list values)
{
    char text[LONGEST_TEXT];
    int length = vscnprintf(text, sizeof(text), format, values);

    if (length > 0 && !kfifo_in_spinlocked(&aside, text, length, &aside_lock))
        atomic_inc(&lost);
    schedule_work(&print_work);
}

void PMX_IsLog(INT32 i4Level, const CHAR* szFormat, ...)
{
    va_list values;

    if (i4Level > loglevel)
        return;
    va_start(values, szFormat);
    put_aside(szFormat, values);
    va_end(values);
}

void Printf(const CHAR* szFormat, ...)
{
    va_list values;

    va_start(values, szFormat);
    put_aside(szFormat, values);
    va_end(values);
}

void UTIL_Printf(const CHAR* szFormat, ...)
{
    va_list values;

    va_start(values, szFormat);
    put_aside(szFormat, values);
    va_end(values);
}

/* The layer goes on behind a broken invariant, and may meet it at every call: the kernel's log is not to overflow. */
void Assert(const CHAR* szExpression, const CHAR* szFile, INT32 i4Line)
{
    pr_err_ratelimited("pmx: ASSERT %s, %s:%d\n", szExpression, szFile, i4Line);
}

void pmx_console_begin(void)
{
    INIT_KFIFO(aside);
}

void pmx_console_end(void)
{
    flush_work(&print_work);
}
