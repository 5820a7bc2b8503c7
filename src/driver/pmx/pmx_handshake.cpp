// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The display part's handshake: graphics stay out of the picture while the sink switches format.
 *
 *  format-change  OSD-enable  timer     OSD planes
 *       0             0       whatever  mixed      ready
 *       1             0       whatever  mixed      the display part switches
 *       1             0       runs      out        held back by PMX_SetModeEx, until an answer or the timer
 *       0             1       whatever  out        answered, but the video plane waits: until PMX_SetOsdEnable
 *
 * The display part alone raises the first flag. Every state that can be reached, with resets and timers that come late,
 * is drawn in docs/handshake.svg. */
#include "drv_pmx.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

UINT32 PMX_SetFormatChangeFlag(BOOL bIsFormatChange)
{
    PMX_IsLog(0, "Display Format Change :%d.\n", bIsFormatChange);
    prPmxStatus()->fgPmxFormatChangeFlag = bIsFormatChange;
    if (bIsFormatChange == FALSE)
    {
        PMX_SetOsdEnableFlag(TRUE);
        if (fgVdpIsWaitforSyncCtrl() == FALSE) // else the OSD planes wait for PMX_SetOsdEnable
            PMX_SetOsdEnable();
        else
            PMX_NOTE(AWAITS_VIDEO);
    }
    return 1;
}

UINT32 PMX_SetOsdEnableFlag(BOOL bIsOsdEnable)
{
    PMX_IsLog(0, "Set Osd Enable :%d.\n", bIsOsdEnable);
    prPmxStatus()->fgPmxEnabeOsdFlag = bIsOsdEnable;
    return 1;
}

UINT32 PMX_SetOsdEnable(void)
{
    PMX_IsLog(0, "PMX_SetOsdEnable.\n");
    if (prPmxStatus()->fgPmxEnabeOsdFlag != FALSE)
    {
        PMX_NOTE(MIXED_AGAIN);
        for (UCHAR ucPlane = PMX_OSD_PLANE_FIRST; ucPlane <= PMX_OSD_PLANE_LAST; ucPlane++)
            vPmxMixPlane(0, ucPlane);
        PMX_SetOsdEnableFlag(FALSE);
    }
    else
    {
        PMX_NOTE(NOTHING_OWED);
    }
    return 1;
}

/* Nobody stops it when the display part answers in time: graphics that are back are then mixed once again. */
void _PMX_TmrIsr(HANDLE_T, void*)
{
    PMX_NOTE(TIMED_OUT);
    PMX_IsLog(0, "PMX timeout.\n");
    prPmxStatus()->fgTimerAlreadySet = FALSE;
    PMX_SetFormatChangeFlag(FALSE);
}

UINT32 PMX_SetFormatChangeTimer(UINT32 u4TimeInterval)
{
    PMX_IsLog(0, "Display Format Change Timer Set.\n");
    if (x_timer_stop(prPmxStatus()->hPMXTimer) != OSR_OK)
    {
        PMX_NOTE(NO_TIMER);
        Assert("x_timer_stop(_arPmxDispPartStatus.hPMXTimer) == OSR_OK", __FILE__, __LINE__);
    }
    if (x_timer_start(prPmxStatus()->hPMXTimer, u4TimeInterval, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, nullptr) != OSR_OK)
    {
        PMX_NOTE(NO_TIMER);
        Assert("x_timer_start(_arPmxDispPartStatus.hPMXTimer, u4TimeInterval, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, NULL)"
               "==OSR_OK",
               __FILE__, __LINE__);
    }
    return 1;
}

BOOL fgPMX_DisplayModeReady(void)
{
    PMX_IsLog(9, "[PMX] fgPMX_DisplayModeReady is %d.\n", prPmxStatus()->fgPmxFormatChangeFlag);
    return prPmxStatus()->fgPmxFormatChangeFlag == FALSE;
}
