// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The parallel digital port: switch, width and mode, clock phase, drive strength. */
#include <string>

#include "tests/support/layer_fixture.h"

namespace
{

constexpr UINT32 digital_out_bit = 0x02000000;

std::string port(unsigned enable, unsigned mode, unsigned bits, unsigned format)
{
    return "PMX_HalSetDigitalOut(0, " + std::to_string(enable) + ", " + std::to_string(mode) + ", " +
           std::to_string(bits) + ")\nPMX_HalSetDigitalOutRgb(0, " + std::to_string(format) + ")\n";
}

} // namespace

class DigitalOut : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }

    static void mixer_on()
    {
        EXPECT_EQ(1u, PMX_SetEnable(0, 1));
        board::trace::clear();
    }
};

TEST_F(DigitalOut, SetDigitalOutEnable_MixerOff_OnlyStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, 0));
    EXPECT_NO_TRACE();
    EXPECT_RECORD_CHANGED(before, "ucDigitalOut");
    EXPECT_EQ(0, record("ucDigitalOut"));
    UCHAR enable = 99;
    EXPECT_EQ(1u, PMX_GetDigitalOutEnable(0, &enable));
    EXPECT_EQ(0, enable);
    EXPECT_NO_TRACE();
}

TEST_F(DigitalOut, SetDigitalOutEnable_MixerOn_ReachesTheHardwareWithModeWidthAndFormat)
{
    mixer_on();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, 0));
    EXPECT_TRACE(R"(
        PMX_HalSetDigitalOut(0, 0, 0, 24)
        PMX_HalSetDigitalOutRgb(0, PLA_MXR_DIGITAL_OUTPUT_FMT_YBR)
    )");
    EXPECT_RECORD_CHANGED(before, "ucDigitalOut");
    EXPECT_EQ(0, board::state().find("mixer.digital_out.enabled")->as_number());
    set_record("ucProprietaryMode", 5);
    set_record("ucDigitalBit", 30);
    set_record("ucDigitalRgb", 4);
    EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, 1));
    EXPECT_TRACE(R"(
        PMX_HalSetDigitalOut(0, 1, 5, 30)
        PMX_HalSetDigitalOutRgb(0, PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB)
    )");
    EXPECT_EQ(1, board::state().find("mixer.digital_out.enabled")->as_number());
}

TEST_F(DigitalOut, SetDigitalOutEnable_EachValue_IsStoredAndHandedOnAsGiven)
{
    for (unsigned enable = 0; enable < 256; ++enable)
    {
        set_record("ucEnable", 0);
        EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, static_cast<UCHAR>(enable)));
        EXPECT_NO_TRACE();
        EXPECT_EQ(enable, record("ucDigitalOut"));
        set_record("ucEnable", 1);
        EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, static_cast<UCHAR>(enable)));
        EXPECT_TRACE(port(enable, 0, 24, 0));
        EXPECT_EQ(enable, record("ucDigitalOut"));
    }
}

TEST_F(DigitalOut, SetDigitalOutEnable_TheMasterEnableDecides_NotTheArgument)
{
    for (const UCHAR master : { 1, 2, 128, 255 })
    {
        set_record("ucEnable", master);
        EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, 0));
        EXPECT_EQ(1u, PMX_SetDigitalOutPara(0, 24, 0));
        EXPECT_TRACE(port(0, 0, 24, 0) + port(0, 0, 24, 0));
        EXPECT_EQ(master, record("ucEnable"));
    }
}

TEST_F(DigitalOut, SetDigitalOutPara_MixerOff_OnlyStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDigitalOutPara(0, 30, 1));
    EXPECT_NO_TRACE();
    EXPECT_RECORD_CHANGED(before, "ucDigitalBit", "ucProprietaryMode");
    EXPECT_EQ(30, record("ucDigitalBit"));
    EXPECT_EQ(1, record("ucProprietaryMode"));
}

TEST_F(DigitalOut, SetDigitalOutPara_MixerOn_ReachesTheHardwareWithSwitchAndFormat)
{
    mixer_on();
    set_record("ucDigitalOut", 9);
    set_record("ucDigitalRgb", 3);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDigitalOutPara(0, 30, 1));
    EXPECT_TRACE(R"(
        PMX_HalSetDigitalOut(0, 9, 1, 30)
        PMX_HalSetDigitalOutRgb(0, PLA_MXR_DIGITAL_OUTPUT_FMT_YBR422)
    )");
    EXPECT_RECORD_CHANGED(before, "ucDigitalBit", "ucProprietaryMode");
    EXPECT_EQ(30, board::state().find("mixer.digital_out.bits")->as_number());
    EXPECT_EQ(1, board::state().find("mixer.digital_out.mode")->as_number());
}

TEST_F(DigitalOut, SetDigitalOutPara_EachValueOfEither_IsStoredAndHandedOnAsGiven)
{
    mixer_on();
    for (unsigned bits = 0; bits < 256; ++bits)
    {
        const unsigned mode = 255 - bits;
        EXPECT_EQ(1u, PMX_SetDigitalOutPara(0, static_cast<UCHAR>(bits), static_cast<UCHAR>(mode)));
        EXPECT_TRACE(port(1, mode, bits, 0));
        EXPECT_EQ(bits, record("ucDigitalBit"));
        EXPECT_EQ(mode, record("ucProprietaryMode"));
    }
}

TEST_F(DigitalOut, SetDigitalOutEnableAndPara_TheStoredValuesAgain_AreAppliedAgain)
{
    mixer_on();
    for (int i = 0; i < 2; ++i)
    {
        EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, 1));
        EXPECT_EQ(1u, PMX_SetDigitalOutPara(0, 24, 0));
        EXPECT_TRACE(port(1, 0, 24, 0) + port(1, 0, 24, 0));
    }
}

TEST_F(DigitalOut, SetDigitalOutEnableAndPara_AreStoredBeforeTheHardware)
{
    mixer_on();
    std::int64_t enable = -1;
    std::int64_t bits = -1;
    std::int64_t mode = -1;
    at_call("PMX_HalSetDigitalOut", [&] {
        enable = record("ucDigitalOut");
        bits = record("ucDigitalBit");
        mode = record("ucProprietaryMode");
    });
    EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, 7));
    EXPECT_EQ(7, enable);
    EXPECT_EQ(1u, PMX_SetDigitalOutPara(0, 16, 3));
    EXPECT_EQ(16, bits);
    EXPECT_EQ(3, mode);
}

TEST_F(DigitalOut, SetDigitalOutEnableAndPara_CapabilityBitClear_NothingIsStored)
{
    for (const UCHAR master : { 0, 1 })
    {
        set_record("ucEnable", master);
        set_record("u4Capability", ~digital_out_bit);
        const RecordSnapshot before;
        EXPECT_EQ(0u, PMX_SetDigitalOutEnable(0, 0));
        EXPECT_EQ(0u, PMX_SetDigitalOutPara(0, 30, 1));
        EXPECT_RECORD_UNCHANGED(before);
        UCHAR enable = 99;
        EXPECT_EQ(0u, PMX_GetDigitalOutEnable(0, &enable));
        EXPECT_EQ(99, enable);
    }
    EXPECT_NO_TRACE();
}

TEST_F(DigitalOut, SetDigitalOutEnableParaAndGetDigitalOutEnable_Bit25AloneCounts)
{
    for (unsigned bit = 0; bit < 32; ++bit)
    {
        const UINT32 mask = 1u << bit;
        const bool own = mask == digital_out_bit;
        UCHAR enable = 99;
        set_record("u4Capability", mask);
        EXPECT_EQ(own ? 1u : 0u, PMX_SetDigitalOutEnable(0, 1)) << bit;
        EXPECT_EQ(own ? 1u : 0u, PMX_SetDigitalOutPara(0, 24, 0)) << bit;
        EXPECT_EQ(own ? 1u : 0u, PMX_GetDigitalOutEnable(0, &enable)) << bit;
        EXPECT_EQ(own ? 1 : 99, enable);
        set_record("u4Capability", ~mask);
        EXPECT_EQ(own ? 0u : 1u, PMX_SetDigitalOutEnable(0, 1)) << bit;
        EXPECT_EQ(own ? 0u : 1u, PMX_SetDigitalOutPara(0, 24, 0)) << bit;
        EXPECT_EQ(own ? 0u : 1u, PMX_GetDigitalOutEnable(0, &enable)) << bit;
    }
}

TEST_F(DigitalOut, SetDigitalOutPhase_TheHardwareGetsItWhole_TheRecordItsLowByte)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDigitalOutPhase(0, 0x1234));
    EXPECT_TRACE("PMX_HalSetDigitalOutPhase(0, 0x1234)");
    EXPECT_RECORD_CHANGED(before, "u4Phase");
    EXPECT_EQ(0x34, record("u4Phase"));
    EXPECT_EQ(0x1234, board::state().find("mixer.digital_out.phase")->as_number());
}

TEST_F(DigitalOut, SetDigitalOutPhase_EachLowByteUnderEachHighPart)
{
    for (unsigned low = 0; low < 256; ++low)
    {
        for (const UINT32 high : { 0u, 0x100u, 0xFF00u, 0x12345600u, 0xFFFFFF00u })
        {
            EXPECT_EQ(1u, PMX_SetDigitalOutPhase(0, high | low));
            EXPECT_TRACE("PMX_HalSetDigitalOutPhase(0, " + std::to_string(high | low) + ")");
            EXPECT_EQ(low, record("u4Phase"));
        }
    }
}

TEST_F(DigitalOut, SetDigitalOutPhase_WorksWithMixerOnOrOffAndWithoutCapability)
{
    for (const UCHAR master : { 0, 1 })
    {
        for (const UINT32 capability : { 0u, ~digital_out_bit, 0xFFFFFFFFu })
        {
            set_record("ucEnable", master);
            set_record("u4Capability", capability);
            EXPECT_EQ(1u, PMX_SetDigitalOutPhase(0, 3));
            EXPECT_TRACE("PMX_HalSetDigitalOutPhase(0, 3)");
        }
    }
}

TEST_F(DigitalOut, SetDigitalOutPhase_IsStoredBehindTheHardware)
{
    std::int64_t stored = -1;
    at_call("PMX_HalSetDigitalOutPhase", [&] { stored = record("u4Phase"); });
    EXPECT_EQ(1u, PMX_SetDigitalOutPhase(0, 3));
    EXPECT_EQ(2, stored);
}

TEST_F(DigitalOut, SetDigitalOutDrv_IsHandedOnAndNeverStored)
{
    const RecordSnapshot before;
    for (const UINT32 drive : { 0u, 1u, 6u, 255u, 256u, 0x80000000u, 0xFFFFFFFFu })
    {
        EXPECT_EQ(1u, PMX_SetDigitalOutDrv(drive));
        EXPECT_TRACE("PMX_HalSetDigitalOutDrv(" + std::to_string(drive) + ")");
        EXPECT_EQ(drive, board::state().find("mixer.digital_out.drive")->as_number());
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DigitalOut, SetDigitalOutDrv_WithoutCapabilityAndBeforeStartUpToo)
{
    set_record("u4Capability", 0);
    EXPECT_EQ(1u, PMX_SetDigitalOutDrv(3));
    EXPECT_TRACE("PMX_HalSetDigitalOutDrv(3)");
    power_on();
    EXPECT_EQ(1u, PMX_SetDigitalOutDrv(4));
    EXPECT_TRACE("PMX_HalSetDigitalOutDrv(4)");
}

TEST_F(DigitalOut, SetDigitalOutEnableParaPhase_OtherMixerId_RefusedAndNothingChanges)
{
    mixer_on();
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        EXPECT_EQ(0u, PMX_SetDigitalOutEnable(static_cast<UCHAR>(id), 0)) << id;
        EXPECT_EQ(0u, PMX_SetDigitalOutPara(static_cast<UCHAR>(id), 30, 1)) << id;
        EXPECT_EQ(0u, PMX_SetDigitalOutPhase(static_cast<UCHAR>(id), 3)) << id;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DigitalOut, GetDigitalOutEnable_ReadsTheValueAsGiven_OtherMixerIdOrNullPointerRefused)
{
    UCHAR enable = 99;
    EXPECT_EQ(1u, PMX_GetDigitalOutEnable(0, &enable));
    EXPECT_EQ(1, enable);
    set_record("ucDigitalOut", 255);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_GetDigitalOutEnable(0, &enable));
    EXPECT_EQ(255, enable);
    enable = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_GetDigitalOutEnable(static_cast<UCHAR>(id), &enable)) << id;
    EXPECT_EQ(0u, PMX_GetDigitalOutEnable(0, nullptr));
    EXPECT_EQ(0u, PMX_GetDigitalOutEnable(1, nullptr));
    EXPECT_EQ(99, enable);
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_NO_TRACE();
}
