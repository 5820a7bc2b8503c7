// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The flight recorder: the memory that it is lent, and the file in which it is read. A crash dump has it, too. */
#include <linux/debugfs.h>
#include <linux/err.h>
#include <linux/ktime.h>
#include <linux/module.h>
#include <linux/preempt.h>
#include <linux/sched.h>
#include <linux/vmalloc.h>

#include "pmx_port.h"
#include "pmx_recorder.h"

#define THREADS 253 /* numbers for threads; 0 is for interrupts */
#define TICK_SHIFT 10

static unsigned int recording = 64;
module_param(recording, uint, 0444);
MODULE_PARM_DESC(recording, "kilobytes of the flight recorder's ring, a power of two; 0: nothing is recorded");
static bool watch_all;
module_param(watch_all, bool, 0444);
MODULE_PARM_DESC(watch_all, "record what others do to the layer's private objects, too; for tests");

static struct debugfs_blob_wrapper memory;
static struct dentry *folder, *file;

/* In nanoseconds by a shift: a division would cost more than all the rest. */
static UINT32 time_now(void)
{
    return (UINT32)(ktime_get_mono_fast_ns() >> TICK_SHIFT);
}

static UINT32 thread_now(void)
{
    return in_task() ? 1 + (UINT32)task_pid_nr(current) % THREADS : 0;
}

/* Others may have the folder of that name already. */
static void show(void)
{
    struct dentry* found = debugfs_lookup("pmx", NULL);

    if (!found)
        folder = debugfs_create_dir("pmx", NULL);
    file = debugfs_create_blob("recording", 0400, found ? found : folder, &memory);
    dput(found);
}

int pmx_recorder_begin(void)
{
    PMX_RECORDER_SETUP_T setup = {
        .pu4Time = time_now, .pu4Thread = thread_now, .u4TickNs = 1u << TICK_SHIFT, .fgWatchAll = watch_all
    };

    if (!recording)
        return 0;
    memory.size = PMX_RECORDER_MEMORY(recording * 1024ul);
    memory.data = vzalloc(memory.size);
    if (!memory.data)
        return -ENOMEM;
    setup.pvMemory = memory.data;
    setup.u4Size = memory.size;
    if (!fgPmxRecorderStart(&setup))
    {
        vfree(memory.data);
        return -EINVAL;
    }
    show();
    return 0;
}

/* Last of all: whatever calls the layer, or is called by it, goes first. */
void pmx_recorder_end(void)
{
    if (!memory.data)
        return;
    PMX_RecorderStop();
    debugfs_remove(file);
    debugfs_remove(folder);
    vfree(memory.data);
}
