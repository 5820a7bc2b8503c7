// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Aspect ratios while their two flags hold neither 0 nor 1, and an HDMI driver that answers neither. */
#include "tests/layer/aspect.h"

using aspect::hdmi;
using aspect::output_change;

namespace
{

constexpr int odd_numbers[] = { 2, 128, 254, 255 };

} // namespace

class OddAspectFlags : public aspect::AspectTest
{
protected:
    static void waits(int number, UINT32 ratio)
    {
        set_record("fgAspNext", number);
        set_record("u4AspNext", ratio);
        set_record("u4AspectRatio", 77);
    }

    static void digest(int number, UINT32 ratio)
    {
        set_record("fgDigestEnable", number);
        set_record("u4DigestAsp", ratio);
        set_record("u4AspectRatio", 77);
    }
};

TEST_F(OddAspectFlags, SetAspectRatioNext_AnyNonZeroNumber_Waits_AndBecomesZero)
{
    for (const int number : odd_numbers)
    {
        waits(number, 5);
        EXPECT_EQ(5u, PMX_SetAspectRatioNext(0));
        EXPECT_TRACE(hdmi(5) + output_change);
        EXPECT_EQ(0, record("fgAspNext"));
        EXPECT_EQ(5, record("u4AspectRatio"));
    }
}

TEST_F(OddAspectFlags, SetAspectRatioNext_AnyOtherAnswerThanFalse_IsApplied)
{
    for (const int answer : { 1, 2, 128, 255 })
    {
        waits(1, 9);
        hdmi_answers(answer);
        EXPECT_EQ(9u, PMX_SetAspectRatioNext(0));
        EXPECT_TRACE(hdmi(9, std::to_string(answer).c_str()) + output_change);
    }
}

TEST_F(OddAspectFlags, SetAspectRatioEx_FlagOfAWaitingRatio_BecomesOneOrZero)
{
    for (const int number : odd_numbers)
    {
        waits(number, 5);
        EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 2, static_cast<BOOL>(number)));
        EXPECT_EQ(1, record("fgAspNext"));
        waits(number, 5);
        EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 2, 0));
        EXPECT_EQ(0, record("fgAspNext"));
        EXPECT_EQ(0, record("u4AspNext"));
    }
}

TEST_F(OddAspectFlags, GetAspectRatioMW_AnyNonZeroNumber_Waits)
{
    for (const int number : odd_numbers)
    {
        waits(number, 5);
        const RecordSnapshot before;
        EXPECT_EQ(5u, asked_for());
        EXPECT_EQ(77u, in_force());
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(OddAspectFlags, DigestView_AnyNonZeroNumber_IsShown_AndToldAsItIs)
{
    for (const int number : odd_numbers)
    {
        digest(number, 9);
        const RecordSnapshot before;
        EXPECT_EQ(9u, in_force());
        EXPECT_EQ(77u, asked_for());
        EXPECT_EQ(number, PMX_IsUnderDigestMode(0));
        EXPECT_EQ(0, PMX_IsUnderDigestMode(1));
        EXPECT_EQ(0, PMX_IsUnderDigestMode(255));
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(OddAspectFlags, SetDigestAspectRatioEx_TheFlagBecomesOneOrZero)
{
    for (const int number : odd_numbers)
    {
        digest(number, 9);
        EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, static_cast<BOOL>(number)));
        EXPECT_EQ(1, record("fgDigestEnable"));
        digest(number, 9);
        EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 2, 0));
        EXPECT_EQ(0, record("fgDigestEnable"));
        EXPECT_EQ(2, record("u4DigestAsp"));
    }
}
