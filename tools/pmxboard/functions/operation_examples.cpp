// SPDX-License-Identifier: MIT OR GPL-2.0-only
// A line for every operation that works as it stands on the default board.
#include "tools/pmxboard/functions/operation_examples.h"

namespace pmxboard
{
namespace
{

const std::vector<OperationExample> table = {
    { "PMX_Init", {} },
    { "PMX_Reset 0" },
    { "PMX_Uninit" },
    { "i4PMX_Uninit 0" },
    { "PMX_Stop" },
    { "i4PMX_Suspend 0" },
    { "i4PMX_Resume 0" },
    { "i4PmxRegisterIM PMX_COMP_TYPE_PMX 0", { "PMX_Init", "i4PmxUnregisterIM PMX_COMP_TYPE_PMX 0" } },
    { "i4PmxUnregisterIM PMX_COMP_TYPE_PMX 0" },

    { "PMX_GetCap 0" },
    { "PMX_SetEnable 0 1" },
    { "PMX_GetEnable 0" },
    { "PMX_EnableVideoPlane 0 1" },
    { "PMX_DisableVideoPlane 0 1" },
    { "i4PmxEnableVideoPlane 0 1" },
    { "i4PmxDisableVideoPlane 0 1" },

    { "PMX_GetHDMIDefaultRes" },
    { "vSetPLLGP_HDMIDDS RES_1080P24HZ" },
    { "PMX_SetTvType 0 PMX_TV_TYPE_PAL" },
    { "PMX_GetTvType 0" },

    { R"(PMX_Printf 3 "half way: 50%%%%\n")", { "PMX_Init", "poke PMX_debug_level 0b1000" } },
    { "PMX_QueryStatus" },

    { "PMX_CheckCap 0 RES_1080P60HZ" },
    { "PMX_SetMode 0 RES_720P50HZ 50 0" },
    { "i4PmxSetMode 0 RES_720P60HZ 60 0" },
    { "PMX_SetModeEx 0 [[0], [1, RES_1080P60HZ], [1, RES_480P], [1, RES_480I]] 60 0 0" },
    { "PMX_GetMode 0" },
    { "i4PmxGetMode 0" },
    { "PMX_IsForceMode 0" },
    { "PMX_SetForceMode 0 TRUE" },

    { "PMX_SetFormatChangeFlag FALSE" },
    { "PMX_SetOsdEnableFlag TRUE" },
    { "PMX_SetOsdEnable" },
    { "_PMX_TmrIsr 0 0" },
    { "PMX_SetFormatChangeTimer 10000" },
    { "fgPMX_DisplayModeReady" },

    { "PMX_ColorSpaceSetup DRV_PMX_CS_YCBCR_601 RES_1080P60HZ" },

    { "PMX_GetOutSize 0" },
    { "i4PmxGetOutSize 0" },
    { "PMX_ProgressiveOut 0" },
    { "fgPmxFmtHDOutput 0" },

    { "PMX_SetTVSystem 0 50 FALSE" },
    { "PMX_ChkSupportedRes 0 RES_1080P60HZ 60" },
    { "PMX_SetHdmiDeepColor 0 1" },
    { "PMX_RecordUiResAuto TRUE" },

    { "PMX_SetBg 0 0x00108080" },
    { "PMX_SetPlaneOrderArray 0 [4, 3, 0, 1, 2, 5, 6, 7]" },
    { "PMX_SetPlaneOrder 0 4 7" },
    { "PMX_GetPlaneOrder 0 4" },
    { "PMX_SetOrderVdpComp0 0 1" },
    { "d_PMX_SetOrderVdpComp0 0 1" },
    { "d_PMX_GetOrderVdpComp0 0" },
    { "PMX_VdpGetPlanePosition 0 0" },
    { "i4PmxGetPlanePosition 0 1" },

    { "PMX_SetArbPlaneOrder 0 0x76543201" },
    { "PMX_GetArbPlaneOrder 0" },

    { "PMX_SetSwapEnable 0 1 4" },
    { "PMX_GetSwapEnable 0 4" },
    { "PMX_SetCBEnable 0 1" },
    { "PMX_GetCBEnable 0" },
    { "PMX_SetMuteEnable 0 1" },
    { "PMX_GetMuteEnable 0" },
    { "PMX_SetActiveZone 0 RES_1080P60HZ" },
    { "PMX_SetDelay 0 0 16 4" },

    { "u4PmxCompId2LocalId PMX_COMP_TYPE_OSD 2" },
    { "i4Pmx_Connect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_OSD 2" },
    { "i4Pmx_Disconnect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_OSD 2", { "PMX_Init", "source osd2 connect" } },

    { "PMX_VdpEnabled 0 0 1920 1080 0", { "PMX_Init", "source vdp0 connect" } },
    { "PMX_VdpDisabled 0 0", { "PMX_Init", "source vdp0 start 1920x1080" } },
    { "PMX_OsdEnabled 0 2 1280 720 DRV_GFX_COLOR_MODE_RGB", { "PMX_Init", "source osd2 connect" } },
    { "PMX_OsdDisabled 0 2", { "PMX_Init", "source osd2 start 1280x720 rgb" } },
    { "PMX_DecideMasterColorSpace 0" },
    { "PMX_InformVdpColorSpace 0", { "PMX_Init", "source vdp0 start 1920x1080" } },

    { "i4PmxOsdEnabled 0 1280 720 DRV_GFX_COLOR_MODE_RGB" },
    { "i4PmxOsdDisabled 0" },
    { "i4PmxVdpEnabled 0 1920 1080" },
    { "i4PmxVdpDisabled 0" },

    { "PMX_SetBrightness 0 140 TRUE" },
    { "PMX_GetBrightness 0" },
    { "d_PMX_SetBrightness 140" },
    { "d_PMX_GetBrightness" },
    { "PMX_SetContrast 0 140 TRUE" },
    { "PMX_GetContrast 0" },
    { "d_PMX_SetContrast 140" },
    { "d_PMX_GetContrast" },
    { "PMX_SetHue 0 120 TRUE" },
    { "PMX_GetHue 0" },
    { "d_PMX_SetHue 120" },
    { "d_PMX_GetHue" },
    { "PMX_SetSaturation 0 150 TRUE" },
    { "PMX_GetSaturation 0" },
    { "d_PMX_SetSaturation 150" },
    { "d_PMX_GetSaturation" },
    { "PMX_SetSharpness 0 3 TRUE" },
    { "PMX_GetSharpness 0" },
    { "d_PMX_SetSharpness 3" },
    { "d_PMX_GetSharpness" },
    { "PMX_SetGamma 0 2" },
    { "PMX_GetGamma 0" },
    { "PMX_GetGammaNs 0" },
    { "PMX_SetBlackLv 0 1 1" },
    { "PMX_GetBlackLv 0" },
    { "PMX_SetDGOSource TRUE" },
    { "PMX_SetCVBSSetup TRUE" },
    { "PMX_SetCVBSPal60 TRUE" },
    { "PMX_SetMediaType 0 1" },
    { "d_PMX_Set2DSmooth 1" },

    { "PMX_SetAspectRatio 0 ASP_4_3" },
    { "PMX_SetAspectRatioEx 0 ASP_4_3 TRUE" },
    { "PMX_SetAspectRatioNext 0", { "PMX_Init", "PMX_SetAspectRatioEx 0 ASP_4_3 TRUE" } },
    { "PMX_SetDigestAspectRatioEx 0 ASP_16_9 TRUE" },
    { "PMX_GetAspectRatio 0" },
    { "i4PmxGetAspectRatio 0" },
    { "PMX_IsUnderDigestMode 0" },
    { "PMX_GetNormalAspectRatio 0" },
    { "PMX_GetDigestAspectRatio 0" },
    { "PMX_GetAspectRatioMW 0" },

    { "PMX_SetDigitalOutEnable 0 1" },
    { "PMX_GetDigitalOutEnable 0" },
    { "PMX_SetDigitalOutPara 0 24 0" },
    { "PMX_SetDigitalOutPhase 0 2" },
    { "PMX_SetDigitalOutDrv 4" },
    { "PMX_SetDigitalOutRgb 0 PLA_MXR_DIGITAL_OUTPUT_FMT_RGB" },
    { "PMX_GetDigitalOutRgb 0" },

    { "PMX_SetExternalChipSetting PLA_MXR_EXT_ZOOM_IMAGE 120" },
    { "PMX_SetClosedCaptionOnOff 0 PLA_MXR_CLOSED_CAPTION_ON" },
};

} // namespace

const OperationExample* example_of(std::string_view operation)
{
    for (const OperationExample& example : table)
    {
        if (example.line.substr(0, example.line.find(' ')) == operation)
            return &example;
    }
    return nullptr;
}

} // namespace pmxboard
