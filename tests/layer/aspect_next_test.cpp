// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** An aspect ratio that waits for the next mode change. */
#include "tests/layer/aspect.h"

using aspect::Fields;
using aspect::hdmi;
using aspect::output_change;

using AspectNext = aspect::AspectTest;

TEST_F(AspectNext, SetAspectRatioEx_OnNext_OnlyWaits)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 5, 1));
    EXPECT_TRACE(R"(LOG9 "[EX] PMX_ID(0), Aspect Ratio(5), Apply On Next(1)\n")");
    EXPECT_RECORD_CHANGED(before, "fgAspNext", "u4AspNext");
    EXPECT_EQ((Fields{ .waits = true, .next = 5 }), fields());
    EXPECT_EQ(5u, asked_for());
    UINT32 ratio = 99;
    EXPECT_EQ(1u, PMX_GetAspectRatio(0, &ratio));
    EXPECT_EQ(3u, ratio);
}

TEST_F(AspectNext, SetAspectRatioEx_OnNext_AnyValueButZero_IsLoggedAsGivenAndStoredAsOne)
{
    for (unsigned on_next = 1; on_next < 256; ++on_next)
    {
        set_fields({});
        EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 0xFFFFFFFF, static_cast<BOOL>(on_next)));
        EXPECT_TRACE("LOG9 \"[EX] PMX_ID(0), Aspect Ratio(-1), Apply On Next(" + std::to_string(on_next) + ")\\n\"");
        EXPECT_EQ((Fields{ .waits = true, .next = 0xFFFFFFFF }), fields());
    }
}

TEST_F(AspectNext, SetAspectRatioEx_OnNext_TheLastOneWaits)
{
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 5, 1));
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 2, 1));
    EXPECT_EQ((Fields{ .waits = true, .next = 2 }), fields());
    EXPECT_EQ(2u, asked_for());
}

TEST_F(AspectNext, SetAspectRatioEx_OnNext_HdmiIsNotAsked)
{
    hdmi_answers(FALSE);
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 5, 1));
    EXPECT_CALLS("");
}

TEST_F(AspectNext, SetAspectRatioNext_Waiting_AppliesItWithoutALine)
{
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 5, 1));
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(5u, PMX_SetAspectRatioNext(0));
    EXPECT_TRACE(R"(
        fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, ASP_4_3_LB, 1) = TRUE
        VDP_GlobalOutputChange()
    )");
    EXPECT_RECORD_CHANGED(before, "fgAspNext", "u4AspectRatio");
    EXPECT_EQ((Fields{ .normal = 5, .next = 5 }), fields());
}

TEST_F(AspectNext, SetAspectRatioNext_EachRatio_IsAppliedWholeAndReturned)
{
    for (const std::uint32_t ratio : aspect::ratios)
    {
        set_fields({ .normal = 99, .waits = true, .next = ratio });
        EXPECT_EQ(ratio, PMX_SetAspectRatioNext(0));
        EXPECT_TRACE(hdmi(ratio) + output_change);
        EXPECT_EQ((Fields{ .normal = ratio, .next = ratio }), fields());
    }
}

TEST_F(AspectNext, SetAspectRatioNext_NothingWaits_ReturnsTheCurrentRatioForAnyId)
{
    for (const std::uint32_t ratio : aspect::ratios)
    {
        set_fields({ .normal = ratio, .waits = false, .next = 77 });
        const RecordSnapshot before;
        for (const UCHAR id : { 0, 1, 7, 255 })
            EXPECT_EQ(ratio, PMX_SetAspectRatioNext(id));
        EXPECT_RECORD_UNCHANGED(before);
    }
    EXPECT_NO_TRACE();
}

TEST_F(AspectNext, SetAspectRatioNext_Twice_AppliesOnce)
{
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 5, 1));
    EXPECT_EQ(5u, PMX_SetAspectRatioNext(0));
    board::trace::clear();
    EXPECT_EQ(5u, PMX_SetAspectRatioNext(0));
    EXPECT_NO_TRACE();
}

TEST_F(AspectNext, SetAspectRatioNext_HdmiRefuses_StoredAndWaitsNoMore)
{
    set_fields({ .waits = true, .next = 5 });
    hdmi_answers(FALSE);
    EXPECT_EQ(0u, PMX_SetAspectRatioNext(0));
    EXPECT_TRACE(hdmi(5, "FALSE"));
    EXPECT_EQ((Fields{ .normal = 5, .next = 5 }), fields());
    board::faults::clear_all();
    EXPECT_EQ(5u, PMX_SetAspectRatioNext(0));
    EXPECT_NO_TRACE();
}

TEST_F(AspectNext, SetAspectRatioNext_OtherMixerId_AppliesToTheOneRecordWithoutHdmi)
{
    hdmi_answers(FALSE);
    for (unsigned id = 1; id < 256; ++id)
    {
        set_fields({ .normal = 3, .waits = true, .next = id + 100 });
        EXPECT_EQ(id + 100, PMX_SetAspectRatioNext(static_cast<UCHAR>(id)));
        EXPECT_TRACE("VDP_GlobalOutputChange()");
        EXPECT_EQ((Fields{ .normal = id + 100, .next = id + 100 }), fields());
    }
}

TEST_F(AspectNext, SetAspectRatioNext_IsStoredAndWaitsNoMoreBeforeHdmiIsAsked)
{
    set_fields({ .waits = true, .next = 5 });
    Fields seen;
    at_call("fgPmxDrvSetAvd", [&] { seen = fields(); });
    EXPECT_EQ(5u, PMX_SetAspectRatioNext(0));
    EXPECT_EQ((Fields{ .normal = 5, .next = 5 }), seen);
}

TEST_F(AspectNext, SetAspectRatioNext_DigestViewShown_ItsRatioStaysInForce)
{
    set_fields({ .waits = true, .next = 5, .digest_shown = true, .digest = 9 });
    EXPECT_EQ(5u, PMX_SetAspectRatioNext(0));
    EXPECT_TRACE(hdmi(5) + output_change);
    EXPECT_EQ((Fields{ .normal = 5, .next = 5, .digest_shown = true, .digest = 9 }), fields());
    EXPECT_EQ(9u, in_force());
}

TEST_F(AspectNext, SetMode_DoesNotApplyIt)
{
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 5, 1));
    EXPECT_EQ(1u, PMX_SetMode(0, RES_720P60HZ, 60, 0));
    EXPECT_EQ((Fields{ .waits = true, .next = 5 }), fields());
}

TEST_F(AspectNext, GetAspectRatioMW_TheWaitingRatioElseTheNormalOne)
{
    for (const std::uint32_t ratio : aspect::ratios)
    {
        set_fields({ .normal = 77, .waits = true, .next = ratio, .digest_shown = true, .digest = 9 });
        const RecordSnapshot waiting;
        EXPECT_EQ(ratio, asked_for());
        EXPECT_RECORD_UNCHANGED(waiting);
        set_fields({ .normal = ratio, .waits = false, .next = 77, .digest_shown = true, .digest = 9 });
        const RecordSnapshot applied;
        EXPECT_EQ(ratio, asked_for());
        EXPECT_RECORD_UNCHANGED(applied);
    }
    EXPECT_NO_TRACE();
}

TEST_F(AspectNext, GetAspectRatioMW_OtherMixerIdOrNullPointer_Refused)
{
    UINT32 ratio = 99;
    for (const bool waits : { false, true })
    {
        set_fields({ .waits = waits, .next = 5 });
        for (unsigned id = 1; id < 256; ++id)
            EXPECT_EQ(0u, PMX_GetAspectRatioMW(static_cast<UCHAR>(id), &ratio)) << id;
        EXPECT_EQ(0u, PMX_GetAspectRatioMW(0, nullptr));
        EXPECT_EQ(0u, PMX_GetAspectRatioMW(1, nullptr));
    }
    EXPECT_EQ(99u, ratio);
    EXPECT_NO_TRACE();
}
