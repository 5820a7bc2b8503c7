// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "sources_test.h"

#include <stdexcept>

#include "board/video_planes.h"

namespace
{

using board::sources::Id;

constexpr UINT32 CONNECTED = 0x71000000;
constexpr UINT32 NO_PORT = 0xF1000002;

using Sources = SourcesTest;

TEST_F(Sources, PowerOn_NobodyIsConnected)
{
    const auto plane = [](const std::string& tag) {
        return "{connected=0, size=null, taken=null, luma_key=0, published=0, tag=" + tag +
               ", colour_space=null, times_told=0, connects_back=0}";
    };
    EXPECT_EQ(plane("10"), now("vdp0"));
    EXPECT_EQ(plane("11"), now("vdp1"));
    EXPECT_EQ(plane("12"), now("vdp2"));
    EXPECT_EQ(plane("13"), now("vdp3"));
    for (const char* const osd : { "osd0", "osd1", "osd2", "osd3", "osd4", "osd5" })
        EXPECT_EQ("{connected=0, size=null, taken=null, colour_mode=null}", now(osd));
    EXPECT_EQ(10u, board::sources::state().keys().size());
}

TEST_F(Sources, PowerOn_ForgetsEverything)
{
    const std::string as_new = board::sources::state().to_text();
    board::sources::start_video(1, { 720, 480 }, 3);
    board::sources::start_graphics(2, { 720, 480 }, DRV_GFX_COLOR_MODE_YCBCR);
    board::sources::set_connects_back(0, true);
    EXPECT_NE(as_new, board::sources::state().to_text());
    power_on({});
    EXPECT_EQ(as_new, board::sources::state().to_text());
}

TEST_F(Sources, Names_AreFoundAndOthersRefused)
{
    for (const std::string_view name : board::sources::names())
        EXPECT_EQ(name, board::sources::name_of(source(name)));
    EXPECT_EQ(10u, board::sources::names().size());
    for (const char* const name : { "vdp4", "osd6", "vdp", "", "VDP0", "vdp00" })
        EXPECT_THROW(source(name), std::invalid_argument) << name;
    EXPECT_THROW(board::sources::start_video(4, {}, 0), std::invalid_argument);
    EXPECT_THROW(board::sources::start_graphics(6, {}, DRV_GFX_COLOR_MODE_RGB), std::invalid_argument);
    EXPECT_THROW(board::sources::connect({ Id::Type::OsdPlane, 6 }), std::invalid_argument);
    EXPECT_THROW(board::sources::set_connects_back(4, true), std::invalid_argument);
    EXPECT_TRUE(board::trace::entries().empty());
}

TEST_F(Sources, Connect_VideoPlane_PublishesItsTableFirst)
{
    EXPECT_EQ(CONNECTED, board::sources::connect(source("vdp2")));
    EXPECT_EQ((Lines{ "NOTICE source \"vdp2 connects\"",
                      "i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, 2, IID_IVdp, video_plane_interface, 12) = 0",
                      "LOG8 \"Tp,Id=65,2\\n\"", "LOG8 \"Comp(1) connect\\n\"" }),
              story({ "i4ImRegisterInterface2", "PMX_IsLog" }));
    EXPECT_EQ("1", now("vdp2.connected"));
    EXPECT_EQ("1", now("vdp2.published"));

    EXPECT_EQ(CONNECTED, board::sources::connect(source("vdp2")));
    EXPECT_EQ((Lines{ "NOTICE source \"vdp2 connects\"" }), story({ "i4ImRegisterInterface2" })) << "it is published";
}

TEST_F(Sources, Connect_OsdPlane_HasNoTable)
{
    EXPECT_EQ(CONNECTED, board::sources::connect(source("osd5")));
    EXPECT_EQ((Lines{ "NOTICE source \"osd5 connects\"", "LOG8 \"Tp,Id=176,5\\n\"", "LOG8 \"Comp(7) connect\\n\"" }),
              story({ "i4ImRegisterInterface2", "PMX_IsLog" }));
    EXPECT_EQ("1", now("osd5.connected"));
}

TEST_F(Sources, Calls_RunUnderTheNameOfTheLayersOperation)
{
    board::sources::start_video(0, { 720, 576 }, 0);
    board::sources::stop(source("vdp0"));
    board::sources::disconnect(source("vdp0"));
    board::sources::start_graphics(0, { 720, 576 }, DRV_GFX_COLOR_MODE_RGB);
    board::sources::stop(source("osd0"));
    std::vector<std::string> operations;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (operations.empty() || operations.back() != entry.operation)
            operations.push_back(entry.operation);
    }
    EXPECT_EQ((Lines{ "", "i4Pmx_Connect", "", "PMX_VdpEnabled", "", "PMX_VdpDisabled", "", "i4Pmx_Disconnect", "",
                      "i4Pmx_Connect", "", "PMX_OsdEnabled", "", "PMX_OsdDisabled" }),
              operations);
}

TEST_F(Sources, Disconnect_WithdrawsTheTable)
{
    board::sources::connect(source("vdp1"));
    board::trace::clear();
    EXPECT_EQ(CONNECTED, board::sources::disconnect(source("vdp1")));
    EXPECT_EQ(
        (Lines{ "NOTICE source \"vdp1 disconnects\"", "i4ImUnregisterInterface2(PMX_COMP_TYPE_VDP, 1, IID_IVdp) = 0" }),
        story({ "i4ImUnregisterInterface2" }));
    EXPECT_EQ("0", now("vdp1.connected"));
    EXPECT_EQ("0", now("vdp1.published"));
    EXPECT_EQ(CONNECTED, board::sources::disconnect(source("vdp1"))) << "nobody asks whether it had connected";
    EXPECT_EQ((Lines{ "NOTICE source \"vdp1 disconnects\"" }), story({ "i4ImUnregisterInterface2" }));
}

TEST_F(Sources, Disconnect_ATableThatCannotBeWithdrawn_StaysPublished)
{
    board::sources::connect(source("vdp1"));
    answer_always("i4ImUnregisterInterface2", -1);
    board::sources::disconnect(source("vdp1"));
    EXPECT_EQ("0", now("vdp1.connected"));
    EXPECT_EQ("1", now("vdp1.published"));
    board::faults::clear_all();
    board::sources::disconnect(source("vdp1"));
    EXPECT_EQ("0", now("vdp1.published"));
}

TEST_F(Sources, Start_ConnectsFirst_AndEnablesTheHardware)
{
    EXPECT_EQ(1u, board::sources::start_video(1, { 1920, 1080 }, 16));
    EXPECT_EQ((Lines{ "NOTICE source \"vdp1 connects\"", "NOTICE source \"vdp1 starts, 1920x1080, luma key 16\"" }),
              story());
    EXPECT_EQ("{width=1920, height=1080}", now("vdp1.size"));
    EXPECT_EQ("16", now("vdp1.luma_key"));
    EXPECT_EQ("1", now("vdp1.taken"));
    EXPECT_EQ("VDP_ENABLED", member(board::video_planes::state(), "planes[1].hw_enable"));

    EXPECT_EQ(1u, board::sources::start_video(1, { 1920, 1080 }, 0));
    EXPECT_EQ((Lines{ "NOTICE source \"vdp1 starts, 1920x1080, luma key 0\"" }), story());

    EXPECT_EQ(1u, board::sources::start_video(3, { 1, 1 }, 0)) << "the one without hardware of its own";
    EXPECT_EQ("VDP_DISABLED", member(board::video_planes::state(), "planes[2].hw_enable"));
}

TEST_F(Sources, Start_Graphics)
{
    EXPECT_EQ(1u, board::sources::start_graphics(3, { 1280, 720 }, DRV_GFX_COLOR_MODE_YCBCR));
    EXPECT_EQ(1u, board::sources::start_graphics(4, { 1280, 720 }, DRV_GFX_COLOR_MODE_RGB));
    EXPECT_EQ((Lines{ "NOTICE source \"osd3 connects\"", "NOTICE source \"osd3 starts, 1280x720, YCbCr\"",
                      "NOTICE source \"osd4 connects\"", "NOTICE source \"osd4 starts, 1280x720, RGB\"" }),
              story());
    EXPECT_EQ("{connected=1, size={width=1280, height=720}, taken=1, colour_mode=DRV_GFX_COLOR_MODE_YCBCR}",
              now("osd3"));
    EXPECT_EQ("DRV_GFX_COLOR_MODE_RGB", now("osd4.colour_mode"));
}

TEST_F(Sources, Start_RefusedByTheMixer_IsKept)
{
    board::sources::connect(source("vdp2"));
    board::sources::connect(source("vdp1"));
    board::sources::disconnect(source("vdp1")); // and with it the port of both
    EXPECT_EQ(0u, board::sources::start_video(2, { 1920, 1080 }, 0));
    EXPECT_EQ("0", now("vdp2.taken"));
    EXPECT_EQ("1", now("vdp2.connected")) << "as it knows itself";
}

TEST_F(Sources, Resize_IsTheSameEventWithAnotherSize)
{
    board::sources::start_video(1, { 1920, 1080 }, 9);
    board::sources::start_graphics(0, { 100, 100 }, DRV_GFX_COLOR_MODE_YCBCR);
    board::trace::clear();
    EXPECT_EQ(1u, board::sources::resize(source("vdp1"), { 720, 576 }));
    EXPECT_EQ(1u, board::sources::resize(source("osd0"), { -1, -2147483647 - 1 }));
    EXPECT_EQ((Lines{ "NOTICE source \"vdp1 is 720x576 from now on\"", "LOG8 \"VDP_1 Enabled\\n\"",
                      "NOTICE source \"osd0 is -1x-2147483648 from now on\"", "LOG8 \"OSD_0 Enabled\\n\"" }),
              [] {
                  Lines lines;
                  for (const std::string& line : story({ "PMX_IsLog" }))
                  {
                      if (line.starts_with("NOTICE") || line.ends_with("Enabled\\n\""))
                          lines.push_back(line);
                  }
                  return lines;
              }());
    EXPECT_EQ("{width=720, height=576}", now("vdp1.size"));
    EXPECT_EQ("9", now("vdp1.luma_key"));
}

TEST_F(Sources, Resize_OfAStoppedSource_IsRefused)
{
    EXPECT_THROW(board::sources::resize(source("vdp0"), { 1, 1 }), std::invalid_argument);
    board::sources::start_graphics(0, { 1, 1 }, DRV_GFX_COLOR_MODE_RGB);
    board::sources::stop(source("osd0"));
    board::trace::clear();
    EXPECT_THROW(board::sources::resize(source("osd0"), { 1, 1 }), std::invalid_argument);
    EXPECT_TRUE(board::trace::entries().empty());
}

TEST_F(Sources, Stop_DisablesTheHardwareAndForgetsTheSize)
{
    board::sources::start_video(0, { 1920, 1080 }, 0);
    board::trace::clear();
    EXPECT_EQ(1u, board::sources::stop(source("vdp0")));
    EXPECT_EQ((Lines{ "NOTICE source \"vdp0 stops\"", "LOG8 \"VDP_0 Disabled\\n\"" }), story({ "PMX_IsLog" }));
    EXPECT_EQ("null", now("vdp0.size"));
    EXPECT_EQ("1", now("vdp0.connected"));
    EXPECT_EQ("VDP_DISABLED", member(board::video_planes::state(), "planes[0].hw_enable"));
    EXPECT_EQ(1u, board::sources::stop(source("osd5"))) << "nobody asks whether it had started";
}

TEST_F(Sources, WhatEachIsTold_IsKept)
{
    board::sources::connect(source("vdp0"));
    board::sources::connect(source("vdp3"));
    board::sources::connect(source("vdp1"));
    board::sources::start_graphics(0, { 720, 576 }, DRV_GFX_COLOR_MODE_YCBCR);
    EXPECT_EQ("DRV_PMX_CS_YCBCR_601", now("vdp0.colour_space"));
    EXPECT_EQ("DRV_PMX_CS_YCBCR_601", now("vdp1.colour_space"));
    EXPECT_EQ("null", now("vdp3.colour_space")) << "vdp1 has taken its port";
    board::sources::resize(source("osd0"), { 721, 576 });
    EXPECT_EQ("DRV_PMX_CS_YCBCR_709", now("vdp0.colour_space"));
    EXPECT_EQ("2", now("vdp0.times_told"));
    EXPECT_EQ("2", now("vdp1.times_told"));
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(Sources, TableThatCannotBePublished_IsNotFoundByTheMixer)
{
    answer_always("i4ImRegisterInterface2", -1);
    EXPECT_EQ(CONNECTED, board::sources::connect(source("vdp0")));
    EXPECT_EQ((Lines{ "NOTICE source \"vdp0 connects\"", "NOTICE source \"vdp0 cannot publish its interface\"" }),
              story());
    EXPECT_EQ("0", now("vdp0.published"));
    board::sources::start_video(0, { 1, 1 }, 0);
    EXPECT_EQ(1u, board::asserts());
    EXPECT_EQ("0", now("vdp0.times_told"));
    board::sources::disconnect(source("vdp0"));
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(Sources, NothingBeyondThePortsIsPublishedOrConnected)
{
    EXPECT_EQ(NO_PORT, i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, 4));
    EXPECT_EQ(NO_PORT, i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, 6));
    EXPECT_EQ("0", now("vdp3.connected"));
}

} // namespace
