// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Master enable and capability word. */
#include "tests/support/layer_fixture.h"

using MasterEnable = LayerTest;
using Capability = LayerTest;

TEST_F(MasterEnable, SetEnable_On_AppliesTheDigitalPortsDefaults)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetEnable(0, 1));
    EXPECT_TRACE(R"(
        PMX_VsyncEnable()
        PMX_HalSetDigitalOut(0, 1, 0, 24)
        PMX_HalSetDigitalOutRgb(0, 0)
        PMX_HalSetDigitalOutPhase(0, 2)
    )");
    EXPECT_RECORD_CHANGED(before, "ucEnable");
    EXPECT_EQ(1, record("ucEnable"));
}

TEST_F(MasterEnable, SetEnable_On_EachSettingComesFromItsOwnField)
{
    started();
    set_record("ucDigitalOut", 11);
    set_record("ucProprietaryMode", 22);
    set_record("ucDigitalBit", 33);
    set_record("ucDigitalRgb", 44);
    set_record("u4Phase", 55);
    EXPECT_EQ(1u, PMX_SetEnable(0, 1));
    EXPECT_TRACE(R"(
        PMX_VsyncEnable()
        PMX_HalSetDigitalOut(0, 11, 22, 33)
        PMX_HalSetDigitalOutRgb(0, 44)
        PMX_HalSetDigitalOutPhase(0, 55)
    )");
}

TEST_F(MasterEnable, SetEnable_Off_SwitchesThePortOff)
{
    started();
    EXPECT_EQ(1u, PMX_SetEnable(0, 1));
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetEnable(0, 0));
    EXPECT_TRACE(R"(
        PMX_VsyncDisable()
        PMX_HalSetDigitalOut(0, 0, 0, 0)
    )");
    EXPECT_RECORD_CHANGED(before, "ucEnable");
    EXPECT_EQ(0, record("ucEnable"));
}

TEST_F(MasterEnable, SetEnable_TheStoredValue_DoesNothing)
{
    started();
    const RecordSnapshot off;
    EXPECT_EQ(1u, PMX_SetEnable(0, 0));
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(off);

    for (const UCHAR enable : { 1, 2, 255 })
    {
        set_record("ucEnable", enable);
        const RecordSnapshot on;
        EXPECT_EQ(1u, PMX_SetEnable(0, enable));
        EXPECT_NO_TRACE();
        EXPECT_RECORD_UNCHANGED(on);
    }
}

TEST_F(MasterEnable, SetEnable_TwoAfterOne_SwitchesOnAgainAndStoresTwo)
{
    started();
    EXPECT_EQ(1u, PMX_SetEnable(0, 1));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetEnable(0, 2));
    EXPECT_TRACE(R"(
        PMX_VsyncEnable()
        PMX_HalSetDigitalOut(0, 1, 0, 24)
        PMX_HalSetDigitalOutRgb(0, 0)
        PMX_HalSetDigitalOutPhase(0, 2)
    )");
    EXPECT_EQ(2, record("ucEnable"));
}

TEST_F(MasterEnable, SetEnable_AnyNonZeroValue_SwitchesOnAndIsStoredAsGiven)
{
    started();
    for (unsigned enable = 1; enable < 256; ++enable)
    {
        EXPECT_EQ(1u, PMX_SetEnable(0, static_cast<UCHAR>(enable)));
        EXPECT_TRACE(R"(
            PMX_VsyncEnable()
            PMX_HalSetDigitalOut(0, 1, 0, 24)
            PMX_HalSetDigitalOutRgb(0, 0)
            PMX_HalSetDigitalOutPhase(0, 2)
        )");
        EXPECT_EQ(enable, record("ucEnable"));
    }
}

TEST_F(MasterEnable, SetEnable_IsStoredBehindTheHardware)
{
    started();
    std::int64_t stored = -1;
    at_call("PMX_HalSetDigitalOutPhase", [&] { stored = record("ucEnable"); });
    EXPECT_EQ(1u, PMX_SetEnable(0, 1));
    EXPECT_EQ(0, stored);
    at_call("PMX_HalSetDigitalOut", [&] { stored = record("ucEnable"); });
    EXPECT_EQ(1u, PMX_SetEnable(0, 0));
    EXPECT_EQ(1, stored);
}

TEST_F(MasterEnable, SetEnable_OtherMixerId_RefusedAndNothingChanges)
{
    started();
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        EXPECT_EQ(0u, PMX_SetEnable(static_cast<UCHAR>(id), 1)) << id;
        EXPECT_EQ(0u, PMX_SetEnable(static_cast<UCHAR>(id), 0)) << id;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(MasterEnable, GetEnable_ReadsTheValueAsGiven)
{
    started();
    for (const UCHAR enable : { 0, 1, 2, 255 })
    {
        set_record("ucEnable", enable);
        const RecordSnapshot before;
        UCHAR read = 99;
        EXPECT_EQ(1u, PMX_GetEnable(0, &read));
        EXPECT_EQ(enable, read);
        EXPECT_RECORD_UNCHANGED(before);
    }
    EXPECT_NO_TRACE();
}

TEST_F(MasterEnable, GetEnable_OtherMixerIdOrNullPointer_Refused)
{
    started();
    UCHAR read = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_GetEnable(static_cast<UCHAR>(id), &read)) << id;
    EXPECT_EQ(99, read);
    EXPECT_EQ(0u, PMX_GetEnable(0, nullptr));
    EXPECT_EQ(0u, PMX_GetEnable(1, nullptr));
    EXPECT_NO_TRACE();
}

TEST_F(Capability, GetCap_DefaultWord)
{
    started();
    UINT32 capability = 0;
    EXPECT_EQ(1u, PMX_GetCap(0, &capability));
    EXPECT_EQ(0x7FFBFFFFu, capability);
    EXPECT_NO_TRACE();
}

TEST_F(Capability, GetCap_ReadsTheRecord)
{
    started();
    for (const UINT32 word : { 0u, 1u, 0x80000000u, 0xFFFFFFFFu })
    {
        set_record("u4Capability", word);
        const RecordSnapshot before;
        UINT32 capability = 99;
        EXPECT_EQ(1u, PMX_GetCap(0, &capability));
        EXPECT_EQ(word, capability);
        EXPECT_RECORD_UNCHANGED(before);
    }
    EXPECT_NO_TRACE();
}

TEST_F(Capability, GetCap_OtherMixerIdOrNullPointer_Refused)
{
    started();
    UINT32 capability = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_GetCap(static_cast<UCHAR>(id), &capability)) << id;
    EXPECT_EQ(99u, capability);
    EXPECT_EQ(0u, PMX_GetCap(0, nullptr));
    EXPECT_EQ(0u, PMX_GetCap(1, nullptr));
    EXPECT_NO_TRACE();
}
