// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/line.h"

#include <gtest/gtest.h>

#include "tools/pmxboard/functions/errors.h"

namespace
{

using pmxboard::Line;
using Words = std::vector<std::string>;

std::string reason(const std::string& text)
{
    try
    {
        const Line line(text);
        return "taken apart into " + std::to_string(line.size()) + " words";
    }
    catch (const pmxboard::LineError& error)
    {
        return error.what();
    }
}

TEST(ScenarioLine, Words_AreSeparatedByBlanks)
{
    EXPECT_EQ((Words{ "PMX_SetEnable", "0", "1" }), Line("  PMX_SetEnable \t0   1\r").words());
}

TEST(ScenarioLine, Comment_EndsTheLine)
{
    EXPECT_TRUE(Line("").empty());
    EXPECT_TRUE(Line("   # nothing but a comment \"").empty());
    EXPECT_EQ((Words{ "loglevel", "9" }), Line("loglevel 9# and why").words());
    EXPECT_EQ("loglevel 9", Line("loglevel 9   # and why").from(0));
}

TEST(ScenarioLine, Quotes_HoldBlanksHashesAndBracketsTogether)
{
    EXPECT_EQ((Words{ "print", R"("a # b \" ) c")", "d" }), Line(R"(print "a # b \" ) c" d)").words());
}

TEST(ScenarioLine, Brackets_HoldTogether)
{
    EXPECT_EQ((Words{ "a", "[1, {b=2, c=[3, 4]}]", "F(0, \")\")", "record.arPortInfo[3].ucLumaKey" }),
              Line("a [1, {b=2, c=[3, 4]}] F(0, \")\") record.arPortInfo[3].ucLumaKey").words());
}

TEST(ScenarioLine, From_IsTheLineAsWritten)
{
    const Line line("expect call  x_sema_lock(1, *)  =  0  # comment");
    EXPECT_EQ("x_sema_lock(1, *)  =  0", line.from(2));
    EXPECT_EQ("", line.from(9));
}

TEST(ScenarioLine, WhatDoesNotClose_IsRefused)
{
    EXPECT_EQ("a quote does not close: \"open", reason("print \"open"));
    EXPECT_EQ("a quote does not close: \"open\\\"", reason(R"(print "open\")"));
    EXPECT_EQ("a '[' does not close: [1, 2", reason("call [1, 2"));
    EXPECT_EQ("a '(' does not close: F(0", reason("expect call F(0"));
    EXPECT_EQ("a ')' closes nothing: F0)", reason("expect call F0)"));
    EXPECT_EQ("a ']' closes nothing: {1]", reason("call {1]"));
}

TEST(ScenarioLine, WordsAndBracketsHaveALimit)
{
    std::string words;
    for (unsigned i = 0; i < 1000; ++i)
        words += " 0";
    EXPECT_EQ("taken apart into 1000 words", reason(words));
    EXPECT_EQ("a line has more than 1000 words", reason(words + " 0"));
    EXPECT_EQ("taken apart into 1 words", reason(std::string(32, '[') + std::string(32, ']')));
    EXPECT_EQ("brackets stand more than 32 deep in each other", reason(std::string(33, '[') + std::string(33, ']')));
}

} // namespace
