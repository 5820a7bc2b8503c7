// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <set>

#include "board/names.h"
#include "drv_if_pmx.h"
#include "scenario_run.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/kind.h"
#include "tools/pmxboard/functions/mode_names.h"

namespace
{

using pmxboard::read_mode;
using pmxboard::refresh_of;
using tool_test::diagnostics;
using tool_test::run;

std::string refusal_of(const std::string& written)
{
    try
    {
        return std::to_string(read_mode(written));
    }
    catch (const pmxboard::LineError& error)
    {
        return error.what();
    }
}

TEST(ModeNames, RefreshAsTheNameTells)
{
    EXPECT_EQ("60", refresh_of("RES_1080P60HZ"));
    EXPECT_EQ("23.976", refresh_of("RES_1080P23_976HZ"));
    EXPECT_EQ("29.97", refresh_of("RES_1080P29_97HZ"));
    EXPECT_EQ("23.976", refresh_of("RES_4K2K23976HZ"));
    EXPECT_EQ("50", refresh_of("RES_3D_1080I50HZ_SBS_HALF"));
    EXPECT_EQ("60", refresh_of("RES_480P"));
    EXPECT_EQ("50", refresh_of("RES_576I_2880"));
    EXPECT_EQ("60", refresh_of("RES_2D_640x480HZ")) << "the number before HZ is a height";
    EXPECT_EQ("", refresh_of("RES_PANEL_AUO_B089AW01"));
    EXPECT_EQ("", refresh_of("RES_2160P"));
    EXPECT_EQ("", refresh_of(""));
}

TEST(ModeNames, EveryMode_IsFoundByItsShortName)
{
    std::set<std::string> names;
    for (const std::string_view mode : pmxboard::names_in(board::names::Family::ResolutionMode))
    {
        const std::string name = pmxboard::short_name_of(mode);
        EXPECT_TRUE(names.insert(name).second) << name;
        EXPECT_EQ(board::names::number_of(mode), read_mode(name)) << name;
        EXPECT_EQ(board::names::number_of(mode), read_mode(mode));
    }
    EXPECT_EQ(names.size(), pmxboard::short_mode_names().size());
}

TEST(ModeNames, AsPeopleWriteThem)
{
    EXPECT_EQ(unsigned{ RES_720P50HZ }, read_mode("720P50"));
    EXPECT_EQ(unsigned{ RES_720P50HZ }, read_mode("720p50hz"));
    EXPECT_EQ(unsigned{ RES_576I }, read_mode("576i"));
    EXPECT_EQ(unsigned{ RES_576I }, read_mode("576i50"));
    EXPECT_EQ(unsigned{ RES_1080P23_976HZ }, read_mode("1080p23.976"));
    EXPECT_EQ(38u, read_mode("38"));
}

TEST(ModeNames, Unknown_IsAnsweredWithTheNearest)
{
    EXPECT_EQ(0u, refusal_of("1080p").find("no mode is called 1080p; did you mean ")) << refusal_of("1080p");
    EXPECT_EQ("no mode is called 720p55; did you mean 720p50, 720p60?", refusal_of("720p55"));
    EXPECT_EQ("mode: PMX_TV_TYPE_PAL is the name of something else", refusal_of("PMX_TV_TYPE_PAL").substr(0, 51));
    EXPECT_EQ(0u, refusal_of("RES_480PP").find("mode: RES_480PP is neither a number nor a name"));
    EXPECT_EQ("10", refusal_of("0x0A"));
    EXPECT_EQ(0u, refusal_of("").find("mode: ")) << refusal_of("");
}

TEST(OutputsVerb, IsTheFullCall)
{
    const std::string full = run("PMX_Init\nPMX_SetModeEx 0 [ [0], [1, RES_720P50HZ], [0], [1, RES_576I] ] 50 "
                                 "DRV_NON_EXT_CHIP 0")
                                 .shown;
    const auto shorter = run("PMX_Init\noutputs hdmi=720p50 cvbs=576i\nexpect result 1");
    EXPECT_TRUE(shorter.done) << shorter.diagnostics;
    EXPECT_NE(std::string::npos, shorter.shown.find("  PMX_SetModeEx 0 [ [0], [1, RES_720P50HZ], [0], [1, RES_576I] ] "
                                                    "50 DRV_NON_EXT_CHIP 0\n"));
    const std::string calls = full.substr(full.find("  | SetModeEx"));
    EXPECT_NE(std::string::npos, shorter.shown.find(calls)) << shorter.shown;
}

TEST(OutputsVerb, OfTheFrequencyOfTheFirstOutput)
{
    EXPECT_EQ("", diagnostics("PMX_Init\noutputs composite=576i hdmi=1080p23.976\nexpect state ucVfreq 23\n"
                              "outputs component=480p digital=576p\nexpect state ucVfreq 50\n"
                              "expect state arOutputConf[0] {eResMode=RES_576P, fgOutputEnable=1, ...}\n"
                              "outputs hdmi=off\nexpect state ucVfreq 60\n"
                              "meanwhile x_thread_delay outputs hdmi=480p\nvSetPLLGP_HDMIDDS 3\n"
                              "expect state ucMode RES_480P"));
}

TEST(OutputsVerb, WrittenWrong)
{
    EXPECT_EQ("here.pmx:1: there is no output hdm; did you mean hdmi?\n", diagnostics("outputs hdm=480p"));
    EXPECT_EQ("here.pmx:1: hdmi is given twice\n", diagnostics("outputs hdmi=480p hdmi=off"));
    EXPECT_EQ("here.pmx:1: cvbs is given twice\n", diagnostics("outputs composite=480i cvbs=480i"));
    EXPECT_EQ("here.pmx:1: the name of RES_2160P does not tell its frequency; PMX_SetModeEx takes both\n",
              diagnostics("outputs hdmi=2160p"));
    EXPECT_EQ("here.pmx:1: write: outputs SETTING [SETTING…]; SETTING is OUTPUT=MODE or OUTPUT=off, such as "
              "hdmi=720p50; OUTPUT is digital, hdmi, component or composite (cvbs)\n",
              diagnostics("outputs hdmi"));
}

/** Requests near one that was refused are told apart by it. */
TEST(ModeNames, TheLetterI_MeansInterlacedAlone)
{
    for (const std::string_view mode : pmxboard::names_in(board::names::Family::ResolutionMode))
    {
        const std::size_t i = mode.find('I');
        const std::string_view before = mode.substr(0, i == mode.npos ? 0 : i);
        EXPECT_EQ(before.size(), before.find_last_of("0123456789") + 1) << mode;
    }
}

} // namespace
