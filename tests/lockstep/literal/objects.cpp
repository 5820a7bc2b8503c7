// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* What the module holds, as it is at load, and what a reset loads. */
#include "tests/lockstep/literal/literal.h"

PMX_CONF_T _arPmxConf[1] = {};
PMX_DISPLAY_PART_STATUS_T _arPmxDispPartStatus = {};
HANDLE_T MutexPMX = 0;
UCHAR _PmxInitiated = 0;
INT32 bComp0OnTop = 0;
BOOL _fg2DCap = 0;
BOOL _PmxTestOsd = 0;
BOOL _fgBootUp = 1;
UINT32 PMX_debug_level = 0;

static constexpr PMX_CONF_T defaults()
{
    PMX_CONF_T record = {};
    record.ucEnable = 0;
    record.ucMode = RES_1080I60HZ;
    record.ucTvType = 0;
    record.ucVfreq = 60;
    record.ucDigitalOut = 1;
    record.u4Phase = 2;
    record.ucProprietaryMode = 0;
    record.ucDigitalBit = 24;
    record.ucDigitalRgb = 0;
    record.ucBrightness = 128;
    record.ucContrast = 128;
    record.ucHue = 128;
    record.ucSaturation = 128;
    record.u4AspectRatio = 3;
    record.u4BgColor = 0x108080;
    record.u4Capability = 0x7FFBFFFF;
    const UCHAR order[8] = { 4, 3, 1, 0, 2, 5, 6, 7 };
    for (int position = 0; position < 8; ++position)
        record.aucPlaneOrder[position] = order[position];
    for (int port = 0; port < 8; ++port)
    {
        record.arPortInfo[port].eInputColorMode = port < 2 ? DRV_GFX_COLOR_MODE_YCBCR : DRV_GFX_COLOR_MODE_RGB;
        record.arPortInfo[port].eSrcColorSpace = DRV_PMX_CS_YCBCR_709;
    }
    record.eMasterColorSpace = DRV_PMX_CS_YCBCR_709;
    for (int output = 0; output < 4; ++output)
    {
        record.arOutputConf[output].fgOutputEnable = 1;
        record.arOutputConf[output].eResMode = output == PMX_OUTPUT_CVBS ? RES_480I : RES_1080P60HZ;
        record.arOutputConf[output].u4VFreq = 60;
    }
    record.u4AspNext = 3;
    record.rDrvExtScl = DRV_NON_EXT_CHIP;
    record.u4PlaneOrder = 0x76543210;
    return record;
}

constinit const PMX_CONF_T _arPmxConfDefault = defaults();

const IPMX _rPMXIF = {
    i4PmxSetMode,           i4PmxGetMode,          i4PmxGetOutSize,       i4PmxGetAspectRatio,
    i4PmxDisableVideoPlane, i4PmxEnableVideoPlane, i4PmxOsdEnabled,       i4PmxOsdDisabled,
    i4PmxVdpEnabled,        i4PmxVdpDisabled,      i4PmxGetPlanePosition,
};

const PM_OPERATIONS_T pmx_pm_ops = { i4PMX_Suspend, i4PMX_Resume };
