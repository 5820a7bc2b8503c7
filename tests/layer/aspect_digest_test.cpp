// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The digest view's aspect ratio. */
#include <set>

#include "drv_if.h"
#include "tests/layer/aspect.h"

using aspect::Fields;
using aspect::signed_number;

namespace
{

std::string announced(std::uint32_t ratio, unsigned digest)
{
    return "LOG0 \"[EX] PMX_ID(0), Digest Aspect Ratio(" + signed_number(ratio) + "), Digest mode enable(" +
           std::to_string(digest) + ")\\n\"\n";
}

/** Leaving the digest view with a ratio: 4:3 for three of them, 16:9 for everything else. */
std::string left(std::uint32_t ratio)
{
    static const std::set<std::uint32_t> narrow{ ASP_4_3, ASP_4_3_LB, ASP_4_3_FULL };
    const std::string lines = announced(ratio, 0) + aspect::output_change;
    if (narrow.contains(ratio))
        return lines + "TVE_SetAspectRatio(ASPECT_RATIO_4_3)\n"
                       "LOG0 \"[EX] TveAsp = 0 Hdmi(par = 1,afd = 8)\\n\"\n";
    return lines + "TVE_SetAspectRatio(ASPECT_RATIO_16_9_FULL_FORMAT)\n"
                   "LOG0 \"[EX] TveAsp = 1 Hdmi(par = 2,afd = 8)\\n\"\n";
}

} // namespace

using Digest = aspect::AspectTest;

TEST_F(Digest, SetDigestAspectRatioEx_Entering_TellsTheVideoPlanesAlone)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, ASP_4_3, 1));
    EXPECT_TRACE(R"(
        LOG0 "[EX] PMX_ID(0), Digest Aspect Ratio(2), Digest mode enable(1)\n"
        VDP_GlobalOutputChange()
    )");
    EXPECT_RECORD_CHANGED(before, "fgDigestEnable", "u4DigestAsp");
    EXPECT_EQ((Fields{ .digest_shown = true, .digest = 2 }), fields());
}

TEST_F(Digest, SetDigestAspectRatioEx_Leaving_SignalsOnTheAnalogueOutputsAndOnlyLogsHdmi)
{
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, ASP_4_3, 1));
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, ASP_4_3_FULL, 0));
    EXPECT_TRACE(R"(
        LOG0 "[EX] PMX_ID(0), Digest Aspect Ratio(9), Digest mode enable(0)\n"
        VDP_GlobalOutputChange()
        TVE_SetAspectRatio(ASPECT_RATIO_4_3)
        LOG0 "[EX] TveAsp = 0 Hdmi(par = 1,afd = 8)\n"
    )");
    EXPECT_RECORD_CHANGED(before, "fgDigestEnable", "u4DigestAsp");
    EXPECT_EQ((Fields{ .digest_shown = false, .digest = 9 }), fields());
    EXPECT_EQ(ASPECT_RATIO_4_3, board::state().find("tv_encoder.aspect")->as_number());
}

TEST_F(Digest, SetDigestAspectRatioEx_LeavingWith0Or10_16_9)
{
    for (const std::uint32_t ratio : { 0u, 10u })
    {
        EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, ratio, 0));
        EXPECT_CALLS(R"(
            VDP_GlobalOutputChange()
            TVE_SetAspectRatio(ASPECT_RATIO_16_9_FULL_FORMAT)
        )");
    }
}

TEST_F(Digest, SetDigestAspectRatioEx_LeavingWithTheLowBitsOfANarrowOne_16_9)
{
    for (const std::uint32_t above : { 0x100u, 0x10000u, 0x80000000u })
    {
        for (const std::uint32_t ratio : { above + ASP_4_3, above + ASP_4_3_LB, above + ASP_4_3_FULL })
        {
            EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, ratio, 0));
            EXPECT_TRACE(left(ratio));
        }
    }
}

TEST_F(Digest, SetDigestAspectRatioEx_EachRatioInAndOut)
{
    for (const std::uint32_t ratio : aspect::ratios)
    {
        EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, ratio, 1));
        EXPECT_TRACE(announced(ratio, 1) + aspect::output_change);
        EXPECT_EQ((Fields{ .digest_shown = true, .digest = ratio }), fields());
        EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, ratio, 0));
        EXPECT_TRACE(left(ratio));
        EXPECT_EQ((Fields{ .digest_shown = false, .digest = ratio }), fields());
    }
}

TEST_F(Digest, SetDigestAspectRatioEx_AnyValueButZero_EntersAndIsStoredAsOne)
{
    for (unsigned digest = 1; digest < 256; ++digest)
    {
        set_fields({});
        EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 4, static_cast<BOOL>(digest)));
        EXPECT_TRACE(announced(4, digest) + aspect::output_change);
        EXPECT_EQ((Fields{ .digest_shown = true, .digest = 4 }), fields());
    }
}

TEST_F(Digest, SetDigestAspectRatioEx_EnteringOrLeavingAgain_DoesTheSameAgain)
{
    for (int i = 0; i < 2; ++i)
    {
        EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, 1));
        EXPECT_TRACE(announced(2, 1) + aspect::output_change);
    }
    for (int i = 0; i < 2; ++i)
    {
        EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, 0));
        EXPECT_TRACE(left(2));
    }
}

TEST_F(Digest, SetDigestAspectRatioEx_NormalAndWaitingRatiosStay)
{
    for (const BOOL digest : { 1, 0 })
    {
        set_fields({ .normal = 6, .waits = true, .next = 5 });
        EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, digest));
        EXPECT_EQ((Fields{ .normal = 6, .waits = true, .next = 5, .digest_shown = digest != 0, .digest = 2 }),
                  fields());
    }
}

TEST_F(Digest, SetDigestAspectRatioEx_VideoPlanesThatAskBack_ReadTheRatioThatHoldsThen)
{
    std::uint32_t read = 99;
    at_call("VDP_GlobalOutputChange", [&] { read = in_force(); });
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, 1));
    EXPECT_EQ(2u, read);
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 9, 0));
    EXPECT_EQ(3u, read);
    EXPECT_EQ(9, record("u4DigestAsp"));
}

TEST_F(Digest, SetDigestAspectRatioEx_HdmiThatRefuses_IsNotAskedInTheFirstPlace)
{
    hdmi_answers(FALSE);
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, 1));
    EXPECT_TRACE(announced(2, 1) + aspect::output_change);
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, 0));
    EXPECT_TRACE(left(2));
}

TEST_F(Digest, SetDigestAspectRatioEx_OtherMixerId_RefusedWithoutALine)
{
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        EXPECT_EQ(0u, PMX_SetDigestAspectRatioEx(static_cast<UCHAR>(id), 2, 1)) << id;
        EXPECT_EQ(0u, PMX_SetDigestAspectRatioEx(static_cast<UCHAR>(id), 2, 0)) << id;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Digest, GetAspectRatio_DigestRatio2_IsInForceAndTheNormalOneIsKept)
{
    EXPECT_EQ(1u, PMX_SetAspectRatio(0, 6));
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, 1));
    board::trace::clear();
    UINT32 in_force = 99;
    UINT32 normal = 99;
    UINT32 digest = 99;
    EXPECT_EQ(1u, PMX_GetAspectRatio(0, &in_force));
    EXPECT_EQ(1u, PMX_GetNormalAspectRatio(0, &normal));
    EXPECT_EQ(1u, PMX_GetDigestAspectRatio(0, &digest));
    EXPECT_EQ(2u, in_force);
    EXPECT_EQ(6u, normal);
    EXPECT_EQ(2u, digest);
    EXPECT_EQ(6u, asked_for());
    EXPECT_EQ(TRUE, PMX_IsUnderDigestMode(0));
    EXPECT_NO_TRACE();
}

TEST_F(Digest, GetNormalAndGetDigestAspectRatio_EachReadsItsOwnFieldWhateverTheView)
{
    for (const bool shown : { false, true })
    {
        for (const std::uint32_t ratio : aspect::ratios)
        {
            set_fields({ .normal = ratio, .waits = true, .next = 55, .digest_shown = shown, .digest = 66 });
            UINT32 read = 99;
            EXPECT_EQ(1u, PMX_GetNormalAspectRatio(0, &read));
            EXPECT_EQ(ratio, read);
            set_fields({ .normal = 44, .waits = true, .next = 55, .digest_shown = shown, .digest = ratio });
            const RecordSnapshot before;
            EXPECT_EQ(1u, PMX_GetDigestAspectRatio(0, &read));
            EXPECT_EQ(ratio, read);
            EXPECT_RECORD_UNCHANGED(before);
        }
    }
    EXPECT_NO_TRACE();
}

TEST_F(Digest, GetNormalAndGetDigestAspectRatio_OtherMixerIdOrNullPointer_Refused)
{
    for (const auto get : { PMX_GetNormalAspectRatio, PMX_GetDigestAspectRatio })
    {
        UINT32 ratio = 99;
        for (unsigned id = 1; id < 256; ++id)
            EXPECT_EQ(0u, get(static_cast<UCHAR>(id), &ratio)) << id;
        EXPECT_EQ(0u, get(0, nullptr));
        EXPECT_EQ(0u, get(1, nullptr));
        EXPECT_EQ(99u, ratio);
    }
    EXPECT_NO_TRACE();
}

TEST_F(Digest, IsUnderDigestMode_TheFlagForMixer0_FalseForAnyOther)
{
    EXPECT_EQ(FALSE, PMX_IsUnderDigestMode(0));
    set_record("fgDigestEnable", 1);
    const RecordSnapshot before;
    EXPECT_EQ(TRUE, PMX_IsUnderDigestMode(0));
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(FALSE, PMX_IsUnderDigestMode(static_cast<UCHAR>(id))) << id;
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_NO_TRACE();
}

TEST_F(Digest, i4PmxGetAspectRatio_ThroughTheRegisteredTable_FollowsTheView)
{
    void* table = nullptr;
    void* tag = nullptr;
    ASSERT_LE(0, i4ImQueryInterface(66, 0, IID_IPMX, &table, &tag));
    const auto read = [&] {
        UINT32 ratio = 99;
        EXPECT_EQ(1, static_cast<const IPMX*>(table)->pi4GetAspectRatio(tag, &ratio));
        return ratio;
    };
    EXPECT_EQ(3u, read());
    EXPECT_EQ(1u, PMX_SetAspectRatio(0, 6));
    EXPECT_EQ(6u, read());
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 5, 1));
    EXPECT_EQ(6u, read());
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, 1));
    EXPECT_EQ(2u, read());
    EXPECT_EQ(5u, PMX_SetAspectRatioNext(0));
    EXPECT_EQ(2u, read());
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 4, 0));
    EXPECT_EQ(5u, read());
    EXPECT_LE(0, i4ImReleaseInterface(66, 0, IID_IPMX, tag));
}
