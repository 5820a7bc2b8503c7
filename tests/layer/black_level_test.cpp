// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The analogue outputs' black level. */
#include <string>

#include "tests/support/layer_fixture.h"

namespace
{

constexpr UINT32 black_level_bit = 0x40000000;

std::string set_lines(unsigned component, unsigned composite)
{
    const std::string cav = std::to_string(component);
    const std::string cvbs = std::to_string(composite);
    return "LOG8 \"TVE Set Black Lv, CAV(" + cav + "), CVBS(" + cvbs + ")\\n\"\nTVE_SetBlackLvl(" + cav + ", " + cvbs +
           ")\n";
}

std::string get_lines(unsigned component, unsigned composite)
{
    return "LOG8 \"TVE Get Black Lv, CAV(" + std::to_string(component) + "), CVBS(" + std::to_string(composite) +
           ")\\n\"\n";
}

} // namespace

class BlackLevel : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }
};

TEST_F(BlackLevel, SetBlackLv_BothOutputsAreToldAndStored)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetBlackLv(0, 1, 2));
    EXPECT_TRACE(R"(
        LOG8 "TVE Set Black Lv, CAV(1), CVBS(2)\n"
        TVE_SetBlackLvl(1, 2)
    )");
    EXPECT_RECORD_CHANGED(before, "ucCAVBlackLv", "ucCVBSBlackLv");
    EXPECT_EQ(1, record("ucCAVBlackLv"));
    EXPECT_EQ(2, record("ucCVBSBlackLv"));
    EXPECT_EQ(1, board::state().find("tv_encoder.black_level.component")->as_number());
    EXPECT_EQ(2, board::state().find("tv_encoder.black_level.composite")->as_number());
}

TEST_F(BlackLevel, SetBlackLv_EachValueOfEitherOutput)
{
    for (unsigned value = 0; value < 256; ++value)
    {
        const unsigned other = 255 - value;
        EXPECT_EQ(1u, PMX_SetBlackLv(0, static_cast<UCHAR>(value), static_cast<UCHAR>(other)));
        EXPECT_TRACE(set_lines(value, other));
        EXPECT_EQ(value, record("ucCAVBlackLv"));
        EXPECT_EQ(other, record("ucCVBSBlackLv"));
    }
}

TEST_F(BlackLevel, SetBlackLv_TheStoredValuesAgain_AreAppliedAgain)
{
    EXPECT_EQ(1u, PMX_SetBlackLv(0, 0, 0));
    EXPECT_TRACE(set_lines(0, 0));
    EXPECT_EQ(1u, PMX_SetBlackLv(0, 0, 0));
    EXPECT_TRACE(set_lines(0, 0));
}

TEST_F(BlackLevel, SetBlackLv_IsStoredBehindTheEncoder)
{
    std::int64_t component = -1;
    std::int64_t composite = -1;
    at_call("TVE_SetBlackLvl", [&] {
        component = record("ucCAVBlackLv");
        composite = record("ucCVBSBlackLv");
    });
    EXPECT_EQ(1u, PMX_SetBlackLv(0, 1, 1));
    EXPECT_EQ(0, component);
    EXPECT_EQ(0, composite);
}

TEST_F(BlackLevel, SetBlackLv_OtherMixerId_RefusedWithoutALine)
{
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_SetBlackLv(static_cast<UCHAR>(id), 1, 1)) << id;
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(BlackLevel, SetBlackLv_CapabilityBitClear_RefusedWithoutALine)
{
    set_record("u4Capability", ~black_level_bit);
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetBlackLv(0, 1, 1));
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(BlackLevel, SetAndGetBlackLv_Bit30AloneCounts)
{
    for (unsigned bit = 0; bit < 32; ++bit)
    {
        const UINT32 mask = 1u << bit;
        const bool own = mask == black_level_bit;
        UCHAR component = 99;
        UCHAR composite = 99;
        set_record("u4Capability", mask);
        EXPECT_EQ(own ? 1u : 0u, PMX_SetBlackLv(0, 3, 4)) << bit;
        EXPECT_TRACE(own ? set_lines(3, 4) : "");
        EXPECT_EQ(own ? 1u : 0u, PMX_GetBlackLv(0, &component, &composite)) << bit;
        EXPECT_TRACE(own ? get_lines(3, 4) : "");
        set_record("u4Capability", ~mask);
        EXPECT_EQ(own ? 0u : 1u, PMX_SetBlackLv(0, 5, 6)) << bit;
        EXPECT_TRACE(own ? "" : set_lines(5, 6));
        EXPECT_EQ(own ? 0u : 1u, PMX_GetBlackLv(0, &component, &composite)) << bit;
        EXPECT_TRACE(own ? "" : get_lines(5, 6));
    }
}

TEST_F(BlackLevel, GetBlackLv_ReadsBothAndLogsThem)
{
    UCHAR component = 99;
    UCHAR composite = 99;
    EXPECT_EQ(1u, PMX_GetBlackLv(0, &component, &composite));
    EXPECT_EQ(0, component);
    EXPECT_EQ(0, composite);
    EXPECT_TRACE(R"(LOG8 "TVE Get Black Lv, CAV(0), CVBS(0)\n")");
    set_record("ucCAVBlackLv", 255);
    set_record("ucCVBSBlackLv", 1);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_GetBlackLv(0, &component, &composite));
    EXPECT_EQ(255, component);
    EXPECT_EQ(1, composite);
    EXPECT_TRACE(R"(LOG8 "TVE Get Black Lv, CAV(255), CVBS(1)\n")");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(BlackLevel, GetBlackLv_OtherMixerIdEitherPointerNullOrNoCapability_RefusedWithoutALine)
{
    UCHAR component = 99;
    UCHAR composite = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_GetBlackLv(static_cast<UCHAR>(id), &component, &composite)) << id;
    EXPECT_EQ(0u, PMX_GetBlackLv(0, nullptr, &composite));
    EXPECT_EQ(0u, PMX_GetBlackLv(0, &component, nullptr));
    EXPECT_EQ(0u, PMX_GetBlackLv(0, nullptr, nullptr));
    EXPECT_EQ(0u, PMX_GetBlackLv(1, nullptr, nullptr));
    set_record("u4Capability", ~black_level_bit);
    EXPECT_EQ(0u, PMX_GetBlackLv(0, &component, &composite));
    EXPECT_EQ(0u, PMX_GetBlackLv(0, nullptr, nullptr));
    EXPECT_EQ(99, component);
    EXPECT_EQ(99, composite);
    EXPECT_NO_TRACE();
}

TEST_F(BlackLevel, Reset_ReturnsTheDefaults)
{
    EXPECT_EQ(1u, PMX_SetBlackLv(0, 1, 1));
    PMX_Reset(0);
    EXPECT_EQ(0, record("ucCAVBlackLv"));
    EXPECT_EQ(0, record("ucCVBSBlackLv"));
}

TEST_F(BlackLevel, GetBlackLv_ChangedWhileItIsPrinted_BothWereGivenBefore)
{
    set_record("ucCAVBlackLv", 1);
    set_record("ucCVBSBlackLv", 2);
    at_call("PMX_IsLog", [] {
        set_record("ucCAVBlackLv", 3);
        set_record("ucCVBSBlackLv", 4);
    });
    UCHAR component = 99;
    UCHAR composite = 99;
    EXPECT_EQ(1u, PMX_GetBlackLv(0, &component, &composite));
    EXPECT_EQ(1, component);
    EXPECT_EQ(2, composite);
}

TEST_F(BlackLevel, GetBlackLv_BothIntoOnePlace_TheCompositeLevelIsLeft)
{
    set_record("ucCAVBlackLv", 1);
    set_record("ucCVBSBlackLv", 2);
    UCHAR level = 99;
    EXPECT_EQ(1u, PMX_GetBlackLv(0, &level, &level));
    EXPECT_EQ(2, level);
}
