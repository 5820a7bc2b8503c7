// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/names.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <set>

#include "drv_if_pmx.h"

namespace
{

using board::names::Family;

// That the headers are read rightly is for tests/headers; here, what becomes of it.
TEST(Names, NameOf_ANumberOfAFamily)
{
    using board::names::name_of;
    EXPECT_EQ("RES_480I", name_of(Family::ResolutionMode, 0));
    EXPECT_EQ("RES_1080P23_976HZ", name_of(Family::ResolutionMode, 19));
    EXPECT_EQ("RES_AUTO", name_of(Family::ResolutionMode, RES_AUTO));
    EXPECT_EQ("", name_of(Family::ResolutionMode, RES_AUTO + 1));
    EXPECT_EQ("", name_of(Family::ResolutionMode, -1));
    EXPECT_EQ("", name_of(Family::ResolutionMode, 0x100000000));
    EXPECT_EQ("PMX_TV_TYPE_PAL", name_of(Family::TvType, 3));
    EXPECT_EQ("", name_of(Family::TvType, 1));
    EXPECT_EQ("PMX_COMP_TYPE_PMX", name_of(Family::ComponentType, 66));
    EXPECT_EQ("IID_IPMX", name_of(Family::InterfaceId, 9));
    EXPECT_EQ("PMX_OUTPUT_HDMI", name_of(Family::Output, 1));
    EXPECT_EQ("PMX_SET_EXT_DEEP_COLOR", name_of(Family::AvdCommand, 31));
    EXPECT_EQ("", name_of(Family::AvdCommand, 3));
    EXPECT_EQ("", name_of(Family::None, 1)) << "TRUE is understood, and never shown";
}

TEST(Names, NumberOf_AName)
{
    using board::names::number_of;
    EXPECT_EQ(RES_2160P_4096, number_of("RES_2160P_4096"));
    EXPECT_EQ(0xB0, number_of("PMX_COMP_TYPE_OSD"));
    EXPECT_EQ(8, number_of("HDMI_AS_PICTURE_AR"));
    EXPECT_EQ(14, number_of("PLA_MXR_EXT_DEEP_COLOR"));
    EXPECT_EQ(1, number_of("TRUE"));
    EXPECT_EQ(0, number_of("FALSE"));
    EXPECT_EQ(0, number_of("OSR_OK"));
    EXPECT_EQ(1, number_of("TVE_2"));
    EXPECT_EQ(1, number_of("TVE_SET_OK"));
    EXPECT_EQ(1, number_of("PMX_SET_OK"));
    EXPECT_EQ(0x71000000, number_of("PMX_PORT_DONE"));
    EXPECT_EQ(17, number_of("VDP_CMD_ORDER_CHANGES"));
    EXPECT_EQ(std::nullopt, number_of("RES_480p"));
    EXPECT_EQ(std::nullopt, number_of(""));
}

TEST(Names, Families_AllButNone_HaveNamesAndATitle)
{
    std::set<Family> seen;
    for (const auto& [family, title] : board::names::families())
    {
        const auto has_name = [family = family](std::string_view name) {
            return board::names::name_of(family, *board::names::number_of(name)) == name;
        };
        EXPECT_TRUE(std::any_of(board::names::all().begin(), board::names::all().end(), has_name)) << title;
        EXPECT_FALSE(title.empty());
        EXPECT_NE(Family::None, family);
        EXPECT_TRUE(seen.insert(family).second) << title;
    }
    EXPECT_EQ(static_cast<std::size_t>(Family::ClosedCaption), seen.size());
}

TEST(Names, All_HasEachNameOnce)
{
    std::set<std::string_view> names(board::names::all().begin(), board::names::all().end());
    EXPECT_EQ(names.size(), board::names::all().size());
    for (const std::string_view name : board::names::all())
        EXPECT_TRUE(board::names::number_of(name)) << name;
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
    EXPECT_EQ(Family::Plane, family_of("pi4VdpGetPlanePosition", "result"));
    EXPECT_EQ(Family::GfxColorMode, family_of("pi4OsdEnabled", "eSrcColorSpace"));
    EXPECT_EQ(Family::SemaOption, family_of("x_sema_lock", "eOption"));
    EXPECT_EQ(Family::CcirMode, family_of("CCIR_DRV_INFO_T", "eDgiMode"));
    EXPECT_EQ(Family::Aspect, family_of("PMX_CONF_T", "u4AspNext"));
    EXPECT_EQ(Family::None, family_of("", "ucMode"));
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
