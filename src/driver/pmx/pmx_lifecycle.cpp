// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Start-up, reset, shut-down, registration, power, master enable, second video plane. */
#include "drv_if.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

#define DRIVE_STRENGTH_AT_START 3

void PMX_Init(void)
{
    PMX_IsLog(1, "PMX_Init\n");
    if (_PmxInitiated != 0)
    {
        PMX_NOTE(STARTED_ALREADY);
        return;
    }
    _PmxInitiated = 1; // before anything can fail: a second call must not create a second mutex

    INT32 i4Ret = x_sema_create(&MutexPMX, X_SEMA_TYPE_MUTEX, 1);
    if (i4Ret != OSR_OK)
        Assert("i4Ret == OSR_OK", __FILE__, __LINE__);

    PMX_Reset(0);
    i4PmxRegisterIM(PMX_COMP_TYPE_PMX, 0);

    // After the reset, which clears the timer's handle.
    if (x_timer_create(&_arPmxDispPartStatus.hPMXTimer) != OSR_OK)
        Assert("x_timer_create(&_arPmxDispPartStatus.hPMXTimer)==OSR_OK", __FILE__, __LINE__);
    PMX_IsLog(0, "[PMX] create a timer \n");

    PMX_VsyncInit();
    PMX_HalSetDigitalOutDrv(DRIVE_STRENGTH_AT_START);
    register_pm_ops(&pmx_pm_ops);
}

/* Take the boot loader's mode if it is one that the mixer starts with, else 480p. Yields the TV type that goes with
 * it. */
static UCHAR ucTakeBootMode(PMX_CONF_T* prConf)
{
    prConf->ucMode = PMX_GetHDMIDefaultRes();
    UTIL_Printf("[PMX]_arPmxConf[ucPmxId].ucMode=%d\n", prConf->ucMode);

    UINT8 u1Flags = prPmxModeRow(prConf->ucMode)->u1Flags;
    if ((u1Flags & PMX_MODE_BOOT_50) != 0)
        return PMX_TV_TYPE_PAL;
    if ((u1Flags & PMX_MODE_BOOT_60) == 0)
    {
        PMX_NOTE(BOOT_MODE, prConf->ucMode);
        prConf->ucMode = RES_480P;
    }
    return PMX_TV_TYPE_NTSC;
}

void PMX_Reset(UCHAR ucPmxId)
{
    if (ucPmxId != 0)
    {
        PMX_NOTE(MIXER_ID, ucPmxId);
        return;
    }

    volatile PMX_DISPLAY_PART_STATUS_T* prStatus = prPmxStatus();
    prStatus->fgPmxEnabeOsdFlag = FALSE;
    prStatus->fgPmxFormatChangeFlag = FALSE;
    prStatus->fgTimerAlreadySet = FALSE;
    prStatus->hPMXTimer = 0; // a timer that runs goes on running, and nobody here knows it any more

    PMX_CONF_T* prConf = prPmxConf();
    memcpy(prConf, &_arPmxConfDefault, sizeof *prConf);
    UCHAR ucTvType = ucTakeBootMode(prConf);

    vSetPLLGP_HDMIDDS(prConf->ucMode);
    PMX_HalSetDigitalOut(0, 0, 0, 0);
    PMX_HalSetMode(0, prConf->ucMode);
    if (_fgBootUp == FALSE) // at boot the scaler keeps what the boot loader set
        PMX_HalSetScalerMode(prConf->ucMode);
    PMX_SetTvType(0, ucTvType);
    PMX_HalSetBg(0, prConf->u4BgColor);
    if (_fgBootUp == FALSE) // and so does the TV encoder
    {
        TVE_SetBrightness(prConf->ucBrightness);
        TVE_SetContrast(prConf->ucContrast);
        TVE_SetHue(prConf->ucHue);
        TVE_SetSaturation(prConf->ucSaturation);
        TVE_SetSharpness(prConf->ucSharpness);
    }

    vPmxProgramPlaneOrder(PMX_PLANE_ORDER_AT_RESET);
    PMX_HalInitPlaneOrder(0);
    PMX_DisableVideoPlane(0, 1);

    VDP_GlobalOutputChange();
    VDP_SetTvFormat(prConf->ucMode, TRUE);
}

/* What both ways of shutting down share: vertical sync, registration, timer. */
static void vStopAndUnregister(void)
{
    PMX_VsyncStop();
    i4PmxUnregisterIM(PMX_COMP_TYPE_PMX, 0);
    if (x_timer_delete(prPmxStatus()->hPMXTimer) != OSR_OK)
        Assert("x_timer_delete(_arPmxDispPartStatus.hPMXTimer)==OSR_OK", __FILE__, __LINE__);
}

void PMX_Uninit(void)
{
    PMX_IsLog(1, "PMX_Uninit\n");
    if (_PmxInitiated != 1)
    {
        PMX_NOTE(NOT_STARTED, _PmxInitiated);
        return;
    }

    unregister_pm_ops(&pmx_pm_ops);
    vStopAndUnregister();
    if (x_sema_delete(MutexPMX) != OSR_OK)
        Assert("x_sema_delete (MutexPMX) == OSR_OK", __FILE__, __LINE__);
    MutexPMX = 0;
    _PmxInitiated = 0;
}

/* Not PMX_Uninit with a result: power management stays registered, there need be no mutex, and one that could not be
 * deleted is told by the result and by MutexPMX, not by Assert. */
INT32 i4PMX_Uninit(UINT32 u4Case)
{
    INT32 i4Ret = 0;

    PMX_IsLog(1, "i4PMX_Uninit u4Case %d\n", (INT32)u4Case);
    if (_PmxInitiated == 1)
    {
        vStopAndUnregister();
        if (MutexPMX != 0)
        {
            if (x_sema_delete(MutexPMX) == OSR_OK)
                MutexPMX = 0;
            else
                i4Ret = PMX_WHY(MUTEX_STAYS, -1, MutexPMX);
        }
        _PmxInitiated = 0;
    }
    else
    {
        PMX_NOTE(NOT_STARTED, _PmxInitiated);
    }
    PMX_IsLog(1, "i4PMX_Uninit return %d\n", i4Ret);
    return i4Ret;
}

/* Everything but vertical-sync handling stays as it is: whoever stops the mixer this way starts it again with
 * PMX_Init. */
void PMX_Stop(void)
{
    PMX_IsLog(1, "PMX_Stop\n");
    if (_PmxInitiated == 1)
    {
        _PmxInitiated = 0;
        PMX_VsyncStop();
    }
    else
    {
        PMX_NOTE(NOT_STARTED, _PmxInitiated);
    }
}

int i4PMX_Suspend(void*)
{
    PMX_HalClockSet(0, 0);
    PMX_HalClockSet(2, 0);
    return 0;
}

int i4PMX_Resume(void*)
{
    PMX_HalClockSet(0, 1);
    PMX_HalClockSet(2, 1);
    return 0;
}

INT32 i4PmxRegisterIM(UINT16 u2CompType, UINT16 u2CompId)
{
    void* pvTag = (void*)(size_t)u2CompId; // what the IPMX functions decode their mixer id from
    INT32 i4Ret = i4ImRegisterInterface2(u2CompType, u2CompId, IID_IPMX, &_rPMXIF, pvTag);
    PMX_NOTE_IF(i4Ret < 0, NOT_REGISTERED, i4Ret);
    if (i4Ret < 0)
        PMX_IsLog(9, "Fail to register IID_IPMX of PMX Comp %d\n", u2CompId);
    return i4Ret;
}

INT32 i4PmxUnregisterIM(UINT16 u2CompType, UINT16 u2CompId)
{
    INT32 i4Ret = i4ImUnregisterInterface2(u2CompType, u2CompId, IID_IPMX);
    PMX_NOTE_IF(i4Ret < 0, NOT_REGISTERED, i4Ret);
    if (i4Ret < 0) // one text for both: it says register here too
        PMX_IsLog(9, "Fail to register IID_IPMX of PMX Comp %d\n", u2CompId);
    return i4Ret;
}

UINT32 PMX_GetCap(UCHAR ucPmxId, UINT32* pu4Cap)
{
    return u4PmxGiveWord(ucPmxId, prPmxConf()->u4Capability, pu4Cap);
}

UINT32 PMX_SetEnable(UCHAR ucPmxId, UCHAR ucEnable)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    PMX_CONF_T* prConf = prPmxConf();
    if (ucEnable == prConf->ucEnable)
        return PMX_WHY(SAME_VALUE, 1, ucEnable);

    if (ucEnable != 0)
    {
        PMX_VsyncEnable();
        vPmxProgramDigitalOut();
        PMX_HalSetDigitalOutPhase(0, prConf->u4Phase);
    }
    else
    {
        PMX_VsyncDisable();
        PMX_HalSetDigitalOut(0, 0, 0, 0);
    }
    prConf->ucEnable = ucEnable; // as given: another non-zero value switches on again
    return 1;
}

UINT32 PMX_GetEnable(UCHAR ucPmxId, UCHAR* pucEnable)
{
    return u4PmxGiveByte(ucPmxId, prPmxConf()->ucEnable, pucEnable);
}

/* Whether a video plane sits in the second mixer plane. The hardware's swap decides: not every switch of it is in
 * bComp0OnTop. */
static bool fgInSecondPlane(UCHAR ucPmxId, UCHAR ucVdpId)
{
    UCHAR ucSecond = fgPmxHalSwapPlane1_2(ucPmxId) != FALSE ? 0 : 1;
    PMX_NOTE_IF(ucVdpId != ucSecond, NOT_IN_SECOND, ucVdpId, ucSecond);
    return ucVdpId == ucSecond;
}

/* The id is handed on unchecked: the callers behind IPMX send what their tag carries. */
UINT32 PMX_EnableVideoPlane(UCHAR ucPmxId, UCHAR ucVdpId)
{
    if (fgInSecondPlane(ucPmxId, ucVdpId))
        vPmxMixPlane(ucPmxId, DRV_PMX_PLANE_2);
    return 1;
}

UINT32 PMX_DisableVideoPlane(UCHAR ucPmxId, UCHAR ucVdpId)
{
    if (fgInSecondPlane(ucPmxId, ucVdpId))
        vPmxNotMixPlane(ucPmxId, DRV_PMX_PLANE_2);
    return 1;
}

INT32 i4PmxEnableVideoPlane(void* pvTag, UCHAR ucVdpId)
{
    return (INT32)PMX_EnableVideoPlane(ucPmxIdOfTag(pvTag), ucVdpId);
}

INT32 i4PmxDisableVideoPlane(void* pvTag, UCHAR ucVdpId)
{
    return (INT32)PMX_DisableVideoPlane(ucPmxIdOfTag(pvTag), ucVdpId);
}
