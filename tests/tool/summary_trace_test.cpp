// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include "scenario_run.h"

namespace
{

using tool_test::run_traced;

TEST(SummaryTrace, CountsByNeighbour_AndTellsWhatHappenedByItself)
{
    EXPECT_EQ(
        "> PMX_Init\n"
        "    39 calls in 2 ms: system 7, registers 19, mixer 10, video 2, interfaces 1\n"
        "> PMX_SetFormatChangeTimer 10000\n"
        "    2 calls: system 2\n"
        "  = 1\n"
        "> advance 10s\n"
        "    6 calls: video 1, mixer 5\n"
        "    at 10002 ms, expiry: timer 2: _PMX_TmrIsr\n"
        "> PMX_GetMode 0\n"
        "  = 1\n"
        "  *pucMode = RES_1080P60HZ\n",
        run_traced("PMX_Init\nPMX_SetFormatChangeTimer 10000\nadvance 10s\nPMX_GetMode 0\nexpect result 1", "summary")
            .shown);
}

TEST(SummaryTrace, QuietIsQuiet_AndWhatIsNotShownIsNotCounted)
{
    EXPECT_EQ("", run_traced("PMX_Init", "summary", false, { .quiet = true }).shown);
    EXPECT_EQ(
        "> PMX_Init\n    10 calls: mixer 10\n",
        run_traced("PMX_Init", "summary", false, { .filter = { { "PMX_Hal", "fgPmxHal", "vPmx", "PMX_Vsync" }, {} } })
            .shown);
}

TEST(SummaryTrace, InAFileOfItsOwn_TheConsoleIsShown)
{
    const auto outcome = run_traced("PMX_Stop\nPMX_SetTvType 0 3", "summary", true);
    EXPECT_EQ("> PMX_Stop\n  | PMX_Stop\n> PMX_SetTvType 0 3\n  = 1\n", outcome.shown);
    EXPECT_EQ("    1 call: mixer 1\n", outcome.trace);
}

} // namespace
