/* Size of the picture in the mixer's resolution mode. */
#include "drv_pmx.h"
#include "pmx_if.h"

UINT32 PMX_GetOutSize(UCHAR ucPmxId, UINT32* pu4Width, UINT32* pu4Height)
{
    if (ucPmxId != 0 || pu4Width == nullptr || pu4Height == nullptr)
        return 0;

    const PMX_MODE_ROW_T* prRow = prPmxModeRow(prPmxConf()->ucMode);
    *pu4Width = prRow->u2Width;
    *pu4Height = prRow->u2Height;
    return 1;
}

INT32 i4PmxGetOutSize(void* pvTag, UINT32* pu4Width, UINT32* pu4Height)
{
    return (INT32)PMX_GetOutSize(ucPmxIdOfTag(pvTag), pu4Width, pu4Height);
}
