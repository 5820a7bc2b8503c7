// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tools/pmxboard/decode/story.h"

namespace
{

using pmxboard::decode::Event;
using pmxboard::decode::read_log;

/** One line an event: lines, operation, title, details; `!` leads a problem. */
std::string told(const std::string& log)
{
    std::string story;
    for (const Event& event : pmxboard::decode::tell(read_log(log)).events)
    {
        story += (event.problem ? "! " : "") + std::to_string(event.first_line) + "-" +
                 std::to_string(event.last_line) + " " + event.operation + ": " + event.title;
        for (const std::string& detail : event.details)
            story += " | " + detail;
        story += "\n";
    }
    return story;
}

const std::string lines_held_back = "[   10.000300] [PMX] fgPMX_DisplayModeReady is 1.\r\n"
                                    "[   10.000400] [PMX] VDP_SetClearVideo & Not Mix OSD..\r\n"
                                    "[   10.000500] Display Format Change Timer Set.\r\n";
const std::string told_held_back =
    "1-3 PMX_SetModeEx: a mode change, of which the log has the end | graphics wait for the display part, for 10000 ms "
    "at most | the display timer is set\n";

TEST(DecodeStory, LogFromTheMiddle_ForeignLinesStampsColoursAndCarriageReturns_TellsItAllTheSame)
{
    EXPECT_EQ(
        "2-2 PMX_SetFormatChangeFlag: the display part begins to switch: its flag is raised\n"
        "4-7 PMX_SetModeEx: a mode change, of which the log has the end | graphics wait for the display part, for "
        "10000 ms at most | the display timer is set\n"
        "8-11 PMX_SetFormatChangeFlag: the display part's flag is lowered, as when it has switched, 2.5 s after line 6 "
        "| graphics are mixed again, 2.5 s after line 6\n",
        told("et OSD Display mode.\r\n"
             "\x1b[32m[   10.000100] Display Format Change :1.\x1b[0m\r\n"
             "[   10.000200] eth0: link up\r\n"
             "[   10.000300] [PMX] fgPMX_DisplayModeReady is 1.\r\n"
             "[   10.000350] ir: key 0x1c\r\n"
             "[   10.000400] [PMX] VDP_SetClearVideo & Not Mix OSD..\r\n"
             "[   10.000500] Display Format Change Timer Set.\r\n"
             "[   12.500400] Display Format Change :0.\r\n"
             "[   12.500500] Set Osd Enable :1.\r\n"
             "[   12.500600] PMX_SetOsdEnable.\r\n"
             "[   12.500700] Set Osd Enable :0.\r\n"));
}

TEST(DecodeStory, TimerReleases_IsAProblem)
{
    EXPECT_EQ(told_held_back +
                  "! 4-8 _PMX_TmrIsr: the display timer has run out, 10.0 s after line 3: no answer of the "
                  "display part stands before it | graphics are mixed again, 10.0 s after line 2\n",
              told(lines_held_back + "[   20.000400] PMX timeout.\n"
                                     "[   20.000500] Display Format Change :0.\n"
                                     "[   20.000600] Set Osd Enable :1.\n"
                                     "[   20.000700] PMX_SetOsdEnable.\n"
                                     "[   20.000800] Set Osd Enable :0.\n"));
}

TEST(DecodeStory, VideoPlaneWaits_LetsGraphicsBackLater)
{
    EXPECT_EQ(told_held_back + "4-5 PMX_SetFormatChangeFlag: the display part's flag is lowered, as when it has "
                               "switched, 1.0 s after line 2 | nothing here lets graphics back, as when the video "
                               "plane driver does so later\n"
                               "6-7 PMX_SetOsdEnable: graphics return if they wait for it: the video plane driver lets "
                               "them | graphics are mixed again, 1.5 s after line 2\n",
              told(lines_held_back + "[   11.000400] Display Format Change :0.\n"
                                     "[   11.000500] Set Osd Enable :1.\n"
                                     "[   11.500400] PMX_SetOsdEnable.\n"
                                     "[   11.500500] Set Osd Enable :0.\n"));
}

TEST(DecodeStory, TimerOfAnEarlierChange_IsNoProblem)
{
    EXPECT_EQ(
        "1-5 _PMX_TmrIsr: the display timer has run out: no line before it has graphics wait for it | graphics are "
        "mixed again\n",
        told("PMX timeout.\nDisplay Format Change :0.\nSet Osd Enable :1.\nPMX_SetOsdEnable.\n"
             "Set Osd Enable :0.\n"));
}

TEST(DecodeStory, StillHeldBackAtTheEnd_IsSaid)
{
    EXPECT_EQ(told_held_back + "! 2-3 PMX_SetModeEx: nothing up to the log's end brings these graphics back\n",
              told(lines_held_back));
}

TEST(DecodeStory, NotWaited_FlagAndGraphicsBelongToTheModeChange)
{
    EXPECT_EQ(
        "1-6 PMX_SetModeEx: mode change requested (its outputs are logged at level 9) | no wait for the display "
        "part: HDMI was sent no new resolution | the mixer's format stays (HDMI changed: 0, TV encoders changed: ?) | "
        "graphics are mixed again\n",
        told("SetModeEx\n"
             "[PMX] fgHdmiExist:0, Not wait display part...\n"
             "Display Format Change :0.\n"
             "Set Osd Enable :1.\n"
             "PMX_SetOsdEnable.\n"
             "Set Osd Enable :0.\n"));
}

TEST(DecodeStory, ModeChange_NamesOutputsFormatAndFifthOsd)
{
    EXPECT_EQ("1-9 PMX_SetModeEx: mode change requested: digital port off, HDMI 720p 50 Hz, component 576p, composite "
              "576i; fifth OSD 2 | output PMX_OUTPUT_HDMI (1) is the first that is on, and gives the mixer mode "
              "RES_720P50HZ (9) | everything is programmed for mode RES_720P50HZ (9) at ? Hz\n"
              "9-9 : the log ends within a call: next comes \"PMX Finished to set OSD Display mode.\" of "
              "PMX_SetModeEx\n",
              told("SetModeEx\nCCIR(0, RES_480I)\nHDMI(1, RES_720P50HZ)\nCAV (1, RES_576P)\nCVBS(1, RES_576I)\n"
                   "CCIR(0, 0, 0, 0)\nOSD5(2)\nHD Exist(1)\nPMX Start to set OSD Display mode:9.\n"));
}

TEST(DecodeStory, AModeWithoutANameOfItsOwn_IsToldAsFarAsItIsPrinted)
{
    const auto told_of = [](const std::string& printed) {
        return told("SetModeEx\nCCIR(0, RES_480I)\nHDMI(1, " + printed +
                    ")\nCAV (0, RES_480I)\nCVBS(0, RES_480I)\nCCIR(0, 0, 0, 0)\nOSD5(0)\n");
    };
    EXPECT_NE(std::string::npos, told_of("(null)").find("HDMI a mode without a name (4K)"));
    EXPECT_NE(std::string::npos, told_of("(null)").find("gives the mixer mode without a name (4K)\n"));
    EXPECT_NE(std::string::npos, told_of("RES_1080P50HZ").find("gives the mixer mode RES_1080P50HZ (13)\n"));
}

TEST(DecodeStory, AllOutputsOff_IsAProblem)
{
    EXPECT_EQ("! 1-2 PMX_SetModeEx: mode change requested (its outputs are logged at level 9) | all outputs "
              "are off, and HDMI gives the mixer mode RES_1080I60HZ (10)\n",
              told("SetModeEx\n[PMX] Warning: Disable All output, set fmt as 10.\n"));
}

TEST(DecodeStory, RefusedMode_SaysThatNothingWasSetAndThatTheFlagIsLowered)
{
    EXPECT_EQ("! 1-6 PMX_SetModeEx: mode change requested (its outputs are logged at level 9) | refused by the "
              "capability word; nothing was set, and the display part's flag is lowered, not set | graphics are "
              "mixed again\n",
              told("SetModeEx\n"
                   "[PMX] PMX_SetModeEx, PMX_CheckCap error, set format change flag, wait display part...\n"
                   "Display Format Change :0.\nSet Osd Enable :1.\nPMX_SetOsdEnable.\nSet Osd Enable :0.\n"));
}

TEST(DecodeStory, SetModeThatDoesNothing_SaysWhatItMayBe)
{
    EXPECT_EQ("1-1 PMX_SetMode: one mode on all outputs: 1080p 60 Hz | no set-up stands behind it, as when it is "
              "refused by the capability word or set already\n"
              "2-2 PMX_SetBrightness: brightness 150 for HDMI\n",
              told("SetMode, RES_1080P60HZ\n[PMX] Seting Brightness: 0,150.\n"));
}

struct Conversion
{
    const char* lines;
    const char* details;
};

TEST(DecodeStory, EveryColourConversion_IsNamed)
{
    const Conversion conversions[] = {
        { "CC_A disable\nScaler CC disable, don't care\n", "converter A off | scaler's converter off (not used)" },
        { "CC_A disable\nScaler CC enable, 709->601\n", "converter A off | scaler's converter BT.709 to BT.601" },
        { "CC_A enable, 709->601\nScaler CC disable\n", "converter A BT.709 to BT.601 | scaler's converter off" },
        { "CC_A enable, 601->709\nScaler CC disable\n", "converter A BT.601 to BT.709 | scaler's converter off" },
    };
    for (const Conversion& one : conversions)
        EXPECT_EQ("1-3 PMX_ColorSpaceSetup: colours for 1080p 60 Hz from BT.601 | " + std::string(one.details) + "\n",
                  told("Mode(12), eMixerOutCS(0)\n" + std::string(one.lines)));
}

TEST(DecodeStory, SourceStarts_MasterColourSpaceAndColoursAreItsConsequence)
{
    EXPECT_EQ("1-8 PMX_VdpEnabled: video plane 0 starts | its pictures are BT.601 | colour space DRV_PMX_CS_YCBCR_6"
              "01 (0) is what port 0 (main video) asks for, over those before it | the master colour sp"
              "ace changes from DRV_PMX_CS_YCBCR_709 (1) to DRV_PMX_CS_YCBCR_601 (0) | a video plane is to be told "
              "BT.601 | colours for 480p from BT.601 | converter A off | "
              "scaler's converter off (not used)\n",
              told("VDP_0 Enabled\nVDP_0's Src Color Space = DRV_PMX_CS_YCBCR_601\n"
                   "[PMX] VDP_COMP_1 enabled and Color Space is 0.\n"
                   "[PMX] Master Color Space change from 1 to 0.\nInform Vdp CS(0)\n"
                   "Mode(2), eMixerOutCS(0)\nCC_A disable\nScaler CC disable, don't care\n"));
}

TEST(DecodeStory, Assertion_IsAProblemWithItsMeaning)
{
    EXPECT_EQ(
        "! 1-7 PMX_VdpEnabled: video plane 0 starts | its pictures are BT.601 | the master colour space changes from "
        "DRV"
        "_PMX_CS_YCBCR_709 (1) to DRV_PMX_CS_YCBCR_601 (0) | a video plane is to be told BT.601 | that video plane was "
        "passed over | a component of type PMX_COMP_TYPE_VDP (65) with id ? gave no table | ASSERTION: a video plane "
        "has no interface table and was passed over | colours for 480p "
        "from BT.601\n",
        told("VDP_0 Enabled\nVDP_0's Src Color Space = DRV_PMX_CS_YCBCR_601\n"
             "[PMX] Master Color Space change from 1 to 0.\nInform Vdp CS(0)\n"
             "Query VDP Interface Fail!\nASSERT 0, src/driver/pmx/pmx_source.cpp:177\nMode(2), eMixerOutCS(0)\n"));
}

TEST(DecodeStory, NoSink_IsWhyNobodyIsWaitedFor)
{
    EXPECT_THAT(told("SetModeEx\n[PMX] fgHdmiExist:1, Not wait display part...\n"),
                testing::HasSubstr("nobody is waited for: no sink is there"));
}

struct Because
{
    const char* lines;
    const char* reason;
};

TEST(DecodeStory, WhatLinesDetermine_IsToldAsTheReason)
{
    constexpr const char* refusal =
        "[PMX] PMX_SetModeEx, PMX_CheckCap error, set format change flag, wait display part...\n";
    const std::string request = "SetModeEx\nCCIR(0, RES_480I)\nHDMI(1, RES_1080P50HZ)\nCAV (1, RES_576P)\n"
                                "CVBS(1, RES_576I)\nCCIR(0, 0, 0, 0)\nOSD5(2)\n";
    const std::string refused = request + refusal;
    const std::string never = std::string("SetModeEx\n[PMX] Warning: Disable All output, set fmt as 49.\n") + refusal;
    const Because cases[] = {
        { refused.c_str(), "capability bit 9 (RES_1080P50HZ) is clear in ?" },
        { never.c_str(), "no product admits mode RES_2160P (49)" },
        { "[PMX] Seting Hue: 1,100.\n[PMX] Seting Hue fail: 1,100.\n", "capability bit 23 (hue) is clear in ?" },
        { "COMP ID to LOCAL ID Fail, CompType = 7, CompId = 3\n", "a component of type 7 with id 3 has no input port" },
        { "[PMX0] Set PlaneOrder = [0x76543211]\n[PMX]u1PlnSel[0]=1\n[PMX]u1PlnSel[1]=1\n"
          "Plane[0] and Plane[1] connect to the same input source!\n",
          "source 1 feeds two planes, 0 and 1" },
        { "Plane[0] and Plane[1] connect to the same input source!\n", "source ? feeds two planes, 0 and 1" },
        { "Invalid VDP Id\n", "the hardware has no video plane ?: they are 0 and 1" },
        { "Mode(12), eMixerOutCS(2)\nInvalid Color Space Id\n",
          "the mixer is never set up for colour space DRV_PMX_CS_RGB (2)" },
        { "Mode(255), eMixerOutCS(1)\n", "mode 255 has no colour standard: the converters stay as they are" },
        { "Fail to register IID_IPMX of PMX Comp 0\n", "the interface manager refused with ?" },
        { "i4PMX_Uninit u4Case 1\ni4PMX_Uninit return -1\n", "the operating system did not delete mutex ?" },
        { "SetMode, RES_1080P60HZ\nMode(12), eMixerOutCS(1)\n",
          "everything is programmed for mode RES_1080P60HZ (12) at ? Hz" },
        { "OSD_1 Enabled\nOSD_1's Src Color Space = DRV_PMX_CS_YCBCR_601\n",
          "colour space DRV_PMX_CS_YCBCR_601 (0) is what port 3 (OSD 1) asks for, over those before it" },
        { "[PMX0] Set PlaneOrder = [0x76543211]\n[PMX]u1PlnSel[0]=1\n[PMX]u1PlnSel[1]=2\n"
          "Plane[0] and Plane[1] connect to the same input source!\n",
          "source ? feeds two planes, 0 and 1" },
        { "[PMX0] Set PlaneOrder = [0x76543211]\n[PMX]u1PlnSel[9]=1\n"
          "Plane[9] and Plane[1] connect to the same input source!\n",
          "source ? feeds two planes, 9 and 1" },
        { "Plane[-1] and Plane[1] connect to the same input source!\n", "source ? feeds two planes, ?" },
        { "Plane[1] and Plane[-1] connect to the same input source!\n", "source ? feeds two planes, ?" },
        { "Invalid Color Space Id\n", "the mixer is never set up for colour space ?" },
        { "SetModeEx\n[PMX] Warning: Disable All output, set fmt as -1.\n",
          "all outputs are off, and HDMI gives the mixer mode ?" },
        { "OSD_1 Enabled\nOSD_99999999999's Src Color Space = DRV_PMX_CS_YCBCR_601\n",
          "colour space DRV_PMX_CS_YCBCR_601 (0) is what port ? asks for, over those before it" },
        { "[PMX] Gfx enabled and Color Space is 1.\n",
          "colour space DRV_PMX_CS_YCBCR_709 (1) is what port ? asks for, over those before it" },
        { "[PMX]_arPmxConf[ucPmxId].ucMode=33\n",
          "mode RES_3D_576I25HZ (33) is none to start with: 480p takes its place" },
        { "Display Format Change Timer Set.\nASSERT x_timer_stop(_arPmxDispPartStatus.hPMXTimer) == OSR_OK, "
          "src/driver/pmx/pmx_handshake.cpp:72\n",
          "the operating system refused the display timer" },
    };
    for (const Because& one : cases)
        EXPECT_THAT(told(one.lines), testing::HasSubstr(std::string(" | ") + one.reason)) << one.lines;
}

TEST(DecodeStory, WhatLinesDoNotDetermine_HasNoReason)
{
    const char* const logs[] = {
        "SetModeEx\nHDMI(1, RES_1080P50HZ)\n",            // the digital port's line is missing
        "Mode(12), eMixerOutCS(1)\n",                     // a mode with a standard
        "Mode(99999999999), eMixerOutCS(4294967297)\n",   // numbers that the layer cannot print
        "i4PMX_Uninit u4Case 1\ni4PMX_Uninit return 0\n", // it was deleted, or not started
        "[PMX]_arPmxConf[ucPmxId].ucMode=12\n",           // a mode to start with
        "[PMX]_arPmxConf[ucPmxId].ucMode=-1\n",           // a number that the layer cannot print
        "[PMX] fgHdmiEx\nusb 1-1: new device\nist:1, Not wait display part...\n", // whose value may be another's
        "PMX_SetOsdEnable.\n",
        "OSD_1's Src Color Space = DRV_PMX_CS_RGB\n",
        "SetMode, RES_1080P60HZ\n",
    };
    for (const char* const log : logs)
    {
        for (const Event& event : pmxboard::decode::tell(read_log(log)).events)
            EXPECT_TRUE(event.reasons.empty()) << log;
    }
}

TEST(DecodeStory, Modes4K_AreToldByTheirNumbers)
{
    EXPECT_THAT(told("[PMX]_arPmxConf[ucPmxId].ucMode=47\n"), testing::HasSubstr("starts from 4K2K 23.976 Hz"));
    EXPECT_THAT(told("[PMX]_arPmxConf[ucPmxId].ucMode=48\n"), testing::HasSubstr("starts from 4K2K 24 Hz"));
}

TEST(DecodeStory, AssertionOfAnUnknownExpression_IsToldByItsFile)
{
    EXPECT_EQ("! 1-1 PMX_ColorSpaceSetup: ASSERTION: an assertion of pmx_colour.cpp\n",
              told("ASSERT fgMine, src/driver/pmx/pmx_colour.cpp:12\n"));
}

TEST(DecodeStory, ColoursSetUpTwice_AreTwoEvents)
{
    const std::string one = "Mode(12), eMixerOutCS(0)\nCC_A disable\nScaler CC disable\n";
    const std::string set_up =
        "PMX_ColorSpaceSetup: colours for 1080p 60 Hz from BT.601 | converter A off | scaler's converter off\n";
    EXPECT_EQ("1-3 " + set_up + "4-6 " + set_up, told(one + one));
}

TEST(DecodeStory, AFlagLoweredLater_IsNotTheTimers)
{
    EXPECT_EQ("1-1 _PMX_TmrIsr: the display timer has run out: no line before it has graphics wait for it\n"
              "2-2 PMX_SetFormatChangeFlag: the display part's flag is lowered, as when it has switched\n"
              "2-2 : the log ends within a call: next comes \"Set Osd Enable :%d.\" of _PMX_TmrIsr\n",
              told("[   20.000000] PMX timeout.\n[   22.000000] Display Format Change :0.\n"));
}

TEST(DecodeStory, GraphicsAreBack_WhenTheyWaitNoLongerBehindTheirReturn)
{
    EXPECT_THAT(told("PMX_SetOsdEnable.\nSet Osd Enable :0.\n"), testing::HasSubstr("graphics are mixed again"));
    EXPECT_THAT(told("PMX_SetOsdEnable.\nASSERT x_timer_stop(_arPmxDispPartStatus.hPMXTimer) == OSR_OK, "
                     "src/driver/pmx/pmx_handshake.cpp:72\nSet Osd Enable :0.\n"),
                testing::HasSubstr("graphics are mixed again"));
    EXPECT_THAT(told("PMX_SetOsdEnable.\nSet Osd Enable :1.\n"),
                testing::Not(testing::HasSubstr("graphics are mixed again")));
}

TEST(DecodeStory, AStampFromBefore_TellsNoTime)
{
    EXPECT_THAT(told("[   10.500000] [PMX] VDP_SetClearVideo & Not Mix OSD..\n"
                     "[   10.500000] Display Format Change Timer Set.\nPMX_Stop\n"
                     "[   10.200000] Display Format Change :0.\n"),
                testing::HasSubstr("as when it has switched, after line 1"));
}

TEST(DecodeStory, WholeSeconds_AreNotShownWithTenths)
{
    EXPECT_THAT(
        told("12:00:00 [PMX] VDP_SetClearVideo & Not Mix OSD..\n12:00:00 Display Format Change Timer Set.\n"
             "12:00:03 Display Format Change :0.\n"),
        testing::HasSubstr("the display part's flag is lowered, as when it has switched, about 3 s after line 1"));
}

TEST(DecodeStory, OverMidnight_TimeGoesOn)
{
    EXPECT_THAT(told("23:59:59.500 [PMX] VDP_SetClearVideo & Not Mix OSD..\n"
                     "23:59:59.500 Display Format Change Timer Set.\n00:00:01.500 Display Format Change :0.\n"),
                testing::HasSubstr("2.0 s after line 1"));
}

const std::string lines_back = "Display Format Change :0.\nSet Osd Enable :1.\nPMX_SetOsdEnable.\nSet Osd Enable :0.\n";
const std::string lines_start = "TESTPMX: Get pard ID:0.\nTESTPMX: Get Test Data :12, 0x       c.\n"
                                "[PMX]_arPmxConf[ucPmxId].ucMode=12\n[PMX] create a timer \n";

struct Start
{
    const char* what;
    std::string lines;
    const char* told;
};

TEST(DecodeStory, AStart_EndsAllThatWasBefore)
{
    const Start starts[] = {
        { "boot loader", "U-Boot 2011.03 (Mar 01 2011)\n" + lines_back, "nothing before the new start brings" },
        { "kernel", "[    0.000000] Linux version 2.6.35\n" + lines_back, "nothing before the new start brings" },
        { "clock", "[    1.500000] Display Format Change :0.\n" + lines_back, "nothing before the new start brings" },
        { "board", "> power-on\n" + lines_back, "nothing before the new start brings" },
        { "named board", "> power-on default\n" + lines_back, "nothing before the new start brings" },
        { "layer", lines_start + lines_back, "nothing before this start-up brings" },
    };
    for (const Start& one : starts)
    {
        const std::string story = told(lines_held_back + one.lines);
        EXPECT_THAT(story, testing::HasSubstr(one.told)) << one.what;
        EXPECT_THAT(story, testing::HasSubstr("graphics are mixed again\n")) << one.what;
        EXPECT_THAT(story, testing::Not(testing::HasSubstr("graphics are mixed again,"))) << one.what;
    }
}

TEST(DecodeStory, AVersionWithinASentence_IsNoStart)
{
    EXPECT_THAT(told(lines_held_back + "player runs on Linux version 2.6.35\n" + lines_back),
                testing::Not(testing::HasSubstr("begins anew")));
}

TEST(DecodeStory, ALogThatEndsWithinACall_TellsWhatItsConsoleWouldShowNext)
{
    EXPECT_THAT(told("i4PMX_Uninit u4Case 1\n"),
                testing::HasSubstr("within a call: next comes \"i4PMX_Uninit return %d\" of i4PMX_Uninit\n"));
}

const std::string lines_colours = "Mode(12), eMixerOutCS(1)\nCC_A disable\n";
const std::string lines_one_mode = "SetMode, RES_1080P60HZ\n" + lines_colours + "Scaler CC disable\n";

struct Hole
{
    std::string lines;
    const char* what; ///< must stand there
};

TEST(DecodeStory, WhatCannotBe_IsNamedAGap)
{
    const Hole holes[] = {
        { lines_held_back + "[   34.900000] PMX timeout.\n", "\"PMX timeout.\"" },
        { lines_held_back + "[   15.000000] PMX timeout.\n", "another \"Display Format Change Timer Set.\"" },
        { lines_held_back + "[   60.000000] eth0: link up\n", "\"PMX timeout.\"" },
        { lines_start + "[PMX] fgPMX_DisplayModeReady is 1.\n", "\"Display Format Change :1\"" },
        { lines_start + "PMX_SetOsdEnable.\nSet Osd Enable :0.\n", "\"Set Osd Enable :1\"" },
        { "CC_A disable\nPMX_Init\n" + lines_start + "[PMX] Master Color Space change from 0 to 1.\n",
          "another change of the master colour space" },
        { lines_start + "HD Exist(1)\n", "what leads to \"HD Exist(1)\"" },
        { lines_start + "SetModeEx\nCCIR(0, RES_480I)\nSetModeEx\n", "\"HDMI(%d, %s)\" of PMX_SetModeEx" },
        { lines_start + "SetModeEx\nCCIR(0, RES_480I)\nDisplay Format Change Timer Set.\n", "\"HDMI(%d, %s)\"" },
        { lines_start + "Display Format Change :1.\n[PMX] fgPMX_DisplayModeReady is 0.\n",
          "\"Display Format Change :0\"" },
        { lines_start + "SetModeEx\n[PMX] VDP_SetClearVideo & Not Mix OSD..\nDisplay Format Change Timer Set.\n",
          "\"Display Format Change :1\"" },
        { lines_start + "VDP_0 Enabled\nVDP_0's Src Color Space = DRV_PMX_CS_YCBCR_601\n"
                        "[PMX] Master Color Space change from 1 to 0.\nInform Vdp CS(1)\n",
          "another change of the master colour space" },
        { lines_one_mode + "Mode(9) CS(1)\n", "a mode change" },
        { lines_start + lines_colours + "Scaler CC disable Scaler CC disable\n",
          "what leads to \"Scaler CC disable\"" },
        // Nothing takes so long: the call of the first line is over.
        { lines_start + "[   10.000000] Tp,Id=65,0\n[   50.000000] VDP_0 Disabled\nComp(0) connect\n",
          "what leads to \"Comp(0) connect\"" },
    };
    for (const Hole& one : holes)
        EXPECT_THAT(told(one.lines), testing::HasSubstr("missing")) << one.lines;
    for (const Hole& one : holes)
        EXPECT_THAT(told(one.lines), testing::HasSubstr(one.what)) << one.lines;
}

TEST(DecodeStory, ANumberThatTheLayerCannotPrint_TellsNothing)
{
    const std::string known = "CC_A disable\nPMX_Init\n" + lines_start;
    for (const std::string& log : { known + "[PMX] Master Color Space change from 99999999999999999999 to 1.\n",
                                    lines_one_mode + "Mode(99999999999999999999) CS(1)\n" })
        EXPECT_THAT(told(log), testing::Not(testing::HasSubstr("missing"))) << log;
}

TEST(DecodeStory, AnswersOnBothSidesOfACallThatWasBrokenOff_AreTwo)
{
    const std::string story = told(lines_start + "[   10.000000] Tp,Id=65,0\n"
                                                 "[   20.000000] [PMX] fgPMX_DisplayModeReady is 1.\n"
                                                 "[   45.000000] [PMX] fgPMX_DisplayModeReady is 0.\n");
    EXPECT_THAT(story, testing::HasSubstr("whether graphics may be shown: no, the display part switches\n"));
    EXPECT_THAT(story, testing::HasSubstr("whether graphics may be shown: yes\n"));
}

TEST(DecodeStory, ALevelThatIsRaised_IsNoGap)
{
    const std::string start = told("TESTPMX: Get pard ID:0.\nTESTPMX: Get Test Data :12, 0x       c.\n"
                                   "[PMX]_arPmxConf[ucPmxId].ucMode=12\n[PMX] create a timer \nSetModeEx\n"
                                   "[PMX] Master Color Space change from 0 to 1.\nMode(9), eMixerOutCS(1)\n"
                                   "CC_A disable\nScaler CC disable\n");
    EXPECT_THAT(start, testing::Not(testing::HasSubstr("missing")));
}

TEST(DecodeStory, BehindAGap_WhatLastedIsAssumed)
{
    const auto story = pmxboard::decode::tell(read_log("[PMX] VDP_SetClearVideo & Not Mix OSD..\n"
                                                       "Display Format Change Timer Set.\nHD Exist(1)\n" +
                                                       lines_back));
    const Event& last = story.events.back();
    EXPECT_EQ(std::vector<std::string>{ "graphics are mixed again" }, last.details);
    EXPECT_EQ(std::vector<std::string>{ "graphics are mixed again, after line 1" }, last.assumed);
}

TEST(DecodeStory, ADoubledLine_IsNotTwoEvents)
{
    EXPECT_EQ("1-1 PMX_Stop: stopped: mutex, timer and registrations stay\n",
              told("[   1.000001] PMX_Stop\n[   1.000001] PMX_Stop\n"));
    const std::string request =
        "CC_A disable\nSetModeEx\nSetModeEx\nCCIR(0, RES_480I)\nCCIR(0, RES_480I)\nHDMI(0, RES_480I)\n";
    EXPECT_THAT(told(request), testing::HasSubstr("2-6 PMX_SetModeEx: mode change requested: digital port off, HDMI "
                                                  "off\n"));
    const std::string colours = told(lines_start + lines_colours + "Scaler CC disable\nScaler CC disable\n");
    EXPECT_THAT(colours, testing::EndsWith(" | converter A off | scaler's converter off\n"));
    EXPECT_THAT(colours, testing::Not(testing::HasSubstr("missing")));
}

TEST(DecodeStory, LinesOutOfOrder_AreTakenByTheirStamps)
{
    EXPECT_EQ(told_held_back, told("[   10.000300] [PMX] fgPMX_DisplayModeReady is 1.\n"
                                   "[   10.000500] Display Format Change Timer Set.\n"
                                   "[   10.000400] [PMX] VDP_SetClearVideo & Not Mix OSD..\n")
                                  .substr(0, told_held_back.size()));
}

TEST(DecodeStory, ATraceWhoseFirstLineIsCut_IsOne)
{
    EXPECT_EQ(
        "2-2 PMX_Stop: stopped: mutex, timer and registrations stay\n",
        told("ogram\":0}\n{\"sequence\":7,\"time_us\":5,\"kind\":\"log\",\"level\":1,\"text\":\"PMX_Stop\\n\"}\n"));
}

TEST(DecodeStory, ATraceInJsonLines_IsReadAsItsConsole)
{
    EXPECT_EQ("1-1 PMX_Stop: stopped: mutex, timer and registrations stay\n"
              "2-2 : the system begins anew: nothing of what was lasts\n"
              "2-2 PMX_Stop: stopped: mutex, timer and registrations stay\n",
              told("{\"sequence\":7,\"time_us\":5,\"kind\":\"log\",\"level\":1,\"text\":\"PMX_Stop\\n\"}\n"
                   "{\"sequence\":1,\"time_us\":0,\"kind\":\"log\",\"level\":1,\"text\":\"PMX_Stop\\n\"}\n"
                   "{\"sequence\":2,\"time_us\":0,\"kind\":\"call\",\"function\":\"PMX_Stop\"}\n"
                   "{\"sequence\":3,\"time_us\""));
}

TEST(DecodeStory, NothingOfTheLayer_NoEvents)
{
    EXPECT_EQ("", told("eth0: link up\nmmc0: card\n"));
    EXPECT_EQ("", told(""));
}

} // namespace
