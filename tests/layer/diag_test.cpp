// SPDX-License-Identifier: MIT OR GPL-2.0-only
// PMX_Printf prints what a bit of PMX_debug_level lets through.

#include <climits>
#include <string>

#include <gtest/gtest.h>

#include "tests/support/layer_fixture.h"

using Diag = LayerTest;

namespace
{

/** What a print of this level puts on the console. */
std::string printed_at(INT32 level)
{
    board::trace::clear();
    PMX_Printf(level, "level %d\n", level);
    std::string text;
    for (const board::TraceEntry& entry : board::trace::entries())
        text += entry.text;
    return text;
}

} // namespace

TEST_F(Diag, Printf_FormatsThenPrints)
{
    PMX_debug_level = 1;
    PMX_Printf(0, "%s is %d, 0x%08x\n", "mode", -12, 0xBEEFu);
    EXPECT_TRACE(R"(
        x_vsnprintf("mode is -12, 0x0000beef\n", 512, "%s is %d, 0x%08x\n") = 24
        UTIL_Printf "mode is -12, 0x0000beef\n"
    )");
}

TEST_F(Diag, Printf_GoesToTheConsoleWhateverItsLevel)
{
    board::set_console_level(-1);
    PMX_debug_level = 0x10;
    PMX_Printf(4, "text\n");
    EXPECT_EQ("text\n", board::console_text());
}

TEST_F(Diag, Printf_MaskAtLoad_AdmitsNothing)
{
    EXPECT_EQ(0u, PMX_debug_level);
    for (INT32 level = 0; level < 32; ++level)
        PMX_Printf(level, "level %d\n", level);
    EXPECT_NO_TRACE();
    EXPECT_EQ("", board::console_text());
}

TEST_F(Diag, Printf_Mask2_AdmitsLevel1Alone)
{
    PMX_debug_level = 0x2;
    for (INT32 level = 0; level < 32; ++level)
        EXPECT_EQ(level == 1 ? "level 1\n" : "", printed_at(level));
}

TEST_F(Diag, Printf_EachBit_AdmitsItsLevelAlone)
{
    for (INT32 bit = 0; bit < 32; ++bit)
    {
        PMX_debug_level = 1u << bit;
        for (INT32 level = 0; level < 32; ++level)
        {
            const std::string line = "level " + std::to_string(level) + "\n";
            EXPECT_EQ(level == bit ? line : "", printed_at(level)) << "bit " << bit << ", level " << level;
        }
    }
}

TEST_F(Diag, Printf_EachBitMissing_HoldsItsLevelBackAlone)
{
    for (INT32 bit = 0; bit < 32; ++bit)
    {
        PMX_debug_level = ~(1u << bit);
        for (INT32 level = 0; level < 32; ++level)
            EXPECT_EQ(level == bit, printed_at(level).empty()) << "bit " << bit << ", level " << level;
    }
}

TEST_F(Diag, Printf_LevelWithoutABit_PrintsNothingWithEveryBitSet)
{
    PMX_debug_level = 0xFFFFFFFF;
    board::trace::clear();
    for (INT32 level : { -1, -31, -32, -33, 32, 33, 63, 64, 255, 256, INT_MIN, INT_MIN + 1, INT_MAX - 1, INT_MAX })
    {
        PMX_Printf(level, "level %d\n", level);
        EXPECT_NO_TRACE() << "level " << level;
    }
    EXPECT_EQ("", board::console_text());
}

TEST_F(Diag, Printf_TextOf511Characters_IsPrintedWhole)
{
    PMX_debug_level = 1;
    const std::string text(511, 'a');
    PMX_Printf(0, "%s", text.c_str());
    EXPECT_TRACE("x_vsnprintf(*, 512, \"%s\") = 511\n"
                 "UTIL_Printf \"" +
                 text + "\"\n");
}

TEST_F(Diag, Printf_LongerText_IsCutTo511Characters)
{
    PMX_debug_level = 1;
    const std::string text(511, 'a');
    PMX_Printf(0, "%s%s", text.c_str(), "b");
    EXPECT_TRACE("x_vsnprintf(*, 512, \"%s%s\") = 512\n"
                 "UTIL_Printf \"" +
                 text + "\"\n");

    PMX_Printf(0, "%s%1000d", text.c_str(), 1);
    EXPECT_TRACE("x_vsnprintf(*, 512, \"%s%1000d\") = 1511\n"
                 "UTIL_Printf \"" +
                 text + "\"\n");
}

TEST_F(Diag, Printf_EmptyText)
{
    PMX_debug_level = 1;
    PMX_Printf(0, "%s", "");
    EXPECT_TRACE(R"(
        x_vsnprintf("", 512, "%s") = 0
        UTIL_Printf ""
    )");
}

TEST_F(Diag, Printf_PercentSignsOfTheFormattedText_AreInterpretedOnceMore)
{
    PMX_debug_level = 1;
    PMX_Printf(0, "%%%%");
    EXPECT_TRACE(R"(
        x_vsnprintf("%%", 512, "%%%%") = 2
        UTIL_Printf "%"
    )");
    EXPECT_EQ("%", board::console_text());
}

TEST_F(Diag, Printf_PercentSignsOfAValue_AreInterpretedToo)
{
    PMX_debug_level = 1;
    PMX_Printf(0, "%s of %d\n", "50%%", 2);
    EXPECT_TRACE(R"(
        x_vsnprintf("50%% of 2\n", 512, "%s of %d\n") = 10
        UTIL_Printf "50% of 2\n"
    )");
}

TEST_F(Diag, Printf_ModeWithoutAName_IsPrintedAsNull)
{
    PMX_debug_level = 1;
    PMX_Printf(0, "%s\n", szResStr[RES_2160P]);
    EXPECT_TRACE(R"(
        x_vsnprintf("(null)\n", 512, "%s\n") = 7
        UTIL_Printf "(null)\n"
    )");
}

TEST_F(Diag, Printf_ChangesNothing)
{
    PMX_debug_level = 0xFFFFFFFF;
    const RecordSnapshot before;
    PMX_Printf(0, "text %d\n", 1);
    PMX_Printf(31, "text %d\n", 2);
    PMX_Printf(32, "text %d\n", 3);
    EXPECT_RECORD_UNCHANGED(before);
}
