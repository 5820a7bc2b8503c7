// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Settings of the external video chip, and closed captions. */
#include <string>

#include "tests/support/layer_fixture.h"

namespace
{

/** The command of each setting, in the settings' order. */
constexpr const char* commands[] = {
    "PMX_SET_EXT_SHARPNESS",        "PMX_SET_EXT_BRIGHTNESS",
    "PMX_SET_EXT_CONTRAST",         "PMX_SET_EXT_SATURATION",
    "PMX_SET_EXT_COLOR_SPACE",      "PMX_SET_EXT_Y_C_DELAY",
    "PMX_SET_EXT_CUE_CORRECT",      "PMX_SET_EXT_BORDER_LEVEL",
    "PMX_SET_EXT_DEINTERLACE_MODE", "PMX_SET_EXT_NOISE_REDUCTION",
    "PMX_SET_EXT_EDGE_ENHANCEMENT", "PMX_SET_EXT_DETAIL_ENHANCEMENT",
    "PMX_SET_EXT_ZOOM_IMAGE",       "PMX_SET_EXT_GAMMA",
    "PMX_SET_EXT_DEEP_COLOR",
};

struct Passed
{
    INT32 value;
    unsigned byte; ///< what the driver receives of it
};

constexpr Passed values[] = {
    { 0, 0 },    { 1, 1 },      { 3, 3 },       { 127, 127 },         { 128, 128 },        { 255, 255 },
    { 256, 0 },  { 300, 44 },   { 0x1234, 52 }, { 0x12345678, 0x78 }, { 0x7FFFFFFF, 255 }, { -1, 255 },
    { -2, 254 }, { -128, 128 }, { -255, 1 },    { -256, 0 },          { -300, 212 },       { -2147483647 - 1, 0 },
};

PLA_MXR_EXTERNAL_CHIP_SETTING_E setting(UINT32 number)
{
    return static_cast<PLA_MXR_EXTERNAL_CHIP_SETTING_E>(number);
}

std::int64_t received(const std::string& command)
{
    return board::state().find("hdmi_av.commands." + command)->as_number();
}

} // namespace

class ExternalChip : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }
};

using ClosedCaption = ExternalChip;

TEST_F(ExternalChip, SetExternalChipSetting_Gamma3_IsCommand30WithTheByte3)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetExternalChipSetting(PLA_MXR_EXT_GAMMA, 3));
    EXPECT_TRACE("fgPmxDrvSetAvd(30, 3, 1) = TRUE");
    EXPECT_EQ(3, received("PMX_SET_EXT_GAMMA"));
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ExternalChip, SetExternalChipSetting_Brightness300_IsCutTo44)
{
    EXPECT_EQ(1u, PMX_SetExternalChipSetting(PLA_MXR_EXT_BRIGHTNESS, 300));
    EXPECT_TRACE("fgPmxDrvSetAvd(18, 44, 1) = TRUE");
    EXPECT_EQ(44, received("PMX_SET_EXT_BRIGHTNESS"));
}

TEST_F(ExternalChip, SetExternalChipSetting_EachSettingIsTheCommand17Above)
{
    for (UINT32 number = 0; number < 15; ++number)
    {
        EXPECT_EQ(1u, PMX_SetExternalChipSetting(setting(number), 100 + static_cast<INT32>(number)));
        EXPECT_TRACE("fgPmxDrvSetAvd(" + std::to_string(number + 17) + ", " + std::to_string(number + 100) +
                     ", 1) = TRUE");
    }
    for (UINT32 number = 0; number < 15; ++number)
        EXPECT_EQ(number + 100, received(commands[number])) << commands[number];
}

TEST_F(ExternalChip, SetExternalChipSetting_EachSettingWithEachValue_TheDriverGetsTheLowByte)
{
    const RecordSnapshot before;
    for (UINT32 number = 0; number < 15; ++number)
    {
        for (const Passed& passed : values)
        {
            EXPECT_EQ(1u, PMX_SetExternalChipSetting(setting(number), passed.value));
            EXPECT_TRACE(std::string("fgPmxDrvSetAvd(") + commands[number] + ", " + std::to_string(passed.byte) +
                         ", 1) = TRUE");
        }
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ExternalChip, SetExternalChipSetting_UnknownSetting_NothingIsSent)
{
    const RecordSnapshot before;
    for (const UINT32 number :
         { 15u, 16u, 17u, 31u, 255u, 256u, 270u, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFEFu, 0xFFFFFFFFu })
    {
        for (const Passed& passed : values)
            EXPECT_EQ(0u, PMX_SetExternalChipSetting(setting(number), passed.value)) << number;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ExternalChip, SetExternalChipSetting_DriverRefuses_DoesNotMatter)
{
    board::faults::set({ "fgPmxDrvSetAvd", FALSE, board::Fault::When::Always });
    for (UINT32 number = 0; number < 15; ++number)
    {
        EXPECT_EQ(1u, PMX_SetExternalChipSetting(setting(number), 5));
        EXPECT_TRACE(std::string("fgPmxDrvSetAvd(") + commands[number] + ", 5, 1) = FALSE");
    }
}

TEST_F(ExternalChip, SetExternalChipSetting_WithoutCapabilityAndBeforeStartUpToo)
{
    set_record("u4Capability", 0);
    EXPECT_EQ(1u, PMX_SetExternalChipSetting(PLA_MXR_EXT_SHARPNESS, 9));
    EXPECT_TRACE("fgPmxDrvSetAvd(PMX_SET_EXT_SHARPNESS, 9, 1) = TRUE");
    power_on();
    EXPECT_EQ(1u, PMX_SetExternalChipSetting(PLA_MXR_EXT_DEEP_COLOR, 2));
    EXPECT_TRACE("fgPmxDrvSetAvd(PMX_SET_EXT_DEEP_COLOR, 2, 1) = TRUE");
}

TEST_F(ClosedCaption, SetClosedCaptionOnOff_OnAndOff)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetClosedCaptionOnOff(0, PLA_MXR_CLOSED_CAPTION_ON));
    EXPECT_TRACE("VDP_EnableCC(1)");
    EXPECT_EQ(1, board::state().find("video_planes.closed_caption")->as_number());
    EXPECT_EQ(1u, PMX_SetClosedCaptionOnOff(0, PLA_MXR_CLOSED_CAPTION_OFF));
    EXPECT_TRACE("VDP_EnableCC(0)");
    EXPECT_EQ(0, board::state().find("video_planes.closed_caption")->as_number());
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ClosedCaption, SetClosedCaptionOnOff_AnyValueButOne_SwitchesThemOff)
{
    const auto switched = [](UINT32 value) {
        EXPECT_EQ(1u, PMX_SetClosedCaptionOnOff(0, static_cast<PLA_MXR_CLOSED_CAPTION_ON_OFF_T>(value)));
        EXPECT_TRACE(value == 1 ? "VDP_EnableCC(1)" : "VDP_EnableCC(0)");
    };
    for (UINT32 value = 0; value < 256; ++value)
        switched(value);
    for (const UINT32 value : { 256u, 257u, 0x10001u, 0x7FFFFFFFu, 0x80000001u, 0xFFFFFFFFu })
        switched(value);
}

TEST_F(ClosedCaption, SetClosedCaptionOnOff_TheSameValueAgain_IsHandedOnAgain)
{
    for (int i = 0; i < 2; ++i)
    {
        EXPECT_EQ(1u, PMX_SetClosedCaptionOnOff(0, PLA_MXR_CLOSED_CAPTION_ON));
        EXPECT_TRACE("VDP_EnableCC(1)");
    }
}

TEST_F(ClosedCaption, SetClosedCaptionOnOff_OtherMixerId_OneIsReturnedAndNothingDone)
{
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        EXPECT_EQ(1u, PMX_SetClosedCaptionOnOff(static_cast<UCHAR>(id), PLA_MXR_CLOSED_CAPTION_ON)) << id;
        EXPECT_EQ(1u, PMX_SetClosedCaptionOnOff(static_cast<UCHAR>(id), PLA_MXR_CLOSED_CAPTION_OFF)) << id;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(0, board::state().find("video_planes.closed_caption")->as_number());
}

TEST_F(ClosedCaption, SetClosedCaptionOnOff_BeforeStartUpToo)
{
    power_on();
    EXPECT_EQ(1u, PMX_SetClosedCaptionOnOff(0, PLA_MXR_CLOSED_CAPTION_ON));
    EXPECT_TRACE("VDP_EnableCC(1)");
}
