// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Every expectation both ways: met in silence, and failed with what was expected and what was found.
#include <gtest/gtest.h>

#include "scenario_run.h"

namespace
{

using tool_test::diagnostics;
using tool_test::repeat;

/** A scenario whose second line is an expectation on the first. */
std::string after(const std::string& command, const std::string& expectation)
{
    return diagnostics(command + "\nexpect " + expectation);
}

std::string failed(const std::string& text)
{
    return "here.pmx:2: " + text + repeat;
}

TEST(Expectations, Result)
{
    EXPECT_EQ("", after("PMX_SetTvType 0 3", "result 1"));
    EXPECT_EQ("", after("PMX_SetTvType 0 3", "result PMX_SET_OK"));
    EXPECT_EQ("", after("PMX_SetTvType 0 3", "result *"));
    EXPECT_EQ("", after("PMX_GetHDMIDefaultRes", "result RES_1080P60HZ"));
    EXPECT_EQ(failed("expected result 0, found 1"), after("PMX_SetTvType 0 3", "result 0"));
    EXPECT_EQ(failed("expected result RES_480P, found RES_1080P60HZ"),
              after("PMX_GetHDMIDefaultRes", "result RES_480P"));
    EXPECT_EQ(failed("expected result FALSE, found 1"), after("PMX_SetTvType 0 3", "result FALSE"));
}

TEST(Expectations, Result_IsThatOfTheLastOperation)
{
    EXPECT_EQ("", diagnostics("PMX_SetTvType 1 3\nadvance 1ms\nloglevel 2\nexpect result 0"));
}

TEST(Expectations, Out)
{
    EXPECT_EQ("", diagnostics("poke ucMode 2\nPMX_GetMode 0\nexpect out pucMode RES_480P"));
    EXPECT_EQ("", after("PMX_GetMode 1", "out pucMode untouched"));
    EXPECT_EQ(failed("expected *pucMode = 3, found RES_480I"), after("PMX_GetMode 0", "out pucMode 3"));
    EXPECT_EQ(failed("expected *pucMode = untouched, found RES_480I"), after("PMX_GetMode 0", "out pucMode untouched"));
    EXPECT_EQ(failed("expected *pucMode = RES_480I, found untouched"), after("PMX_GetMode 1", "out pucMode RES_480I"));
}

TEST(Expectations, Call_InOrderWithGaps)
{
    const std::string init = "PMX_Init\nexpect call PMX_HalSetMode(0, RES_1080P60HZ)\n";
    EXPECT_EQ("",
              diagnostics(init + "expect call VDP_SetTvFormat(*, TRUE)\nexpect call register_pm_ops(pmx_pm_ops) = 0"));
    EXPECT_EQ(
        "here.pmx:3: expected call x_sema_create(...), found it before PMX_HalSetMode(0, RES_1080P60HZ), which is "
        "already behind" +
            repeat,
        diagnostics(init + "expect call x_sema_create(...)"));
    EXPECT_EQ("here.pmx:3: expected call VDP_SetTvFormat(RES_480P, 1), found VDP_SetTvFormat(RES_1080P60HZ, 1)" +
                  repeat,
              diagnostics(init + "expect call VDP_SetTvFormat(RES_480P, 1)"));
    EXPECT_EQ("here.pmx:3: expected call PMX_VsyncStop(), found none after PMX_HalSetMode(0, RES_1080P60HZ)" + repeat,
              diagnostics(init + "expect call PMX_VsyncStop()"));
    EXPECT_EQ(failed("expected call PMX_VsyncStop(), found none"), after("PMX_Init", "call PMX_VsyncStop()"));
    EXPECT_EQ(failed("expected call PMX_VsyncStop(), found that the last command made no call at all"),
              after("PMX_GetMode 0", "call PMX_VsyncStop()"));
}

TEST(Expectations, Call_EachEntryOnce)
{
    EXPECT_EQ("", diagnostics("PMX_Init\nexpect call x_thread_delay(1)\nexpect call x_thread_delay(1)"));
    EXPECT_NE("", diagnostics("PMX_Init\nexpect call x_thread_delay(1)\nexpect call x_thread_delay(1)\n"
                              "expect call x_thread_delay(1)"));
}

TEST(Expectations, Call_LogsAndAssertsAsWell)
{
    EXPECT_EQ(
        "", diagnostics(
                "fault x_sema_create -1\nPMX_Init\nexpect call LOG1 \"PMX_Init\\n\"\n"
                "expect call Assert(\"i4Ret == OSR_OK\", *)\nexpect call UTIL_Printf \"TESTPMX: Get pard ID:0.\\n\""));
    EXPECT_EQ(failed("expected call LOG1 \"PMX_Start\\n\", found LOG1 \"PMX_Stop\\n\""),
              after("PMX_Stop", "call LOG1 \"PMX_Start\\n\""));
}

TEST(Expectations, Next)
{
    EXPECT_EQ(
        "",
        diagnostics("PMX_SetEnable 0 1\nexpect next PMX_VsyncEnable()\nexpect next PMX_HalSetDigitalOut(*, *, *, *)"));
    EXPECT_EQ(failed("expected next PMX_HalSetDigitalOut(...), found PMX_VsyncEnable()"),
              after("PMX_SetEnable 0 1", "next PMX_HalSetDigitalOut(...)"));
    EXPECT_EQ("here.pmx:3: expected next PMX_HalSetTvType(0, 3), found nothing more" + repeat,
              diagnostics("PMX_SetTvType 0 3\nexpect next PMX_HalSetTvType(0, 3)\nexpect next PMX_HalSetTvType(0, 3)"));
}

TEST(Expectations, Next_ThatFailed_DoesNotMoveOn)
{
    EXPECT_EQ("here.pmx:2: expected next PMX_HalSetTvType(0, 0), found PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)" + repeat,
              diagnostics("PMX_SetTvType 0 3\nexpect next PMX_HalSetTvType(0, 0)"));
}

TEST(Expectations, NoMore)
{
    EXPECT_EQ("", after("PMX_GetMode 0", "no-more"));
    EXPECT_EQ("", diagnostics("PMX_SetTvType 0 3\nexpect next PMX_HalSetTvType(0, 3)\nexpect no-more"));
    EXPECT_EQ(failed("expected no more, found PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)"),
              after("PMX_SetTvType 0 3", "no-more"));
}

TEST(Expectations, None)
{
    EXPECT_EQ("", after("PMX_SetTvType 0 3", "none PMX_HalSetMode"));
    EXPECT_EQ(failed("expected none PMX_HalSetTvType, found PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)"),
              after("PMX_SetTvType 0 3", "none PMX_HalSetTvType"));
    EXPECT_EQ("", diagnostics("PMX_SetTvType 0 3\nPMX_GetMode 0\nexpect none PMX_HalSetTvType"))
        << "only the last command counts";
}

TEST(Expectations, Log)
{
    EXPECT_EQ("", after("PMX_Stop", "log 1 \"PMX_Stop\\n\""));
    EXPECT_EQ(failed("expected log 8 \"PMX_Stop\\n\", found no line of this level"),
              after("PMX_Stop", "log 8 \"PMX_Stop\\n\""));
    EXPECT_EQ(failed("expected log 0 \"TESTPMX: Get pard ID:0.\\n\", found at last LOG0 \"[PMX] create a timer \\n\""),
              after("PMX_Init", "log 0 \"TESTPMX: Get pard ID:0.\\n\""))
        << "it is printed with no level";
    EXPECT_EQ(failed("expected log 1 \"PMX_Stop\", found at last LOG1 \"PMX_Stop\\n\""),
              after("PMX_Stop", "log 1 \"PMX_Stop\""));
}

TEST(Expectations, Console)
{
    EXPECT_EQ("", after("PMX_Stop", "console \"MX_St\""));
    EXPECT_EQ(failed("expected console \"PMX_Init\", found \"PMX_Stop\\n\""),
              after("PMX_Stop", "console \"PMX_Init\""));
    const std::string shortened = after("PMX_QueryStatus", "console \"nobody prints that\"");
    EXPECT_TRUE(shortened.starts_with("here.pmx:2: expected console \"nobody prints that\", found …\"")) << shortened;
    EXPECT_GT(std::size_t{ 400 }, shortened.size()) << "no more than fits";
    EXPECT_EQ("here.pmx:3: expected console \"PMX_Stop\", found \"\"" + repeat,
              diagnostics("PMX_Stop\nPMX_GetMode 0\nexpect console \"PMX_Stop\""));
}

TEST(Expectations, State)
{
    EXPECT_EQ("", after("PMX_Init", "state mixer.mode RES_1080P60HZ"));
    EXPECT_EQ("", after("PMX_Init", "state record.aucPlaneOrder [4, 3, 1, 0, 2, 5, 6, 7]"));
    EXPECT_EQ("", after("PMX_Init", "state piVdp1 null"));
    EXPECT_EQ(failed("expected state ucMode 2, found RES_1080P60HZ"), after("PMX_Init", "state ucMode 2"));
    EXPECT_EQ(failed("expected state ucMode null, found RES_1080P60HZ"), after("PMX_Init", "state ucMode null"));
    EXPECT_EQ("here.pmx:2: no name _ucMode", after("PMX_Init", "state ucMode _ucMode").substr(0, 27));
    EXPECT_EQ("here.pmx:2: nothing stands before or behind a comma: 4,,3\n",
              after("PMX_Init", "state record.aucPlaneOrder [4,,3]"));
    EXPECT_EQ(failed("expected state record.aucPlaneOrder [4], found [4, 3, 1, 0, 2, 5, 6, 7]"),
              after("PMX_Init", "state record.aucPlaneOrder [4]"));
    EXPECT_TRUE(
        after("PMX_Init", "state mixer.mod 1").starts_with("here.pmx:2: no state mixer.mod; did you mean mixer.mode"))
        << after("PMX_Init", "state mixer.mod 1");
}

TEST(Expectations, Asserts)
{
    EXPECT_EQ("", diagnostics("fault x_sema_create -1\nPMX_Init\nexpect asserts 1"));
    EXPECT_EQ(failed("expected asserts 1, found 0"), after("PMX_Init", "asserts 1"));
}

TEST(Expectations, Misuses)
{
    const std::string misuse = "PMX_Init\nneighbour x_thread_delay 1\npoke MutexPMX 99\nPMX_Uninit\n";
    EXPECT_EQ("", diagnostics(misuse + "expect misuses 1"));
    EXPECT_EQ("here.pmx:5: expected misuses 0, found 1" + repeat, diagnostics(misuse + "expect misuses 0"));
}

TEST(Expectations, Misuse_ThatNobodyExpected_FailsAtTheEnd)
{
    const std::string misuse = "PMX_Init\npoke MutexPMX 99\nPMX_Uninit\n";
    const std::string at_end = diagnostics(misuse);
    EXPECT_TRUE(at_end.starts_with("here.pmx:3: the platform was misused 1 times, and 0 were expected; the last: "))
        << at_end;
    EXPECT_TRUE(at_end.ends_with(repeat)) << at_end;
    EXPECT_EQ("", diagnostics(misuse + "expect misuses 1\n"));
    const std::string at_power_on = diagnostics(misuse + "power-on\n");
    EXPECT_TRUE(at_power_on.starts_with("here.pmx:4: the platform was misused 1 times")) << at_power_on;
    EXPECT_EQ("", diagnostics(misuse + "expect misuses 1\npower-on\nexpect misuses 0"));
}

TEST(Expectations, AreCounted)
{
    EXPECT_TRUE(tool_test::run("PMX_Stop\nexpect asserts 0\nexpect misuses 0")
                    .shown.ends_with("here.pmx: 2 expectations met\n"));
}

} // namespace
