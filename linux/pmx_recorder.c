// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The flight recorder: the memory that it is lent, and the file in which it is read. A crash dump has it, too. */
#include <linux/atomic.h>
#include <linux/debugfs.h>
#include <linux/err.h>
#include <linux/fs.h>
#include <linux/ktime.h>
#include <linux/mm.h>
#include <linux/module.h>
#include <linux/preempt.h>
#include <linux/sched.h>
#include <linux/vmalloc.h>

#include "pmx_port.h"
#include "pmx_recorder.h"

#define THREADS 253 /* numbers for threads; 0 is for interrupts */
#define TICK_SHIFT 10
#define MOST_KILOBYTES 65536u

static unsigned int recording = 64;
module_param(recording, uint, 0444);
MODULE_PARM_DESC(recording, "kilobytes of the flight recorder's ring, a power of two; 0: nothing is recorded");
static bool watch_all;
module_param(watch_all, bool, 0444);
MODULE_PARM_DESC(watch_all, "record what others do to the layer's private objects, too; for tests");

static struct
{
    void* data;
    size_t size;
} memory;
static struct dentry *folder, *file;

/* In nanoseconds by a shift: a division would cost more than all the rest. */
static UINT32 time_now(void)
{
    return (UINT32)(ktime_get_mono_fast_ns() >> TICK_SHIFT);
}

/* Each has a number of its own, near its id: a replay takes one number for one thread. Numbers are not given back; when
 * there are no more, some threads share theirs. */
static UINT32 thread_now(void)
{
    static u32 known[THREADS];
    const u32 id = task_pid_nr(current);
    u32 at = id % THREADS;
    u32 i;

    if (!in_task())
        return 0;
    for (i = 0; i < THREADS; ++i, at = (at + 1) % THREADS)
    {
        u32 there = READ_ONCE(known[at]);

        if (!there)
            there = cmpxchg(&known[at], 0, id) ?: id;
        if (there == id)
            break;
    }
    return 1 + at;
}

/* Who opens the file has the recording as it is then. */
struct reading
{
    size_t size;
    u32 words[];
};

/* The layer goes on while it is copied: snapshots that were overwritten meanwhile are where nothing begins. */
static void drop_overwritten(PMX_RECORDER_T* copy)
{
    const PMX_RECORDER_T* now = memory.data;
    u32 head, i;

    smp_rmb(); /* the copy is older than this */
    head = READ_ONCE(now->u4Head);
    for (i = 0; i < PMX_RECORDER_SNAPSHOTS; ++i)
        if (head - copy->au4Snapshot[i] > copy->u4RingWords)
            copy->au4Snapshot[i] = copy->u4Head;
}

static int recording_open(struct inode* inode, struct file* opened)
{
    struct reading* copy = kvmalloc(sizeof *copy + memory.size, GFP_KERNEL);

    if (!copy)
        return -ENOMEM;
    copy->size = memory.size;
    memcpy(copy->words, memory.data, memory.size);
    drop_overwritten((PMX_RECORDER_T*)copy->words);
    opened->private_data = copy;
    return 0;
}

static ssize_t recording_read(struct file* opened, char __user* to, size_t count, loff_t* at)
{
    const struct reading* copy = opened->private_data;

    return simple_read_from_buffer(to, count, at, copy->words, copy->size);
}

static int recording_release(struct inode* inode, struct file* opened)
{
    kvfree(opened->private_data);
    return 0;
}

static const struct file_operations recording_operations = {
    .owner = THIS_MODULE,
    .open = recording_open,
    .read = recording_read,
    .release = recording_release,
    .llseek = default_llseek,
};

/* Others may have the folder of that name already. */
static void show(void)
{
    struct dentry* found = debugfs_lookup("pmx", NULL);

    if (!found)
        folder = debugfs_create_dir("pmx", NULL);
    file = debugfs_create_file("recording", 0400, found ? found : folder, NULL, &recording_operations);
    dput(found);
}

/* Where the ring lies in one piece a plain copy of the physical memory has it in one piece, too. */
static void* lend(size_t size)
{
    void* pages = alloc_pages_exact(size, GFP_KERNEL | __GFP_ZERO | __GFP_NOWARN);

    if (pages)
        return pages;
    pages = vzalloc(size);
    if (pages)
        pr_warn("pmx: the recording is scattered over the memory\n");
    return pages;
}

static void take_back(void)
{
    /* What is left of it is no recording. */
    memset(memory.data, 0, sizeof(PMX_RECORDER_T));
    if (is_vmalloc_addr(memory.data))
        vfree(memory.data);
    else
        free_pages_exact(memory.data, memory.size);
    memory.data = NULL;
}

/* A driver that works is worth more than a recording of it. */
void pmx_recorder_begin(void)
{
    PMX_RECORDER_SETUP_T setup = {
        .pu4Time = time_now, .pu4Thread = thread_now, .u4TickNs = 1u << TICK_SHIFT, .fgWatchAll = watch_all
    };

    if (!recording)
        return;
    if (recording <= MOST_KILOBYTES)
    {
        memory.size = PMX_RECORDER_MEMORY(recording * 1024ul);
        memory.data = lend(memory.size);
    }
    setup.pvMemory = memory.data;
    setup.u4Size = memory.size;
    if (memory.data && fgPmxRecorderStart(&setup))
    {
        show();
        return;
    }
    pr_warn("pmx: nothing is recorded: a ring of %u kilobytes cannot be had\n", recording);
    if (memory.data)
        take_back();
}

/* Last of all: whatever calls the layer, or is called by it, goes first. */
void pmx_recorder_end(void)
{
    if (!memory.data)
        return;
    PMX_RecorderStop();
    debugfs_remove(file);
    if (folder && simple_empty(folder)) /* others may have put files into it */
        debugfs_remove(folder);
    take_back();
}
