// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The output mute, and the colour bar that it hides. */
#include "tests/support/layer_fixture.h"

class Mute : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }

    /** What is read back, which takes no platform call. */
    static unsigned muted()
    {
        UCHAR value = 0xAA;
        EXPECT_EQ(1u, PMX_GetMuteEnable(0, &value));
        EXPECT_NO_TRACE();
        return value;
    }

    static bool silent() { return board::state().find("mixer.muted")->as_number() != 0; }

    static bool bar_shown() { return board::state().find("mixer.colour_bar.enabled")->as_number() != 0; }

    static void set_bar(UCHAR value)
    {
        EXPECT_EQ(1u, PMX_SetCBEnable(0, value));
        board::trace::clear();
    }
    static void set_mute(UCHAR value)
    {
        EXPECT_EQ(1u, PMX_SetMuteEnable(0, value));
        board::trace::clear();
    }

    static constexpr const char* mutes = R"(
        LOG8 "Mute Enable\n"
        PMX_HalEnableMute(0)
    )";
    static constexpr const char* unmutes = R"(
        LOG8 "Mute Disable\n"
        PMX_HalDisableMute(0)
    )";
    static constexpr const char* mutes_and_hides = R"(
        LOG8 "Mute Enable\n"
        PMX_HalEnableMute(0)
        LOG8 "Mute Disable ColorBar\n"
        PMX_HalDisableCB(0)
    )";
    static constexpr const char* shows_and_unmutes = R"(
        LOG8 "Mute Disable\n"
        LOG8 "Mute Enable ColorBar\n"
        PMX_HalEnableCB(0)
        PMX_HalDisableMute(0)
    )";
    /** How the bar is switched on and off in RES_1080P60HZ. */
    static constexpr const char* bar_on = R"(
        LOG8 "ColorBar Enable\n"
        PMX_HalSetActiveZone(0, RES_1080P60HZ)
        PMX_HalSetCBWidth(0, 30)
        PMX_HalEnableCB(0)
    )";
    static constexpr const char* bar_off = R"(
        LOG8 "ColorBar Disable\n"
        PMX_HalDisableCB(0)
    )";
};

TEST_F(Mute, SetMuteEnable_OnAndOff)
{
    const RecordSnapshot before;
    EXPECT_EQ(0u, muted());
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 1));
    EXPECT_TRACE(mutes);
    EXPECT_RECORD_CHANGED(before, "ucMuteEnable");
    EXPECT_EQ(1u, muted());
    EXPECT_TRUE(silent());
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_TRACE(unmutes);
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(0u, muted());
    EXPECT_FALSE(silent());
}

TEST_F(Mute, SetMuteEnable_BarOn_HidesItAndBringsItBackBeforeTheMuteEnds)
{
    set_bar(1);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 1));
    EXPECT_TRACE(mutes_and_hides);
    EXPECT_RECORD_CHANGED(before, "ucMuteEnable");
    EXPECT_FALSE(bar_shown());
    EXPECT_EQ(1, record("ucCBEnable"));
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_TRACE(shows_and_unmutes);
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_TRUE(bar_shown());
    EXPECT_EQ(1, record("ucCBEnable"));
}

TEST_F(Mute, SetMuteEnable_BarOnWithFirstVideoOnTop_LeavesSwapWidthAndZoneAlone)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    set_bar(1);
    set_record("ucMode", RES_480P);
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 1));
    EXPECT_TRACE(mutes_and_hides);
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_TRACE(shows_and_unmutes);
    EXPECT_EQ(1, record("bComp0OnTop"));
    EXPECT_EQ(0, board::state().find("mixer.swaps.plane_1_2")->as_number());
    EXPECT_EQ(30, board::state().find("mixer.colour_bar.width")->as_number());
}

TEST_F(Mute, SetMuteEnable_BarOnWithAnotherValueThanOne_NeitherHidesNorRestoresIt)
{
    for (const UCHAR value : { 2, 3, 128, 255 })
    {
        set_bar(value);
        EXPECT_EQ(1u, PMX_SetMuteEnable(0, 1));
        EXPECT_TRACE(mutes);
        EXPECT_TRUE(bar_shown());
        EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
        EXPECT_TRACE(unmutes);
        EXPECT_EQ(value, record("ucCBEnable"));
    }
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
    EXPECT_TRACE(bar_on);
}

TEST_F(Mute, SetMuteEnable_BarSwitchedOnUnderTheMute_IsShownAndEnabledAgain)
{
    set_mute(1);
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
    EXPECT_TRACE(bar_on);
    EXPECT_TRUE(bar_shown());
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_TRACE(shows_and_unmutes);
}

TEST_F(Mute, SetMuteEnable_BarSwitchedOffUnderTheMute_StaysOff)
{
    set_bar(1);
    set_mute(1);
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_TRACE(bar_off);
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_TRACE(unmutes);
    EXPECT_FALSE(bar_shown());
}

TEST_F(Mute, SetMuteEnable_BarChangedUnderTheMute_ItsValueAtTheTimeDecides)
{
    set_bar(1);
    set_mute(1);
    set_bar(2);
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_TRACE(unmutes);
    set_mute(1);
    set_bar(1);
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_TRACE(shows_and_unmutes);
}

TEST_F(Mute, SetMuteEnable_TheStoredValue_DoesNothing)
{
    set_bar(1);
    for (const UCHAR value : { 0, 1, 2, 255, 0 })
    {
        set_mute(value);
        const RecordSnapshot before;
        EXPECT_EQ(1u, PMX_SetMuteEnable(0, value));
        EXPECT_NO_TRACE();
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(Mute, SetMuteEnable_AnotherValueButZero_MutesAgain)
{
    set_bar(1);
    for (const UCHAR value : { 2, 1, 2, 255 })
    {
        EXPECT_EQ(1u, PMX_SetMuteEnable(0, value));
        EXPECT_TRACE(mutes_and_hides);
        EXPECT_EQ(value, muted());
    }
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_TRACE(shows_and_unmutes);
}

TEST_F(Mute, SetMuteEnable_StoresBehindTheLastCall)
{
    set_bar(1);
    at_call("PMX_HalDisableCB", [] { EXPECT_EQ(0, record("ucMuteEnable")); });
    set_mute(2);
    EXPECT_EQ(2, record("ucMuteEnable"));
    at_call("PMX_HalDisableMute", [] { EXPECT_EQ(2, record("ucMuteEnable")); });
    set_mute(0);
    EXPECT_EQ(0, record("ucMuteEnable"));
}

/** Every value of bar, mute and first video on top, and every change of bar or mute from there: whatever order of
 *  switching has led to a situation, these are all that there are. */
TEST_F(Mute, SetMuteEnableAndSetCBEnable_EverySituation_SwitchesWhatItMust)
{
    const std::vector<UCHAR> values{ 0, 1, 2, 255 };
    for (const int on_top : { 0, 1, 2, -1 })
    {
        set_record("bComp0OnTop", on_top);
        const std::string suspended = "LOG8 \"Temporarily Turn Off Plane Swap 1_2\\n\"\nPMX_HalSwapPlane1_2(0, 0)";
        const std::string resumed = "LOG8 \"Resume Plane Swap 1_2\\n\"\nPMX_HalSwapPlane1_2(0, 1)";
        for (const UCHAR bar : values)
        {
            for (const UCHAR mute : values)
            {
                for (const UCHAR value : values)
                {
                    SCOPED_TRACE("on top " + std::to_string(on_top) + ", bar " + std::to_string(bar) + ", mute " +
                                 std::to_string(mute) + ", value " + std::to_string(value));
                    set_record("ucCBEnable", bar);
                    set_record("ucMuteEnable", mute);
                    std::string expected;
                    if (value != mute && value != 0)
                        expected = bar == 1 ? mutes_and_hides : mutes;
                    else if (value != mute)
                        expected = bar == 1 ? shows_and_unmutes : unmutes;
                    EXPECT_EQ(1u, PMX_SetMuteEnable(0, value));
                    EXPECT_TRACE(expected);
                    EXPECT_EQ(bar, record("ucCBEnable"));
                    EXPECT_EQ(value, record("ucMuteEnable"));

                    expected.clear();
                    if (value != bar && value != 0)
                        expected = bar_on + (on_top == 1 ? suspended : "");
                    else if (value != bar)
                        expected = bar_off + (on_top == 1 ? resumed : "");
                    EXPECT_EQ(1u, PMX_SetCBEnable(0, value));
                    EXPECT_TRACE(expected);
                    EXPECT_EQ(value, record("ucCBEnable"));
                    EXPECT_EQ(value, record("ucMuteEnable"));
                }
            }
        }
        EXPECT_EQ(on_top, record("bComp0OnTop"));
    }
}

TEST_F(Mute, GetMuteEnable_NullPointer_IsRefused)
{
    EXPECT_EQ(0u, PMX_GetMuteEnable(0, nullptr));
    EXPECT_EQ(0u, PMX_GetMuteEnable(1, nullptr));
    EXPECT_NO_TRACE();
}

TEST_F(Mute, SetAndGetMuteEnable_EveryOtherMixerId_IsRefused)
{
    set_bar(1);
    set_mute(1);
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        const auto mixer = static_cast<UCHAR>(id);
        UCHAR value = 0xAA;
        for (const UCHAR enable : { 0, 1, 2 })
            EXPECT_EQ(0u, PMX_SetMuteEnable(mixer, enable)) << id;
        EXPECT_EQ(0u, PMX_GetMuteEnable(mixer, &value)) << id;
        EXPECT_EQ(0xAA, value);
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Mute, Reset_ForgetsTheMuteThatTheHardwareKeeps)
{
    set_mute(1);
    PMX_Reset(0);
    board::trace::clear();
    EXPECT_EQ(0u, muted());
    EXPECT_TRUE(silent());
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_NO_TRACE();
}
