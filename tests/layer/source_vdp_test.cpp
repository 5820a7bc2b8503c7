// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** A video plane starts and stops. */
#include "tests/layer/source_events.h"

using source_events::announce;
using source_events::change;
using source_events::log8;

class SourceVdp : public SourceTest
{
protected:
    /** The master colour space before the next event. */
    static void master(int colour_space) { set_record("eMasterColorSpace", colour_space); }
    static std::int64_t master() { return record("eMasterColorSpace"); }
    static bool full_range() { return device("osd_planes.full_range_conversion") != 0; }
};

namespace
{

std::string decided_by_main(int colour_space)
{
    return log8("[PMX] VDP_COMP_1 enabled and Color Space is %d.", colour_space);
}

std::string decided_by_second(int colour_space)
{
    return log8("[PMX] VDP_COMP_2 enabled and Color Space is %d.", colour_space);
}

std::string source_of(int plane, int colour_space)
{
    return log8(colour_space == 1 ? "VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_709"
                                  : "VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_601",
                plane);
}

/** What an enabled plane leaves in the trace before the decision. */
std::string enabled(int plane, int colour_space)
{
    std::string lines = log8("VDP_%d Enabled", plane);
    if (plane == 2)
        lines += "LOG8 \"Turn on OSD full range conversion\\n\"\n"
                 "OSD_RNG_Set_Xvycc_En(1)\n";
    if (plane == 1)
        lines += "LOG8 \"Turn off OSD full range conversion since SUB video enable. \\n\"\n"
                 "OSD_RNG_Set_Xvycc_En(0)\n";
    lines += source_of(plane, colour_space);
    if (plane == 2)
        lines += "LOG8 \"VDP_2's (JPG(BACKGROUND) is force to 601.\\n\"\n";
    return lines;
}

} // namespace

TEST_F(SourceVdp, VdpEnabled_MainVideo1080AfterStandardDefinition_MasterBecomes709)
{
    connect(main_video);
    master(0);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 1920, 1080, 0));
    EXPECT_TRACE(R"(
        LOG8 "VDP_0 Enabled\n"
        LOG8 "VDP_0's Src Color Space = DRV_PMX_CS_YCBCR_709\n"
        LOG8 "[PMX] VDP_COMP_1 enabled and Color Space is 1.\n"
        LOG8 "[PMX] Master Color Space change from 0 to 1.\n"
    )" + announce(1, { main_video }));
    EXPECT_RECORD_CHANGED(before, "arPortInfo[0].fgEnabled", "eMasterColorSpace");
    EXPECT_EQ(1, record("arPortInfo[0].fgEnabled"));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());
}

TEST_F(SourceVdp, VdpEnabled_MainVideo1080In709Already_NothingIsAnnounced)
{
    connect(main_video);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 1920, 1080, 0));
    EXPECT_TRACE(R"(
        LOG8 "VDP_0 Enabled\n"
        LOG8 "VDP_0's Src Color Space = DRV_PMX_CS_YCBCR_709\n"
        LOG8 "[PMX] VDP_COMP_1 enabled and Color Space is 1.\n"
    )");
    EXPECT_RECORD_CHANGED(before, "arPortInfo[0].fgEnabled");
}

TEST_F(SourceVdp, VdpEnabled_MainVideo576_MasterBecomes601)
{
    connect(main_video);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 720, 576, 5));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("arPortInfo[0].eSrcColorSpace"));
    EXPECT_EQ(5, record("arPortInfo[0].ucLumaKey"));
    EXPECT_RECORD_CHANGED(before, "arPortInfo[0].fgEnabled", "arPortInfo[0].eSrcColorSpace", "arPortInfo[0].ucLumaKey",
                          "eMasterColorSpace");
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
}

TEST_F(SourceVdp, VdpEnabled_ConvertersAreSetForTheCurrentMode)
{
    connect(main_video);
    set_record("ucMode", RES_576P);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 720, 576, 0));
    EXPECT_TRACE(enabled(0, 0) + decided_by_main(0) + log8("[PMX] Master Color Space change from %d to %d.", 1, 0) +
                 announce(0, { main_video }, RES_576P));
}

TEST_F(SourceVdp, VdpEnabled_SecondVideo_StoredOnPort1AndFullRangeOff)
{
    connect(second_video);
    set_record("arPortInfo[1].eInputColorMode", DRV_GFX_COLOR_MODE_RGB);
    mix_second_video(true);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 1, 352, 288, 16));
    EXPECT_TRACE(R"(
        LOG8 "VDP_1 Enabled\n"
        LOG8 "Turn off OSD full range conversion since SUB video enable. \n"
        OSD_RNG_Set_Xvycc_En(0)
        LOG8 "VDP_1's Src Color Space = DRV_PMX_CS_YCBCR_601\n"
        fgPmxHalMixPlane(0, 1) = 1
        LOG8 "[PMX] VDP_COMP_2 enabled and Color Space is 0.\n"
    )" + change(1, 0, { second_video }));
    EXPECT_RECORD_CHANGED(before, "arPortInfo[1].fgEnabled", "arPortInfo[1].eInputColorMode",
                          "arPortInfo[1].eSrcColorSpace", "arPortInfo[1].ucLumaKey", "eMasterColorSpace");
    EXPECT_EQ(DRV_GFX_COLOR_MODE_YCBCR, record("arPortInfo[1].eInputColorMode"));
    EXPECT_EQ(16, record("arPortInfo[1].ucLumaKey"));
}

TEST_F(SourceVdp, VdpEnabled_SecondVideoWithLumaKey0_NeverDecidesWhateverItsSize)
{
    connect(second_video);
    for (const bool mixed : { false, true })
    {
        mix_second_video(mixed);
        for (const int was : { 0, 1 })
        {
            master(was);
            EXPECT_EQ(1u, PMX_VdpEnabled(0, 1, 1920, 1080, 0));
            EXPECT_TRACE(enabled(1, 1));
            EXPECT_EQ(1u, PMX_VdpEnabled(0, 1, 720, 480, 0));
            EXPECT_TRACE(enabled(1, 0));
            EXPECT_EQ(was, master());
        }
    }
}

TEST_F(SourceVdp, VdpEnabled_SecondVideoWithLumaKey_CountsOnlyWhileMixed)
{
    connect(second_video);
    mix_second_video(false);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 1, 720, 480, 1));
    EXPECT_TRACE(enabled(1, 0) + "fgPmxHalMixPlane(0, 1) = 0");
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());
    mix_second_video(true);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 1, 720, 480, 1));
    EXPECT_TRACE(enabled(1, 0) + "fgPmxHalMixPlane(0, 1) = 1\n" + decided_by_second(0) +
                 change(1, 0, { second_video }));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, master());
}

TEST_F(SourceVdp, VdpEnabled_Background_Always601AndFullRangeOn)
{
    connect(background);
    mix_second_video(true);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 2, 1920, 1080, 1));
    EXPECT_TRACE(R"(
        LOG8 "VDP_2 Enabled\n"
        LOG8 "Turn on OSD full range conversion\n"
        OSD_RNG_Set_Xvycc_En(1)
        LOG8 "VDP_2's Src Color Space = DRV_PMX_CS_YCBCR_709\n"
        LOG8 "VDP_2's (JPG(BACKGROUND) is force to 601.\n"
        fgPmxHalMixPlane(0, 1) = 1
        LOG8 "[PMX] VDP_COMP_2 enabled and Color Space is 0.\n"
    )" + change(1, 0, { background }));
    EXPECT_RECORD_CHANGED(before, "arPortInfo[1].fgEnabled", "arPortInfo[1].eSrcColorSpace", "arPortInfo[1].ucLumaKey",
                          "eMasterColorSpace");
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("arPortInfo[1].eSrcColorSpace"));
    EXPECT_TRUE(full_range());
}

TEST_F(SourceVdp, VdpEnabled_FourthPlane_Port1WithoutSpecialHandling)
{
    for (const bool on : { false, true })
    {
        connect(background);
        EXPECT_EQ(1u, on ? PMX_VdpEnabled(0, 2, 720, 480, 0) : PMX_VdpDisabled(0, 2));
        connect(fourth_video);
        EXPECT_EQ(1u, PMX_VdpEnabled(0, 3, 1280, 720, 0));
        EXPECT_TRACE(enabled(3, 1));
        EXPECT_EQ(1, record("arPortInfo[1].fgEnabled"));
        EXPECT_EQ(DRV_PMX_CS_YCBCR_709, record("arPortInfo[1].eSrcColorSpace"));
        EXPECT_EQ(on, full_range());
    }
}

TEST_F(SourceVdp, VdpEnabled_MainVideo_LeavesFullRangeAlone)
{
    for (const Plane& plane : { main_video, background })
        connect(plane);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 2, 720, 480, 0));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 1920, 1080, 0));
    EXPECT_TRACE(enabled(0, 1) + decided_by_main(1));
    EXPECT_TRUE(full_range());
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 0));
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 3));
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 1));
    EXPECT_TRUE(full_range());
}

TEST_F(SourceVdp, VdpEnabled_EverySizeAtTheBorder)
{
    for (const Plane& plane : { main_video, second_video, fourth_video })
    {
        connect(plane);
        const std::string port = plane.id == 0 ? "arPortInfo[0]" : "arPortInfo[1]";
        for (const INT32 width : source_events::widths)
        {
            for (const INT32 height : source_events::heights)
            {
                const int source = source_events::colour_space_of(width, height);
                // What it would decide is so already; what it stores is not.
                master(source);
                set_record(port + ".eSrcColorSpace", 1 - source);
                EXPECT_EQ(1u, PMX_VdpEnabled(0, static_cast<UCHAR>(plane.id), width, height, 0));
                EXPECT_TRACE(enabled(plane.id, source) + (plane.id == 0 ? decided_by_main(source) : ""))
                    << width << " x " << height;
                EXPECT_EQ(source, record(port + ".eSrcColorSpace")) << width << " x " << height;
            }
        }
        EXPECT_EQ(1u, PMX_VdpDisabled(0, static_cast<UCHAR>(plane.id)));
        board::trace::clear();
    }
}

TEST_F(SourceVdp, VdpEnabled_Background_SaysWhatItsSizeMeansAndIs601)
{
    connect(background);
    for (const INT32 width : source_events::widths)
    {
        for (const INT32 height : source_events::heights)
        {
            set_record("arPortInfo[1].eSrcColorSpace", DRV_PMX_CS_YCBCR_709);
            EXPECT_EQ(1u, PMX_VdpEnabled(0, 2, width, height, 0));
            EXPECT_TRACE(enabled(2, source_events::colour_space_of(width, height))) << width << " x " << height;
            EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("arPortInfo[1].eSrcColorSpace")) << width << " x " << height;
        }
    }
}

TEST_F(SourceVdp, VdpEnabled_NamedSizes)
{
    const auto source = [](INT32 width, INT32 height) {
        EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, width, height, 0));
        return record("arPortInfo[0].eSrcColorSpace");
    };
    connect(main_video);
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, source(721, 480));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, source(720, 576));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, source(720, 577));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, source(0x10000, 480)); // all 32 bits count
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, source(720, 0x10000));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, source(0, 0));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, source(-1920, -1080));
}

TEST_F(SourceVdp, VdpEnabled_TheSizeItselfIsNotStored)
{
    connect(main_video);
    set_record("arPortInfo[0].u4SrcWidth", 11);
    set_record("arPortInfo[0].u4SrcHeight", 12);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 1920, 1080, 0));
    EXPECT_EQ(11, record("arPortInfo[0].u4SrcWidth"));
    EXPECT_EQ(12, record("arPortInfo[0].u4SrcHeight"));
}

TEST_F(SourceVdp, VdpEnabled_ThePortIsWrittenBeforeTheMessagesThatSayIt)
{
    connect(background);
    set_record("arPortInfo[1].eInputColorMode", DRV_GFX_COLOR_MODE_RGB);
    set_record("arPortInfo[1].eSrcColorSpace", DRV_PMX_CS_YCBCR_601);
    std::vector<std::string> seen;
    board::at_every_call([&](const board::TraceEntry&) {
        std::string fields;
        for (const char* name : { "fgEnabled", "eInputColorMode", "ucLumaKey", "eSrcColorSpace" })
            fields += std::to_string(record(std::string("arPortInfo[1].") + name)) + " ";
        seen.push_back(fields);
    });
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 2, 1920, 1080, 7));
    board::at_every_call({});
    ASSERT_LE(4u, seen.size());
    EXPECT_EQ("1 0 7 0 ", seen[0]); // enabled
    EXPECT_EQ("1 0 7 0 ", seen[2]); // full range is switched: its size has not been looked at
    EXPECT_EQ("1 0 7 1 ", seen[3]); // BT.709 by its size
    EXPECT_EQ("1 0 7 0 ", seen.back());
}

TEST_F(SourceVdp, VdpEnabled_AnyPlaneOfTheSharedPortWillDo)
{
    connect(second_video);
    for (const UCHAR plane : { 3, 2, 1 })
    {
        EXPECT_EQ(1u, PMX_VdpEnabled(0, plane, 720, 480, 0));
        EXPECT_TRACE(enabled(plane, 0));
    }
    EXPECT_EQ(1, record("arPortInfo[1].u2CompId"));
}

TEST_F(SourceVdp, VdpEnabled_MixerIdIsHandedToTheDecision)
{
    connect(second_video);
    for (const UCHAR mixer : { 0, 1, 7, 255 })
    {
        EXPECT_EQ(1u, PMX_VdpEnabled(mixer, 1, 720, 480, 1));
        EXPECT_TRACE(enabled(1, 0) + "fgPmxHalMixPlane(" + std::to_string(mixer) + ", 1) = 0");
        EXPECT_EQ(1, record("arPortInfo[1].fgEnabled"));
        EXPECT_EQ(1u, PMX_VdpDisabled(mixer, 1));
        EXPECT_TRACE(log8("VDP_%d Disabled", 1));
        EXPECT_EQ(0, record("arPortInfo[1].fgEnabled"));
    }
}

TEST_F(SourceVdp, VdpEnabled_MainVideo576UnderHdGraphics_MasterStays709)
{
    connect(main_video);
    EXPECT_EQ(1u, PMX_OsdEnabled(0, 0, 1280, 720, DRV_GFX_COLOR_MODE_YCBCR));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 720, 576, 0));
    EXPECT_TRACE(enabled(0, 0) + decided_by_main(0) + log8("[PMX] Gfx enabled and Color Space is %d.", 1));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, master());
}
