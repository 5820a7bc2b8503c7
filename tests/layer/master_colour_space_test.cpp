// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** How the master colour space is chosen: rule by rule, and its announcement. */
#include "tests/layer/source_events.h"

using source_events::announce;
using source_events::change;
using source_events::log8;

class MasterColourSpace : public SourceTest
{
protected:
    static void master(std::int64_t colour_space) { set_record("eMasterColorSpace", colour_space); }
    static std::int64_t master() { return record("eMasterColorSpace"); }

    /** A port as a source event leaves it. */
    static void source(unsigned port, std::int64_t colour_space, DRV_GFX_COLOR_MODE_T mode = DRV_GFX_COLOR_MODE_YCBCR)
    {
        const std::string name = "arPortInfo[" + std::to_string(port) + "].";
        set_record(name + "fgEnabled", 1);
        set_record(name + "eSrcColorSpace", colour_space);
        set_record(name + "eInputColorMode", mode);
    }

    static void decide() { EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0)); }
};

namespace
{

std::string by_main(int colour_space)
{
    return log8("[PMX] VDP_COMP_1 enabled and Color Space is %d.", colour_space);
}

std::string by_second(int colour_space)
{
    return log8("[PMX] VDP_COMP_2 enabled and Color Space is %d.", colour_space);
}

std::string by_graphics(int colour_space)
{
    return log8("[PMX] Gfx enabled and Color Space is %d.", colour_space);
}

constexpr const char* asked_mixed = "fgPmxHalMixPlane(0, 1) = 1\n";
constexpr const char* asked_not_mixed = "fgPmxHalMixPlane(0, 1) = 0\n";

} // namespace

TEST_F(MasterColourSpace, DecideMasterColorSpace_NothingEnabled_StaysAsItIs)
{
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());
    for (const int was : { 0, 1, 2 })
    {
        master(was);
        const RecordSnapshot before;
        decide();
        EXPECT_NO_TRACE();
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_MainVideo)
{
    source(0, 0);
    const RecordSnapshot before;
    decide();
    EXPECT_TRACE(R"(
        LOG8 "[PMX] VDP_COMP_1 enabled and Color Space is 0.\n"
        LOG8 "[PMX] Master Color Space change from 1 to 0.\n"
        OSDSetColorSpace(DRV_PMX_CS_YCBCR_601)
    )" + source_events::inform(0, {}) +
                 R"(vPostChgInputCS(DRV_PMX_CS_YCBCR_601)
        LOG9 "Mode(12), eMixerOutCS(0)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 0)
        LOG9 "CC_A enable, 601->709\n"
        PMX_HalSetScaler709601(0, 0, 0)
        LOG8 "Scaler CC disable\n"
    )");
    EXPECT_RECORD_CHANGED(before, "eMasterColorSpace");
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
    decide();
    EXPECT_TRACE(by_main(0));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_SecondVideo_HardwareIsAskedLast)
{
    mix_second_video(true);
    decide();
    EXPECT_NO_TRACE(); // not enabled, no luma key

    set_record("arPortInfo[1].ucLumaKey", 9);
    decide();
    EXPECT_NO_TRACE(); // not enabled

    source(1, 0);
    set_record("arPortInfo[1].ucLumaKey", 0);
    decide();
    EXPECT_NO_TRACE(); // no luma key
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());

    set_record("arPortInfo[1].ucLumaKey", 9);
    mix_second_video(false);
    decide();
    EXPECT_TRACE(asked_not_mixed);
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());

    mix_second_video(true);
    decide();
    EXPECT_TRACE(asked_mixed + by_second(0) + change(1, 0));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_SecondVideo_AnyLumaKeyButZeroAndAnyAnswerButZero)
{
    source(1, 0);
    for (unsigned key = 1; key < 256; ++key)
    {
        set_record("arPortInfo[1].ucLumaKey", key);
        master(1);
        board::faults::set({ .function = "fgPmxHalMixPlane", .answer = key });
        decide();
        EXPECT_TRACE("fgPmxHalMixPlane(0, 1) = " + std::to_string(key) + "\n" + by_second(0) + change(1, 0)) << key;
    }
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_SecondVideoOutranksMainVideo)
{
    source(0, 1);
    source(1, 0);
    set_record("arPortInfo[1].ucLumaKey", 1);
    mix_second_video(true);
    decide();
    EXPECT_TRACE(by_main(1) + asked_mixed + by_second(0) + change(1, 0));
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_GraphicsOutrankBothVideos)
{
    source(0, 0);
    source(1, 0);
    set_record("arPortInfo[1].ucLumaKey", 1);
    mix_second_video(true);
    source(4, 1);
    decide();
    EXPECT_TRACE(by_main(0) + asked_mixed + by_second(0) + by_graphics(1));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_AmongGraphicsTheHighestPortWins)
{
    for (unsigned port = 2; port < 8; ++port)
        source(port, port == 7 ? 0 : 1);
    decide();
    EXPECT_TRACE(by_graphics(1) + by_graphics(1) + by_graphics(1) + by_graphics(1) + by_graphics(1) + by_graphics(0) +
                 change(1, 0));
    source(7, 1);
    source(2, 0);
    decide();
    EXPECT_TRACE(by_graphics(0) + by_graphics(1) + by_graphics(1) + by_graphics(1) + by_graphics(1) + by_graphics(1) +
                 change(0, 1));
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_RgbGraphicsNeverCount)
{
    for (unsigned port = 2; port < 8; ++port)
    {
        source(port, 0, DRV_GFX_COLOR_MODE_RGB);
        decide();
        source(port, 0, static_cast<DRV_GFX_COLOR_MODE_T>(2));
        decide();
    }
    EXPECT_NO_TRACE();
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_ColourModeOfVideosPlaysNoPart)
{
    source(0, 1, DRV_GFX_COLOR_MODE_RGB);
    source(1, 0, DRV_GFX_COLOR_MODE_RGB);
    set_record("arPortInfo[1].ucLumaKey", 1);
    mix_second_video(true);
    decide();
    EXPECT_TRACE(by_main(1) + asked_mixed + by_second(0) + change(1, 0));
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_LumaKeyAndSizeOfOtherPortsPlayNoPart)
{
    for (const unsigned port : { 0, 2, 3, 4, 5, 6, 7 })
    {
        const std::string name = "arPortInfo[" + std::to_string(port) + "].";
        for (const int key : { 0, 255 })
        {
            source(port, 1);
            set_record(name + "ucLumaKey", key);
            set_record(name + "u4SrcWidth", key);
            decide();
            EXPECT_TRACE(port == 0 ? by_main(1) : by_graphics(1));
        }
        set_record(name + "fgEnabled", 0);
    }
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_ConnectionPlaysNoPart)
{
    for (const bool connected : { true, false })
    {
        for (unsigned port = 0; port < 8; ++port)
        {
            // No video plane is told: the test looks at the decision alone.
            const std::string name = "arPortInfo[" + std::to_string(port) + "].";
            source(port, 1);
            set_record(name + "fgConnected", connected ? 1 : 0);
            set_record("arPortInfo[1].ucLumaKey", 1);
            mix_second_video(true);
            decide();
            EXPECT_TRACE(port == 0 ? by_main(1) : port == 1 ? asked_mixed + by_second(1) : by_graphics(1));
            set_record(name + "fgEnabled", 0);
            decide();
            EXPECT_NO_TRACE();
        }
    }
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_MixerIdIsHandedToTheHardwareQuestionAlone)
{
    connect(main_video);
    source(0, 1);
    source(1, 0);
    set_record("arPortInfo[1].ucLumaKey", 1);
    for (const UCHAR mixer : { 0, 1, 7, 255 })
    {
        master(0);
        mix_second_video(true);
        board::faults::set({ .function = "fgPmxHalMixPlane", .answer = 0 });
        EXPECT_EQ(1u, PMX_DecideMasterColorSpace(mixer));
        EXPECT_TRACE(by_main(1) + "fgPmxHalMixPlane(" + std::to_string(mixer) + ", 1) = 0\n" +
                     change(0, 1, { main_video }));
        EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());
    }
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_Change_OsdVideoPlanesHdmiAndConvertersInThisOrder)
{
    for (const Plane& plane : { main_video, background })
        connect(plane);
    source(5, 0);
    const RecordSnapshot before;
    decide();
    EXPECT_CALLS(R"(
        OSDSetColorSpace(DRV_PMX_CS_YCBCR_601)
        x_sema_lock(*, X_SEMA_OPTION_WAIT) = 0
        i4ImQueryInterface(PMX_COMP_TYPE_VDP, 0, IID_IVdp, *, 0x5100) = 0
        pu4SetColorMode(0x5100, DRV_PMX_CS_YCBCR_601)
        i4ImReleaseInterface(PMX_COMP_TYPE_VDP, 0, IID_IVdp, 0x5100) = 0
        i4ImQueryInterface(PMX_COMP_TYPE_VDP, 2, IID_IVdp, *, 0x5302) = 0
        pu4SetColorMode(0x5302, DRV_PMX_CS_YCBCR_601)
        i4ImReleaseInterface(PMX_COMP_TYPE_VDP, 2, IID_IVdp, 0x5302) = 0
        x_sema_unlock(*) = 0
        vPostChgInputCS(DRV_PMX_CS_YCBCR_601)
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 0)
        PMX_HalSetScaler709601(0, 0, 0)
    )");
    EXPECT_RECORD_CHANGED(before, "eMasterColorSpace");
    EXPECT_EQ(0, device("osd_planes.colour_space"));
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_NewValueIsStoredBehindItsMessageAndBeforeTheFirstCall)
{
    source(0, 0);
    std::vector<std::string> stored; // what came when, with the master of that moment
    board::at_every_call([&](const board::TraceEntry& entry) {
        if (stored.size() < 3)
            stored.push_back(entry.function + " " + std::to_string(master()));
    });
    decide();
    board::at_every_call({});
    EXPECT_EQ((std::vector<std::string>{ "PMX_IsLog 1", "PMX_IsLog 1", "OSDSetColorSpace 0" }), stored);
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_ConvertersAreSetForTheCurrentMode)
{
    source(0, 0);
    for (const unsigned mode : { RES_480I, RES_576P, RES_720P60HZ, RES_1080P24HZ, RES_2160P })
    {
        set_record("ucMode", mode);
        master(1);
        decide();
        EXPECT_TRACE(by_main(0) + log8("[PMX] Master Color Space change from %d to %d.", 1, 0) + announce(0, {}, mode));
    }
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_OsdGetsEightBitsOfTheNewValueOthersAll)
{
    source(0, 0x101);
    decide();
    EXPECT_TRACE(by_main(0x101) + log8("[PMX] Master Color Space change from %d to %d.", 1, 0x101) +
                 "OSDSetColorSpace(1)\n" + source_events::inform(0x101, {}) +
                 R"(vPostChgInputCS(0x101)
        LOG9 "Mode(12), eMixerOutCS(257)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        LOG5 "Invalid Color Space Id\n"
        Assert("0", "src/driver/pmx/pmx_colour.cpp")
    )");
    EXPECT_EQ(0x101, master());
    expect_asserts(1);
}

TEST_F(MasterColourSpace, DecideMasterColorSpace_EveryNumberIsToldWhole)
{
    constexpr int large = 0x10001;
    master(large);
    for (const unsigned port : { 0, 1, 2 })
        source(port, large);
    set_record("arPortInfo[1].ucLumaKey", 1);
    mix_second_video(true);
    decide();
    EXPECT_TRACE(by_main(large) + asked_mixed + by_second(large) + by_graphics(large));
    for (const unsigned port : { 0, 1, 2 })
        set_record("arPortInfo[" + std::to_string(port) + "].fgEnabled", 0);
    for (const auto& [was, becomes] : { std::pair(large, 0x20000), std::pair(0x20000, large) })
    {
        source(0, becomes);
        decide();
        EXPECT_EQ("[PMX] Master Color Space change from " + std::to_string(was) + " to " + std::to_string(becomes) +
                      ".\n",
                  board::trace::entries().at(1).text);
        board::trace::clear();
    }
    expect_asserts(2); // converters know no such colour space
}
