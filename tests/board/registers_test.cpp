// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"

#include "u_os.h"

namespace
{

constexpr UINT32 control_a = 0xFD00003C;
constexpr UINT32 synthesiser = 0xFD000040;
constexpr UINT32 control_b = 0xFD000044;

class Registers : public DeviceTest
{
protected:
    static std::string now(std::string_view path) { return member(board::registers::state(), path); }

    static void set(UINT32 address, UINT32 bits) { x_reg_write32(address, x_reg_read32(address) | bits); }
    static void clear(UINT32 address, UINT32 bits) { x_reg_write32(address, x_reg_read32(address) & ~bits); }

    /** The sequence that brings the PLL up; one of its ten parts may be left out. */
    static void bring_up(UINT32 word, int without = 0)
    {
        if (without != 1)
            set(control_b, 0x7);
        if (without != 2)
            x_reg_write32(synthesiser, word);
        if (without != 3)
            set(control_a, 0x2);
        if (without != 4)
            set(control_b, 0x4000);
        if (without != 5)
            x_thread_delay(1);
        if (without != 6)
        {
            set(control_a, 0x4);
            clear(control_a, 0x4);
        }
        if (without != 7)
        {
            set(synthesiser, 0x1);
            clear(synthesiser, 0x1);
        }
        if (without != 8)
            x_thread_delay(1);
        if (without != 9)
            set(control_a, 0x10000);
        if (without != 10)
            set(control_b, 0x10);
    }
};

TEST_F(Registers, AWordReadsWhatWasWrittenLast_ZeroBefore)
{
    EXPECT_EQ(0u, x_reg_read32(0xFD00003C));
    EXPECT_EQ("x_reg_read32(0xFD00003C) = 0x0", last_call());
    x_reg_write32(0xFD00003C, 0xFFFFFFFF);
    EXPECT_EQ("x_reg_write32(0xFD00003C, 0xFFFFFFFF)", last_call());
    EXPECT_EQ(0xFFFFFFFFu, x_reg_read32(0xFD00003C));
    EXPECT_EQ("x_reg_read32(0xFD00003C) = 0xFFFFFFFF", last_call());
    x_reg_write32(0x10, 7);
    EXPECT_EQ("{0x10=0x7, 0xFD00003C=0xFFFFFFFF}", now("words"));
    EXPECT_EQ("2", now("reads"));
    EXPECT_EQ("2", now("writes"));
}

TEST_F(Registers, PowerOn_ForgetsEverything)
{
    bring_up(0x03D2F1AA);
    power_on({});
    EXPECT_EQ("{reads=0, writes=0, words={}, pll={synthesiser_word=0x0, family=null, load_pulse_pending=0, "
              "reset_pulse_pending=0, load_pulses=0, reset_pulses=0, powered=0, enabled=0, complete_sequences=0, "
              "broken_sequences=0, steps_of_running_sequence=0}}",
              board::registers::state().to_text());
}

TEST_F(Registers, AnAddressBetweenWords_IsReportedAndHarmless)
{
    x_reg_write32(0xFD00003D, 1);
    EXPECT_EQ(0u, x_reg_read32(0xFD00003E));
    EXPECT_EQ(2u, board::misuses());
    EXPECT_EQ("{}", now("words"));
}

TEST_F(Registers, Pll_CompleteSequence)
{
    bring_up(0x03D2F1AA);
    EXPECT_EQ("{synthesiser_word=0x3D2F1AA, family=\"60 Hz family\", load_pulse_pending=0, reset_pulse_pending=0, "
              "load_pulses=1, reset_pulses=1, powered=1, enabled=1, complete_sequences=1, broken_sequences=0, "
              "steps_of_running_sequence=0}",
              now("pll"));
    EXPECT_EQ("{0xFD00003C=0x10002, 0xFD000040=0x3D2F1AA, 0xFD000044=0x4017}", now("words"));
}

TEST_F(Registers, Pll_AgainForTheOtherFamily)
{
    bring_up(0x03D2F1AA);
    bring_up(0x03D1745E);
    EXPECT_EQ("\"50/24 Hz family\"", now("pll.family"));
    EXPECT_EQ("2", now("pll.complete_sequences"));
    EXPECT_EQ("2", now("pll.load_pulses"));
    EXPECT_EQ("2", now("pll.reset_pulses"));
    EXPECT_EQ("0", now("pll.broken_sequences"));
}

TEST_F(Registers, Pll_AnythingLeftOut_IsNoCompleteSequence)
{
    for (int part = 1; part <= 10; ++part)
    {
        power_on({});
        bring_up(0x03D2F1AA, part);
        EXPECT_EQ("0", now("pll.complete_sequences")) << "without part " << part;
        EXPECT_EQ(part == 6 ? "0" : "1", now("pll.reset_pulses")) << "without part " << part;
        EXPECT_EQ(part == 7 ? "0" : "1", now("pll.load_pulses")) << "without part " << part;
        EXPECT_EQ(part == 3 || part == 4 || part == 1 ? "0" : "1", now("pll.powered")) << "without part " << part;
        EXPECT_EQ(part == 9 || part == 10 ? "0" : "1", now("pll.enabled")) << "without part " << part;
    }
}

TEST_F(Registers, Pll_AWriteThatChangesOtherBits_BreaksTheSequence)
{
    set(control_b, 0x7);
    x_reg_write32(synthesiser, 0x03D2F1AA);
    EXPECT_EQ("2", now("pll.steps_of_running_sequence"));
    x_reg_write32(control_a, 0x82);
    EXPECT_EQ("0", now("pll.steps_of_running_sequence"));
    EXPECT_EQ("1", now("pll.broken_sequences"));
    bring_up(0x03D2F1AA);
    EXPECT_EQ("1", now("pll.complete_sequences")) << "a later one counts";
    EXPECT_EQ("1", now("pll.broken_sequences"));
}

TEST_F(Registers, Pll_StartingOver_BreaksTheSequenceAndBeginsTheNext)
{
    set(control_b, 0x7);
    x_reg_write32(synthesiser, 0x03D2F1AA);
    bring_up(0x03D1745E);
    EXPECT_EQ("1", now("pll.broken_sequences"));
    EXPECT_EQ("1", now("pll.complete_sequences"));
}

TEST_F(Registers, Pll_PulsesThatArePending)
{
    x_reg_write32(synthesiser, 0x03D1745F);
    x_reg_write32(control_a, 0x4);
    EXPECT_EQ("1", now("pll.load_pulse_pending"));
    EXPECT_EQ("1", now("pll.reset_pulse_pending"));
    EXPECT_EQ("\"50/24 Hz family\"", now("pll.family")) << "the load bit is no part of the word";
    EXPECT_EQ("0", now("pll.load_pulses"));
    x_reg_write32(synthesiser, 0x12345679);
    x_reg_write32(control_a, 0x6);
    EXPECT_EQ("0", now("pll.load_pulses")) << "they last until they are taken back";
    EXPECT_EQ("0", now("pll.reset_pulses"));
    x_reg_write32(synthesiser, 0x12345678);
    x_reg_write32(control_a, 0x2);
    EXPECT_EQ("1", now("pll.load_pulses"));
    EXPECT_EQ("1", now("pll.reset_pulses"));
    EXPECT_EQ("null", now("pll.family"));
}

TEST_F(Registers, Fault_AnswersARead)
{
    x_reg_write32(0x10, 7);
    answer_always("x_reg_read32", 0xFFFFFFFF);
    EXPECT_EQ(0xFFFFFFFFu, x_reg_read32(0x10));
    EXPECT_EQ("x_reg_read32(0x10) = 0xFFFFFFFF", last_call());
    EXPECT_EQ("0", now("reads"));
}

} // namespace
