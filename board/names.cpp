#include "board/names.h"

#include "drv_av_d.h"
#include "drv_if.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "x_plane_mxr.h"
#include "x_vid_dec.h"

namespace board::names
{
namespace
{

struct Row
{
    Family family;
    std::int64_t number;
    std::string_view name;
};

#define NAMED(family, name)                                    \
    {                                                          \
        Family::family, static_cast<std::int64_t>(name), #name \
    }

// Rows of the family None are understood and never shown: their numbers mean too many things.
constexpr Row rows[] = {
    NAMED(ResolutionMode, RES_480I),
    NAMED(ResolutionMode, RES_576I),
    NAMED(ResolutionMode, RES_480P),
    NAMED(ResolutionMode, RES_576P),
    NAMED(ResolutionMode, RES_480P_1440),
    NAMED(ResolutionMode, RES_576P_1440),
    NAMED(ResolutionMode, RES_480P_2880),
    NAMED(ResolutionMode, RES_576P_2880),
    NAMED(ResolutionMode, RES_720P60HZ),
    NAMED(ResolutionMode, RES_720P50HZ),
    NAMED(ResolutionMode, RES_1080I60HZ),
    NAMED(ResolutionMode, RES_1080I50HZ),
    NAMED(ResolutionMode, RES_1080P60HZ),
    NAMED(ResolutionMode, RES_1080P50HZ),
    NAMED(ResolutionMode, RES_1080P30HZ),
    NAMED(ResolutionMode, RES_1080P25HZ),
    NAMED(ResolutionMode, RES_480I_2880),
    NAMED(ResolutionMode, RES_576I_2880),
    NAMED(ResolutionMode, RES_1080P24HZ),
    NAMED(ResolutionMode, RES_1080P23_976HZ),
    NAMED(ResolutionMode, RES_1080P29_97HZ),
    NAMED(ResolutionMode, RES_3D_1080P23HZ),
    NAMED(ResolutionMode, RES_3D_1080P24HZ),
    NAMED(ResolutionMode, RES_3D_720P60HZ),
    NAMED(ResolutionMode, RES_3D_720P50HZ),
    NAMED(ResolutionMode, RES_3D_720P30HZ),
    NAMED(ResolutionMode, RES_3D_720P25HZ),
    NAMED(ResolutionMode, RES_3D_576P50HZ),
    NAMED(ResolutionMode, RES_3D_480P60HZ),
    NAMED(ResolutionMode, RES_3D_1080I60HZ),
    NAMED(ResolutionMode, RES_3D_1080I50HZ),
    NAMED(ResolutionMode, RES_3D_1080I30HZ),
    NAMED(ResolutionMode, RES_3D_1080I25HZ),
    NAMED(ResolutionMode, RES_3D_576I25HZ),
    NAMED(ResolutionMode, RES_3D_480I30HZ),
    NAMED(ResolutionMode, RES_3D_576I50HZ),
    NAMED(ResolutionMode, RES_3D_480I60HZ),
    NAMED(ResolutionMode, RES_2D_480I60HZ),
    NAMED(ResolutionMode, RES_2D_576I50HZ),
    NAMED(ResolutionMode, RES_2D_640x480HZ),
    NAMED(ResolutionMode, RES_PANEL_AUO_B089AW01),
    NAMED(ResolutionMode, RES_3D_720P60HZ_TB),
    NAMED(ResolutionMode, RES_3D_720P50HZ_TB),
    NAMED(ResolutionMode, RES_3D_1080I60HZ_SBS_HALF),
    NAMED(ResolutionMode, RES_3D_1080I50HZ_SBS_HALF),
    NAMED(ResolutionMode, RES_3D_1080P23HZ_TB),
    NAMED(ResolutionMode, RES_3D_1080P24HZ_TB),
    NAMED(ResolutionMode, RES_4K2K23976HZ),
    NAMED(ResolutionMode, RES_4K2K24HZ),
    NAMED(ResolutionMode, RES_2160P),
    NAMED(ResolutionMode, RES_2160P_4096),
    NAMED(ResolutionMode, RES_MODE_NUM),
    NAMED(ResolutionMode, RES_AUTO),
    NAMED(CcirMode, CCIR_INVALID),
    NAMED(CcirMode, CCIR_601_MODE),
    NAMED(CcirMode, CCIR_656_MODE),
    NAMED(CcirFormat, CCIR_NON_USED),
    NAMED(CcirFormat, CCIR_YCMIX_8BIT),
    NAMED(CcirFormat, CCIR_YCMIX_10BIT),
    NAMED(CcirFormat, CCIR_YCMIX_12BIT),
    NAMED(CcirFormat, CCIR_YC422_16BIT),
    NAMED(CcirFormat, CCIR_YC422_20BIT),
    NAMED(CcirFormat, CCIR_YC422_24BIT),
    NAMED(CcirFormat, CCIR_YC444_24BIT),
    NAMED(CcirFormat, CCIR_YC444_30BIT),
    NAMED(CcirFormat, CCIR_YC444_36BIT),
    NAMED(GfxColorMode, DRV_GFX_COLOR_MODE_YCBCR),
    NAMED(GfxColorMode, DRV_GFX_COLOR_MODE_RGB),
    NAMED(ColorSpace, DRV_PMX_CS_YCBCR_601),
    NAMED(ColorSpace, DRV_PMX_CS_YCBCR_709),
    NAMED(ColorSpace, DRV_PMX_CS_RGB),
    NAMED(Plane, DRV_PMX_PLANE_1),
    NAMED(Plane, DRV_PMX_PLANE_2),
    NAMED(Plane, DRV_PMX_PLANE_3),
    NAMED(Plane, DRV_PMX_PLANE_4),
    NAMED(Plane, DRV_PMX_PLANE_5),
    NAMED(Plane, DRV_PMX_PLANE_6),
    NAMED(Plane, DRV_PMX_PLANE_7),
    NAMED(Plane, DRV_PMX_PLANE_8),
    NAMED(Output, PMX_OUTPUT_CCIR),
    NAMED(Output, PMX_OUTPUT_HDMI),
    NAMED(Output, PMX_OUTPUT_CAV),
    NAMED(Output, PMX_OUTPUT_CVBS),
    NAMED(Output, PMX_OUTPUT_NUM),
    NAMED(ExtChipUsage, DRV_NON_EXT_CHIP),
    NAMED(ExtChipUsage, DRV_EXT_SCL_EXT_TX),
    NAMED(ExtChipUsage, DRV_EXT_SCL_INT_TX),
    NAMED(ExtChipUsage, DRV_RX_BYPASS_TX),
    NAMED(TvType, PMX_TV_TYPE_NTSC),
    NAMED(TvType, PMX_TV_TYPE_PAL),
    NAMED(ComponentType, PMX_COMP_TYPE_VDP),
    NAMED(ComponentType, PMX_COMP_TYPE_PMX),
    NAMED(ComponentType, PMX_COMP_TYPE_OSD),
    NAMED(InterfaceId, IID_IVdp),
    NAMED(InterfaceId, IID_IPMX),
    NAMED(SemaType, X_SEMA_TYPE_BINARY),
    NAMED(SemaType, X_SEMA_TYPE_COUNTING),
    NAMED(SemaType, X_SEMA_TYPE_MUTEX),
    NAMED(SemaOption, X_SEMA_OPTION_WAIT),
    NAMED(SemaOption, X_SEMA_OPTION_NOWAIT),
    NAMED(TimerFlag, X_TIMER_FLAG_ONCE),
    NAMED(TimerFlag, X_TIMER_FLAG_REPEAT),
    NAMED(VdpEnable, VDP_DISABLED),
    NAMED(VdpEnable, VDP_HIDDEN),
    NAMED(VdpEnable, VDP_ENABLED),
    NAMED(TveAspect, ASPECT_RATIO_4_3),
    NAMED(TveAspect, ASPECT_RATIO_16_9_FULL_FORMAT),
    NAMED(Aspect, ASP_UNKNOW),
    NAMED(Aspect, ASP_1_1),
    NAMED(Aspect, ASP_4_3),
    NAMED(Aspect, ASP_16_9),
    NAMED(Aspect, ASP_221_1),
    NAMED(Aspect, ASP_4_3_LB),
    NAMED(Aspect, ASP_16_9_NORMAL),
    NAMED(Aspect, ASP_UNDEFINED),
    NAMED(Aspect, ASP_16_9_PAN_SCAN),
    NAMED(Aspect, ASP_4_3_FULL),
    NAMED(HdmiColorSpace, HDMI_RGB),
    NAMED(HdmiColorSpace, HDMI_RGB_FULL),
    NAMED(HdmiColorSpace, HDMI_YCBCR_444),
    NAMED(HdmiColorSpace, HDMI_YCBCR_422),
    NAMED(HdmiColorSpace, HDMI_XV_YCC),
    NAMED(HdmiColorSpace, HDMI_YCBCR_444_FULL),
    NAMED(HdmiColorSpace, HDMI_YCBCR_422_FULL),
    NAMED(HdmiPictureAspect, HDMI_PICTURE_4_3),
    NAMED(HdmiPictureAspect, HDMI_PICTURE_16_9),
    NAMED(HdmiAfd, HDMI_AS_PICTURE_AR),
    NAMED(AvdCommand, PMX_CHG_HDMI_COLOR_SPACE),
    NAMED(AvdCommand, PMX_CHG_HDMI_VIDEO_ASPECT_RATIO),
    NAMED(AvdCommand, PMX_SET_UI_TV_SYSTEM),
    NAMED(AvdCommand, PMX_SET_HDMI_BRIGHTNESS),
    NAMED(AvdCommand, PMX_SET_HDMI_CONTRAST),
    NAMED(AvdCommand, PMX_SET_HDMI_HUE),
    NAMED(AvdCommand, PMX_SET_HDMI_SATURATION),
    NAMED(AvdCommand, PMX_CHG_DEEP_COLOR_BIT),
    NAMED(AvdCommand, PMX_SET_VIDEO_PLL),
    NAMED(AvdCommand, PMX_SET_HDMI_RES_CHG),
    NAMED(AvdCommand, PMX_CHG_UI_RES_AUTO),
    NAMED(AvdCommand, PMX_SET_HDMI_SHARPNESS),
    NAMED(AvdCommand, PMX_SET_CCIR_RES_CHG),
    NAMED(AvdCommand, PMX_SET_EXT_SHARPNESS),
    NAMED(AvdCommand, PMX_SET_EXT_BRIGHTNESS),
    NAMED(AvdCommand, PMX_SET_EXT_CONTRAST),
    NAMED(AvdCommand, PMX_SET_EXT_SATURATION),
    NAMED(AvdCommand, PMX_SET_EXT_COLOR_SPACE),
    NAMED(AvdCommand, PMX_SET_EXT_Y_C_DELAY),
    NAMED(AvdCommand, PMX_SET_EXT_CUE_CORRECT),
    NAMED(AvdCommand, PMX_SET_EXT_BORDER_LEVEL),
    NAMED(AvdCommand, PMX_SET_EXT_DEINTERLACE_MODE),
    NAMED(AvdCommand, PMX_SET_EXT_NOISE_REDUCTION),
    NAMED(AvdCommand, PMX_SET_EXT_EDGE_ENHANCEMENT),
    NAMED(AvdCommand, PMX_SET_EXT_DETAIL_ENHANCEMENT),
    NAMED(AvdCommand, PMX_SET_EXT_ZOOM_IMAGE),
    NAMED(AvdCommand, PMX_SET_EXT_GAMMA),
    NAMED(AvdCommand, PMX_SET_EXT_DEEP_COLOR),
    NAMED(AvdQuery, PMX_GET_VALID_RES_AND_VFREQ),
    NAMED(DigitalFormat, PLA_MXR_DIGITAL_OUTPUT_FMT_YBR),
    NAMED(DigitalFormat, PLA_MXR_DIGITAL_OUTPUT_FMT_RGB),
    NAMED(DigitalFormat, PLA_MXR_DIGITAL_OUTPUT_FMT_XVYCC),
    NAMED(DigitalFormat, PLA_MXR_DIGITAL_OUTPUT_FMT_YBR422),
    NAMED(DigitalFormat, PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB),
    NAMED(ExtChipSetting, PLA_MXR_EXT_SHARPNESS),
    NAMED(ExtChipSetting, PLA_MXR_EXT_BRIGHTNESS),
    NAMED(ExtChipSetting, PLA_MXR_EXT_CONTRAST),
    NAMED(ExtChipSetting, PLA_MXR_EXT_SATURATION),
    NAMED(ExtChipSetting, PLA_MXR_EXT_COLOR_SPACE),
    NAMED(ExtChipSetting, PLA_MXR_EXT_Y_C_DELAY),
    NAMED(ExtChipSetting, PLA_MXR_EXT_CUE_CORRECT),
    NAMED(ExtChipSetting, PLA_MXR_EXT_BORDER_LEVEL),
    NAMED(ExtChipSetting, PLA_MXR_EXT_DEINTERLACE_MODE),
    NAMED(ExtChipSetting, PLA_MXR_EXT_NOISE_REDUCTION),
    NAMED(ExtChipSetting, PLA_MXR_EXT_EDGE_ENHANCEMENT),
    NAMED(ExtChipSetting, PLA_MXR_EXT_DETAIL_ENHANCEMENT),
    NAMED(ExtChipSetting, PLA_MXR_EXT_ZOOM_IMAGE),
    NAMED(ExtChipSetting, PLA_MXR_EXT_GAMMA),
    NAMED(ExtChipSetting, PLA_MXR_EXT_DEEP_COLOR),
    NAMED(ClosedCaption, PLA_MXR_CLOSED_CAPTION_OFF),
    NAMED(ClosedCaption, PLA_MXR_CLOSED_CAPTION_ON),
    NAMED(None, TRUE),
    NAMED(None, FALSE),
    NAMED(None, OSR_OK),
    NAMED(None, TVE_1),
    NAMED(None, TVE_2),
    NAMED(None, TVE_SET_OK),
    NAMED(None, PMX_SET_OK),
};

#undef NAMED

} // namespace

std::string_view name_of(Family family, std::int64_t number)
{
    if (family == Family::None)
        return {};
    for (const Row& row : rows)
    {
        if (row.family == family && row.number == number)
            return row.name;
    }
    return {};
}

std::optional<std::int64_t> number_of(std::string_view name)
{
    for (const Row& row : rows)
    {
        if (row.name == name)
            return row.number;
    }
    return std::nullopt;
}

const std::vector<std::string_view>& all()
{
    static const std::vector<std::string_view> names = [] {
        std::vector<std::string_view> collected;
        for (const Row& row : rows)
            collected.push_back(row.name);
        return collected;
    }();
    return names;
}

} // namespace board::names
