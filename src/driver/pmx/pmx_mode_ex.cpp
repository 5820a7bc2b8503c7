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

/* Working values of one call. */
typedef struct
{
    UCHAR ucFmtMode; // the mixer's format
    UCHAR ucVFreq;
    UINT8 fgOSD5;
    BOOL fgHDExist; // the mixer's format is an HD format
    BOOL fgFmtChange;
    BOOL fgHdmiChange;
    BOOL fgTveChange; // component, composite or the fifth OSD plane: looked at when the format is the same
    OUTPUT_T rHDMI;
    OUTPUT_T rCAV;
    OUTPUT_T rCVBS;
} MODE_EX_T;

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

/* The first enabled output, in the order of their indices, gives the mixer's format. */
static UCHAR ucChooseFormat(const PMX_RESOLUTION_T* prOutConf)
{
    for (UINT32 i = 0; i < PMX_OUTPUT_NUM; i++)
    {
        if (prOutConf[i].fgOutputEnable != 0)
            return (UCHAR)prOutConf[i].eResMode;
    }
    PMX_RESOLUTION_MODE_T eHdmiMode = prOutConf[PMX_OUTPUT_HDMI].eResMode;
    PMX_IsLog(0, "[PMX] Warning: Disable All output, set fmt as %d.\n", (INT32)eHdmiMode);
    return (UCHAR)eHdmiMode;
}

static BOOL fgDiffers(const PMX_RESOLUTION_T* prStored, const PMX_RESOLUTION_T* prGiven)
{
    return prStored->fgOutputEnable != prGiven->fgOutputEnable || prStored->eResMode != prGiven->eResMode;
}

/* Find what changed, against what the record holds, and store the request. The video PLL is set here too, for a new
 * frequency alone: a new format at the old frequency leaves it. */
static void vFindChanges(MODE_EX_T* pr, const PMX_RESOLUTION_T* prGiven, DRV_EXT_CHIP_USAGE_T rDrvExtScl)
{
    PMX_CONF_T* prConf = prPmxConf();
    PMX_RESOLUTION_T* prStored = prConf->arOutputConf;

    pr->fgFmtChange = TRUE;
    if (prConf->ucVfreq != pr->ucVFreq)
        vSetPLLGP_HDMIDDS(pr->ucFmtMode);
    else if (prConf->ucMode == pr->ucFmtMode && prConf->fgSetModeCalled != 0 && prConf->rDrvExtScl == rDrvExtScl)
        pr->fgFmtChange = FALSE;
    prConf->ucMode = pr->ucFmtMode;
    prConf->ucVfreq = pr->ucVFreq;
    prConf->fgSetModeCalled = 1;
    prConf->rDrvExtScl = rDrvExtScl;

    pr->fgHdmiChange = fgDiffers(&prStored[PMX_OUTPUT_HDMI], &prGiven[PMX_OUTPUT_HDMI]) || fgIsHotPlugChgRes() == 1;
    pr->fgTveChange = fgDiffers(&prStored[PMX_OUTPUT_CAV], &prGiven[PMX_OUTPUT_CAV]) ||
                      fgDiffers(&prStored[PMX_OUTPUT_CVBS], &prGiven[PMX_OUTPUT_CVBS]) || prConf->fgOSD5 != pr->fgOSD5;

    for (UINT32 i = 0; i < PMX_OUTPUT_NUM; i++) // as given: the next request is compared with this one
    {
        prStored[i].fgOutputEnable = prGiven[i].fgOutputEnable;
        prStored[i].eResMode = prGiven[i].eResMode;
    }
    prConf->fgOSD5 = pr->fgOSD5;

    if (_fgBootUp == 1) // the record does not tell what the boot loader set: the first call leaves nothing out
    {
        pr->fgFmtChange = TRUE;
        _fgBootUp = 0;
    }
}

/* An output that is off runs the mixer's format. */
static OUTPUT_T rAsRun(const PMX_RESOLUTION_T* prGiven, UCHAR ucFmtMode)
{
    PMX_RESOLUTION_MODE_T eResMode = prGiven->eResMode;
    if (prGiven->fgOutputEnable == 0)
        eResMode = (PMX_RESOLUTION_MODE_T)ucFmtMode;
    return { .eResMode = eResMode, .fgOutputEnable = prGiven->fgOutputEnable };
}

/* Route the fifth OSD plane to component and composite. */
static void vRouteFifthOsd(const MODE_EX_T* pr)
{
    UCHAR ucCvbsMode = (UCHAR)pr->rCVBS.eResMode;

    if ((pr->fgHDExist != 0 && fgPmxTveHd(pr->rCAV.eResMode) == 0) || pr->fgOSD5 == 2)
        _i4Osd5Out(1, ucCvbsMode);
    else if (pr->fgOSD5 == 1 || pr->fgHDExist != 0)
        _i4Osd5Out_CVBSOnly(1, ucCvbsMode);
    else
        _i4Osd5Out(0, ucCvbsMode);
}

static void vSetTvEncoderFormat(UINT32 u4Tve, const OUTPUT_T* prOutput, const MODE_EX_T* pr, const CHAR* szExpected)
{
    if (TVE_SetFmtEx(u4Tve, pr->ucFmtMode, pr->ucVFreq, (UCHAR)prOutput->eResMode, prOutput->fgOutputEnable,
                     pr->fgHDExist, pr->fgOSD5) != TVE_SET_OK)
        Assert(szExpected, __FILE__, __LINE__);
}

/* Route the fifth OSD plane and set both TV encoders. */
static void vSetTvEncoders(const MODE_EX_T* pr)
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

static void vApplyFullChange(const MODE_EX_T* pr, PMX_SET_HDMI_RES_PARAMETER_T* prResData)
{
    const PMX_CONF_T* prConf = prPmxConf();

    if (_PmxTestOsd == 0)
    {
        PMX_IsLog(1, "PMX Start to set OSD Display mode:%d.\n", pr->ucFmtMode);
        OSD_BASE_SetDisplayMode(pr->ucFmtMode);
        PMX_IsLog(1, "PMX Finished to set OSD Display mode.\n");
    }
    TVE_SetBlackScreen(TVE_1, 0);
    TVE_SetBlackScreen(TVE_2, 0);
    fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, prResData, 1);
    fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, prResData, 1);
    PMX_HalSetMode(0, pr->ucFmtMode);
    if (pr->fgOSD5 == 0) // else the scaler stays in its mode
        PMX_HalSetScalerMode(prConf->ucMode);
    PMX_IsLog(9, "Adjust PMX_ColorSpaceSetup call sequence.\n");
    PMX_ColorSpaceSetup(prConf->eMasterColorSpace, prConf->ucMode); // one-mode setting does this before the modes
    VDP_SetTvFormat(pr->ucFmtMode, 1);
    vPmxChooseTvType(fgIsNtsc(pr->ucVFreq));
    vSetTvEncoders(pr);
    PMX_HalScalerReset(0);
    vPostChgRes(pr->ucFmtMode);
    vPmxFinishModeChange(prResData);
}

static void vApplySameFormat(const MODE_EX_T* pr, PMX_SET_HDMI_RES_PARAMETER_T* prResData)
{
    if (pr->fgHdmiChange != 0)
    {
        fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, prResData, 1);
        fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, prResData, 1);
    }
    if (pr->fgTveChange != 0)
        vSetTvEncoders(pr);
    if (pr->fgHdmiChange != 0)
        fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, prResData, 1);
    VDP_SetTvFormat(pr->ucFmtMode, 0);
    if (pr->fgHdmiChange == 0)
        vSendAvdNotifyScomResChgOK();
    PMX_HalScalerReset(0);
}

/* Decide whether graphics wait. Nobody is waited for without a sink, or when neither this call nor one whose timer
 * still runs sent an HDMI change. */
static void vWaitForDisplayPart(BOOL fgHdmiExist)
{
    bool fgAnswers = (fgHdmiExist != 0 || prPmxStatus()->fgTimerAlreadySet != FALSE) && i4GetHotPlugStatus() == 1;
    if (!fgAnswers)
    {
        PMX_IsLog(0, "[PMX] fgHdmiExist:%d, Not wait display part...\n", fgHdmiExist);
        PMX_SetFormatChangeFlag(FALSE);
    }
    if (fgPMX_DisplayModeReady() != 0)
        return;

    PMX_IsLog(0, "[PMX] VDP_SetClearVideo & Not Mix OSD..\n");
    VDP_SetClearVideo(0, 0, 0x80, 0x80);
    for (UCHAR ucPlane = DRV_PMX_PLANE_3; ucPlane <= DRV_PMX_PLANE_7; ucPlane++)
        vPmxNotMixPlane(0, ucPlane);
    PMX_SetFormatChangeTimer(DISPLAY_PART_TIMEOUT_MS);
    prPmxStatus()->fgTimerAlreadySet = TRUE;
}

UINT32 PMX_SetModeEx(UCHAR ucPmxId, PMX_RESOLUTION_T* prOutConf, UCHAR ucVFreq, DRV_EXT_CHIP_USAGE_T rDrvExtScl,
                     UINT8 fgOSD5)
{
    if (ucPmxId != 0 || prOutConf == nullptr)
        return 0;

    vLogRequest(prOutConf, fgOSD5);
    UCHAR ucFmtMode = ucChooseFormat(prOutConf);
    if (PMX_CheckCap(0, ucFmtMode) == 0)
    {
        // The text speaks of setting the flag; it is lowered: a refused request starts nothing to wait for.
        PMX_IsLog(0, "[PMX] PMX_SetModeEx, PMX_CheckCap error, set format change flag, wait display part...\n");
        PMX_SetFormatChangeFlag(FALSE);
        return 0;
    }

    MODE_EX_T rCall;
    rCall.ucFmtMode = ucFmtMode;
    rCall.ucVFreq = ucVFreq;
    rCall.fgOSD5 = fgOSD5;
    rCall.fgHDExist = fgPmxTveHd(ucFmtMode);
    rCall.rHDMI = rAsRun(&prOutConf[PMX_OUTPUT_HDMI], ucFmtMode);
    rCall.rCAV = rAsRun(&prOutConf[PMX_OUTPUT_CAV], ucFmtMode);
    rCall.rCVBS = rAsRun(&prOutConf[PMX_OUTPUT_CVBS], ucFmtMode);
    PMX_SET_HDMI_RES_PARAMETER_T stResData = {
        .u1ScaleMode = 0,
        .ucHdmiOutDisplayResolution = (UINT8)rCall.rHDMI.eResMode,
        .ucFmtOutResolution = ucFmtMode,
        .ucCCIROutResolution = ucFmtMode,
        .ucHdmiOutMode = (UINT8)rDrvExtScl,
        .eCcirDrvInfo = prOutConf[PMX_OUTPUT_CCIR].eCcirDrvInfo,
        .fgOsdMsg = fgOSD5,
        .ucCCIROutMode = 0,
        .fgCCIROutEnable = prOutConf[PMX_OUTPUT_CCIR].fgOutputEnable,
        .fgHdmiOutEnable = rCall.rHDMI.fgOutputEnable,
        .u2_Vfreq = 0,
    };

    vFindChanges(&rCall, prOutConf, rDrvExtScl);
    PMX_IsLog(9, "HD Exist(%d)\n", rCall.fgHDExist);
    TVE_SetMuteCtrol(rCall.fgFmtChange, (UCHAR)rCall.rCAV.eResMode, (UCHAR)rCall.rCVBS.eResMode, rCall.fgHDExist,
                     fgOSD5);
    if (rCall.fgFmtChange != 0)
        vApplyFullChange(&rCall, &stResData);
    else
        vApplySameFormat(&rCall, &stResData);

    // Both ways of applying send HDMI a resolution change exactly then.
    vWaitForDisplayPart(rCall.fgFmtChange != 0 || rCall.fgHdmiChange != 0);
    return 1;
}
