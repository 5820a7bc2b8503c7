#include "board/names.h"

namespace board::names
{
namespace
{

struct Use
{
    std::string_view owner; ///< empty: of whatever function or record
    std::string_view argument;
    Family family;
};

// One argument name means one thing nearly everywhere; where it does not, the owner's row stands first.
constexpr Use uses[] = {
    { "i4PmxOsdEnabled", "eSrcColorSpace", Family::GfxColorMode },
    { "pi4OsdEnabled", "eSrcColorSpace", Family::GfxColorMode },
    { "VDP_GetHwEnable", "result", Family::VdpEnable },
    { "PMX_GetHDMIDefaultRes", "result", Family::ResolutionMode },
    { "x_sema_create", "eType", Family::SemaType },
    { "x_sema_lock", "eOption", Family::SemaOption },
    { "x_timer_start", "eFlag", Family::TimerFlag },
    { "fgPmxDrvSetAvd", "u4Command", Family::AvdCommand },
    { "fgPmxDrvGetAvdInfo", "u4Query", Family::AvdQuery },
    { "TVE_SetAspectRatio", "eAspect", Family::TveAspect },
    { "OSDSetColorSpace", "ucColorSpace", Family::ColorSpace },

    { "", "ucMode", Family::ResolutionMode },
    { "", "pucMode", Family::ResolutionMode },
    { "", "bResIndex", Family::ResolutionMode },
    { "", "eResMode", Family::ResolutionMode },
    { "", "ucMainFmt", Family::ResolutionMode },
    { "", "ucTargetFmt", Family::ResolutionMode },
    { "", "ucCavFmt", Family::ResolutionMode },
    { "", "ucCvbsFmt", Family::ResolutionMode },
    { "", "ucCvbsMode", Family::ResolutionMode },
    { "", "ucHdmiOutDisplayResolution", Family::ResolutionMode },
    { "", "ucFmtOutResolution", Family::ResolutionMode },
    { "", "ucCCIROutResolution", Family::ResolutionMode },
    { "", "u4ResCheck", Family::ResolutionMode },
    { "", "u4ValidAutoRes", Family::ResolutionMode },
    { "", "ucChkRes", Family::ResolutionMode },
    { "", "ucSupportedAutoRes", Family::ResolutionMode },
    { "", "ucOutputMode", Family::ResolutionMode },

    { "", "eDgoMode", Family::CcirMode },
    { "", "eDgiMode", Family::CcirMode },
    { "", "eDgoFmt", Family::CcirFormat },
    { "", "eDgiFmt", Family::CcirFormat },

    { "", "eInputColorMode", Family::GfxColorMode },
    { "", "eSrcColorMode", Family::GfxColorMode },
    { "", "eSrcColorSpace", Family::ColorSpace },
    { "", "eMasterColorSpace", Family::ColorSpace },
    { "", "eColorSpace", Family::ColorSpace },
    { "", "eMixerOutCS", Family::ColorSpace },

    { "", "ucPlane", Family::Plane },
    { "", "rDrvExtScl", Family::ExtChipUsage },
    { "", "ucHdmiOutMode", Family::ExtChipUsage },
    { "", "ucTvType", Family::TvType },
    { "", "pucTvType", Family::TvType },
    { "", "u2CompType", Family::ComponentType },
    { "", "u2ThisCompType", Family::ComponentType },
    { "", "u2UpstreamCompType", Family::ComponentType },
    { "", "u4IfId", Family::InterfaceId },
    { "", "u4AspectRatio", Family::Aspect },
    { "", "pu4AspectRatio", Family::Aspect },
    { "", "u4AspNext", Family::Aspect },
    { "", "u4DigestAsp", Family::Aspect },
    { "", "ucDigitalRgb", Family::DigitalFormat },
    { "", "ucRgb", Family::DigitalFormat },
    { "", "pucRgb", Family::DigitalFormat },
    { "", "eSetType", Family::ExtChipSetting },
    { "", "eClosedCaptionOnOff", Family::ClosedCaption },
};

} // namespace

Family family_of(std::string_view owner, std::string_view argument)
{
    for (const Use& use : uses)
    {
        if (use.argument == argument && (use.owner.empty() || use.owner == owner))
            return use.family;
    }
    return Family::None;
}

} // namespace board::names
