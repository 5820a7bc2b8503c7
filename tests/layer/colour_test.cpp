// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The two colour converters: the mixer's and the scaler's. */
#include "pmx_hal.h"
#include "tests/layer/one_mode.h"
#include "tests/support/layer_fixture.h"

using Colour = LayerTest;

namespace
{

constexpr std::uint32_t colour_spaces[] = { DRV_PMX_CS_YCBCR_601, DRV_PMX_CS_YCBCR_709, DRV_PMX_CS_RGB, 3, 0xFFFFFFFF };

void colour_setup(std::uint32_t colour_space, unsigned mode)
{
    PMX_ColorSpaceSetup(static_cast<DRV_PMX_COLOR_SPACE_T>(colour_space), static_cast<UCHAR>(mode));
}

board::Value converters()
{
    return *board::state().find("mixer.converters");
}

} // namespace

TEST_F(Colour, ColorSpaceSetup_1080P60MixedIn709_OnlyTheScalerConverts)
{
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, RES_1080P60HZ);
    EXPECT_TRACE(R"(
        LOG9 "Mode(12), eMixerOutCS(1)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 0, 0)
        LOG9 "CC_A disable\n"
        PMX_HalSetScaler709601(0, 1, 1)
        LOG8 "Scaler CC enable, 709->601\n"
    )");
}

TEST_F(Colour, ColorSpaceSetup_1080P60MixedIn601_OnlyTheMainPathConverts)
{
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_601, RES_1080P60HZ);
    EXPECT_TRACE(R"(
        LOG9 "Mode(12), eMixerOutCS(0)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 0)
        LOG9 "CC_A enable, 601->709\n"
        PMX_HalSetScaler709601(0, 0, 0)
        LOG8 "Scaler CC disable\n"
    )");
}

TEST_F(Colour, ColorSpaceSetup_480IMixedIn601_NothingConverts)
{
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_601, RES_480I);
    EXPECT_TRACE(R"(
        LOG9 "Mode(0), eMixerOutCS(0)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 0, 0)
        LOG9 "CC_A disable\n"
        PMX_HalSetScaler709601(0, 0, 0)
        LOG8 "Scaler CC disable, don't care\n"
    )");
}

TEST_F(Colour, ColorSpaceSetup_480IMixedIn709_OnlyTheMainPathConverts)
{
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, RES_480I);
    EXPECT_TRACE(R"(
        LOG9 "Mode(0), eMixerOutCS(1)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 1)
        LOG9 "CC_A enable, 709->601\n"
        PMX_HalSetScaler709601(0, 0, 0)
        LOG8 "Scaler CC disable, don't care\n"
    )");
}

TEST_F(Colour, ColorSpaceSetup_2D576I_OnlySelectsConverters)
{
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, RES_2D_576I50HZ);
    EXPECT_TRACE(R"(
        LOG9 "Mode(38), eMixerOutCS(1)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
    )");
}

TEST_F(Colour, ColorSpaceSetup_2160P_OnlySelectsConverters)
{
    for (const std::uint32_t colour_space : colour_spaces)
    {
        colour_setup(colour_space, RES_2160P);
        EXPECT_TRACE("LOG9 \"Mode(" + std::to_string(RES_2160P) + "), eMixerOutCS(" +
                     std::to_string(static_cast<std::int32_t>(colour_space)) +
                     ")\\n\"\n"
                     "PMX_HalSelectVdoutCconv(0, 1)\n"
                     "PMX_HalSelectScalerCconv(0, 0)");
    }
}

TEST_F(Colour, ColorSpaceSetup_PanelCountsAsStandardDefinition)
{
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, RES_PANEL_AUO_B089AW01);
    EXPECT_CALLS(R"(
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 1)
        PMX_HalSetScaler709601(0, 0, 0)
    )");
}

TEST_F(Colour, ColorSpaceSetup_ModeWithoutASetting_ConvertersKeepTheirs)
{
    for (const unsigned mode : { RES_480I, RES_1080P60HZ })
    {
        PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, static_cast<UCHAR>(mode));
        const board::Value before = converters();
        for (unsigned without = 0; without < 256; ++without)
        {
            if (mode_facts::facts_of(without).colours != mode_facts::Colours::None)
                continue;
            PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_601, static_cast<UCHAR>(without));
            EXPECT_EQ(before.to_text(), converters().to_text()) << without;
        }
    }
}

TEST_F(Colour, ColorSpaceSetup_Rgb_ReportedAndConvertersKeepTheirs)
{
    for (const unsigned mode : { RES_576P, RES_720P50HZ })
    {
        PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, static_cast<UCHAR>(mode));
        const board::Value before = converters();
        board::trace::clear();
        PMX_ColorSpaceSetup(DRV_PMX_CS_RGB, static_cast<UCHAR>(mode));
        EXPECT_TRACE("LOG9 \"Mode(" + std::to_string(mode) + R"(), eMixerOutCS(2)\n"
            PMX_HalSelectVdoutCconv(0, 1)
            PMX_HalSelectScalerCconv(0, 0)
            LOG5 "Invalid Color Space Id\n"
            Assert("0", "src/driver/pmx/pmx_colour.cpp")
        )");
        EXPECT_EQ(before.to_text(), converters().to_text());
    }
    expect_asserts(2);
}

TEST_F(Colour, ColorSpaceSetup_LowBitsOfAKnownColourSpace_IsReportedAsGiven)
{
    colour_setup(0x10001, RES_576P);
    EXPECT_TRACE(R"(
        LOG9 "Mode(3), eMixerOutCS(65537)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        LOG5 "Invalid Color Space Id\n"
        Assert("0", "src/driver/pmx/pmx_colour.cpp")
    )");
    expect_asserts(1);
}

TEST_F(Colour, ColorSpaceSetup_SelectorsAreProgrammedAnewEachTime)
{
    PMX_HalSelectVdoutCconv(0, 0);
    PMX_HalSelectScalerCconv(0, 1);
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, RES_2160P);
    const board::Value now = converters();
    EXPECT_EQ("1", now.find("video_out_select")->to_text());
    EXPECT_EQ("0", now.find("scaler_select")->to_text());
}

TEST_F(Colour, ColorSpaceSetup_SameInputsTwice_SameCallsTwice)
{
    for (const unsigned mode : { RES_480I, RES_1080P60HZ, RES_2160P })
    {
        for (const std::uint32_t colour_space : { DRV_PMX_CS_YCBCR_601, DRV_PMX_CS_YCBCR_709 })
        {
            const std::string once = one_mode::colour_setup(mode, colour_space);
            colour_setup(colour_space, mode);
            colour_setup(colour_space, mode);
            EXPECT_TRACE(once + once);
        }
    }
}

TEST_F(Colour, ColorSpaceSetup_EveryModeNumberInEveryColourSpace)
{
    started();
    const RecordSnapshot before;
    unsigned refused = 0;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        for (const std::uint32_t colour_space : colour_spaces)
        {
            SCOPED_TRACE(std::to_string(mode) + " in " + std::to_string(colour_space));
            colour_setup(colour_space, mode);
            EXPECT_TRACE(one_mode::colour_setup(mode, colour_space));
        }
        const bool handled = mode_facts::facts_of(mode).colours != mode_facts::Colours::None;
        refused += handled ? 3 : 0;
    }
    expect_asserts(refused);
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Colour, ColorSpaceSetup_TakesItsArgumentsNotTheRecords)
{
    started();
    set_record("ucMode", RES_480I);
    set_record("eMasterColorSpace", DRV_PMX_CS_YCBCR_601);
    const RecordSnapshot before;
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, RES_1080I50HZ);
    EXPECT_TRACE(one_mode::colour_setup(RES_1080I50HZ, 1));
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Colour, ColorSpaceSetup_BeforeStartUp_TheSame)
{
    const RecordSnapshot before;
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, RES_720P60HZ);
    EXPECT_TRACE(one_mode::colour_setup(RES_720P60HZ, 1));
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Colour, DecideMasterColorSpace_OtherMixerId_ConvertersOfMixer0)
{
    started();
    set_record("arPortInfo[0].fgEnabled", 1);
    set_record("arPortInfo[0].eSrcColorSpace", DRV_PMX_CS_YCBCR_601);
    EXPECT_EQ(1u, PMX_DecideMasterColorSpace(7));
    EXPECT_CALLS(R"(
        OSDSetColorSpace(0)
        x_sema_lock(*, X_SEMA_OPTION_WAIT)
        x_sema_unlock(*)
        vPostChgInputCS(DRV_PMX_CS_YCBCR_601)
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 0)
        PMX_HalSetScaler709601(0, 0, 0)
    )");
}
