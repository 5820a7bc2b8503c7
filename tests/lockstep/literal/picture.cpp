// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Picture adjustments, gamma, black level, options that are passed on. */
#include "tests/lockstep/literal/literal.h"

static bool has_bit(unsigned bit)
{
    return (conf.u4Capability & (1u << bit)) != 0;
}

UINT32 PMX_SetBrightness(UCHAR ucPmxId, UCHAR ucBrightness, UCHAR bSetTVE)
{
    if (ucPmxId != 0)
        return 0;
    PMX_IsLog(8, "[PMX] Seting Brightness: %d,%d.\n", bSetTVE, ucBrightness);
    if (!has_bit(21))
    {
        PMX_IsLog(8, "[PMX] Seting Brightness fail: %d,%d.\n", bSetTVE, ucBrightness);
        return 0;
    }
    if (bSetTVE != 0)
        conf.ucBrightness = ucBrightness;
    PMX_HalSetBrightness(0, ucBrightness);
    if (bSetTVE != 0)
        TVE_SetBrightness(ucBrightness);
    else
        fgPmxDrvSetAvd(4, &ucBrightness, 1);
    return 1;
}

UINT32 PMX_SetContrast(UCHAR ucPmxId, UCHAR ucContrast, UCHAR bSetTVE)
{
    if (ucPmxId != 0)
        return 0;
    PMX_IsLog(8, "[PMX] Seting Contrast: %d,%d.\n", bSetTVE, ucContrast);
    if (!has_bit(22))
    {
        PMX_IsLog(8, "[PMX] Seting Contrast fail: %d,%d.\n", bSetTVE, ucContrast);
        return 0;
    }
    if (bSetTVE != 0)
        conf.ucContrast = ucContrast;
    PMX_HalSetContrast(0, ucContrast);
    if (bSetTVE != 0)
        TVE_SetContrast(ucContrast);
    else
        fgPmxDrvSetAvd(5, &ucContrast, 1);
    return 1;
}

UINT32 PMX_SetHue(UCHAR ucPmxId, UCHAR ucHue, UCHAR bSetTVE)
{
    if (ucPmxId != 0)
        return 0;
    PMX_IsLog(8, "[PMX] Seting Hue: %d,%d.\n", bSetTVE, ucHue);
    if (!has_bit(23))
    {
        PMX_IsLog(8, "[PMX] Seting Hue fail: %d,%d.\n", bSetTVE, ucHue);
        return 0;
    }
    if (bSetTVE != 0)
        conf.ucHue = ucHue;
    if (bSetTVE != 0)
        TVE_SetHue(ucHue);
    else
        fgPmxDrvSetAvd(6, &ucHue, 1);
    return 1;
}

UINT32 PMX_SetSaturation(UCHAR ucPmxId, UCHAR ucSaturation, UCHAR bSetTVE)
{
    if (ucPmxId != 0)
        return 0;
    PMX_IsLog(8, "[PMX] Seting Saturation: %d,%d.\n", bSetTVE, ucSaturation);
    if (!has_bit(24))
    {
        PMX_IsLog(8, "[PMX] Seting Saturation fail: %d,%d.\n", bSetTVE, ucSaturation);
        return 0;
    }
    if (bSetTVE != 0)
        conf.ucSaturation = ucSaturation;
    if (bSetTVE != 0)
        TVE_SetSaturation(ucSaturation);
    else
        fgPmxDrvSetAvd(7, &ucSaturation, 1);
    return 1;
}

UINT32 PMX_SetSharpness(UCHAR ucPmxId, UCHAR ucSharpness, UCHAR bSetTVE)
{
    if (ucPmxId != 0)
        return 0;
    PMX_IsLog(8, "[PMX] Seting Sharpness: %d,%d.\n", bSetTVE, ucSharpness);
    if (!has_bit(27))
    {
        PMX_IsLog(8, "[PMX] Seting Sharpness fail: %d,%d.\n", bSetTVE, ucSharpness);
        return 0;
    }
    if (bSetTVE != 0)
        conf.ucSharpness = ucSharpness;
    if (bSetTVE != 0)
        TVE_SetSharpness(ucSharpness);
    else
        fgPmxDrvSetAvd(15, &ucSharpness, 1);
    return 1;
}

UINT32 PMX_GetBrightness(UCHAR ucPmxId, UCHAR* pucBrightness)
{
    if (ucPmxId != 0 || pucBrightness == nullptr || !has_bit(21))
        return 0;
    *pucBrightness = conf.ucBrightness;
    return 1;
}

UINT32 PMX_GetContrast(UCHAR ucPmxId, UCHAR* pucContrast)
{
    if (ucPmxId != 0 || pucContrast == nullptr || !has_bit(22))
        return 0;
    *pucContrast = conf.ucContrast;
    return 1;
}

UINT32 PMX_GetHue(UCHAR ucPmxId, UCHAR* pucHue)
{
    if (ucPmxId != 0 || pucHue == nullptr || !has_bit(23))
        return 0;
    *pucHue = conf.ucHue;
    return 1;
}

UINT32 PMX_GetSaturation(UCHAR ucPmxId, UCHAR* pucSaturation)
{
    if (ucPmxId != 0 || pucSaturation == nullptr || !has_bit(24))
        return 0;
    *pucSaturation = conf.ucSaturation;
    return 1;
}

UINT32 PMX_GetSharpness(UCHAR ucPmxId, UCHAR* pucSharpness)
{
    if (ucPmxId != 0 || pucSharpness == nullptr || !has_bit(27))
        return 0;
    *pucSharpness = conf.ucSharpness;
    return 1;
}

void d_PMX_SetBrightness(UCHAR ucBrightness)
{
    PMX_SetBrightness(0, ucBrightness, 1);
}

void d_PMX_SetContrast(UCHAR ucContrast)
{
    PMX_SetContrast(0, ucContrast, 1);
}

void d_PMX_SetHue(UCHAR ucHue)
{
    PMX_SetHue(0, ucHue, 1);
}

void d_PMX_SetSaturation(UCHAR ucSaturation)
{
    PMX_SetSaturation(0, ucSaturation, 1);
}

void d_PMX_SetSharpness(UCHAR ucSharpness)
{
    PMX_SetSharpness(0, ucSharpness, 1);
}

void d_PMX_GetBrightness(UCHAR* pucBrightness)
{
    PMX_GetBrightness(0, pucBrightness);
}

void d_PMX_GetContrast(UCHAR* pucContrast)
{
    PMX_GetContrast(0, pucContrast);
}

void d_PMX_GetHue(UCHAR* pucHue)
{
    PMX_GetHue(0, pucHue);
}

void d_PMX_GetSaturation(UCHAR* pucSaturation)
{
    PMX_GetSaturation(0, pucSaturation);
}

void d_PMX_GetSharpness(UCHAR* pucSharpness)
{
    PMX_GetSharpness(0, pucSharpness);
}

UINT32 PMX_SetGamma(UCHAR ucPmxId, UCHAR ucGamma)
{
    static const UCHAR curves[4][9] = {
        { 0, 99, 136, 163, 186, 206, 224, 240, 255 },
        { 0, 121, 155, 180, 199, 216, 230, 243, 255 },
        { 0, 85, 125, 155, 180, 202, 221, 239, 255 },
        { 0, 100, 137, 164, 187, 206, 224, 240, 255 },
    };
    if (ucPmxId != 0)
        return 0;
    if (!has_bit(20))
        return 0;
    conf.ucGamma = ucGamma;
    if (ucGamma >= 1 && ucGamma <= 4)
        PMX_HalSetGamma(0, 1, curves[ucGamma - 1]);
    else
        PMX_HalSetGamma(0, 0, nullptr);
    return 1;
}

UINT32 PMX_GetGamma(UCHAR ucPmxId, UCHAR* pucGamma)
{
    if (ucPmxId != 0 || pucGamma == nullptr || !has_bit(20))
        return 0;
    *pucGamma = conf.ucGamma;
    return 1;
}

UINT32 PMX_GetGammaNs(UCHAR ucPmxId, UCHAR* pucGammaNs)
{
    if (ucPmxId != 0 || pucGammaNs == nullptr || !has_bit(20))
        return 0;
    *pucGammaNs = 4;
    return 1;
}

UINT32 PMX_SetBlackLv(UCHAR ucPmxId, UCHAR ucCAVEn, UCHAR ucCVBSEn)
{
    if (ucPmxId != 0 || !has_bit(30))
        return 0;
    PMX_IsLog(8, "TVE Set Black Lv, CAV(%d), CVBS(%d)\n", ucCAVEn, ucCVBSEn);
    TVE_SetBlackLvl(ucCAVEn, ucCVBSEn);
    conf.ucCAVBlackLv = ucCAVEn;
    conf.ucCVBSBlackLv = ucCVBSEn;
    return 1;
}

UINT32 PMX_GetBlackLv(UCHAR ucPmxId, UCHAR* pucCAVEn, UCHAR* pucCVBSEn)
{
    if (ucPmxId != 0 || pucCAVEn == nullptr || pucCVBSEn == nullptr || !has_bit(30))
        return 0;
    *pucCAVEn = conf.ucCAVBlackLv;
    *pucCVBSEn = conf.ucCVBSBlackLv;
    PMX_IsLog(8, "TVE Get Black Lv, CAV(%d), CVBS(%d)\n", conf.ucCAVBlackLv, conf.ucCVBSBlackLv);
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
    _fg2DCap = uc2D != 0 ? 1 : 0;
}
