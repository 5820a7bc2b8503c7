// SPDX-License-Identifier: MIT OR GPL-2.0-only
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
    "1-3 PMX_SetModeEx: a mode change, of which the log has the end | graphics held back until the display part has "
    "switched | the display timer runs\n";

TEST(DecodeStory, LogFromTheMiddle_ForeignLinesStampsColoursAndCarriageReturns_TellsItAllTheSame)
{
    EXPECT_EQ(
        "2-2 PMX_SetFormatChangeFlag: the display part begins to switch: its flag is raised\n"
        "4-7 PMX_SetModeEx: a mode change, of which the log has the end | graphics held back until the display part "
        "has switched | the display timer runs\n"
        "8-11 PMX_SetFormatChangeFlag: the display part has switched after 2.5 s | graphics are back\n",
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
    EXPECT_EQ(told_held_back + "! 4-8 _PMX_TmrIsr: the timer runs out after 10.0 s: the display part has not answered "
                               "| graphics are back\n",
              told(lines_held_back + "[   20.000400] PMX timeout.\n"
                                     "[   20.000500] Display Format Change :0.\n"
                                     "[   20.000600] Set Osd Enable :1.\n"
                                     "[   20.000700] PMX_SetOsdEnable.\n"
                                     "[   20.000800] Set Osd Enable :0.\n"));
}

TEST(DecodeStory, VideoPlaneWaits_LetsGraphicsBackLater)
{
    EXPECT_EQ(told_held_back + "4-5 PMX_SetFormatChangeFlag: the display part has switched after 1.0 s | graphics go "
                               "on waiting, for the video plane driver\n"
                               "6-7 PMX_SetOsdEnable: graphics are back after 1.5 s: the video plane driver let them\n",
              told(lines_held_back + "[   11.000400] Display Format Change :0.\n"
                                     "[   11.000500] Set Osd Enable :1.\n"
                                     "[   11.500400] PMX_SetOsdEnable.\n"
                                     "[   11.500500] Set Osd Enable :0.\n"));
}

TEST(DecodeStory, TimerOfAnEarlierChange_IsNoProblem)
{
    EXPECT_EQ("1-4 _PMX_TmrIsr: the timer of an earlier mode change runs out; graphics are back already\n",
              told("PMX timeout.\nDisplay Format Change :0.\nSet Osd Enable :1.\nPMX_SetOsdEnable.\n"));
}

TEST(DecodeStory, StillHeldBackAtTheEnd_IsSaid)
{
    EXPECT_EQ(told_held_back + "! 2-3 PMX_SetModeEx: graphics are still held back where the log ends\n",
              told(lines_held_back));
}

TEST(DecodeStory, NotWaited_FlagAndGraphicsBelongToTheModeChange)
{
    EXPECT_EQ("1-6 PMX_SetModeEx: mode change requested (its outputs are logged at level 9) | no wait for the display "
              "part\n",
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
              "576i; fifth OSD 2 | mixer format 720p 50 Hz\n",
              told("SetModeEx\nCCIR(0, RES_480I)\nHDMI(1, RES_720P50HZ)\nCAV (1, RES_576P)\nCVBS(1, RES_576I)\n"
                   "CCIR(0, 0, 0, 0)\nOSD5(2)\nHD Exist(1)\nPMX Start to set OSD Display mode:9.\n"));
}

TEST(DecodeStory, AllOutputsOff_IsAProblem)
{
    EXPECT_EQ("! 1-2 PMX_SetModeEx: mode change requested (its outputs are logged at level 9) | every output off; "
              "mixer format 1080i 60 Hz\n",
              told("SetModeEx\n[PMX] Warning: Disable All output, set fmt as 10.\n"));
}

TEST(DecodeStory, RefusedMode_SaysThatNothingWasSetAndThatTheFlagIsLowered)
{
    EXPECT_EQ("! 1-6 PMX_SetModeEx: mode change requested (its outputs are logged at level 9) | refused by the "
              "capability word; nothing was set, and the display part's flag is lowered, not set\n",
              told("SetModeEx\n"
                   "[PMX] PMX_SetModeEx, PMX_CheckCap error, set format change flag, wait display part...\n"
                   "Display Format Change :0.\nSet Osd Enable :1.\nPMX_SetOsdEnable.\nSet Osd Enable :0.\n"));
}

TEST(DecodeStory, SetModeThatDoesNothing_SaysWhatItMayBe)
{
    EXPECT_EQ("1-1 PMX_SetMode: one mode on all outputs: 1080p 60 Hz | no set-up follows: refused by the capability "
              "word, or set already\n"
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
    EXPECT_EQ("1-7 PMX_VdpEnabled: video plane 0 starts | its pictures are BT.601 | master colour space changes from "
              "BT.709 to BT.601 | a video plane is told BT.601 | colours for 480p from BT.601 | converter A off\n",
              told("VDP_0 Enabled\nVDP_0's Src Color Space = DRV_PMX_CS_YCBCR_601\n"
                   "[PMX] VDP_COMP_1 enabled and Color Space is 0.\n"
                   "[PMX] Master Color Space change from 1 to 0.\nInform Vdp CS(0)\n"
                   "Mode(2), eMixerOutCS(0)\nCC_A disable\n"));
}

TEST(DecodeStory, Assertion_IsAProblemWithItsMeaning)
{
    EXPECT_EQ("! 1-3 PMX_VdpEnabled: video plane 0 starts | that video plane has no interface table and was passed "
              "over | ASSERTION: a video plane has no interface table and was passed over\n",
              told("VDP_0 Enabled\nQuery VDP Interface Fail!\nASSERT 0, src/driver/pmx/pmx_source.cpp:177\n"));
}

TEST(DecodeStory, NothingOfTheLayer_NoEvents)
{
    EXPECT_EQ("", told("eth0: link up\nmmc0: card\n"));
    EXPECT_EQ("", told(""));
}

} // namespace
