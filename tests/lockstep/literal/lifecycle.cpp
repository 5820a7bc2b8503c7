// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Start-up, reset, shut-down, registration, power, master enable, second video plane. */
#include "tests/lockstep/literal/literal.h"

void PMX_Init(void)
{
    PMX_IsLog(1, "PMX_Init\n");
    if (_PmxInitiated != 0)
        return;
    _PmxInitiated = 1;
    if (x_sema_create(&MutexPMX, X_SEMA_TYPE_MUTEX, 1) != OSR_OK)
        Assert("i4Ret == OSR_OK", __FILE__, __LINE__);
    PMX_Reset(0);
    i4PmxRegisterIM(66, 0);
    if (x_timer_create(&status.hPMXTimer) != OSR_OK)
        Assert("x_timer_create(&_arPmxDispPartStatus.hPMXTimer)==OSR_OK", __FILE__, __LINE__);
    PMX_IsLog(0, "[PMX] create a timer \n");
    PMX_VsyncInit();
    PMX_HalSetDigitalOutDrv(3);
    register_pm_ops(&pmx_pm_ops);
}

void PMX_Reset(UCHAR ucPmxId)
{
    if (ucPmxId != 0)
        return;
    status.fgPmxEnabeOsdFlag = 0;
    status.fgPmxFormatChangeFlag = 0;
    status.fgTimerAlreadySet = 0;
    status.hPMXTimer = 0;
    std::memcpy(&conf, &_arPmxConfDefault, sizeof(PMX_CONF_T));
    conf.ucMode = PMX_GetHDMIDefaultRes();
    UTIL_Printf("[PMX]_arPmxConf[ucPmxId].ucMode=%d\n", conf.ucMode);
    UCHAR ucTvType = 0;
    switch (conf.ucMode)
    {
    case RES_576I:
    case RES_576P:
    case RES_720P50HZ:
    case RES_1080I50HZ:
    case RES_1080P50HZ: ucTvType = 3; break;
    case RES_480I:
    case RES_480P:
    case RES_720P60HZ:
    case RES_1080I60HZ:
    case RES_1080P60HZ: ucTvType = 0; break;
    default:
        conf.ucMode = RES_480P;
        ucTvType = 0;
        break;
    }
    vSetPLLGP_HDMIDDS(conf.ucMode);
    PMX_HalSetDigitalOut(0, 0, 0, 0);
    PMX_HalSetMode(0, conf.ucMode);
    if (_fgBootUp == 0)
        PMX_HalSetScalerMode(conf.ucMode);
    PMX_SetTvType(0, ucTvType);
    PMX_HalSetBg(0, conf.u4BgColor);
    if (_fgBootUp == 0)
    {
        TVE_SetBrightness(conf.ucBrightness);
        TVE_SetContrast(conf.ucContrast);
        TVE_SetHue(conf.ucHue);
        TVE_SetSaturation(conf.ucSaturation);
        TVE_SetSharpness(conf.ucSharpness);
    }
    UINT32 au4PlaneOrder[8];
    for (int position = 0; position < 8; ++position)
        au4PlaneOrder[position] = conf.aucPlaneOrder[position];
    PMX_HalPlaneOrder(0, 3, au4PlaneOrder);
    PMX_HalInitPlaneOrder(0);
    PMX_DisableVideoPlane(0, 1);
    VDP_GlobalOutputChange();
    VDP_SetTvFormat(conf.ucMode, 1);
}

void PMX_Uninit(void)
{
    PMX_IsLog(1, "PMX_Uninit\n");
    if (_PmxInitiated != 1)
        return;
    unregister_pm_ops(&pmx_pm_ops);
    PMX_VsyncStop();
    i4PmxUnregisterIM(66, 0);
    if (x_timer_delete(status.hPMXTimer) != OSR_OK)
        Assert("x_timer_delete(_arPmxDispPartStatus.hPMXTimer)==OSR_OK", __FILE__, __LINE__);
    if (x_sema_delete(MutexPMX) != OSR_OK)
        Assert("x_sema_delete (MutexPMX) == OSR_OK", __FILE__, __LINE__);
    MutexPMX = 0;
    _PmxInitiated = 0;
}

INT32 i4PMX_Uninit(UINT32 u4Case)
{
    INT32 i4Ret = 0;
    PMX_IsLog(1, "i4PMX_Uninit u4Case %d\n", static_cast<int>(u4Case));
    if (_PmxInitiated == 1)
    {
        PMX_VsyncStop();
        i4PmxUnregisterIM(66, 0);
        if (x_timer_delete(status.hPMXTimer) != OSR_OK)
            Assert("x_timer_delete(_arPmxDispPartStatus.hPMXTimer)==OSR_OK", __FILE__, __LINE__);
        if (MutexPMX != 0)
        {
            if (x_sema_delete(MutexPMX) == OSR_OK)
                MutexPMX = 0;
            else
                i4Ret = -1;
        }
        _PmxInitiated = 0;
    }
    PMX_IsLog(1, "i4PMX_Uninit return %d\n", i4Ret);
    return i4Ret;
}

void PMX_Stop(void)
{
    PMX_IsLog(1, "PMX_Stop\n");
    if (_PmxInitiated == 1)
    {
        _PmxInitiated = 0;
        PMX_VsyncStop();
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
    void* const tag = reinterpret_cast<void*>(static_cast<std::uintptr_t>(u2CompId));
    const INT32 i4Ret = i4ImRegisterInterface2(u2CompType, u2CompId, 9, &_rPMXIF, tag);
    if (i4Ret < 0)
        PMX_IsLog(9, "Fail to register IID_IPMX of PMX Comp %d\n", u2CompId);
    return i4Ret;
}

INT32 i4PmxUnregisterIM(UINT16 u2CompType, UINT16 u2CompId)
{
    const INT32 i4Ret = i4ImUnregisterInterface2(u2CompType, u2CompId, 9);
    if (i4Ret < 0)
        PMX_IsLog(9, "Fail to register IID_IPMX of PMX Comp %d\n", u2CompId);
    return i4Ret;
}

UINT32 PMX_GetCap(UCHAR ucPmxId, UINT32* pu4Cap)
{
    if (ucPmxId != 0 || pu4Cap == nullptr)
        return 0;
    *pu4Cap = conf.u4Capability;
    return 1;
}

UINT32 PMX_SetEnable(UCHAR ucPmxId, UCHAR ucEnable)
{
    if (ucPmxId != 0)
        return 0;
    if (ucEnable == conf.ucEnable)
        return 1;
    if (ucEnable != 0)
    {
        PMX_VsyncEnable();
        PMX_HalSetDigitalOut(0, conf.ucDigitalOut, conf.ucProprietaryMode, conf.ucDigitalBit);
        PMX_HalSetDigitalOutRgb(0, conf.ucDigitalRgb);
        PMX_HalSetDigitalOutPhase(0, conf.u4Phase);
    }
    else
    {
        PMX_VsyncDisable();
        PMX_HalSetDigitalOut(0, 0, 0, 0);
    }
    conf.ucEnable = ucEnable;
    return 1;
}

UINT32 PMX_GetEnable(UCHAR ucPmxId, UCHAR* pucEnable)
{
    if (ucPmxId != 0 || pucEnable == nullptr)
        return 0;
    *pucEnable = conf.ucEnable;
    return 1;
}

UINT32 PMX_EnableVideoPlane(UCHAR ucPmxId, UCHAR ucVdpId)
{
    if (fgPmxHalSwapPlane1_2(ucPmxId) != 0)
    {
        if (ucVdpId == 0)
            vPmxMixPlane(ucPmxId, 1);
    }
    else
    {
        if (ucVdpId == 1)
            vPmxMixPlane(ucPmxId, 1);
    }
    return 1;
}

UINT32 PMX_DisableVideoPlane(UCHAR ucPmxId, UCHAR ucVdpId)
{
    if (fgPmxHalSwapPlane1_2(ucPmxId) != 0)
    {
        if (ucVdpId == 0)
            vPmxNotMixPlane(ucPmxId, 1);
    }
    else
    {
        if (ucVdpId == 1)
            vPmxNotMixPlane(ucPmxId, 1);
    }
    return 1;
}

INT32 i4PmxEnableVideoPlane(void* pvTag, UCHAR ucVdpId)
{
    return static_cast<INT32>(PMX_EnableVideoPlane(id_of(pvTag), ucVdpId));
}

INT32 i4PmxDisableVideoPlane(void* pvTag, UCHAR ucVdpId)
{
    return static_cast<INT32>(PMX_DisableVideoPlane(id_of(pvTag), ucVdpId));
}
