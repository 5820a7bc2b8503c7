// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Per-output mode setting. */
#include "tests/lockstep/literal/literal.h"

/* Working values of one call. */
struct Working
{
    PMX_RESOLUTION_T rCCIR, rHDMI, rCAV, rCVBS;
    UCHAR ucFmtMode;
    UCHAR ucVFreq;
    UINT8 fgOSD5;
    DRV_EXT_CHIP_USAGE_T rDrvExtScl;
    BOOL fgFmtChange, fgHdmiChange, fgCavChange, fgCvbsChange, fgOSD5Change;
    BOOL fgHDExist;
    BOOL fgHdmiExist;
    PMX_SET_HDMI_RES_PARAMETER_T stResData;
};

static bool in_hd_set(UINT32 mode)
{
    return mode_facts::facts_of(mode).is(mode_facts::tve_hd);
}

static void log_request(const Working& w)
{
    PMX_IsLog(0, "SetModeEx\n");
    PMX_IsLog(9, "CCIR(%d, %s)\n", w.rCCIR.fgOutputEnable, name_of(w.rCCIR.eResMode));
    PMX_IsLog(9, "HDMI(%d, %s)\n", w.rHDMI.fgOutputEnable, name_of(w.rHDMI.eResMode));
    PMX_IsLog(9, "CAV (%d, %s)\n", w.rCAV.fgOutputEnable, name_of(w.rCAV.eResMode));
    PMX_IsLog(9, "CVBS(%d, %s)\n", w.rCVBS.fgOutputEnable, name_of(w.rCVBS.eResMode));
    PMX_IsLog(9, "CCIR(%d, %d, %d, %d)\n", static_cast<int>(w.rCCIR.eCcirDrvInfo.eDgoMode),
              static_cast<int>(w.rCCIR.eCcirDrvInfo.eDgoFmt), static_cast<int>(w.rCCIR.eCcirDrvInfo.eDgiMode),
              static_cast<int>(w.rCCIR.eCcirDrvInfo.eDgiFmt));
    PMX_IsLog(9, "OSD5(%d)\n", w.fgOSD5);
}

static void choose_format(Working& w)
{
    if (w.rCCIR.fgOutputEnable != 0)
        w.ucFmtMode = static_cast<UCHAR>(w.rCCIR.eResMode);
    else if (w.rHDMI.fgOutputEnable != 0)
        w.ucFmtMode = static_cast<UCHAR>(w.rHDMI.eResMode);
    else if (w.rCAV.fgOutputEnable != 0)
        w.ucFmtMode = static_cast<UCHAR>(w.rCAV.eResMode);
    else if (w.rCVBS.fgOutputEnable != 0)
        w.ucFmtMode = static_cast<UCHAR>(w.rCVBS.eResMode);
    else
    {
        PMX_IsLog(0, "[PMX] Warning: Disable All output, set fmt as %d.\n", static_cast<int>(w.rHDMI.eResMode));
        w.ucFmtMode = static_cast<UCHAR>(w.rHDMI.eResMode);
    }
}

/* From the frequency to the stored request. `given` are the copies as they were before disabled outputs took the
 * mixer's format. */
static void find_changes_and_store(Working& w, const PMX_RESOLUTION_T* given)
{
    if (conf.ucVfreq != w.ucVFreq)
        vSetPLLGP_HDMIDDS(w.ucFmtMode);
    if (conf.ucMode == w.ucFmtMode && conf.ucVfreq == w.ucVFreq && conf.fgSetModeCalled != 0 &&
        conf.rDrvExtScl == w.rDrvExtScl)
        w.fgFmtChange = FALSE;
    else
        w.fgFmtChange = TRUE;
    conf.ucMode = w.ucFmtMode;
    conf.ucVfreq = w.ucVFreq;
    conf.fgSetModeCalled = 1;
    conf.rDrvExtScl = w.rDrvExtScl;

    PMX_RESOLUTION_T* const stored = conf.arOutputConf;
    if (stored[1].fgOutputEnable == given[1].fgOutputEnable && stored[1].eResMode == given[1].eResMode)
        w.fgHdmiChange = fgIsHotPlugChgRes() == 1 ? TRUE : FALSE;
    else
        w.fgHdmiChange = TRUE;
    w.fgCavChange = stored[2].fgOutputEnable != given[2].fgOutputEnable || stored[2].eResMode != given[2].eResMode;
    w.fgCvbsChange = stored[3].fgOutputEnable != given[3].fgOutputEnable || stored[3].eResMode != given[3].eResMode;
    const UINT8 remembered = conf.fgOSD5;
    w.fgOSD5Change = remembered != w.fgOSD5;
    for (int output = 0; output < 4; ++output)
    {
        stored[output].fgOutputEnable = given[output].fgOutputEnable;
        stored[output].eResMode = given[output].eResMode;
    }
    conf.fgOSD5 = w.fgOSD5;
    if (_fgBootUp == 1)
    {
        w.fgFmtChange = TRUE;
        w.fgHdmiChange = TRUE;
        w.fgCavChange = TRUE;
        w.fgCvbsChange = TRUE;
        _fgBootUp = 0;
    }
}

static void fill_record(Working& w)
{
    std::memset(&w.stResData, 0, sizeof w.stResData);
    w.stResData.u1ScaleMode = 0;
    w.stResData.ucHdmiOutDisplayResolution = static_cast<UINT8>(w.rHDMI.eResMode);
    w.stResData.ucFmtOutResolution = w.ucFmtMode;
    w.stResData.ucCCIROutResolution = w.ucFmtMode;
    w.stResData.ucHdmiOutMode = static_cast<UINT8>(w.rDrvExtScl);
    w.stResData.eCcirDrvInfo = w.rCCIR.eCcirDrvInfo;
    w.stResData.fgOsdMsg = w.fgOSD5;
    w.stResData.fgCCIROutEnable = w.rCCIR.fgOutputEnable;
    w.stResData.fgHdmiOutEnable = w.rHDMI.fgOutputEnable;
}

static void route_fifth_osd(const Working& w)
{
    const UCHAR mode = static_cast<UCHAR>(w.rCVBS.eResMode);
    if ((w.fgHDExist != 0 && !in_hd_set(w.rCAV.eResMode)) || w.fgOSD5 == 2)
        _i4Osd5Out(1, mode);
    else if (w.fgOSD5 == 1 || w.fgHDExist != 0)
        _i4Osd5Out_CVBSOnly(1, mode);
    else
        _i4Osd5Out(0, mode);
}

static void set_encoders(const Working& w)
{
    if (TVE_SetFmtEx(TVE_1, w.ucFmtMode, w.ucVFreq, static_cast<UCHAR>(w.rCAV.eResMode), w.rCAV.fgOutputEnable,
                     w.fgHDExist, w.fgOSD5) != TVE_SET_OK)
        Assert("TVE_SetFmtEx(TVE_1, ucFmtMode, ucVFreq, rCAV.eResMode, rCAV.fgOutputEnable, fgHDExist, fgOSD5) == "
               "TVE_SET_OK",
               __FILE__, __LINE__);
    if (TVE_SetFmtEx(TVE_2, w.ucFmtMode, w.ucVFreq, static_cast<UCHAR>(w.rCVBS.eResMode), w.rCVBS.fgOutputEnable,
                     w.fgHDExist, w.fgOSD5) != TVE_SET_OK)
        Assert("TVE_SetFmtEx(TVE_2, ucFmtMode, ucVFreq, rCVBS.eResMode, rCVBS.fgOutputEnable, fgHDExist, fgOSD5) == "
               "TVE_SET_OK",
               __FILE__, __LINE__);
    TVE_SetEnable(TVE_1, w.rCAV.fgOutputEnable);
    TVE_SetEnable(TVE_2, w.rCVBS.fgOutputEnable);
}

static void full_change(Working& w)
{
    if (_PmxTestOsd == 0)
    {
        PMX_IsLog(1, "PMX Start to set OSD Display mode:%d.\n", w.ucFmtMode);
        OSD_BASE_SetDisplayMode(w.ucFmtMode);
        PMX_IsLog(1, "PMX Finished to set OSD Display mode.\n");
    }
    TVE_SetBlackScreen(0, 0);
    TVE_SetBlackScreen(1, 0);
    fill_record(w);
    fgPmxDrvSetAvd(9, &w.stResData, 1);
    fgPmxDrvSetAvd(16, &w.stResData, 1);
    PMX_HalSetMode(0, w.ucFmtMode);
    if (w.fgOSD5 == 0)
        PMX_HalSetScalerMode(conf.ucMode);
    PMX_IsLog(9, "Adjust PMX_ColorSpaceSetup call sequence.\n");
    PMX_ColorSpaceSetup(conf.eMasterColorSpace, conf.ucMode);
    VDP_SetTvFormat(w.ucFmtMode, 1);
    if (w.ucVFreq == 60 || w.ucVFreq == 30 || w.ucVFreq == 29 || w.ucVFreq == 23 || w.ucVFreq == 0)
    {
        if (PMX_SetTvType(0, 0) != 1)
            Assert("PMX_SetTvType(ucPmxId, PMX_TV_TYPE_NTSC) == PMX_SET_OK", __FILE__, __LINE__);
    }
    else
    {
        if (PMX_SetTvType(0, 3) != 1)
            Assert("PMX_SetTvType(ucPmxId, PMX_TV_TYPE_PAL) == PMX_SET_OK", __FILE__, __LINE__);
    }
    route_fifth_osd(w);
    set_encoders(w);
    PMX_HalScalerReset(0);
    vPostChgRes(w.ucFmtMode);
    VDP_GlobalOutputChange();
    VDP_VsyncSendCmd(0, 2);
    VDP_VsyncSendCmd(1, 2);
    VDP_VsyncSendCmd(2, 2);
    fgPmxDrvSetAvd(10, &w.stResData, 1);
    OSD_BASE_SetFlag_PMXChangeResDone();
    w.fgHdmiExist = TRUE;
}

static void same_format(Working& w)
{
    fill_record(w);
    if (w.fgHdmiChange != 0)
    {
        fgPmxDrvSetAvd(9, &w.stResData, 1);
        fgPmxDrvSetAvd(16, &w.stResData, 1);
    }
    if (w.fgCavChange != 0 || w.fgCvbsChange != 0 || w.fgOSD5Change != 0)
    {
        route_fifth_osd(w);
        set_encoders(w);
    }
    if (w.fgHdmiChange != 0)
    {
        fgPmxDrvSetAvd(10, &w.stResData, 1);
        w.fgHdmiExist = TRUE;
    }
    else
    {
        w.fgHdmiExist = FALSE;
    }
    VDP_SetTvFormat(w.ucFmtMode, 0);
    if (w.fgHdmiChange == 0)
        vSendAvdNotifyScomResChgOK();
    PMX_HalScalerReset(0);
}

static void wait_for_display_part(const Working& w)
{
    if (!((w.fgHdmiExist != 0 || status.fgTimerAlreadySet != 0) && i4GetHotPlugStatus() == 1))
    {
        PMX_IsLog(0, "[PMX] fgHdmiExist:%d, Not wait display part...\n", w.fgHdmiExist);
        PMX_SetFormatChangeFlag(FALSE);
    }
    if (fgPMX_DisplayModeReady() != 0)
        return;
    PMX_IsLog(0, "[PMX] VDP_SetClearVideo & Not Mix OSD..\n");
    VDP_SetClearVideo(0, 0, 0x80, 0x80);
    vPmxNotMixPlane(0, 2);
    vPmxNotMixPlane(0, 3);
    vPmxNotMixPlane(0, 4);
    vPmxNotMixPlane(0, 5);
    vPmxNotMixPlane(0, 6);
    PMX_SetFormatChangeTimer(10000);
    status.fgTimerAlreadySet = TRUE;
}

UINT32 PMX_SetModeEx(UCHAR ucPmxId, PMX_RESOLUTION_T* prOutConf, UCHAR ucVFreq, DRV_EXT_CHIP_USAGE_T rDrvExtScl,
                     UINT8 fgOSD5)
{
    if (ucPmxId != 0)
        return 0;
    if (prOutConf == nullptr)
        return 0;
    Working w = {};
    w.ucVFreq = ucVFreq;
    w.rDrvExtScl = rDrvExtScl;
    w.fgOSD5 = fgOSD5;
    PMX_RESOLUTION_T given[4];
    std::memcpy(given, prOutConf, sizeof given);
    w.rCCIR = given[PMX_OUTPUT_CCIR];
    w.rHDMI = given[PMX_OUTPUT_HDMI];
    w.rCAV = given[PMX_OUTPUT_CAV];
    w.rCVBS = given[PMX_OUTPUT_CVBS];
    log_request(w);
    choose_format(w);
    if (PMX_CheckCap(0, w.ucFmtMode) == 0)
    {
        PMX_IsLog(0, "[PMX] PMX_SetModeEx, PMX_CheckCap error, set format change flag, wait display part...\n");
        PMX_SetFormatChangeFlag(FALSE);
        return 0;
    }
    if (w.rHDMI.fgOutputEnable == 0)
        w.rHDMI.eResMode = static_cast<PMX_RESOLUTION_MODE_T>(w.ucFmtMode);
    if (w.rCAV.fgOutputEnable == 0)
        w.rCAV.eResMode = static_cast<PMX_RESOLUTION_MODE_T>(w.ucFmtMode);
    if (w.rCVBS.fgOutputEnable == 0)
        w.rCVBS.eResMode = static_cast<PMX_RESOLUTION_MODE_T>(w.ucFmtMode);
    find_changes_and_store(w, given);
    w.fgHDExist = in_hd_set(w.ucFmtMode) ? 1 : 0;
    PMX_IsLog(9, "HD Exist(%d)\n", w.fgHDExist);
    TVE_SetMuteCtrol(w.fgFmtChange, static_cast<UCHAR>(w.rCAV.eResMode), static_cast<UCHAR>(w.rCVBS.eResMode),
                     w.fgHDExist, fgOSD5);
    if (w.fgFmtChange != 0)
        full_change(w);
    else
        same_format(w);
    wait_for_display_part(w);
    return 1;
}
