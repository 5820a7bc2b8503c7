// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The display part's flags and timer. */
#include "tests/lockstep/literal/literal.h"

UINT32 PMX_SetFormatChangeFlag(BOOL bIsFormatChange)
{
    PMX_IsLog(0, "Display Format Change :%d.\n", bIsFormatChange);
    status.fgPmxFormatChangeFlag = bIsFormatChange;
    if (bIsFormatChange == FALSE)
    {
        PMX_SetOsdEnableFlag(TRUE);
        if (fgVdpIsWaitforSyncCtrl() == FALSE)
            PMX_SetOsdEnable();
    }
    return 1;
}

UINT32 PMX_SetOsdEnableFlag(BOOL bIsOsdEnable)
{
    PMX_IsLog(0, "Set Osd Enable :%d.\n", bIsOsdEnable);
    status.fgPmxEnabeOsdFlag = bIsOsdEnable;
    return 1;
}

UINT32 PMX_SetOsdEnable(void)
{
    PMX_IsLog(0, "PMX_SetOsdEnable.\n");
    if (status.fgPmxEnabeOsdFlag != 0)
    {
        vPmxMixPlane(0, 2);
        vPmxMixPlane(0, 3);
        vPmxMixPlane(0, 4);
        vPmxMixPlane(0, 5);
        vPmxMixPlane(0, 6);
        PMX_SetOsdEnableFlag(FALSE);
    }
    return 1;
}

void _PMX_TmrIsr(HANDLE_T, void*)
{
    PMX_IsLog(0, "PMX timeout.\n");
    status.fgTimerAlreadySet = FALSE;
    PMX_SetFormatChangeFlag(FALSE);
}

UINT32 PMX_SetFormatChangeTimer(UINT32 u4TimeInterval)
{
    PMX_IsLog(0, "Display Format Change Timer Set.\n");
    if (x_timer_stop(status.hPMXTimer) != OSR_OK)
        Assert("x_timer_stop(_arPmxDispPartStatus.hPMXTimer) == OSR_OK", __FILE__, __LINE__);
    if (x_timer_start(status.hPMXTimer, u4TimeInterval, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, nullptr) != OSR_OK)
        Assert("x_timer_start(_arPmxDispPartStatus.hPMXTimer, u4TimeInterval, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, "
               "NULL)==OSR_OK",
               __FILE__, __LINE__);
    return 1;
}

BOOL fgPMX_DisplayModeReady(void)
{
    PMX_IsLog(9, "[PMX] fgPMX_DisplayModeReady is %d.\n", status.fgPmxFormatChangeFlag);
    return status.fgPmxFormatChangeFlag == 0 ? 1 : 0;
}
