// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Plane swaps, colour bar, output mute, active zone, delay. */
#include "tests/lockstep/literal/literal.h"

UINT32 PMX_SetSwapEnable(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucSwapMode)
{
    if (ucPmxId != 0)
        return 0;
    const UINT32 on = ucEnable != 0 ? 1 : 0;
    if (ucSwapMode == 1)
    {
        PMX_IsLog(8, "Plane 1_2 Swap\n");
        PMX_HalSwapPlane1_2(0, on);
    }
    if (ucSwapMode == 2)
    {
        PMX_IsLog(8, "Plane 3_4 Swap\n");
        PMX_HalSwapPlane3_4(0, on);
    }
    if (ucSwapMode == 3)
    {
        PMX_IsLog(8, "Plane 6_7 Swap\n");
        PMX_HalSwapPlane6_7(0, on);
    }
    if (ucSwapMode == 4)
    {
        PMX_IsLog(8, "Plane 4_7 Swap\n");
        PMX_HalSwapPlane4_7(0, on);
    }
    if (ucSwapMode == 5)
    {
        PMX_IsLog(8, "Plane 1_3 Swap\n");
        PMX_HalSwapPlane1_3(0, on);
    }
    if (ucSwapMode == 6)
    {
        PMX_IsLog(8, "Plane 5_8 Swap\n");
        PMX_HalSwapPlane5_8(0, on);
    }
    return 1;
}

UINT32 PMX_GetSwapEnable(UCHAR ucPmxId, UCHAR* pucEnable, UCHAR ucSwapMode)
{
    if (ucPmxId != 0)
        return 0;
    if (ucSwapMode == 1)
        *pucEnable = fgPmxHalSwapPlane1_2(0);
    if (ucSwapMode == 2)
        *pucEnable = fgPmxHalSwapPlane3_4(0);
    if (ucSwapMode == 3)
        *pucEnable = fgPmxHalSwapPlane6_7(0);
    if (ucSwapMode == 4)
        *pucEnable = fgPmxHalSwapPlane4_7(0);
    if (ucSwapMode == 5)
        *pucEnable = fgPmxHalSwapPlane1_3(0);
    if (ucSwapMode == 6)
        *pucEnable = fgPmxHalSwapPlane5_8(0);
    return 1;
}

static UINT8 bar_width(UCHAR ucMode)
{
    switch (ucMode)
    {
    case RES_480I:
    case RES_576I:
    case RES_480P:
    case RES_576P: return 22;
    case RES_720P60HZ:
    case RES_720P50HZ: return 20;
    default: return 30;
    }
}

UINT32 PMX_SetCBEnable(UCHAR ucPmxId, UCHAR ucEnable)
{
    if (ucPmxId != 0)
        return 0;
    if (ucEnable == conf.ucCBEnable)
        return 1;
    if (ucEnable != 0)
    {
        PMX_IsLog(8, "ColorBar Enable\n");
        PMX_HalSetActiveZone(0, conf.ucMode);
        PMX_HalSetCBWidth(0, bar_width(conf.ucMode));
        PMX_HalEnableCB(0);
        if (bComp0OnTop == 1)
        {
            PMX_IsLog(8, "Temporarily Turn Off Plane Swap 1_2\n");
            PMX_HalSwapPlane1_2(0, 0);
        }
    }
    else
    {
        PMX_IsLog(8, "ColorBar Disable\n");
        PMX_HalDisableCB(0);
        if (bComp0OnTop == 1)
        {
            PMX_IsLog(8, "Resume Plane Swap 1_2\n");
            PMX_HalSwapPlane1_2(0, 1);
        }
    }
    conf.ucCBEnable = ucEnable;
    return 1;
}

UINT32 PMX_GetCBEnable(UCHAR ucPmxId, UCHAR* pucEnable)
{
    if (ucPmxId != 0 || pucEnable == nullptr)
        return 0;
    *pucEnable = conf.ucCBEnable;
    return 1;
}

UINT32 PMX_SetMuteEnable(UCHAR ucPmxId, UCHAR ucEnable)
{
    if (ucPmxId != 0)
        return 0;
    if (ucEnable == conf.ucMuteEnable)
        return 1;
    if (ucEnable != 0)
    {
        PMX_IsLog(8, "Mute Enable\n");
        PMX_HalEnableMute(0);
        if (conf.ucCBEnable == 1)
        {
            PMX_IsLog(8, "Mute Disable ColorBar\n");
            PMX_HalDisableCB(0);
        }
    }
    else
    {
        PMX_IsLog(8, "Mute Disable\n");
        if (conf.ucCBEnable == 1)
        {
            PMX_IsLog(8, "Mute Enable ColorBar\n");
            PMX_HalEnableCB(0);
        }
        PMX_HalDisableMute(0);
    }
    conf.ucMuteEnable = ucEnable;
    return 1;
}

UINT32 PMX_GetMuteEnable(UCHAR ucPmxId, UCHAR* pucEnable)
{
    if (ucPmxId != 0 || pucEnable == nullptr)
        return 0;
    *pucEnable = conf.ucMuteEnable;
    return 1;
}

UINT32 PMX_SetActiveZone(UCHAR ucPmxId, UCHAR ucMode)
{
    PMX_HalSetActiveZone(ucPmxId, ucMode);
    return 1;
}

UINT32 PMX_SetDelay(UCHAR ucVdoId, UCHAR ucADJ_F, UINT16 u2HDelay, UINT16 u2VDelay)
{
    PMX_HalSetDelay(ucVdoId, ucADJ_F, u2HDelay, u2VDelay);
    return 1;
}
