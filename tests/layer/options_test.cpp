// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Switches that others act on: digital port's source, composite's set-up and PAL-60, media type; and the 2D
 *  smoothing flag. */
#include <string>

#include "tests/support/layer_fixture.h"

class Options : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }
};

TEST_F(Options, SetDGOSource_BeforeOrAfterTheMixer)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDGOSource(TRUE));
    EXPECT_TRACE("vSetCcirOutBeforeMixer(1)");
    EXPECT_EQ(1, board::state().find("hdmi_av.ccir_before_mixer")->as_number());
    EXPECT_EQ(1u, PMX_SetDGOSource(FALSE));
    EXPECT_TRACE("vSetCcirOutBeforeMixer(0)");
    EXPECT_EQ(0, board::state().find("hdmi_av.ccir_before_mixer")->as_number());
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Options, SetCVBSSetup_LogsBehindTheEncoder)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetCVBSSetup(TRUE));
    EXPECT_TRACE(R"(
        TVE_CVBSSetup_En(1)
        LOG8 "SetCVBSSetup = 1 \n"
    )");
    EXPECT_EQ(1u, PMX_SetCVBSSetup(FALSE));
    EXPECT_TRACE(R"(
        TVE_CVBSSetup_En(0)
        LOG8 "SetCVBSSetup = 0 \n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Options, SetCVBSPal60_LogsBehindTheEncoder)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetCVBSPal60(TRUE));
    EXPECT_TRACE(R"(
        TVE_CVBSPal60_En(1)
        LOG8 "TVE_CVBSPal60_En = 1 \n"
    )");
    EXPECT_EQ(1u, PMX_SetCVBSPal60(FALSE));
    EXPECT_TRACE(R"(
        TVE_CVBSPal60_En(0)
        LOG8 "TVE_CVBSPal60_En = 0 \n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Options, SetDGOSourceSetCVBSSetupSetCVBSPal60_EachValueIsHandedOnAsGiven)
{
    for (unsigned value = 0; value < 256; ++value)
    {
        const std::string number = std::to_string(value);
        EXPECT_EQ(1u, PMX_SetDGOSource(static_cast<BOOL>(value)));
        EXPECT_EQ(1u, PMX_SetCVBSSetup(static_cast<BOOL>(value)));
        EXPECT_EQ(1u, PMX_SetCVBSPal60(static_cast<BOOL>(value)));
        EXPECT_TRACE("vSetCcirOutBeforeMixer(" + number + ")\n" + "TVE_CVBSSetup_En(" + number + ")\n" +
                     "LOG8 \"SetCVBSSetup = " + number + " \\n\"\n" + "TVE_CVBSPal60_En(" + number + ")\n" +
                     "LOG8 \"TVE_CVBSPal60_En = " + number + " \\n\"\n");
    }
}

TEST_F(Options, SetMediaType_EachTypeIsHandedOnAndNotStored)
{
    const RecordSnapshot before;
    for (unsigned type = 0; type < 256; ++type)
    {
        EXPECT_EQ(1u, PMX_SetMediaType(0, static_cast<UCHAR>(type)));
        EXPECT_TRACE("TVE_Identify_Mediatype(" + std::to_string(type) + ")");
    }
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(255, board::state().find("tv_encoder.media_type")->as_number());
}

TEST_F(Options, SetMediaType_OtherMixerId_Refused)
{
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_SetMediaType(static_cast<UCHAR>(id), 1)) << id;
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Options, SwitchesWithoutCapabilityBit_WorkWithNoneAndBeforeStartUp)
{
    for (const bool start : { true, false })
    {
        if (start)
            set_record("u4Capability", 0);
        else
            power_on();
        const RecordSnapshot before;
        EXPECT_EQ(1u, PMX_SetDGOSource(TRUE));
        EXPECT_EQ(1u, PMX_SetCVBSSetup(TRUE));
        EXPECT_EQ(1u, PMX_SetCVBSPal60(TRUE));
        EXPECT_EQ(1u, PMX_SetMediaType(0, 7));
        EXPECT_CALLS(R"(
            vSetCcirOutBeforeMixer(1)
            TVE_CVBSSetup_En(1)
            TVE_CVBSPal60_En(1)
            TVE_Identify_Mediatype(7)
        )");
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(Options, d_PMX_Set2DSmooth_Five_SetsTheFlagToOne)
{
    const RecordSnapshot before;
    EXPECT_EQ(0, _fg2DCap);
    d_PMX_Set2DSmooth(5);
    EXPECT_EQ(1, _fg2DCap);
    EXPECT_RECORD_CHANGED(before, "_fg2DCap");
    d_PMX_Set2DSmooth(0);
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_NO_TRACE();
}

TEST_F(Options, d_PMX_Set2DSmooth_EachValueBecomesZeroOrOne)
{
    for (unsigned value = 0; value < 256; ++value)
    {
        d_PMX_Set2DSmooth(static_cast<UCHAR>(value));
        EXPECT_EQ(value != 0 ? 1 : 0, _fg2DCap) << value;
    }
    EXPECT_NO_TRACE();
}

TEST_F(Options, d_PMX_Set2DSmooth_OutlivesAReset)
{
    d_PMX_Set2DSmooth(1);
    PMX_Reset(0);
    EXPECT_EQ(1, _fg2DCap);
}
