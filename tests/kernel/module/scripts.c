// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* What a scenario can have the neighbours do: as much of the virtual board as scenarios use. */
#include <linux/completion.h>
#include <linux/delay.h>
#include <linux/hrtimer.h>
#include <linux/kthread.h>
#include <linux/module.h>
#include <linux/mtd/mtd.h>
#include <linux/platform_device.h>
#include <linux/sched.h>
#include <linux/spinlock.h>
#include <linux/string.h>

#include "drv_av_d.h"
#include "drv_if.h"
#include "drv_if_vdp.h"
#include "drv_pmx.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "record.h"

#define PLANES 8
#define VIDEO_PLANES 4
#define HARDWARE_VIDEO_PLANES 3
#define OSD_PLANES 6
#define FIRST_TAG 10
#define MOST_SCRIPTS 8
#define FLASH_BYTES 64

/* Failures, and what happens inside a call */

struct script
{
    char function[40]; /* empty: none */
    char command[120];
    int answer;
    enum
    {
        ON_CALL,
        FROM_CALL,
        ALWAYS
    } when;
    unsigned int n, calls;
    bool as_thread;
};

static struct script failures[MOST_SCRIPTS], meanwhiles[MOST_SCRIPTS];
static DEFINE_SPINLOCK(scripts_lock);

/* One that is free, or the failure that the function has already. */
static struct script* place_for(struct script* all, const char* function)
{
    struct script *one, *free = NULL;

    for (one = all; one < all + MOST_SCRIPTS; one++)
    {
        if (all == failures && strcmp(one->function, function) == 0)
            return one;
        if (!one->function[0] && !free)
            free = one;
    }
    return free;
}

static bool is_due(struct script* script)
{
    script->calls++;
    if (script->when == ALWAYS)
        return true;
    return script->when == FROM_CALL ? script->calls >= script->n : script->calls == script->n;
}

bool script_fails(const char* function, int* answer)
{
    struct script* one;
    bool fails = false;

    spin_lock_bh(&scripts_lock);
    for (one = failures; one < failures + MOST_SCRIPTS; one++)
    {
        if (strcmp(one->function, function) != 0 || !is_due(one))
            continue;
        *answer = one->answer;
        fails = true;
        if (one->when == ON_CALL)
            one->function[0] = '\0';
    }
    spin_unlock_bh(&scripts_lock);
    return fails;
}

/* Threads: one of their own runs until it waits for a mutex or ends; whoever started it waits for that. When the mutex
 * is given back it runs on, before the one that gave it. */

static struct task_struct* other;
static DECLARE_COMPLETION(other_settled);
static DECLARE_COMPLETION(other_ended);
static bool other_waits;
static char other_command[120];

static int be_other(void* nothing)
{
    run_line(other_command);
    other_waits = false;
    complete(&other_settled);
    complete(&other_ended);
    return 0;
}

static void run_as_thread(const char* command)
{
    strscpy(other_command, command, sizeof(other_command));
    reinit_completion(&other_settled);
    reinit_completion(&other_ended);
    other = kthread_create(be_other, NULL, "pmx_other");
    if (IS_ERR(other))
    {
        trace_note("no thread for %s", command);
        return;
    }
    wake_up_process(other);
    wait_for_completion(&other_settled);
}

INT32 __real_x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption);
INT32 script_x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption);
INT32 script_x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption)
{
    if (current != other || __real_x_sema_lock(hSema, X_SEMA_OPTION_NOWAIT) == OSR_OK)
        return current == other ? OSR_OK : __real_x_sema_lock(hSema, eOption);
    other_waits = true;
    complete(&other_settled);
    return __real_x_sema_lock(hSema, eOption);
}

INT32 __real_x_sema_unlock(HANDLE_T hSema);
INT32 script_x_sema_unlock(HANDLE_T hSema);
INT32 script_x_sema_unlock(HANDLE_T hSema)
{
    INT32 result;
    bool has_waited = current != other && other_waits;

    if (has_waited)
        reinit_completion(&other_settled);
    result = __real_x_sema_unlock(hSema);
    if (has_waited)
    {
        other_waits = false;
        wait_for_completion(&other_ended);
    }
    return result;
}

/* Inside a call of somebody else, whose answer is the one that is told. */
static int inside;

bool script_is_inside(void)
{
    return inside > 0 || current == other;
}

void script_call_ends(const char* function)
{
    struct script *one, due[MOST_SCRIPTS];
    int i, num = 0;

    spin_lock_bh(&scripts_lock);
    for (one = meanwhiles; one < meanwhiles + MOST_SCRIPTS; one++)
    {
        if (strcmp(one->function, function) != 0 || !is_due(one))
            continue;
        due[num++] = *one;
        one->function[0] = '\0';
    }
    spin_unlock_bh(&scripts_lock);
    for (i = 0; i < num; i++)
    {
        inside++;
        if (due[i].as_thread)
            run_as_thread(due[i].command);
        else
            run_line(due[i].command);
        inside--;
    }
}

/* Flash: an MTD device in memory, which the port finds by its name */

static u8 flash_bytes[FLASH_BYTES] = { 12, 0, 0, 0, 0xff, 0xff, 0xff, 0xff };
static char flash_name[32];
static struct mtd_info flash;
static bool flash_is_there;

static int read_flash(struct mtd_info* device, loff_t from, size_t length, size_t* done, u_char* to)
{
    memcpy(to, flash_bytes + from, length);
    *done = length;
    return 0;
}

static void remove_flash(void)
{
    if (flash_is_there)
        mtd_device_unregister(&flash);
    flash_is_there = false;
}

static void add_flash(const char* name, unsigned int size)
{
    remove_flash();
    strscpy(flash_name, name, sizeof(flash_name));
    flash = (struct mtd_info){ .name = flash_name,
                               .type = MTD_ROM,
                               .flags = MTD_NO_ERASE, /* else an erase function is missed */
                               .size = size,
                               .erasesize = size,
                               .writesize = 1,
                               .owner = THIS_MODULE,
                               ._read = read_flash };
    flash_is_there = mtd_device_register(&flash, NULL, 0) == 0;
}

/* Sink, display part and video plane driver */

enum
{
    STAYS_AWAY = -2,
    NEVER_ANSWERS = -1 /* else milliseconds */
};

static bool sink_is_plugged = true, resolution_is_wanted, planes_wait, chosen;
static u32 chosen_mode, chosen_frequency;
static VDP_ENABLE_T hw_enable[HARDWARE_VIDEO_PLANES] = { VDP_ENABLED };
static int display_part = STAYS_AWAY;
static struct hrtimer display_part_clock;
static INT32 delays[PLANES], order_delays[PLANES];
static u32 special_order;

/* The display part answers where that is allowed, too: in the context of a timer. */
static enum hrtimer_restart display_part_answers(struct hrtimer* clock)
{
    PMX_SetFormatChangeFlag(FALSE);
    return HRTIMER_NORESTART;
}

INT32 script_i4GetHotPlugStatus(void);
INT32 script_i4GetHotPlugStatus(void)
{
    return sink_is_plugged ? 1 : 0;
}

BOOL script_fgIsHotPlugChgRes(void);
BOOL script_fgIsHotPlugChgRes(void)
{
    return resolution_is_wanted;
}

BOOL script_fgVdpIsWaitforSyncCtrl(void);
BOOL script_fgVdpIsWaitforSyncCtrl(void)
{
    return planes_wait;
}

VDP_ENABLE_T script_VDP_GetHwEnable(UCHAR ucVdpId);
VDP_ENABLE_T script_VDP_GetHwEnable(UCHAR ucVdpId)
{
    return ucVdpId < HARDWARE_VIDEO_PLANES ? hw_enable[ucVdpId] : VDP_DISABLED;
}

BOOL __real_fgPmxDrvSetAvd(UINT32 u4Command, void* pvParameter, UINT32 u4Length);
BOOL script_fgPmxDrvSetAvd(UINT32 u4Command, void* pvParameter, UINT32 u4Length);
BOOL script_fgPmxDrvSetAvd(UINT32 u4Command, void* pvParameter, UINT32 u4Length)
{
    if (u4Command == PMX_SET_HDMI_RES_CHG && display_part != STAYS_AWAY)
    {
        hrtimer_cancel(&display_part_clock);
        PMX_SetFormatChangeFlag(TRUE);
        if (display_part >= 0)
            hrtimer_start(&display_part_clock, ms_to_ktime(display_part), HRTIMER_MODE_REL_SOFT);
    }
    return __real_fgPmxDrvSetAvd(u4Command, pvParameter, u4Length);
}

BOOL __real_fgPmxDrvGetAvdInfo(UINT32 u4Query, void* pvParameter);
BOOL script_fgPmxDrvGetAvdInfo(UINT32 u4Query, void* pvParameter);
BOOL script_fgPmxDrvGetAvdInfo(UINT32 u4Query, void* pvParameter)
{
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T* query = pvParameter;
    BOOL answer = __real_fgPmxDrvGetAvdInfo(u4Query, pvParameter);

    if (answer && chosen)
    {
        query->u4ValidAutoRes = chosen_mode;
        query->u2ValidAutoVfreq = chosen_frequency;
    }
    return answer;
}

INT32 __real_PMX_HalSetPlaneOrder(UCHAR ucPmxId, const UINT8* pu1PlnSel, INT32* pi4PlnDelay);
INT32 script_PMX_HalSetPlaneOrder(UCHAR ucPmxId, const UINT8* pu1PlnSel, INT32* pi4PlnDelay);
INT32 script_PMX_HalSetPlaneOrder(UCHAR ucPmxId, const UINT8* pu1PlnSel, INT32* pi4PlnDelay)
{
    INT32 result = __real_PMX_HalSetPlaneOrder(ucPmxId, pu1PlnSel, pi4PlnDelay);
    u32 order = 0;
    int i;

    for (i = 0; i < PLANES; i++)
        order |= (u32)pu1PlnSel[i] << 4 * i;
    if (result == 0)
        memcpy(pi4PlnDelay, order == special_order ? order_delays : delays, sizeof(delays));
    return result;
}

/* Sources */

static struct source
{
    bool is_connected, is_published, connects_back;
    int width, height, detail; /* a video plane's luma key, an OSD plane's colour mode */
} video[VIDEO_PLANES], osd[OSD_PLANES];

static UINT32 connect(bool is_osd, int plane);

static UINT32 set_color_mode(void* tag, DRV_PMX_COLOR_SPACE_T space)
{
    unsigned long plane = (unsigned long)tag - FIRST_TAG;

    might_sleep();
    if (plane < VIDEO_PLANES && video[plane].connects_back)
        connect(false, plane);
    return 1;
}

static UINT32 not_for_the_mixer(void* tag)
{
    trace_note("the mixer calls pu4SetColorMode alone");
    return 0;
}

static const IVdp video_plane = { not_for_the_mixer, not_for_the_mixer, not_for_the_mixer, not_for_the_mixer,
                                  not_for_the_mixer, not_for_the_mixer, not_for_the_mixer, not_for_the_mixer,
                                  set_color_mode,    not_for_the_mixer, not_for_the_mixer };
const void* const script_video_plane = &video_plane;

static UINT32 connect(bool is_osd, int plane)
{
    struct source* source = is_osd ? &osd[plane] : &video[plane];
    UINT32 answer;

    if (!is_osd && !source->is_published)
        source->is_published = i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, plane, IID_IVdp, &video_plane,
                                                      (void*)(unsigned long)(FIRST_TAG + plane)) >= 0;
    answer = i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, is_osd ? PMX_COMP_TYPE_OSD : PMX_COMP_TYPE_VDP, plane);
    source->is_connected = answer == PMX_PORT_DONE;
    return answer;
}

static UINT32 disconnect(bool is_osd, int plane)
{
    struct source* source = is_osd ? &osd[plane] : &video[plane];
    UINT32 answer = i4Pmx_Disconnect(PMX_COMP_TYPE_PMX, 0, is_osd ? PMX_COMP_TYPE_OSD : PMX_COMP_TYPE_VDP, plane);

    source->is_connected = false;
    if (source->is_published && i4ImUnregisterInterface2(PMX_COMP_TYPE_VDP, plane, IID_IVdp) >= 0)
        source->is_published = false;
    return answer;
}

static UINT32 deliver(bool is_osd, int plane)
{
    const struct source* source = is_osd ? &osd[plane] : &video[plane];

    if (is_osd)
        return PMX_OsdEnabled(0, plane, source->width, source->height, source->detail);
    return PMX_VdpEnabled(0, plane, source->width, source->height, source->detail);
}

static UINT32 stop(bool is_osd, int plane)
{
    UINT32 answer = is_osd ? PMX_OsdDisabled(0, plane) : PMX_VdpDisabled(0, plane);

    if (!is_osd && plane < HARDWARE_VIDEO_PLANES)
        hw_enable[plane] = VDP_DISABLED;
    return answer;
}

static void run_source(struct words* words)
{
    bool is_osd = strcmp(word(words), "osd") == 0;
    int plane = number(words);
    const char* what = word(words);
    struct source* source;
    bool starts = strcmp(what, "start") == 0;

    if (plane < 0 || plane >= (is_osd ? OSD_PLANES : VIDEO_PLANES))
    {
        words->wrong = true;
        return;
    }
    source = is_osd ? &osd[plane] : &video[plane];
    if (strcmp(what, "connects-back") == 0)
        source->connects_back = number(words);
    else if (strcmp(what, "connect") == 0)
        trace_result("source = %u", connect(is_osd, plane));
    else if (strcmp(what, "disconnect") == 0)
        trace_result("source = %u", disconnect(is_osd, plane));
    else if (strcmp(what, "stop") == 0)
        trace_result("source = %u", stop(is_osd, plane));
    else if (starts || strcmp(what, "size") == 0)
    {
        if (starts && !source->is_connected)
            connect(is_osd, plane);
        source->width = number(words);
        source->height = number(words);
        if (starts)
            source->detail = number(words);
        if (starts && !is_osd && plane < HARDWARE_VIDEO_PLANES)
            hw_enable[plane] = VDP_ENABLED;
        trace_result("source = %u", deliver(is_osd, plane));
    }
    else
        words->wrong = true;
}

/* Commands */

static void run_fault(struct words* words)
{
    const char* function = word(words);
    struct script* script = place_for(failures, function);

    if (!script)
    {
        words->wrong = true;
        return;
    }
    *script = (struct script){};
    script->answer = number(words);
    script->when = number(words);
    script->n = number(words);
    if (script->n)
        strscpy(script->function, function, sizeof(script->function));
}

static void run_meanwhile(struct words* words)
{
    struct script* script = place_for(meanwhiles, "");

    if (!script)
    {
        words->wrong = true;
        return;
    }
    *script = (struct script){};
    script->as_thread = number(words);
    script->n = number(words);
    strscpy(script->function, word(words), sizeof(script->function));
    strscpy(script->command, words->rest ? words->rest : "", sizeof(script->command));
    words->rest = NULL;
}

static void run_flash(struct words* words)
{
    const char* name = word(words);
    int i, size = number(words);

    if (size <= 0 || size > FLASH_BYTES)
    {
        remove_flash();
        words->wrong = size > FLASH_BYTES;
        return;
    }
    for (i = 0; i < size; i++)
        flash_bytes[i] = number(words);
    add_flash(name, size);
}

static void run_display_part(struct words* words)
{
    display_part = number(words);
    if (display_part == STAYS_AWAY)
        hrtimer_cancel(&display_part_clock);
}

static void run_display_part_tells(struct words* words)
{
    bool is_switching = number(words);

    if (!is_switching)
        hrtimer_cancel(&display_part_clock);
    PMX_SetFormatChangeFlag(is_switching);
}

static void run_planes_wait(struct words* words)
{
    planes_wait = number(words);
    if (!planes_wait)
        PMX_SetOsdEnable();
}

static void run_request(struct words* words)
{
    PMX_RESOLUTION_T* output = lent_outputs;
    long long place = number(words), is_mode = number(words), value = number(words);

    if (!output || place < 0 || place >= PMX_OUTPUT_NUM)
        words->wrong = true;
    else if (is_mode)
        output[place].eResMode = value;
    else
        output[place].fgOutputEnable = value;
}

static void run_sink(struct words* words)
{
    sink_is_plugged = number(words);
}

static void run_wanted(struct words* words)
{
    resolution_is_wanted = number(words);
}

static void run_valid(struct words* words)
{
    chosen = number(words);
    chosen_mode = number(words);
    chosen_frequency = number(words);
}

static void run_hw_enable(struct words* words)
{
    unsigned int plane = number(words);
    VDP_ENABLE_T enable = number(words);

    if (plane < HARDWARE_VIDEO_PLANES)
        hw_enable[plane] = enable;
    else
        words->wrong = true;
}

static void run_plane_delay(struct words* words)
{
    int i;

    for (i = 0; i < PLANES; i++)
        delays[i] = number(words);
}

static void run_plane_delay_order(struct words* words)
{
    int i;

    special_order = number(words);
    for (i = 0; i < PLANES; i++)
        order_delays[i] = number(words);
}

static void run_swap(struct words* words)
{
    UCHAR mixer = number(words);

    PMX_HalSwapPlane1_2(mixer, number(words));
}

static void run_sleep(struct words* words)
{
    msleep(number(words));
}

/* Through the port's device, as the kernel does it. */
static int run_power(bool wakes)
{
    struct device* device = bus_find_device_by_name(&platform_bus_type, NULL, "pmx");
    const struct dev_pm_ops* operations = device && device->driver ? device->driver->pm : NULL;
    int answer = -ENODEV;

    if (operations)
        answer = wakes ? operations->resume(device) : operations->suspend(device);
    put_device(device);
    return answer;
}

static void run_suspend(struct words* words)
{
    trace_result("suspend = %d", run_power(false));
}

static void run_resume(struct words* words)
{
    trace_result("resume = %d", run_power(true));
}

static void run_boot_up(struct words* words)
{
    _fgBootUp = number(words);
}

#ifdef PMX_HAS_RECORD
extern UINT8 _arPmxConf[];

static void run_poke(struct words* words)
{
    unsigned int offset = number(words), size = number(words);
    UINT32 value = number(words);

    memcpy(_arPmxConf + offset, &value, min_t(size_t, size, sizeof(value)));
}
#endif

static const struct command commands[] = {
    { "source", run_source },
    { "fault", run_fault },
    { "meanwhile", run_meanwhile },
    { "request", run_request },
    { "flash", run_flash },
    { "display-part", run_display_part },
    { "display-part-tells", run_display_part_tells },
    { "planes-wait", run_planes_wait },
    { "sink", run_sink },
    { "wanted", run_wanted },
    { "valid", run_valid },
    { "hw-enable", run_hw_enable },
    { "plane-delay", run_plane_delay },
    { "plane-delay-order", run_plane_delay_order },
    { "PMX_HalSwapPlane1_2", run_swap },
    { "sleep", run_sleep },
    { "suspend", run_suspend },
    { "resume", run_resume },
    { "_fgBootUp", run_boot_up },
#ifdef PMX_HAS_RECORD
    { "poke", run_poke },
#endif
};

int script_command(const char* verb, struct words* words)
{
    int i;

    for (i = 0; i < ARRAY_SIZE(commands); i++)
    {
        if (strcmp(commands[i].name, verb) == 0)
        {
            commands[i].run(words);
            return 0;
        }
    }
    return NO_SUCH_COMMAND;
}

void scripts_begin(void)
{
    hrtimer_init(&display_part_clock, CLOCK_MONOTONIC, HRTIMER_MODE_REL_SOFT);
    display_part_clock.function = display_part_answers;
    add_flash("fast_init_param", 8);
}

void scripts_end(void)
{
    hrtimer_cancel(&display_part_clock);
    remove_flash();
}
