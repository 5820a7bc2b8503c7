/* Aspect ratio of the output picture. */
#include "drv_pmx.h"
#include "pmx_if.h"

UINT32 PMX_GetAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio)
{
    if (ucPmxId != 0 || pu4AspectRatio == nullptr)
        return 0;

    const PMX_CONF_T* prConf = prPmxConf();
    *pu4AspectRatio = prConf->fgDigestEnable != 0 ? prConf->u4DigestAsp : prConf->u4AspectRatio;
    return 1;
}

INT32 i4PmxGetAspectRatio(void* pvTag, UINT32* pu4AspectRatio)
{
    return (INT32)PMX_GetAspectRatio(ucPmxIdOfTag(pvTag), pu4AspectRatio);
}
