// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The picture of the current mode; commands about the TV system. */
#include "tests/lockstep/literal/literal.h"

UINT32 PMX_GetOutSize(UCHAR ucPmxId, UINT32* pu4Width, UINT32* pu4Height)
{
    if (ucPmxId != 0)
        return 0;
    if (pu4Width == nullptr)
        return 0;
    if (pu4Height == nullptr)
        return 0;
    const mode_facts::Mode& size = mode_facts::facts_of(conf.ucMode);
    *pu4Width = size.width;
    *pu4Height = size.height;
    return 1;
}

INT32 i4PmxGetOutSize(void* pvTag, UINT32* pu4Width, UINT32* pu4Height)
{
    return static_cast<INT32>(PMX_GetOutSize(id_of(pvTag), pu4Width, pu4Height));
}

UCHAR PMX_ProgressiveOut(UCHAR ucPmxId)
{
    if (ucPmxId != 0)
        return 0;
    return mode_facts::facts_of(conf.ucMode).is(mode_facts::progressive) ? 1 : 0;
}

BOOL fgPmxFmtHDOutput(UCHAR)
{
    return mode_facts::facts_of(conf.ucMode).is(mode_facts::hd_out) ? 1 : 0;
}

UINT32 PMX_SetTVSystem(UCHAR ucPmxId, UINT16 u2VSyncFreq, BOOL fgTvSysAuto)
{
    if (ucPmxId != 0)
        return 0;
    if (u2VSyncFreq != 50 && u2VSyncFreq != 60 && u2VSyncFreq != 24 && u2VSyncFreq != 30 && u2VSyncFreq != 25)
        return 0;
    PMX_SET_TV_SYS_PARAMETER_T record;
    std::memset(&record, 0, sizeof record);
    record.u2_Vfreq = u2VSyncFreq;
    record.fgAutoEnable = fgTvSysAuto;
    fgPmxDrvSetAvd(2, &record, 1);
    return 1;
}

UINT32 PMX_ChkSupportedRes(UCHAR ucPmxId, UCHAR ucChkRes, UINT16 u2VSyncFreq, UCHAR* ucSupportedAutoRes,
                           UINT16* ucSupportedAutoVsyncFreg)
{
    if (ucPmxId != 0)
        return 0;
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T record;
    std::memset(&record, 0, sizeof record);
    record.u4ResCheck = ucChkRes;
    record.u2VsyncFreq = u2VSyncFreq;
    if (fgPmxDrvGetAvdInfo(1, &record) == FALSE)
        return 0;
    *ucSupportedAutoRes = static_cast<UCHAR>(record.u4ValidAutoRes & 0xFF);
    *ucSupportedAutoVsyncFreg = record.u2ValidAutoVfreq;
    return 1;
}

UINT32 PMX_SetHdmiDeepColor(UCHAR ucPmxId, UCHAR ucDeepColor)
{
    if (ucPmxId != 0)
        return 1;
    return fgPmxDrvSetAvd(8, &ucDeepColor, 1) != FALSE ? 1 : 0;
}

void PMX_RecordUiResAuto(BOOL fgIsAuto)
{
    BOOL fgUiResAuto = fgIsAuto;
    fgPmxDrvSetAvd(13, &fgUiResAuto, 1);
}
