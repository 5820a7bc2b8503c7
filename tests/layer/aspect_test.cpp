// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The normal aspect ratio, set now. */
#include "tests/layer/aspect.h"

using aspect::Fields;
using aspect::hdmi;
using aspect::output_change;
using aspect::signed_number;

namespace
{

std::string announced(std::uint32_t ratio)
{
    return "LOG9 \"PMX_ID(0), Aspect Ratio(" + signed_number(ratio) + ")\\n\"\n";
}

std::string announced_ex(std::uint32_t ratio, unsigned on_next)
{
    return "LOG9 \"[EX] PMX_ID(0), Aspect Ratio(" + signed_number(ratio) + "), Apply On Next(" +
           std::to_string(on_next) + ")\\n\"\n";
}

const std::string change_told = "LOG9 \"VDP_GlobalOutputChange\\n\"\n";
const std::string told_ex = "LOG9 \"[EX] VDP_GlobalOutputChange\\n\"\n";

} // namespace

using Aspect = aspect::AspectTest;

TEST_F(Aspect, Fields_ByDefault)
{
    EXPECT_EQ(Fields{}, fields());
    EXPECT_EQ(3u, asked_for());
    EXPECT_EQ(3u, in_force());
}

TEST_F(Aspect, SetAspectRatio_HdmiThenVideoPlanes)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetAspectRatio(0, ASP_4_3));
    EXPECT_TRACE(R"(
        LOG9 "PMX_ID(0), Aspect Ratio(2)\n"
        fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, ASP_4_3, 1) = TRUE
        VDP_GlobalOutputChange()
        LOG9 "VDP_GlobalOutputChange\n"
    )");
    EXPECT_RECORD_CHANGED(before, "u4AspectRatio");
    EXPECT_EQ(2, record("u4AspectRatio"));
    EXPECT_EQ(2, board::state().find("hdmi_av.commands.PMX_CHG_HDMI_VIDEO_ASPECT_RATIO")->as_number());
}

TEST_F(Aspect, SetAspectRatio_EachRatioIsHandedOnWhole)
{
    for (const std::uint32_t ratio : aspect::ratios)
    {
        EXPECT_EQ(1u, PMX_SetAspectRatio(0, ratio));
        EXPECT_TRACE(announced(ratio) + hdmi(ratio) + output_change + change_told);
        EXPECT_EQ((Fields{ .normal = ratio }), fields());
    }
}

TEST_F(Aspect, SetAspectRatio_TheStoredRatioAgain_IsSignalledAgain)
{
    for (int i = 0; i < 2; ++i)
    {
        EXPECT_EQ(1u, PMX_SetAspectRatio(0, 3));
        EXPECT_TRACE(announced(3) + hdmi(3) + output_change + change_told);
    }
}

TEST_F(Aspect, SetAspectRatio_HdmiRefuses_StoredButTheVideoPlanesAreNotTold)
{
    hdmi_answers(FALSE);
    EXPECT_EQ(0u, PMX_SetAspectRatio(0, ASP_4_3_LB));
    EXPECT_TRACE(R"(
        LOG9 "PMX_ID(0), Aspect Ratio(5)\n"
        fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, ASP_4_3_LB, 1) = FALSE
    )");
    EXPECT_EQ((Fields{ .normal = 5 }), fields());
    EXPECT_EQ(5u, in_force());
}

TEST_F(Aspect, SetAspectRatio_AnyAnswerButFalse_IsNoRefusal)
{
    for (const int answer : { 1, 2, 255 })
    {
        hdmi_answers(answer);
        EXPECT_EQ(1u, PMX_SetAspectRatio(0, 2));
        EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 2, 0));
        EXPECT_CALLS(R"(
            fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, 2, 1)
            VDP_GlobalOutputChange()
            fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, 2, 1)
            VDP_GlobalOutputChange()
        )");
    }
}

TEST_F(Aspect, SetAspectRatio_IsStoredBeforeHdmiIsAsked)
{
    std::int64_t stored = -1;
    at_call("fgPmxDrvSetAvd", [&] { stored = record("u4AspectRatio"); });
    EXPECT_EQ(1u, PMX_SetAspectRatio(0, 8));
    EXPECT_EQ(8, stored);
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 6, 0));
    EXPECT_EQ(6, stored);
}

TEST_F(Aspect, SetAspectRatio_VideoPlanesThatAskBack_ReadTheNewRatio)
{
    std::uint32_t read = 99;
    at_call("VDP_GlobalOutputChange", [&] { read = in_force(); });
    EXPECT_EQ(1u, PMX_SetAspectRatio(0, 4));
    EXPECT_EQ(4u, read);
}

TEST_F(Aspect, SetAspectRatio_ARatioThatWaits_GoesOnWaiting)
{
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 5, 1));
    EXPECT_EQ(1u, PMX_SetAspectRatio(0, 2));
    EXPECT_EQ((Fields{ .normal = 2, .waits = true, .next = 5 }), fields());
    EXPECT_EQ(5u, asked_for());
}

TEST_F(Aspect, SetAspectRatio_DigestViewShown_ItsRatioStaysInForce)
{
    set_fields({ .digest_shown = true, .digest = 9 });
    EXPECT_EQ(1u, PMX_SetAspectRatio(0, 2));
    EXPECT_TRACE(announced(2) + hdmi(2) + output_change + change_told);
    EXPECT_EQ((Fields{ .normal = 2, .digest_shown = true, .digest = 9 }), fields());
    EXPECT_EQ(9u, in_force());
}

TEST_F(Aspect, SetAspectRatioEx_Now_HdmiThenVideoPlanes)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, ASP_4_3, 0));
    EXPECT_TRACE(R"(
        LOG9 "[EX] PMX_ID(0), Aspect Ratio(2), Apply On Next(0)\n"
        fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, ASP_4_3, 1) = TRUE
        VDP_GlobalOutputChange()
        LOG9 "[EX] VDP_GlobalOutputChange\n"
    )");
    EXPECT_RECORD_CHANGED(before, "u4AspectRatio", "u4AspNext");
    EXPECT_EQ((Fields{ .normal = 2, .next = 0 }), fields());
}

TEST_F(Aspect, SetAspectRatioEx_Now_EachRatioIsHandedOnWhole)
{
    for (const std::uint32_t ratio : aspect::ratios)
    {
        EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, ratio, 0));
        EXPECT_TRACE(announced_ex(ratio, 0) + hdmi(ratio) + output_change + told_ex);
        EXPECT_EQ((Fields{ .normal = ratio, .next = 0 }), fields());
    }
}

TEST_F(Aspect, SetAspectRatioEx_Now_DropsARatioThatWaits)
{
    set_fields({ .normal = 3, .waits = true, .next = 5, .digest_shown = true, .digest = 9 });
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 2, 0));
    EXPECT_TRACE(announced_ex(2, 0) + hdmi(2) + output_change + told_ex);
    EXPECT_EQ((Fields{ .normal = 2, .next = 0, .digest_shown = true, .digest = 9 }), fields());
    EXPECT_EQ(2u, asked_for());
    EXPECT_EQ(2u, PMX_SetAspectRatioNext(0));
    EXPECT_NO_TRACE();
}

TEST_F(Aspect, SetAspectRatioEx_Now_HdmiRefuses_StoredAndTheWaitingRatioIsGone)
{
    set_fields({ .normal = 3, .waits = true, .next = 5 });
    hdmi_answers(FALSE);
    EXPECT_EQ(0u, PMX_SetAspectRatioEx(0, 2, 0));
    EXPECT_TRACE(announced_ex(2, 0) + hdmi(2, "FALSE"));
    EXPECT_EQ((Fields{ .normal = 2, .next = 0 }), fields());
}

TEST_F(Aspect, SetAspectRatioAndEx_OtherMixerId_RefusedWithoutALine)
{
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        EXPECT_EQ(0u, PMX_SetAspectRatio(static_cast<UCHAR>(id), 5)) << id;
        EXPECT_EQ(0u, PMX_SetAspectRatioEx(static_cast<UCHAR>(id), 5, 0)) << id;
        EXPECT_EQ(0u, PMX_SetAspectRatioEx(static_cast<UCHAR>(id), 5, 1)) << id;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Aspect, Reset_ReturnsAllFiveFieldsToTheirDefaults)
{
    set_fields({ .normal = 2, .waits = true, .next = 5, .digest_shown = true, .digest = 9 });
    PMX_Reset(0);
    EXPECT_EQ(Fields{}, fields());
}
