/* The mixer's resolution mode. */
#include "drv_pmx.h"
#include "pmx_if.h"

UINT32 PMX_GetMode(UCHAR ucPmxId, UCHAR* pucMode)
{
    if (ucPmxId != 0 || pucMode == nullptr)
        return 0;

    *pucMode = prPmxConf()->ucMode;
    return 1;
}

INT32 i4PmxGetMode(void* pvTag, UCHAR* pucMode)
{
    return (INT32)PMX_GetMode(ucPmxIdOfTag(pvTag), pucMode);
}
