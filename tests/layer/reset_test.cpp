// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Reset: record, boot resolution, hardware. */
#include <algorithm>

#include "tests/layer/sequences.h"
#include "tests/support/layer_fixture.h"
#include "tools/record_view/record_view.h"
#include "u_os.h"

using Reset = LayerTest;

namespace
{

/** The modes that a boot loader may leave, by field rate. */
constexpr PMX_RESOLUTION_MODE_T boot_modes_50[] = { RES_576I, RES_576P, RES_720P50HZ, RES_1080I50HZ, RES_1080P50HZ };
constexpr PMX_RESOLUTION_MODE_T boot_modes_60[] = { RES_480I, RES_480P, RES_720P60HZ, RES_1080I60HZ, RES_1080P60HZ };

template <std::size_t N>
bool holds(const PMX_RESOLUTION_MODE_T (&modes)[N], unsigned mode)
{
    return std::find(std::begin(modes), std::end(modes), mode) != std::end(modes);
}

/** What a reset makes of a byte that the boot loader left. */
sequences::Reset reset_from(unsigned byte)
{
    sequences::Reset expected{ .boot_word = byte };
    if (holds(boot_modes_50, byte))
    {
        expected.mode = byte;
        expected.tv_type = 3;
        expected.pll_word = 0x03D1745E;
    }
    else
        expected.mode = holds(boot_modes_60, byte) ? byte : unsigned{ RES_480P };
    return expected;
}

} // namespace

TEST_F(Reset, Reset_AtBoot_WholeSequence)
{
    PMX_Reset(0);
    EXPECT_TRACE(R"(
        get_part_id_by_name("fast_init_param") = 0
        UTIL_Printf "TESTPMX: Get pard ID:0.\n"
        i4NFBPartitionRead(0, 0, [0x0C, 0x01, 0x00, 0x00], 4) = 4
        UTIL_Printf "TESTPMX: Get Test Data :12, 0x     10c.\n"
        UTIL_Printf "[PMX]_arPmxConf[ucPmxId].ucMode=12\n"
        )" + sequences::pll(0x03D2F1AA) +
                 R"(
        PMX_HalSetDigitalOut(0, 0, 0, 0)
        PMX_HalSetMode(0, RES_1080P60HZ)
        PMX_HalSetTvType(0, 0)
        PMX_HalSetBg(0, 0x108080)
        PMX_HalPlaneOrder(0, 3, [4, 3, 1, 0, 2, 5, 6, 7])
        PMX_HalInitPlaneOrder(0)
        fgPmxHalSwapPlane1_2(0) = FALSE
        vPmxNotMixPlane(0, 1)
        VDP_GlobalOutputChange()
        VDP_SetTvFormat(RES_1080P60HZ, 1)
    )");
}

TEST_F(Reset, Reset_AfterTheFirstModeSetting_ProgramsScalerAndTvEncoderToo)
{
    boot_word(RES_1080I50HZ);
    set_record("_fgBootUp", 0);
    for (const char* field : { "ucBrightness", "ucContrast", "ucHue", "ucSaturation", "ucSharpness" })
        set_record(field, 7);
    PMX_Reset(0);
    EXPECT_TRACE(R"(
        get_part_id_by_name("fast_init_param") = 0
        UTIL_Printf "TESTPMX: Get pard ID:0.\n"
        i4NFBPartitionRead(0, 0, [0x0B, 0x00, 0x00, 0x00], 4) = 4
        UTIL_Printf "TESTPMX: Get Test Data :11, 0x       b.\n"
        UTIL_Printf "[PMX]_arPmxConf[ucPmxId].ucMode=11\n"
        )" + sequences::pll(0x03D1745E) +
                 R"(
        PMX_HalSetDigitalOut(0, 0, 0, 0)
        PMX_HalSetMode(0, RES_1080I50HZ)
        PMX_HalSetScalerMode(RES_1080I50HZ)
        PMX_HalSetTvType(0, 3)
        PMX_HalSetBg(0, 0x108080)
        TVE_SetBrightness(128)
        TVE_SetContrast(128)
        TVE_SetHue(128)
        TVE_SetSaturation(128)
        TVE_SetSharpness(0)
        PMX_HalPlaneOrder(0, 3, [4, 3, 1, 0, 2, 5, 6, 7])
        PMX_HalInitPlaneOrder(0)
        fgPmxHalSwapPlane1_2(0) = FALSE
        vPmxNotMixPlane(0, 1)
        VDP_GlobalOutputChange()
        VDP_SetTvFormat(RES_1080I50HZ, 1)
    )");
    EXPECT_EQ(0, record("_fgBootUp"));
}

TEST_F(Reset, Reset_EveryBootByte_IsTakenOrReplacedBy480P)
{
    for (const bool after_boot : { false, true })
    {
        for (unsigned byte = 0; byte < 256; ++byte)
        {
            SCOPED_TRACE(byte);
            power_on();
            boot_word(byte);
            set_record("_fgBootUp", after_boot ? 0 : 1);
            sequences::Reset expected = reset_from(byte);
            expected.after_boot = after_boot;
            PMX_Reset(0);
            EXPECT_TRACE(sequences::reset(expected));
            EXPECT_EQ(expected.mode, record("ucMode"));
            EXPECT_EQ(expected.tv_type, record("ucTvType"));
        }
    }
}

TEST_F(Reset, Reset_1080P24_IsReplacedBy480POf60HzSystems)
{
    boot_word(RES_1080P24HZ);
    PMX_Reset(0);
    EXPECT_TRACE(sequences::reset({ .boot_word = 18, .mode = RES_480P, .tv_type = 0 }));
    EXPECT_EQ(RES_480P, record("ucMode"));
    EXPECT_EQ(0, record("ucTvType"));
}

TEST_F(Reset, Reset_HighBytesOfTheBootWord_DoNotCount)
{
    boot_word(0xFFFFFF0B);
    PMX_Reset(0);
    EXPECT_TRACE(
        sequences::reset({ .boot_word = 0xFFFFFF0B, .mode = RES_1080I50HZ, .tv_type = 3, .pll_word = 0x03D1745E }));
    EXPECT_EQ(RES_1080I50HZ, record("ucMode"));
}

TEST_F(Reset, Reset_PartitionMissing_480I)
{
    no_boot_partition();
    PMX_Reset(0);
    EXPECT_TRACE(sequences::failed_boot_read("-1") + sequences::reset_tail({ .boot_word = 0, .mode = RES_480I }));
    EXPECT_EQ(RES_480I, record("ucMode"));
    EXPECT_EQ(0, record("ucTvType"));
}

TEST_F(Reset, Reset_PartitionTooShort_480I)
{
    for (const auto& image : { std::vector<std::uint8_t>{}, std::vector<std::uint8_t>{ 0x0C, 0x01, 0x00 } })
    {
        power_on();
        boot_image(image);
        PMX_Reset(0);
        EXPECT_TRACE(sequences::failed_boot_read("0") + sequences::reset_tail({ .boot_word = 0, .mode = RES_480I }));
        EXPECT_EQ(RES_480I, record("ucMode"));
    }
}

TEST_F(Reset, Reset_OtherMixerId_DoesNothing)
{
    started();
    set_record("ucBrightness", 7);
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
        PMX_Reset(static_cast<UCHAR>(id));
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Reset, Reset_EveryFieldOfRecordAndHandshake_IsReloaded)
{
    PMX_Reset(0);
    const RecordSnapshot reloaded;
    EXPECT_EQ(0, record("ucEnable"));
    EXPECT_EQ(60, record("ucVfreq"));
    EXPECT_EQ(0x7FFBFFFF, record("u4Capability"));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, record("eMasterColorSpace"));

    unsigned changed = 0;
    for (const std::string& field : record_view::fields())
    {
        const std::string owner = record_view::type_of(field).record;
        if (owner.empty())
            continue;
        set_record(field, record_view::type_of(field).range().highest);
        ++changed;
    }
    EXPECT_EQ(changed, reloaded.changes().size());
    EXPECT_LT(48u, changed);
    PMX_Reset(0);
    EXPECT_RECORD_UNCHANGED(reloaded);
}

TEST_F(Reset, Reset_LeavesTheModulesOtherObjectsAlone)
{
    started();
    set_record("MutexPMX", 0x55);
    set_record("_PmxInitiated", 3);
    set_record("_fgBootUp", 2);
    set_record("bComp0OnTop", 9);
    set_record("_PmxTestOsd", 1);
    set_record("_fg2DCap", 1);
    set_record("PMX_debug_level", 0xAA);
    const RecordSnapshot before;
    PMX_Reset(0);
    EXPECT_RECORD_CHANGED(before, "status.hPMXTimer");
    EXPECT_EQ(0, record("status.hPMXTimer"));
    EXPECT_CALLS("get_part_id_by_name(...)\ni4NFBPartitionRead(...)\n"
                 "x_reg_write32(...)\nx_reg_write32(...)\nx_reg_write32(...)\nx_reg_write32(...)\nx_thread_delay(1)\n"
                 "x_reg_write32(...)\nx_reg_write32(...)\nx_reg_write32(...)\nx_reg_write32(...)\nx_thread_delay(1)\n"
                 "x_reg_write32(...)\nx_reg_write32(...)\n"
                 "PMX_HalSetDigitalOut(...)\nPMX_HalSetMode(...)\nPMX_HalSetTvType(...)\nPMX_HalSetBg(...)\n"
                 "PMX_HalPlaneOrder(...)\nPMX_HalInitPlaneOrder(0)\nfgPmxHalSwapPlane1_2(0)\nvPmxNotMixPlane(0, 1)\n"
                 "VDP_GlobalOutputChange()\nVDP_SetTvFormat(...)");
}

TEST_F(Reset, Reset_RecordIsReloadedBeforeTheBootResolutionIsRead)
{
    set_record("ucMode", 2);
    set_record("ucBrightness", 7);
    set_record("status.fgPmxFormatChangeFlag", 1);
    std::vector<std::int64_t> seen;
    at_call("get_part_id_by_name", [&] {
        seen = { record("ucMode"), record("ucBrightness"), record("status.fgPmxFormatChangeFlag") };
    });
    PMX_Reset(0);
    EXPECT_EQ((std::vector<std::int64_t>{ RES_1080I60HZ, 128, 0 }), seen);
}

TEST_F(Reset, Reset_RunsInEitherState)
{
    PMX_Reset(0);
    EXPECT_EQ(0, record("_PmxInitiated"));
    EXPECT_EQ(0, record("MutexPMX"));
    EXPECT_EQ(RES_1080P60HZ, record("ucMode"));
    started();
    set_record("ucMode", 2);
    PMX_Reset(0);
    EXPECT_EQ(1, record("_PmxInitiated"));
    EXPECT_EQ(RES_1080P60HZ, record("ucMode"));
}

TEST_F(Reset, Reset_MasterEnableIsOffAfterwards)
{
    started();
    EXPECT_EQ(1u, PMX_SetEnable(0, 1));
    PMX_Reset(0);
    UCHAR enable = 9;
    EXPECT_EQ(1u, PMX_GetEnable(0, &enable));
    EXPECT_EQ(0, enable);
}

TEST_F(Reset, Reset_VideoPlanesSwapped_TheSecondPlaneStaysInTheMix)
{
    board::faults::set({ "fgPmxHalSwapPlane1_2", 1 });
    PMX_Reset(0);
    EXPECT_CALLS("get_part_id_by_name(...)\ni4NFBPartitionRead(...)\n"
                 "x_reg_write32(...)\nx_reg_write32(...)\nx_reg_write32(...)\nx_reg_write32(...)\nx_thread_delay(1)\n"
                 "x_reg_write32(...)\nx_reg_write32(...)\nx_reg_write32(...)\nx_reg_write32(...)\nx_thread_delay(1)\n"
                 "x_reg_write32(...)\nx_reg_write32(...)\n"
                 "PMX_HalSetDigitalOut(...)\nPMX_HalSetMode(...)\nPMX_HalSetTvType(...)\nPMX_HalSetBg(...)\n"
                 "PMX_HalPlaneOrder(...)\nPMX_HalInitPlaneOrder(0)\nfgPmxHalSwapPlane1_2(0) = TRUE\n"
                 "VDP_GlobalOutputChange()\nVDP_SetTvFormat(...)");
}

TEST_F(Reset, Reset_ModeChangedWhileItIsPrinted_TheTvTypeIsThatOfTheNewOne)
{
    at_call("UTIL_Printf", [] { set_record("ucMode", RES_576I); });
    PMX_Reset(0);
    EXPECT_EQ(RES_576I, record("ucMode"));
    EXPECT_EQ(PMX_TV_TYPE_PAL, record("ucTvType"));
}
