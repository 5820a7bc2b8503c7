// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Capability check, one mode on all outputs, force mode. */
#include "tests/lockstep/literal/literal.h"

UINT32 PMX_CheckCap(UCHAR, UCHAR ucMode)
{
    return mode_facts::admitted(ucMode, conf.u4Capability) ? 1 : 0;
}

UINT32 PMX_SetMode(UCHAR ucPmxId, UCHAR ucMode, UCHAR ucVFreq, UINT8 fgOSD5)
{
    if (ucPmxId != 0)
        return 0;
    PMX_IsLog(9, "SetMode, %s\n", name_of(ucMode));
    if (PMX_CheckCap(ucPmxId, ucMode) == 0)
        return 0;
    OSD_BASE_SetDisplayMode(ucMode);
    if (ucMode == conf.ucMode && ucVFreq == conf.ucVfreq && conf.fgSetModeCalled != 0)
    {
        VDP_SetTvFormat(ucMode, 0);
        return 1;
    }
    conf.ucMode = ucMode;
    conf.ucVfreq = ucVFreq;
    conf.fgSetModeCalled = 1;
    PMX_SET_HDMI_RES_PARAMETER_T record;
    std::memset(&record, 0, sizeof record);
    record.u1ScaleMode = 0;
    record.ucHdmiOutDisplayResolution = ucMode;
    record.ucFmtOutResolution = ucMode;
    record.ucCCIROutResolution = ucMode;
    record.ucHdmiOutMode = 0;
    record.fgHdmiOutEnable = 1;
    record.ucCCIROutMode = 1;
    fgPmxDrvSetAvd(9, &record, 1);
    fgPmxDrvSetAvd(16, &record, 1);
    PMX_ColorSpaceSetup(conf.eMasterColorSpace, ucMode);
    PMX_HalSetMode(0, ucMode);
    PMX_HalSetScalerMode(ucMode);
    VDP_SetTvFormat(ucMode, 1);
    if (ucVFreq == 60)
    {
        if (PMX_SetTvType(ucPmxId, 0) != 1)
            Assert("PMX_SetTvType(ucPmxId, PMX_TV_TYPE_NTSC) == PMX_SET_OK", __FILE__, __LINE__);
    }
    else
    {
        if (PMX_SetTvType(ucPmxId, 3) != 1)
            Assert("PMX_SetTvType(ucPmxId, PMX_TV_TYPE_PAL) == PMX_SET_OK", __FILE__, __LINE__);
    }
    const BOOL fgHD = mode_facts::facts_of(ucMode).is(mode_facts::tve_hd) ? 1 : 0;
    TVE_SetFmtEx(0, ucMode, ucVFreq, ucMode, 1, fgHD, fgOSD5);
    if (ucVFreq == 60)
        TVE_SetFmtEx(1, ucMode, 60, RES_480I, 1, fgHD, fgOSD5);
    else
        TVE_SetFmtEx(1, ucMode, ucVFreq, RES_576I, 1, fgHD, fgOSD5);
    PMX_HalReset(0);
    PMX_HalScalerReset(0);
    VDP_GlobalOutputChange();
    VDP_VsyncSendCmd(0, 2);
    VDP_VsyncSendCmd(1, 2);
    VDP_VsyncSendCmd(2, 2);
    fgPmxDrvSetAvd(10, &record, 1);
    OSD_BASE_SetFlag_PMXChangeResDone();
    return 1;
}

INT32 i4PmxSetMode(void* pvTag, UCHAR ucMode, UCHAR ucVFreq, BOOL fgOSD5)
{
    return static_cast<INT32>(PMX_SetMode(id_of(pvTag), ucMode, ucVFreq, fgOSD5));
}

UINT32 PMX_GetMode(UCHAR ucPmxId, UCHAR* pucMode)
{
    if (ucPmxId != 0 || pucMode == nullptr)
        return 0;
    *pucMode = conf.ucMode;
    return 1;
}

INT32 i4PmxGetMode(void* pvTag, UCHAR* pucMode)
{
    return static_cast<INT32>(PMX_GetMode(id_of(pvTag), pucMode));
}

BOOL PMX_IsForceMode(UCHAR)
{
    return conf.fgForceMode != 0 ? 1 : 0;
}

void PMX_SetForceMode(UCHAR, BOOL fgOn)
{
    conf.fgForceMode = fgOn != 0 ? 1 : 0;
}
