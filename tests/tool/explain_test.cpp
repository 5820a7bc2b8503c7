// SPDX-License-Identifier: MIT OR GPL-2.0-only
// `explain` and `why`: each reason there is, as a person reads it, and what would be accepted instead.
#include <gtest/gtest.h>

#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "scenario_run.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/explanation.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/state/now.h"

namespace
{

using tool_test::diagnostics;

class Explain : public testing::Test
{
protected:
    Explain() : m_output({ .to = &m_shown }), m_session(m_output, "default", ".") {}

    std::string shown_by(const std::string& line)
    {
        m_shown.str({});
        m_session.run_line(line);
        return m_shown.str();
    }

    /** Carry lines out whose own output is of no interest. */
    void carry_out(const std::vector<std::string>& lines)
    {
        for (const std::string& line : lines)
            m_session.run_line(line);
    }

    std::ostringstream m_shown;
    pmxboard::Output m_output;
    pmxboard::Session m_session;
};

/** What a command is told, after what was done before. */
struct Told
{
    std::vector<std::string> before;
    std::string command;
    std::vector<std::string> sentences; ///< among others, in this order
    std::vector<std::string> accepted;
};

constexpr const char* held = "outputs hdmi=720p50";

const Told each_reason[] = {
    { { "PMX_Init" },
      "PMX_SetBrightness 3 20 1",
      { "there is no mixer 3: the one mixer is 0" },
      { "PMX_SetBrightness 0 20 1" } },
    { {}, "i4PmxSetMode 0x201 RES_480P 60 0", { "there is no mixer 1: the one mixer is 0" }, {} },
    { {}, "PMX_GetMode 0 null", { "argument 2 is a null pointer" }, { "PMX_GetMode 0" } },
    { {}, "PMX_GetOutSize 0 null null", { "argument 2 is a null pointer" }, {} },
    { {}, "PMX_GetOutSize 0", {}, {} },
    { { "PMX_Init" },
      "PMX_SetMode 0 RES_2D_576I50HZ 50 0",
      { "no product admits mode RES_2D_576I50HZ (38)" },
      { "PMX_SetMode 0 RES_1080I50HZ 50 0" } },
    { { "poke u4Capability 0x7FFBBFFF" },
      "PMX_SetMode 0 RES_1080P29_97HZ 29 0",
      { "capability bit 14 (RES_1080P29_97HZ, RES_3D_1080P23HZ_TB) is clear in 0x7FFBBFFF" },
      { "PMX_SetMode 0 RES_1080P30HZ 30 0" } },
    { { "poke u4Capability 0x7FFBFDFF" },
      "outputs hdmi=1080p50 composite=576i",
      { "output PMX_OUTPUT_HDMI (1) is the first that is on, and gives the mixer mode RES_1080P50HZ (13)",
        "capability bit 9 (RES_1080P50HZ) is clear in 0x7FFBFDFF" },
      { "outputs hdmi=1080p60 composite=576i" } },
    { { "poke u4Capability 0x7FFBFDFF" },
      "outputs component=off hdmi=1080p50",
      { "capability bit 9 (RES_1080P50HZ) is clear in 0x7FFBFDFF" },
      { "outputs component=off hdmi=1080p60" } },
    { { "poke u4Capability 0x7FFBFFFE" },
      "outputs hdmi=off",
      { "all outputs are off, and HDMI gives the mixer mode RES_480I (0)" },
      {} },
    { { "poke u4Capability 0x7FFBFDFF" },
      "PMX_SetMode 0 RES_1080P50HZ 55 0",
      { "capability bit 9 (RES_1080P50HZ) is clear in 0x7FFBFDFF" },
      { "PMX_SetMode 0 RES_1080P60HZ 55 0" } },
    { { "poke u4Capability 0x7FFBFDFF" },
      "PMX_SetModeEx 0 [[0], {fgOutputEnable=1, eResMode=RES_1080P50HZ, u4VFreq=50, "
      "eCcirDrvInfo={eDgoMode=CCIR_656_MODE}}, [0], [0]] 50 0 0",
      { "capability bit 9 (RES_1080P50HZ) is clear in 0x7FFBFDFF" },
      { "PMX_SetModeEx 0 [{fgOutputEnable=0}, {fgOutputEnable=1, eResMode=RES_1080P60HZ, u4VFreq=50, "
        "eCcirDrvInfo={eDgoMode=CCIR_656_MODE, eDgoFmt=CCIR_NON_USED, eDgiMode=CCIR_INVALID, "
        "eDgiFmt=CCIR_NON_USED}}, {fgOutputEnable=0}, {fgOutputEnable=0}] 60 0 0" } },
    { { "PMX_Init" },
      "PMX_SetModeEx 0 [[0],[0,RES_2160P],[0],[0]] 60 0 0",
      { "all outputs are off, and HDMI gives the mixer mode RES_2160P (49)", "no product admits mode RES_2160P (49)" },
      { "PMX_SetModeEx 0 [{fgOutputEnable=0}, {fgOutputEnable=0, eResMode=RES_1080P60HZ}, {fgOutputEnable=0}, "
        "{fgOutputEnable=0}] 60 0 0" } },
    { { "PMX_Init" },
      "PMX_SetMode 0 RES_2160P 50 0",
      { "no product admits mode RES_2160P (49)" },
      { "PMX_SetMode 0 RES_1080P50HZ 50 0" } },
    { { "poke u4Capability 0" }, "PMX_SetGamma 0 1", { "capability bit 20 (gamma) is clear in 0x00000000" }, {} },
    { { "PMX_Init" }, "PMX_Init", { "the layer has been started already" }, {} },
    { {}, "PMX_Stop", { "the layer is not started: its mark is 0" }, {} },
    { { "PMX_SetCBEnable 0 1" }, "PMX_SetCBEnable 0 1", { "it is set to 1 already" }, {} },
    { {},
      "PMX_EnableVideoPlane 0 2",
      { "video plane 2 is not switched here: plane 1 sits in the second mixer plane" },
      {} },
    { {}, "PMX_Printf 3 \"text\"", { "level 3 is not admitted by the bits 0x00000000" }, {} },
    { {}, "PMX_Printf -1 \"text\"", { "level -1 is not admitted by the bits 0x00000000" }, {} },
    { {},
      "i4Pmx_Connect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_OSD 9",
      { "a component of type PMX_COMP_TYPE_OSD (176) with id 9 has no input port" },
      {} },
    { {},
      "i4Pmx_Connect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_VDP 0x104",
      { "a component of type PMX_COMP_TYPE_VDP (65) with id 260 has no input port" },
      {} },
    { {},
      "PMX_VdpEnabled 0 1 720 576 1",
      { "nobody has connected video plane 1: port 1 (second video) is empty" },
      { "i4Pmx_Connect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_VDP 1", "PMX_VdpEnabled 0 1 720 576 1" } },
    { {},
      "PMX_SetArbPlaneOrder 0 0x76343210",
      { "source 3 feeds two planes, 3 and 5" },
      { "PMX_SetArbPlaneOrder 0 0x76543210" } },
    { { "fault PMX_HalSetPlaneOrder 1" },
      "PMX_SetArbPlaneOrder 0 0x76543210",
      { "the mixer hardware refused the order, which stays stored" },
      {} },
    { { "fault PMX_HalGetPlaneOrder 1" },
      "PMX_GetArbPlaneOrder 0",
      { "the mixer hardware cannot report its order" },
      {} },
    { {}, "PMX_SetPlaneOrder 0 1 8", { "there is no position 8: the last one is 7" }, { "PMX_SetPlaneOrder 0 1 7" } },
    { {}, "PMX_GetSwapEnable 0 0", { "there is no swap 0: they are 1 to 6" }, {} },
    { {},
      "PMX_SetTVSystem 0 59 1",
      { "no TV system has 59 Hz: they have 24, 25, 30, 50 or 60" },
      { "PMX_SetTVSystem 0 60 1" } },
    { { "fault fgPmxDrvSetAvd 0" },
      "PMX_SetAspectRatio 0 ASP_4_3",
      { "the HDMI/AV driver refused command PMX_CHG_HDMI_VIDEO_ASPECT_RATIO (1) with value 2" },
      {} },
    { { "fault fgPmxDrvSetAvd 0" },
      "PMX_SetHdmiDeepColor 0 12",
      { "the HDMI/AV driver refused command PMX_CHG_DEEP_COLOR_BIT (8) with value 12" },
      {} },
    { { "fault fgPmxDrvGetAvdInfo 0" },
      "PMX_ChkSupportedRes 0 RES_480P 60",
      { "the HDMI/AV driver has no answer for mode RES_480P (2) at 60 Hz" },
      {} },
    { {},
      "PMX_SetDigitalOutRgb 0 5",
      { "HDMI has no code for colour format 5: the last one is 4" },
      { "PMX_SetDigitalOutRgb 0 PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB" } },
    { {}, "PMX_SetExternalChipSetting 99 0", { "the external chip has no setting 99" }, {} },
    { {}, "PMX_VdpGetPlanePosition 0 2", { "the hardware has no video plane 2: they are 0 and 1" }, {} },
    { {},
      "PMX_ColorSpaceSetup DRV_PMX_CS_RGB RES_480P",
      { "the mixer is never set up for colour space DRV_PMX_CS_RGB (2)" },
      { "PMX_ColorSpaceSetup DRV_PMX_CS_YCBCR_709 RES_480P" } },
    { {},
      "PMX_ColorSpaceSetup DRV_PMX_CS_YCBCR_601 RES_2160P",
      { "mode RES_2160P (49) has no colour standard: the converters stay as they are" },
      { "PMX_ColorSpaceSetup DRV_PMX_CS_YCBCR_601 RES_1080P60HZ" } },
    { { "source vdp0 connect", "fault i4ImQueryInterface -1" },
      "PMX_InformVdpColorSpace 0",
      { "a component of type PMX_COMP_TYPE_VDP (65) with id 0 gave no table" },
      {} },
    { { "fault i4ImRegisterInterface2 -5" },
      "i4PmxRegisterIM PMX_COMP_TYPE_PMX 0",
      { "the interface manager refused with -5" },
      {} },
    { {}, "i4PmxVdpDisabled 0", { "source events through the table are inert: only the direct operation counts" }, {} },
    { { "PMX_Init", "fault x_sema_delete -1" },
      "i4PMX_Uninit 0",
      { "the operating system did not delete mutex 0x1" },
      {} },
    { {}, "PMX_SetOsdEnable", { "no graphics are owed their return" }, {} },
    { {}, "PMX_SetAspectRatioNext 0", { "no aspect ratio waits: 0 is in force" }, {} },
    { { "PMX_Init" },
      "PMX_SetMode 0 RES_720P50HZ 50 0",
      { "the mixer was set to mode RES_1080P60HZ (12) at 60 Hz",
        "everything is programmed for mode RES_720P50HZ (9) at 50 Hz" },
      {} },
    { { "PMX_Init", "PMX_SetMode 0 RES_720P50HZ 50 0" },
      "PMX_SetMode 0 RES_720P50HZ 50 0",
      { "mode RES_720P50HZ (9) at 50 Hz is what runs already: nothing is programmed" },
      {} },
    { { "PMX_Init", held }, held, { "the mixer's format stays (HDMI changed: 0, TV encoders changed: 0)" }, {} },
    { { "PMX_Init", "source osd2 connect", "source osd2 start 720x576 ycbcr" },
      "source osd2 start 720x576 rgb",
      { "port 4 (OSD 2) goes on counting as YCbCr graphics, whatever it is given now" },
      {} },
    { { "PMX_Init" }, "PMX_SetGamma 0 99", { "no gamma curve has the number 99: gamma is off" }, {} },
    { {},
      "PMX_SetTVSystem 0 400 1",
      { "no TV system has 400 Hz: they have 24, 25, 30, 50 or 60" },
      { "PMX_SetTVSystem 0 60 1" } },
    { {}, "PMX_SetPlaneOrder 0 8 8", { "there is no position 8: the last one is 7" }, { "PMX_SetPlaneOrder 0 8 7" } },
    { { "PMX_Init" }, held, { "the first setting after start-up programs everything" }, {} },
    { { "PMX_Init", "sink unplug" }, held, { "nobody is waited for: no sink is there" }, {} },
    { { "PMX_Init", held }, held, { "nobody is waited for: HDMI was sent no change, and no display timer runs" }, {} },
    { { "PMX_Init", "display-part answer 3s" },
      held,
      { "graphics wait for the display part, for 10000 ms at most" },
      {} },
    { { "PMX_Init", "display-part answer 3s", "fault x_timer_start -1" },
      held,
      { "the operating system refused the display timer" },
      {} },
    { { "PMX_Init", "video-plane waiting on" },
      "PMX_SetFormatChangeFlag 0",
      { "graphics wait until the video plane driver calls PMX_SetOsdEnable" },
      {} },
    { { "PMX_Init" }, "PMX_SetFormatChangeFlag 0", { "graphics are mixed again" }, {} },
    { { "PMX_Init", "display-part answer 30s", held },
      "advance 10s",
      { "the display timer has run out", "graphics are mixed again" },
      {} },
    { { "PMX_Init", "source vdp0 connect" },
      "source vdp0 start 720x576",
      { "colour space DRV_PMX_CS_YCBCR_601 (0) is what port 0 (main video) asks for, over those before it",
        "the master colour space changes from DRV_PMX_CS_YCBCR_709 (1) to DRV_PMX_CS_YCBCR_601 (0)" },
      {} },
    { { "PMX_Init", "source vdp1 connect" },
      "source vdp1 start 720x576",
      { "the second video does not count: it needs a luma key, which is 0, and to be mixed",
        "the master colour space stays DRV_PMX_CS_YCBCR_709 (1)" },
      {} },
    { { "PMX_Init", "source osd2 connect" },
      "source osd2 start 720x576 rgb",
      { "RGB graphics on port 4 (OSD 2) do not count", "the master colour space stays DRV_PMX_CS_YCBCR_709 (1)" },
      {} },
    { { "PMX_Init" },
      "PMX_SetDigitalOutEnable 0 1",
      { "stored alone: PMX_SetEnable programs it when the mixer goes on" },
      {} },
    { { "PMX_Init" },
      "PMX_SetDigitalOutPhase 0 260",
      { "phase 260 is programmed at once, and its low 8 bits are stored" },
      {} },
    { { "flash fast_init_param word 20" },
      "PMX_Init",
      { "mode RES_1080P29_97HZ (20) is none to start with: 480p takes its place" },
      {} },
};

TEST_F(Explain, EachReason_IsToldWithItsValuesAndWithWhatWouldBeAccepted)
{
    std::set<PMX_REASON_T> seen;
    for (const Told& told : each_reason)
    {
        SCOPED_TRACE(told.command);
        carry_out({ "power-on" });
        carry_out(told.before);
        const pmxboard::Explanation explanation = pmxboard::explain(m_session, told.command);
        std::size_t next = 0;
        std::string all;
        for (const pmxboard::Reason& reason : explanation.reasons)
        {
            seen.insert(reason.number);
            const std::string sentence = pmxboard::sentence_of(reason);
            all += "\n  " + sentence;
            if (next < told.sentences.size() && sentence == told.sentences[next])
                ++next;
        }
        EXPECT_EQ(next, told.sentences.size()) << "what is missing stands not in:" << all;
        EXPECT_EQ(explanation.accepted, told.accepted);
        EXPECT_EQ(explanation.failure, "");
        // Whatever is told of an operation was announced by `ops`.
        const auto announced = pmxboard::reasons_of(told.command.substr(0, told.command.find(' ')));
        for (const pmxboard::Reason& reason : explanation.reasons)
        {
            EXPECT_TRUE(announced.empty() ||
                        std::any_of(announced.begin(), announced.end(),
                                    [&](const auto& place) { return place.number == reason.number; }))
                << pmxboard::sentence_of(reason);
        }
    }
    for (const pmxboard::ReasonRow& row : pmxboard::reason_rows())
        EXPECT_TRUE(seen.contains(row.number)) << row.name << " is told by none of these";
}

TEST_F(Explain, WhatWouldFail_IsNotProposed)
{
    carry_out({ "PMX_Init", "meanwhile PMX_HalSetMode flash nothing off" });
    const pmxboard::Search few{ 5, std::chrono::seconds(10) };
    EXPECT_EQ(std::vector<std::string>{}, pmxboard::explain(m_session, "PMX_SetMode 0 RES_2160P 50 0", few).accepted)
        << "each of them would, though it fails once: none is tried behind another one that has changed something";
    carry_out({ "meanwhile off" });
    EXPECT_EQ((std::vector<std::string>{ "PMX_SetMode 0 RES_1080P50HZ 50 0" }),
              pmxboard::explain(m_session, "PMX_SetMode 0 RES_2160P 50 0", few).accepted);
}

TEST_F(Explain, BehindALongTrace_WhatIsAcceptedIsFound)
{
    carry_out({ "PMX_Init" });
    while (board::trace::entries().size() <= 4096)
        carry_out({ "PMX_SetArbPlaneOrder 0 0x76543210" }); // the next one would forget them
    EXPECT_EQ((std::vector<std::string>{ "PMX_SetPlaneOrder 0 1 7" }),
              pmxboard::explain(m_session, "PMX_SetPlaneOrder 0 1 9").accepted);
    EXPECT_LT(4096u, board::trace::entries().size());
}

TEST_F(Explain, RequestsNear_InTheirOrder)
{
    const auto near = [this](const std::string& command) {
        return pmxboard::requests_near(pmxboard::explain(m_session, command, pmxboard::none));
    };
    carry_out({ "PMX_Init", "poke u4Capability 0x7FFBFFF7" });
    const auto modes = near("PMX_SetMode 0 RES_576P 50 0");
    ASSERT_LT(3u, modes.size());
    EXPECT_EQ("PMX_SetMode 0 RES_576P_1440 50 0", modes[0].at(0));
    EXPECT_EQ("PMX_SetMode 0 RES_576P_2880 50 0", modes[1].at(0));
    EXPECT_EQ("PMX_SetMode 0 RES_576I 50 0", modes[2].at(0)) << "of another scan, and no other height at 60 Hz";
    std::set<std::string> numbers;
    for (const auto& request : near("PMX_SetPlaneOrder 0 1 255"))
        numbers.insert(request.at(0));
    EXPECT_TRUE(numbers.contains("PMX_SetPlaneOrder 0 1 254"));
    EXPECT_FALSE(numbers.contains("PMX_SetPlaneOrder 0 1 256")) << "which no argument of 8 bits holds";
}

TEST_F(Explain, ChangesNothing)
{
    carry_out({ "PMX_Init" });
    const board::Value before = pmxboard::whole_state();
    const std::size_t entries = board::trace::entries().size();
    shown_by("explain PMX_SetMode 0 RES_720P50HZ 50 0");
    shown_by("explain PMX_SetMode 0 RES_2160P 50 0");
    EXPECT_EQ(pmxboard::whole_state(), before);
    EXPECT_EQ(board::trace::entries().size(), entries);
}

TEST_F(Explain, ShowsPathPlaceAdviceAndWhatIsAccepted)
{
    carry_out({ "PMX_Init", "poke u4Capability 0x7FFBFDFF" });
    const std::string shown = shown_by("explain outputs hdmi=1080p50");
    EXPECT_EQ(shown.substr(0, shown.find("(ucChooseFormat")),
              "> explain outputs hdmi=1080p50\n"
              "  refused: PMX_SetModeEx = 0\n"
              "  because  output PMX_OUTPUT_HDMI (1) is the first that is on, and gives the\n"
              "           mixer mode RES_1080P50HZ (13)  ");
    EXPECT_NE(shown.find("  and      capability bit 9 (RES_1080P50HZ) is clear in 0x7FFBFDFF\n"
                         "  at       PMX_CheckCap, src/driver/pmx/pmx_mode.cpp:"),
              shown.npos)
        << shown;
    EXPECT_NE(shown.find("  so       ask for another mode\n"), shown.npos) << shown;
    EXPECT_NE(shown.find("  accepted: outputs hdmi=1080p60\n"), shown.npos) << shown;
}

TEST_F(Explain, WhatTakesTwoCommands_IsShownBelowEachOther)
{
    const std::string shown = shown_by("explain PMX_VdpEnabled 0 1 720 576 1");
    EXPECT_NE(shown.find("  accepted: i4Pmx_Connect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_VDP 1\n"
                         "           PMX_VdpEnabled 0 1 720 576 1\n"),
              shown.npos)
        << shown;
}

TEST_F(Explain, TakesTheStateThatThereIs)
{
    carry_out({ "PMX_Init", "PMX_SetMuteEnable 0 1" });
    EXPECT_NE(shown_by("explain PMX_SetMuteEnable 0 1").find("it is set to 1 already"), std::string::npos);
    EXPECT_EQ(shown_by("explain PMX_SetMuteEnable 0 0").find("already"), std::string::npos);
}

TEST_F(Explain, RefusesExpectationsAndWrongLines)
{
    EXPECT_THROW(m_session.run_line("explain expect result 1"), pmxboard::LineError);
    EXPECT_THROW(m_session.run_line("explain PMX_Nothing"), pmxboard::LineError);
    EXPECT_THROW(m_session.run_line("explain PMX_SetMode 0"), pmxboard::LineError);
}

TEST_F(Explain, ACommandThatWouldFail_IsTold)
{
    const std::string shown = shown_by("explain power-on no-such-board");
    EXPECT_NE(shown.find("  failed:  power-on no-such-board\n  but      "), shown.npos) << shown;
}

TEST_F(Explain, WhoEndsWhatIsNotStarted_HasNothingToDo)
{
    for (const char* const end : { "PMX_Uninit", "i4PMX_Uninit 2", "PMX_Stop" })
    {
        const std::string shown = shown_by(std::string("explain ") + end);
        EXPECT_NE(shown.find("  nothing: "), shown.npos) << shown;
        EXPECT_NE(shown.find("  so       nothing is to be done: it is so already\n"), shown.npos) << shown;
        EXPECT_EQ(shown.find("PMX_Init"), shown.npos) << shown;
        EXPECT_EQ("nothing", pmxboard::verdict_of(pmxboard::explain(m_session, end)));
    }
}

TEST_F(Explain, AVerbIsToldByItsLine)
{
    carry_out({ "PMX_Init", "source vdp0 start 100x100", "i4Pmx_Disconnect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_VDP 0" });
    const std::string shown = shown_by("explain source vdp0 size 200x200");
    EXPECT_NE(shown.find("  refused: source vdp0 size 200x200 (answer: 0)\n"), shown.npos) << shown;
    EXPECT_NE(shown.find("nobody has connected video plane 0"), shown.npos) << shown;
    EXPECT_NE(shown_by("explain suspend").find("  done:    suspend (answer: 0)\n"), shown.npos);
    EXPECT_NE(shown_by("explain PMX_SetMode 0 RES_2160P 50 0").find("  refused: PMX_SetMode = 0\n"), shown.npos);
}

TEST_F(Explain, WorksWhileStoresAreShown_AndAfterAnotherPowerOn)
{
    carry_out({ "stores on", "PMX_Init" });
    EXPECT_NE(shown_by("explain PMX_SetMode 0 RES_2160P 60 0").find("no product admits"), std::string::npos);
    EXPECT_NE(shown_by("explain power-on").find("done:"), std::string::npos);
    carry_out({ "power-on" });
    EXPECT_NE(shown_by("explain PMX_Stop").find("the layer is not started"), std::string::npos);
}

/* What somebody else was refused on the way is told, and is no refusal. */

TEST_F(Explain, WhatWasDone_IsNotCalledRefused)
{
    carry_out({ "PMX_Init", "PMX_SetSwapEnable 0 1 1" });
    EXPECT_EQ(pmxboard::explain(m_session, "PMX_Reset 0").refusal(), nullptr);
    carry_out({ "power-on", "PMX_Init", "display-part answer 3s", "fault x_timer_stop -1" });
    EXPECT_EQ(pmxboard::explain(m_session, held).refusal(), nullptr);
    carry_out({ "power-on", "fault i4ImRegisterInterface2 -5" });
    EXPECT_EQ(pmxboard::explain(m_session, "PMX_Init").refusal(), nullptr);
}

TEST_F(Explain, WhatWasHandedOn_IsARefusal)
{
    carry_out({ "PMX_Init" });
    for (const char* const command :
         { "PMX_SetMode 0 RES_2160P 60 0", "i4PmxSetMode 0 RES_2160P 60 0",
           "i4Pmx_Connect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_OSD 9", "PMX_VdpEnabled 0 9 1 1 1",
           "i4PmxEnableVideoPlane 0 2", "PMX_SetCBEnable 0 0", "PMX_Init" })
        EXPECT_NE(pmxboard::explain(m_session, command).refusal(), nullptr) << command;
}

/* why */

TEST_F(Explain, WhyExplainsTheLastCommandThatDidSomething)
{
    EXPECT_THROW(m_session.run_line("why"), pmxboard::LineError);
    m_session.explain_commands(true);
    carry_out({ "PMX_Init", "PMX_SetMode 0 RES_2160P 60 0", "state ucMode" });
    const std::string shown = shown_by("why");
    EXPECT_NE(shown.find("no product admits mode RES_2160P (49)"), shown.npos) << shown;
    EXPECT_EQ(shown_by("why"), shown);
}

TEST_F(Explain, WhyOsdTellsSinceWhenByWhomAndUntilWhen)
{
    carry_out({ "PMX_Init" });
    EXPECT_NE(shown_by("why osd").find("Graphics   shown"), std::string::npos);
    carry_out({ "display-part answer 3s", "outputs hdmi=720p50 composite=576i" });
    EXPECT_EQ(shown_by("why osd"),
              "> why osd\n"
              "Graphics   held back since 4 ms by PMX_SetModeEx: planes 3 to 7 wait until the\n"
              "           display part answers at 3004 ms; the timer ends the wait at 10004 ms\n"
              "Record     outputs digital=off hdmi=720p50 component=off composite=576i at 50 Hz\n");
}

TEST_F(Explain, WhyOsdTellsWhoForgotGraphicsAndWhatBringsThemBack)
{
    carry_out({ "PMX_Init", "display-part never", "outputs hdmi=720p50 composite=576i", "PMX_Uninit" });
    EXPECT_NE(shown_by("why osd").find("PMX_Uninit has deleted it"), std::string::npos);
    carry_out({ "PMX_Init" });
    const std::string shown = shown_by("why osd");
    EXPECT_NE(shown.find("PMX_Init has forgotten that they were held back"), std::string::npos) << shown;
    EXPECT_NE(shown.find("PMX_SetFormatChangeFlag(FALSE) brings them back"), std::string::npos) << shown;
    carry_out({ "PMX_SetFormatChangeFlag FALSE" });
    EXPECT_NE(shown_by("why osd").find("Graphics   shown"), std::string::npos);
}

TEST_F(Explain, WhyModeTellsWhichOutputDecided)
{
    carry_out({ "PMX_Init", "outputs hdmi=720p50 composite=576i" });
    std::string shown = shown_by("why mode");
    EXPECT_NE(shown.find("  mode:    RES_720P50HZ at 50 Hz\n  because  output PMX_OUTPUT_HDMI (1)"), shown.npos)
        << shown;
    EXPECT_EQ(shown.find("  but "), shown.npos) << shown;
    carry_out({ "PMX_SetMode 0 RES_480P 60 0" });
    shown = shown_by("why mode");
    EXPECT_NE(shown.find("  mode:    RES_480P at 60 Hz\n"), shown.npos) << shown;
    EXPECT_NE(shown.find("  but      not the outputs decided: PMX_SetMode did since, or start-up\n"), shown.npos)
        << shown;
}

TEST_F(Explain, WhyModeTellsThatAllOutputsAreOff)
{
    carry_out({ "PMX_Init", "PMX_SetModeEx 0 [[0], [0, RES_720P60HZ], [0], [0]] 60 0 0" });
    const std::string off = "because  all outputs are off, and HDMI gives the mixer mode RES_720P60HZ";
    std::string shown = shown_by("why mode");
    EXPECT_NE(shown.find(off), shown.npos) << shown;
    EXPECT_EQ(shown.find("  but "), shown.npos) << shown;
    carry_out({ "poke u4Capability 0x7FFBFFEF" });
    shown = shown_by("why mode");
    EXPECT_NE(shown.find("capability bit 4 (RES_720P60HZ"), shown.npos) << shown;
    EXPECT_EQ(shown.find("  but "), shown.npos) << shown;
    carry_out({ "PMX_SetMode 0 RES_480P 60 0" });
    shown = shown_by("why mode");
    EXPECT_NE(shown.find(off), shown.npos) << shown;
    EXPECT_NE(shown.find("  but      not the outputs decided: "), shown.npos) << shown;
}

TEST_F(Explain, WhyColourSpaceTellsWhoDelivers)
{
    carry_out({ "PMX_Init" });
    EXPECT_NE(shown_by("why colour-space").find("  but      nothing delivers pictures"), std::string::npos);
    carry_out({ "source vdp0 connect", "source vdp0 start 720x576" });
    const std::string shown = shown_by("why colour-space");
    EXPECT_NE(shown.find("  master:  DRV_PMX_CS_YCBCR_601\n"
                         "  because  colour space DRV_PMX_CS_YCBCR_601 (0) is what port 0 (main video)\n"),
              shown.npos)
        << shown;
    carry_out({ "PMX_VdpDisabled 0 0", "poke eMasterColorSpace 1", "poke arPortInfo[0].fgEnabled 1" });
    EXPECT_NE(shown_by("why colour-space").find("that is what the next decision yields"), std::string::npos);
}

/* Without asking */

/** Lines in a file of their own, run with or without explanations; what is shown, and what is told of failures. */
std::pair<std::string, std::string> run_from_file(const std::string& lines, bool explain, bool keep_going = false)
{
    const std::string name = testing::TempDir() + "explained-" + std::to_string(getpid()) + ".pmx";
    std::ofstream(name) << lines;
    std::ostringstream shown;
    std::ostringstream diagnostics;
    const pmxboard::Scenario scenario{
        .name = name, .board = "default", .repeat = "again", .keep_going = keep_going, .explain = explain
    };
    std::ifstream file(name);
    pmxboard::run_scenario(file, scenario, { .to = &shown, .filter = { { "TVE_" }, {} } }, diagnostics);
    std::filesystem::remove(name);
    return { shown.str(), diagnostics.str() };
}

constexpr const char* refused = "PMX_Init\nPMX_SetMode 0 RES_2160P 60 0\n";

TEST(ExplainedRun, TellsWhatIsRefused)
{
    const auto [shown, diagnostics] = run_from_file(std::string(refused) + "PMX_SetMode 0 RES_480P 60 0\n", true);
    EXPECT_EQ(shown.find("refused: "), shown.rfind("refused: "));
    EXPECT_NE(shown.find("no product admits mode RES_2160P (49)"), shown.npos) << shown;
    EXPECT_EQ(diagnostics, "");
}

TEST(ExplainedRun, AFailedExpectation_IsExplainedWithoutAsking)
{
    const auto [shown, diagnostics] = run_from_file(std::string(refused) + "state ucMode\nexpect result 1\n", false);
    EXPECT_EQ(shown.find("refused: "), shown.npos) << shown;
    EXPECT_NE(diagnostics.find(":4: expected result 1, found 0\n  refused: PMX_SetMode = 0\n"
                               "  because  no product admits mode RES_2160P (49)\n"),
              diagnostics.npos)
        << diagnostics;
}

TEST_F(Explain, WhatIsDoneOnceMoreForItsExplanation_WritesNothing)
{
    const std::string name = testing::TempDir() + "written-" + std::to_string(getpid()) + ".json";
    carry_out({ "PMX_Init" });
    m_session.explain_command(3);
    EXPECT_ANY_THROW(m_session.run_line("  save " + name));
    EXPECT_FALSE(std::filesystem::exists(name));
    carry_out({ "PMX_SetTvType 0 0", "PMX_SetMode 0 RES_2160P 60 0" });
    ASSERT_TRUE(m_session.explanation());
    EXPECT_NE(m_session.explanation()->refusal(), nullptr);
}

TEST(ExplainedRun, WhatCannotBeRunAgain_FailsAsBefore)
{
    EXPECT_EQ(diagnostics(std::string(refused) + "expect result 1\n"),
              "here.pmx:3: expected result 1, found 0" + tool_test::repeat);
}

TEST(ExplainedRun, OfManyFailures_TheFirstAreExplained)
{
    std::string lines = "PMX_Init\n";
    for (unsigned i = 0; i < 5; ++i)
        lines += "PMX_SetMode 0 RES_2160P 60 0\nexpect result 1\n";
    const auto [shown, diagnostics] = run_from_file(lines, false, true);
    const auto count = [&told = diagnostics](const std::string& text) {
        unsigned found = 0;
        for (std::size_t at = told.find(text); at != told.npos; at = told.find(text, at + 1))
            ++found;
        return found;
    };
    EXPECT_EQ(5u, count("expected result 1, found 0")) << diagnostics;
    EXPECT_EQ(3u, count("no product admits mode RES_2160P (49)")) << diagnostics;
}

TEST(ExplainedRun, AFileThatIsAnotherOneNow_FailsAsBefore)
{
    const std::string unreadable = testing::TempDir() + "unreadable-" + std::to_string(getpid()) + ".pmx";
    std::ofstream(unreadable) << std::string(2'000'000, 'x');
    for (const std::string& name : { unreadable, std::string(5'000, 'x') + ".pmx" })
    {
        std::istringstream lines(std::string(refused) + "expect result 1\n");
        std::ostringstream shown;
        std::ostringstream diagnostics;
        const pmxboard::Scenario scenario{ .name = name, .board = "default", .repeat = "again" };
        EXPECT_FALSE(pmxboard::run_scenario(lines, scenario, { .to = &shown }, diagnostics));
        EXPECT_TRUE(diagnostics.str().ends_with(":3: expected result 1, found 0\nrepeat: again\n"))
            << diagnostics.str().substr(0, 1000);
    }
    std::filesystem::remove(unreadable);
}

} // namespace
