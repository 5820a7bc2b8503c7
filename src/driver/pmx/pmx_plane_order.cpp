/* Where the video planes stand among the mixer planes. */
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

UINT32 PMX_VdpGetPlanePosition(UCHAR ucPmxId, UCHAR ucVdpHwId)
{
    bool fgSwapped = fgPmxHalSwapPlane1_2(ucPmxId) != 0;

    if (ucVdpHwId == 0)
        return fgSwapped ? DRV_PMX_PLANE_2 : DRV_PMX_PLANE_1;
    if (ucVdpHwId == 1)
        return fgSwapped ? DRV_PMX_PLANE_1 : DRV_PMX_PLANE_2;

    PMX_IsLog(5, "Invalid VDP Id\n");
    Assert("0", __FILE__, __LINE__);
    return DRV_PMX_PLANE_1;
}

INT32 i4PmxGetPlanePosition(void* pvTag, UCHAR ucVdpHwId)
{
    return (INT32)PMX_VdpGetPlanePosition(ucPmxIdOfTag(pvTag), ucVdpHwId);
}
