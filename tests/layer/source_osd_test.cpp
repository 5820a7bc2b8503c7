// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** An OSD plane starts and stops. */
#include "tests/layer/source_events.h"

using source_events::announce;
using source_events::change;
using source_events::log8;

class SourceOsd : public SourceTest
{
protected:
    static void master(int colour_space) { set_record("eMasterColorSpace", colour_space); }
    static std::int64_t master() { return record("eMasterColorSpace"); }

    static UINT32 enable(unsigned plane, INT32 width, INT32 height, std::uint32_t mode = DRV_GFX_COLOR_MODE_YCBCR)
    {
        return PMX_OsdEnabled(0, static_cast<UCHAR>(plane), width, height, static_cast<DRV_GFX_COLOR_MODE_T>(mode));
    }
};

namespace
{

/** The port of an OSD plane. */
std::string osd_port(unsigned plane)
{
    return "arPortInfo[" + std::to_string(plane + 2) + "].";
}

std::string enabled(unsigned plane, int colour_space)
{
    const int number = static_cast<int>(plane);
    return log8("OSD_%d Enabled", number) + log8(colour_space == 1 ? "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_709"
                                                                   : "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_601",
                                                 number);
}

std::string enabled_in_rgb(unsigned plane)
{
    const int number = static_cast<int>(plane);
    return log8("OSD_%d Enabled", number) + log8("OSD_%d's Src Color Space = DRV_PMX_CS_RGB", number);
}

std::string decided_by_graphics(int colour_space)
{
    return log8("[PMX] Gfx enabled and Color Space is %d.", colour_space);
}

} // namespace

TEST_F(SourceOsd, OsdEnabled_YCbCrOfAnotherColourSpace_TakesTheMasterAtOnceWithoutItsMessage)
{
    connect(main_video);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_OsdEnabled(0, 1, 720, 576, DRV_GFX_COLOR_MODE_YCBCR));
    EXPECT_TRACE(R"(
        LOG8 "OSD_1 Enabled\n"
        LOG8 "OSD_1's Src Color Space = DRV_PMX_CS_YCBCR_601\n"
        OSDSetColorSpace(DRV_PMX_CS_YCBCR_601)
    )" + source_events::inform(0, { main_video }) +
                 R"(vPostChgInputCS(DRV_PMX_CS_YCBCR_601)
        LOG9 "Mode(12), eMixerOutCS(0)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 0)
        LOG9 "CC_A enable, 601->709\n"
        PMX_HalSetScaler709601(0, 0, 0)
        LOG8 "Scaler CC disable\n"
    )");
    EXPECT_RECORD_CHANGED(before, "arPortInfo[3].fgEnabled", "arPortInfo[3].eInputColorMode",
                          "arPortInfo[3].eSrcColorSpace", "eMasterColorSpace");
    EXPECT_EQ(1, record("arPortInfo[3].fgEnabled"));
    EXPECT_EQ(DRV_GFX_COLOR_MODE_YCBCR, record("arPortInfo[3].eInputColorMode"));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("arPortInfo[3].eSrcColorSpace"));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
}

TEST_F(SourceOsd, OsdEnabled_YCbCrOfTheMasterColourSpace_AnnouncesNothing)
{
    connect(main_video);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_OsdEnabled(0, 0, 1920, 1080, DRV_GFX_COLOR_MODE_YCBCR));
    EXPECT_TRACE(R"(
        LOG8 "OSD_0 Enabled\n"
        LOG8 "OSD_0's Src Color Space = DRV_PMX_CS_YCBCR_709\n"
    )");
    EXPECT_RECORD_CHANGED(before, "arPortInfo[2].fgEnabled", "arPortInfo[2].eInputColorMode");
}

TEST_F(SourceOsd, OsdEnabled_EachPlaneInEachColourSpaceFromEachMaster)
{
    for (unsigned plane = 0; plane < 6; ++plane)
    {
        for (const int was : { 0, 1, 2, 3, 0x100, 0x101 })
        {
            for (const int source : { 0, 1 })
            {
                SCOPED_TRACE(std::to_string(plane) + ", " + std::to_string(was) + " to " + std::to_string(source));
                master(was);
                EXPECT_EQ(1u, source == 1 ? enable(plane, 1280, 720) : enable(plane, 720, 480));
                EXPECT_TRACE(enabled(plane, source) + (was == source ? "" : announce(source)));
                EXPECT_EQ(source, master());
                EXPECT_EQ(source, record(osd_port(plane) + "eSrcColorSpace"));
            }
        }
    }
}

TEST_F(SourceOsd, OsdEnabled_PortAndMasterAreWrittenBeforeTheMessagesThatSayIt)
{
    std::vector<std::string> seen;
    board::at_every_call([&](const board::TraceEntry& entry) {
        if (entry.function == "PMX_IsLog" && seen.size() < 2)
            seen.push_back(std::to_string(record("arPortInfo[2].fgEnabled")) +
                           std::to_string(record("arPortInfo[2].eInputColorMode")) +
                           std::to_string(record("arPortInfo[2].eSrcColorSpace")) + std::to_string(master()));
    });
    EXPECT_EQ(1u, enable(0, 720, 480));
    board::at_every_call({});
    EXPECT_EQ((std::vector<std::string>{ "1111", "1000" }), seen);
}

TEST_F(SourceOsd, OsdEnabled_ConvertersAreSetForTheCurrentMode)
{
    for (const unsigned mode : { RES_480I, RES_576P, RES_720P50HZ, RES_2160P })
    {
        set_record("ucMode", mode);
        master(1);
        EXPECT_EQ(1u, enable(2, 720, 480));
        EXPECT_TRACE(enabled(2, 0) + announce(0, {}, mode));
    }
}

TEST_F(SourceOsd, OsdEnabled_Rgb_OnlySaysSo)
{
    connect(main_video);
    for (unsigned plane = 0; plane < 6; ++plane)
    {
        for (const int was : { 0, 1 })
        {
            master(was);
            set_record(osd_port(plane) + "fgEnabled", 0);
            const RecordSnapshot before;
            EXPECT_EQ(1u, enable(plane, was == 0 ? 1920 : 720, 480, DRV_GFX_COLOR_MODE_RGB));
            EXPECT_TRACE(enabled_in_rgb(plane));
            EXPECT_RECORD_CHANGED(before, osd_port(plane) + "fgEnabled");
            EXPECT_EQ(1, record(osd_port(plane) + "fgEnabled"));
        }
    }
}

TEST_F(SourceOsd, OsdEnabled_AnyOtherColourMode_CountsAsRgb)
{
    for (const std::uint32_t mode : { 2u, 255u, 256u, 0x10000u, 0x80000000u, 0xFFFFFFFFu })
    {
        set_record("arPortInfo[2].fgEnabled", 0);
        const RecordSnapshot before;
        EXPECT_EQ(1u, enable(0, 720, 480, mode));
        EXPECT_TRACE(enabled_in_rgb(0));
        EXPECT_RECORD_CHANGED(before, "arPortInfo[2].fgEnabled");
    }
}

TEST_F(SourceOsd, OsdEnabled_RgbOnAPortThatHeldYCbCr_KeepsCountingAsYCbCr)
{
    EXPECT_EQ(1u, enable(4, 720, 480));
    EXPECT_EQ(1u, PMX_OsdDisabled(0, 4));
    master(1);
    board::trace::clear();
    EXPECT_EQ(1u, enable(4, 1920, 1080, DRV_GFX_COLOR_MODE_RGB));
    EXPECT_TRACE(enabled_in_rgb(4));
    EXPECT_EQ(DRV_GFX_COLOR_MODE_YCBCR, record("arPortInfo[6].eInputColorMode"));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("arPortInfo[6].eSrcColorSpace"));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());
    EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
    EXPECT_TRACE(decided_by_graphics(0) + change(1, 0));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
}

TEST_F(SourceOsd, OsdEnabled_YCbCrAfterRgb_Counts)
{
    EXPECT_EQ(1u, enable(4, 720, 480, DRV_GFX_COLOR_MODE_RGB));
    EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());
    board::trace::clear();
    EXPECT_EQ(1u, enable(4, 720, 480));
    EXPECT_TRACE(enabled(4, 0) + announce(0));
    EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
    EXPECT_TRACE(decided_by_graphics(0));
}

TEST_F(SourceOsd, OsdEnabled_TakesTheMasterFromAHigherPort)
{
    EXPECT_EQ(1u, enable(5, 1920, 1080));
    board::trace::clear();
    EXPECT_EQ(1u, enable(0, 720, 480));
    EXPECT_TRACE(enabled(0, 0) + announce(0));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
    // The next decision gives it back: among graphics the highest port wins.
    EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
    EXPECT_TRACE(decided_by_graphics(0) + decided_by_graphics(1) + change(0, 1));
}

TEST_F(SourceOsd, OsdEnabled_EverySizeAtTheBorder)
{
    for (const INT32 width : source_events::widths)
    {
        for (const INT32 height : source_events::heights)
        {
            const int source = source_events::colour_space_of(width, height);
            master(source);
            set_record("arPortInfo[5].eSrcColorSpace", 1 - source);
            EXPECT_EQ(1u, enable(3, width, height));
            EXPECT_TRACE(enabled(3, source)) << width << " x " << height;
            EXPECT_EQ(source, record("arPortInfo[5].eSrcColorSpace")) << width << " x " << height;
            EXPECT_EQ(source, master());
        }
    }
}

TEST_F(SourceOsd, OsdEnabled_NamedSizes)
{
    const auto master_of = [](INT32 width, INT32 height) {
        EXPECT_EQ(1u, enable(0, width, height));
        return master();
    };
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master_of(721, 480));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master_of(720, 576));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master_of(720, 577));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master_of(0x10000, 480)); // all 32 bits count
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master_of(720, 0x10000));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master_of(-1920, -1080));
}

TEST_F(SourceOsd, OsdEnabled_SizeAndLumaKeyOfThePortStay)
{
    set_record("arPortInfo[2].u4SrcWidth", 11);
    set_record("arPortInfo[2].u4SrcHeight", 12);
    set_record("arPortInfo[2].ucLumaKey", 13);
    EXPECT_EQ(1u, enable(0, 1920, 1080));
    EXPECT_EQ(11, record("arPortInfo[2].u4SrcWidth"));
    EXPECT_EQ(12, record("arPortInfo[2].u4SrcHeight"));
    EXPECT_EQ(13, record("arPortInfo[2].ucLumaKey"));
}

TEST_F(SourceOsd, OsdEnabledAndDisabled_ConnectedOrNot_TheSame)
{
    for (const bool connected : { false, true })
    {
        if (connected)
        {
            EXPECT_EQ(0x71000000u, i4Pmx_Connect(66, 0, PMX_COMP_TYPE_OSD, 3));
        }
        master(1);
        board::trace::clear();
        EXPECT_EQ(1u, enable(3, 720, 480));
        EXPECT_TRACE(enabled(3, 0) + announce(0));
        EXPECT_EQ(1u, PMX_OsdDisabled(0, 3));
        EXPECT_TRACE(log8("OSD_%d Disabled", 3));
        EXPECT_EQ(connected, record("arPortInfo[5].fgConnected") != 0);
    }
}

TEST_F(SourceOsd, OsdEnabledAndDisabled_AnyMixerId_ActOnMixer0)
{
    mix_second_video(true);
    set_record("arPortInfo[1].fgEnabled", 1);
    set_record("arPortInfo[1].ucLumaKey", 1);
    for (const UCHAR mixer : { 0, 1, 7, 255 })
    {
        EXPECT_EQ(1u, PMX_OsdEnabled(mixer, 0, 720, 480, DRV_GFX_COLOR_MODE_YCBCR));
        EXPECT_TRACE(enabled(0, 0) + announce(0));
        EXPECT_EQ(1, record("arPortInfo[2].fgEnabled"));
        // The decision is made for mixer 0: it asks its hardware.
        EXPECT_EQ(1u, PMX_OsdDisabled(mixer, 0));
        EXPECT_TRACE(log8("OSD_%d Disabled", 0) + "fgPmxHalMixPlane(0, 1) = 1\n" +
                     log8("[PMX] VDP_COMP_2 enabled and Color Space is %d.", 1) + change(0, 1));
        EXPECT_EQ(0, record("arPortInfo[2].fgEnabled"));
    }
}

TEST_F(SourceOsd, OsdDisabled_ReturnsTheMasterToTheVideo)
{
    connect(main_video);
    EXPECT_EQ(1u, enable(0, 720, 480));
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 1920, 1080, 0));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_OsdDisabled(0, 0));
    EXPECT_TRACE(R"(
        LOG8 "OSD_0 Disabled\n"
        LOG8 "[PMX] VDP_COMP_1 enabled and Color Space is 1.\n"
        LOG8 "[PMX] Master Color Space change from 0 to 1.\n"
    )" + announce(1, { main_video }));
    EXPECT_RECORD_CHANGED(before, "arPortInfo[2].fgEnabled", "eMasterColorSpace");
}

TEST_F(SourceOsd, OsdDisabled_NothingElseEnabled_MasterStays)
{
    for (unsigned plane = 0; plane < 6; ++plane)
    {
        EXPECT_EQ(1u, enable(plane, 720, 480));
        board::trace::clear();
        EXPECT_EQ(1u, PMX_OsdDisabled(0, static_cast<UCHAR>(plane)));
        EXPECT_TRACE(log8("OSD_%d Disabled", static_cast<int>(plane)));
        EXPECT_EQ(0, record(osd_port(plane) + "fgEnabled"));
        EXPECT_EQ(DRV_GFX_COLOR_MODE_YCBCR, record(osd_port(plane) + "eInputColorMode"));
        EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
    }
}

TEST_F(SourceOsd, OsdDisabled_LowerPlaneRemaining_TakesTheMaster)
{
    EXPECT_EQ(1u, enable(1, 720, 480));
    EXPECT_EQ(1u, enable(3, 1920, 1080));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_OsdDisabled(0, 3));
    EXPECT_TRACE(log8("OSD_%d Disabled", 3) + decided_by_graphics(0) + change(1, 0));
}
