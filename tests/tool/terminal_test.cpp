// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <string>

#include "tools/pmxboard/graphics/terminal.h"

namespace
{

using pmxboard::answer_in;
using pmxboard::TerminalAnswer;

const std::string takes_kitty = "\x1b_Gi=31;OK\x1b\\";
const std::string takes_sixel = "\x1b[?62;4;22c";
const std::string takes_none = "\x1b[?62;22c";

/** "kitty sixel complete | typed", with what does not hold left out. */
std::string told(const std::string& received)
{
    const TerminalAnswer answer = answer_in(received);
    return std::string(answer.kitty ? "kitty " : "") + (answer.sixel ? "sixel " : "") +
           (answer.complete ? "complete " : "") + "| " + answer.typed;
}

TEST(TerminalAnswer, IsToldFromKeys)
{
    EXPECT_EQ("kitty sixel complete | state", told("sta" + takes_kitty + "t" + takes_sixel + "e"));
    EXPECT_EQ("complete | ", told(takes_none));
    EXPECT_EQ("complete | ", told("\x1b[?4c")) << "the terminal's class is no ability";
    EXPECT_EQ("complete | \x1b[A\x1b[1;5C\x1b", told("\x1b[A" + takes_none + "\x1b[1;5C\x1b")) << "these are keys";
    EXPECT_EQ("complete | ", told("\x1b_Gi=31;EINVAL:no\x1b\\" + takes_none));
    EXPECT_EQ("complete | ", told("\x1b_Gi=312;OK\x1b\\" + takes_none)) << "an answer to somebody else";
}

TEST(TerminalAnswer, OneThatBreaksOffIsNothingTyped)
{
    for (const std::string& whole : { takes_sixel, takes_kitty })
    {
        for (std::size_t length = 3; length < whole.size(); ++length)
            EXPECT_EQ("| ls", told("ls" + whole.substr(0, length))) << length;
    }
    EXPECT_EQ("sixel complete | ls", told("\x1b_Gi=31;O" + takes_sixel + "ls"));
    EXPECT_EQ("kitty complete | \nls", told("\x1b[?62;4\n" + takes_kitty + takes_none + "ls"));
}

TEST(TerminalAnswer, ZeroesAndStrayBytesAreKeys)
{
    const std::string stray("\0\xff\x80", 3);
    EXPECT_EQ("kitty sixel complete | " + stray + stray, told(stray + takes_kitty + stray + takes_sixel));
}

TEST(TerminalAnswer, TheFirstCounts)
{
    EXPECT_EQ("complete | ", told(takes_none + takes_sixel + takes_kitty));
    std::string many;
    for (int i = 0; i < 1000; ++i)
        many += takes_kitty;
    EXPECT_EQ("kitty | ", told(many));
}

TEST(TerminalAnswer, TakesAsLongAsWhatCame)
{
    constexpr std::size_t mebibyte = std::size_t{ 1 } << 20;
    for (const std::string piece : { "\x1b", "\x1b[?", "\x1b_G", "\x1b[?6;", "\x1b_Gi=31;", "x" })
    {
        std::string received;
        while (received.size() < mebibyte)
            received += piece;
        const TerminalAnswer answer = answer_in(received + takes_sixel);
        EXPECT_TRUE(answer.sixel) << piece;
        EXPECT_LE(answer.typed.size(), received.size());
    }
    const TerminalAnswer answer = answer_in("\x1b_Gi=31;" + std::string(mebibyte, 'x') + ";OK\x1b\\");
    EXPECT_FALSE(answer.kitty) << "no terminal says so much";
}

} // namespace
