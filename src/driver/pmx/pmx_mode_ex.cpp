// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Per-output mode setting: choose the mixer's format, find what changed, drive the stack, decide whether graphics must
 * wait. The order of the calls is what the neighbouring drivers rely on. */
#include "drv_av_d.h"
#include "drv_osd.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

#define DISPLAY_PART_TIMEOUT_MS 10000

/* What an output will run. */
typedef struct
{
    PMX_RESOLUTION_MODE_T eResMode; // the mixer's format while the output is off
    BOOL fgOutputEnable;
} OUTPUT_T;

/* What one call was asked for, and what follows from that alone. */
typedef struct
{
    const PMX_RESOLUTION_T* prOutConf; // the outputs as given: the layer's copy of them
    DRV_EXT_CHIP_USAGE_T rDrvExtScl;
    UCHAR ucVFreq;
    UINT8 fgOSD5;
    UCHAR ucFmtMode; // the mixer's format
    bool fgHDExist;  // which is an HD format
    OUTPUT_T rHDMI;
    OUTPUT_T rCAV;
    OUTPUT_T rCVBS;
} REQUEST_T;

/* What it changes, against what the record held. */
typedef struct
{
    bool fgFmtChange;
    bool fgHdmiChange;
    bool fgTveChange; // component, composite or the fifth OSD plane: looked at when the format is the same
} CHANGES_T;

static void vLogRequest(const PMX_RESOLUTION_T* prOutConf, UINT8 fgOSD5)
{
    const PMX_RESOLUTION_T* prCCIR = &prOutConf[PMX_OUTPUT_CCIR];
    const PMX_RESOLUTION_T* prHDMI = &prOutConf[PMX_OUTPUT_HDMI];
    const PMX_RESOLUTION_T* prCAV = &prOutConf[PMX_OUTPUT_CAV];
    const PMX_RESOLUTION_T* prCVBS = &prOutConf[PMX_OUTPUT_CVBS];
    const CCIR_DRV_INFO_T* prCcirInfo = &prCCIR->eCcirDrvInfo;

    PMX_IsLog(0, "SetModeEx\n");
    PMX_IsLog(9, "CCIR(%d, %s)\n", prCCIR->fgOutputEnable, szPmxModeName(prCCIR->eResMode));
    PMX_IsLog(9, "HDMI(%d, %s)\n", prHDMI->fgOutputEnable, szPmxModeName(prHDMI->eResMode));
    PMX_IsLog(9, "CAV (%d, %s)\n", prCAV->fgOutputEnable, szPmxModeName(prCAV->eResMode));
    PMX_IsLog(9, "CVBS(%d, %s)\n", prCVBS->fgOutputEnable, szPmxModeName(prCVBS->eResMode));
    PMX_IsLog(9, "CCIR(%d, %d, %d, %d)\n", (INT32)prCcirInfo->eDgoMode, (INT32)prCcirInfo->eDgoFmt,
              (INT32)prCcirInfo->eDgiMode, (INT32)prCcirInfo->eDgiFmt);
    PMX_IsLog(9, "OSD5(%d)\n", fgOSD5);
}

/* The mixer runs what the first output runs that is on; with all of them off, HDMI's mode. */
static UCHAR ucChooseFormat(const PMX_RESOLUTION_T* prOutConf)
{
    for (UINT32 i = 0; i < PMX_OUTPUT_NUM; i++)
    {
        if (prOutConf[i].fgOutputEnable != FALSE)
        {
            PMX_NOTE(FORMAT_FROM_OUTPUT, i, (UCHAR)prOutConf[i].eResMode);
            return (UCHAR)prOutConf[i].eResMode;
        }
    }
    PMX_RESOLUTION_MODE_T eHdmiMode = prOutConf[PMX_OUTPUT_HDMI].eResMode;
    PMX_NOTE(FORMAT_FROM_OFF, (UCHAR)eHdmiMode);
    PMX_IsLog(0, "[PMX] Warning: Disable All output, set fmt as %d.\n", (INT32)eHdmiMode);
    return (UCHAR)eHdmiMode;
}

/* An output that is off runs the mixer's format. */
static OUTPUT_T rAsRun(const PMX_RESOLUTION_T* prGiven, UCHAR ucFmtMode)
{
    PMX_RESOLUTION_MODE_T eResMode = prGiven->eResMode;
    if (prGiven->fgOutputEnable == FALSE)
        eResMode = (PMX_RESOLUTION_MODE_T)ucFmtMode;
    return { .eResMode = eResMode, .fgOutputEnable = prGiven->fgOutputEnable };
}

static bool fgFormatDiffers(const REQUEST_T* pr)
{
    const PMX_CONF_T* prConf = prPmxConf();
    return prConf->ucMode != pr->ucFmtMode || prConf->ucVfreq != pr->ucVFreq || prConf->fgSetModeCalled == FALSE ||
           prConf->rDrvExtScl != pr->rDrvExtScl;
}

static void vStoreFormat(const REQUEST_T* pr)
{
    PMX_CONF_T* prConf = prPmxConf();
    prConf->ucMode = pr->ucFmtMode;
    prConf->ucVfreq = pr->ucVFreq;
    prConf->fgSetModeCalled = TRUE;
    prConf->rDrvExtScl = pr->rDrvExtScl;
}

static bool fgOutputDiffers(const REQUEST_T* pr, UINT32 u4Output)
{
    const PMX_RESOLUTION_T* prStored = &prPmxConf()->arOutputConf[u4Output];
    const PMX_RESOLUTION_T* prGiven = &pr->prOutConf[u4Output];
    return prStored->fgOutputEnable != prGiven->fgOutputEnable || prStored->eResMode != prGiven->eResMode;
}

/* As given, not as run: the next request is compared with this one. */
static void vStoreOutputs(const REQUEST_T* pr)
{
    PMX_CONF_T* prConf = prPmxConf();
    for (UINT32 i = 0; i < PMX_OUTPUT_NUM; i++)
    {
        prConf->arOutputConf[i].fgOutputEnable = pr->prOutConf[i].fgOutputEnable;
        prConf->arOutputConf[i].eResMode = pr->prOutConf[i].eResMode;
    }
    prConf->fgOSD5 = pr->fgOSD5;
}

/* Find what changed, bit by bit in front of what overwrites it, and store the request. HDMI is asked in between. */
static CHANGES_T rFindChangesAndStore(const REQUEST_T* pr)
{
    PMX_NOTE(FORMAT_WAS, prPmxConf()->ucMode, prPmxConf()->ucVfreq);
    bool fgFmtChange = fgFormatDiffers(pr);
    vStoreFormat(pr);

    bool fgHdmiChange = fgOutputDiffers(pr, PMX_OUTPUT_HDMI) || fgIsHotPlugChgRes() == TRUE;
    bool fgTveChange = fgOutputDiffers(pr, PMX_OUTPUT_CAV) || fgOutputDiffers(pr, PMX_OUTPUT_CVBS) ||
                       prPmxConf()->fgOSD5 != pr->fgOSD5;
    vStoreOutputs(pr);

    if (_fgBootUp == TRUE) // the record does not tell what the boot loader set: the first call leaves nothing out
    {
        PMX_NOTE(AFTER_BOOT);
        fgFmtChange = true;
        _fgBootUp = FALSE;
    }
    return { .fgFmtChange = fgFmtChange, .fgHdmiChange = fgHdmiChange, .fgTveChange = fgTveChange };
}

/* Say on which analogue outputs the fifth OSD plane is seen. */
static void vRouteFifthOsd(const REQUEST_T* pr)
{
    UCHAR ucCvbsMode = (UCHAR)pr->rCVBS.eResMode;

    if ((pr->fgHDExist && !fgPmxTveHd(pr->rCAV.eResMode)) || pr->fgOSD5 == 2)
        _i4Osd5Out(TRUE, ucCvbsMode);
    else if (pr->fgOSD5 == 1 || pr->fgHDExist)
        _i4Osd5Out_CVBSOnly(TRUE, ucCvbsMode);
    else
        _i4Osd5Out(FALSE, ucCvbsMode);
}

static void vSetTvEncoderFormat(UINT32 u4Tve, const OUTPUT_T* prOutput, const REQUEST_T* pr, const CHAR* szExpected)
{
    if (TVE_SetFmtEx(u4Tve, pr->ucFmtMode, pr->ucVFreq, (UCHAR)prOutput->eResMode, prOutput->fgOutputEnable,
                     pr->fgHDExist, pr->fgOSD5) != TVE_SET_OK)
        Assert(szExpected, __FILE__, __LINE__);
}

/* Route the fifth OSD plane and set both TV encoders. */
static void vSetTvEncoders(const REQUEST_T* pr)
{
    vRouteFifthOsd(pr);
    vSetTvEncoderFormat(
        TVE_1, &pr->rCAV, pr,
        "TVE_SetFmtEx(TVE_1, ucFmtMode, ucVFreq, rCAV.eResMode, rCAV.fgOutputEnable, fgHDExist, fgOSD5) == "
        "TVE_SET_OK");
    vSetTvEncoderFormat(
        TVE_2, &pr->rCVBS, pr,
        "TVE_SetFmtEx(TVE_2, ucFmtMode, ucVFreq, rCVBS.eResMode, rCVBS.fgOutputEnable, fgHDExist, fgOSD5) == "
        "TVE_SET_OK");
    TVE_SetEnable(TVE_1, pr->rCAV.fgOutputEnable);
    TVE_SetEnable(TVE_2, pr->rCVBS.fgOutputEnable);
}

/* More frequencies count as NTSC than in one-mode setting, where 60 alone does; 24 is PAL in both. */
static bool fgIsNtsc(UCHAR ucVFreq)
{
    return ucVFreq == 60 || ucVFreq == 30 || ucVFreq == 29 || ucVFreq == 23 || ucVFreq == 0;
}

/* What HDMI is told. The driver gets every byte of the record: those without a name, and the two fields that are not
 * this operation's, are 0. */
static void vFillResData(PMX_SET_HDMI_RES_PARAMETER_T* prResData, const REQUEST_T* pr)
{
    const PMX_RESOLUTION_T* prCCIR = &pr->prOutConf[PMX_OUTPUT_CCIR];

    memset(prResData, 0, sizeof *prResData);
    prResData->ucHdmiOutDisplayResolution = (UINT8)pr->rHDMI.eResMode;
    prResData->ucFmtOutResolution = pr->ucFmtMode;
    prResData->ucCCIROutResolution = pr->ucFmtMode;
    prResData->ucHdmiOutMode = (UINT8)pr->rDrvExtScl;
    prResData->eCcirDrvInfo = prCCIR->eCcirDrvInfo;
    prResData->fgOsdMsg = pr->fgOSD5;
    prResData->fgCCIROutEnable = prCCIR->fgOutputEnable;
    prResData->fgHdmiOutEnable = pr->rHDMI.fgOutputEnable;
}

static void vApplyFullChange(const REQUEST_T* pr)
{
    const PMX_CONF_T* prConf = prPmxConf();

    PMX_NOTE(FULL_CHANGE, pr->ucFmtMode, pr->ucVFreq);
    if (_PmxTestOsd == FALSE)
    {
        PMX_IsLog(1, "PMX Start to set OSD Display mode:%d.\n", pr->ucFmtMode);
        OSD_BASE_SetDisplayMode(pr->ucFmtMode);
        PMX_IsLog(1, "PMX Finished to set OSD Display mode.\n");
    }
    TVE_SetBlackScreen(TVE_1, FALSE);
    TVE_SetBlackScreen(TVE_2, FALSE);
    PMX_SET_HDMI_RES_PARAMETER_T stResData;
    vFillResData(&stResData, pr);
    fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, &stResData, 1);
    fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, &stResData, 1);
    PMX_HalSetMode(0, pr->ucFmtMode);
    if (pr->fgOSD5 == 0) // else the scaler stays in its mode
        PMX_HalSetScalerMode(prConf->ucMode);
    PMX_IsLog(9, "Adjust PMX_ColorSpaceSetup call sequence.\n");
    PMX_ColorSpaceSetup(prConf->eMasterColorSpace, prConf->ucMode); // one-mode setting does this before the modes
    VDP_SetTvFormat(pr->ucFmtMode, TRUE);
    vPmxChooseTvType(fgIsNtsc(pr->ucVFreq));
    vSetTvEncoders(pr);
    PMX_HalScalerReset(0);
    vPostChgRes(pr->ucFmtMode);
    vPmxFinishModeChange(&stResData);
}

static void vApplySameFormat(const REQUEST_T* pr, bool fgHdmiChange, bool fgTveChange)
{
    PMX_NOTE(SAME_FORMAT, fgHdmiChange, fgTveChange);
    PMX_SET_HDMI_RES_PARAMETER_T stResData;
    vFillResData(&stResData, pr);
    if (fgHdmiChange)
    {
        fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, &stResData, 1);
        fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, &stResData, 1);
    }
    if (fgTveChange)
        vSetTvEncoders(pr);
    if (fgHdmiChange)
        fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, &stResData, 1);
    VDP_SetTvFormat(pr->ucFmtMode, FALSE);
    if (!fgHdmiChange)
        vSendAvdNotifyScomResChgOK();
    PMX_HalScalerReset(0);
}

/* Nobody is waited for without a sink, or when neither this call nor one whose timer still runs sent an HDMI change. */
static bool fgDisplayPartAnswers(bool fgHdmiExist)
{
    return (fgHdmiExist || prPmxStatus()->fgTimerAlreadySet != FALSE) && i4GetHotPlugStatus() == 1;
}

/* Take graphics out of the picture until the display part, or the timer, brings them back. */
static void vHoldGraphicsBack(void)
{
    PMX_NOTE(HELD_BACK, DISPLAY_PART_TIMEOUT_MS);
    PMX_IsLog(0, "[PMX] VDP_SetClearVideo & Not Mix OSD..\n");
    VDP_SetClearVideo(0, 0, 0x80, 0x80); // black
    for (UCHAR ucPlane = PMX_OSD_PLANE_FIRST; ucPlane <= PMX_OSD_PLANE_LAST; ucPlane++)
        vPmxNotMixPlane(0, ucPlane);
    PMX_SetFormatChangeTimer(DISPLAY_PART_TIMEOUT_MS);
    prPmxStatus()->fgTimerAlreadySet = TRUE;
}

UINT32 PMX_SetModeEx(UCHAR ucPmxId, PMX_RESOLUTION_T* prOutConf, UCHAR ucVFreq, DRV_EXT_CHIP_USAGE_T rDrvExtScl,
                     UINT8 fgOSD5)
{
    if (ucPmxId != 0 || prOutConf == nullptr)
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId), PMX_WHY(NULL_POINTER, 0, 2));

    // Read once: the video PLL sleeps further down, and the caller may have other plans by then.
    PMX_RESOLUTION_T arOutConf[PMX_OUTPUT_NUM];
    memcpy(arOutConf, prOutConf, sizeof arOutConf);

    vLogRequest(arOutConf, fgOSD5);
    UCHAR ucFmtMode = ucChooseFormat(arOutConf);
    if (PMX_CheckCap(0, ucFmtMode) == 0)
    {
        // The text speaks of setting the flag; it is lowered: a refused request starts nothing to wait for.
        PMX_IsLog(0, "[PMX] PMX_SetModeEx, PMX_CheckCap error, set format change flag, wait display part...\n");
        PMX_SetFormatChangeFlag(FALSE);
        return 0;
    }

    const REQUEST_T rRequest = {
        .prOutConf = arOutConf,
        .rDrvExtScl = rDrvExtScl,
        .ucVFreq = ucVFreq,
        .fgOSD5 = fgOSD5,
        .ucFmtMode = ucFmtMode,
        .fgHDExist = fgPmxTveHd(ucFmtMode),
        .rHDMI = rAsRun(&arOutConf[PMX_OUTPUT_HDMI], ucFmtMode),
        .rCAV = rAsRun(&arOutConf[PMX_OUTPUT_CAV], ucFmtMode),
        .rCVBS = rAsRun(&arOutConf[PMX_OUTPUT_CVBS], ucFmtMode),
    };
    if (prPmxConf()->ucVfreq != ucVFreq) // a new format at the old frequency leaves the video PLL
        vSetPLLGP_HDMIDDS(ucFmtMode);
    const CHANGES_T rChanges = rFindChangesAndStore(&rRequest);

    PMX_IsLog(9, "HD Exist(%d)\n", rRequest.fgHDExist);
    TVE_SetMuteCtrol(rChanges.fgFmtChange, (UCHAR)rRequest.rCAV.eResMode, (UCHAR)rRequest.rCVBS.eResMode,
                     rRequest.fgHDExist, fgOSD5);
    if (rChanges.fgFmtChange)
        vApplyFullChange(&rRequest);
    else
        vApplySameFormat(&rRequest, rChanges.fgHdmiChange, rChanges.fgTveChange);

    bool fgHdmiExist = rChanges.fgFmtChange || rChanges.fgHdmiChange; // HDMI was sent a resolution change
    if (!fgDisplayPartAnswers(fgHdmiExist))
    {
        PMX_NOTE_IF(fgHdmiExist || prPmxStatus()->fgTimerAlreadySet != FALSE, NO_SINK);
        PMX_NOTE_IF(!fgHdmiExist && prPmxStatus()->fgTimerAlreadySet == FALSE, HDMI_AS_IT_WAS);
        PMX_IsLog(0, "[PMX] fgHdmiExist:%d, Not wait display part...\n", fgHdmiExist);
        PMX_SetFormatChangeFlag(FALSE);
    }
    if (fgPMX_DisplayModeReady() == FALSE)
        vHoldGraphicsBack();
    return 1;
}
