// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Background colour and the stacking order, position by position. */
#include <array>

#include "pmx_hal.h"
#include "tests/support/layer_fixture.h"

class PlaneOrder : public LayerTest
{
protected:
    using Order = std::array<std::int64_t, 8>;
    using Words = std::array<UINT32, 8>;

    static constexpr Order at_start{ 4, 3, 1, 0, 2, 5, 6, 7 };

    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }

    static Order stored()
    {
        Order order{};
        for (std::size_t i = 0; i < order.size(); ++i)
            order[i] = record("aucPlaneOrder[" + std::to_string(i) + "]");
        return order;
    }

    /** The position of a plane, which takes no platform call; 99 stands for a result that was not written. */
    static unsigned position(unsigned plane)
    {
        UCHAR found = 99;
        EXPECT_EQ(1u, PMX_GetPlaneOrder(0, static_cast<UCHAR>(plane), &found));
        EXPECT_NO_TRACE();
        return found;
    }

    static std::string handed_on(const Order& order)
    {
        std::string line = "PMX_HalPlaneOrder(0, 8, [";
        for (std::size_t i = 0; i < order.size(); ++i)
            line += (i == 0 ? "" : ", ") + std::to_string(order[i]);
        return line + "])";
    }
};

TEST_F(PlaneOrder, SetBg_StoresAndProgramsTheColour)
{
    EXPECT_EQ(0x108080, record("u4BgColor"));
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetBg(0, 0x29F06E));
    EXPECT_TRACE("PMX_HalSetBg(0, 0x29F06E)");
    EXPECT_RECORD_CHANGED(before, "u4BgColor");
    EXPECT_EQ(0x29F06E, record("u4BgColor"));
    EXPECT_EQ(0x29F06E, board::state().find("mixer.background")->as_number());
}

TEST_F(PlaneOrder, SetBg_TheStoredColourAgain_IsProgrammedAgain)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetBg(0, 0x108080));
    EXPECT_TRACE("PMX_HalSetBg(0, 0x108080)");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneOrder, SetBg_AllThirtyTwoBits_AreKeptAndHandedOn)
{
    for (const UINT32 colour : { 0u, 0xFFFFFFFFu, 0x80000000u, 0xAB108080u })
    {
        EXPECT_EQ(1u, PMX_SetBg(0, colour));
        EXPECT_TRACE("PMX_HalSetBg(0, " + std::to_string(colour) + ")");
        EXPECT_EQ(colour, record("u4BgColor"));
    }
}

TEST_F(PlaneOrder, SetBg_StoresBeforeItCallsTheHardware)
{
    at_call("PMX_HalSetBg", [] { EXPECT_EQ(0x123456, record("u4BgColor")); });
    EXPECT_EQ(1u, PMX_SetBg(0, 0x123456));
    EXPECT_TRACE("PMX_HalSetBg(0, 0x123456)");
}

TEST_F(PlaneOrder, SetPlaneOrderArray_StoresAndProgramsEveryPosition)
{
    EXPECT_EQ(at_start, stored());
    const Words words{ 7, 6, 5, 4, 3, 2, 0, 1 };
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetPlaneOrderArray(0, words.data()));
    EXPECT_TRACE("PMX_HalPlaneOrder(0, 8, [7, 6, 5, 4, 3, 2, 0, 1])");
    EXPECT_RECORD_CHANGED(before, "aucPlaneOrder[0]", "aucPlaneOrder[1]", "aucPlaneOrder[2]", "aucPlaneOrder[3]",
                          "aucPlaneOrder[4]", "aucPlaneOrder[5]", "aucPlaneOrder[6]", "aucPlaneOrder[7]");
    EXPECT_EQ((Order{ 7, 6, 5, 4, 3, 2, 0, 1 }), stored());
    EXPECT_EQ("{number=8, order=[7, 6, 5, 4, 3, 2, 0, 1]}", board::state().find("mixer.stacking")->to_text());
}

TEST_F(PlaneOrder, SetPlaneOrderArray_RecordKeepsLowBytesAndTheHardwareGetsTheWords)
{
    const Words words{ 0x105, 0xFFFFFFFF, 0x100, 0xABCDEF80, 8, 255, 256, 0x7FFFFFFF };
    const Words copy = words;
    EXPECT_EQ(1u, PMX_SetPlaneOrderArray(0, words.data()));
    EXPECT_TRACE("PMX_HalPlaneOrder(0, 8, [0x105, 0xFFFFFFFF, 0x100, 0xABCDEF80, 8, 255, 256, 0x7FFFFFFF])");
    EXPECT_EQ((Order{ 5, 255, 0, 0x80, 8, 255, 0, 255 }), stored());
    EXPECT_EQ(copy, words);
}

TEST_F(PlaneOrder, SetPlaneOrderArray_PlanesNamedTwice_AreKeptAsWritten)
{
    const Words words{ 2, 2, 2, 2, 2, 2, 2, 2 };
    EXPECT_EQ(1u, PMX_SetPlaneOrderArray(0, words.data()));
    EXPECT_TRACE("PMX_HalPlaneOrder(0, 8, [2, 2, 2, 2, 2, 2, 2, 2])");
    EXPECT_EQ((Order{ 2, 2, 2, 2, 2, 2, 2, 2 }), stored());
    EXPECT_EQ(0u, position(2));
    EXPECT_EQ(8u, position(4));
}

TEST_F(PlaneOrder, SetPlaneOrderArray_StoresBeforeItCallsTheHardware)
{
    const Words words{ 10, 11, 12, 13, 14, 15, 16, 17 };
    at_call("PMX_HalPlaneOrder", [] { EXPECT_EQ((Order{ 10, 11, 12, 13, 14, 15, 16, 17 }), stored()); });
    EXPECT_EQ(1u, PMX_SetPlaneOrderArray(0, words.data()));
    EXPECT_TRACE("PMX_HalPlaneOrder(0, 8, [10, 11, 12, 13, 14, 15, 16, 17])");
}

TEST_F(PlaneOrder, SetPlaneOrderArray_NullPointer_IsRefused)
{
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetPlaneOrderArray(0, nullptr));
    EXPECT_EQ(0u, PMX_SetPlaneOrderArray(1, nullptr));
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneOrder, SetPlaneOrder_LeavesThePlaneWhereItStoodToo)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetPlaneOrder(0, 5, 0));
    EXPECT_TRACE("PMX_HalPlaneOrder(0, 8, [5, 3, 1, 0, 2, 5, 6, 7])");
    EXPECT_RECORD_CHANGED(before, "aucPlaneOrder[0]");
    EXPECT_EQ((Order{ 5, 3, 1, 0, 2, 5, 6, 7 }), stored());
    EXPECT_EQ(0u, position(5));
    EXPECT_EQ(8u, position(4));
}

TEST_F(PlaneOrder, SetPlaneOrder_BothPositionsWritten_MovesThePlane)
{
    EXPECT_EQ(1u, PMX_SetPlaneOrder(0, 5, 0));
    EXPECT_EQ(1u, PMX_SetPlaneOrder(0, 4, 5));
    EXPECT_TRACE(R"(
        PMX_HalPlaneOrder(0, 8, [5, 3, 1, 0, 2, 5, 6, 7])
        PMX_HalPlaneOrder(0, 8, [5, 3, 1, 0, 2, 4, 6, 7])
    )");
    EXPECT_EQ(0u, position(5));
    EXPECT_EQ(5u, position(4));
}

TEST_F(PlaneOrder, SetPlaneOrder_ThePlaneThatStandsThere_IsProgrammedAgain)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetPlaneOrder(0, 7, 7));
    EXPECT_TRACE("PMX_HalPlaneOrder(0, 8, [4, 3, 1, 0, 2, 5, 6, 7])");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneOrder, SetPlaneOrder_EveryPlaneIdAtEveryPosition_IsTakenAsGiven)
{
    Order expected = at_start;
    for (unsigned plane = 0; plane < 256; ++plane)
    {
        for (unsigned place = 0; place < 8; ++place)
        {
            SCOPED_TRACE("plane " + std::to_string(plane) + " at " + std::to_string(place));
            expected[place] = plane;
            EXPECT_EQ(1u, PMX_SetPlaneOrder(0, static_cast<UCHAR>(plane), static_cast<UCHAR>(place)));
            EXPECT_TRACE(handed_on(expected));
        }
        EXPECT_EQ(expected, stored());
    }
}

TEST_F(PlaneOrder, SetPlaneOrder_StoresBeforeItCallsTheHardware)
{
    at_call("PMX_HalPlaneOrder", [] { EXPECT_EQ(200, record("aucPlaneOrder[3]")); });
    EXPECT_EQ(1u, PMX_SetPlaneOrder(0, 200, 3));
    EXPECT_TRACE("PMX_HalPlaneOrder(0, 8, [4, 3, 1, 200, 2, 5, 6, 7])");
}

TEST_F(PlaneOrder, SetPlaneOrder_EveryPositionAboveSeven_IsRefused)
{
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetPlaneOrder(0, 2, 8));
    for (unsigned place = 8; place < 256; ++place)
        EXPECT_EQ(0u, PMX_SetPlaneOrder(0, 0xAA, static_cast<UCHAR>(place))) << place;
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneOrder, GetPlaneOrder_OrderAtStart_FindsEveryPlaneAndAnswersEightForAnyOther)
{
    const std::array<unsigned, 8> positions{ 3, 2, 4, 1, 0, 5, 6, 7 }; // of planes 0 to 7
    const RecordSnapshot before;
    for (unsigned plane = 0; plane < 256; ++plane)
        EXPECT_EQ(plane < 8 ? positions[plane] : 8u, position(plane)) << plane;
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneOrder, GetPlaneOrder_PlaneNamedTwice_AnswersTheLowestPosition)
{
    const Words words{ 9, 8, 7, 8, 9, 7, 255, 255 };
    EXPECT_EQ(1u, PMX_SetPlaneOrderArray(0, words.data()));
    board::trace::clear();
    EXPECT_EQ(0u, position(9));
    EXPECT_EQ(1u, position(8));
    EXPECT_EQ(2u, position(7));
    EXPECT_EQ(6u, position(255));
    EXPECT_EQ(8u, position(0));
}

TEST_F(PlaneOrder, GetPlaneOrder_TheRecordAloneDecides)
{
    const Words other{ 0, 1, 2, 3, 4, 5, 6, 7 };
    PMX_HalPlaneOrder(0, 8, other.data());
    board::trace::clear();
    EXPECT_EQ(0u, position(4));
    set_record("aucPlaneOrder[7]", 77);
    EXPECT_EQ(7u, position(77));
}

TEST_F(PlaneOrder, GetPlaneOrder_NullPointer_IsRefused)
{
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_GetPlaneOrder(0, 4, nullptr));
    EXPECT_EQ(0u, PMX_GetPlaneOrder(1, 4, nullptr));
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneOrder, SetAndGet_EveryOtherMixerId_IsRefused)
{
    const Words words{ 7, 6, 5, 4, 3, 2, 1, 0 };
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        SCOPED_TRACE("mixer " + std::to_string(id));
        const auto mixer = static_cast<UCHAR>(id);
        UCHAR found = 99;
        EXPECT_EQ(0u, PMX_SetBg(mixer, 0x29F06E));
        EXPECT_EQ(0u, PMX_SetPlaneOrderArray(mixer, words.data()));
        EXPECT_EQ(0u, PMX_SetPlaneOrder(mixer, 5, 0));
        EXPECT_EQ(0u, PMX_GetPlaneOrder(mixer, 4, &found));
        EXPECT_EQ(99, found);
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PlaneOrder, SetPlaneOrder_ThePackedOrderIsKeptApart)
{
    const Words words{ 7, 6, 5, 4, 3, 2, 1, 0 };
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x01234567));
    EXPECT_EQ(at_start, stored());
    EXPECT_EQ(1u, PMX_SetPlaneOrderArray(0, words.data()));
    EXPECT_EQ(1u, PMX_SetPlaneOrder(0, 4, 4));
    EXPECT_EQ(0x01234567, record("u4PlaneOrder"));
    EXPECT_EQ("[7, 6, 5, 4, 3, 2, 1, 0]", board::state().find("mixer.selectors")->to_text());
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x76543210));
    EXPECT_EQ((Order{ 7, 6, 5, 4, 4, 2, 1, 0 }), stored());
    EXPECT_EQ("[7, 6, 5, 4, 4, 2, 1, 0]", board::state().find("mixer.stacking.order")->to_text());
}

TEST_F(PlaneOrder, Reset_BringsBackOrderAndBackground)
{
    const Words words{ 7, 6, 5, 4, 3, 2, 1, 0 };
    EXPECT_EQ(1u, PMX_SetPlaneOrderArray(0, words.data()));
    EXPECT_EQ(1u, PMX_SetBg(0, 0x29F06E));
    PMX_Reset(0);
    EXPECT_EQ(at_start, stored());
    EXPECT_EQ(0x108080, record("u4BgColor"));
    EXPECT_EQ("{number=3, order=[4, 3, 1, 0, 2, 5, 6, 7]}", board::state().find("mixer.stacking")->to_text());
    EXPECT_EQ(0x108080, board::state().find("mixer.background")->as_number());
    board::trace::clear();
    EXPECT_EQ(0u, position(4));
}
