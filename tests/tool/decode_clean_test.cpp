// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/clean.h"

#include <gtest/gtest.h>

namespace
{

using namespace pmxboard::decode;

TEST(DecodeClean, TerminalSequencesAndControlCharactersGo)
{
    EXPECT_EQ("PMX_Init", clean("\x1b[1;32mPMX_\x1b[0mInit"));
    EXPECT_EQ("PMX_Init", clean("\x1b]0;title\aPMX_Init"));
    EXPECT_EQ("a b", clean("a\tb"));
    EXPECT_EQ("ab", clean(std::string_view("a\0b\x7f\b", 5)));
    EXPECT_EQ("ü", clean("ü"));
    EXPECT_EQ("PMX_Init", clean("PMX_Init\x1b["));
    EXPECT_EQ("PMX_Init1;3", clean("PMX_Init\x1b[1;3")) << "what does not end is none";
    EXPECT_EQ("PMX_Init1x", clean("PMX_Init\x1b[1\x01x"));
}

TEST(DecodeClean, ATextInTheTraceHasItsLineEndWrittenOut)
{
    EXPECT_EQ("LOG1 \"PMX_Stop", clean(R"(LOG1 "PMX_Stop\n")"));
    EXPECT_EQ("UTIL_Printf \"TESTPMX: Get pard ID:0.", clean(R"(UTIL_Printf "TESTPMX: Get pard ID:0.\n")"));
    for (const char* const as_it_stands : { R"(LOG1 "PMX_Stop")", R"(LOG1 "Main")", R"(LOG"")", R"("PMX_Stop\n")" })
        EXPECT_EQ(as_it_stands, clean(as_it_stands));
}

TEST(DecodeClean, TimeStampsAreReadWhateverTheirForm)
{
    EXPECT_DOUBLE_EQ(41.20523, stamp_of("[   41.205230] PMX_Init").seconds.value_or(0));
    EXPECT_EQ("12:34:56.789", stamp_of("12:34:56.789 PMX_Init").text);
    EXPECT_DOUBLE_EQ(45296.789, stamp_of("12:34:56,789 PMX_Init").seconds.value_or(0));
    EXPECT_EQ("", stamp_of("PMX_Init").text);
    EXPECT_EQ("12:34:56", stamp_of("ttyS0 12:34:56: PMX_Init").text);
    EXPECT_EQ("5.25", stamp_of("(  5.25) PMX_Init").text);
    EXPECT_EQ("", stamp_of("HDMI(1, RES_480I)").text);
    for (const char* other : { "x1.12:34:56", "112:34:56", "12:34:5", "v 5.25 x", "[5.25x]", "[5.]",
                               "12:34:", "ab:34:56", "1x:34:56", "12:ab:56", "12:34:ab" })
        EXPECT_EQ("", stamp_of(other).text) << other;
}

TEST(DecodeClean, OfSeveralTimeStamps_TheFinestIsMeant)
{
    EXPECT_EQ("12.345678", stamp_of("Nov 22 12:34:56 player kernel: [   12.345678] ").text);
    EXPECT_EQ("12:34:56", stamp_of("Nov 22 12:34:56 player app[123]: ").text);
    EXPECT_EQ("12:34:56.789012", stamp_of("2026-11-22T12:34:56.789012+00:00 [   12.345] ").text);
    EXPECT_EQ("12.5", stamp_of("<6>[   12.5] ").text);
    EXPECT_DOUBLE_EQ(13 * 3600, stamp_of("01:00:00 PM ").seconds.value_or(0));
    EXPECT_DOUBLE_EQ(0, stamp_of("12:00:00 AM ").seconds.value_or(1));
    EXPECT_DOUBLE_EQ(11 * 3600, stamp_of("11:00:00 AM ").seconds.value_or(0));
}

TEST(DecodeClean, APrefixDoesNotEndInAWord)
{
    for (const char* prefix : { "", "   ", "[ 1.5] ", "PMX: ", "10:00:00 AM ", "12.5 " })
        EXPECT_TRUE(is_prefix(prefix)) << prefix;
    for (const char* words : { "the ", "x", "12" })
        EXPECT_FALSE(is_prefix(words)) << words;
}

} // namespace
