// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Settings of the external chip, and closed captions: handed on, never kept. */
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "drv_vdp.h"
#include "pmx_if.h"
#include "x_plane_mxr.h"

UINT32 PMX_SetExternalChipSetting(PLA_MXR_EXTERNAL_CHIP_SETTING_E eSetType, INT32 i4Value)
{
    if (eSetType > PLA_MXR_EXT_DEEP_COLOR)
        return PMX_WHY(CHIP_SETTING, 0, eSetType);

    // One byte of the value by its address: the low one on this little-endian processor, which is what the chip takes.
    fgPmxDrvSetAvd((UINT32)PMX_SET_EXT_SHARPNESS + (UINT32)eSetType, &i4Value, 1);
    return 1;
}

UINT32 PMX_SetClosedCaptionOnOff(UCHAR ucPmxId, PLA_MXR_CLOSED_CAPTION_ON_OFF_T eClosedCaptionOnOff)
{
    if (ucPmxId != 0) // success, as nowhere else but in PMX_SetHdmiDeepColor
        return PMX_WHY(MIXER_ID, 1, ucPmxId);

    VDP_EnableCC(eClosedCaptionOnOff == PLA_MXR_CLOSED_CAPTION_ON);
    return 1;
}
