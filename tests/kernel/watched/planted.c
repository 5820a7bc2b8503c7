// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Faults as a driver makes them, one by one, by their names in the parameter "plant": whoever watches has to see
 * each. */
#include <linux/bottom_half.h>
#include <linux/delay.h>
#include <linux/hrtimer.h>
#include <linux/kthread.h>
#include <linux/module.h>
#include <linux/mutex.h>
#include <linux/slab.h>
#include <linux/string.h>

#include "drv_if.h"
#include "drv_if_vdp.h"
#include "drv_pmx.h"

#define LOST_OBJECTS 8
#define LONG_S 1000
#define RACING_ROUNDS 20000

/* A video plane that holds its own lock around calls of the mixer, and takes it when the mixer calls. */
static DEFINE_MUTEX(plane_lock);

static UINT32 take_lock(void* tag, DRV_PMX_COLOR_SPACE_T space)
{
    mutex_lock(&plane_lock);
    mutex_unlock(&plane_lock);
    return 1;
}

static const IVdp locking_plane = { .pu4SetColorMode = take_lock };

static noinline void plant_lock_order(void)
{
    i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, 0, IID_IVdp, &locking_plane, NULL);
    i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, 0);
    PMX_InformVdpColorSpace(0);
    mutex_lock(&plane_lock);
    i4Pmx_Disconnect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, 0);
    mutex_unlock(&plane_lock);
    i4ImUnregisterInterface2(PMX_COMP_TYPE_VDP, 0, IID_IVdp);
}

/* A request that is gone when the layer copies it. */
static noinline void plant_use_after_free(void)
{
    PMX_RESOLUTION_T* outputs = kcalloc(PMX_OUTPUT_NUM, sizeof(*outputs), GFP_KERNEL);

    kfree(outputs);
    PMX_SetModeEx(0, outputs, 60, DRV_NON_EXT_CHIP, 0);
}

/* A source that connects where nobody may sleep. */
static noinline void plant_sleep(void)
{
    local_bh_disable();
    i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, 0);
    local_bh_enable();
}

/* A timer that goes while it runs. */
static enum hrtimer_restart never(struct hrtimer* clock)
{
    return HRTIMER_NORESTART;
}

static noinline void plant_object(void)
{
    struct hrtimer* clock = kzalloc(sizeof(*clock), GFP_KERNEL);

    if (!clock)
        return;
    hrtimer_init(clock, CLOCK_MONOTONIC, HRTIMER_MODE_REL_SOFT);
    clock->function = never;
    hrtimer_start(clock, ktime_set(LONG_S, 0), HRTIMER_MODE_REL_SOFT);
    kfree(clock);
}

/* A plane's number that no word has bits for. */
static noinline void plant_shift(void)
{
    static volatile int plane = 40, mask;

    mask |= 1 << plane;
}

/* Several, for an address may be left on a stack by chance. */
static noinline void plant_leak(void)
{
    int i;

    for (i = 0; i < LOST_OBJECTS; i++)
    {
        volatile char* lost = kmalloc(100 + i, GFP_KERNEL);

        if (lost)
            lost[0] = 1;
    }
}

/* What two threads count without a lock. */
static unsigned int counted;

static noinline int count(void* nothing)
{
    int i;

    for (i = 0; i < RACING_ROUNDS; i++)
    {
        counted++;
        barrier();
    }
    while (nothing && !kthread_should_stop())
        msleep(1);
    return 0;
}

static noinline void plant_race(void)
{
    struct task_struct* other = kthread_run(count, &counted, "pmx_other");

    if (IS_ERR(other))
        return;
    count(NULL);
    kthread_stop(other);
}

static const struct
{
    const char* name;
    void (*plant)(void);
} faults[] = {
    { "lock-order", plant_lock_order },
    { "use-after-free", plant_use_after_free },
    { "sleep", plant_sleep },
    { "object", plant_object },
    { "shift", plant_shift },
    { "leak", plant_leak },
    { "race", plant_race },
};

static int plant_set(const char* value, const struct kernel_param* parameter)
{
    int i;

    for (i = 0; i < ARRAY_SIZE(faults); i++)
    {
        if (sysfs_streq(value, faults[i].name))
        {
            faults[i].plant();
            return 0;
        }
    }
    return -EINVAL;
}

static const struct kernel_param_ops plant = { .set = plant_set };
module_param_cb(plant, &plant, NULL, 0200);
