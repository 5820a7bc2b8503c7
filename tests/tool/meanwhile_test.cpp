// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What happens while the layer is inside a platform call.
#include <gtest/gtest.h>

#include <algorithm>
#include <optional>
#include <random>

#include "board/board.h"
#include "board/threads.h"
#include "drv_pmx.h"
#include "scenario_run.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/operation.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/prompt/completion.h"

namespace
{

using tool_test::diagnostics;
using tool_test::repeat;
using tool_test::run;

const std::string change = "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\n";

TEST(MeanwhileVerb, RunsInsideTheCall_BelowItInTheTrace)
{
    EXPECT_EQ("        0.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n"
              "        0.000    NOTICE meanwhile \"PMX_SetBg 0 5\"\n"
              "        0.000    PMX_HalSetBg(0, 0x5)\n"
              "        0.000    NOTICE meanwhile \"= 1\"\n",
              run("meanwhile PMX_HalSetTvType PMX_SetBg 0 5\nPMX_SetTvType 0 3", {}, true).trace);
}

TEST(MeanwhileVerb, ResultAndOutputs_AreNotices_AndTheOuterCommandKeepsItsOwn)
{
    EXPECT_EQ(
        "", diagnostics("poke ucMode RES_576P\nmeanwhile PMX_HalSetTvType PMX_GetMode 0\nPMX_SetTvType 0 3\n"
                        "expect result 1\nexpect call NOTICE meanwhile \"= 1, *pucMode = RES_576P\"\nexpect no-more"));
    EXPECT_EQ("", diagnostics("meanwhile PMX_HalSetTvType PMX_GetMode 1\nPMX_SetTvType 0 3\n"
                              "expect call NOTICE meanwhile \"= 0, *pucMode untouched\"\nexpect no-more"));
    EXPECT_EQ(
        "", diagnostics("PMX_Init\nmeanwhile PMX_HalSetTvType ipmx pi4GetOutSize tag\nPMX_SetTvType 0 3\n"
                        "expect next PMX_HalSetTvType(0, 3)\nexpect next NOTICE meanwhile \"ipmx pi4GetOutSize tag\"\n"
                        "expect next i4ImQueryInterface(...)\nexpect next i4ImReleaseInterface(...)\n"
                        "expect next NOTICE meanwhile \"= 1, *pu4Width = 1920, *pu4Height = 1080\"\nexpect no-more"));
    EXPECT_EQ("",
              diagnostics("PMX_Init\nmeanwhile PMX_HalSetTvType suspend\nmeanwhile PMX_HalSetTvType resume\n"
                          "PMX_SetTvType 0 3\nexpect call PMX_HalClockSet(0, 0)\nexpect call NOTICE meanwhile \"= 0\"\n"
                          "expect call PMX_HalClockSet(0, 1)\nexpect result 1"));
}

TEST(MeanwhileVerb, OnTheNthCall_AndSeveral)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nmeanwhile PMX_HalSetTvType on 2 sink unplug\nPMX_SetTvType 0 0\n"
                              "expect state hdmi_av.sink_plugged TRUE\nPMX_SetTvType 0 0\n"
                              "expect call NOTICE meanwhile \"sink unplug\"\nexpect state hdmi_av.sink_plugged FALSE"));
    EXPECT_EQ("", diagnostics("meanwhile PMX_HalSetTvType poke ucMode 2\nmeanwhile PMX_HalSetTvType poke ucMode 3\n"
                              "PMX_SetTvType 0 0\nexpect state ucMode 3"));
}

TEST(MeanwhileVerb, EveryVerbThatDoesSomething)
{
    EXPECT_EQ("", diagnostics("PMX_Init\ndisplay-part never\nmeanwhile TVE_SetMuteCtrol display-part raise\n"
                              "meanwhile TVE_SetBlackScreen fault i4GetHotPlugStatus 1\n"
                              "meanwhile TVE_SetBlackScreen loglevel 9\n"
                              "meanwhile TVE_SetBlackScreen plane-delay 1 2 3 4 5 6 7 8\n"
                              "meanwhile TVE_SetBlackScreen flash fast_init_param off\n"
                              "meanwhile TVE_SetBlackScreen neighbour PMX_HalSetBg 0 7\n"
                              "meanwhile TVE_SetBlackScreen video-plane waiting on\n"
                              "meanwhile TVE_SetBlackScreen source osd0 start 1280x720 rgb\n"
                              "meanwhile TVE_SetBlackScreen advance 5ms\n" +
                              change + "expect call PMX_HalSetBg(0, 7)\nexpect result 1"));
}

TEST(MeanwhileVerb, WhatItStores_IsItsOwn)
{
    EXPECT_EQ("", diagnostics("stores on\nmeanwhile PMX_HalSetTvType poke ucMode RES_576P\nPMX_SetTvType 0 3\n"
                              "expect next SET ucTvType 0 → 3 (PMX_SetTvType)\nexpect next PMX_HalSetTvType(0, 3)\n"
                              "expect next NOTICE meanwhile \"poke ucMode RES_576P\"\n"
                              "expect next SET ucMode RES_480I → RES_576P (meanwhile)\nexpect no-more"));
    EXPECT_EQ("", diagnostics("stores on\nmeanwhile PMX_HalSetTvType PMX_SetBg 0 5\nPMX_SetTvType 0 3\n"
                              "expect call SET u4BgColor * → 5 (PMX_SetBg)\nexpect next PMX_HalSetBg(0, 5)"));
}

TEST(MeanwhileVerb, Diff_TellsOfTheCommandThatWasInterrupted)
{
    EXPECT_NE(std::string::npos, run("meanwhile PMX_HalSetTvType poke ucMode 3\nPMX_SetTvType 0 3\ndiff")
                                     .shown.find("record.ucMode  RES_480I → RES_576P"));
}

TEST(MeanwhileVerb, Off_TakesBack)
{
    EXPECT_EQ(
        "", diagnostics("meanwhile PMX_HalSetTvType poke ucMode 3\nmeanwhile PMX_HalSetTvType off\nPMX_SetTvType 0 3\n"
                        "expect state ucMode 0"));
    EXPECT_EQ("", diagnostics("meanwhile PMX_HalSetTvType poke ucMode 3\nmeanwhile PMX_HalSetBg sink plug\n"
                              "meanwhile off\nPMX_SetTvType 0 3\nexpect state ucMode 0\nmeanwhile off"));
}

TEST(MeanwhileVerb, ThatNeverHappened_FailsTheScenario)
{
    EXPECT_EQ("here.pmx:2: meanwhile PMX_HalSetTvType on 2 sink unplug: never happened; PMX_HalSetTvType was called 1 "
              "times since" +
                  repeat,
              diagnostics("meanwhile PMX_HalSetTvType on 2 sink unplug\nPMX_SetTvType 0 3"));
    EXPECT_EQ("here.pmx:2: meanwhile PMX_HalSetBg sink unplug: never happened; PMX_HalSetBg was called 0 times since" +
                  repeat,
              diagnostics("meanwhile PMX_HalSetBg sink unplug\npower-on"));
    EXPECT_EQ("", diagnostics("PMX_SetTvType 0 3")) << "it is gone when the next scenario begins";
}

TEST(MeanwhileVerb, PowerOnAfterTheFailure_HasForgottenIt)
{
    pmxboard::Output output({ .quiet = true });
    pmxboard::Session session(output, "default", ".");
    session.run_line("meanwhile PMX_HalSetBg sink unplug");
    EXPECT_THROW(session.run_line("power-on"), pmxboard::StepFailed);
    EXPECT_NO_THROW(session.run_line("power-on"));
    EXPECT_NO_THROW(session.finish());
}

TEST(MeanwhileVerb, WrongLines_AreRefusedWhereTheyStand)
{
    const std::string usage = "here.pmx:1: write: meanwhile [as thread] FUNCTION [on N] COMMAND, meanwhile [as thread] "
                              "FUNCTION [on N] request "
                              "OUTPUT MODE|on|off, meanwhile FUNCTION off, or meanwhile off; OUTPUT is digital, hdmi, "
                              "component or composite (cvbs)\n";
    for (const char* const line :
         { "meanwhile", "meanwhile PMX_HalSetBg", "meanwhile PMX_HalSetBg on", "meanwhile PMX_HalSetBg on 1",
           "meanwhile as thread", "meanwhile as thread PMX_HalSetBg" })
        EXPECT_EQ(usage, diagnostics(line)) << line;
    const auto refused = [](const std::string& line) { return diagnostics("meanwhile " + line).substr(12); };
    EXPECT_EQ(0u, refused("PMX_HalSetBgg sink plug")
                      .find("the platform has no function PMX_HalSetBgg; did you mean PMX_HalSetBg"));
    EXPECT_EQ(0u, refused("as PMX_HalSetBg sink plug").find("the platform has no function as"));
    EXPECT_EQ(0u, refused("PMX_SetBg sink plug").find("the platform has no function PMX_SetBg"));
    EXPECT_EQ("the call's number is 1 to 2147483647, not 0\n", refused("PMX_HalSetBg on 0 sink plug"));
    EXPECT_EQ(0u, refused("PMX_HalSetBg on x sink plug").find("the call's number: x is neither a number nor a name"));
    EXPECT_EQ(0u, refused("PMX_HalSetBg sinks plug").find("no command sinks; did you mean sink"));
    EXPECT_EQ(0u, refused("PMX_HalSetBg sink plugg").find("write: sink plug, sink unplug"));
    EXPECT_EQ(0u, refused("PMX_HalSetBg poke ucMode").find("write: poke FIELD VALUE"));
    EXPECT_EQ(0u, refused("PMX_HalSetBg PMX_GetMode").find("ucPmxId is missing: PMX_GetMode ucPmxId"));
    EXPECT_EQ(0u, refused("PMX_HalSetBg PMX_SetTvType 0 RES_480P").find("ucTvType: "));
    EXPECT_EQ(0u, refused("as thread PMX_HalSetBg off").find("no command off"));
    EXPECT_EQ("meanwhile takes a command that somebody else gives; each meanwhile stands on a line of its own\n",
              refused("PMX_HalSetBg meanwhile PMX_HalSetBg sink plug"));
    EXPECT_EQ("power-on would take the board away from under the operation that is running\n",
              refused("PMX_HalSetBg power-on"));
    for (const char* const verb : { "state", "save x.json", "diff", "what-if PMX_Init", "print \"x\"", "trace off",
                                    "stores on", "expect no-more" })
    {
        EXPECT_EQ(std::string(verb).substr(0, std::string_view(verb).find(' ')) +
                      " only looks, and meanwhile is for what somebody else does; look behind the command that it "
                      "happens in\n",
                  refused(std::string("PMX_HalSetBg ") + verb));
    }
}

TEST(MeanwhileVerb, WhatFailsInside_FailsTheStepWhenItIsDone)
{
    const auto outcome = run("meanwhile PMX_HalSetTvType flash nothing off\nPMX_SetTvType 0 3");
    EXPECT_EQ("here.pmx:2: meanwhile PMX_HalSetTvType flash nothing off: there is no flash partition nothing" + repeat,
              outcome.diagnostics);
    EXPECT_NE(std::string::npos, outcome.shown.find("  = 1\n")) << "the layer goes on: " << outcome.shown;
    EXPECT_EQ(
        "here.pmx:3: meanwhile as thread PMX_HalSetTvType source osd0 size 1x1: osd0 is stopped: its size comes when "
        "it starts" +
            repeat,
        diagnostics("PMX_Init\nmeanwhile as thread PMX_HalSetTvType source osd0 size 1x1\nPMX_SetTvType 0 3"));
    EXPECT_EQ("here.pmx:2: meanwhile PMX_HalSetTvType ipmx pi4GetMode tag: no IPMX table is registered: "
              "i4ImQueryInterface answers -1" +
                  repeat,
              diagnostics("meanwhile PMX_HalSetTvType ipmx pi4GetMode tag\nPMX_SetTvType 0 3"));
}

TEST(MeanwhileVerb, WhatFailedInside_DoesNotStayForTheNextCommand)
{
    pmxboard::Output output({ .quiet = true });
    pmxboard::Session session(output, "default", ".");
    session.run_line("meanwhile PMX_HalSetTvType flash nothing off");
    EXPECT_THROW(session.run_line("PMX_SetTvType 0 3"), pmxboard::StepFailed);
    EXPECT_NO_THROW(session.run_line("PMX_SetTvType 0 3"));
    EXPECT_NO_THROW(session.finish());
}

TEST(MeanwhileVerb, WhatIf_DoesIt_AndItStaysArmed)
{
    const auto outcome =
        run("meanwhile PMX_HalSetTvType poke ucMode 3\nwhat-if PMX_SetTvType 0 3\nexpect state ucMode 0\n"
            "PMX_SetTvType 0 3\nexpect state ucMode 3");
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    const auto failing = run("meanwhile PMX_HalSetTvType flash nothing off\nwhat-if PMX_SetTvType 0 3\nmeanwhile off");
    EXPECT_TRUE(failing.done) << failing.diagnostics;
    EXPECT_NE(std::string::npos, failing.shown.find("  would fail: meanwhile PMX_HalSetTvType flash nothing off: "))
        << failing.shown;
}

TEST(Request, ChangesTheCallersArray)
{
    std::vector<std::string> seen;
    board::at_every_call([&](const board::TraceEntry& entry) {
        const auto outputs = pmxboard::LentOutputs::innermost();
        if (entry.function != "TVE_SetMuteCtrol" && entry.function != "TVE_SetEnable")
            return;
        for (const PMX_RESOLUTION_T& output : outputs)
            seen.push_back(std::to_string(output.fgOutputEnable) + " " + std::to_string(output.eResMode));
        seen.emplace_back("-");
    });
    EXPECT_EQ("",
              diagnostics("PMX_Init\nmeanwhile TVE_SetMuteCtrol request composite RES_480I\n"
                          "meanwhile TVE_SetBlackScreen request hdmi off\n"
                          "meanwhile TVE_SetBlackScreen request digital on\n"
                          "meanwhile TVE_SetBlackScreen request component 3\n"
                          "meanwhile TVE_SetEnable request component RES_480P\n" +
                          change + "expect call NOTICE meanwhile \"request composite RES_480I\"\nexpect result 1\n" +
                          "neighbour TVE_SetEnable 0 1"));
    board::at_every_call({});
    EXPECT_EQ((std::vector<std::string>{ "0 0", "1 13", "1 3", "1 0", "-", // inside TVE_SetMuteCtrol
                                         "1 0", "0 13", "1 2", "1 0", "-", // inside the first TVE_SetEnable
                                         "1 0", "0 13", "1 2", "1 0", "-", // inside the second
                                         "-" }),                           // nothing is lent outside
              seen);
    EXPECT_EQ(
        "here.pmx:2: meanwhile PMX_HalSetTvType request hdmi off: no PMX_SetModeEx is running whose request could "
        "change" +
            repeat,
        diagnostics("meanwhile PMX_HalSetTvType request hdmi off\nPMX_SetTvType 0 3"));
}

TEST(Request, WrongLines)
{
    const auto refused = [](const std::string& line) {
        return diagnostics("meanwhile PMX_HalSetBg " + line).substr(12);
    };
    for (const char* const wrong : { "request", "request hdmi", "request hdmi on on" })
        EXPECT_EQ(0u, refused(wrong).find("write: meanwhile [as thread] FUNCTION")) << wrong;
    EXPECT_EQ("there is no output hdm; did you mean hdmi?\n", refused("request hdm on"));
    EXPECT_EQ(0u,
              refused("request hdmi RES_480PP").find("the request's mode: RES_480PP is neither a number nor a name"));
    EXPECT_EQ(0u, diagnostics("request hdmi on").find("here.pmx:1: no command request"));
}

TEST(ThreadVerb, WaitsForTheMutex_AndTheTraceSaysSo)
{
    EXPECT_EQ("",
              diagnostics("PMX_Init\nsource vdp0 connect\nmeanwhile as thread i4ImQueryInterface source osd1 connect\n"
                          "PMX_InformVdpColorSpace 0\nexpect call i4ImQueryInterface(...)\n"
                          "expect next NOTICE meanwhile \"as thread source osd1 connect\"\n"
                          "expect next NOTICE source \"osd1 connects\"\nexpect next x_sema_lock(1, *) = 0\n"
                          "expect next NOTICE thread \"i4Pmx_Connect waits for mutex 1\"\n"
                          "expect call i4ImReleaseInterface(...)\nexpect next x_sema_unlock(1) = 0\n"
                          "expect next NOTICE thread \"i4Pmx_Connect goes on\"\nexpect next LOG8 \"Tp,Id=176,1\\n\"\n"
                          "expect next LOG8 \"Comp(3) connect\\n\"\nexpect next x_sema_unlock(1) = 0\n"
                          "expect next NOTICE meanwhile \"= PMX_PORT_DONE\"\nexpect no-more\n"
                          "expect state arPortInfo[3].fgConnected 1\nexpect misuses 0\nexpect asserts 0"));
}

TEST(ThreadVerb, NestedInTheSameThread_ItIsADeadlock)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nsource vdp0 connect\nmeanwhile i4ImQueryInterface source osd1 connect\n"
                              "PMX_InformVdpColorSpace 0\n"
                              "expect call NOTICE misuse \"x_sema_lock: a second lock by the holder, handle 1\"\n"
                              "expect misuses 2\nexpect asserts 2"))
        << "the second lock, and the second release";
}

TEST(ThreadVerb, NobodyGivesTheMutexBack_IsAMisuse)
{
    const std::string lines =
        "PMX_Init\nsource vdp0 connect\nmeanwhile as thread i4ImQueryInterface source osd1 connect\n"
        "meanwhile i4ImReleaseInterface poke MutexPMX 99\nPMX_InformVdpColorSpace 0\n"
        "expect misuses 1\nexpect asserts 1\n";
    // The thread is refused its lock, goes on without, and has no such mutex to give back.
    const std::string message =
        "the platform was misused 3 times, and 1 were expected; the last: x_sema_unlock: no semaphore has handle 99";
    EXPECT_EQ("here.pmx:7: " + message + repeat, diagnostics(lines));
    EXPECT_EQ("here.pmx:8: " + message + repeat, diagnostics(lines + "power-on"));
    EXPECT_TRUE(board::threads::waiting().empty());
    EXPECT_NE(std::string::npos,
              run(lines).shown.find("  | BOARD misuse: thread: i4Pmx_Connect waits for mutex 1, which "
                                    "nobody gives back\n"));
    EXPECT_EQ(
        "here.pmx:8: what-if copies the process, and a thread that waits cannot be copied: i4Pmx_Connect waits for "
        "mutex 1" +
            repeat,
        diagnostics(lines + "what-if PMX_GetMode 0"));
    EXPECT_EQ(
        "here.pmx:8: explain copies the process, and a thread that waits cannot be copied: i4Pmx_Connect waits for "
        "mutex 1" +
            repeat,
        diagnostics(lines + "explain PMX_GetMode 0"));
    EXPECT_EQ("", diagnostics("PMX_Init"));
}

TEST(ThreadVerb, WithinWhatIf)
{
    const auto outcome =
        run("PMX_Init\nsource vdp0 connect\nmeanwhile as thread i4ImQueryInterface source osd1 connect\n"
            "what-if PMX_InformVdpColorSpace 0\nexpect state arPortInfo[3].fgConnected 0\n"
            "PMX_InformVdpColorSpace 0\nexpect state arPortInfo[3].fgConnected 1");
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    const std::size_t first = outcome.shown.find("i4Pmx_Connect goes on");
    EXPECT_NE(std::string::npos, outcome.shown.find("i4Pmx_Connect goes on", first + 1)) << outcome.shown;
}

TEST(ThreadVerb, IsTheSameEveryTime)
{
    const std::string lines = "PMX_Init\nstores on\nsource vdp0 connect\nsource vdp1 connect\n"
                              "meanwhile as thread i4ImQueryInterface source osd1 connect\n"
                              "meanwhile as thread i4ImQueryInterface on 2 source osd2 connect\n"
                              "meanwhile as thread x_sema_unlock source osd3 start 1920x1080 ycbcr\n"
                              "PMX_InformVdpColorSpace 0\n";
    const std::string first = run(lines).shown;
    for (int i = 0; i < 20; ++i)
        EXPECT_EQ(first, run(lines).shown);
}

TEST(MeanwhileVerb, Completion)
{
    const auto has = [](const std::string& line, const std::string& word) {
        const auto all = pmxboard::complete(line, line.size()).candidates;
        return std::find(all.begin(), all.end(), word) != all.end();
    };
    EXPECT_TRUE(has("meanwhile ", "x_thread_delay"));
    EXPECT_TRUE(has("meanwhile ", "as"));
    EXPECT_TRUE(has("meanwhile ", "off"));
    EXPECT_TRUE(has("meanwhile as ", "thread"));
    EXPECT_TRUE(has("meanwhile as thread ", "x_thread_delay"));
    EXPECT_TRUE(has("meanwhile x_thread_delay ", "on"));
    EXPECT_TRUE(has("meanwhile x_thread_delay ", "off"));
    EXPECT_TRUE(has("meanwhile x_thread_delay ", "request"));
    EXPECT_TRUE(has("meanwhile x_thread_delay ", "sink"));
    EXPECT_TRUE(has("meanwhile x_thread_delay ", "PMX_SetMode"));
    EXPECT_TRUE(has("meanwhile x_thread_delay sink ", "unplug"));
    EXPECT_TRUE(has("meanwhile x_thread_delay on 2 sink ", "unplug"));
    EXPECT_TRUE(has("meanwhile as thread x_thread_delay on 2 PMX_SetTvType 0 ", "PMX_TV_TYPE_PAL"));
    EXPECT_TRUE(has("meanwhile x_thread_delay request ", "hdmi"));
    EXPECT_TRUE(has("meanwhile x_thread_delay request hdmi ", "RES_480P"));
    EXPECT_TRUE(has("meanwhile x_thread_delay on 2 request hdmi ", "off"));
    EXPECT_TRUE(has("expect next SET ucM", "ucMode"));
    EXPECT_TRUE(has("expect next SET ucMode RES_480P → RES_4", "RES_480I"));
    EXPECT_TRUE(has("expect next S", "SET"));
}

TEST(MeanwhileVerb, HostileLines_AreRefusedOrDone_AndNothingElse)
{
    const std::vector<std::string> words = { "meanwhile",   "as",
                                             "thread",      "PMX_HalSetTvType",
                                             "x_sema_lock", "x_sema_unlock",
                                             "on",          "off",
                                             "1",           "0",
                                             "-1",          "99999999999999999999",
                                             "request",     "hdmi",
                                             "digital",     "RES_480P",
                                             "sink",        "unplug",
                                             "poke",        "ucMode",
                                             "MutexPMX",    "3",
                                             "source",      "osd1",
                                             "vdp0",        "connect",
                                             "start",       "1x1",
                                             "ycbcr",       "PMX_SetTvType",
                                             "advance",     "1ms",
                                             "expect",      "next",
                                             "SET",         "→",
                                             "->",          "*",
                                             "(",           ")",
                                             "[",           "\"",
                                             "#",           "\xE2\x86",
                                             "\xFF",        "power-on",
                                             "what-if",     "stores",
                                             "fault",       "=" };
    std::mt19937 random(1);
    constexpr int lines_a_board = 20;
    std::optional<pmxboard::Output> output;
    std::optional<pmxboard::Session> session;
    for (int i = 0; i < 600; ++i)
    {
        std::string line = i % 3 == 0 ? "meanwhile" : i % 3 == 1 ? "meanwhile x_sema_lock" : "expect next SET";
        for (unsigned n = random() % 6; n > 0; --n)
            line += " " + words[random() % words.size()];
        if (i % lines_a_board == 0)
        {
            session.reset();
            output.emplace(pmxboard::OutputOptions{ .quiet = true });
            session.emplace(*output, "default", ".");
            session->watch_changes(false); // nobody asks for them
        }
        const auto carry_out = [&](const std::string& text) {
            try
            {
                session->run_line(text);
            }
            catch (const pmxboard::LineError&)
            {
            }
            catch (const pmxboard::StepFailed&)
            {
            }
        };
        carry_out("stores on");
        carry_out("PMX_Init");
        EXPECT_NO_THROW(carry_out(line)) << line;
        EXPECT_NO_THROW(carry_out("source vdp0 start 1920x1080")) << line;
        (void)pmxboard::complete(line, line.size()).candidates;
    }
}

} // namespace
