// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include "scenario_run.h"
#include "tools/pmxboard/view/trace_filter.h"

namespace
{

using pmxboard::TraceFilter;
using tool_test::run;

board::TraceEntry entry(const std::string& function, const std::string& operation)
{
    board::TraceEntry made;
    made.function = function;
    made.operation = operation;
    return made;
}

TEST(TraceFilter, Empty_ShowsEverything)
{
    EXPECT_TRUE(TraceFilter{}.shows(entry("TVE_SetEnable", "PMX_SetEnable")));
    EXPECT_EQ("", TraceFilter{}.complaint());
}

TEST(TraceFilter, ByTheBeginningOfTheFunctionsName)
{
    const TraceFilter filter{ { "TVE_", "VDP_Set" }, {} };
    EXPECT_EQ("", filter.complaint());
    EXPECT_TRUE(filter.shows(entry("TVE_SetEnable", "")));
    EXPECT_TRUE(filter.shows(entry("VDP_SetTvFormat", "")));
    EXPECT_FALSE(filter.shows(entry("VDP_GlobalOutputChange", "")));
    EXPECT_FALSE(filter.shows(entry("xTVE_", "")));
    board::TraceEntry notice = entry("TVE_", "");
    notice.kind = board::TraceEntry::Kind::Notice;
    EXPECT_FALSE(filter.shows(notice)) << "a notice is no platform function";
}

TEST(TraceFilter, ByOperation)
{
    const TraceFilter filter{ {}, { "PMX_SetModeEx", "_PMX_TmrIsr", "pi4SetMode" } };
    EXPECT_EQ("", filter.complaint());
    EXPECT_TRUE(filter.shows(entry("TVE_SetEnable", "PMX_SetModeEx")));
    EXPECT_TRUE(filter.shows(entry("vPmxMixPlane", "_PMX_TmrIsr")));
    EXPECT_FALSE(filter.shows(entry("TVE_SetEnable", "PMX_SetMode")));
    EXPECT_FALSE(filter.shows(entry("TVE_SetEnable", "")));
}

TEST(TraceFilter, ByBoth)
{
    const TraceFilter filter{ { "TVE_" }, { "PMX_SetModeEx" } };
    EXPECT_TRUE(filter.shows(entry("TVE_SetEnable", "PMX_SetModeEx")));
    EXPECT_FALSE(filter.shows(entry("TVE_SetEnable", "PMX_SetEnable")));
    EXPECT_FALSE(filter.shows(entry("VDP_SetTvFormat", "PMX_SetModeEx")));
}

TEST(TraceFilter, WhatDoesNotExist_IsNamed)
{
    const auto complaint = [](TraceFilter filter) { return filter.complaint(); };
    EXPECT_EQ("no platform function begins with \"TEV_\"; did you mean TVE_, get_?", complaint({ { "TEV_" }, {} }));
    EXPECT_EQ("no platform function begins with \"\"", complaint({ { "" }, {} }));
    EXPECT_TRUE(
        complaint({ {}, { "PMX_SetModEx" } }).starts_with("no operation PMX_SetModEx; did you mean PMX_SetMode"));
    EXPECT_EQ("no operation PMX_ThatNobodyEverHeardOfAnywhere",
              complaint({ {}, { "PMX_ThatNobodyEverHeardOfAnywhere" } }));
}

TEST(TraceFilter, NamesEveryOperationThatTheBoardReports)
{
    run("PMX_Init\nsuspend\nresume\ndisplay-part answer 3s\nsource vdp0 start 1920x1080\nsource vdp0 disconnect\n"
        "source osd0 start 1280x720 rgb\nsource osd0 disconnect\n"
        "PMX_SetModeEx 0 [ [0], [1, RES_1080I60HZ], [0], [1, RES_480I] ] 60 0 0\nadvance 20s\n"
        "ipmx pi4GetMode tag\nPMX_SetOsdEnable");
    std::size_t named = 0;
    for (const board::TraceEntry& made : board::trace::entries())
    {
        if (made.operation.empty())
            continue;
        EXPECT_EQ("", TraceFilter({ {}, { made.operation } }).complaint());
        ++named;
    }
    EXPECT_LT(100u, named);
}

TEST(TraceFilter, DecidesWhatARunShows)
{
    const std::string lines = "PMX_Init\nPMX_SetModeEx 0 [ [0], [1, RES_480P], [1, RES_480P], [0] ] 60 0 0\n"
                              "expect call TVE_SetBlackScreen(*, *)\nexpect call VDP_SetTvFormat(...)";
    const auto outcome = run(lines, { .filter = { { "TVE_SetEn" }, { "PMX_SetModeEx" } } }, true);
    EXPECT_TRUE(outcome.done) << "expectations see everything; " << outcome.diagnostics;
    EXPECT_EQ("        2.000  TVE_SetEnable(0, 1)\n        2.000  TVE_SetEnable(1, 0)\n", outcome.trace);
}

} // namespace
