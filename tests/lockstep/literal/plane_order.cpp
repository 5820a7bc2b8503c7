// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Background, stacking order, first video plane on top, where the video planes sit. */
#include "tests/lockstep/literal/literal.h"

UINT32 PMX_SetBg(UCHAR ucPmxId, UINT32 u4BgColor)
{
    if (ucPmxId != 0)
        return 0;
    conf.u4BgColor = u4BgColor;
    PMX_HalSetBg(ucPmxId, u4BgColor);
    return 1;
}

UINT32 PMX_SetPlaneOrderArray(UCHAR ucPmxId, const UINT32* pu4PlaneOrder)
{
    if (ucPmxId != 0)
        return 0;
    if (pu4PlaneOrder == nullptr)
        return 0;
    for (int position = 0; position < 8; ++position)
        conf.aucPlaneOrder[position] = static_cast<UCHAR>(pu4PlaneOrder[position] & 0xFF);
    PMX_HalPlaneOrder(0, 8, pu4PlaneOrder);
    return 1;
}

UINT32 PMX_SetPlaneOrder(UCHAR ucPmxId, UCHAR ucVdpId, UCHAR ucPlaneOrder)
{
    if (ucPmxId != 0)
        return 0;
    if (ucPlaneOrder > 7)
        return 0;
    conf.aucPlaneOrder[ucPlaneOrder] = ucVdpId;
    UINT32 order[8];
    for (int position = 0; position < 8; ++position)
        order[position] = conf.aucPlaneOrder[position];
    PMX_HalPlaneOrder(0, 8, order);
    return 1;
}

UINT32 PMX_GetPlaneOrder(UCHAR ucPmxId, UCHAR ucVdpId, UCHAR* pucPlaneOrder)
{
    if (ucPmxId != 0)
        return 0;
    if (pucPlaneOrder == nullptr)
        return 0;
    for (UCHAR position = 0; position < 8; ++position)
    {
        if (conf.aucPlaneOrder[position] == ucVdpId)
        {
            *pucPlaneOrder = position;
            return 1;
        }
    }
    *pucPlaneOrder = 8;
    return 1;
}

UINT32 PMX_SetOrderVdpComp0(UCHAR ucPmxId, UINT32 u4OnTop)
{
    bComp0OnTop = static_cast<INT32>(u4OnTop);
    PMX_HalSwapPlane1_2(ucPmxId, u4OnTop);
    const VDP_ENABLE_T state = u4OnTop != 0 ? VDP_GetHwEnable(0) : VDP_GetHwEnable(1);
    if (state != VDP_DISABLED)
        vPmxMixPlane(ucPmxId, 1);
    else
        vPmxNotMixPlane(ucPmxId, 1);
    return 1;
}

UINT32 d_PMX_SetOrderVdpComp0(UCHAR ucPmxId, UINT32 u4OnTop)
{
    VDP_VsyncSendCmd(0, 17);
    VDP_VsyncSendCmd(1, 17);
    VDP_VsyncSendCmd(2, 17);
    return PMX_SetOrderVdpComp0(ucPmxId, u4OnTop);
}

UINT32 d_PMX_GetOrderVdpComp0(UCHAR, UINT32* pu4OnTop)
{
    *pu4OnTop = static_cast<UINT32>(bComp0OnTop);
    return 1;
}

UINT32 PMX_VdpGetPlanePosition(UCHAR ucPmxId, UCHAR ucVdpHwId)
{
    const BOOL swapped = fgPmxHalSwapPlane1_2(ucPmxId);
    if (swapped != 0)
    {
        if (ucVdpHwId == 0)
            return DRV_PMX_PLANE_2;
        if (ucVdpHwId == 1)
            return DRV_PMX_PLANE_1;
    }
    else
    {
        if (ucVdpHwId == 0)
            return DRV_PMX_PLANE_1;
        if (ucVdpHwId == 1)
            return DRV_PMX_PLANE_2;
    }
    PMX_IsLog(5, "Invalid VDP Id\n");
    Assert("0", __FILE__, __LINE__);
    return DRV_PMX_PLANE_1;
}

INT32 i4PmxGetPlanePosition(void* pvTag, UCHAR ucVdpHwId)
{
    return static_cast<INT32>(PMX_VdpGetPlanePosition(id_of(pvTag), ucVdpHwId));
}
