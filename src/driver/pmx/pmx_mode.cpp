// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Capability check, one mode on all outputs, force mode. */
#include "drv_av_d.h"
#include "drv_osd.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

UINT32 PMX_CheckCap(UCHAR, UCHAR ucMode)
{
    UINT8 u1CapBit = prPmxModeRow(ucMode)->u1CapBit;
    if (u1CapBit >= PMX_CAP_ALWAYS)
    {
        PMX_NOTE_IF(u1CapBit == PMX_CAP_NEVER, MODE_NEVER, ucMode);
        return u1CapBit == PMX_CAP_ALWAYS;
    }
    PMX_NOTE_IF(!fgPmxHasCap(u1CapBit), MODE_BIT, u1CapBit, prPmxConf()->u4Capability);
    return fgPmxHasCap(u1CapBit);
}

void vPmxChooseTvType(bool fgNtsc)
{
    if (PMX_SetTvType(0, fgNtsc ? PMX_TV_TYPE_NTSC : PMX_TV_TYPE_PAL) != PMX_SET_OK)
        Assert(fgNtsc ? "PMX_SetTvType(ucPmxId, PMX_TV_TYPE_NTSC) == PMX_SET_OK"
                      : "PMX_SetTvType(ucPmxId, PMX_TV_TYPE_PAL) == PMX_SET_OK",
               __FILE__, __LINE__);
}

void vPmxFinishModeChange(PMX_SET_HDMI_RES_PARAMETER_T* prResData)
{
    VDP_GlobalOutputChange();
    for (UINT32 u4VdpIdx = 0; u4VdpIdx < PMX_VDP_COMMANDED_NUM; u4VdpIdx++)
        VDP_VsyncSendCmd(u4VdpIdx, VDP_CMD_OUTPUT_CHANGED);
    fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, prResData, 1);
    OSD_BASE_SetFlag_PMXChangeResDone();
}

UINT32 PMX_SetMode(UCHAR ucPmxId, UCHAR ucMode, UCHAR ucVFreq, UINT8 fgOSD5)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    PMX_IsLog(9, "SetMode, %s\n", szPmxModeName(ucMode));
    if (PMX_CheckCap(ucPmxId, ucMode) == 0)
        return 0;

    PMX_CONF_T* prConf = prPmxConf();
    OSD_BASE_SetDisplayMode(ucMode);
    if (ucMode == prConf->ucMode && ucVFreq == prConf->ucVfreq && prConf->fgSetModeCalled != FALSE)
    {
        PMX_NOTE(SAME_MODE, ucMode, ucVFreq);
        VDP_SetTvFormat(ucMode, FALSE);
        return 1;
    }
    PMX_NOTE(FORMAT_WAS, prConf->ucMode, prConf->ucVfreq);
    PMX_NOTE(FULL_CHANGE, ucMode, ucVFreq);
    prConf->ucMode = ucMode;
    prConf->ucVfreq = ucVFreq;
    prConf->fgSetModeCalled = TRUE;

    PMX_SET_HDMI_RES_PARAMETER_T rResData;
    memset(&rResData, 0, sizeof rResData); // the driver gets every byte, those without a name too
    rResData.ucHdmiOutDisplayResolution = ucMode;
    rResData.ucFmtOutResolution = ucMode;
    rResData.ucCCIROutResolution = ucMode;
    rResData.ucCCIROutMode = 1;
    rResData.fgHdmiOutEnable = TRUE;
    fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, &rResData, 1);
    fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, &rResData, 1);

    // Colour set-up before the mixer is told its mode: per-output mode setting does it the other way round.
    PMX_ColorSpaceSetup(prConf->eMasterColorSpace, ucMode);
    PMX_HalSetMode(0, ucMode);
    PMX_HalSetScalerMode(ucMode);
    VDP_SetTvFormat(ucMode, TRUE);

    bool fg60Hz = ucVFreq == 60; // 60 alone; per-output mode setting takes more frequencies for NTSC
    vPmxChooseTvType(fg60Hz);

    bool fgHD = fgPmxTveHd(ucMode);
    TVE_SetFmtEx(TVE_1, ucMode, ucVFreq, ucMode, TRUE, fgHD, fgOSD5);
    TVE_SetFmtEx(TVE_2, ucMode, ucVFreq, fg60Hz ? RES_480I : RES_576I, TRUE, fgHD, fgOSD5);

    PMX_HalReset(0);
    PMX_HalScalerReset(0);
    vPmxFinishModeChange(&rResData);
    return 1;
}

INT32 i4PmxSetMode(void* pvTag, UCHAR ucMode, UCHAR ucVFreq, BOOL fgOSD5)
{
    return (INT32)PMX_SetMode(ucPmxIdOfTag(pvTag), ucMode, ucVFreq, fgOSD5);
}

UINT32 PMX_GetMode(UCHAR ucPmxId, UCHAR* pucMode)
{
    return u4PmxGiveByte(ucPmxId, prPmxConf()->ucMode, pucMode);
}

INT32 i4PmxGetMode(void* pvTag, UCHAR* pucMode)
{
    return (INT32)PMX_GetMode(ucPmxIdOfTag(pvTag), pucMode);
}

BOOL PMX_IsForceMode(UCHAR)
{
    return prPmxConf()->fgForceMode != FALSE;
}

void PMX_SetForceMode(UCHAR, BOOL fgOn)
{
    prPmxConf()->fgForceMode = fgOn != FALSE;
}
