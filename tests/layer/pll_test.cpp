// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The video PLL's frequency synthesiser. */
#include "tests/layer/mode_facts.h"
#include "tests/layer/sequences.h"
#include "tests/support/layer_fixture.h"
#include "u_os.h"

using VideoPll = LayerTest;

namespace
{

constexpr std::uint32_t word_60 = 64156074;
constexpr std::uint32_t word_other = 64058462;
static_assert(word_60 == 0x03D2F1AA && word_other == 0x03D1745E);

void preset(std::uint32_t a, std::uint32_t word, std::uint32_t b)
{
    x_reg_write32(sequences::pll_control_a, a);
    x_reg_write32(sequences::pll_word, word);
    x_reg_write32(sequences::pll_control_b, b);
    board::trace::clear();
}

} // namespace

TEST_F(VideoPll, SetPLLGP_1080P24_TakesTheWordOfAllOthers)
{
    vSetPLLGP_HDMIDDS(RES_1080P24HZ);
    EXPECT_TRACE(R"(
        x_reg_read32(0xFD000044) = 0
        x_reg_write32(0xFD000044, 0x7)
        x_reg_write32(0xFD000040, 0x03D1745E)
        x_reg_read32(0xFD00003C) = 0
        x_reg_write32(0xFD00003C, 0x2)
        x_reg_read32(0xFD000044) = 0x7
        x_reg_write32(0xFD000044, 0x4007)
        x_thread_delay(1)
        x_reg_read32(0xFD00003C) = 0x2
        x_reg_write32(0xFD00003C, 0x6)
        x_reg_read32(0xFD00003C) = 0x6
        x_reg_write32(0xFD00003C, 0x2)
        x_reg_read32(0xFD000040) = 0x03D1745E
        x_reg_write32(0xFD000040, 0x03D1745F)
        x_reg_read32(0xFD000040) = 0x03D1745F
        x_reg_write32(0xFD000040, 0x03D1745E)
        x_thread_delay(1)
        x_reg_read32(0xFD00003C) = 0x2
        x_reg_write32(0xFD00003C, 0x10002)
        x_reg_read32(0xFD000044) = 0x4007
        x_reg_write32(0xFD000044, 0x4017)
    )");
}

TEST_F(VideoPll, SetPLLGP_1080P23_976_TakesTheWordOfTheSixtyHertzFamily)
{
    vSetPLLGP_HDMIDDS(RES_1080P23_976HZ);
    EXPECT_TRACE(sequences::pll(0x03D2F1AA));
}

TEST_F(VideoPll, SetPLLGP_EveryByte_WholeSequenceWithItsFamilysWord)
{
    unsigned of_the_family = 0;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        SCOPED_TRACE(mode);
        const bool is_60 = mode_facts::facts_of(mode).is(mode_facts::pll_60);
        of_the_family += is_60 ? 1 : 0;
        preset(0, 0, 0);
        vSetPLLGP_HDMIDDS(static_cast<BYTE>(mode));
        EXPECT_TRACE(sequences::pll(is_60 ? word_60 : word_other));
    }
    EXPECT_EQ(mode_facts::modes_with(mode_facts::pll_60).size(), of_the_family);
}

TEST_F(VideoPll, SetPLLGP_OtherBitsOfTheControlWords_AreKept)
{
    preset(0xA5A0A5A0, 0, 0x5A5A1A28);
    vSetPLLGP_HDMIDDS(RES_480P);
    EXPECT_TRACE(R"(
        x_reg_read32(0xFD000044) = 0x5A5A1A28
        x_reg_write32(0xFD000044, 0x5A5A1A2F)
        x_reg_write32(0xFD000040, 0x03D2F1AA)
        x_reg_read32(0xFD00003C) = 0xA5A0A5A0
        x_reg_write32(0xFD00003C, 0xA5A0A5A2)
        x_reg_read32(0xFD000044) = 0x5A5A1A2F
        x_reg_write32(0xFD000044, 0x5A5A5A2F)
        x_thread_delay(1)
        x_reg_read32(0xFD00003C) = 0xA5A0A5A2
        x_reg_write32(0xFD00003C, 0xA5A0A5A6)
        x_reg_read32(0xFD00003C) = 0xA5A0A5A6
        x_reg_write32(0xFD00003C, 0xA5A0A5A2)
        x_reg_read32(0xFD000040) = 0x03D2F1AA
        x_reg_write32(0xFD000040, 0x03D2F1AB)
        x_reg_read32(0xFD000040) = 0x03D2F1AB
        x_reg_write32(0xFD000040, 0x03D2F1AA)
        x_thread_delay(1)
        x_reg_read32(0xFD00003C) = 0xA5A0A5A2
        x_reg_write32(0xFD00003C, 0xA5A1A5A2)
        x_reg_read32(0xFD000044) = 0x5A5A5A2F
        x_reg_write32(0xFD000044, 0x5A5A5A3F)
    )");
}

TEST_F(VideoPll, SetPLLGP_AllBitsSetBefore_OnlyTheResetPulseIsClearedAndTheWordIsPlainlyWritten)
{
    preset(0xFFFFFFFF, 0xFFFFFFFF, 0xFFFFFFFF);
    vSetPLLGP_HDMIDDS(RES_576P);
    EXPECT_TRACE(sequences::pll(0x03D1745E, 0xFFFFFFFF, 0xFFFFFFFF));
    EXPECT_EQ(0xFFFFFFFBu, x_reg_read32(sequences::pll_control_a));
    EXPECT_EQ(0x03D1745Eu, x_reg_read32(sequences::pll_word));
    EXPECT_EQ(0xFFFFFFFFu, x_reg_read32(sequences::pll_control_b));
}

TEST_F(VideoPll, SetPLLGP_EachBitSetBefore_IsKept)
{
    for (unsigned bit = 0; bit < 32; ++bit)
    {
        SCOPED_TRACE(bit);
        const std::uint32_t one = std::uint32_t{ 1 } << bit;
        preset(one, one, one);
        vSetPLLGP_HDMIDDS(RES_1080P60HZ);
        EXPECT_TRACE(sequences::pll(0x03D2F1AA, one, one));
        const std::uint32_t kept = bit == 2 ? 0 : one; // the reset pulse ends low
        EXPECT_EQ(0x00010002u | kept, x_reg_read32(sequences::pll_control_a));
        EXPECT_EQ(0x03D2F1AAu, x_reg_read32(sequences::pll_word));
        EXPECT_EQ(0x00004017u | one, x_reg_read32(sequences::pll_control_b));
    }
}

TEST_F(VideoPll, SetPLLGP_WaitsTwiceForOneMillisecond)
{
    const auto before = board::now();
    vSetPLLGP_HDMIDDS(RES_480I);
    EXPECT_EQ(std::chrono::milliseconds(2), board::now() - before);
}

TEST_F(VideoPll, SetPLLGP_KeepsNoState)
{
    started();
    const RecordSnapshot before;
    vSetPLLGP_HDMIDDS(RES_576I);
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(VideoPll, SetPLLGP_ClearedByOthersInBetween_EachStepSetsItsOwnBitsAlone)
{
    unsigned writes = 0;
    at_call("x_reg_write32", [&writes] {
        if (++writes == 2) // the word, behind the first bits
            x_reg_write32(sequences::pll_control_b, 0);
    });
    vSetPLLGP_HDMIDDS(RES_480P);
    EXPECT_EQ(0x4010u, x_reg_read32(sequences::pll_control_b));
}
