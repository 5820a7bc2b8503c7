// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Measures mode changes when it is loaded. In virtual time a nanosecond is an instruction; nothing
 * else runs meanwhile, so that every run tells the same. */
#include <linux/irqflags.h>
#include <linux/ktime.h>
#include <linux/module.h>

#include "drv_pmx.h"
#include "pmx_port.h"

#define WARM_UP 4

static int rounds = 1000;
module_param(rounds, int, 0444);

static PMX_RESOLUTION_T first[PMX_OUTPUT_NUM], second[PMX_OUTPUT_NUM];
static UCHAR second_frequency;

static void fill(PMX_RESOLUTION_T* outputs, PMX_RESOLUTION_MODE_T hdmi, PMX_RESOLUTION_MODE_T component)
{
    memset(outputs, 0, sizeof(first));
    outputs[PMX_OUTPUT_HDMI].fgOutputEnable = TRUE;
    outputs[PMX_OUTPUT_HDMI].eResMode = hdmi;
    outputs[PMX_OUTPUT_CAV].fgOutputEnable = TRUE;
    outputs[PMX_OUTPUT_CAV].eResMode = component;
    outputs[PMX_OUTPUT_CVBS].fgOutputEnable = TRUE;
    outputs[PMX_OUTPUT_CVBS].eResMode = RES_480I;
}

static noinline void change(int step)
{
    PMX_SetModeEx(0, step & 1 ? second : first, step & 1 ? second_frequency : 60, DRV_NON_EXT_CHIP, 0);
}

/* As much as the loop and the choice of an argument take. */
static noinline void do_nothing(int step)
{
    asm volatile("" : : "r"(step & 1 ? second : first), "r"(step & 1 ? second_frequency : 60));
}

static u64 time_of(void (*step)(int))
{
    unsigned long flags;
    u64 begun;
    int i;

    for (i = 0; i < WARM_UP; i++)
        step(i);
    local_irq_save(flags);
    begun = ktime_get_ns();
    for (i = 0; i < rounds; i++)
        step(i);
    begun = ktime_get_ns() - begun;
    local_irq_restore(flags);
    return begun;
}

static void measure(const char* what)
{
    u64 took = time_of(change), nothing = time_of(do_nothing);

    pr_info("COST %s %s %llu %d\n", THIS_MODULE->name, what, took - nothing, rounds);
}

/* Where the console is empty, there is nothing to begin. */
void __weak pmx_console_begin(void)
{
}

void __weak pmx_console_end(void)
{
}

static int __init measure_begin(void)
{
    pmx_console_begin();
    PMX_Reset(0);
    fill(first, RES_1080P60HZ, RES_480P);
    fill(second, RES_720P60HZ, RES_480P);
    second_frequency = 60;
    measure("mode");
    fill(second, RES_720P50HZ, RES_576P);
    second_frequency = 50;
    measure("frequency");
    fill(second, RES_1080P60HZ, RES_480P);
    second_frequency = 60;
    measure("again");
    pmx_console_end();
    return 0;
}

static void __exit measure_end(void)
{
}

module_init(measure_begin);
module_exit(measure_end);
MODULE_DESCRIPTION("what the layer costs");
MODULE_LICENSE("Dual MIT/GPL");
