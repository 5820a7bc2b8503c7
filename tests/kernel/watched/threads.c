// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Three threads of a stack that is busy: one sets modes, one has sources come and go, one reports. The display timer
 * runs out meanwhile, in its own context. Writing a number to the parameter "threads" has each make so many calls, and
 * go on until the others have; the parameter tells then what was done. */
#include <linux/atomic.h>
#include <linux/completion.h>
#include <linux/delay.h>
#include <linux/kthread.h>
#include <linux/module.h>
#include <linux/preempt.h>

#include "drv_if.h"
#include "drv_if_vdp.h"
#include "drv_pmx.h"
#include "u_os.h"
#include "x_vid_dec.h"

#define REPORT_EVERY 64 /* of its steps, for it takes as long as all others */
#define SHORT_MS 2      /* of the display timer, so that it runs out while modes change */

static unsigned int least;
static atomic_t calls, expiries, misplaced, behind, running;
static DECLARE_COMPLETION(all_ended);

/* The timer's own context: a soft interrupt. */
static x_timer_cb_fct expiry;

static void expire(HANDLE_T hTimer, void* pvArg)
{
    atomic_inc(&expiries);
    if (!in_serving_softirq())
        atomic_inc(&misplaced);
    expiry(hTimer, pvArg);
}

INT32 __real_x_timer_start(HANDLE_T hTimer, UINT32 u4DelayMs, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback,
                           void* pvArg);
INT32 __wrap_x_timer_start(HANDLE_T hTimer, UINT32 u4DelayMs, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback,
                           void* pvArg);
INT32 __wrap_x_timer_start(HANDLE_T hTimer, UINT32 u4DelayMs, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback,
                           void* pvArg)
{
    WRITE_ONCE(expiry, pfCallback);
    return __real_x_timer_start(hTimer, u4DelayMs, eFlag, pfCallback ? expire : NULL, pvArg);
}

static void set_outputs(PMX_RESOLUTION_MODE_T mode, UCHAR frequency)
{
    PMX_RESOLUTION_T outputs[PMX_OUTPUT_NUM] = {};
    int i;

    for (i = 0; i < PMX_OUTPUT_NUM; i++)
    {
        outputs[i].fgOutputEnable = TRUE;
        outputs[i].eResMode = mode;
    }
    outputs[PMX_OUTPUT_CVBS].eResMode = RES_480I;
    PMX_SetModeEx(0, outputs, frequency, DRV_NON_EXT_CHIP, 0);
}

static void set_modes(unsigned int step)
{
    bool on = step / 8 % 2;

    switch (step % 8)
    {
    case 0: set_outputs(on ? RES_1080P60HZ : RES_720P50HZ, on ? 60 : 50); break;
    case 1:
        PMX_SetFormatChangeFlag(TRUE);
        PMX_SetOsdEnableFlag(TRUE);
        PMX_SetFormatChangeTimer(SHORT_MS);
        break;
    case 2: PMX_SetAspectRatio(0, on ? ASP_16_9 : ASP_4_3); break;
    case 3: PMX_SetBrightness(0, on ? 128 : 160, 1); break;
    case 4: PMX_SetMode(0, on ? RES_720P50HZ : RES_480P, on ? 50 : 60, 0); break;
    case 5: PMX_SetArbPlaneOrder(0, on ? 0x76543210 : 0x67543210); break;
    case 6: PMX_SetMuteEnable(0, on); break;
    default: usleep_range(SHORT_MS * 1000, SHORT_MS * 1500);
    }
}

static void move_sources(unsigned int step)
{
    UCHAR plane = step / 8 % 2;

    switch (step % 8)
    {
    case 0: i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, plane); break;
    case 1: PMX_VdpEnabled(0, plane, 1920, 1080, 0); break;
    case 2: i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, plane); break;
    case 3: PMX_OsdEnabled(0, plane, 720, 576, DRV_GFX_COLOR_MODE_YCBCR); break;
    case 4: PMX_InformVdpColorSpace(0); break;
    case 5: PMX_VdpDisabled(0, plane); break;
    case 6: PMX_OsdDisabled(0, plane); break;
    default: i4Pmx_Disconnect(PMX_COMP_TYPE_PMX, 0, step / 16 % 2 ? PMX_COMP_TYPE_OSD : PMX_COMP_TYPE_VDP, plane);
    }
}

static void report(unsigned int step)
{
    UINT32 value = 0, height = 0;
    UCHAR mode = 0;

    switch (step % 8)
    {
    case 0:
        if (step % REPORT_EVERY == 0)
            PMX_QueryStatus();
        break;
    case 1: PMX_GetMode(0, &mode); break;
    case 2: PMX_GetOutSize(0, &value, &height); break;
    case 3: PMX_GetAspectRatio(0, &value); break;
    case 4: PMX_GetTvType(0, &mode); break;
    case 5: fgPMX_DisplayModeReady(); break;
    case 6: PMX_SetFormatChangeFlag(FALSE); break;
    default: PMX_InformVdpColorSpace(0);
    }
}

static void (*const jobs[])(unsigned int step) = { set_modes, move_sources, report };

static int work(void* job)
{
    void (*const step)(unsigned int) = *(void (*const*)(unsigned int))job;
    unsigned int i;

    for (i = 0; i < least || atomic_read(&behind) > 0; i++)
    {
        step(i);
        atomic_inc(&calls);
        if (i + 1 == least)
            atomic_dec(&behind);
        if (i % 16 == 0)
            cond_resched();
    }
    if (atomic_dec_and_test(&running))
        complete(&all_ended);
    return 0;
}

static UINT32 be_told(void* tag, DRV_PMX_COLOR_SPACE_T space)
{
    might_sleep();
    return 1;
}

static const IVdp told_plane = { .pu4SetColorMode = be_told };

static int threads_set(const char* value, const struct kernel_param* parameter)
{
    unsigned int i;
    int result = kstrtouint(value, 0, &least);

    if (result || !least)
        return -EINVAL;
    for (i = 0; i < 2; i++)
        i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, i, IID_IVdp, &told_plane, NULL);
    atomic_set(&behind, ARRAY_SIZE(jobs));
    atomic_set(&running, ARRAY_SIZE(jobs));
    for (i = 0; i < ARRAY_SIZE(jobs); i++)
    {
        struct task_struct* thread = kthread_run(work, (void*)&jobs[i], "pmx_thread_%u", i);

        if (!IS_ERR(thread))
            continue;
        atomic_dec(&behind);
        if (atomic_dec_and_test(&running))
            complete(&all_ended);
    }
    wait_for_completion(&all_ended);
    for (i = 0; i < 2; i++)
        i4ImUnregisterInterface2(PMX_COMP_TYPE_VDP, i, IID_IVdp);
    return 0;
}

static int threads_get(char* text, const struct kernel_param* parameter)
{
    return sysfs_emit(text, "%d calls, %d expiries, %d misplaced\n", atomic_read(&calls), atomic_read(&expiries),
                      atomic_read(&misplaced));
}

static const struct kernel_param_ops threads = { .set = threads_set, .get = threads_get };
module_param_cb(threads, &threads, NULL, 0600);
