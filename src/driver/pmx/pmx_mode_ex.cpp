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

/* Working values of one call. */
typedef struct
{
    const PMX_RESOLUTION_T* prOutConf; // as given
    UCHAR ucVFreq;
    DRV_EXT_CHIP_USAGE_T rDrvExtScl;
    UINT8 fgOSD5;

    PMX_RESOLUTION_T rCCIR; // copies; HDMI, component and composite take the mixer's format here while they are off
    PMX_RESOLUTION_T rHDMI;
    PMX_RESOLUTION_T rCAV;
    PMX_RESOLUTION_T rCVBS;
    UCHAR ucFmtMode; // the mixer's format

    BOOL fgFmtChange;
    BOOL fgHdmiChange;
    BOOL fgCavChange;
    BOOL fgCvbsChange;
    BOOL fgOSD5Change;
    BOOL fgHDExist;   // the mixer's format is an HD format
    BOOL fgHdmiExist; // an HDMI resolution change was sent
    PMX_SET_HDMI_RES_PARAMETER_T stResData;
} MODE_EX_T;

static void vLogRequest(const MODE_EX_T* pr)
{
    const CCIR_DRV_INFO_T* prCcir = &pr->rCCIR.eCcirDrvInfo;

    PMX_IsLog(0, "SetModeEx\n");
    PMX_IsLog(9, "CCIR(%d, %s)\n", pr->rCCIR.fgOutputEnable, szPmxModeName(pr->rCCIR.eResMode));
    PMX_IsLog(9, "HDMI(%d, %s)\n", pr->rHDMI.fgOutputEnable, szPmxModeName(pr->rHDMI.eResMode));
    PMX_IsLog(9, "CAV (%d, %s)\n", pr->rCAV.fgOutputEnable, szPmxModeName(pr->rCAV.eResMode));
    PMX_IsLog(9, "CVBS(%d, %s)\n", pr->rCVBS.fgOutputEnable, szPmxModeName(pr->rCVBS.eResMode));
    PMX_IsLog(9, "CCIR(%d, %d, %d, %d)\n", (INT32)prCcir->eDgoMode, (INT32)prCcir->eDgoFmt, (INT32)prCcir->eDgiMode,
              (INT32)prCcir->eDgiFmt);
    PMX_IsLog(9, "OSD5(%d)\n", pr->fgOSD5);
}

/* The first enabled output gives the mixer's format. */
static UCHAR ucChooseFormat(const MODE_EX_T* pr)
{
    if (pr->rCCIR.fgOutputEnable != 0)
        return (UCHAR)pr->rCCIR.eResMode;
    if (pr->rHDMI.fgOutputEnable != 0)
        return (UCHAR)pr->rHDMI.eResMode;
    if (pr->rCAV.fgOutputEnable != 0)
        return (UCHAR)pr->rCAV.eResMode;
    if (pr->rCVBS.fgOutputEnable != 0)
        return (UCHAR)pr->rCVBS.eResMode;

    PMX_IsLog(0, "[PMX] Warning: Disable All output, set fmt as %d.\n", (INT32)pr->rHDMI.eResMode);
    return (UCHAR)pr->rHDMI.eResMode;
}

static void vTakeFormatIfOff(PMX_RESOLUTION_T* prOutput, UCHAR ucFmtMode)
{
    if (prOutput->fgOutputEnable == 0)
        prOutput->eResMode = (PMX_RESOLUTION_MODE_T)ucFmtMode;
}

static BOOL fgDiffers(const PMX_RESOLUTION_T* prStored, const PMX_RESOLUTION_T* prGiven)
{
    return prStored->fgOutputEnable != prGiven->fgOutputEnable || prStored->eResMode != prGiven->eResMode;
}

/* Find what changed, against what the record holds, and store the request. The video PLL is set here too, for a new
 * frequency alone: a new format at the old frequency leaves it. */
static void vFindChanges(MODE_EX_T* pr)
{
    PMX_CONF_T* prConf = prPmxConf();
    PMX_RESOLUTION_T* prStored = prConf->arOutputConf;
    const PMX_RESOLUTION_T* prGiven = pr->prOutConf;

    if (prConf->ucVfreq != pr->ucVFreq)
        vSetPLLGP_HDMIDDS(pr->ucFmtMode);

    pr->fgFmtChange = prConf->ucMode != pr->ucFmtMode || prConf->ucVfreq != pr->ucVFreq ||
                      prConf->fgSetModeCalled == 0 || prConf->rDrvExtScl != pr->rDrvExtScl;
    prConf->ucMode = pr->ucFmtMode;
    prConf->ucVfreq = pr->ucVFreq;
    prConf->fgSetModeCalled = 1;
    prConf->rDrvExtScl = pr->rDrvExtScl;

    if (fgDiffers(&prStored[PMX_OUTPUT_HDMI], &prGiven[PMX_OUTPUT_HDMI]))
        pr->fgHdmiChange = TRUE;
    else
        pr->fgHdmiChange = fgIsHotPlugChgRes() == 1;
    pr->fgCavChange = fgDiffers(&prStored[PMX_OUTPUT_CAV], &prGiven[PMX_OUTPUT_CAV]);
    pr->fgCvbsChange = fgDiffers(&prStored[PMX_OUTPUT_CVBS], &prGiven[PMX_OUTPUT_CVBS]);
    pr->fgOSD5Change = prConf->fgOSD5 != pr->fgOSD5;

    for (UINT32 i = 0; i < PMX_OUTPUT_NUM; i++) // as given: the next request is compared with this one
    {
        prStored[i].fgOutputEnable = prGiven[i].fgOutputEnable;
        prStored[i].eResMode = prGiven[i].eResMode;
    }
    prConf->fgOSD5 = pr->fgOSD5;

    if (_fgBootUp == 1) // the record does not tell what the boot loader set: the first call leaves nothing out
    {
        pr->fgFmtChange = TRUE;
        pr->fgHdmiChange = TRUE;
        pr->fgCavChange = TRUE;
        pr->fgCvbsChange = TRUE;
        _fgBootUp = 0;
    }
}

static void vFillResData(MODE_EX_T* pr)
{
    pr->stResData.u1ScaleMode = 0;
    pr->stResData.ucHdmiOutDisplayResolution = (UINT8)pr->rHDMI.eResMode;
    pr->stResData.ucFmtOutResolution = pr->ucFmtMode;
    pr->stResData.ucCCIROutResolution = pr->ucFmtMode;
    pr->stResData.ucHdmiOutMode = (UINT8)pr->rDrvExtScl;
    pr->stResData.eCcirDrvInfo = pr->rCCIR.eCcirDrvInfo;
    pr->stResData.fgOsdMsg = pr->fgOSD5;
    pr->stResData.fgCCIROutEnable = pr->rCCIR.fgOutputEnable;
    pr->stResData.fgHdmiOutEnable = pr->rHDMI.fgOutputEnable;
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

/* Route the fifth OSD plane and set both TV encoders. */
static void vSetTvEncoders(const MODE_EX_T* pr)
{
    vRouteFifthOsd(pr);
    if (TVE_SetFmtEx(TVE_1, pr->ucFmtMode, pr->ucVFreq, (UCHAR)pr->rCAV.eResMode, pr->rCAV.fgOutputEnable,
                     pr->fgHDExist, pr->fgOSD5) != TVE_SET_OK)
        Assert("TVE_SetFmtEx(TVE_1, ucFmtMode, ucVFreq, rCAV.eResMode, rCAV.fgOutputEnable, fgHDExist, fgOSD5) == "
               "TVE_SET_OK",
               __FILE__, __LINE__);
    if (TVE_SetFmtEx(TVE_2, pr->ucFmtMode, pr->ucVFreq, (UCHAR)pr->rCVBS.eResMode, pr->rCVBS.fgOutputEnable,
                     pr->fgHDExist, pr->fgOSD5) != TVE_SET_OK)
        Assert("TVE_SetFmtEx(TVE_2, ucFmtMode, ucVFreq, rCVBS.eResMode, rCVBS.fgOutputEnable, fgHDExist, fgOSD5) == "
               "TVE_SET_OK",
               __FILE__, __LINE__);
    TVE_SetEnable(TVE_1, pr->rCAV.fgOutputEnable);
    TVE_SetEnable(TVE_2, pr->rCVBS.fgOutputEnable);
}

/* More frequencies count as NTSC than in one-mode setting, where 60 alone does; 24 is PAL in both. */
static void vSetTvType(UCHAR ucVFreq)
{
    if (ucVFreq == 60 || ucVFreq == 30 || ucVFreq == 29 || ucVFreq == 23 || ucVFreq == 0)
    {
        if (PMX_SetTvType(0, PMX_TV_TYPE_NTSC) != PMX_SET_OK)
            Assert("PMX_SetTvType(ucPmxId, PMX_TV_TYPE_NTSC) == PMX_SET_OK", __FILE__, __LINE__);
    }
    else
    {
        if (PMX_SetTvType(0, PMX_TV_TYPE_PAL) != PMX_SET_OK)
            Assert("PMX_SetTvType(ucPmxId, PMX_TV_TYPE_PAL) == PMX_SET_OK", __FILE__, __LINE__);
    }
}

static void vApplyFullChange(MODE_EX_T* pr)
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
    vFillResData(pr);
    fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, &pr->stResData, 1);
    fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, &pr->stResData, 1);
    PMX_HalSetMode(0, pr->ucFmtMode);
    if (pr->fgOSD5 == 0) // else the scaler stays in its mode
        PMX_HalSetScalerMode(prConf->ucMode);
    PMX_IsLog(9, "Adjust PMX_ColorSpaceSetup call sequence.\n");
    PMX_ColorSpaceSetup(prConf->eMasterColorSpace, prConf->ucMode); // one-mode setting does this before the modes
    VDP_SetTvFormat(pr->ucFmtMode, 1);
    vSetTvType(pr->ucVFreq);
    vSetTvEncoders(pr);
    PMX_HalScalerReset(0);
    vPostChgRes(pr->ucFmtMode);
    VDP_GlobalOutputChange();
    for (UINT32 u4VdpIdx = 0; u4VdpIdx < 3; u4VdpIdx++)
        VDP_VsyncSendCmd(u4VdpIdx, 2);
    fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, &pr->stResData, 1);
    OSD_BASE_SetFlag_PMXChangeResDone();
    pr->fgHdmiExist = TRUE;
}

static void vApplySameFormat(MODE_EX_T* pr)
{
    vFillResData(pr);
    if (pr->fgHdmiChange != 0)
    {
        fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, &pr->stResData, 1);
        fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, &pr->stResData, 1);
    }
    if (pr->fgCavChange != 0 || pr->fgCvbsChange != 0 || pr->fgOSD5Change != 0)
        vSetTvEncoders(pr);
    if (pr->fgHdmiChange != 0)
    {
        fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, &pr->stResData, 1);
        pr->fgHdmiExist = TRUE;
    }
    else
    {
        pr->fgHdmiExist = FALSE;
    }
    VDP_SetTvFormat(pr->ucFmtMode, 0);
    if (pr->fgHdmiChange == 0)
        vSendAvdNotifyScomResChgOK();
    PMX_HalScalerReset(0);
}

/* Decide whether graphics wait. Nobody is waited for without a sink, or when neither this call nor one whose timer
 * still runs sent an HDMI change. */
static void vWaitForDisplayPart(const MODE_EX_T* pr)
{
    bool fgAnswers = (pr->fgHdmiExist != 0 || _arPmxDispPartStatus.fgTimerAlreadySet != 0) && i4GetHotPlugStatus() == 1;
    if (!fgAnswers)
    {
        PMX_IsLog(0, "[PMX] fgHdmiExist:%d, Not wait display part...\n", pr->fgHdmiExist);
        PMX_SetFormatChangeFlag(FALSE);
    }
    if (fgPMX_DisplayModeReady() != 0)
        return;

    PMX_IsLog(0, "[PMX] VDP_SetClearVideo & Not Mix OSD..\n");
    VDP_SetClearVideo(0, 0, 0x80, 0x80);
    for (UCHAR ucPlane = DRV_PMX_PLANE_3; ucPlane <= DRV_PMX_PLANE_7; ucPlane++)
        vPmxNotMixPlane(0, ucPlane);
    PMX_SetFormatChangeTimer(DISPLAY_PART_TIMEOUT_MS);
    _arPmxDispPartStatus.fgTimerAlreadySet = TRUE;
}

UINT32 PMX_SetModeEx(UCHAR ucPmxId, PMX_RESOLUTION_T* prOutConf, UCHAR ucVFreq, DRV_EXT_CHIP_USAGE_T rDrvExtScl,
                     UINT8 fgOSD5)
{
    if (ucPmxId != 0 || prOutConf == nullptr)
        return 0;

    MODE_EX_T rCall = {};
    rCall.prOutConf = prOutConf;
    rCall.ucVFreq = ucVFreq;
    rCall.rDrvExtScl = rDrvExtScl;
    rCall.fgOSD5 = fgOSD5;
    rCall.rCCIR = prOutConf[PMX_OUTPUT_CCIR];
    rCall.rHDMI = prOutConf[PMX_OUTPUT_HDMI];
    rCall.rCAV = prOutConf[PMX_OUTPUT_CAV];
    rCall.rCVBS = prOutConf[PMX_OUTPUT_CVBS];
    vLogRequest(&rCall);

    rCall.ucFmtMode = ucChooseFormat(&rCall);
    if (PMX_CheckCap(0, rCall.ucFmtMode) == 0)
    {
        // The text speaks of setting the flag; it is lowered: a refused request starts nothing to wait for.
        PMX_IsLog(0, "[PMX] PMX_SetModeEx, PMX_CheckCap error, set format change flag, wait display part...\n");
        PMX_SetFormatChangeFlag(FALSE);
        return 0;
    }
    vTakeFormatIfOff(&rCall.rHDMI, rCall.ucFmtMode);
    vTakeFormatIfOff(&rCall.rCAV, rCall.ucFmtMode);
    vTakeFormatIfOff(&rCall.rCVBS, rCall.ucFmtMode);

    vFindChanges(&rCall);
    rCall.fgHDExist = fgPmxTveHd(rCall.ucFmtMode);
    PMX_IsLog(9, "HD Exist(%d)\n", rCall.fgHDExist);
    TVE_SetMuteCtrol(rCall.fgFmtChange, (UCHAR)rCall.rCAV.eResMode, (UCHAR)rCall.rCVBS.eResMode, rCall.fgHDExist,
                     fgOSD5);

    if (rCall.fgFmtChange != 0)
        vApplyFullChange(&rCall);
    else
        vApplySameFormat(&rCall);
    vWaitForDisplayPart(&rCall);
    return 1;
}
