// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Power management: one platform device, for whose driver the kernel calls what was registered: in order of
 * registration when it goes to sleep, backwards when it wakes up. */
#include <linux/err.h>
#include <linux/mutex.h>
#include <linux/platform_device.h>

#include "pmx_port.h"
#include "u_os.h"

#define MOST_OPERATIONS 4

static const PM_OPERATIONS_T* registered[MOST_OPERATIONS];
static DEFINE_MUTEX(registered_lock);

/* The place of the operations; of NULL the first that is free. */
static int place_of(const PM_OPERATIONS_T* operations)
{
    int i;

    for (i = 0; i < MOST_OPERATIONS; i++)
    {
        if (registered[i] == operations)
            return i;
    }
    return -1;
}

/* A layer that was stopped and started again registers once more, and is kept once. */
int register_pm_ops(const PM_OPERATIONS_T* prOps)
{
    int result = -1;

    if (!prOps)
        return -1;
    mutex_lock(&registered_lock);
    if (place_of(prOps) >= 0)
        result = 0;
    else if (place_of(NULL) >= 0)
    {
        registered[place_of(NULL)] = prOps;
        result = 0;
    }
    mutex_unlock(&registered_lock);
    return result;
}

int unregister_pm_ops(const PM_OPERATIONS_T* prOps)
{
    int place = -1;

    mutex_lock(&registered_lock);
    if (prOps)
        place = place_of(prOps);
    if (place >= 0)
        registered[place] = NULL;
    mutex_unlock(&registered_lock);
    return place < 0 ? -1 : 0;
}

/* Everybody is called; the first failure counts. The kernel has frozen all threads that could register meanwhile. */
static int pmx_suspend(struct device* device)
{
    int i, result = 0;

    for (i = 0; i < MOST_OPERATIONS; i++)
    {
        int answer = registered[i] ? registered[i]->suspend(NULL) : 0;

        result = result ? result : answer;
    }
    return result;
}

static int pmx_resume(struct device* device)
{
    int i, result = 0;

    for (i = MOST_OPERATIONS - 1; i >= 0; i--)
    {
        int answer = registered[i] ? registered[i]->resume(NULL) : 0;

        result = result ? result : answer;
    }
    return result;
}

static DEFINE_SIMPLE_DEV_PM_OPS(pmx_pm, pmx_suspend, pmx_resume);

static struct platform_driver pmx_driver = { .driver = { .name = "pmx", .pm = pm_sleep_ptr(&pmx_pm) } };
static struct platform_device* pmx_device;

int pmx_power_begin(void)
{
    int result = platform_driver_register(&pmx_driver);

    if (result)
        return result;
    pmx_device = platform_device_register_simple("pmx", PLATFORM_DEVID_NONE, NULL, 0);
    if (!IS_ERR(pmx_device))
        return 0;
    platform_driver_unregister(&pmx_driver);
    return PTR_ERR(pmx_device);
}

void pmx_power_end(void)
{
    platform_device_unregister(pmx_device);
    platform_driver_unregister(&pmx_driver);
}
