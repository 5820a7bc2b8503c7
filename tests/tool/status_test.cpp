// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <algorithm>

#include <nlohmann/json.hpp>

#include "scenario_run.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/status.h"

namespace
{

using board::Value;
using pmxboard::Status;
using pmxboard::status_of;
using pmxboard::StatusPart;
using tool_test::run;
using Json = nlohmann::json;
using State = pmxboard::GraphicsStatus::State;

constexpr const char* outputs_at_50 =
    "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 DRV_NON_EXT_CHIP 0\n";

Status after(const std::string& lines)
{
    const auto outcome = run(lines);
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    return status_of(pmxboard::whole_state(), "default");
}

/** What `status …` shows as the last command. */
std::string shown_by(const std::string& lines)
{
    const std::string shown = run(lines).shown;
    return shown.substr(shown.find('\n', shown.rfind("> status")) + 1);
}

TEST(Status, AtStart_NothingIsSetYet)
{
    EXPECT_EQ("Board default, 0 ms after power-on\n"
              "Mixer      nobody has called PMX_Init\n",
              shown_by("status").substr(0, 73));
    EXPECT_EQ("Output      shows           size      Hz  colour\n"
              "  digital   not set yet\n"
              "  HDMI      not set yet                            what the boot loader left\n"
              "  component not set yet\n"
              "  composite not set yet\n"
              "  HDMI sink: plugged in, takes any mode\n",
              shown_by("PMX_Init\nstatus outputs"));
}

TEST(Status, Product_ShowsWhatItLacksAndWhatItsSinkTakes)
{
    const std::string shown = shown_by("power-on bedroom-player\nPMX_Init\nstatus");
    EXPECT_TRUE(shown.starts_with("Board bedroom player, 2 ms after power-on\n"
                                  "Mixer      RES_720P50HZ at 60 Hz, PMX_TV_TYPE_PAL, master enable off\n"
                                  "  capability 0x3DEA30FF: refuses 23 modes, gamma, digital port, black level\n"))
        << shown;
    EXPECT_NE(std::string::npos,
              shown.find("  HDMI sink: plugged in, takes RES_720P50HZ at 50 Hz, RES_1080I50HZ at 50 Hz,\n"
                         "    RES_576P at 50 Hz, RES_576I at 50 Hz, RES_720P60HZ at 60 Hz\n"))
        << shown;
    EXPECT_NE(std::string::npos, shown.find("vdp0    720x576    YCbCr BT.601")) << shown;
    EXPECT_NE(std::string::npos, shown.find("osd1    -          connected")) << shown;
}

TEST(Status, IsOneScreen)
{
    const std::string text = shown_by(std::string("PMX_Init\nsource vdp0 start 1920x1080\ndisplay-part never\n") +
                                      outputs_at_50 + "PMX_SetSwapEnable 0 1 1\nPMX_SetMuteEnable 0 1\nstatus");
    EXPECT_GE(24, std::count(text.begin(), text.end(), '\n')) << text;
    for (std::size_t begin = 0, end = 0; (end = text.find('\n', begin)) != text.npos; begin = end + 1)
        EXPECT_GE(80u, pmxboard::columns_of(text.substr(begin, end - begin))) << text;
}

TEST(Status, Outputs_AsTheirDriversWereTold)
{
    EXPECT_EQ("Output      shows           size      Hz  colour\n"
              "  digital   off\n"
              "  HDMI      RES_1080P50HZ   1920x1080 50  BT.709\n"
              "  component RES_576P        720x576   50  BT.601\n"
              "  composite RES_576I        720x576   50  BT.601\n"
              "  HDMI sink: plugged in, takes RES_720P60HZ at 60 Hz whatever is asked\n",
              shown_by(std::string("PMX_Init\nsink valid RES_720P60HZ 60\n") + outputs_at_50 + "status outputs"));
    EXPECT_NE(std::string::npos,
              shown_by("PMX_Init\nsink unplug\nstatus outputs").find("  HDMI sink: none is plugged in\n"));
}

TEST(Status, Planes_WithTheirSources)
{
    EXPECT_EQ("Plane  mixed  stack  source  size       pictures\n"
              "  1    yes    3      vdp2    -          connected\n"
              "  2    no     2      vdp0    720x576    YCbCr BT.601\n"
              "  3    yes    4      osd0    1280x720   RGB\n",
              shown_by("PMX_Init\nsource vdp0 start 720x576\nsource vdp2 connect\nsource osd0 start 1280x720 rgb\n"
                       "PMX_SetSwapEnable 0 1 1\nstatus planes")
                  .substr(0, 196));
    EXPECT_NE(std::string::npos,
              shown_by("PMX_Init\nPMX_SetSwapEnable 0 1 1\nstatus planes").find("  planes 1 and 2 are swapped\n"));
}

TEST(Status, APlaneThatStandsNowhere)
{
    const Status status = after("PMX_Init\nPMX_SetPlaneOrder 0 5 0");
    EXPECT_FALSE(status.planes[4].position);
    EXPECT_EQ(0u, status.planes[5].position);
}

TEST(Status, SourcesFollowTheOrderOfThePlanes)
{
    const Status status = after("PMX_Init\nsource osd3 start 640x480 ycbcr\nPMX_SetArbPlaneOrder 0 0x76043215");
    EXPECT_EQ("osd3", status.planes[0].source);
    EXPECT_EQ("640", status.planes[0].width.to_text());
}

TEST(Status, Graphics_HeldBack_SinceWhenUntilWhenByWhom)
{
    EXPECT_EQ("Graphics   held back since 4 ms by PMX_SetModeEx: planes 3 to 7 wait until the\n"
              "           display part answers at 3004 ms; the timer ends the wait at 10004 ms\n",
              shown_by(std::string("PMX_Init\ndisplay-part answer 3s\n") + outputs_at_50 + "status graphics"));
    const auto never = after(std::string("PMX_Init\ndisplay-part never\n") + outputs_at_50 + "advance 1500us").graphics;
    EXPECT_EQ(State::Held, never.state);
    EXPECT_EQ(4000, never.since_us);
    EXPECT_FALSE(never.answer_us);
    EXPECT_EQ(10004000, never.timer_us);
    EXPECT_EQ((std::vector<unsigned>{ 3, 4, 5, 6, 7 }), never.planes);
    EXPECT_EQ(State::Shown,
              after(std::string("PMX_Init\ndisplay-part never\n") + outputs_at_50 + "advance 10s").graphics.state);
}

TEST(Status, Graphics_InEachOtherState)
{
    EXPECT_EQ("Graphics   shown, while the display part switches\n",
              shown_by("PMX_Init\ndisplay-part raise\nstatus graphics"));
    EXPECT_EQ("Graphics   held back by the video plane: planes 3 to 7 wait until it has its\n"
              "           sync control and calls PMX_SetOsdEnable\n",
              shown_by(std::string("PMX_Init\nvideo-plane waiting on\ndisplay-part answer 1s\n") + outputs_at_50 +
                       "advance 1s\nstatus graphics"));
    EXPECT_EQ("Graphics   planes 4 and 6 out of the mix, and nothing is announced that brings\n"
              "           them back\n",
              shown_by("PMX_Init\nneighbour vPmxNotMixPlane 0 3\nneighbour vPmxNotMixPlane 0 5\nstatus graphics"));
    EXPECT_EQ("Graphics   shown; the timer of the last wait runs until 10004 ms\n",
              shown_by(std::string("PMX_Init\ndisplay-part answer 1s\n") + outputs_at_50 +
                       "advance 1500us\nadvance 1s\nstatus graphics"));
}

const std::string unanswered = std::string("PMX_Init\ndisplay-part never\n") + outputs_at_50;
constexpr const char* forgotten =
    "graphics: the record says that nothing waits, the hardware has planes 3 to 7 out of the mix";
const std::string note = std::string("note: ") + forgotten + "\n";

TEST(Status, Graphics_HeldBackAndNoTimer_WhoTookItAndWhatBringsThemBack)
{
    EXPECT_EQ("Graphics   held back by PMX_SetModeEx: planes 3 to 7 wait until the display part\n"
              "           answers; no timer ends the wait: PMX_Uninit has deleted it, and\n"
              "           PMX_Init would forget the wait. PMX_SetFormatChangeFlag(FALSE) brings\n"
              "           them back\n",
              shown_by(unanswered + "PMX_Uninit\nstatus graphics"));
    EXPECT_EQ("PMX_Uninit", after(unanswered + "i4PMX_Uninit 0").graphics.lost_by);
    EXPECT_EQ("Graphics   held back by PMX_SetModeEx: planes 3 to 7 wait until the display part\n"
              "           answers; no timer ends the wait: the layer has none since PMX_Reset.\n"
              "           PMX_SetFormatChangeFlag(FALSE) brings them back\n",
              shown_by(std::string("PMX_Init\nPMX_Reset 0\ndisplay-part never\n") + outputs_at_50 + "status graphics"));
    EXPECT_EQ(std::nullopt, after(unanswered + "PMX_Stop").graphics.lost_by) << "the timer runs on";
    EXPECT_EQ(State::Shown, after(unanswered + "PMX_Uninit\nPMX_SetFormatChangeFlag FALSE").graphics.state);
}

TEST(Status, Graphics_Forgotten_WhoForgotThemAndWhatBringsThemBack)
{
    const std::string restarted = unanswered + "PMX_Uninit\nPMX_Init\n";
    EXPECT_EQ("Graphics   planes 3 to 7 out of the mix, and nothing is announced that brings\n"
              "           them back: PMX_Init has forgotten that they were held back.\n"
              "           PMX_SetFormatChangeFlag(FALSE) brings them back, or the end of the\n"
              "           next change that the display part announces\n" +
                  note,
              shown_by(restarted + "status graphics"));
    EXPECT_EQ(std::vector<std::string>{ forgotten }, after(restarted).disagreements);
    EXPECT_TRUE(run(restarted).shown.ends_with(note));
    EXPECT_EQ("PMX_Init", Json::parse(pmxboard::to_json(after(restarted))).at("graphics").at("lost_by"));
    EXPECT_EQ(State::Shown, after(restarted + "PMX_SetFormatChangeFlag FALSE").graphics.state);
    EXPECT_EQ(State::Shown, after(restarted + outputs_at_50 + "advance 10s").graphics.state);

    const std::string waiting = unanswered + "video-plane waiting on\nadvance 10s\n";
    EXPECT_EQ("PMX_Reset", after(waiting + "PMX_Reset 0\nvideo-plane waiting off").graphics.lost_by);
}

TEST(Status, Graphics_ForgottenAndAModeSetSince_TheStateDoesNotTellByWhom)
{
    const std::string lines = unanswered + "PMX_Uninit\nPMX_Init\ndisplay-part off\n" + outputs_at_50;
    EXPECT_EQ(std::nullopt, after(lines).graphics.lost_by);
    EXPECT_EQ(std::vector<std::string>{ forgotten }, after(lines).disagreements);
    EXPECT_EQ("Graphics   planes 3 to 7 out of the mix, and nothing is announced that brings\n"
              "           them back: PMX_Init, PMX_Reset or PMX_SetOsdEnableFlag has forgotten\n"
              "           them, or a neighbour has taken them out.\n"
              "           PMX_SetFormatChangeFlag(FALSE) brings them back, or the end of the\n"
              "           next change that the display part announces\n" +
                  note,
              shown_by(lines + "status graphics"));
}

TEST(Status, Graphics_OutAndSomethingStillBringsThemBack)
{
    EXPECT_EQ("Graphics   planes 3 to 7 out of the mix, owed by nobody; the timer brings them\n"
              "           back at 10004 ms\n",
              shown_by(unanswered + "PMX_Stop\nPMX_Init\nstatus graphics"));
    const std::string answers =
        std::string("PMX_Init\ndisplay-part answer 3s\n") + outputs_at_50 + "PMX_Uninit\nPMX_Init\n";
    EXPECT_EQ("Graphics   planes 3 to 7 out of the mix, owed by nobody; the display part's\n"
              "           answer at 3004 ms brings them back\n",
              shown_by(answers + "status graphics"));
    EXPECT_EQ(std::nullopt, after(answers).graphics.lost_by);
    EXPECT_EQ(State::Shown, after(answers + "advance 3s").graphics.state);
}

TEST(Status, Graphics_ANeighbourHasTakenThemOut_NobodyIsBlamed)
{
    std::string lines = "PMX_Init\n";
    for (const char plane : { '2', '3', '4', '5', '6' })
        lines += std::string("neighbour vPmxNotMixPlane 0 ") + plane + "\n";
    EXPECT_EQ(std::nullopt, after(lines).graphics.lost_by);
}

TEST(Status, RecordAndHardwareDisagree_IsTold)
{
    const std::string lines = std::string("PMX_Init\nfault fgPmxDrvSetAvd 0 always\n") + outputs_at_50;
    const std::string sentence = "HDMI: the record says RES_1080P50HZ, its driver has taken nothing";
    EXPECT_EQ(std::vector<std::string>{ sentence }, after(lines).disagreements);
    EXPECT_TRUE(
        shown_by(lines + "status")
            .ends_with("The record and the hardware disagree\n  " + sentence + "\n" + "note: " + sentence + "\n"));
    EXPECT_TRUE(run(lines).shown.ends_with("note: " + sentence + "\n"));
    EXPECT_EQ("", run(lines, { .quiet = true }).shown);
    EXPECT_EQ(
        (std::vector<std::string>{ "mode: the record says RES_480P, the hardware has RES_1080P60HZ",
                                   "mute: the record says on, the hardware has it off",
                                   "sources of the planes: the record says 0x76543201, the hardware has 0x76543210" }),
        after("PMX_Init\npoke ucMode RES_480P\npoke ucMuteEnable 1\npoke u4PlaneOrder 0x76543201").disagreements);
    EXPECT_EQ(std::vector<std::string>{}, after(outputs_at_50).disagreements) << "PMX_Init has not been called";
}

TEST(Status, WhatADriverTookBefore_IsWhatTheOutputShows)
{
    const Status status =
        after(std::string("PMX_Init\n") + outputs_at_50 +
              "fault fgPmxDrvSetAvd 0 always\n"
              "PMX_SetModeEx 0 [ [0], [1, RES_720P60HZ], [1, RES_480P], [1, RES_480I] ] 60 DRV_NON_EXT_CHIP 0");
    EXPECT_EQ("RES_1080P50HZ", status.outputs[1].mode.to_text());
    EXPECT_EQ(std::vector<std::string>{ "HDMI: the record says RES_720P60HZ, its driver has taken RES_1080P50HZ" },
              status.disagreements);
}

TEST(Status, FunctionsThatAreNotTheBoards_AreNamedAndNotComparedWith)
{
    after("PMX_Init\npoke ucMode RES_480P");
    Value state = pmxboard::whole_state();
    EXPECT_EQ(1u, status_of(state, "default").disagreements.size());
    EXPECT_EQ(std::string::npos, pmxboard::to_json(status_of(state, "default")).find("replaced"));
    state.add("replaced", Value::list({ Value::symbol("TVE_SetHue"), Value::symbol("x_timer_stop") }));
    const Status status = status_of(state, "default");
    EXPECT_EQ(std::vector<std::string>{}, status.disagreements);
    EXPECT_EQ(R"(["TVE_SetHue","x_timer_stop"])", Json::parse(pmxboard::to_json(status)).at("replaced").dump());
    EXPECT_TRUE(to_text(status, StatusPart::All, {})
                    .ends_with("Not the board's own, so that what they have set is not known here\n"
                               "  TVE_SetHue, x_timer_stop\n"));
}

TEST(Status, OneModeOnAllOutputs_LeavesTheirRecord_AndThatIsNoDisagreement)
{
    const Status status = after("PMX_Init\nPMX_SetMode 0 RES_720P50HZ 50 0");
    EXPECT_EQ("RES_720P50HZ", status.outputs[1].mode.to_text());
    EXPECT_EQ(std::vector<std::string>{}, status.disagreements);
}

TEST(Status, AsJson)
{
    const std::string lines = std::string("PMX_Init\ndisplay-part answer 3s\n") + outputs_at_50 + "status --json";
    const Json json = Json::parse(shown_by(lines));
    EXPECT_EQ("pmxboard-status", json.at("schema"));
    EXPECT_EQ(1, json.at("version"));
    EXPECT_EQ((Json{ { "name", "HDMI" },
                     { "on", 1 },
                     { "mode", { { "value", 13 }, { "name", "RES_1080P50HZ" } } },
                     { "size", { { "width", 1920 }, { "height", 1080 } } },
                     { "frequency", 50 },
                     { "colour", "BT.709" } }),
              json.at("outputs").at(1));
    EXPECT_EQ((Json{ { "state", "held" },
                     { "planes", { 3, 4, 5, 6, 7 } },
                     { "by", "PMX_SetModeEx" },
                     { "since_us", 4000 },
                     { "answer_us", 3004000 },
                     { "timer_us", 10004000 },
                     { "lost_by", nullptr } }),
              json.at("graphics"));
    const std::string as_lines = tool_test::run_traced("PMX_Init\nstatus", "jsonl").shown;
    EXPECT_EQ("status", Json::parse(as_lines.substr(as_lines.rfind('\n', as_lines.size() - 2) + 1)).at("kind"));
}

TEST(Status, OfAStateThatLacksEverything)
{
    const Status status = status_of(Value::record({}), "b");
    EXPECT_EQ(8u, status.planes.size());
    EXPECT_FALSE(status.outputs[1].on);
    EXPECT_NE("", to_text(status, StatusPart::All, {}));
    EXPECT_EQ(1, Json::parse(to_json(status)).at("version"));
}

} // namespace
