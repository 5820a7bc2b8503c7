/* Source events. Those that come through IPMX are inert: only the direct calls count. */
#include "drv_pmx.h"

INT32 i4PmxOsdEnabled(void*, INT32, INT32, DRV_GFX_COLOR_MODE_T)
{
    return 1;
}

INT32 i4PmxOsdDisabled(void*)
{
    return 1;
}

INT32 i4PmxVdpEnabled(void*, INT32, INT32)
{
    return 1;
}

INT32 i4PmxVdpDisabled(void*)
{
    return 1;
}
