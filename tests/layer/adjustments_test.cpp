// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** What the five picture adjustments have in common, each value, target and capability bit of each. */
#include "tests/layer/picture.h"
#include "tests/support/layer_fixture.h"

using picture::Adjustment;
using picture::adjustments;
using picture::applied;
using picture::refused;

class Adjustments : public LayerTest
{
protected:
    static constexpr UINT32 default_capability = 0x7FFBFFFF;

    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }
};

TEST_F(Adjustments, SetAdjustment_EachValueForTheAnalogueOutputs)
{
    for (const Adjustment& adjustment : adjustments)
    {
        SCOPED_TRACE(adjustment.name);
        for (unsigned value = 0; value < 256; ++value)
        {
            EXPECT_EQ(1u, adjustment.set(0, static_cast<UCHAR>(value), 1));
            EXPECT_TRACE(applied(adjustment, 1, value));
            EXPECT_EQ(value, record(adjustment.field));
        }
    }
}

TEST_F(Adjustments, SetAdjustment_EachValueForHdmi_TheAnalogueSettingStays)
{
    for (const Adjustment& adjustment : adjustments)
    {
        SCOPED_TRACE(adjustment.name);
        for (unsigned value = 0; value < 256; ++value)
        {
            EXPECT_EQ(1u, adjustment.set(0, static_cast<UCHAR>(value), 0));
            EXPECT_TRACE(applied(adjustment, 0, value));
            EXPECT_EQ(adjustment.by_default, record(adjustment.field));
        }
    }
}

TEST_F(Adjustments, SetAdjustment_AnyTargetButZero_MeansTheAnalogueOutputsAndIsLoggedAsGiven)
{
    for (const Adjustment& adjustment : adjustments)
    {
        SCOPED_TRACE(adjustment.name);
        for (unsigned target = 1; target < 256; ++target)
        {
            const unsigned value = 255 - target;
            EXPECT_EQ(1u, adjustment.set(0, static_cast<UCHAR>(value), static_cast<UCHAR>(target)));
            EXPECT_TRACE(applied(adjustment, target, value));
            EXPECT_EQ(value, record(adjustment.field));
        }
    }
}

TEST_F(Adjustments, SetAdjustment_TheStoredValueAgain_IsAppliedAgain)
{
    for (const Adjustment& adjustment : adjustments)
    {
        SCOPED_TRACE(adjustment.name);
        for (const unsigned target : { 1, 1, 0, 0 })
        {
            EXPECT_EQ(1u, adjustment.set(0, adjustment.by_default, static_cast<UCHAR>(target)));
            EXPECT_TRACE(applied(adjustment, target, adjustment.by_default));
        }
    }
}

TEST_F(Adjustments, SetAdjustment_OtherMixerId_RefusedWithoutALine)
{
    const RecordSnapshot before;
    for (const Adjustment& adjustment : adjustments)
    {
        for (unsigned id = 1; id < 256; ++id)
        {
            for (const UCHAR target : { 0, 1 })
                EXPECT_EQ(0u, adjustment.set(static_cast<UCHAR>(id), 77, target)) << adjustment.name << " " << id;
        }
    }
    set_record("u4Capability", 0);
    for (const Adjustment& adjustment : adjustments)
        EXPECT_EQ(0u, adjustment.set(1, 77, 1)) << adjustment.name;
    EXPECT_NO_TRACE();
    EXPECT_RECORD_CHANGED(before, "u4Capability");
}

TEST_F(Adjustments, SetAdjustment_ItsOwnCapabilityBitAloneCounts)
{
    for (const Adjustment& adjustment : adjustments)
    {
        SCOPED_TRACE(adjustment.name);
        for (unsigned bit = 0; bit < 32; ++bit)
        {
            const UINT32 mask = 1u << bit;
            const bool own = mask == adjustment.capability;
            set_record("u4Capability", mask);
            EXPECT_EQ(own ? 1u : 0u, adjustment.set(0, 9, 1)) << bit;
            EXPECT_TRACE(own ? applied(adjustment, 1, 9) : refused(adjustment, 1, 9));
            set_record("u4Capability", ~mask);
            EXPECT_EQ(own ? 0u : 1u, adjustment.set(0, 8, 0)) << bit;
            EXPECT_TRACE(own ? refused(adjustment, 0, 8) : applied(adjustment, 0, 8));
        }
    }
}

TEST_F(Adjustments, SetAdjustment_HdmiDriverRefuses_DoesNotMatter)
{
    board::faults::set({ "fgPmxDrvSetAvd", FALSE, board::Fault::When::Always });
    const RecordSnapshot before;
    for (const Adjustment& adjustment : adjustments)
    {
        EXPECT_EQ(1u, adjustment.set(0, 200, 0)) << adjustment.name;
        std::string lines = applied(adjustment, 0, 200);
        lines.replace(lines.rfind("TRUE"), 4, "FALSE");
        EXPECT_TRACE(lines);
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Adjustments, SetAdjustment_IsStoredBeforeTheHardware)
{
    for (const Adjustment& adjustment : adjustments)
    {
        std::int64_t stored = -1;
        at_call((adjustment.in_mixer ? "PMX_HalSet" : "TVE_Set") + adjustment.name,
                [&] { stored = record(adjustment.field); });
        EXPECT_EQ(1u, adjustment.set(0, 33, 1));
        EXPECT_EQ(33, stored) << adjustment.name;
    }
}

TEST_F(Adjustments, SetAdjustment_BeforeStartUp_NothingIsPossible)
{
    power_on();
    const RecordSnapshot before;
    for (const Adjustment& adjustment : adjustments)
    {
        for (const unsigned target : { 0u, 1u, 2u, 255u })
        {
            EXPECT_EQ(0u, adjustment.set(0, 77, static_cast<UCHAR>(target)));
            EXPECT_TRACE(refused(adjustment, target, 77));
        }
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Adjustments, SetAdjustment_ResetReturnsTheDefaultsToTheRecord)
{
    for (const Adjustment& adjustment : adjustments)
        EXPECT_EQ(1u, adjustment.set(0, 77, 1));
    PMX_Reset(0);
    for (const Adjustment& adjustment : adjustments)
        EXPECT_EQ(adjustment.by_default, record(adjustment.field)) << adjustment.name;
}

TEST_F(Adjustments, GetAdjustment_Default)
{
    for (const Adjustment& adjustment : adjustments)
    {
        UCHAR value = 99;
        EXPECT_EQ(1u, adjustment.get(0, &value));
        EXPECT_EQ(adjustment.by_default, value) << adjustment.name;
    }
    EXPECT_NO_TRACE();
}

TEST_F(Adjustments, GetAdjustment_EachReadsItsOwnFieldAndChangesNothing)
{
    UCHAR given = 1;
    for (const Adjustment& adjustment : adjustments)
        set_record(adjustment.field, given++);
    const RecordSnapshot before;
    UCHAR expected = 1;
    for (const Adjustment& adjustment : adjustments)
    {
        UCHAR value = 99;
        EXPECT_EQ(1u, adjustment.get(0, &value));
        EXPECT_EQ(expected++, value) << adjustment.name;
    }
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_NO_TRACE();
}

TEST_F(Adjustments, GetAdjustment_AfterASettingForHdmi_KeepsReportingTheAnalogueOne)
{
    for (const Adjustment& adjustment : adjustments)
    {
        EXPECT_EQ(1u, adjustment.set(0, 60, 1));
        EXPECT_EQ(1u, adjustment.set(0, 140, 0));
        UCHAR value = 99;
        EXPECT_EQ(1u, adjustment.get(0, &value));
        EXPECT_EQ(60, value) << adjustment.name;
    }
}

TEST_F(Adjustments, GetAdjustment_OtherMixerIdNullPointerOrNoCapability_RefusedWithoutALine)
{
    for (const Adjustment& adjustment : adjustments)
    {
        SCOPED_TRACE(adjustment.name);
        UCHAR value = 99;
        set_record("u4Capability", default_capability);
        for (unsigned id = 1; id < 256; ++id)
            EXPECT_EQ(0u, adjustment.get(static_cast<UCHAR>(id), &value)) << id;
        EXPECT_EQ(0u, adjustment.get(0, nullptr));
        EXPECT_EQ(0u, adjustment.get(1, nullptr));
        set_record("u4Capability", ~adjustment.capability);
        EXPECT_EQ(0u, adjustment.get(0, &value));
        EXPECT_EQ(0u, adjustment.get(0, nullptr));
        EXPECT_EQ(99, value);
        set_record("u4Capability", adjustment.capability);
        EXPECT_EQ(1u, adjustment.get(0, &value));
        EXPECT_EQ(adjustment.by_default, value);
    }
    EXPECT_NO_TRACE();
}

TEST_F(Adjustments, d_PMX_SetAdjustment_IsForTheAnalogueOutputs)
{
    for (const Adjustment& adjustment : adjustments)
    {
        SCOPED_TRACE(adjustment.name);
        for (const unsigned value : { 0, 1, 77, 128, 255 })
        {
            adjustment.short_set(static_cast<UCHAR>(value));
            EXPECT_TRACE(applied(adjustment, 1, value));
            EXPECT_EQ(value, record(adjustment.field));
        }
        set_record("u4Capability", ~adjustment.capability);
        adjustment.short_set(66);
        EXPECT_TRACE(refused(adjustment, 1, 66));
        EXPECT_EQ(255, record(adjustment.field));
    }
}

TEST_F(Adjustments, d_PMX_GetAdjustment_WritesTheSettingOrNothing)
{
    for (const Adjustment& adjustment : adjustments)
    {
        SCOPED_TRACE(adjustment.name);
        set_record("u4Capability", default_capability);
        set_record(adjustment.field, 55);
        UCHAR value = 99;
        adjustment.short_get(&value);
        EXPECT_EQ(55, value);
        adjustment.short_get(nullptr);
        set_record("u4Capability", ~adjustment.capability);
        set_record(adjustment.field, 56);
        adjustment.short_get(&value);
        EXPECT_EQ(55, value);
    }
    EXPECT_NO_TRACE();
}
