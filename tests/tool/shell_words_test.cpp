// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What the shell has besides the language: breakpoints, records, filters.
#include <gtest/gtest.h>

#include "program_run.h"
#include "scenario_run.h"

namespace
{

class ShellWords : public ProgramRun
{
};

TEST_F(ShellWords, Break_StopsInTheCall_LooksAndGoesOn)
{
    const Ended ended = run("shell", "PMX_Init\nbreak PMX_HalSetTvType\nbreak\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\n"
                                     "state mixer.tv_type\nstate ucTvType\npoke ucHue 7\nexpect result 1\ncontinue\n"
                                     "state ucHue\nbreak off\nPMX_SetTvType 0 PMX_TV_TYPE_NTSC\n");
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ("<stdin>:8: expect waits until the layer has gone on: continue\n", ended.err);
    const std::size_t stopped = ended.out.find("stopped in PMX_HalSetTvType(0, PMX_TV_TYPE_PAL); continue goes on\n"
                                               "  mixer.tv_type = PMX_TV_TYPE_PAL\n");
    ASSERT_NE(std::string::npos, stopped) << ended.out;
    EXPECT_LT(stopped, ended.out.find("  = 1\n", stopped));
    EXPECT_NE(std::string::npos, ended.out.find("  ucHue = 7\n", stopped));
    EXPECT_EQ(std::string::npos, ended.out.find("stopped", stopped + 1));
}

TEST_F(ShellWords, Break_WhereItStops_NothingIsCarriedOutThatTakesTheLayerAway)
{
    const Ended ended = run("shell", "PMX_Init\nbreak PMX_HalSetTvType\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\npower-on\n"
                                     "include x.pmx\nwhat-if PMX_Init\nrestore x.json\npoke ucHu 7\npoke ucHue 7\n"
                                     "continue\nexpect state ucHue 7\n");
    const std::string waits = " waits until the layer has gone on: continue\n";
    EXPECT_TRUE(ended.err.starts_with("<stdin>:4: power-on" + waits + "<stdin>:5: include" + waits +
                                      "<stdin>:6: what-if" + waits + "<stdin>:7: restore" + waits + "<stdin>:8: "))
        << ended.err;
    EXPECT_EQ(std::string::npos, ended.err.find("<stdin>:9")) << ended.err;
    EXPECT_EQ(1, ended.code);
}

TEST_F(ShellWords, Break_AfterPowerOn_InAnExpiry_AndWhereTheLinesEnd)
{
    const Ended ended = run("shell", "break vPmxMixPlane\npower-on\nPMX_Init\nPMX_SetFormatChangeTimer 10000\n"
                                     "what-if advance 10s\nadvance 10s\nstatus graphics\n");
    EXPECT_EQ(0, ended.code) << ended.err;
    EXPECT_NE(std::string::npos, ended.out.find("stopped in vPmxMixPlane(0, DRV_PMX_PLANE_3)")) << ended.out;
    EXPECT_NE(std::string::npos, ended.out.find("stopped in vPmxMixPlane(0, DRV_PMX_PLANE_7)")) << ended.out;
    EXPECT_EQ("<stdin>:1: the platform has no function PMX_HalSetMod; did you mean PMX_HalSetMode?\n",
              run("shell", "break PMX_HalSetMod\n").err.substr(0, 84));
}

TEST_F(ShellWords, Record_IsAScenario)
{
    const std::string scenario = file("kept.pmx");
    const Ended ended = run("shell", "record " + scenario +
                                         "\nPMX_Init\nPMX_GetMod 0\nPMX_SetTvType 0 3\nrecord off\n"
                                         "PMX_Stop\ninclude " +
                                         scenario + "\n");
    EXPECT_EQ("PMX_Init\nPMX_SetTvType 0 3\nexpect result 1\n", content(scenario));
    EXPECT_EQ(0, run("run -q '" + scenario + "'").code);
    EXPECT_EQ(1, ended.code) << "one line was wrong";
    run("shell", "record " + scenario + "\nPMX_Stop\n");
    EXPECT_EQ("PMX_Stop\n", content(scenario)) << "the end of the lines is the end of the record";
}

TEST_F(ShellWords, Record_IsThere_HoweverTheShellEnds)
{
    const std::string scenario = file("kept.pmx");
    const Ended misused = run("shell -q", "record " + scenario + "\nPMX_Init\nneighbour x_reg_write32 3 0\n");
    EXPECT_EQ(1, misused.code);
    EXPECT_NE(std::string::npos, misused.err.find("misused"));
    EXPECT_EQ("PMX_Init\nneighbour x_reg_write32 3 0\n", content(scenario));
    const std::string too_long((std::size_t{ 1 } << 20) + 1, 'x');
    EXPECT_EQ(2, run("shell -q", "record " + scenario + "\nPMX_Stop\n" + too_long + "\nPMX_Init\n").code);
    EXPECT_EQ("PMX_Stop\n", content(scenario));
}

TEST_F(ShellWords, Record_HoldsNothingThatIsTypedAtABreakpoint)
{
    const std::string scenario = file("kept.pmx");
    const Ended ended = run("shell -q", "PMX_Init\nrecord " + scenario +
                                            "\nbreak PMX_HalSetTvType\nPMX_SetTvType 0 3\npoke ucHue 7\ncontinue\n"
                                            "expect result 7\n");
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ("PMX_SetTvType 0 3\nexpect result 1\n", content(scenario)) << "nor a line that failed";
}

TEST_F(ShellWords, Break_WhereTheLinesCannotBeReadOn_IsNoFailedStep)
{
    const std::string too_long((std::size_t{ 1 } << 20) + 1, 'x');
    const Ended ended = run("shell", "PMX_Init\nbreak PMX_HalSetMode\noutputs hdmi=720p50\n" + too_long + "\n");
    EXPECT_EQ(2, ended.code);
    EXPECT_EQ("pmxboard: a line is longer", ended.err.substr(0, ended.err.find(" than"))) << ended.err;
    EXPECT_NE(std::string::npos, ended.out.find("stopped in PMX_HalSetMode"));
    EXPECT_TRUE(ended.out.ends_with("  = 1\n")) << "the layer goes on: " << ended.out;
}

TEST_F(ShellWords, Break_ShowsWhatLedThere)
{
    const std::string shown =
        run("shell", "PMX_Init\nPMX_SetFormatChangeTimer 10000\nbreak vPmxMixPlane\nadvance 10s\n").out;
    const std::size_t stopped = shown.find("stopped in vPmxMixPlane(0, DRV_PMX_PLANE_4)");
    ASSERT_NE(std::string::npos, stopped) << shown;
    EXPECT_LT(shown.find("  vPmxMixPlane(0, DRV_PMX_PLANE_3)\n"), stopped) << shown;
}

TEST_F(ShellWords, Help_OnTheShellsOwnWords)
{
    const std::string shown = run("shell", "help record break\n").out;
    EXPECT_NE(std::string::npos, shown.find("record\n  record FILE keeps")) << shown;
    EXPECT_NE(std::string::npos, shown.find("break\n  break FUNCTION stops")) << shown;
}

TEST_F(ShellWords, FiltersAsARunHasThem)
{
    const std::string shown = run("shell --only PMX_HalSet --op PMX_Init", "PMX_Init\nPMX_SetTvType 0 3\n").out;
    EXPECT_NE(std::string::npos, shown.find("PMX_HalSetMode"));
    EXPECT_EQ(std::string::npos, shown.find("x_sema_create"));
    EXPECT_EQ(std::string::npos, shown.find("PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)"));
    EXPECT_EQ(2, run("shell --op PMX_Nothing", "").code);
}

TEST(FlashWord, IsWhatTheBootLoaderLeft)
{
    EXPECT_EQ("", tool_test::diagnostics(
                      "flash fast_init_param word RES_576P\nPMX_Init\nexpect state ucMode RES_576P\n"
                      "expect call i4NFBPartitionRead(0, 0, [3, 0, 0, 0], 4) = 4\n"
                      "expect state flash.partitions[0].size 4\nexpect state flash.partitions[0].image \"word 0x3\"\n"
                      "power-on\nflash other word 0x01020304\nexpect state flash.partitions[1].name \"other\"\n"
                      "flash other off\nflash fast_init_param word 12\n"
                      "flash fast_init_param boards/default/fast_init_param.bin\n"
                      "expect state flash.partitions[0].size 16\nflash fast_init_param off\nPMX_Init"));
    EXPECT_EQ("here.pmx:1: the word takes 0 to 4294967295, not 0x100000000\n",
              tool_test::diagnostics("flash fast_init_param word 0x100000000"));
}

} // namespace
