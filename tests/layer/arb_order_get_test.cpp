// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The packed plane order: reading it back, and what outlives what. */
#include "board/mixer.h"
#include "pmx_hal.h"
#include "tests/layer/arb_order.h"

TEST_F(ArbOrder, GetArbPlaneOrder_AfterStart_AnswersTheOrderThatBothHold)
{
    UINT32 order = 0;
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0x76543210u, order);
    EXPECT_TRACE(R"(
        LOG9 "[PMX0] Start to Get PlaneOrder.\n"
        PMX_HalGetPlaneOrder(0, [0, 1, 2, 3, 4, 5, 6, 7]) = 0
        LOG9 "Get PlaneOrder = 0x[76543210],[0][1][2][3][4][5][6][7].\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ArbOrder, GetArbPlaneOrder_SelectorsArePackedPlaneZeroLowest)
{
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x04627351));
    board::trace::clear();
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0x04627351u, order);
    EXPECT_TRACE(R"(
        LOG9 "[PMX0] Start to Get PlaneOrder.\n"
        PMX_HalGetPlaneOrder(0, [1, 5, 3, 7, 2, 6, 4, 0]) = 0
        LOG9 "Get PlaneOrder = 0x[ 4627351],[1][5][3][7][2][6][4][0].\n"
    )");
}

TEST_F(ArbOrder, GetArbPlaneOrder_TopBitStored_WarnsAndAnswersTheStoredOrder)
{
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0xF6543210));
    board::trace::clear();
    const RecordSnapshot before;
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0xF6543210u, order);
    EXPECT_TRACE(R"(
        LOG9 "[PMX0] Start to Get PlaneOrder.\n"
        PMX_HalGetPlaneOrder(0, [0, 1, 2, 3, 4, 5, 6, 7]) = 0
        LOG8 "Warning: PlaneOrder HW = [0x76543210], but SW = [0xf6543210].\n"
        LOG9 "Get PlaneOrder = 0x[76543210],[0][1][2][3][4][5][6][7].\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ArbOrder, GetArbPlaneOrder_AfterARefusal_AnswersTheRefusedOrderAndWarns)
{
    board::faults::set({ "PMX_HalSetPlaneOrder", -1, board::Fault::When::On });
    EXPECT_EQ(0u, PMX_SetArbPlaneOrder(0, 0x01234567));
    board::trace::clear();
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0x01234567u, order);
    EXPECT_TRACE(R"(
        LOG9 "[PMX0] Start to Get PlaneOrder.\n"
        PMX_HalGetPlaneOrder(0, [0, 1, 2, 3, 4, 5, 6, 7]) = 0
        LOG8 "Warning: PlaneOrder HW = [0x76543210], but SW = [0x 1234567].\n"
        LOG9 "Get PlaneOrder = 0x[76543210],[0][1][2][3][4][5][6][7].\n"
    )");
}

TEST_F(ArbOrder, GetArbPlaneOrder_AfterADuplicate_AnswersTheOrderBefore)
{
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x01234567));
    EXPECT_EQ(0u, PMX_SetArbPlaneOrder(0, 0x76543211));
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0x01234567u, order);
}

TEST_F(ArbOrder, GetArbPlaneOrder_HardwareChangedByAnother_WarnsAndKeepsTheStoredOrder)
{
    const std::array<UINT8, 8> selectors{ 7, 0, 0, 0, 0, 0, 0, 0 };
    std::array<INT32, 8> delays{};
    EXPECT_EQ(0, PMX_HalSetPlaneOrder(0, selectors.data(), delays.data()));
    board::trace::clear();
    const RecordSnapshot before;
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0x76543210u, order);
    EXPECT_TRACE(R"(
        LOG9 "[PMX0] Start to Get PlaneOrder.\n"
        PMX_HalGetPlaneOrder(0, [7, 0, 0, 0, 0, 0, 0, 0]) = 0
        LOG8 "Warning: PlaneOrder HW = [0x       7], but SW = [0x76543210].\n"
        LOG9 "Get PlaneOrder = 0x[       7],[7][0][0][0][0][0][0][0].\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ArbOrder, GetArbPlaneOrder_HardwareThatWritesNothing_FindsTheSelectorsZero)
{
    board::faults::set({ "PMX_HalGetPlaneOrder", 0, board::Fault::When::Always });
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0x76543210u, order);
    EXPECT_TRACE(R"(
        LOG9 "[PMX0] Start to Get PlaneOrder.\n"
        PMX_HalGetPlaneOrder(0, <unchanged>) = 0
        LOG8 "Warning: PlaneOrder HW = [0x       0], but SW = [0x76543210].\n"
        LOG9 "Get PlaneOrder = 0x[       0],[0][0][0][0][0][0][0][0].\n"
    )");
}

TEST_F(ArbOrder, GetArbPlaneOrder_HardwareCannotReport_WritesNothing)
{
    for (const std::int64_t answer : { -1, 1, 255 })
    {
        board::faults::set({ "PMX_HalGetPlaneOrder", answer, board::Fault::When::Always });
        UINT32 order = 0x5A5A5A5A;
        const RecordSnapshot before;
        EXPECT_EQ(0u, PMX_GetArbPlaneOrder(0, &order));
        EXPECT_EQ(0x5A5A5A5Au, order);
        EXPECT_EQ(0u, PMX_GetArbPlaneOrder(0, nullptr));
        EXPECT_TRACE(R"(
            LOG9 "[PMX0] Start to Get PlaneOrder.\n"
            PMX_HalGetPlaneOrder(0, <unchanged>)
            LOG9 "[PMX0] Start to Get PlaneOrder.\n"
            PMX_HalGetPlaneOrder(0, <unchanged>)
        )");
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(ArbOrder, GetArbPlaneOrder_OtherMixerIds_AreHandedOnAndReadTheOneRecord)
{
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x01234567));
    board::trace::clear();
    for (const unsigned mixer : { 1u, 7u, 255u })
    {
        const std::string id = std::to_string(mixer);
        UINT32 order = 0x5A5A5A5A;
        EXPECT_EQ(0u, PMX_GetArbPlaneOrder(static_cast<UCHAR>(mixer), &order));
        EXPECT_EQ(0x5A5A5A5Au, order);
        board::faults::set({ "PMX_HalGetPlaneOrder", 0, board::Fault::When::On });
        EXPECT_EQ(1u, PMX_GetArbPlaneOrder(static_cast<UCHAR>(mixer), &order));
        EXPECT_EQ(0x01234567u, order);
        EXPECT_TRACE("LOG9 \"[PMX" + id + "] Start to Get PlaneOrder.\\n\"\n" + "PMX_HalGetPlaneOrder(" + id +
                     ", <unchanged>) = -1\n" + "LOG9 \"[PMX" + id + "] Start to Get PlaneOrder.\\n\"\n" +
                     "PMX_HalGetPlaneOrder(" + id + ", <unchanged>) = 0\n" + R"(
            LOG8 "Warning: PlaneOrder HW = [0x       0], but SW = [0x 1234567].\n"
            LOG9 "Get PlaneOrder = 0x[       0],[0][0][0][0][0][0][0][0].\n"
        )");
    }
}

TEST_F(ArbOrder, Reset_BringsBackTheOrder)
{
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x81234567));
    EXPECT_EQ(0x81234567, record("u4PlaneOrder"));
    PMX_Reset(0);
    board::trace::clear();
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0x76543210u, order);
    EXPECT_TRACE(R"(
        LOG9 "[PMX0] Start to Get PlaneOrder.\n"
        PMX_HalGetPlaneOrder(0, [0, 1, 2, 3, 4, 5, 6, 7]) = 0
        LOG9 "Get PlaneOrder = 0x[76543210],[0][1][2][3][4][5][6][7].\n"
    )");
}

TEST_F(ArbOrder, GetArbPlaneOrder_ThePositionsPlayNoPart)
{
    EXPECT_EQ(1u, PMX_SetPlaneOrder(0, 7, 0));
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0x76543210u, order);
    EXPECT_EQ(7, record("aucPlaneOrder[0]"));
    EXPECT_EQ(3, record("aucPlaneOrder[1]"));
}

TEST_F(ArbOrder, GetArbPlaneOrder_SelectorsThatAreNoSources_AreAddedUpUnmasked)
{
    board::mixer::set_selectors({ 0x10, 1, 2, 3, 4, 5, 6, 0xF7 });
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(0x76543210u, order);
    EXPECT_TRACE(R"(
        LOG9 "[PMX0] Start to Get PlaneOrder.\n"
        PMX_HalGetPlaneOrder(0, [16, 1, 2, 3, 4, 5, 6, 247]) = 0
        LOG8 "Warning: PlaneOrder HW = [0x76543220], but SW = [0x76543210].\n"
        LOG9 "Get PlaneOrder = 0x[76543220],[16][1][2][3][4][5][6][247].\n"
    )");
}

TEST_F(ArbOrder, GetArbPlaneOrder_ChangedWhileItIsPrinted_AnswersWhatIsStoredThen)
{
    unsigned lines = 0;
    at_call("PMX_IsLog", [&lines] { set_record("u4PlaneOrder", 0x76543211 + ++lines); });
    UINT32 order = 0;
    EXPECT_EQ(1u, PMX_GetArbPlaneOrder(0, &order));
    EXPECT_EQ(3u, lines);
    EXPECT_EQ(0x76543214u, order);
    EXPECT_TRACE(R"(
        LOG9 "[PMX0] Start to Get PlaneOrder.\n"
        PMX_HalGetPlaneOrder(0, [0, 1, 2, 3, 4, 5, 6, 7]) = 0
        LOG8 "Warning: PlaneOrder HW = [0x76543210], but SW = [0x76543212].\n"
        LOG9 "Get PlaneOrder = 0x[76543210],[0][1][2][3][4][5][6][7].\n"
    )");
}
