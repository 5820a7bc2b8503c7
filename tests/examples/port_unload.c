// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Starts and unloads the porting skeleton, and looks at its list of timers on the way. */
#include "port_skeleton.c" // NOLINT(bugprone-suspicious-include): its list is private

#include <stdio.h>

static int i4Wrong;

static int i4Timers(void)
{
    int i4Count = 0;
    HANDLE_T hTimer;

    for (hTimer = 1; hTimer <= PORT_TIMERS; hTimer++)
        i4Count += fgTimerExists(hTimer);
    return i4Count;
}

static void vExpect(const char* szWhat, long i4Expected, long i4Found)
{
    if (i4Expected == i4Found)
        return;
    printf("%s: %ld, and not %ld\n", szWhat, i4Found, i4Expected);
    i4Wrong++;
}

static void vUnload(void)
{
    PMX_Init();
    vExpect("timers of a started layer", 1, i4Timers());
    PMX_Uninit();
    vExpect("timers after a plain shut-down", 0, i4Timers());

    PMX_Init();
    PMX_Reset(0);
    PMX_Uninit();
    vExpect("timers that a reset made the layer forget", 1, i4Timers());
    vPortUnload();
    vExpect("timers after unloading", 0, i4Timers());

    PMX_Init();
    PMX_Stop();
    PMX_Init();
    vExpect("timers after a start behind a stop", 2, i4Timers());
    vPortUnload();
    vExpect("timers after unloading", 0, i4Timers());
}

static void vRefuse(void)
{
    HANDLE_T hTimer = 77;
    int i;

    vExpect("deletion of no timer", -1, x_timer_delete(0));
    vExpect("deletion beyond the list", -1, x_timer_delete(PORT_TIMERS + 1));
    vExpect("start of no timer", -1, x_timer_start(1, 5, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, NULL));
    vExpect("stop of no timer", -1, x_timer_stop(1));
    for (i = 1; i <= PORT_TIMERS; i++)
        vExpect("creation", OSR_OK, x_timer_create(&hTimer));
    vExpect("the last handle", PORT_TIMERS, hTimer);
    vExpect("stop of a timer", OSR_OK, x_timer_stop(hTimer));
    hTimer = 77;
    vExpect("creation in a full list", -1, x_timer_create(&hTimer));
    vExpect("a handle after a failed creation", 77, hTimer);
    vExpect("deletion", OSR_OK, x_timer_delete(3));
    vExpect("second deletion", -1, x_timer_delete(3));
    vExpect("creation in a free place", OSR_OK, x_timer_create(&hTimer));
    vExpect("the handle of that place", 3, hTimer);
    vPortUnload();
    vExpect("timers after unloading", 0, i4Timers());
}

/* A source connects and delivers: nobody hands out its table, and the layer calls none. */
static void vMeetSources(void)
{
    PMX_Init();
    vExpect("a video plane's connection", PMX_PORT_DONE,
            (long)i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, 0));
    vExpect("its first size", 1, (long)PMX_VdpEnabled(0, 0, 1920, 1080, 0));
    vExpect("another colour space", 1, (long)PMX_VdpEnabled(0, 0, 720, 576, 0));
    vPortUnload();
}

int main(void)
{
    vUnload();
    vMeetSources();
    vRefuse();
    return i4Wrong != 0;
}
