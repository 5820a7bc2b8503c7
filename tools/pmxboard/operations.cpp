#include "drv_pmx.h"

#include "tools/pmxboard/operation.h"
#include "tools/pmxboard/step_error.h"

namespace pmxboard
{
namespace
{

using board::names::Family;

#define OPERATION(function, ...) operation<function>(#function, { __VA_ARGS__ })

/** The first conversion in a format that wants a value; empty when there is none. A percent sign at the end counts. */
std::string conversion_in(std::string_view format)
{
    for (std::size_t i = format.find('%'); i != format.npos; i = format.find('%', i + 2))
    {
        if (i + 1 == format.size() || format[i + 1] != '%')
            return std::string(format.substr(i, 2));
    }
    return {};
}

std::string folded(std::string_view format)
{
    std::string text;
    for (std::size_t i = 0; i < format.size(); ++i)
    {
        text += format[i];
        if (format[i] == '%')
            ++i;
    }
    return text;
}

/** The text is the format. No values go with it, and it is a format a second time when it reaches the console. */
void check_format(const std::string& format)
{
    if (format.find('\0') != format.npos)
        throw LineError("format_string ends at its \\x00; leave it out");
    const std::string first = conversion_in(format);
    if (!first.empty())
        throw LineError("format_string wants a value for \"" + first +
                        "\", and values cannot be given here; write %% for a percent sign");
    const std::string second = conversion_in(folded(format));
    if (!second.empty())
        throw LineError("format_string is formatted twice on its way to the console, and the second time \"" + second +
                        "\" wants a value; write %%%% for a percent sign");
}

Operation printf_operation()
{
    Operation made;
    made.name = "PMX_Printf";
    made.parameters = { Argument<INT32>::describe("PMX_Printf", "level"),
                        { .name = "format_string", .is_output = false, .may_be_null = false, .kind = {} } };
    made.parameters[1].kind.form = Kind::Form::Text;
    made.check = [](const Values& values) { check_format(values[1].string()); };
    made.call = [](const Operation&, const Values& values) {
        // Through a pointer of plain type: the format is checked above, not by the compiler.
        void (*const print)(INT32, const char*, ...) = PMX_Printf;
        print(static_cast<INT32>(values[0].as_number()), values[1].string().c_str());
        return Outcome{};
    };
    return made;
}

const std::vector<Operation> table = {
    OPERATION(PMX_Init),
    OPERATION(PMX_Reset, "ucPmxId"),
    OPERATION(PMX_Uninit),
    OPERATION(i4PMX_Uninit, "u4Case"),
    OPERATION(PMX_Stop),
    OPERATION(i4PMX_Suspend, "param"),
    OPERATION(i4PMX_Resume, "param"),
    OPERATION(i4PmxRegisterIM, "u2CompType", "u2CompId"),
    OPERATION(i4PmxUnregisterIM, "u2CompType", "u2CompId"),

    OPERATION(PMX_GetCap, "ucPmxId", "pu4Cap"),
    OPERATION(PMX_SetEnable, "ucPmxId", "ucEnable"),
    OPERATION(PMX_GetEnable, "ucPmxId", "pucEnable"),
    OPERATION(PMX_EnableVideoPlane, "ucPmxId", "ucVdpId"),
    OPERATION(PMX_DisableVideoPlane, "ucPmxId", "ucVdpId"),
    OPERATION(i4PmxEnableVideoPlane, "pvTag", "ucVdpId"),
    OPERATION(i4PmxDisableVideoPlane, "pvTag", "ucVdpId"),

    OPERATION(PMX_GetHDMIDefaultRes),
    OPERATION(vSetPLLGP_HDMIDDS, "bResIndex"),
    OPERATION(PMX_SetTvType, "ucPmxId", "ucTvType"),
    OPERATION(PMX_GetTvType, "ucPmxId", "pucTvType"),

    printf_operation(),
    OPERATION(PMX_QueryStatus),

    OPERATION(PMX_CheckCap, "ucPmxId", "ucMode"),
    OPERATION(PMX_SetMode, "ucPmxId", "ucMode", "ucVFreq", "fgOSD5"),
    OPERATION(i4PmxSetMode, "pvTag", "ucMode", "ucVFreq", "fgOSD5"),
    OPERATION(PMX_SetModeEx, "ucPmxId", { "prOutConf", PMX_OUTPUT_NUM }, "ucVFreq", "rDrvExtScl", "fgOSD5"),
    OPERATION(PMX_GetMode, "ucPmxId", "pucMode"),
    OPERATION(i4PmxGetMode, "pvTag", "pucMode"),
    OPERATION(PMX_IsForceMode, "ucPmxId"),
    OPERATION(PMX_SetForceMode, "ucPmxId", "fgOn"),

    OPERATION(PMX_SetFormatChangeFlag, "bIsFormatChange"),
    OPERATION(PMX_SetOsdEnableFlag, "bIsOsdEnable"),
    OPERATION(PMX_SetOsdEnable),
    OPERATION(_PMX_TmrIsr, "h", "pvArg"),
    OPERATION(PMX_SetFormatChangeTimer, "u4TimeInterval"),
    OPERATION(fgPMX_DisplayModeReady),

    OPERATION(PMX_ColorSpaceSetup, { "eMixerOutCS", Family::ColorSpace }, { "ucOutputMode", Family::ResolutionMode }),

    OPERATION(PMX_GetOutSize, "ucPmxId", "pu4Width", "pu4Height"),
    OPERATION(i4PmxGetOutSize, "pvTag", "pu4Width", "pu4Height"),
    OPERATION(PMX_ProgressiveOut, "ucPmxId"),
    OPERATION(fgPmxFmtHDOutput, "ucPmxId"),

    OPERATION(PMX_SetTVSystem, "ucPmxId", "u2VSyncFreq", "fgTvSysAuto"),
    OPERATION(PMX_ChkSupportedRes, "ucPmxId", "ucChkRes", "u2VSyncFreq", never_null("ucSupportedAutoRes"),
              never_null("ucSupportedAutoVsyncFreg")),
    OPERATION(PMX_SetHdmiDeepColor, "ucPmxId", "ucDeepColor"),
    OPERATION(PMX_RecordUiResAuto, "fgIsAuto"),

    OPERATION(PMX_SetBg, "ucPmxId", "u4BgColor"),
    OPERATION(PMX_SetPlaneOrderArray, "ucPmxId", { "pu4PlaneOrder", 8 }),
    OPERATION(PMX_SetPlaneOrder, "ucPmxId", "ucVdpId", "ucPlaneOrder"),
    OPERATION(PMX_GetPlaneOrder, "ucPmxId", "ucVdpId", "pucPlaneOrder"),
    OPERATION(PMX_SetOrderVdpComp0, "ucPmxId", "u4OnTop"),
    OPERATION(d_PMX_SetOrderVdpComp0, "ucPmxId", "u4OnTop"),
    OPERATION(d_PMX_GetOrderVdpComp0, "ucPmxId", never_null("pu4OnTop")),
    OPERATION(PMX_VdpGetPlanePosition, "ucPmxId", "ucVdpHwId").returning(Family::Plane),
    OPERATION(i4PmxGetPlanePosition, "pvTag", "ucVdpHwId").returning(Family::Plane),

    OPERATION(PMX_SetArbPlaneOrder, "ucPmxId", "u4PlaneOrder"),
    OPERATION(PMX_GetArbPlaneOrder, "ucPmxId", never_null("pu4PlaneOrder")),

    OPERATION(PMX_SetSwapEnable, "ucPmxId", "ucEnable", "ucSwapMode"),
    OPERATION(PMX_GetSwapEnable, "ucPmxId", never_null("pucEnable"), "ucSwapMode"),
    OPERATION(PMX_SetCBEnable, "ucPmxId", "ucEnable"),
    OPERATION(PMX_GetCBEnable, "ucPmxId", "pucEnable"),
    OPERATION(PMX_SetMuteEnable, "ucPmxId", "ucEnable"),
    OPERATION(PMX_GetMuteEnable, "ucPmxId", "pucEnable"),
    OPERATION(PMX_SetActiveZone, "ucPmxId", "ucMode"),
    OPERATION(PMX_SetDelay, "ucVdoId", "ucADJ_F", "u2HDelay", "u2VDelay"),

    OPERATION(u4PmxCompId2LocalId, "u2CompType", "u2CompId"),
    OPERATION(i4Pmx_Connect, "u2ThisCompType", "u2ThisCompId", "u2UpstreamCompType", "u2UpstreamCompId"),
    OPERATION(i4Pmx_Disconnect, "u2ThisCompType", "u2ThisCompId", "u2UpstreamCompType", "u2UpstreamCompId"),

    OPERATION(PMX_VdpEnabled, "ucPmxId", "ucVdpId", "i4SrcWidth", "i4SrcHeight", "ucLumaKey"),
    OPERATION(PMX_VdpDisabled, "ucPmxId", "ucVdpId"),
    OPERATION(PMX_OsdEnabled, "ucPmxId", "ucOsdId", "i4SrcWidth", "i4SrcHeight", "eSrcColorMode"),
    OPERATION(PMX_OsdDisabled, "ucPmxId", "ucOsdId"),
    OPERATION(PMX_DecideMasterColorSpace, "ucPmxId"),
    OPERATION(PMX_InformVdpColorSpace, "ucPmxId"),

    OPERATION(i4PmxOsdEnabled, "pvTag", "i4SrcWidth", "i4SrcHeight", "eSrcColorSpace"),
    OPERATION(i4PmxOsdDisabled, "pvTag"),
    OPERATION(i4PmxVdpEnabled, "pvTag", "i4SrcWidth", "i4SrcHeight"),
    OPERATION(i4PmxVdpDisabled, "pvTag"),

    OPERATION(PMX_SetBrightness, "ucPmxId", "ucBrightness", "bSetTVE"),
    OPERATION(PMX_GetBrightness, "ucPmxId", "pucBrightness"),
    OPERATION(d_PMX_SetBrightness, "ucBrightness"),
    OPERATION(d_PMX_GetBrightness, "pucBrightness"),
    OPERATION(PMX_SetContrast, "ucPmxId", "ucContrast", "bSetTVE"),
    OPERATION(PMX_GetContrast, "ucPmxId", "pucContrast"),
    OPERATION(d_PMX_SetContrast, "ucContrast"),
    OPERATION(d_PMX_GetContrast, "pucContrast"),
    OPERATION(PMX_SetHue, "ucPmxId", "ucHue", "bSetTVE"),
    OPERATION(PMX_GetHue, "ucPmxId", "pucHue"),
    OPERATION(d_PMX_SetHue, "ucHue"),
    OPERATION(d_PMX_GetHue, "pucHue"),
    OPERATION(PMX_SetSaturation, "ucPmxId", "ucSaturation", "bSetTVE"),
    OPERATION(PMX_GetSaturation, "ucPmxId", "pucSaturation"),
    OPERATION(d_PMX_SetSaturation, "ucSaturation"),
    OPERATION(d_PMX_GetSaturation, "pucSaturation"),
    OPERATION(PMX_SetSharpness, "ucPmxId", "ucSharpness", "bSetTVE"),
    OPERATION(PMX_GetSharpness, "ucPmxId", "pucSharpness"),
    OPERATION(d_PMX_SetSharpness, "ucSharpness"),
    OPERATION(d_PMX_GetSharpness, "pucSharpness"),
    OPERATION(PMX_SetGamma, "ucPmxId", "ucGamma"),
    OPERATION(PMX_GetGamma, "ucPmxId", "pucGamma"),
    OPERATION(PMX_GetGammaNs, "ucPmxId", "pucGammaNs"),
    OPERATION(PMX_SetBlackLv, "ucPmxId", "ucCAVEn", "ucCVBSEn"),
    OPERATION(PMX_GetBlackLv, "ucPmxId", "pucCAVEn", "pucCVBSEn"),
    OPERATION(PMX_SetDGOSource, "fgBeforeMixer"),
    OPERATION(PMX_SetCVBSSetup, "fgEnable"),
    OPERATION(PMX_SetCVBSPal60, "fgEnable"),
    OPERATION(PMX_SetMediaType, "ucPmxId", "ucMediaType"),
    OPERATION(d_PMX_Set2DSmooth, "uc2D"),

    OPERATION(PMX_SetAspectRatio, "ucPmxId", "u4AspectRatio"),
    OPERATION(PMX_SetAspectRatioEx, "ucPmxId", "u4AspectRatio", "fgApplyOnNext"),
    OPERATION(PMX_SetAspectRatioNext, "ucPmxId").returning(Family::Aspect),
    OPERATION(PMX_SetDigestAspectRatioEx, "ucPmxId", "u4AspectRatio", "fgDigestEnable"),
    OPERATION(PMX_GetAspectRatio, "ucPmxId", "pu4AspectRatio"),
    OPERATION(i4PmxGetAspectRatio, "pvTag", "pu4AspectRatio"),
    OPERATION(PMX_IsUnderDigestMode, "ucPmxId"),
    OPERATION(PMX_GetNormalAspectRatio, "ucPmxId", "pu4AspectRatio"),
    OPERATION(PMX_GetDigestAspectRatio, "ucPmxId", "pu4AspectRatio"),
    OPERATION(PMX_GetAspectRatioMW, "ucPmxId", "pu4AspectRatio"),

    OPERATION(PMX_SetDigitalOutEnable, "ucPmxId", "ucEnable"),
    OPERATION(PMX_GetDigitalOutEnable, "ucPmxId", "pucEnable"),
    OPERATION(PMX_SetDigitalOutPara, "ucPmxId", "ucDigitalBit", "ucProprietaryMode"),
    OPERATION(PMX_SetDigitalOutPhase, "ucPmxId", "u4Phase"),
    OPERATION(PMX_SetDigitalOutDrv, "u4Drving"),
    OPERATION(PMX_SetDigitalOutRgb, "ucPmxId", { "ucRgb", Family::DigitalFormat }),
    OPERATION(PMX_GetDigitalOutRgb, "ucPmxId", { "pucRgb", Family::DigitalFormat }),

    OPERATION(PMX_SetExternalChipSetting, "eSetType", "i4Value"),
    OPERATION(PMX_SetClosedCaptionOnOff, "ucPmxId", "eClosedCaptionOnOff"),
};

} // namespace

const std::vector<Operation>& operations()
{
    return table;
}

} // namespace pmxboard
