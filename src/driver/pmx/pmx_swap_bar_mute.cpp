// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Plane swaps, colour bar and output mute. The mute hides the bar while it is on; the bar undoes "first video on top"
 * meanwhile. */
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

/* The swap of planes 1 and 2 made here is not "first video on top": bComp0OnTop stays as it is. The text is the same
 * for on and off. */
UINT32 PMX_SetSwapEnable(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucSwapMode)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    UINT32 u4Swap = ucEnable != 0;
    switch (ucSwapMode)
    {
    case 1:
        PMX_IsLog(8, "Plane 1_2 Swap\n");
        PMX_HalSwapPlane1_2(0, u4Swap);
        break;
    case 2:
        PMX_IsLog(8, "Plane 3_4 Swap\n");
        PMX_HalSwapPlane3_4(0, u4Swap);
        break;
    case 3:
        PMX_IsLog(8, "Plane 6_7 Swap\n");
        PMX_HalSwapPlane6_7(0, u4Swap);
        break;
    case 4:
        PMX_IsLog(8, "Plane 4_7 Swap\n");
        PMX_HalSwapPlane4_7(0, u4Swap);
        break;
    case 5:
        PMX_IsLog(8, "Plane 1_3 Swap\n");
        PMX_HalSwapPlane1_3(0, u4Swap);
        break;
    case 6:
        PMX_IsLog(8, "Plane 5_8 Swap\n");
        PMX_HalSwapPlane5_8(0, u4Swap);
        break;
    default: PMX_NOTE(SWAP_MODE, ucSwapMode); break;
    }
    return 1;
}

UINT32 PMX_GetSwapEnable(UCHAR ucPmxId, UCHAR* pucEnable, UCHAR ucSwapMode)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    switch (ucSwapMode)
    {
    case 1: *pucEnable = fgPmxHalSwapPlane1_2(0); break;
    case 2: *pucEnable = fgPmxHalSwapPlane3_4(0); break;
    case 3: *pucEnable = fgPmxHalSwapPlane6_7(0); break;
    case 4: *pucEnable = fgPmxHalSwapPlane4_7(0); break;
    case 5: *pucEnable = fgPmxHalSwapPlane1_3(0); break;
    case 6: *pucEnable = fgPmxHalSwapPlane5_8(0); break;
    default: PMX_NOTE(SWAP_MODE, ucSwapMode); break;
    }
    return 1;
}

UINT32 PMX_SetCBEnable(UCHAR ucPmxId, UCHAR ucEnable)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    PMX_CONF_T* prConf = prPmxConf();
    if (ucEnable == prConf->ucCBEnable)
        return PMX_WHY(SAME_VALUE, 1, ucEnable);

    if (ucEnable != 0)
    {
        PMX_IsLog(8, "ColorBar Enable\n");
        PMX_HalSetActiveZone(0, prConf->ucMode);
        PMX_HalSetCBWidth(0, prPmxModeRow(prConf->ucMode)->u1CBWidth);
        PMX_HalEnableCB(0);
        if (bComp0OnTop == 1) // undone while the bar is shown, and still remembered
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
    prConf->ucCBEnable = ucEnable; // as given: the mute looks for exactly 1
    return 1;
}

UINT32 PMX_GetCBEnable(UCHAR ucPmxId, UCHAR* pucEnable)
{
    return u4PmxGiveByte(ucPmxId, prPmxConf()->ucCBEnable, pucEnable);
}

UINT32 PMX_SetMuteEnable(UCHAR ucPmxId, UCHAR ucEnable)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    PMX_CONF_T* prConf = prPmxConf();
    if (ucEnable == prConf->ucMuteEnable)
        return PMX_WHY(SAME_VALUE, 1, ucEnable);

    if (ucEnable != 0)
    {
        PMX_IsLog(8, "Mute Enable\n");
        PMX_HalEnableMute(0);
        if (prConf->ucCBEnable == 1)
        {
            PMX_IsLog(8, "Mute Disable ColorBar\n");
            PMX_HalDisableCB(0);
        }
    }
    else
    {
        PMX_IsLog(8, "Mute Disable\n");
        if (prConf->ucCBEnable == 1) // the bar is back before the picture is
        {
            PMX_IsLog(8, "Mute Enable ColorBar\n");
            PMX_HalEnableCB(0);
        }
        PMX_HalDisableMute(0);
    }
    prConf->ucMuteEnable = ucEnable;
    return 1;
}

UINT32 PMX_GetMuteEnable(UCHAR ucPmxId, UCHAR* pucEnable)
{
    return u4PmxGiveByte(ucPmxId, prPmxConf()->ucMuteEnable, pucEnable);
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
