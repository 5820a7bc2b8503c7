// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* How large and of what kind the mixer's picture is, and what HDMI is told or asked about resolutions. */
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "pmx_if.h"

UINT32 PMX_GetOutSize(UCHAR ucPmxId, UINT32* pu4Width, UINT32* pu4Height)
{
    if (ucPmxId != 0 || pu4Width == nullptr || pu4Height == nullptr)
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId),
                              PMX_WHY(NULL_POINTER, 0, pu4Width == nullptr ? 2 : 3));

    const PMX_MODE_ROW_T* prRow = prPmxModeRow(prPmxConf()->ucMode);
    *pu4Width = prRow->u2Width;
    *pu4Height = prRow->u2Height;
    return 1;
}

INT32 i4PmxGetOutSize(void* pvTag, UINT32* pu4Width, UINT32* pu4Height)
{
    return (INT32)PMX_GetOutSize(ucPmxIdOfTag(pvTag), pu4Width, pu4Height);
}

UCHAR PMX_ProgressiveOut(UCHAR ucPmxId)
{
    if (ucPmxId != 0)
        return 0;

    return (prPmxModeRow(prPmxConf()->ucMode)->u1Flags & PMX_MODE_PROGRESSIVE) != 0;
}

BOOL fgPmxFmtHDOutput(UCHAR)
{
    return (prPmxModeRow(prPmxConf()->ucMode)->u1Flags & PMX_MODE_HD_OUT) != 0;
}

static bool fgIsTvSystemFreq(UINT16 u2VSyncFreq)
{
    return u2VSyncFreq == 50 || u2VSyncFreq == 60 || u2VSyncFreq == 24 || u2VSyncFreq == 30 || u2VSyncFreq == 25;
}

UINT32 PMX_SetTVSystem(UCHAR ucPmxId, UINT16 u2VSyncFreq, BOOL fgTvSysAuto)
{
    if (ucPmxId != 0 || !fgIsTvSystemFreq(u2VSyncFreq))
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId), PMX_WHY(TV_SYSTEM, 0, u2VSyncFreq));

    PMX_SET_TV_SYS_PARAMETER_T rTvSys;
    memset(&rTvSys, 0, sizeof rTvSys); // the driver gets every byte, the one without a name too
    rTvSys.u2_Vfreq = u2VSyncFreq;
    rTvSys.fgAutoEnable = fgTvSysAuto;
    fgPmxDrvSetAvd(PMX_SET_UI_TV_SYSTEM, &rTvSys, 1);
    return 1;
}

UINT32 PMX_ChkSupportedRes(UCHAR ucPmxId, UCHAR ucChkRes, UINT16 u2VSyncFreq, UCHAR* ucSupportedAutoRes,
                           UINT16* ucSupportedAutoVsyncFreg)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T rValid;
    memset(&rValid, 0, sizeof rValid); // the answers, and the bytes without a name
    rValid.u4ResCheck = ucChkRes;
    rValid.u2VsyncFreq = u2VSyncFreq;
    if (fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &rValid) == FALSE)
        return PMX_WHY(NO_HDMI_ANSWER, 0, ucChkRes, u2VSyncFreq);

    *ucSupportedAutoRes = (UCHAR)rValid.u4ValidAutoRes;
    *ucSupportedAutoVsyncFreg = rValid.u2ValidAutoVfreq;
    return 1;
}

UINT32 PMX_SetHdmiDeepColor(UCHAR ucPmxId, UCHAR ucDeepColor)
{
    if (ucPmxId != 0) // success for an unknown mixer: the one operation of this file that answers so
        return PMX_WHY(MIXER_ID, 1, ucPmxId);

    return fgPmxDrvSetAvd(PMX_CHG_DEEP_COLOR_BIT, &ucDeepColor, 1) != FALSE
               ? 1u
               : PMX_WHY(HDMI_REFUSED, 0u, PMX_CHG_DEEP_COLOR_BIT, ucDeepColor);
}

void PMX_RecordUiResAuto(BOOL fgIsAuto)
{
    BOOL fgUiResAuto = fgIsAuto;
    fgPmxDrvSetAvd(PMX_CHG_UI_RES_AUTO, &fgUiResAuto, 1);
}
