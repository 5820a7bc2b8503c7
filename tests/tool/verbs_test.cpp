// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <filesystem>

#include "board/board.h"
#include "drv_if.h"
#include "drv_if_pmx.h"
#include "scenario_run.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"

namespace
{

using tool_test::behind_last;
using tool_test::diagnostics;
using tool_test::run;

TEST(Verbs, PowerOn_MakesTheBoardAsGoodAsNew)
{
    EXPECT_EQ("", diagnostics("PMX_Init\npower-on\nexpect state _PmxInitiated 0\nexpect state MutexPMX 0\n"
                              "expect no-more\nexpect asserts 0\nexpect state ucMode 0"));
}

TEST(Verbs, PowerOn_NamesABoard)
{
    EXPECT_EQ("", diagnostics("power-on default\nPMX_GetHDMIDefaultRes\nexpect result RES_1080P60HZ"));
    EXPECT_EQ("", diagnostics("power-on boards/default/board.toml\nPMX_GetHDMIDefaultRes\nexpect result 12"));
}

TEST(Verbs, WithoutPowerOn_TheScenarioHasItsOwnBoard)
{
    EXPECT_EQ("", diagnostics("PMX_Init"));
    EXPECT_EQ("", diagnostics("expect state _PmxInitiated 0\nPMX_Init\nexpect state _PmxInitiated 1"))
        << "an expectation must see the board of its own scenario, not that of the one before";
}

TEST(Verbs, PowerOn_OfAProduct)
{
    EXPECT_EQ("", diagnostics("power-on bedroom-player\nexpect state sources.vdp0.connected 0\nPMX_Init\n"
                              "expect call PMX_HalSetMode(0, RES_720P50HZ)\n"
                              "expect call NOTICE source \"vdp0 starts, 720x576, luma key 0\"\n"
                              "expect call NOTICE source \"osd1 connects\"\n"
                              "PMX_CheckCap 0 RES_1080P50HZ\nexpect result 0\n"
                              "PMX_GetCap 0\nexpect out pu4Cap 0x3DEA30FF\n"
                              "PMX_ChkSupportedRes 0 RES_1080P60HZ 60\nexpect out ucSupportedAutoRes RES_720P50HZ\n"
                              "PMX_ChkSupportedRes 0 RES_576P 50\nexpect out ucSupportedAutoRes RES_576P\n"
                              "PMX_Reset 0\nexpect state u4Capability 0x3DEA30FF\nexpect none i4ImQueryInterface\n"
                              "PMX_Stop\nPMX_Init\nexpect call i4ImRegisterInterface2(...)\nexpect none x_sema_lock"))
        << "sources come once";
}

TEST(Verbs, Flash_ReplacesAndRemovesAPartition)
{
    EXPECT_EQ(
        "",
        diagnostics("flash fast_init_param scenarios/images/boot-576p.bin\nPMX_GetHDMIDefaultRes\n"
                    "expect result RES_576P\nflash fast_init_param off\nPMX_GetHDMIDefaultRes\nexpect result RES_480I\n"
                    "flash another scenarios/images/boot-576p.bin\nexpect state flash.partitions[0].name \"another\""));
}

TEST(Verbs, Fault_AnswersTheNextCall)
{
    EXPECT_EQ("",
              diagnostics("fault get_part_id_by_name 7\nPMX_GetHDMIDefaultRes\nexpect call get_part_id_by_name(*) = 7\n"
                          "PMX_GetHDMIDefaultRes\nexpect call get_part_id_by_name(*) = 0"));
}

TEST(Verbs, Fault_OnTheNthCall)
{
    EXPECT_EQ(
        "",
        diagnostics("fault get_part_id_by_name 7 on 2\nPMX_GetHDMIDefaultRes\nexpect call get_part_id_by_name(*) = 0\n"
                    "PMX_GetHDMIDefaultRes\nexpect call get_part_id_by_name(*) = 7\n"
                    "PMX_GetHDMIDefaultRes\nexpect call get_part_id_by_name(*) = 0"));
}

TEST(Verbs, Fault_FromTheNthCall_UntilItIsTakenBack)
{
    EXPECT_EQ("",
              diagnostics(
                  "fault get_part_id_by_name 7 from 2\nPMX_GetHDMIDefaultRes\nexpect call get_part_id_by_name(*) = 0\n"
                  "PMX_GetHDMIDefaultRes\nexpect call get_part_id_by_name(*) = 7\n"
                  "PMX_GetHDMIDefaultRes\nexpect call get_part_id_by_name(*) = 7\n"
                  "fault get_part_id_by_name off\nPMX_GetHDMIDefaultRes\nexpect call get_part_id_by_name(*) = 0"));
}

TEST(Verbs, Fault_IsListedWithWhatIsLeft)
{
    const std::string shown = tool_test::run("fault get_part_id_by_name 7 from 3\nfault x_timer_stop -1 for 5s\n"
                                             "PMX_GetHDMIDefaultRes\nadvance 2s\nfault")
                                  .shown;
    EXPECT_NE(std::string::npos, shown.find("  fault get_part_id_by_name 7 from 2\n  fault x_timer_stop -1 for 3s\n"))
        << shown;
}

TEST(Verbs, Fault_OfTheCallsThatAreMeant)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nfault fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, ...) FALSE always\n"
                              "neighbour vPostChgRes RES_480P\nfault x_timer_stop(*) -1 for 5s\n"
                              "expect state faults[0].call \"fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, ...)\"\n"
                              "expect state faults[1].until_us 5002000\nadvance 5s\n"
                              "fault i4NFBPartitionRead 4 pvDest=[0x0C, 0, 0, 0]\nPMX_GetHDMIDefaultRes\n"
                              "expect result RES_1080P60HZ\n"
                              "expect call i4NFBPartitionRead(0, ...) = 4\n"
                              "fault fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, ...) off\nexpect state faults []"));
}

TEST(Verbs, Fault_ListsThemAsTheyAreTyped)
{
    EXPECT_EQ("  no faults\n", behind_last(run("power-on\nfault").shown));
    const std::string faults = "fault x_timer_create -1 on 2 phTimer=7\n"
                               "fault VDP_GetHwEnable(1) VDP_HIDDEN always\n"
                               "fault x_sema_lock(*, X_SEMA_OPTION_WAIT) 1 for 500ms\n";
    EXPECT_EQ("  fault x_timer_create -1 on 2 phTimer=7\n  fault VDP_GetHwEnable(1) VDP_HIDDEN always\n"
              "  fault x_sema_lock(*, X_SEMA_OPTION_WAIT) 1 for 500ms\n",
              behind_last(run(faults + "fault").shown));
    EXPECT_EQ("  no faults\n", behind_last(run(faults + "fault off\nfault").shown));
}

TEST(Verbs, Fault_ArgumentsThatCannotBeMeant)
{
    EXPECT_EQ("here.pmx:1: x_sema_lock has 2 arguments (hSema, eOption), not 1; ... stands for the rest\n",
              diagnostics("fault x_sema_lock(1) 0"));
    EXPECT_EQ("here.pmx:1: x_timer_create: phTimer: x is neither a number nor a name that goes here\n",
              diagnostics("fault x_timer_create 0 phTimer=x"));
}

TEST(Verbs, Fault_QueryThatSucceedsWithoutATable_DoesNotEndTheTool)
{
    EXPECT_EQ(
        "",
        diagnostics("PMX_Init\nfault i4ImRegisterInterface2 -1 always\nfault i4ImQueryInterface 0 always\n"
                    "source vdp0 start 1920x1080\nsource vdp0 size 720x576\nexpect call i4ImQueryInterface(...) = -1"));
}

TEST(Verbs, Fault_Always)
{
    EXPECT_EQ("", diagnostics("fault get_part_id_by_name -2 always\nPMX_GetHDMIDefaultRes\nPMX_GetHDMIDefaultRes\n"
                              "expect call get_part_id_by_name(*) = -2"));
}

TEST(Verbs, Fault_AnswersByName)
{
    EXPECT_EQ("",
              diagnostics("fault fgPmxHalSwapPlane1_2 TRUE\nPMX_EnableVideoPlane 0 0\nexpect call vPmxMixPlane(0, 1)"));
}

TEST(Verbs, Advance_LetsTimePass)
{
    run("advance 2s\nadvance 3ms\nadvance 4us");
    EXPECT_EQ(2003004, board::now().count());
}

TEST(Verbs, LogLevel_DecidesWhatTheConsoleShows)
{
    EXPECT_EQ("", diagnostics("loglevel 0\nPMX_Stop\nexpect log 1 \"PMX_Stop\\n\"\nexpect console \"\""));
    EXPECT_EQ("here.pmx:3: expected console \"PMX_Stop\", found \"\"\nrepeat: pmxboard run here.pmx\n",
              diagnostics("loglevel 0\nPMX_Stop\nexpect console \"PMX_Stop\""));
    EXPECT_EQ("", diagnostics("loglevel 1\nPMX_Stop\nexpect console \"PMX_Stop\\n\""));
}

TEST(Verbs, State_ShowsAFieldARecordOrEverything)
{
    EXPECT_EQ("> state _fgBootUp\n  _fgBootUp = 1\n", run("state _fgBootUp").shown);
    EXPECT_EQ("> state status\n  hPMXTimer = 0\n  fgPmxFormatChangeFlag = 0\n  fgPmxEnabeOsdFlag = 0\n  "
              "fgTimerAlreadySet = 0\n",
              run("state status").shown);
    const std::string everything = run("state").shown;
    for (const char* const part : { "\n  os", "\n  mixer\n", "\n  tv_encoder", "\n  record\n", "\n    arPortInfo\n",
                                    "\n  status", "\n  module" })
        EXPECT_NE(std::string::npos, everything.find(part)) << part << " in\n" << everything;
}

TEST(Verbs, Poke_ChangesTheRecord)
{
    EXPECT_EQ(
        "", diagnostics("poke ucMode RES_1080P24HZ\nPMX_GetMode 0\nexpect out pucMode 18\npoke PMX_debug_level 0x2\n"
                        "expect state module.PMX_debug_level 2\npoke arOutputConf[PMX_OUTPUT_HDMI].eResMode RES_576P\n"
                        "expect state record.arOutputConf[1].eResMode RES_576P"));
}

TEST(Verbs, Trace_HidesAndShowsCalls)
{
    const std::string shown = run("trace off\nPMX_SetTvType 0 3\ntrace on\nPMX_SetTvType 0 0").shown;
    EXPECT_EQ(std::string::npos, shown.find("PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)"));
    EXPECT_NE(std::string::npos, shown.find("PMX_HalSetTvType(0, PMX_TV_TYPE_NTSC)"));
}

TEST(Verbs, SuspendAndResume_RunWhatIsRegistered)
{
    EXPECT_EQ("", diagnostics(
                      "suspend\nexpect result 0\nexpect none PMX_HalClockSet\nPMX_Init\nsuspend\n"
                      "expect next PMX_HalClockSet(0, 0)\nresume\nexpect next PMX_HalClockSet(0, 1)\nexpect result 0"));
}

TEST(Verbs, WhatLiesFarBack_IsForgotten)
{
    std::string lines = "PMX_Init\n";
    for (unsigned i = 0; i < 25; ++i)
        lines += "PMX_QueryStatus\n";
    EXPECT_EQ("", diagnostics(lines + "expect console \"fgOSD5\""));
    const std::size_t kept = board::console_text().size();
    diagnostics("PMX_Init\nPMX_QueryStatus\n");
    EXPECT_GT(65536 + 2 * board::console_text().size(), kept);
    lines = "PMX_Init\n";
    for (unsigned i = 0; i < 200; ++i)
        lines += "PMX_SetMode 0 RES_720P50HZ 50 0\nPMX_SetMode 0 RES_480P 60 0\n";
    EXPECT_EQ("", diagnostics(lines + "expect call PMX_HalSetMode(0, RES_480P)"));
    EXPECT_GT(std::size_t{ 4'300 }, board::trace::entries().size());
}

TEST(Verbs, Print_ShowsTheText)
{
    EXPECT_EQ("> print \"a\\tb\\n\"\na\tb\n", run("print \"a\\tb\\n\"").shown);
}

TEST(Verbs, Neighbour_CallsThePlatform)
{
    EXPECT_EQ("",
              diagnostics("neighbour PMX_HalSwapPlane1_2 0 1\nexpect next PMX_HalSwapPlane1_2(0, 1)\nexpect no-more\n"
                          "PMX_EnableVideoPlane 0 0\nexpect call vPmxMixPlane(0, 1)\n"
                          "neighbour TVE_SetAspectRatio ASPECT_RATIO_16_9_FULL_FORMAT\n"
                          "expect next TVE_SetAspectRatio(ASPECT_RATIO_16_9_FULL_FORMAT)"));
}

TEST(Verbs, Ipmx_CallsTheRegisteredTableWithItsTag)
{
    EXPECT_EQ(
        "", diagnostics("PMX_Init\nipmx pi4GetOutSize tag\nexpect result 1\nexpect out pu4Width 1920\nexpect no-more\n"
                        "expect state interface_manager.interfaces[0].held 0"));
    EXPECT_EQ(
        "", diagnostics(
                "PMX_Init\nPMX_Uninit\ni4PmxRegisterIM PMX_COMP_TYPE_PMX 0\nipmx pi4OsdDisabled tag\nexpect result 1"));
}

TEST(Verbs, Ipmx_CallsWithAnotherTag)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nipmx pi4GetMode 1\nexpect result 0\nexpect out pucMode untouched\n"
                              "ipmx pi4GetMode 0x100\nexpect result 1\nipmx pi4GetMode tag null\nexpect result 0"));
}

TEST(Verbs, Ipmx_ATableThatCannotBeGivenBack_Fails)
{
    EXPECT_EQ("here.pmx:3: the IPMX table cannot be given back: i4ImReleaseInterface answers -5\n"
              "repeat: pmxboard run here.pmx\n",
              diagnostics("PMX_Init\nfault i4ImReleaseInterface -5\nipmx pi4GetMode tag"));
}

TEST(Verbs, Ipmx_WithoutATable_Fails)
{
    EXPECT_EQ("here.pmx:1: no IPMX table is registered: i4ImQueryInterface answers -1\nrepeat: pmxboard run here.pmx\n",
              diagnostics("ipmx pi4GetMode tag"));
}

/* A mixer of another make that left slots out. */

INT32 answer_mode(void* tag, UCHAR* mode)
{
    *mode = static_cast<UCHAR>(reinterpret_cast<std::uintptr_t>(tag));
    return 7;
}

constexpr IPMX partial_table = [] {
    IPMX table{};
    table.pi4GetMode = answer_mode;
    return table;
}();

std::string failure(pmxboard::Session& session, const char* line)
{
    try
    {
        session.run_line(line);
    }
    catch (const pmxboard::StepFailed& error)
    {
        return error.what();
    }
    return "done";
}

TEST(Verbs, Ipmx_NullSlot_FailsWithItsName)
{
    pmxboard::Output output({ .quiet = true });
    pmxboard::Session session(output, "default", ".");
    session.run_line("power-on");
    UINT32 number = RES_576P;
    void* tag = nullptr;
    std::memcpy(&tag, &number, sizeof number);
    ASSERT_EQ(0, i4ImRegisterInterface2(PMX_COMP_TYPE_PMX, 0, IID_IPMX, &partial_table, tag));

    EXPECT_EQ("done", failure(session, "ipmx pi4GetMode tag"));
    EXPECT_EQ("7", session.last_outcome().result->to_text());
    EXPECT_EQ("RES_576P", session.last_outcome().outputs.at(0).value->to_text());
    EXPECT_EQ("the slot pi4SetMode of the registered table is null",
              failure(session, "ipmx pi4SetMode tag RES_480P 60 0"));
    EXPECT_EQ("the slot pi4VdpDisabled of the registered table is null", failure(session, "ipmx pi4VdpDisabled tag"));
    EXPECT_EQ("0", board::state().find("interface_manager.interfaces[0].held")->to_text()) << "it was given back";
}

TEST(Verbs, Ipmx_SetMode_SetsTheMode)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nipmx pi4SetMode tag RES_576P 50 0\nexpect result 1\n"
                              "expect next LOG9 \"SetMode, RES_576P\\n\"\nexpect call PMX_HalSetMode(0, RES_576P)\n"
                              "ipmx pi4SetMode 1 RES_480P 60 0\nexpect result 0\nexpect no-more\n"
                              "expect state ucMode RES_576P"));
}

TEST(Verbs, Operation_RunsUnderItsName)
{
    run("PMX_SetTvType 0 3");
    EXPECT_EQ("PMX_SetTvType", board::trace::entries().back().operation);
    run("PMX_Init\nipmx pi4EnableVideoPlane tag 1");
    bool seen = false;
    for (const auto& entry : board::trace::entries())
        seen = seen || (entry.function == "vPmxMixPlane" && entry.operation == "pi4EnableVideoPlane");
    EXPECT_TRUE(seen);
}

TEST(Verbs, EachScenario_IsToldInTheGuide)
{
    const std::string description = tool_test::project_file("docs/scenarios.md");
    for (const auto& file : std::filesystem::directory_iterator(PMX_SOURCE_DIR "/scenarios"))
    {
        if (file.path().extension() == ".pmx")
        {
            EXPECT_NE(std::string::npos, description.find("`" + file.path().filename().string() + "`")) << file.path();
        }
    }
}

} // namespace
