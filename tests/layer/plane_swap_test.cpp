// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Swapping planes in the hardware, and what is handed straight on to it: active zone and delay. */
#include "tests/support/layer_fixture.h"

class PlaneSwap : public LayerTest
{
protected:
    struct Pair
    {
        UCHAR mode;
        std::string planes;
    };

    static const std::vector<Pair>& pairs()
    {
        static const std::vector<Pair> all{ { 1, "1_2" }, { 2, "3_4" }, { 3, "6_7" },
                                            { 4, "4_7" }, { 5, "1_3" }, { 6, "5_8" } };
        return all;
    }

    /** The planes that a mode swaps, as names have them; empty for none. */
    static std::string planes_of(unsigned mode)
    {
        for (const Pair& pair : pairs())
        {
            if (pair.mode == mode)
                return pair.planes;
        }
        return {};
    }

    static bool swapped(const std::string& planes)
    {
        return board::state().find("mixer.swaps.plane_" + planes)->as_number() != 0;
    }

    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }
};

TEST_F(PlaneSwap, SetSwapEnable_EachMode_SwapsItsPlanesAndSaysSo)
{
    const RecordSnapshot before;
    for (unsigned mode = 1; mode <= 6; ++mode)
        EXPECT_EQ(1u, PMX_SetSwapEnable(0, 1, static_cast<UCHAR>(mode)));
    EXPECT_TRACE(R"(
        LOG8 "Plane 1_2 Swap\n"
        PMX_HalSwapPlane1_2(0, 1)
        LOG8 "Plane 3_4 Swap\n"
        PMX_HalSwapPlane3_4(0, 1)
        LOG8 "Plane 6_7 Swap\n"
        PMX_HalSwapPlane6_7(0, 1)
        LOG8 "Plane 4_7 Swap\n"
        PMX_HalSwapPlane4_7(0, 1)
        LOG8 "Plane 1_3 Swap\n"
        PMX_HalSwapPlane1_3(0, 1)
        LOG8 "Plane 5_8 Swap\n"
        PMX_HalSwapPlane5_8(0, 1)
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneSwap, SetSwapEnable_Off_SaysTheSame)
{
    for (const Pair& pair : pairs())
        EXPECT_EQ(1u, PMX_SetSwapEnable(0, 1, pair.mode));
    board::trace::clear();
    const RecordSnapshot before;
    for (const Pair& pair : pairs())
    {
        EXPECT_TRUE(swapped(pair.planes));
        EXPECT_EQ(1u, PMX_SetSwapEnable(0, 0, pair.mode));
        EXPECT_TRACE("LOG8 \"Plane " + pair.planes + " Swap\\n\"\n" + "PMX_HalSwapPlane" + pair.planes + "(0, 0)");
        EXPECT_FALSE(swapped(pair.planes));
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneSwap, SetSwapEnable_EveryModeAndValue_OneForAnyValueButZero)
{
    const RecordSnapshot before;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        for (const UCHAR enable : { 0, 1, 2, 255 })
        {
            SCOPED_TRACE("mode " + std::to_string(mode) + ", enable " + std::to_string(enable));
            EXPECT_EQ(1u, PMX_SetSwapEnable(0, enable, static_cast<UCHAR>(mode)));
            const std::string planes = planes_of(mode);
            if (planes.empty())
                EXPECT_NO_TRACE();
            else
                EXPECT_TRACE("LOG8 \"Plane " + planes + " Swap\\n\"\n" + "PMX_HalSwapPlane" + planes + "(0, " +
                             (enable != 0 ? "1" : "0") + ")");
        }
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneSwap, SetSwapEnable_ModesOutsideTheTable_DoNothing)
{
    EXPECT_EQ(1u, PMX_SetSwapEnable(0, 1, 7));
    EXPECT_EQ(1u, PMX_SetSwapEnable(0, 0, 0));
    EXPECT_NO_TRACE();
}

TEST_F(PlaneSwap, SetSwapEnable_PlanesOneAndTwo_DoNotCountAsFirstOnTop)
{
    for (const std::int64_t on_top : { 0, 1, 2, -1 })
    {
        set_record("bComp0OnTop", on_top);
        EXPECT_EQ(1u, PMX_SetSwapEnable(0, 1, 1));
        EXPECT_EQ(on_top, record("bComp0OnTop"));
        EXPECT_EQ(1u, PMX_SetSwapEnable(0, 0, 1));
        EXPECT_EQ(on_top, record("bComp0OnTop"));
    }
}

TEST_F(PlaneSwap, GetSwapEnable_EachMode_AsksTheHardware)
{
    for (const Pair& asked : pairs())
    {
        EXPECT_EQ(1u, PMX_SetSwapEnable(0, 1, asked.mode));
        board::trace::clear();
        const RecordSnapshot before;
        for (const Pair& pair : pairs())
        {
            const bool on = pair.mode == asked.mode;
            UCHAR enable = 0xAA;
            EXPECT_EQ(1u, PMX_GetSwapEnable(0, &enable, pair.mode));
            EXPECT_EQ(on ? 1 : 0, enable) << pair.planes;
            EXPECT_TRACE("fgPmxHalSwapPlane" + pair.planes + "(0) = " + (on ? "TRUE" : "FALSE"));
        }
        EXPECT_RECORD_UNCHANGED(before);
        EXPECT_EQ(1u, PMX_SetSwapEnable(0, 0, asked.mode));
    }
}

TEST_F(PlaneSwap, GetSwapEnable_AnswersWhatTheHardwareSays)
{
    for (const Pair& pair : pairs())
    {
        for (const int answer : { 0, 1, 2, 255 })
        {
            board::faults::set({ "fgPmxHalSwapPlane" + pair.planes, answer, board::Fault::When::On });
            UCHAR enable = 0xAA;
            EXPECT_EQ(1u, PMX_GetSwapEnable(0, &enable, pair.mode));
            EXPECT_EQ(answer, enable) << pair.planes;
        }
    }
}

TEST_F(PlaneSwap, GetSwapEnable_ModesOutsideTheTable_WriteNothing)
{
    UCHAR enable = 0xAA;
    EXPECT_EQ(1u, PMX_GetSwapEnable(0, &enable, 9));
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        if (!planes_of(mode).empty())
            continue;
        EXPECT_EQ(1u, PMX_GetSwapEnable(0, &enable, static_cast<UCHAR>(mode)));
        EXPECT_EQ(1u, PMX_GetSwapEnable(0, nullptr, static_cast<UCHAR>(mode)));
    }
    EXPECT_EQ(0xAA, enable);
    EXPECT_NO_TRACE();
}

TEST_F(PlaneSwap, SetAndGetSwapEnable_EveryOtherMixerId_IsRefused)
{
    const RecordSnapshot before;
    for (unsigned mixer = 1; mixer < 256; ++mixer)
    {
        for (UCHAR mode = 0; mode < 8; ++mode)
        {
            UCHAR enable = 0xAA;
            EXPECT_EQ(0u, PMX_SetSwapEnable(static_cast<UCHAR>(mixer), 1, mode)) << mixer;
            EXPECT_EQ(0u, PMX_GetSwapEnable(static_cast<UCHAR>(mixer), &enable, mode)) << mixer;
            EXPECT_EQ(0u, PMX_GetSwapEnable(static_cast<UCHAR>(mixer), nullptr, mode)) << mixer;
            EXPECT_EQ(0xAA, enable);
        }
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneSwap, Reset_LeavesTheSwapsInTheHardware)
{
    for (const Pair& pair : pairs())
        EXPECT_EQ(1u, PMX_SetSwapEnable(0, 1, pair.mode));
    PMX_Reset(0);
    for (const Pair& pair : pairs())
    {
        UCHAR enable = 0xAA;
        EXPECT_EQ(1u, PMX_GetSwapEnable(0, &enable, pair.mode));
        EXPECT_EQ(1, enable) << pair.planes;
    }
}

TEST_F(PlaneSwap, SetActiveZone_HandsEverythingOn)
{
    const RecordSnapshot before;
    for (const unsigned mixer : { 0u, 1u, 7u, 255u })
    {
        for (unsigned mode = 0; mode < 256; ++mode)
        {
            EXPECT_EQ(1u, PMX_SetActiveZone(static_cast<UCHAR>(mixer), static_cast<UCHAR>(mode)));
            EXPECT_TRACE("PMX_HalSetActiveZone(" + std::to_string(mixer) + ", " + std::to_string(mode) + ")");
        }
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneSwap, SetDelay_HandsEverythingOn)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetDelay(1, 2, 3, 4));
    EXPECT_EQ(1u, PMX_SetDelay(0, 0, 0, 0));
    EXPECT_EQ(1u, PMX_SetDelay(255, 254, 65535, 65534));
    EXPECT_TRACE(R"(
        PMX_HalSetDelay(1, 2, 3, 4)
        PMX_HalSetDelay(0, 0, 0, 0)
        PMX_HalSetDelay(255, 254, 65535, 65534)
    )");
    EXPECT_RECORD_UNCHANGED(before);
}
