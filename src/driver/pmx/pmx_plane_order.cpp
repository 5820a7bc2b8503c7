// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Stacking order position by position, background, and where the video planes stand. The packed order of
 * pmx_arb_order.cpp is another representation, kept apart. */
#include "drv_pmx.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

UINT32 PMX_SetBg(UCHAR ucPmxId, UINT32 u4BgColor)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    prPmxConf()->u4BgColor = u4BgColor;
    PMX_HalSetBg(ucPmxId, u4BgColor);
    return 1;
}

UINT32 PMX_SetPlaneOrderArray(UCHAR ucPmxId, const UINT32* pu4PlaneOrder)
{
    if (ucPmxId != 0 || pu4PlaneOrder == nullptr)
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId), PMX_WHY(NULL_POINTER, 0, 2));

    for (UINT32 i = 0; i < PMX_PLANE_NUM; i++)
        prPmxConf()->aucPlaneOrder[i] = (UCHAR)pu4PlaneOrder[i];
    PMX_HalPlaneOrder(0, PMX_PLANE_ORDER_WANTED, pu4PlaneOrder); // the caller's words, all 32 bits of them
    return 1;
}

/* A plane is not taken from where it stood: a caller that moves one writes both positions, and in between it is named
 * twice. */
UINT32 PMX_SetPlaneOrder(UCHAR ucPmxId, UCHAR ucVdpId, UCHAR ucPlaneOrder)
{
    if (ucPmxId != 0 || ucPlaneOrder >= PMX_PLANE_NUM)
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId), PMX_WHY(POSITION, 0, ucPlaneOrder));

    PMX_CONF_T* prConf = prPmxConf();
    prConf->aucPlaneOrder[ucPlaneOrder] = ucVdpId;
    vPmxProgramPlaneOrder(PMX_PLANE_ORDER_WANTED);
    return 1;
}

UINT32 PMX_GetPlaneOrder(UCHAR ucPmxId, UCHAR ucVdpId, UCHAR* pucPlaneOrder)
{
    if (ucPmxId != 0 || pucPlaneOrder == nullptr)
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId), PMX_WHY(NULL_POINTER, 0, 2));

    UCHAR ucPosition = 0;
    while (ucPosition < PMX_PLANE_NUM && prPmxConf()->aucPlaneOrder[ucPosition] != ucVdpId)
        ucPosition++;
    *pucPlaneOrder = ucPosition; // 8: it stands nowhere
    return 1;
}

UINT32 PMX_SetOrderVdpComp0(UCHAR ucPmxId, UINT32 u4OnTop)
{
    bComp0OnTop = (INT32)u4OnTop;
    PMX_HalSwapPlane1_2(ucPmxId, u4OnTop);

    UCHAR ucInSecondPlane = u4OnTop != 0 ? 0 : 1;
    if (VDP_GetHwEnable(ucInSecondPlane) != VDP_DISABLED) // a hidden one comes back without a word to us
        vPmxMixPlane(ucPmxId, DRV_PMX_PLANE_2);
    else
        vPmxNotMixPlane(ucPmxId, DRV_PMX_PLANE_2);
    return 1;
}

UINT32 d_PMX_SetOrderVdpComp0(UCHAR ucPmxId, UINT32 u4OnTop)
{
    for (UINT32 u4VdpIdx = 0; u4VdpIdx < PMX_VDP_COMMANDED_NUM; u4VdpIdx++)
        VDP_VsyncSendCmd(u4VdpIdx, VDP_CMD_ORDER_CHANGES);
    return PMX_SetOrderVdpComp0(ucPmxId, u4OnTop);
}

UINT32 d_PMX_GetOrderVdpComp0(UCHAR, UINT32* pu4OnTop)
{
    *pu4OnTop = (UINT32)bComp0OnTop;
    return 1;
}

UINT32 PMX_VdpGetPlanePosition(UCHAR ucPmxId, UCHAR ucVdpHwId)
{
    bool fgSwapped = fgPmxHalSwapPlane1_2(ucPmxId) != FALSE;

    if (ucVdpHwId == 0)
        return fgSwapped ? DRV_PMX_PLANE_2 : DRV_PMX_PLANE_1;
    if (ucVdpHwId == 1)
        return fgSwapped ? DRV_PMX_PLANE_1 : DRV_PMX_PLANE_2;

    PMX_IsLog(5, "Invalid VDP Id\n");
    Assert("0", __FILE__, __LINE__);
    return PMX_WHY(NO_VIDEO_PLANE, DRV_PMX_PLANE_1, ucVdpHwId);
}

INT32 i4PmxGetPlanePosition(void* pvTag, UCHAR ucVdpHwId)
{
    return (INT32)PMX_VdpGetPlanePosition(ucPmxIdOfTag(pvTag), ucVdpHwId);
}

void vPmxProgramPlaneOrder(UINT32 u4Number)
{
    UINT32 au4PlaneOrder[PMX_PLANE_NUM];
    for (UINT32 i = 0; i < PMX_PLANE_NUM; i++)
        au4PlaneOrder[i] = prPmxConf()->aucPlaneOrder[i];
    PMX_HalPlaneOrder(0, u4Number, au4PlaneOrder);
}
