// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Arbitrary plane order: any permutation of the eight sources over the eight planes, with the delays that follow from
 * it. */
#include "drv_osd.h"
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

/* Nominal offset of each plane, in the hardware's unit. */
static constexpr UINT8 OFFSETS_HD[PMX_PLANE_NUM] = { 12, 12, 10, 8, 6, 4, 2, 0 };
static constexpr UINT8 OFFSETS_OTHER[PMX_PLANE_NUM] = { 6, 6, 5, 4, 3, 2, 1, 0 };

/* Each field's top bit is not part of the source number. Yields the sources that are used, one bit each. */
static UINT32 u4Unpack(UINT32 u4PlaneOrder, UINT8* pu1PlnSel)
{
    UINT32 u4Used = 0;
    for (UINT32 k = 0; k < PMX_PLANE_NUM; k++)
    {
        pu1PlnSel[k] = (UINT8)((u4PlaneOrder >> (4 * k)) & 7);
        u4Used |= 1u << pu1PlnSel[k];
    }
    return u4Used;
}

/* Name the first two planes that have the same source. */
static void vLogConflict(const UINT8* pu1PlnSel)
{
    for (INT32 i = 0; i < PMX_PLANE_NUM; i++)
    {
        for (INT32 j = i + 1; j < PMX_PLANE_NUM; j++)
        {
            if (pu1PlnSel[i] == pu1PlnSel[j])
            {
                PMX_NOTE(SOURCE_TWICE, pu1PlnSel[i], i << 4 | j);
                PMX_IsLog(9, "Plane[%d] and Plane[%d] connect to the same input source!\n", i, j);
                return;
            }
        }
    }
}

/* Hand the compensations to display control and to the OSD driver; nobody takes those of planes 4, 5 and 7. */
static void vCompensate(const UINT8* pu1Nominal, const INT32* pi4PlnDelay)
{
    PMX_IsLog(8, "Set Video Plane dealy: %d,%d.\n", pi4PlnDelay[0], pi4PlnDelay[1]);
    PMX_IsLog(8, "Set OSD Plane delay: %d,%d,%d,%d,%d.\n", pi4PlnDelay[2], pi4PlnDelay[3], pi4PlnDelay[4],
              pi4PlnDelay[5], pi4PlnDelay[6]);
    DCM_SetVideoPlaneDelay(pi4PlnDelay[0], pi4PlnDelay[1]); // raw; the compensated ones below replace them

    INT32 i4OffSet[PMX_PLANE_NUM];
    for (INT32 i = 0; i < PMX_PLANE_NUM; i++)
    {
        PMX_IsLog(0, "Plane %d ofst is %ld, delay is %ld\n", i, (long)pu1Nominal[i], (long)pi4PlnDelay[i]);
        i4OffSet[i] = (INT32)(pu1Nominal[i] - (UINT32)pi4PlnDelay[i]); // may be negative; wraps, never traps
    }
    DCM_SetVideoPlaneDelay(i4OffSet[0], i4OffSet[1]);

    INT32 i4Offset_SetToOsd[5] = { i4OffSet[6], i4OffSet[3], i4OffSet[2], 0, 0 };
    _i4OSD_SetPosOffset(i4Offset_SetToOsd);
}

UINT32 PMX_SetArbPlaneOrder(UCHAR ucPmxId, UINT32 u4PlaneOrder)
{
    PMX_CONF_T* prConf = prPmxConf();
    UINT8 u1PlnSel[PMX_PLANE_NUM];
    INT32 i4PlnDelay[PMX_PLANE_NUM];

    Printf("[PMX%d] Set PlaneOrder = [0x%8x]\n", ucPmxId, u4PlaneOrder);
    UINT32 u4Used = u4Unpack(u4PlaneOrder, u1PlnSel);
    const UINT8* pu1Nominal = fgPmxTveHd(prConf->ucMode) ? OFFSETS_HD : OFFSETS_OTHER;
    for (INT32 i = 0; i < PMX_PLANE_NUM; i++)
        Printf("[PMX]offset[%d]=%d\n", i, pu1Nominal[i]);
    for (INT32 i = 0; i < PMX_PLANE_NUM; i++)
        Printf("[PMX]u1PlnSel[%d]=%d\n", i, u1PlnSel[i]);
    if (u4Used != 0xFF) // each of the eight once; compared in pairs only when two planes have the same
    {
        vLogConflict(u1PlnSel);
        return 0;
    }

    prConf->u4PlaneOrder = u4PlaneOrder; // stays if the hardware refuses: the next read-back warns of the difference
    memset(i4PlnDelay, 0, sizeof i4PlnDelay);
    if (PMX_HalSetPlaneOrder(ucPmxId, u1PlnSel, i4PlnDelay) != 0)
        return PMX_WHY(ORDER_REFUSED, 0);

    vCompensate(pu1Nominal, i4PlnDelay);
    return 1;
}

UINT32 PMX_GetArbPlaneOrder(UCHAR ucPmxId, UINT32* pu4PlaneOrder)
{
    const PMX_CONF_T* prConf = prPmxConf();
    UINT8 u1PlnSel[PMX_PLANE_NUM];

    memset(u1PlnSel, 0, sizeof u1PlnSel);
    PMX_IsLog(9, "[PMX%d] Start to Get PlaneOrder.\n", ucPmxId);
    if (PMX_HalGetPlaneOrder(ucPmxId, u1PlnSel) != 0)
        return PMX_WHY(ORDER_UNREAD, 0);

    UINT32 u4Hardware = 0;
    for (UINT32 k = 0; k < PMX_PLANE_NUM; k++)
        u4Hardware += (UINT32)u1PlnSel[k] << (4 * k);
    if (u4Hardware != prConf->u4PlaneOrder)
        PMX_IsLog(8, "Warning: PlaneOrder HW = [0x%8x], but SW = [0x%8x].\n", u4Hardware, prConf->u4PlaneOrder);
    PMX_IsLog(9, "Get PlaneOrder = 0x[%8x],[%d][%d][%d][%d][%d][%d][%d][%d].\n", u4Hardware, u1PlnSel[0], u1PlnSel[1],
              u1PlnSel[2], u1PlnSel[3], u1PlnSel[4], u1PlnSel[5], u1PlnSel[6], u1PlnSel[7]);
    *pu4PlaneOrder = prConf->u4PlaneOrder;
    return 1;
}
