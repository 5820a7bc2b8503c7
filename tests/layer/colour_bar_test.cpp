// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The colour bar, and what it does to planes 1 and 2 while they are swapped. */
#include "tests/support/layer_fixture.h"

class ColourBar : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }

    /** What is read back, which takes no platform call. */
    static unsigned bar()
    {
        UCHAR value = 0xAA;
        EXPECT_EQ(1u, PMX_GetCBEnable(0, &value));
        EXPECT_NO_TRACE();
        return value;
    }

    static bool shown() { return board::state().find("mixer.colour_bar.enabled")->as_number() != 0; }

    static bool swapped() { return board::state().find("mixer.swaps.plane_1_2")->as_number() != 0; }

    static void set_bar(UCHAR value)
    {
        EXPECT_EQ(1u, PMX_SetCBEnable(0, value));
        board::trace::clear();
    }

    /** How the bar is shown in RES_1080P60HZ. */
    static constexpr const char* shows = R"(
        LOG8 "ColorBar Enable\n"
        PMX_HalSetActiveZone(0, RES_1080P60HZ)
        PMX_HalSetCBWidth(0, 30)
        PMX_HalEnableCB(0)
    )";
    static constexpr const char* hides = R"(
        LOG8 "ColorBar Disable\n"
        PMX_HalDisableCB(0)
    )";
    static constexpr const char* suspends = R"(
        LOG8 "Temporarily Turn Off Plane Swap 1_2\n"
        PMX_HalSwapPlane1_2(0, 0)
    )";
    static constexpr const char* resumes = R"(
        LOG8 "Resume Plane Swap 1_2\n"
        PMX_HalSwapPlane1_2(0, 1)
    )";
};

TEST_F(ColourBar, SetCBEnable_OnAndOff)
{
    const RecordSnapshot before;
    EXPECT_EQ(0u, bar());
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
    EXPECT_TRACE(R"(
        LOG8 "ColorBar Enable\n"
        PMX_HalSetActiveZone(0, 12)
        PMX_HalSetCBWidth(0, 30)
        PMX_HalEnableCB(0)
    )");
    EXPECT_RECORD_CHANGED(before, "ucCBEnable");
    EXPECT_EQ(1u, bar());
    EXPECT_TRUE(shown());
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_TRACE(R"(
        LOG8 "ColorBar Disable\n"
        PMX_HalDisableCB(0)
    )");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(0u, bar());
    EXPECT_FALSE(shown());
}

TEST_F(ColourBar, SetCBEnable_FirstVideoOnTop_SuspendsAndResumesTheSwap)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
    EXPECT_TRACE(R"(
        LOG8 "ColorBar Enable\n"
        PMX_HalSetActiveZone(0, 12)
        PMX_HalSetCBWidth(0, 30)
        PMX_HalEnableCB(0)
        LOG8 "Temporarily Turn Off Plane Swap 1_2\n"
        PMX_HalSwapPlane1_2(0, 0)
    )");
    EXPECT_RECORD_CHANGED(before, "ucCBEnable");
    EXPECT_EQ(1, record("bComp0OnTop"));
    EXPECT_FALSE(swapped());
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_TRACE(R"(
        LOG8 "ColorBar Disable\n"
        PMX_HalDisableCB(0)
        LOG8 "Resume Plane Swap 1_2\n"
        PMX_HalSwapPlane1_2(0, 1)
    )");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_TRUE(swapped());
}

TEST_F(ColourBar, SetCBEnable_OnTopOtherThanOne_LeavesTheSwapAlone)
{
    for (const UINT32 on_top : { 0u, 2u, 0x101u, 0x80000001u, 0xFFFFFFFFu })
    {
        EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, on_top));
        board::trace::clear();
        EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
        EXPECT_TRACE(shows);
        EXPECT_EQ(on_top != 0, swapped());
        EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
        EXPECT_TRACE(hides);
        EXPECT_EQ(on_top != 0, swapped());
    }
}

TEST_F(ColourBar, SetCBEnable_EveryMode_TakesItsWidth)
{
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        SCOPED_TRACE("mode " + std::to_string(mode));
        unsigned width = 30;
        if (mode == RES_480I || mode == RES_576I || mode == RES_480P || mode == RES_576P)
            width = 22;
        if (mode == RES_720P60HZ || mode == RES_720P50HZ)
            width = 20;
        set_record("ucMode", mode);
        EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
        EXPECT_TRACE("LOG8 \"ColorBar Enable\\n\"\n"
                     "PMX_HalSetActiveZone(0, " +
                     std::to_string(mode) + ")\nPMX_HalSetCBWidth(0, " + std::to_string(width) +
                     ")\nPMX_HalEnableCB(0)");
        EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
        EXPECT_TRACE(hides);
    }
}

TEST_F(ColourBar, SetCBEnable_WidthsByName)
{
    const std::pair<unsigned, int> widths[] = {
        { RES_720P50HZ, 20 }, { RES_576P, 22 }, { RES_1080P24HZ, 30 }, { RES_480P_1440, 30 }
    };
    for (const auto& [mode, width] : widths)
    {
        set_record("ucMode", mode);
        set_bar(1);
        EXPECT_EQ(width, board::state().find("mixer.colour_bar.width")->as_number());
        EXPECT_EQ(mode, board::state().find("mixer.active_zone")->as_number());
        set_bar(0);
    }
}

TEST_F(ColourBar, SetCBEnable_TheStoredValue_DoesNothing)
{
    for (const UCHAR value : { 0, 1, 2, 255, 0 })
    {
        set_bar(value);
        const RecordSnapshot before;
        EXPECT_EQ(1u, PMX_SetCBEnable(0, value));
        EXPECT_NO_TRACE();
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(ColourBar, SetCBEnable_AnotherValueButZero_SwitchesOnAgain)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    board::trace::clear();
    for (const UCHAR value : { 2, 1, 2, 255 })
    {
        EXPECT_EQ(1u, PMX_SetCBEnable(0, value));
        EXPECT_TRACE(std::string(shows) + suspends);
        EXPECT_EQ(value, bar());
    }
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_TRACE(std::string(hides) + resumes);
}

TEST_F(ColourBar, SetCBEnable_StoresBehindTheLastCall)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    at_call("PMX_HalSwapPlane1_2", [] { EXPECT_EQ(0, record("ucCBEnable")); });
    set_bar(2);
    at_call("PMX_HalSwapPlane1_2", [] { EXPECT_EQ(2, record("ucCBEnable")); });
    set_bar(0);
    EXPECT_EQ(0, record("ucCBEnable"));
}

TEST_F(ColourBar, SetOrderVdpComp0_WhileTheBarIsShown_IsWhatTheBarComesBackTo)
{
    set_bar(1);
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    EXPECT_TRUE(swapped());
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_TRACE(std::string(hides) + resumes);

    set_bar(1);
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 0));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_TRACE(hides);
    EXPECT_FALSE(swapped());
}

TEST_F(ColourBar, SetSwapEnable_PlanesOneAndTwo_IsNotSuspended)
{
    EXPECT_EQ(1u, PMX_SetSwapEnable(0, 1, 1));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
    EXPECT_TRACE(shows);
    EXPECT_TRUE(swapped());
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_TRACE(hides);
    EXPECT_TRUE(swapped());
}

TEST_F(ColourBar, SetCBEnable_Off_ResumesTheSwapThatAnotherHasUndone)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    EXPECT_EQ(1u, PMX_SetSwapEnable(0, 0, 1));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
    EXPECT_TRACE(std::string(shows) + suspends);
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_TRACE(std::string(hides) + resumes);
    EXPECT_TRUE(swapped());
}

TEST_F(ColourBar, Reset_WhileTheBarIsShown_ForgetsItAndKeepsTheSwapOff)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    set_bar(1);
    PMX_Reset(0);
    board::trace::clear();
    EXPECT_EQ(0u, bar());
    EXPECT_TRUE(shown());
    EXPECT_FALSE(swapped());
    EXPECT_EQ(1, record("bComp0OnTop"));
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_NO_TRACE();
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
    EXPECT_TRACE(std::string(shows) + suspends);
}

TEST_F(ColourBar, GetCBEnable_AnswersTheStoredValue)
{
    for (const UCHAR value : { 1, 2, 255, 0 })
    {
        set_bar(value);
        const RecordSnapshot before;
        EXPECT_EQ(value, bar());
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(ColourBar, GetCBEnable_NullPointer_IsRefused)
{
    EXPECT_EQ(0u, PMX_GetCBEnable(0, nullptr));
    EXPECT_EQ(0u, PMX_GetCBEnable(1, nullptr));
    EXPECT_NO_TRACE();
}

TEST_F(ColourBar, SetAndGetCBEnable_EveryOtherMixerId_IsRefused)
{
    set_bar(1);
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        const auto mixer = static_cast<UCHAR>(id);
        UCHAR value = 0xAA;
        for (const UCHAR enable : { 0, 1, 2 })
            EXPECT_EQ(0u, PMX_SetCBEnable(mixer, enable)) << id;
        EXPECT_EQ(0u, PMX_GetCBEnable(mixer, &value)) << id;
        EXPECT_EQ(0xAA, value);
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}
