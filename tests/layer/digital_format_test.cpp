// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The digital picture's colour format, on the port and on HDMI; and what the master enable applies of the port. */
#include <string>

#include "tests/support/layer_fixture.h"

namespace
{

/** HDMI's colour code for each format that has one. */
constexpr const char* hdmi_codes[] = { "HDMI_YCBCR_444", "HDMI_RGB", "HDMI_XV_YCC", "HDMI_YCBCR_422", "HDMI_RGB_FULL" };

std::string format_lines(unsigned format)
{
    std::string lines = "PMX_HalSetDigitalOutRgb(0, " + std::to_string(format) + ")\n";
    if (format < 5)
        lines += std::string("fgPmxDrvSetAvd(PMX_CHG_HDMI_COLOR_SPACE, ") + hdmi_codes[format] + ", 1) = TRUE\n";
    return lines;
}

std::int64_t hdmi_code()
{
    return board::state().find("hdmi_av.commands.PMX_CHG_HDMI_COLOR_SPACE")->as_number();
}

} // namespace

class DigitalFormat : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }
};

TEST_F(DigitalFormat, SetDigitalOutRgb_EachFormatHasItsHdmiCode)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, PLA_MXR_DIGITAL_OUTPUT_FMT_RGB));
    EXPECT_TRACE(R"(
        PMX_HalSetDigitalOutRgb(0, 1)
        fgPmxDrvSetAvd(0, 0, 1) = TRUE
    )");
    EXPECT_RECORD_CHANGED(before, "ucDigitalRgb");
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, PLA_MXR_DIGITAL_OUTPUT_FMT_YBR));
    EXPECT_TRACE("PMX_HalSetDigitalOutRgb(0, 0)\nfgPmxDrvSetAvd(0, 2, 1) = TRUE");
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, PLA_MXR_DIGITAL_OUTPUT_FMT_XVYCC));
    EXPECT_TRACE("PMX_HalSetDigitalOutRgb(0, 2)\nfgPmxDrvSetAvd(0, 4, 1) = TRUE");
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, PLA_MXR_DIGITAL_OUTPUT_FMT_YBR422));
    EXPECT_TRACE("PMX_HalSetDigitalOutRgb(0, 3)\nfgPmxDrvSetAvd(0, 3, 1) = TRUE");
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB));
    EXPECT_TRACE("PMX_HalSetDigitalOutRgb(0, 4)\nfgPmxDrvSetAvd(0, 1, 1) = TRUE");
    EXPECT_EQ(1, hdmi_code());
}

TEST_F(DigitalFormat, SetDigitalOutRgb_EachOf256Values)
{
    for (unsigned format = 0; format < 256; ++format)
    {
        EXPECT_EQ(format < 5 ? 1u : 0u, PMX_SetDigitalOutRgb(0, static_cast<UCHAR>(format))) << format;
        EXPECT_TRACE(format_lines(format));
        EXPECT_EQ(format, record("ucDigitalRgb"));
        EXPECT_EQ(format, board::state().find("mixer.digital_out.rgb")->as_number());
    }
}

TEST_F(DigitalFormat, SetDigitalOutRgb_Seven_RefusedAfterStoreAndHardware)
{
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, 4));
    board::trace::clear();
    EXPECT_EQ(0u, PMX_SetDigitalOutRgb(0, 7));
    EXPECT_TRACE("PMX_HalSetDigitalOutRgb(0, 7)");
    UCHAR format = 99;
    EXPECT_EQ(1u, PMX_GetDigitalOutRgb(0, &format));
    EXPECT_EQ(7, format);
    EXPECT_EQ(1, hdmi_code());
}

TEST_F(DigitalFormat, SetDigitalOutRgb_WorksWithMixerOnOrOffAndWithoutCapability)
{
    for (const UCHAR master : { 0, 1 })
    {
        for (const UINT32 capability : { 0u, ~0x02000000u, 0xFFFFFFFFu })
        {
            set_record("ucEnable", master);
            set_record("u4Capability", capability);
            EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, 3));
            EXPECT_TRACE(format_lines(3));
            UCHAR format = 99;
            EXPECT_EQ(1u, PMX_GetDigitalOutRgb(0, &format));
            EXPECT_EQ(3, format);
        }
    }
}

TEST_F(DigitalFormat, SetDigitalOutRgb_TheStoredFormatAgain_IsAppliedAgain)
{
    for (const unsigned format : { 0, 0, 7, 7 })
    {
        EXPECT_EQ(format < 5 ? 1u : 0u, PMX_SetDigitalOutRgb(0, static_cast<UCHAR>(format)));
        EXPECT_TRACE(format_lines(format));
    }
}

TEST_F(DigitalFormat, SetDigitalOutRgb_IsStoredBeforeTheHardware)
{
    std::int64_t stored = -1;
    at_call("PMX_HalSetDigitalOutRgb", [&] { stored = record("ucDigitalRgb"); });
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, 2));
    EXPECT_EQ(2, stored);
}

TEST_F(DigitalFormat, SetDigitalOutRgb_HdmiDriverRefuses_DoesNotMatter)
{
    board::faults::set({ "fgPmxDrvSetAvd", FALSE, board::Fault::When::Always });
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, 1));
    EXPECT_TRACE(R"(
        PMX_HalSetDigitalOutRgb(0, 1)
        fgPmxDrvSetAvd(PMX_CHG_HDMI_COLOR_SPACE, HDMI_RGB, 1) = FALSE
    )");
    EXPECT_EQ(1, record("ucDigitalRgb"));
}

TEST_F(DigitalFormat, SetAndGetDigitalOutRgb_OtherMixerIdOrNullPointer_Refused)
{
    const RecordSnapshot before;
    UCHAR format = 99;
    for (unsigned id = 1; id < 256; ++id)
    {
        EXPECT_EQ(0u, PMX_SetDigitalOutRgb(static_cast<UCHAR>(id), 1)) << id;
        EXPECT_EQ(0u, PMX_GetDigitalOutRgb(static_cast<UCHAR>(id), &format)) << id;
    }
    EXPECT_EQ(0u, PMX_GetDigitalOutRgb(0, nullptr));
    EXPECT_EQ(0u, PMX_GetDigitalOutRgb(1, nullptr));
    EXPECT_EQ(99, format);
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DigitalFormat, GetDigitalOutRgb_ReadsTheValueAsGiven)
{
    UCHAR format = 99;
    EXPECT_EQ(1u, PMX_GetDigitalOutRgb(0, &format));
    EXPECT_EQ(0, format);
    set_record("ucDigitalRgb", 255);
    EXPECT_EQ(1u, PMX_GetDigitalOutRgb(0, &format));
    EXPECT_EQ(255, format);
    EXPECT_NO_TRACE();
}

TEST_F(DigitalFormat, SetEnable_AppliesWhatWasStoredWhileTheMixerWasOff)
{
    EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, 3));
    EXPECT_EQ(1u, PMX_SetDigitalOutPara(0, 30, 1));
    EXPECT_NO_TRACE();
    EXPECT_EQ(0u, PMX_SetDigitalOutRgb(0, 7));
    EXPECT_EQ(1u, PMX_SetDigitalOutPhase(0, 0x1234));
    EXPECT_EQ(1u, PMX_SetDigitalOutDrv(9));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetEnable(0, 1));
    EXPECT_TRACE(R"(
        PMX_VsyncEnable()
        PMX_HalSetDigitalOut(0, 3, 1, 30)
        PMX_HalSetDigitalOutRgb(0, 7)
        PMX_HalSetDigitalOutPhase(0, 0x34)
    )");
}

TEST_F(DigitalFormat, SetEnable_PortSwitchedOffBefore_StaysOff)
{
    EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, 0));
    EXPECT_EQ(1u, PMX_SetEnable(0, 1));
    EXPECT_TRACE(R"(
        PMX_VsyncEnable()
        PMX_HalSetDigitalOut(0, 0, 0, 24)
        PMX_HalSetDigitalOutRgb(0, 0)
        PMX_HalSetDigitalOutPhase(0, 2)
    )");
}

TEST_F(DigitalFormat, Reset_ReturnsAllFieldsToTheirDefaults)
{
    EXPECT_EQ(1u, PMX_SetDigitalOutEnable(0, 0));
    EXPECT_EQ(1u, PMX_SetDigitalOutPara(0, 30, 1));
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, 4));
    EXPECT_EQ(1u, PMX_SetDigitalOutPhase(0, 9));
    PMX_Reset(0);
    EXPECT_EQ(1, record("ucDigitalOut"));
    EXPECT_EQ(24, record("ucDigitalBit"));
    EXPECT_EQ(0, record("ucProprietaryMode"));
    EXPECT_EQ(0, record("ucDigitalRgb"));
    EXPECT_EQ(2, record("u4Phase"));
}
