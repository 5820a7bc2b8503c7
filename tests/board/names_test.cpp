#include "board/names.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <map>
#include <regex>
#include <set>
#include <sstream>

#include "board/trace.h"

namespace
{

using board::names::Family;

struct Expected
{
    Family family;
    std::int64_t first;
    std::vector<std::string> names; ///< of consecutive numbers; "" where there is none
};

const std::vector<Expected> expected = {
    { Family::ResolutionMode,
      0,
      { "RES_480I",
        "RES_576I",
        "RES_480P",
        "RES_576P",
        "RES_480P_1440",
        "RES_576P_1440",
        "RES_480P_2880",
        "RES_576P_2880",
        "RES_720P60HZ",
        "RES_720P50HZ",
        "RES_1080I60HZ",
        "RES_1080I50HZ",
        "RES_1080P60HZ",
        "RES_1080P50HZ",
        "RES_1080P30HZ",
        "RES_1080P25HZ",
        "RES_480I_2880",
        "RES_576I_2880",
        "RES_1080P24HZ",
        "RES_1080P23_976HZ",
        "RES_1080P29_97HZ",
        "RES_3D_1080P23HZ",
        "RES_3D_1080P24HZ",
        "RES_3D_720P60HZ",
        "RES_3D_720P50HZ",
        "RES_3D_720P30HZ",
        "RES_3D_720P25HZ",
        "RES_3D_576P50HZ",
        "RES_3D_480P60HZ",
        "RES_3D_1080I60HZ",
        "RES_3D_1080I50HZ",
        "RES_3D_1080I30HZ",
        "RES_3D_1080I25HZ",
        "RES_3D_576I25HZ",
        "RES_3D_480I30HZ",
        "RES_3D_576I50HZ",
        "RES_3D_480I60HZ",
        "RES_2D_480I60HZ",
        "RES_2D_576I50HZ",
        "RES_2D_640x480HZ",
        "RES_PANEL_AUO_B089AW01",
        "RES_3D_720P60HZ_TB",
        "RES_3D_720P50HZ_TB",
        "RES_3D_1080I60HZ_SBS_HALF",
        "RES_3D_1080I50HZ_SBS_HALF",
        "RES_3D_1080P23HZ_TB",
        "RES_3D_1080P24HZ_TB",
        "RES_4K2K23976HZ",
        "RES_4K2K24HZ",
        "RES_2160P",
        "RES_2160P_4096",
        "RES_MODE_NUM",
        "RES_AUTO" } },
    { Family::CcirMode, 0, { "CCIR_INVALID", "CCIR_601_MODE", "CCIR_656_MODE" } },
    { Family::CcirFormat,
      0,
      { "CCIR_NON_USED", "CCIR_YCMIX_8BIT", "CCIR_YCMIX_10BIT", "CCIR_YCMIX_12BIT", "CCIR_YC422_16BIT",
        "CCIR_YC422_20BIT", "CCIR_YC422_24BIT", "CCIR_YC444_24BIT", "CCIR_YC444_30BIT", "CCIR_YC444_36BIT" } },
    { Family::GfxColorMode, 0, { "DRV_GFX_COLOR_MODE_YCBCR", "DRV_GFX_COLOR_MODE_RGB" } },
    { Family::ColorSpace, 0, { "DRV_PMX_CS_YCBCR_601", "DRV_PMX_CS_YCBCR_709", "DRV_PMX_CS_RGB" } },
    { Family::Plane,
      0,
      { "DRV_PMX_PLANE_1", "DRV_PMX_PLANE_2", "DRV_PMX_PLANE_3", "DRV_PMX_PLANE_4", "DRV_PMX_PLANE_5",
        "DRV_PMX_PLANE_6", "DRV_PMX_PLANE_7", "DRV_PMX_PLANE_8" } },
    { Family::Output,
      0,
      { "PMX_OUTPUT_CCIR", "PMX_OUTPUT_HDMI", "PMX_OUTPUT_CAV", "PMX_OUTPUT_CVBS", "PMX_OUTPUT_NUM" } },
    { Family::ExtChipUsage, 0, { "DRV_NON_EXT_CHIP", "DRV_EXT_SCL_EXT_TX", "DRV_EXT_SCL_INT_TX", "DRV_RX_BYPASS_TX" } },
    { Family::TvType, 0, { "PMX_TV_TYPE_NTSC", "", "", "PMX_TV_TYPE_PAL" } },
    { Family::ComponentType, 65, { "PMX_COMP_TYPE_VDP", "PMX_COMP_TYPE_PMX" } },
    { Family::ComponentType, 176, { "PMX_COMP_TYPE_OSD" } },
    { Family::InterfaceId, 6, { "IID_IVdp", "", "", "IID_IPMX" } },
    { Family::SemaType, 0, { "X_SEMA_TYPE_BINARY", "X_SEMA_TYPE_COUNTING", "X_SEMA_TYPE_MUTEX" } },
    { Family::SemaOption, 1, { "X_SEMA_OPTION_WAIT", "X_SEMA_OPTION_NOWAIT" } },
    { Family::TimerFlag, 1, { "X_TIMER_FLAG_ONCE", "X_TIMER_FLAG_REPEAT" } },
    { Family::VdpEnable, 0, { "VDP_DISABLED", "VDP_HIDDEN", "VDP_ENABLED" } },
    { Family::TveAspect, 0, { "ASPECT_RATIO_4_3", "ASPECT_RATIO_16_9_FULL_FORMAT" } },
    { Family::Aspect,
      0,
      { "ASP_UNKNOW", "ASP_1_1", "ASP_4_3", "ASP_16_9", "ASP_221_1", "ASP_4_3_LB", "ASP_16_9_NORMAL", "ASP_UNDEFINED",
        "ASP_16_9_PAN_SCAN", "ASP_4_3_FULL" } },
    { Family::HdmiColorSpace,
      0,
      { "HDMI_RGB", "HDMI_RGB_FULL", "HDMI_YCBCR_444", "HDMI_YCBCR_422", "HDMI_XV_YCC", "HDMI_YCBCR_444_FULL",
        "HDMI_YCBCR_422_FULL" } },
    { Family::HdmiPictureAspect, 1, { "HDMI_PICTURE_4_3", "HDMI_PICTURE_16_9" } },
    { Family::HdmiAfd, 8, { "HDMI_AS_PICTURE_AR" } },
    { Family::AvdCommand,
      0,
      { "PMX_CHG_HDMI_COLOR_SPACE",
        "PMX_CHG_HDMI_VIDEO_ASPECT_RATIO",
        "PMX_SET_UI_TV_SYSTEM",
        "",
        "PMX_SET_HDMI_BRIGHTNESS",
        "PMX_SET_HDMI_CONTRAST",
        "PMX_SET_HDMI_HUE",
        "PMX_SET_HDMI_SATURATION",
        "PMX_CHG_DEEP_COLOR_BIT",
        "PMX_SET_VIDEO_PLL",
        "PMX_SET_HDMI_RES_CHG",
        "",
        "",
        "PMX_CHG_UI_RES_AUTO",
        "",
        "PMX_SET_HDMI_SHARPNESS",
        "PMX_SET_CCIR_RES_CHG",
        "PMX_SET_EXT_SHARPNESS",
        "PMX_SET_EXT_BRIGHTNESS",
        "PMX_SET_EXT_CONTRAST",
        "PMX_SET_EXT_SATURATION",
        "PMX_SET_EXT_COLOR_SPACE",
        "PMX_SET_EXT_Y_C_DELAY",
        "PMX_SET_EXT_CUE_CORRECT",
        "PMX_SET_EXT_BORDER_LEVEL",
        "PMX_SET_EXT_DEINTERLACE_MODE",
        "PMX_SET_EXT_NOISE_REDUCTION",
        "PMX_SET_EXT_EDGE_ENHANCEMENT",
        "PMX_SET_EXT_DETAIL_ENHANCEMENT",
        "PMX_SET_EXT_ZOOM_IMAGE",
        "PMX_SET_EXT_GAMMA",
        "PMX_SET_EXT_DEEP_COLOR" } },
    { Family::AvdQuery, 1, { "PMX_GET_VALID_RES_AND_VFREQ" } },
    { Family::DigitalFormat,
      0,
      { "PLA_MXR_DIGITAL_OUTPUT_FMT_YBR", "PLA_MXR_DIGITAL_OUTPUT_FMT_RGB", "PLA_MXR_DIGITAL_OUTPUT_FMT_XVYCC",
        "PLA_MXR_DIGITAL_OUTPUT_FMT_YBR422", "PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB" } },
    { Family::ExtChipSetting,
      0,
      { "PLA_MXR_EXT_SHARPNESS", "PLA_MXR_EXT_BRIGHTNESS", "PLA_MXR_EXT_CONTRAST", "PLA_MXR_EXT_SATURATION",
        "PLA_MXR_EXT_COLOR_SPACE", "PLA_MXR_EXT_Y_C_DELAY", "PLA_MXR_EXT_CUE_CORRECT", "PLA_MXR_EXT_BORDER_LEVEL",
        "PLA_MXR_EXT_DEINTERLACE_MODE", "PLA_MXR_EXT_NOISE_REDUCTION", "PLA_MXR_EXT_EDGE_ENHANCEMENT",
        "PLA_MXR_EXT_DETAIL_ENHANCEMENT", "PLA_MXR_EXT_ZOOM_IMAGE", "PLA_MXR_EXT_GAMMA", "PLA_MXR_EXT_DEEP_COLOR" } },
    { Family::ClosedCaption, 0, { "PLA_MXR_CLOSED_CAPTION_OFF", "PLA_MXR_CLOSED_CAPTION_ON" } },
};

constexpr int families = static_cast<int>(Family::ClosedCaption) + 1;

TEST(Names, NameOf_EveryNumberOfEveryFamily)
{
    std::map<std::pair<int, std::int64_t>, std::string> named;
    for (const Expected& row : expected)
    {
        for (std::size_t i = 0; i < row.names.size(); ++i)
            named[{ static_cast<int>(row.family), row.first + static_cast<std::int64_t>(i) }] = row.names[i];
    }
    for (int family = 0; family < families; ++family)
    {
        for (std::int64_t number = -2; number < 300; ++number)
            EXPECT_EQ((named[{ family, number }]), board::names::name_of(static_cast<Family>(family), number))
                << "family " << family << ", number " << number;
        EXPECT_EQ("", board::names::name_of(static_cast<Family>(family), 0x100000000)) << "family " << family;
    }
}

TEST(Names, NumberOf_EveryName)
{
    for (const Expected& row : expected)
    {
        for (std::size_t i = 0; i < row.names.size(); ++i)
        {
            if (row.names[i].empty())
                continue;
            EXPECT_EQ(row.first + static_cast<std::int64_t>(i), board::names::number_of(row.names[i])) << row.names[i];
        }
    }
    EXPECT_EQ(1, board::names::number_of("TRUE"));
    EXPECT_EQ(0, board::names::number_of("FALSE"));
    EXPECT_EQ(0, board::names::number_of("OSR_OK"));
    EXPECT_EQ(0, board::names::number_of("TVE_1"));
    EXPECT_EQ(1, board::names::number_of("TVE_2"));
    EXPECT_EQ(1, board::names::number_of("TVE_SET_OK"));
    EXPECT_EQ(1, board::names::number_of("PMX_SET_OK"));
    EXPECT_EQ(std::nullopt, board::names::number_of("RES_480p"));
    EXPECT_EQ(std::nullopt, board::names::number_of(""));
}

TEST(Names, All_HasEachNameOnce)
{
    std::set<std::string_view> names(board::names::all().begin(), board::names::all().end());
    EXPECT_EQ(names.size(), board::names::all().size());
    for (const std::string_view name : board::names::all())
        EXPECT_TRUE(board::names::number_of(name)) << name;
}

std::string without_comments(const std::string& text)
{
    static const std::regex comment(R"(/\*[^*]*\*+(?:[^/*][^*]*\*+)*/)");
    return std::regex_replace(text, comment, "");
}

std::vector<std::string> header_texts()
{
    std::vector<std::string> texts;
    const std::filesystem::path source = PMX_SOURCE_DIR "/src";
    for (const char* directory : { "system/inc", "driver/inc", "driver/private_inc" })
    {
        for (const auto& file : std::filesystem::directory_iterator(source / directory))
        {
            std::ostringstream text;
            text << std::ifstream(file.path()).rdbuf();
            texts.push_back(without_comments(text.str()));
        }
    }
    return texts;
}

TEST(Names, EveryEnumeratorOfTheHeaders_HasItsName)
{
    const std::regex enumeration(R"(DRV_ENUM(?:\(\w+\)|_UNNAMED)\s*\{([^}]*)\})");
    const std::regex enumerator(R"((\w+)\s*=\s*(\d+))");
    unsigned found = 0;
    for (const std::string& text : header_texts())
    {
        for (std::sregex_iterator body(text.begin(), text.end(), enumeration), end; body != end; ++body)
        {
            const std::string members = (*body)[1];
            for (std::sregex_iterator member(members.begin(), members.end(), enumerator); member != end; ++member)
            {
                EXPECT_EQ(std::stoll((*member)[2]), board::names::number_of((*member)[1].str())) << (*member)[1];
                ++found;
            }
        }
    }
    EXPECT_EQ(171u, found);
}

TEST(Names, FamilyOf_EveryEnumerationParameterOfTheHeaders)
{
    const std::map<std::string, Family> types = {
        { "X_SEMA_TYPE_T", Family::SemaType },
        { "X_SEMA_OPTION_T", Family::SemaOption },
        { "X_TIMER_FLAG_T", Family::TimerFlag },
        { "TVE_ASPECT_RATIO_T", Family::TveAspect },
        { "DRV_PMX_COLOR_SPACE_T", Family::ColorSpace },
        { "DRV_GFX_COLOR_MODE_T", Family::GfxColorMode },
        { "DRV_EXT_CHIP_USAGE_T", Family::ExtChipUsage },
        { "PLA_MXR_EXTERNAL_CHIP_SETTING_E", Family::ExtChipSetting },
        { "PLA_MXR_CLOSED_CAPTION_ON_OFF_T", Family::ClosedCaption },
        { "PMX_RESOLUTION_MODE_T", Family::ResolutionMode },
        { "CCIR_IN_OUT_MODE_T", Family::CcirMode },
        { "CCIR_IN_OUT_FORMAT_T", Family::CcirFormat },
    };
    const std::regex function(R"((\w+)\)?\s*\(([^()]*)\)[^();]*;)");
    const std::regex parameter(R"(\b(\w+) (\w+)\s*(?:,|$))");
    unsigned found = 0;
    for (const std::string& text : header_texts())
    {
        for (std::sregex_iterator call(text.begin(), text.end(), function), end; call != end; ++call)
        {
            const std::string parameters = (*call)[2];
            for (std::sregex_iterator one(parameters.begin(), parameters.end(), parameter); one != end; ++one)
            {
                const auto type = types.find((*one)[1]);
                if (type == types.end())
                    continue;
                EXPECT_EQ(type->second, board::names::family_of((*call)[1].str(), (*one)[2].str()))
                    << (*call)[1] << " " << (*one)[2];
                ++found;
            }
        }
    }
    EXPECT_LE(8u, found);
}

TEST(Names, FamilyOf_FunctionsAndRecords)
{
    using board::names::family_of;
    for (const char* owner : { "PMX_HalSetMode", "PMX_HalSetScalerMode", "PMX_HalSetActiveZone", "VDP_SetTvFormat",
                               "OSD_BASE_SetDisplayMode", "vPostChgRes", "PMX_CONF_T", "PMX_SetMode" })
        EXPECT_EQ(Family::ResolutionMode, family_of(owner, "ucMode")) << owner;
    EXPECT_EQ(Family::ResolutionMode, family_of("PMX_SET_HDMI_RES_PARAMETER_T", "ucFmtOutResolution"));
    EXPECT_EQ(Family::ExtChipUsage, family_of("PMX_SET_HDMI_RES_PARAMETER_T", "ucHdmiOutMode"));
    EXPECT_EQ(Family::ColorSpace, family_of("PMX_PORT_INFO_T", "eSrcColorSpace"));
    EXPECT_EQ(Family::GfxColorMode, family_of("i4PmxOsdEnabled", "eSrcColorSpace"));
    EXPECT_EQ(Family::ColorSpace, family_of("OSDSetColorSpace", "ucColorSpace"));
    EXPECT_EQ(Family::ResolutionMode, family_of("PMX_ColorSpaceSetup", "ucOutputMode"));
    EXPECT_EQ(Family::DigitalFormat, family_of("PMX_SetDigitalOutRgb", "ucRgb"));
    EXPECT_EQ(Family::TveAspect, family_of("TVE_SetAspectRatio", "eAspect"));
    EXPECT_EQ(Family::Plane, family_of("vPmxMixPlane", "ucPlane"));
    EXPECT_EQ(Family::AvdCommand, family_of("fgPmxDrvSetAvd", "u4Command"));
    EXPECT_EQ(Family::VdpEnable, family_of("VDP_GetHwEnable", "result"));
    EXPECT_EQ(Family::ComponentType, family_of("i4ImQueryInterface", "u2CompType"));
    EXPECT_EQ(Family::InterfaceId, family_of("i4ImQueryInterface", "u4IfId"));
    EXPECT_EQ(Family::None, family_of("VDP_VsyncSendCmd", "u4Cmd"));
    EXPECT_EQ(Family::None, family_of("PMX_HalSetMode", "ucPmxId"));
    EXPECT_EQ(Family::None, family_of("PMX_HalSetDigitalOut", "ucProprietaryMode"));
    EXPECT_EQ(Family::None, family_of("PMX_SET_HDMI_RES_PARAMETER_T", "ucCCIROutMode"));
    EXPECT_EQ(Family::None, family_of("", ""));
}

TEST(Names, Nearest_BestFirst)
{
    using board::names::nearest;
    using Found = std::vector<std::string>;
    EXPECT_EQ((Found{ "RES_480P", "RES_480I" }),
              nearest("RES_48P", { "RES_480I", "RES_480P", "RES_576P", "PMX_OUTPUT_CAV" }))
        << "what is much further off than the best only distracts";
    EXPECT_EQ((Found{ "RES_480P" }), nearest("res_480p", { "RES_1080P60HZ", "RES_480P" }));
    EXPECT_EQ((Found{ "PMX_GetMode" }), nearest("PMX_GteMode", { "PMX_GetMode", "PMX_Init" }));
    EXPECT_EQ((Found{ "a1", "a2" }), nearest("a", { "a2", "a1", "a1", "a3" }, 2));
    EXPECT_EQ((Found{ "RES_1080P50HZ", "RES_1080P60HZ" }),
              nearest("RES_1080P", { "RES_1080P60HZ", "RES_480P", "RES_1080P50HZ" }))
        << "whoever stops typing early means the rest too";
    EXPECT_EQ(Found{}, nearest("nothing like it", { "RES_480P" }));
    EXPECT_EQ(Found{}, nearest("x", {}));
    EXPECT_EQ(Found{}, nearest("", { "a", "RES_480P" }));
}

} // namespace
