// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The mixer's gamma curve. */
#include <string>

#include "tests/support/layer_fixture.h"

namespace
{

constexpr UINT32 gamma_bit = 0x00100000;

const char* const curves[] = {
    "[0, 99, 136, 163, 186, 206, 224, 240, 255]",
    "[0, 121, 155, 180, 199, 216, 230, 243, 255]",
    "[0, 85, 125, 155, 180, 202, 221, 239, 255]",
    "[0, 100, 137, 164, 187, 206, 224, 240, 255]",
};

std::string gamma_call(unsigned gamma)
{
    if (gamma < 1 || gamma > 4)
        return "PMX_HalSetGamma(0, 0, null)";
    return std::string("PMX_HalSetGamma(0, 1, ") + curves[gamma - 1] + ")";
}

} // namespace

class Gamma : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }
};

TEST_F(Gamma, SetGamma_OneToFour_SwitchItOnWithTheCurvesPoints)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetGamma(0, 1));
    EXPECT_TRACE("PMX_HalSetGamma(0, 1, [0, 99, 136, 163, 186, 206, 224, 240, 255])");
    EXPECT_RECORD_CHANGED(before, "ucGamma");
    EXPECT_EQ(1u, PMX_SetGamma(0, 2));
    EXPECT_TRACE("PMX_HalSetGamma(0, 1, [0, 121, 155, 180, 199, 216, 230, 243, 255])");
    EXPECT_EQ(1u, PMX_SetGamma(0, 3));
    EXPECT_TRACE("PMX_HalSetGamma(0, 1, [0, 85, 125, 155, 180, 202, 221, 239, 255])");
    EXPECT_EQ(1u, PMX_SetGamma(0, 4));
    EXPECT_TRACE("PMX_HalSetGamma(0, 1, [0, 100, 137, 164, 187, 206, 224, 240, 255])");
    EXPECT_RECORD_CHANGED(before, "ucGamma");
    EXPECT_EQ(4, record("ucGamma"));
}

TEST_F(Gamma, SetGamma_Zero_SwitchesItOffWithoutACurve)
{
    EXPECT_EQ(1u, PMX_SetGamma(0, 3));
    EXPECT_EQ(1, board::state().find("mixer.gamma.enabled")->as_number());
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetGamma(0, 0));
    EXPECT_TRACE("PMX_HalSetGamma(0, 0, null)");
    EXPECT_EQ(0, record("ucGamma"));
    EXPECT_EQ(0, board::state().find("mixer.gamma.enabled")->as_number());
}

TEST_F(Gamma, SetGamma_Seven_SwitchesItOffAndIsReportedAsGiven)
{
    EXPECT_EQ(1u, PMX_SetGamma(0, 1));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetGamma(0, 7));
    EXPECT_TRACE("PMX_HalSetGamma(0, 0, null)");
    UCHAR gamma = 99;
    EXPECT_EQ(1u, PMX_GetGamma(0, &gamma));
    EXPECT_EQ(7, gamma);
}

TEST_F(Gamma, SetGamma_EachOf256Values_IsStoredAsGiven)
{
    for (unsigned gamma = 0; gamma < 256; ++gamma)
    {
        EXPECT_EQ(1u, PMX_SetGamma(0, static_cast<UCHAR>(gamma))) << gamma;
        EXPECT_TRACE(gamma_call(gamma));
        EXPECT_EQ(gamma, record("ucGamma"));
    }
}

TEST_F(Gamma, SetGamma_TheStoredValueAgain_IsAppliedAgain)
{
    for (const unsigned gamma : { 0, 0, 2, 2, 7, 7 })
    {
        EXPECT_EQ(1u, PMX_SetGamma(0, static_cast<UCHAR>(gamma)));
        EXPECT_TRACE(gamma_call(gamma));
    }
}

TEST_F(Gamma, SetGamma_IsStoredBeforeTheHardware)
{
    std::int64_t stored = -1;
    at_call("PMX_HalSetGamma", [&] { stored = record("ucGamma"); });
    EXPECT_EQ(1u, PMX_SetGamma(0, 2));
    EXPECT_EQ(2, stored);
    EXPECT_EQ(1u, PMX_SetGamma(0, 5));
    EXPECT_EQ(5, stored);
}

TEST_F(Gamma, SetGamma_OtherMixerId_RefusedWithoutALine)
{
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_SetGamma(static_cast<UCHAR>(id), 1)) << id;
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Gamma, SetGamma_Bit20AloneCounts)
{
    for (unsigned bit = 0; bit < 32; ++bit)
    {
        const UINT32 mask = 1u << bit;
        const bool own = mask == gamma_bit;
        set_record("ucGamma", 9);
        set_record("u4Capability", mask);
        EXPECT_EQ(own ? 1u : 0u, PMX_SetGamma(0, 2)) << bit;
        EXPECT_TRACE(own ? gamma_call(2) : "");
        EXPECT_EQ(own ? 2 : 9, record("ucGamma"));
        set_record("ucGamma", 9);
        set_record("u4Capability", ~mask);
        EXPECT_EQ(own ? 0u : 1u, PMX_SetGamma(0, 0)) << bit;
        EXPECT_TRACE(own ? "" : gamma_call(0));
        EXPECT_EQ(own ? 9 : 0, record("ucGamma"));
    }
}

TEST_F(Gamma, GetGamma_ReadsTheValueAsGiven)
{
    UCHAR gamma = 99;
    EXPECT_EQ(1u, PMX_GetGamma(0, &gamma));
    EXPECT_EQ(0, gamma);
    for (const UCHAR value : { 1, 4, 5, 255 })
    {
        set_record("ucGamma", value);
        const RecordSnapshot before;
        EXPECT_EQ(1u, PMX_GetGamma(0, &gamma));
        EXPECT_EQ(value, gamma);
        EXPECT_RECORD_UNCHANGED(before);
    }
    EXPECT_NO_TRACE();
}

TEST_F(Gamma, GetGammaNs_FourCurvesWhateverIsSelected)
{
    const RecordSnapshot before;
    UCHAR number = 99;
    EXPECT_EQ(1u, PMX_GetGammaNs(0, &number));
    EXPECT_EQ(4, number);
    EXPECT_RECORD_UNCHANGED(before);
    set_record("ucGamma", 2);
    number = 99;
    EXPECT_EQ(1u, PMX_GetGammaNs(0, &number));
    EXPECT_EQ(4, number);
    EXPECT_NO_TRACE();
}

TEST_F(Gamma, GetGammaAndGetGammaNs_OtherMixerIdNullPointerOrNoCapability_Refused)
{
    for (const auto get : { PMX_GetGamma, PMX_GetGammaNs })
    {
        UCHAR value = 99;
        set_record("u4Capability", gamma_bit);
        for (unsigned id = 1; id < 256; ++id)
            EXPECT_EQ(0u, get(static_cast<UCHAR>(id), &value)) << id;
        EXPECT_EQ(0u, get(0, nullptr));
        EXPECT_EQ(0u, get(1, nullptr));
        set_record("u4Capability", ~gamma_bit);
        EXPECT_EQ(0u, get(0, &value));
        EXPECT_EQ(0u, get(0, nullptr));
        EXPECT_EQ(99, value);
        set_record("u4Capability", gamma_bit);
        EXPECT_EQ(1u, get(0, &value));
    }
    EXPECT_NO_TRACE();
}

TEST_F(Gamma, Reset_SwitchesItOffInTheRecordAlone)
{
    EXPECT_EQ(1u, PMX_SetGamma(0, 2));
    PMX_Reset(0);
    EXPECT_EQ(0, record("ucGamma"));
    EXPECT_EQ(1, board::state().find("mixer.gamma.enabled")->as_number());
}
