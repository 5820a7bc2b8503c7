// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Brightness, contrast, hue, saturation, sharpness: each for the analogue outputs and for HDMI, and refused. */
#include "tests/support/layer_fixture.h"

class Picture : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }

    /** What a device holds. */
    static std::int64_t held(const std::string& path) { return board::state().find(path)->as_number(); }
    static bool never_set(const std::string& path)
    {
        return board::state().find(path)->kind() == board::Value::Kind::Null;
    }

    static void forbid(UINT32 capability) { set_record("u4Capability", 0x7FFBFFFF & ~capability); }
};

TEST_F(Picture, SetBrightness_ForTheAnalogueOutputs_MixerAndEncoderTakeItAndItIsStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetBrightness(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Brightness: 1,77.\n"
        PMX_HalSetBrightness(0, 77)
        TVE_SetBrightness(77)
    )");
    EXPECT_RECORD_CHANGED(before, "ucBrightness");
    EXPECT_EQ(77, record("ucBrightness"));
    EXPECT_EQ(77, held("mixer.brightness"));
    EXPECT_EQ(77, held("tv_encoder.brightness"));
}

TEST_F(Picture, SetBrightness_ForHdmi_MixerAndHdmiTakeItAndItIsNotStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetBrightness(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Brightness: 0,140.\n"
        PMX_HalSetBrightness(0, 140)
        fgPmxDrvSetAvd(PMX_SET_HDMI_BRIGHTNESS, 140, 1) = TRUE
    )");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(140, held("mixer.brightness"));
    EXPECT_EQ(140, held("hdmi_av.commands.PMX_SET_HDMI_BRIGHTNESS"));
    EXPECT_TRUE(never_set("tv_encoder.brightness"));
}

TEST_F(Picture, SetBrightness_CapabilityBitClear_LogsTwiceAndDoesNothing)
{
    forbid(0x00200000);
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetBrightness(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Brightness: 1,77.\n"
        LOG8 "[PMX] Seting Brightness fail: 1,77.\n"
    )");
    EXPECT_EQ(0u, PMX_SetBrightness(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Brightness: 0,140.\n"
        LOG8 "[PMX] Seting Brightness fail: 0,140.\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Picture, SetContrast_ForTheAnalogueOutputs_MixerAndEncoderTakeItAndItIsStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetContrast(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Contrast: 1,77.\n"
        PMX_HalSetContrast(0, 77)
        TVE_SetContrast(77)
    )");
    EXPECT_RECORD_CHANGED(before, "ucContrast");
    EXPECT_EQ(77, record("ucContrast"));
    EXPECT_EQ(77, held("mixer.contrast"));
    EXPECT_EQ(77, held("tv_encoder.contrast"));
}

TEST_F(Picture, SetContrast_ForHdmi_MixerAndHdmiTakeItAndItIsNotStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetContrast(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Contrast: 0,140.\n"
        PMX_HalSetContrast(0, 140)
        fgPmxDrvSetAvd(PMX_SET_HDMI_CONTRAST, 140, 1) = TRUE
    )");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(140, held("mixer.contrast"));
    EXPECT_EQ(140, held("hdmi_av.commands.PMX_SET_HDMI_CONTRAST"));
    EXPECT_TRUE(never_set("tv_encoder.contrast"));
}

TEST_F(Picture, SetContrast_CapabilityBitClear_LogsTwiceAndDoesNothing)
{
    forbid(0x00400000);
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetContrast(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Contrast: 1,77.\n"
        LOG8 "[PMX] Seting Contrast fail: 1,77.\n"
    )");
    EXPECT_EQ(0u, PMX_SetContrast(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Contrast: 0,140.\n"
        LOG8 "[PMX] Seting Contrast fail: 0,140.\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Picture, SetHue_ForTheAnalogueOutputs_OnlyTheEncoderTakesItAndItIsStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetHue(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Hue: 1,77.\n"
        TVE_SetHue(77)
    )");
    EXPECT_RECORD_CHANGED(before, "ucHue");
    EXPECT_EQ(77, record("ucHue"));
    EXPECT_EQ(77, held("tv_encoder.hue"));
}

TEST_F(Picture, SetHue_ForHdmi_OnlyHdmiTakesItAndItIsNotStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetHue(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Hue: 0,140.\n"
        fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, 140, 1) = TRUE
    )");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(140, held("hdmi_av.commands.PMX_SET_HDMI_HUE"));
    EXPECT_TRUE(never_set("tv_encoder.hue"));
}

TEST_F(Picture, SetHue_CapabilityBitClear_LogsTwiceAndDoesNothing)
{
    forbid(0x00800000);
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetHue(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Hue: 1,77.\n"
        LOG8 "[PMX] Seting Hue fail: 1,77.\n"
    )");
    EXPECT_EQ(0u, PMX_SetHue(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Hue: 0,140.\n"
        LOG8 "[PMX] Seting Hue fail: 0,140.\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Picture, SetSaturation_ForTheAnalogueOutputs_OnlyTheEncoderTakesItAndItIsStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetSaturation(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Saturation: 1,77.\n"
        TVE_SetSaturation(77)
    )");
    EXPECT_RECORD_CHANGED(before, "ucSaturation");
    EXPECT_EQ(77, record("ucSaturation"));
    EXPECT_EQ(77, held("tv_encoder.saturation"));
}

TEST_F(Picture, SetSaturation_ForHdmi_OnlyHdmiTakesItAndItIsNotStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetSaturation(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Saturation: 0,140.\n"
        fgPmxDrvSetAvd(PMX_SET_HDMI_SATURATION, 140, 1) = TRUE
    )");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(140, held("hdmi_av.commands.PMX_SET_HDMI_SATURATION"));
    EXPECT_TRUE(never_set("tv_encoder.saturation"));
}

TEST_F(Picture, SetSaturation_CapabilityBitClear_LogsTwiceAndDoesNothing)
{
    forbid(0x01000000);
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetSaturation(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Saturation: 1,77.\n"
        LOG8 "[PMX] Seting Saturation fail: 1,77.\n"
    )");
    EXPECT_EQ(0u, PMX_SetSaturation(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Saturation: 0,140.\n"
        LOG8 "[PMX] Seting Saturation fail: 0,140.\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Picture, SetSharpness_ForTheAnalogueOutputs_OnlyTheEncoderTakesItAndItIsStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetSharpness(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Sharpness: 1,77.\n"
        TVE_SetSharpness(77)
    )");
    EXPECT_RECORD_CHANGED(before, "ucSharpness");
    EXPECT_EQ(77, record("ucSharpness"));
    EXPECT_EQ(77, held("tv_encoder.sharpness"));
}

TEST_F(Picture, SetSharpness_ForHdmi_OnlyHdmiTakesItAndItIsNotStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetSharpness(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Sharpness: 0,140.\n"
        fgPmxDrvSetAvd(PMX_SET_HDMI_SHARPNESS, 140, 1) = TRUE
    )");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(140, held("hdmi_av.commands.PMX_SET_HDMI_SHARPNESS"));
    EXPECT_TRUE(never_set("tv_encoder.sharpness"));
}

TEST_F(Picture, SetSharpness_CapabilityBitClear_LogsTwiceAndDoesNothing)
{
    forbid(0x08000000);
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetSharpness(0, 77, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Sharpness: 1,77.\n"
        LOG8 "[PMX] Seting Sharpness fail: 1,77.\n"
    )");
    EXPECT_EQ(0u, PMX_SetSharpness(0, 140, 0));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Sharpness: 0,140.\n"
        LOG8 "[PMX] Seting Sharpness fail: 0,140.\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}
