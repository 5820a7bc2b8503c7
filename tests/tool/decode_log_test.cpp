// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include "tools/pmxboard/decode/log.h"
#include "tools/pmxboard/text/printable.h"

namespace
{

using namespace pmxboard;
using namespace pmxboard::decode;

TEST(DecodeLog, PrefixesOfEveryKind_DoNotMatter)
{
    for (const char* const prefix : { "", "[   12.345678] ", "12:34:56.789 ", "\x1b[31m", "  | ", "<6>[    1.5] " })
    {
        const Log log = read_log(std::string(prefix) + "HDMI(1, RES_720P60HZ)\r\n");
        ASSERT_EQ(1u, log.items.size()) << prefix;
        EXPECT_EQ("HDMI(1, RES_720P60HZ)", log.items[0].shown) << prefix;
        EXPECT_EQ("RES_720P60HZ", log.items[0].value("eResMode")) << prefix;
        EXPECT_EQ(1, log.items[0].number("fgOutputEnable")) << prefix;
    }
}

TEST(DecodeLog, TextsOnOneLine_AreSeveral)
{
    const Log log = read_log("PMX_Uninit CC_A disableScaler CC disable\n");
    ASSERT_GE(log.items.size(), 2u);
    EXPECT_EQ("PMX_Uninit", log.items[0].shown);
    EXPECT_EQ(1u, log.items[1].line);
}

TEST(DecodeLog, TextBrokenByAForeignLine_IsPutTogether)
{
    const Log log = read_log("PMX Finished to s\nusb 1-1: new device\net OSD Display mode.\n");
    ASSERT_EQ(1u, log.items.size());
    EXPECT_EQ("PMX Finished to set OSD Display mode.", log.items[0].shown);
    EXPECT_EQ(1u, log.items[0].line);
    EXPECT_EQ(3u, log.items[0].last_line);
    EXPECT_EQ(Item::Cut::None, log.items[0].cut);
    EXPECT_EQ(0u, log.cut);
    EXPECT_EQ(1u, log.foreign);
}

TEST(DecodeLog, CutAtBothEnds_IsMarked)
{
    const Log log = read_log("hed to set OSD Display mode.\nPMX_Stop\nAdjust PMX_ColorSpaceSe");
    ASSERT_EQ(3u, log.items.size());
    EXPECT_EQ(Item::Cut::Begin, log.items[0].cut);
    EXPECT_EQ(Item::Cut::None, log.items[1].cut);
    EXPECT_EQ(Item::Cut::End, log.items[2].cut);
    EXPECT_EQ(2u, log.cut);
}

TEST(DecodeLog, Level_IsTheHighestThatShows)
{
    EXPECT_EQ(std::nullopt, read_log("foreign\n").level);
    EXPECT_EQ(1, read_log("SetModeEx\nPMX_Stop\n").level);
    EXPECT_EQ(9, read_log("OSD5(0)\nPMX_Stop\n").level);
}

TEST(DecodeLog, ForeignLines_AreNotTaken)
{
    for (const char* const line : { "player: calling SetModeEx again", "my_PMX_Initialise", "mode 0", "",
                                    "cc: src/driver/pmx/pmx_mode.cpp: no such file" })
        EXPECT_TRUE(read_log(line).items.empty()) << line;
}

TEST(DecodeLog, OneTextIsReadAlone_AndWhole)
{
    EXPECT_TRUE(read_text("PMX_Stop"));
    for (const char* const none :
         { "", "player: hello", "PMX_Stop PMX_Init", "HDMI(1, RES_108", "PMX Finished to set OSD Dis" })
        EXPECT_FALSE(read_text(none)) << none;
}

TEST(DecodeLog, ATraceWhoseLinesLackSomething_IsReadAsFarAsItGoes)
{
    const Log log = read_log("{\"sequence\":1,\"kind\":\"log\"}\n"
                             "{\"sequence\":2,\"kind\":\"log\",\"text\":5,\"time_us\":7}\n"
                             "{\"sequence\":3,\"kind\":\"log\",\"text\":\"PMX_Stop\\n\",\"time_us\":\"x\"}\n"
                             "{\"sequence\":4,\"kind\":\"log\",\"text\":\"PMX_Init\\n\"}\n"
                             "{\"sequence\":5,\"kind\":\"assert\"}\n"
                             "{\"sequence\":6,\"kind\":\"assert\",\"arguments\":[]}\n"
                             "{\"sequence\":7,\"kind\":\"assert\",\"time_us\":1,\"arguments\":{\"szExpression\":\"0\","
                             "\"szFile\":\"src/driver/pmx/pmx_colour.cpp\"}}\n"
                             "{\"sequence\":8,\"kind\":\"call\",\"function\":\"x\"}\n");
    EXPECT_EQ(Log::Form::Trace, log.form);
    ASSERT_EQ(3u, log.items.size());
    EXPECT_EQ("PMX_Stop", log.items[0].shown);
    EXPECT_EQ(3u, log.items[0].line);
    EXPECT_EQ("PMX_Init", log.items[1].shown);
    EXPECT_EQ("0, pmx_colour.cpp", log.items[2].shown);
    EXPECT_EQ(7u, log.items[2].line);
}

TEST(DecodeLog, Assertion_IsKnownByExpressionAndFile)
{
    const auto one = read_text("ASSERT x_sema_delete (MutexPMX) == OSR_OK, src/driver/pmx/pmx_lifecycle.cpp:88");
    ASSERT_TRUE(one);
    EXPECT_EQ(level_assertion, one->text->level);
    EXPECT_EQ((std::vector<std::string>{ "pmx_lifecycle.cpp", "88" }), one->values);
    const auto nought = read_text("ASSERT 0, src/driver/pmx/pmx_colour.cpp:12");
    ASSERT_TRUE(nought);
    EXPECT_EQ("0", nought->text->format);
    EXPECT_EQ("0, pmx_colour.cpp", nought->shown);
}

TEST(DecodeLog, AnAssertionOfAnUnknownExpression_IsKnownByItsFileAlone)
{
    for (const char* const expression : { "fgMine", "i == 10", "i == 0x1" }) // and not by the 0 within a number
    {
        const auto one = read_text("ASSERT " + std::string(expression) + ", src/driver/pmx/pmx_colour.cpp:12");
        ASSERT_TRUE(one) << expression;
        EXPECT_EQ(level_file, one->text->level) << expression;
        EXPECT_EQ("src/driver/pmx/pmx_colour.cpp", one->shown) << expression;
        EXPECT_EQ((std::vector<std::string>{ "pmx_colour.cpp", "12" }), one->values) << expression;
    }
}

TEST(DecodeLog, AFile_BelongsToTheExpressionOfItsOwnLine)
{
    const Log log = read_log("ASSERT x_sema_unlock(MutexPMX) == OSR_OK, src/dr\n"
                             "ASSERT 0, src/driver/pmx/pmx_colour.cpp:12\n"
                             "ASSERT 0, src/driver/pmx/pmx_colour.cpp:13 ASSERT 0, src/driver/pmx/pmx_source.cpp:14\n");
    ASSERT_EQ(4u, log.items.size());
    EXPECT_TRUE(log.items[0].values.empty());
    EXPECT_EQ((std::vector<std::string>{ "pmx_colour.cpp", "12" }), log.items[1].values);
    EXPECT_EQ((std::vector<std::string>{ "pmx_colour.cpp", "13" }), log.items[2].values);
    EXPECT_EQ((std::vector<std::string>{ "pmx_source.cpp", "14" }), log.items[3].values);
    EXPECT_EQ("0, pmx_source.cpp", log.items[3].shown);
}

TEST(DecodeLog, OnlyTheSameAgain_StandsTwice)
{
    EXPECT_EQ(1u, read_log("[    1.000001] Inform Vdp CS(0)\n[    1.000001] Inform Vdp CS(0)\n").twice);
    EXPECT_EQ(0u, read_log("[    1.000001] Inform Vdp CS(0)\n[    1.000001] Inform Vdp CS(1)\n").twice);
    EXPECT_EQ(0u, read_log("[    1.000001] Inform Vdp CS(0) Inform Vdp CS(0)\n").twice);
}

TEST(DecodeLog, ALine_PassesNoMoreThanABufferHolds)
{
    std::string younger;
    for (int i = 10; i < 50; ++i)
        younger += "[   10." + std::to_string(i) + "0000] PMX_Stop\n";
    const Log log = read_log(younger + "[   10.000000] PMX_Stop\n");
    EXPECT_EQ(1u, log.displaced);
    EXPECT_EQ(40u, log.order[40 - 32]);
}

TEST(DecodeLog, Printable_HasNoControlCharactersAndIsShortened)
{
    EXPECT_EQ("a\\x07b\\xFF", printable("a\ab\xff", 80));
    EXPECT_EQ("abc…", printable("abcdef", 4));
}

} // namespace
