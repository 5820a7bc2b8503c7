// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>
#include <string>

#include <nlohmann/json.hpp>

#include "scenario_run.h"
#include "tools/pmxboard/state/paths.h"
#include "tools/pmxboard/view/output.h"

namespace
{

using tool_test::run;
using tool_test::run_traced;
using Json = nlohmann::json;

std::vector<Json> parsed_lines(const std::string& text)
{
    std::vector<Json> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        lines.push_back(Json::parse(line));
    return lines;
}

TEST(Output, ForPeople_CommandCallsConsoleResult)
{
    EXPECT_EQ(
        "> PMX_SetTvType 0 PMX_TV_TYPE_PAL\n"
        "        0.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n"
        "  = 1\n"
        "> PMX_GetTvType 0\n"
        "  = 1\n"
        "  *pucTvType = PMX_TV_TYPE_PAL\n"
        "> PMX_GetTvType 1\n"
        "  = 0\n"
        "  *pucTvType untouched\n"
        "> advance 1500us\n"
        "> PMX_Stop\n"
        "  | PMX_Stop\n"
        "> loglevel 0\n"
        "> PMX_Stop\n"
        "        1.500  LOG1 \"PMX_Stop\\n\"\n",
        run("PMX_SetTvType 0 PMX_TV_TYPE_PAL   # Europe\nPMX_GetTvType 0\nPMX_GetTvType 1\nadvance 1500us\nPMX_Stop\n"
            "loglevel 0\nPMX_Stop\n")
            .shown);
}

TEST(Output, CallTooLongForTheScreen_IsBrokenBehindCommas)
{
    EXPECT_EQ("> PMX_ChkSupportedRes 0 RES_1080P60HZ 60\n"
              "        0.000  fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ,\n"
              "                   {u4ResCheck=RES_1080P60HZ, u2VsyncFreq=60,\n"
              "                   u4ValidAutoRes=RES_1080P60HZ, u2ValidAutoVfreq=60}) = 1\n"
              "  = 1\n"
              "  *ucSupportedAutoRes = RES_1080P60HZ\n"
              "  *ucSupportedAutoVsyncFreg = 60\n",
              run("PMX_ChkSupportedRes 0 RES_1080P60HZ 60").shown);
    const auto apart = run("PMX_ChkSupportedRes 0 RES_1080P60HZ 60", {}, true);
    EXPECT_EQ(1, std::count(apart.trace.begin(), apart.trace.end(), '\n')) << "a file has one line a call";
    std::istringstream lines(run("PMX_Init\nPMX_SetModeEx 0 [ [1, RES_480P], [0], [0], [0] ] 60 0 0").shown);
    for (std::string line; std::getline(lines, line);)
        EXPECT_GE(81u, line.size()) << line;
}

TEST(Output, ALongRecord_IsShownOnce_AndThenAsWhatChanged)
{
    const std::string lines = "PMX_Init\nPMX_SetModeEx 0 [ [0], [1, 8], [1, 2], [1, 0] ] 60 0 0\n"
                              "expect call fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, {as before}, *)\n" // any record
                              "expect call fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, {as before}, 1) = 1\n"
                              "expect call fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, {fgHdmiOutEnable=1, ...}, 1) = 1\n"
                              "PMX_SetHdmiDeepColor 0 1\n";
    const auto outcome = run(lines);
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    EXPECT_NE(std::string::npos, outcome.shown.find("fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, {u1ScaleMode=0,\n"));
    EXPECT_NE(std::string::npos, outcome.shown.find("  fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, {as before}, 1) = 1\n"));
    EXPECT_EQ(std::string::npos,
              run(lines.substr(0, lines.find("expect")), { .verbose = true }).shown.find("as before"));
    EXPECT_EQ(std::string::npos, run(lines, {}, true).trace.find("as before"));
    const std::string both = run("PMX_ChkSupportedRes 0 12 60\nPMX_ChkSupportedRes 0 12 60").shown;
    EXPECT_EQ(std::string::npos, both.find("as before")) << "each command shows it";
    const std::string within =
        run("meanwhile fgPmxDrvGetAvdInfo PMX_ChkSupportedRes 0 8 50\nPMX_ChkSupportedRes 0 8 60").shown;
    EXPECT_EQ(std::string::npos, within.find("…")) << "what runs inside is told first, and shown behind: " << within;
}

TEST(Output, OfAChangedRecord_WhatChanged)
{
    std::ostringstream nowhere;
    const auto sink = pmxboard::trace_form("text").make({}, nowhere);
    const auto shown = [&](int last, const char* key = "theLastOfFields") {
        board::TraceEntry entry;
        entry.function = "tell";
        const auto name = board::Value::text("a text that makes it long");
        entry.arguments = { { "pr",
                              board::Value::record({ { "szName", name }, { key, board::Value::number(last) } }) } };
        return sink->entry(entry, true).substr(15);
    };
    EXPECT_EQ("tell({szName=\"a text that makes it long\", theLastOfFields=1})\n", shown(1));
    EXPECT_EQ("tell({as before})\n", shown(1));
    EXPECT_EQ("tell({…, theLastOfFields=2})\n", shown(2));
    EXPECT_EQ("tell({szName=\"a text that makes it long\", other=2})\n", shown(2, "other"));
    sink->command("next");
    EXPECT_EQ("tell({szName=\"a text that makes it long\", other=2})\n", shown(2, "other"));
}

TEST(Output, ResultsHaveNames_AndLargeNumbersAreHexadecimal)
{
    const std::string shown =
        run("PMX_Init\nsource osd1 connect\ni4Pmx_Connect 66 0 66 0\nPMX_GetArbPlaneOrder 0").shown;
    EXPECT_NE(std::string::npos, shown.find("  = PMX_PORT_DONE\n"));
    EXPECT_NE(std::string::npos, shown.find("  = PMX_NO_SUCH_PORT\n"));
    EXPECT_NE(std::string::npos, shown.find("  *pu4PlaneOrder = 0x76543210\n"));
}

TEST(Output, Verbose_ShowsArgumentNamesAndExpectations)
{
    const auto outcome = run("PMX_SetTvType 0 3\nexpect result 1", { .verbose = true });
    EXPECT_EQ("> PMX_SetTvType 0 3\n"
              "        0.000  PMX_HalSetTvType(ucPmxId=0, ucTvType=PMX_TV_TYPE_PAL)\n"
              "  = 1\n"
              "> expect result 1\n"
              "here.pmx: 1 expectations met\n",
              outcome.shown);
}

TEST(Output, Quiet_ShowsNothingButFailures)
{
    const auto fine = run("PMX_Init\nstate\nprint \"text\\n\"\nexpect asserts 0", { .quiet = true });
    EXPECT_TRUE(fine.done);
    EXPECT_EQ("", fine.shown);
    EXPECT_EQ("", fine.diagnostics);
    const auto failed = run("PMX_Init\nexpect asserts 1", { .quiet = true });
    EXPECT_EQ("", failed.shown);
    EXPECT_EQ("here.pmx:2: expected asserts 1, found 0\nrepeat: pmxboard run here.pmx\n", failed.diagnostics);
}

TEST(Output, ScriptedAnswers_AreMarked)
{
    const std::string shown = run("fault x_timer_create -1\nPMX_Init").shown;
    EXPECT_NE(std::string::npos, shown.find("x_timer_create(0) = -1  (scripted)\n")) << shown;
}

TEST(Output, Colour_OnlyWhenAskedFor)
{
    EXPECT_EQ(std::string::npos, run("fault x_timer_create -1\nPMX_Init\nPMX_GetMode 0").shown.find('\x1b'));
    const std::string shown = run("PMX_GetMode 0", { .colour = true }).shown;
    EXPECT_EQ("\x1b[1m> PMX_GetMode 0\x1b[0m\n\x1b[32m  = 1\x1b[0m\n\x1b[32m  *pucMode = RES_480I\x1b[0m\n", shown);
}

TEST(Output, Colour_EndsWithEachLine)
{
    std::istringstream lines(
        run("fault fgPmxDrvGetAvdInfo 1\nPMX_ChkSupportedRes 0 RES_1080P60HZ 60", { .colour = true }).shown);
    unsigned count = 0;
    for (std::string line; std::getline(lines, line); ++count)
    {
        EXPECT_EQ(line.starts_with("\x1b["), line.ends_with("\x1b[0m")) << line;
    }
    EXPECT_LT(3u, count);
}

TEST(Output, TraceOff_LeavesTheConsole)
{
    const std::string shown = run_traced("PMX_Init", "off").shown;
    EXPECT_NE(std::string::npos, shown.find("  | PMX_Init\n"));
    EXPECT_EQ(std::string::npos, shown.find("x_sema_create"));
}

TEST(Output, TextTraceApart_HoldsLogLinesToo)
{
    const auto outcome = run("PMX_Stop\nPMX_SetTvType 0 3", {}, true);
    EXPECT_EQ("        0.000  LOG1 \"PMX_Stop\\n\"\n        0.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n",
              outcome.trace);
    EXPECT_EQ("> PMX_Stop\n  | PMX_Stop\n> PMX_SetTvType 0 3\n  = 1\n", outcome.shown);
}

TEST(Output, Json_OneObjectALine)
{
    const auto outcome = run_traced("PMX_Init\nexpect asserts 0\nPMX_SetTvType 0 PMX_TV_TYPE_PAL", "jsonl");
    ASSERT_TRUE(outcome.done) << outcome.diagnostics;
    const auto lines = parsed_lines(outcome.shown);
    ASSERT_GT(lines.size(), 30u);
    EXPECT_EQ("log", lines[0].at("kind"));
    EXPECT_EQ("PMX_IsLog", lines[0].at("function"));
    EXPECT_EQ(1, lines[0].at("level"));
    EXPECT_EQ("PMX_Init\n", lines[0].at("text"));
    EXPECT_EQ("PMX_Init", lines[0].at("operation"));
    EXPECT_EQ("call", lines[1].at("kind"));
    EXPECT_EQ("x_sema_create", lines[1].at("function"));
    EXPECT_EQ("X_SEMA_TYPE_MUTEX", lines[1].at("arguments").at("eType").at("name"));
    EXPECT_EQ(0, lines[1].at("result"));
    const Json& last = lines.back();
    EXPECT_EQ("PMX_HalSetTvType", last.at("function"));
    EXPECT_EQ((Json{ { "value", 3 }, { "name", "PMX_TV_TYPE_PAL" } }), last.at("arguments").at("ucTvType"));
    EXPECT_EQ(0, last.at("arguments").at("ucPmxId"));
    EXPECT_EQ("PMX_SetTvType", last.at("operation"));
    EXPECT_EQ(2000, last.at("time_us"));
    EXPECT_EQ(0, last.at("depth"));
    for (std::size_t i = 0; i < lines.size(); ++i)
        EXPECT_EQ(i + 1, lines[i].at("sequence")) << "in the order in which they began";
}

TEST(Output, Json_StateIsALineToo)
{
    const auto lines = parsed_lines(run_traced("state _fgBootUp ucHue\nstate --json", "jsonl").shown);
    ASSERT_EQ(3u, lines.size());
    EXPECT_EQ((Json{ { "kind", "state" }, { "version", 1 }, { "path", "_fgBootUp" }, { "value", 1 } }), lines[0]);
    EXPECT_EQ("ucHue", lines[1].at("path"));
    EXPECT_EQ("", lines[2].at("path"));
    EXPECT_EQ(48u, lines[2].at("value").at("record").size());
    EXPECT_TRUE(lines[2].at("value").contains("mixer"));
}

TEST(Output, Json_ToItsOwnPlace)
{
    const auto outcome = run_traced("PMX_SetTvType 0 3", "jsonl", true, { .quiet = true });
    EXPECT_EQ("", outcome.shown);
    ASSERT_EQ(1u, parsed_lines(outcome.trace).size());
    EXPECT_EQ("> PMX_SetTvType 0 3\n  = 1\n", run_traced("PMX_SetTvType 0 3", "jsonl", true).shown);
}

TEST(Output, WhatRunsInsideACall_StandsBehindIt)
{
    std::ostringstream shown;
    pmxboard::Output output({ .to = &shown });
    board::TraceEntry inner;
    inner.function = "vPmxMixPlane";
    inner.depth = 1;
    board::TraceEntry outer;
    outer.function = "x_thread_delay";
    output.entry(inner);
    output.entry(outer);
    EXPECT_EQ("        0.000  x_thread_delay()\n        0.000    vPmxMixPlane()\n", shown.str());
}

TEST(Output, ConsoleLines_AreShownWhole)
{
    std::ostringstream shown;
    pmxboard::Output output({ .to = &shown });
    output.console("one");
    output.console(" line\n ");
    output.console("next\nno end");
    output.flush();
    EXPECT_EQ("  | one line\n  |  next\n  | no end\n", shown.str());
}

TEST(Output, Tree_BreaksWhatDoesNotFit)
{
    board::Value wide;
    for (const char* const key : { "first", "second", "third" })
        wide.add(key, board::Value::text(std::string(30, 'x')));
    board::Value all;
    all.add("number", board::Value::number(1));
    all.add("empty", board::Value::list({}));
    all.add("list", board::Value::list({ board::Value::number(1), board::Value::number(2) }));
    all.add("wide", board::Value::list({ wide }));
    const std::string text = "\"" + std::string(30, 'x') + "\"\n";
    EXPECT_EQ("  number = 1\n  empty = []\n  list = [1, 2]\n  wide\n    [0]\n      first = " + text +
                  "      second = " + text + "      third = " + text,
              pmxboard::to_text(pmxboard::NamedValues{ { "", all } }));
}

} // namespace
