// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/tokens.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <string>

namespace
{

namespace tokens = board::tokens;

using Parts = std::vector<std::string_view>;

/** What is wrong with a text that cannot be split. */
std::string refused(std::string_view text)
{
    try
    {
        tokens::split(text);
    }
    catch (const std::invalid_argument& error)
    {
        return error.what();
    }
    return "nothing";
}

TEST(Tokens, Split_AtCommasOutsideOfBracketsAndQuotes)
{
    EXPECT_EQ(Parts(), tokens::split(" \t"));
    EXPECT_EQ((Parts{ "a", "[1, 2]", "{x=(3, 4)}", "\"5, ]\"" }), tokens::split(" a,[1, 2] , {x=(3, 4)}, \"5, ]\""));
}

TEST(Tokens, Split_RefusesWhatIsNotWellFormed)
{
    for (const char* text : { "1]", "1)", "1}" })
        EXPECT_EQ(std::string("a bracket closes that was not opened: ") + text, refused(text));
    for (const char* text : { "[1", "[1)", "[1}", "(1]", "{(}" })
        EXPECT_TRUE(refused(text).starts_with("a bracket is not closed: ")) << text;
    EXPECT_EQ("nothing stands before or behind a comma: 1,", refused("1,"));
    EXPECT_TRUE(refused("\"a").starts_with("a text is not closed: "));
}

TEST(Tokens, Brackets_StandInEachOtherAsDeepAsIsTold)
{
    EXPECT_EQ("nothing", refused(std::string(64, '[') + std::string(64, ']')));
    EXPECT_EQ("brackets stand more than 64 deep in each other", refused(std::string(65, '[') + std::string(65, ']')));
}

TEST(Tokens, Inside_IsWhatOneBracketEncloses)
{
    EXPECT_EQ("1, [2]", tokens::inside("[1, [2]]", '[', ']'));
    for (const char* text : { "", "[", "(1)", "[1] ", "[1][2]" })
        EXPECT_THROW((void)tokens::inside(text, '[', ']'), std::invalid_argument) << text;
}

} // namespace
