// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Picture adjustments, gamma, black level, and options that are passed straight on. */
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

/* What the five adjustments differ in. The console texts say "Seting" in all five, and stay so. */
typedef struct
{
    const CHAR* szTrace;
    const CHAR* szRefusal;
    UCHAR PMX_CONF_T::*pucStored;
    UINT8 u1CapBit;
    UINT8 u1HdmiCommand;
} ADJUSTMENT_T;

static constexpr ADJUSTMENT_T BRIGHTNESS = { .szTrace = "[PMX] Seting Brightness: %d,%d.\n",
                                             .szRefusal = "[PMX] Seting Brightness fail: %d,%d.\n",
                                             .pucStored = &PMX_CONF_T::ucBrightness,
                                             .u1CapBit = PMX_CAP_BIT_BRIGHTNESS,
                                             .u1HdmiCommand = PMX_SET_HDMI_BRIGHTNESS };
static constexpr ADJUSTMENT_T CONTRAST = { .szTrace = "[PMX] Seting Contrast: %d,%d.\n",
                                           .szRefusal = "[PMX] Seting Contrast fail: %d,%d.\n",
                                           .pucStored = &PMX_CONF_T::ucContrast,
                                           .u1CapBit = PMX_CAP_BIT_CONTRAST,
                                           .u1HdmiCommand = PMX_SET_HDMI_CONTRAST };
static constexpr ADJUSTMENT_T HUE = { .szTrace = "[PMX] Seting Hue: %d,%d.\n",
                                      .szRefusal = "[PMX] Seting Hue fail: %d,%d.\n",
                                      .pucStored = &PMX_CONF_T::ucHue,
                                      .u1CapBit = PMX_CAP_BIT_HUE,
                                      .u1HdmiCommand = PMX_SET_HDMI_HUE };
static constexpr ADJUSTMENT_T SATURATION = { .szTrace = "[PMX] Seting Saturation: %d,%d.\n",
                                             .szRefusal = "[PMX] Seting Saturation fail: %d,%d.\n",
                                             .pucStored = &PMX_CONF_T::ucSaturation,
                                             .u1CapBit = PMX_CAP_BIT_SATURATION,
                                             .u1HdmiCommand = PMX_SET_HDMI_SATURATION };
static constexpr ADJUSTMENT_T SHARPNESS = { .szTrace = "[PMX] Seting Sharpness: %d,%d.\n",
                                            .szRefusal = "[PMX] Seting Sharpness fail: %d,%d.\n",
                                            .pucStored = &PMX_CONF_T::ucSharpness,
                                            .u1CapBit = PMX_CAP_BIT_SHARPNESS,
                                            .u1HdmiCommand = PMX_SET_HDMI_SHARPNESS };

/* What the five setters share: id, trace, capability, refusal, and the stored value, which is the analogue outputs'
 * alone. */
static bool fgTakeAdjustment(const ADJUSTMENT_T* prAdjustment, UCHAR ucPmxId, UCHAR ucValue, UCHAR bSetTVE)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, false, ucPmxId);

    PMX_IS_LOG_TEXT(8, prAdjustment->szTrace, bSetTVE, ucValue);
    if (!fgPmxHasCap(prAdjustment->u1CapBit))
    {
        PMX_IS_LOG_TEXT(8, prAdjustment->szRefusal, bSetTVE, ucValue);
        return PMX_WHY(FEATURE_BIT, false, prAdjustment->u1CapBit, prPmxConf()->u4Capability);
    }
    if (bSetTVE != 0)
        prPmxConf()->*prAdjustment->pucStored = ucValue;
    return true;
}

/* A value for HDMI is sent and not kept. */
static void vAdjustHdmi(const ADJUSTMENT_T* prAdjustment, UCHAR ucValue)
{
    fgPmxDrvSetAvd(prAdjustment->u1HdmiCommand, &ucValue, 1);
}

static UINT32 u4GetAdjustment(const ADJUSTMENT_T* prAdjustment, UCHAR ucPmxId, UCHAR* pucValue)
{
    return u4PmxGiveFeatureByte(ucPmxId, prAdjustment->u1CapBit, prPmxConf()->*prAdjustment->pucStored, pucValue);
}

UINT32 PMX_SetBrightness(UCHAR ucPmxId, UCHAR ucBrightness, UCHAR bSetTVE)
{
    if (!fgTakeAdjustment(&BRIGHTNESS, ucPmxId, ucBrightness, bSetTVE))
        return 0;

    PMX_HalSetBrightness(0, ucBrightness); // whatever the target
    if (bSetTVE != 0)
        TVE_SetBrightness(ucBrightness);
    else
        vAdjustHdmi(&BRIGHTNESS, ucBrightness);
    return 1;
}

UINT32 PMX_GetBrightness(UCHAR ucPmxId, UCHAR* pucBrightness)
{
    return u4GetAdjustment(&BRIGHTNESS, ucPmxId, pucBrightness);
}

void d_PMX_SetBrightness(UCHAR ucBrightness)
{
    PMX_SetBrightness(0, ucBrightness, 1);
}

void d_PMX_GetBrightness(UCHAR* pucBrightness)
{
    PMX_GetBrightness(0, pucBrightness);
}

UINT32 PMX_SetContrast(UCHAR ucPmxId, UCHAR ucContrast, UCHAR bSetTVE)
{
    if (!fgTakeAdjustment(&CONTRAST, ucPmxId, ucContrast, bSetTVE))
        return 0;

    PMX_HalSetContrast(0, ucContrast); // whatever the target
    if (bSetTVE != 0)
        TVE_SetContrast(ucContrast);
    else
        vAdjustHdmi(&CONTRAST, ucContrast);
    return 1;
}

UINT32 PMX_GetContrast(UCHAR ucPmxId, UCHAR* pucContrast)
{
    return u4GetAdjustment(&CONTRAST, ucPmxId, pucContrast);
}

void d_PMX_SetContrast(UCHAR ucContrast)
{
    PMX_SetContrast(0, ucContrast, 1);
}

void d_PMX_GetContrast(UCHAR* pucContrast)
{
    PMX_GetContrast(0, pucContrast);
}

UINT32 PMX_SetHue(UCHAR ucPmxId, UCHAR ucHue, UCHAR bSetTVE)
{
    if (!fgTakeAdjustment(&HUE, ucPmxId, ucHue, bSetTVE))
        return 0;

    if (bSetTVE != 0)
        TVE_SetHue(ucHue);
    else
        vAdjustHdmi(&HUE, ucHue);
    return 1;
}

UINT32 PMX_GetHue(UCHAR ucPmxId, UCHAR* pucHue)
{
    return u4GetAdjustment(&HUE, ucPmxId, pucHue);
}

void d_PMX_SetHue(UCHAR ucHue)
{
    PMX_SetHue(0, ucHue, 1);
}

void d_PMX_GetHue(UCHAR* pucHue)
{
    PMX_GetHue(0, pucHue);
}

UINT32 PMX_SetSaturation(UCHAR ucPmxId, UCHAR ucSaturation, UCHAR bSetTVE)
{
    if (!fgTakeAdjustment(&SATURATION, ucPmxId, ucSaturation, bSetTVE))
        return 0;

    if (bSetTVE != 0)
        TVE_SetSaturation(ucSaturation);
    else
        vAdjustHdmi(&SATURATION, ucSaturation);
    return 1;
}

UINT32 PMX_GetSaturation(UCHAR ucPmxId, UCHAR* pucSaturation)
{
    return u4GetAdjustment(&SATURATION, ucPmxId, pucSaturation);
}

void d_PMX_SetSaturation(UCHAR ucSaturation)
{
    PMX_SetSaturation(0, ucSaturation, 1);
}

void d_PMX_GetSaturation(UCHAR* pucSaturation)
{
    PMX_GetSaturation(0, pucSaturation);
}

UINT32 PMX_SetSharpness(UCHAR ucPmxId, UCHAR ucSharpness, UCHAR bSetTVE)
{
    if (!fgTakeAdjustment(&SHARPNESS, ucPmxId, ucSharpness, bSetTVE))
        return 0;

    if (bSetTVE != 0)
        TVE_SetSharpness(ucSharpness);
    else
        vAdjustHdmi(&SHARPNESS, ucSharpness);
    return 1;
}

UINT32 PMX_GetSharpness(UCHAR ucPmxId, UCHAR* pucSharpness)
{
    return u4GetAdjustment(&SHARPNESS, ucPmxId, pucSharpness);
}

void d_PMX_SetSharpness(UCHAR ucSharpness)
{
    PMX_SetSharpness(0, ucSharpness, 1);
}

void d_PMX_GetSharpness(UCHAR* pucSharpness)
{
    PMX_GetSharpness(0, pucSharpness);
}

UINT32 PMX_SetGamma(UCHAR ucPmxId, UCHAR ucGamma)
{
    if (ucPmxId != 0 || !fgPmxHasCap(PMX_CAP_BIT_GAMMA))
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId),
                              PMX_WHY(FEATURE_BIT, 0, PMX_CAP_BIT_GAMMA, prPmxConf()->u4Capability));

    PMX_NOTE_IF(ucGamma > PMX_GAMMA_CURVE_NUM, NO_CURVE, ucGamma);
    prPmxConf()->ucGamma = ucGamma; // as given, also when no curve has this number and gamma is off
    const UCHAR* pucCurve = ucGamma >= 1 && ucGamma <= PMX_GAMMA_CURVE_NUM ? aucGammaCurve[ucGamma - 1] : nullptr;
    PMX_HalSetGamma(0, pucCurve != nullptr, pucCurve);
    return 1;
}

UINT32 PMX_GetGamma(UCHAR ucPmxId, UCHAR* pucGamma)
{
    return u4PmxGiveFeatureByte(ucPmxId, PMX_CAP_BIT_GAMMA, prPmxConf()->ucGamma, pucGamma);
}

UINT32 PMX_GetGammaNs(UCHAR ucPmxId, UCHAR* pucGammaNs)
{
    return u4PmxGiveFeatureByte(ucPmxId, PMX_CAP_BIT_GAMMA, PMX_GAMMA_CURVE_NUM, pucGammaNs);
}

UINT32 PMX_SetBlackLv(UCHAR ucPmxId, UCHAR ucCAVEn, UCHAR ucCVBSEn)
{
    if (ucPmxId != 0 || !fgPmxHasCap(PMX_CAP_BIT_BLACK_LEVEL))
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId),
                              PMX_WHY(FEATURE_BIT, 0, PMX_CAP_BIT_BLACK_LEVEL, prPmxConf()->u4Capability));

    PMX_IsLog(8, "TVE Set Black Lv, CAV(%d), CVBS(%d)\n", ucCAVEn, ucCVBSEn);
    TVE_SetBlackLvl(ucCAVEn, ucCVBSEn);
    prPmxConf()->ucCAVBlackLv = ucCAVEn;
    prPmxConf()->ucCVBSBlackLv = ucCVBSEn;
    return 1;
}

UINT32 PMX_GetBlackLv(UCHAR ucPmxId, UCHAR* pucCAVEn, UCHAR* pucCVBSEn)
{
    if (ucPmxId != 0 || pucCAVEn == nullptr || pucCVBSEn == nullptr || !fgPmxHasCap(PMX_CAP_BIT_BLACK_LEVEL))
        return PMX_WHY_EITHER(
            ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId),
            PMX_WHY_EITHER(pucCAVEn == nullptr || pucCVBSEn == nullptr,
                           PMX_WHY(NULL_POINTER, 0, pucCAVEn == nullptr ? 2 : 3),
                           PMX_WHY(FEATURE_BIT, 0, PMX_CAP_BIT_BLACK_LEVEL, prPmxConf()->u4Capability)));

    const PMX_CONF_T* prConf = prPmxConf();
    *pucCAVEn = prConf->ucCAVBlackLv;
    *pucCVBSEn = prConf->ucCVBSBlackLv;
    PMX_IsLog(8, "TVE Get Black Lv, CAV(%d), CVBS(%d)\n", prConf->ucCAVBlackLv, prConf->ucCVBSBlackLv);
    return 1;
}

UINT32 PMX_SetDGOSource(BOOL fgBeforeMixer)
{
    vSetCcirOutBeforeMixer(fgBeforeMixer);
    return 1;
}

UINT32 PMX_SetCVBSSetup(BOOL fgEnable)
{
    TVE_CVBSSetup_En(fgEnable);
    PMX_IsLog(8, "SetCVBSSetup = %d \n", fgEnable);
    return 1;
}

UINT32 PMX_SetCVBSPal60(BOOL fgEnable)
{
    TVE_CVBSPal60_En(fgEnable);
    PMX_IsLog(8, "TVE_CVBSPal60_En = %d \n", fgEnable);
    return 1;
}

UINT32 PMX_SetMediaType(UCHAR ucPmxId, UCHAR ucMediaType)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    TVE_Identify_Mediatype(ucMediaType);
    return 1;
}

void d_PMX_Set2DSmooth(UCHAR uc2D)
{
    _fg2DCap = uc2D != 0;
}
