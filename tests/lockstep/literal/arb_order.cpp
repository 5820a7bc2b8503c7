// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Arbitrary plane order with the planes' delays. */
#include "tests/lockstep/literal/literal.h"

static void apply_delays(INT32* i4OffSet, const INT32* i4PlnDelay)
{
    PMX_IsLog(8, "Set Video Plane dealy: %d,%d.\n", i4PlnDelay[0], i4PlnDelay[1]);
    PMX_IsLog(8, "Set OSD Plane delay: %d,%d,%d,%d,%d.\n", i4PlnDelay[2], i4PlnDelay[3], i4PlnDelay[4], i4PlnDelay[5],
              i4PlnDelay[6]);
    DCM_SetVideoPlaneDelay(i4PlnDelay[0], i4PlnDelay[1]);
    for (int i = 0; i < 8; ++i)
    {
        PMX_IsLog(0, "Plane %d ofst is %ld, delay is %ld\n", i, static_cast<long>(i4OffSet[i]),
                  static_cast<long>(i4PlnDelay[i]));
        i4OffSet[i] = static_cast<INT32>(static_cast<UINT32>(i4OffSet[i]) - static_cast<UINT32>(i4PlnDelay[i]));
    }
    DCM_SetVideoPlaneDelay(i4OffSet[0], i4OffSet[1]);
    INT32 i4Offset_SetToOsd[5] = { i4OffSet[6], i4OffSet[3], i4OffSet[2], 0, 0 };
    _i4OSD_SetPosOffset(i4Offset_SetToOsd);
}

UINT32 PMX_SetArbPlaneOrder(UCHAR ucPmxId, UINT32 u4PlaneOrder)
{
    UINT8 u1PlnSel[8] = { 0, 0, 0, 0, 0, 0, 0, 0 };
    INT32 i4PlnDelay[8] = { 0, 0, 0, 0, 0, 0, 0, 0 };
    INT32 i4OffSet[8] = { 12, 12, 10, 8, 6, 4, 2, 0 };
    Printf("[PMX%d] Set PlaneOrder = [0x%8x]\n", ucPmxId, u4PlaneOrder);
    for (int k = 0; k < 8; ++k)
        u1PlnSel[k] = static_cast<UINT8>((u4PlaneOrder >> (4 * k)) & 7);
    if (!mode_facts::facts_of(conf.ucMode).is(mode_facts::tve_hd))
    {
        const INT32 others[8] = { 6, 6, 5, 4, 3, 2, 1, 0 };
        std::memcpy(i4OffSet, others, sizeof i4OffSet);
    }
    for (int i = 0; i < 8; ++i)
        Printf("[PMX]offset[%d]=%d\n", i, i4OffSet[i]);
    for (int i = 0; i < 8; ++i)
        Printf("[PMX]u1PlnSel[%d]=%d\n", i, u1PlnSel[i]);
    for (int i = 0; i < 8; ++i)
    {
        for (int j = 0; j < 8; ++j)
        {
            if (i != j && u1PlnSel[i] == u1PlnSel[j])
            {
                PMX_IsLog(9, "Plane[%d] and Plane[%d] connect to the same input source!\n", i, j);
                return 0;
            }
        }
    }
    conf.u4PlaneOrder = u4PlaneOrder;
    std::memset(i4PlnDelay, 0, sizeof i4PlnDelay);
    if (PMX_HalSetPlaneOrder(ucPmxId, u1PlnSel, i4PlnDelay) != 0)
        return 0;
    apply_delays(i4OffSet, i4PlnDelay);
    return 1;
}

UINT32 PMX_GetArbPlaneOrder(UCHAR ucPmxId, UINT32* pu4PlaneOrder)
{
    UINT8 u1PlnSel[8] = { 0, 0, 0, 0, 0, 0, 0, 0 };
    PMX_IsLog(9, "[PMX%d] Start to Get PlaneOrder.\n", ucPmxId);
    if (PMX_HalGetPlaneOrder(ucPmxId, u1PlnSel) != 0)
        return 0;
    UINT32 hardware = 0;
    for (int k = 0; k < 8; ++k)
        hardware += static_cast<UINT32>(u1PlnSel[k]) << (4 * k);
    if (hardware != conf.u4PlaneOrder)
        PMX_IsLog(8, "Warning: PlaneOrder HW = [0x%8x], but SW = [0x%8x].\n", hardware, conf.u4PlaneOrder);
    PMX_IsLog(9, "Get PlaneOrder = 0x[%8x],[%d][%d][%d][%d][%d][%d][%d][%d].\n", hardware, u1PlnSel[0], u1PlnSel[1],
              u1PlnSel[2], u1PlnSel[3], u1PlnSel[4], u1PlnSel[5], u1PlnSel[6], u1PlnSel[7]);
    *pu4PlaneOrder = conf.u4PlaneOrder;
    return 1;
}
