/* Picture adjustments, gamma, black level, and options that are passed straight on. */
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

#define CAP_GAMMA 0x00100000
#define CAP_BRIGHTNESS 0x00200000
#define CAP_CONTRAST 0x00400000
#define CAP_HUE 0x00800000
#define CAP_SATURATION 0x01000000
#define CAP_SHARPNESS 0x08000000
#define CAP_BLACK_LEVEL 0x40000000

static bool fgHasCap(UINT32 u4Mask)
{
    return (prPmxConf()->u4Capability & u4Mask) != 0;
}

/* What the five setters share: id, trace, capability, refusal, and the stored value, which is the analogue outputs'
 * alone. The console texts say "Seting" in all five, and stay so. */
static bool fgTakeAdjustment(UCHAR ucPmxId, UINT32 u4Mask, UCHAR ucValue, UCHAR bSetTVE, const CHAR* szTrace,
                             const CHAR* szRefusal, UCHAR* pucStored)
{
    if (ucPmxId != 0)
        return false;

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral" // each caller's texts take these two values
    PMX_IsLog(8, szTrace, bSetTVE, ucValue);
    if (!fgHasCap(u4Mask))
    {
        PMX_IsLog(8, szRefusal, bSetTVE, ucValue);
        return false;
    }
#pragma GCC diagnostic pop

    if (bSetTVE != 0)
        *pucStored = ucValue;
    return true;
}

static UINT32 u4GetAdjustment(UCHAR ucPmxId, UINT32 u4Mask, UCHAR ucStored, UCHAR* pucValue)
{
    if (ucPmxId != 0 || pucValue == nullptr || !fgHasCap(u4Mask))
        return 0;

    *pucValue = ucStored;
    return 1;
}

UINT32 PMX_SetBrightness(UCHAR ucPmxId, UCHAR ucBrightness, UCHAR bSetTVE)
{
    if (!fgTakeAdjustment(ucPmxId, CAP_BRIGHTNESS, ucBrightness, bSetTVE, "[PMX] Seting Brightness: %d,%d.\n",
                          "[PMX] Seting Brightness fail: %d,%d.\n", &prPmxConf()->ucBrightness))
        return 0;

    PMX_HalSetBrightness(0, ucBrightness); // whatever the target
    if (bSetTVE != 0)
        TVE_SetBrightness(ucBrightness);
    else
        fgPmxDrvSetAvd(PMX_SET_HDMI_BRIGHTNESS, &ucBrightness, 1);
    return 1;
}

UINT32 PMX_GetBrightness(UCHAR ucPmxId, UCHAR* pucBrightness)
{
    return u4GetAdjustment(ucPmxId, CAP_BRIGHTNESS, prPmxConf()->ucBrightness, pucBrightness);
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
    if (!fgTakeAdjustment(ucPmxId, CAP_CONTRAST, ucContrast, bSetTVE, "[PMX] Seting Contrast: %d,%d.\n",
                          "[PMX] Seting Contrast fail: %d,%d.\n", &prPmxConf()->ucContrast))
        return 0;

    PMX_HalSetContrast(0, ucContrast); // whatever the target
    if (bSetTVE != 0)
        TVE_SetContrast(ucContrast);
    else
        fgPmxDrvSetAvd(PMX_SET_HDMI_CONTRAST, &ucContrast, 1);
    return 1;
}

UINT32 PMX_GetContrast(UCHAR ucPmxId, UCHAR* pucContrast)
{
    return u4GetAdjustment(ucPmxId, CAP_CONTRAST, prPmxConf()->ucContrast, pucContrast);
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
    if (!fgTakeAdjustment(ucPmxId, CAP_HUE, ucHue, bSetTVE, "[PMX] Seting Hue: %d,%d.\n",
                          "[PMX] Seting Hue fail: %d,%d.\n", &prPmxConf()->ucHue))
        return 0;

    if (bSetTVE != 0)
        TVE_SetHue(ucHue);
    else
        fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, &ucHue, 1);
    return 1;
}

UINT32 PMX_GetHue(UCHAR ucPmxId, UCHAR* pucHue)
{
    return u4GetAdjustment(ucPmxId, CAP_HUE, prPmxConf()->ucHue, pucHue);
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
    if (!fgTakeAdjustment(ucPmxId, CAP_SATURATION, ucSaturation, bSetTVE, "[PMX] Seting Saturation: %d,%d.\n",
                          "[PMX] Seting Saturation fail: %d,%d.\n", &prPmxConf()->ucSaturation))
        return 0;

    if (bSetTVE != 0)
        TVE_SetSaturation(ucSaturation);
    else
        fgPmxDrvSetAvd(PMX_SET_HDMI_SATURATION, &ucSaturation, 1);
    return 1;
}

UINT32 PMX_GetSaturation(UCHAR ucPmxId, UCHAR* pucSaturation)
{
    return u4GetAdjustment(ucPmxId, CAP_SATURATION, prPmxConf()->ucSaturation, pucSaturation);
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
    if (!fgTakeAdjustment(ucPmxId, CAP_SHARPNESS, ucSharpness, bSetTVE, "[PMX] Seting Sharpness: %d,%d.\n",
                          "[PMX] Seting Sharpness fail: %d,%d.\n", &prPmxConf()->ucSharpness))
        return 0;

    if (bSetTVE != 0)
        TVE_SetSharpness(ucSharpness);
    else
        fgPmxDrvSetAvd(PMX_SET_HDMI_SHARPNESS, &ucSharpness, 1);
    return 1;
}

UINT32 PMX_GetSharpness(UCHAR ucPmxId, UCHAR* pucSharpness)
{
    return u4GetAdjustment(ucPmxId, CAP_SHARPNESS, prPmxConf()->ucSharpness, pucSharpness);
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
    if (ucPmxId != 0 || !fgHasCap(CAP_GAMMA))
        return 0;

    prPmxConf()->ucGamma = ucGamma; // as given, also when no curve has this number and gamma is off
    if (ucGamma >= 1 && ucGamma <= PMX_GAMMA_CURVE_NUM)
        PMX_HalSetGamma(0, 1, aucGammaCurve[ucGamma - 1]);
    else
        PMX_HalSetGamma(0, 0, nullptr);
    return 1;
}

UINT32 PMX_GetGamma(UCHAR ucPmxId, UCHAR* pucGamma)
{
    return u4GetAdjustment(ucPmxId, CAP_GAMMA, prPmxConf()->ucGamma, pucGamma);
}

UINT32 PMX_GetGammaNs(UCHAR ucPmxId, UCHAR* pucGammaNs)
{
    return u4GetAdjustment(ucPmxId, CAP_GAMMA, PMX_GAMMA_CURVE_NUM, pucGammaNs);
}

UINT32 PMX_SetBlackLv(UCHAR ucPmxId, UCHAR ucCAVEn, UCHAR ucCVBSEn)
{
    if (ucPmxId != 0 || !fgHasCap(CAP_BLACK_LEVEL))
        return 0;

    PMX_IsLog(8, "TVE Set Black Lv, CAV(%d), CVBS(%d)\n", ucCAVEn, ucCVBSEn);
    TVE_SetBlackLvl(ucCAVEn, ucCVBSEn);
    prPmxConf()->ucCAVBlackLv = ucCAVEn;
    prPmxConf()->ucCVBSBlackLv = ucCVBSEn;
    return 1;
}

UINT32 PMX_GetBlackLv(UCHAR ucPmxId, UCHAR* pucCAVEn, UCHAR* pucCVBSEn)
{
    if (ucPmxId != 0 || pucCAVEn == nullptr || pucCVBSEn == nullptr || !fgHasCap(CAP_BLACK_LEVEL))
        return 0;

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
        return 0;

    TVE_Identify_Mediatype(ucMediaType);
    return 1;
}

void d_PMX_Set2DSmooth(UCHAR uc2D)
{
    _fg2DCap = uc2D != 0;
}
