// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Reading the boot resolution; the TV type. */
#include "tests/layer/sequences.h"
#include "tests/support/layer_fixture.h"

using Boot = LayerTest;
using TvType = LayerTest;

TEST_F(Boot, GetHDMIDefaultRes_Word0000010C_IsTwelve)
{
    const RecordSnapshot before;
    EXPECT_EQ(RES_1080P60HZ, PMX_GetHDMIDefaultRes());
    EXPECT_TRACE(R"(
        get_part_id_by_name("fast_init_param") = 0
        UTIL_Printf "TESTPMX: Get pard ID:0.\n"
        i4NFBPartitionRead(0, 0, [0x0C, 0x01, 0x00, 0x00], 4) = 4
        UTIL_Printf "TESTPMX: Get Test Data :12, 0x     10c.\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Boot, GetHDMIDefaultRes_EveryLowByte_IsReturnedUnvalidated)
{
    for (const std::uint32_t high : { 0x00000000u, 0xABCDEF00u })
    {
        for (std::uint32_t byte = 0; byte < 256; ++byte)
        {
            SCOPED_TRACE(high | byte);
            boot_word(high | byte);
            EXPECT_EQ(byte, PMX_GetHDMIDefaultRes());
            EXPECT_TRACE(sequences::boot_read(high | byte));
        }
    }
}

TEST_F(Boot, GetHDMIDefaultRes_WideWord_IsPrintedWhole)
{
    boot_word(0xFFFFFF0C);
    EXPECT_EQ(12, PMX_GetHDMIDefaultRes());
    EXPECT_TRACE(R"(
        get_part_id_by_name("fast_init_param") = 0
        UTIL_Printf "TESTPMX: Get pard ID:0.\n"
        i4NFBPartitionRead(0, 0, [0x0C, 0xFF, 0xFF, 0xFF], 4) = 4
        UTIL_Printf "TESTPMX: Get Test Data :12, 0xffffff0c.\n"
    )");
}

TEST_F(Boot, GetHDMIDefaultRes_PartitionMissing_ReadsAllTheSameAndGives480I)
{
    no_boot_partition();
    EXPECT_EQ(RES_480I, PMX_GetHDMIDefaultRes());
    EXPECT_TRACE(R"(
        get_part_id_by_name("fast_init_param") = -1
        UTIL_Printf "TESTPMX: Get pard ID:-1.\n"
        i4NFBPartitionRead(-1, 0, <unchanged>, 4)
        UTIL_Printf "TESTPMX: Get Test Data :0, 0x       0.\n"
    )");
}

TEST_F(Boot, GetHDMIDefaultRes_PartitionTooShort_480I)
{
    for (const auto& image : { std::vector<std::uint8_t>{}, std::vector<std::uint8_t>{ 0x0C, 0x01, 0x00 } })
    {
        boot_image(image);
        EXPECT_EQ(RES_480I, PMX_GetHDMIDefaultRes());
        EXPECT_TRACE(sequences::failed_boot_read("0"));
    }
}

TEST_F(Boot, GetHDMIDefaultRes_LongPartition_OnlyTheFirstWordIsRead)
{
    boot_image({ 0x0A, 0x02, 0x03, 0x04, 0x05, 0x06, 0x07, 0x08 });
    EXPECT_EQ(RES_1080I60HZ, PMX_GetHDMIDefaultRes());
    EXPECT_TRACE(sequences::boot_read(0x0403020A));
}

TEST_F(Boot, GetHDMIDefaultRes_PartitionIdIsHandedOnAsFound)
{
    for (const int id : { 7, 0x12345 })
    {
        board::faults::set({ "get_part_id_by_name", id });
        board::faults::set({ "i4NFBPartitionRead", 4 });
        EXPECT_EQ(RES_480I, PMX_GetHDMIDefaultRes());
        EXPECT_TRACE(sequences::failed_boot_read(std::to_string(id).c_str()));
    }
}

TEST_F(TvType, SetTvType_StoresAndForwards)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetTvType(0, PMX_TV_TYPE_PAL));
    EXPECT_TRACE("PMX_HalSetTvType(0, 3)");
    EXPECT_RECORD_CHANGED(before, "ucTvType");
    EXPECT_EQ(3, record("ucTvType"));
}

TEST_F(TvType, SetTvType_EveryValue_IsStoredAndForwardedAsGiven)
{
    started();
    for (unsigned type = 0; type < 256; ++type)
    {
        EXPECT_EQ(1u, PMX_SetTvType(0, static_cast<UCHAR>(type)));
        EXPECT_TRACE("PMX_HalSetTvType(0, " + std::to_string(type) + ")");
        EXPECT_EQ(type, record("ucTvType"));
    }
}

TEST_F(TvType, SetTvType_SameValueAgain_IsForwardedAgain)
{
    started();
    EXPECT_EQ(1u, PMX_SetTvType(0, 7));
    EXPECT_EQ(1u, PMX_SetTvType(0, 7));
    EXPECT_TRACE("PMX_HalSetTvType(0, 7)\nPMX_HalSetTvType(0, 7)");
    EXPECT_EQ(7, record("ucTvType"));
}

TEST_F(TvType, SetTvType_IsStoredBeforeTheHardwareIsTold)
{
    started();
    std::int64_t stored = -1;
    at_call("PMX_HalSetTvType", [&] { stored = record("ucTvType"); });
    EXPECT_EQ(1u, PMX_SetTvType(0, 9));
    EXPECT_EQ(9, stored);
}

TEST_F(TvType, SetTvType_OtherMixerId_RefusedAndNothingChanges)
{
    started();
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_SetTvType(static_cast<UCHAR>(id), 3)) << id;
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(TvType, GetTvType_ReadsTheRecord)
{
    started();
    for (const UCHAR type : { 0, 3, 7, 255 })
    {
        set_record("ucTvType", type);
        const RecordSnapshot before;
        UCHAR read = 99;
        EXPECT_EQ(1u, PMX_GetTvType(0, &read));
        EXPECT_EQ(type, read);
        EXPECT_RECORD_UNCHANGED(before);
    }
    EXPECT_NO_TRACE();
}

TEST_F(TvType, GetTvType_OtherMixerIdOrNullPointer_Refused)
{
    started();
    set_record("ucTvType", 7);
    UCHAR read = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_GetTvType(static_cast<UCHAR>(id), &read)) << id;
    EXPECT_EQ(99, read);
    EXPECT_EQ(0u, PMX_GetTvType(0, nullptr));
    EXPECT_EQ(0u, PMX_GetTvType(1, nullptr));
    EXPECT_NO_TRACE();
}
