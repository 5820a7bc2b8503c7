// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Which of the two video planes lies above the other. */
#include "board/video_planes.h"
#include "pmx_hal.h"
#include "tests/support/layer_fixture.h"

class OrderVdpComp0 : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }

    static bool mixed(unsigned plane)
    {
        return board::state().find("mixer.mixed[" + std::to_string(plane) + "]")->as_number() != 0;
    }

    /** What the shortcut reads, which takes no platform call. */
    static UINT32 on_top(UCHAR mixer = 0)
    {
        UINT32 value = 0x5A5A5A5A;
        EXPECT_EQ(1u, d_PMX_GetOrderVdpComp0(mixer, &value));
        EXPECT_NO_TRACE();
        return value;
    }
};

TEST_F(OrderVdpComp0, SetOrderVdpComp0_OnTop_SwapsAndMixesTheFirstVideoPlane)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    EXPECT_TRACE(R"(
        PMX_HalSwapPlane1_2(0, 1)
        VDP_GetHwEnable(0) = VDP_ENABLED
        vPmxMixPlane(0, 1)
    )");
    EXPECT_RECORD_CHANGED(before, "bComp0OnTop");
    EXPECT_EQ(1u, on_top());
    EXPECT_TRUE(mixed(1));
}

TEST_F(OrderVdpComp0, SetOrderVdpComp0_OnTopWhileTheFirstIsDisabled_SwapsAndTakesPlaneOneOut)
{
    board::video_planes::set_hw_enable(0, VDP_DISABLED);
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    EXPECT_TRACE(R"(
        PMX_HalSwapPlane1_2(0, 1)
        VDP_GetHwEnable(0) = VDP_DISABLED
        vPmxNotMixPlane(0, 1)
    )");
    EXPECT_FALSE(mixed(1));
    EXPECT_TRUE(mixed(0));
}

TEST_F(OrderVdpComp0, SetOrderVdpComp0_BelowWhileTheSecondIsHidden_PutsItBackInTheBlend)
{
    board::video_planes::set_hw_enable(0, VDP_DISABLED);
    board::video_planes::set_hw_enable(1, VDP_HIDDEN);
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    board::trace::clear();
    EXPECT_FALSE(mixed(1));
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 0));
    EXPECT_TRACE(R"(
        PMX_HalSwapPlane1_2(0, 0)
        VDP_GetHwEnable(1) = VDP_HIDDEN
        vPmxMixPlane(0, 1)
    )");
    EXPECT_TRUE(mixed(1));
    EXPECT_EQ(0u, on_top());
}

TEST_F(OrderVdpComp0, SetOrderVdpComp0_BelowWhileTheSecondIsDisabled_TakesPlaneOneOut)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 0));
    EXPECT_TRACE(R"(
        PMX_HalSwapPlane1_2(0, 0)
        VDP_GetHwEnable(1) = VDP_DISABLED
        vPmxNotMixPlane(0, 1)
    )");
    EXPECT_FALSE(mixed(1));
}

TEST_F(OrderVdpComp0, SetOrderVdpComp0_TheStoredValueAgain_RunsEveryStepAgain)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 0));
    EXPECT_TRACE(R"(
        PMX_HalSwapPlane1_2(0, 0)
        VDP_GetHwEnable(1) = VDP_DISABLED
        vPmxNotMixPlane(0, 1)
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(OrderVdpComp0, SetOrderVdpComp0_EveryValueStateAndMixerId_IsTakenAsGiven)
{
    for (const UINT32 value : { 0u, 1u, 2u, 0x100u, 0x80000000u, 0xFFFFFFFFu })
    {
        for (const UCHAR mixer : { 0, 1, 7, 255 })
        {
            for (const std::int64_t state : { 0, 1, 2, 3, 255 })
            {
                board::faults::set({ "VDP_GetHwEnable", state, board::Fault::When::Always });
                const std::string id = std::to_string(mixer);
                SCOPED_TRACE("value " + std::to_string(value) + ", mixer " + id + ", state " + std::to_string(state));
                EXPECT_EQ(1u, PMX_SetOrderVdpComp0(mixer, value));
                EXPECT_TRACE("PMX_HalSwapPlane1_2(" + id + ", " + std::to_string(value) + ")\n" + "VDP_GetHwEnable(" +
                             (value != 0 ? "0" : "1") + ") = " + std::to_string(state) + "\n" +
                             (state != 0 ? "vPmxMixPlane(" : "vPmxNotMixPlane(") + id + ", 1)");
                EXPECT_EQ(static_cast<INT32>(value), record("bComp0OnTop"));
                EXPECT_EQ(value, on_top());
            }
        }
    }
}

TEST_F(OrderVdpComp0, SetOrderVdpComp0_StoresBeforeItCallsTheHardware)
{
    at_call("PMX_HalSwapPlane1_2", [] { EXPECT_EQ(2, record("bComp0OnTop")); });
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 2));
    EXPECT_CALLS(R"(
        PMX_HalSwapPlane1_2(0, 2)
        VDP_GetHwEnable(0)
        vPmxMixPlane(0, 1)
    )");
}

TEST_F(OrderVdpComp0, SetOrderVdpComp0_ThePlaneThatIsMixedIsAskedAfterTheSwap)
{
    at_call("PMX_HalSwapPlane1_2", [] { board::video_planes::set_hw_enable(0, VDP_DISABLED); });
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    EXPECT_FALSE(mixed(1));
}

TEST_F(OrderVdpComp0, SetOrderVdpComp0_PlaneZeroStaysAsItIs)
{
    for (const UINT32 value : { 1u, 0u })
    {
        for (const VDP_ENABLE_T state : { VDP_DISABLED, VDP_HIDDEN, VDP_ENABLED })
        {
            board::video_planes::set_hw_enable(0, state);
            board::video_planes::set_hw_enable(1, state);
            vPmxNotMixPlane(0, 0);
            EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, value));
            EXPECT_FALSE(mixed(0));
            vPmxMixPlane(0, 0);
            EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, value));
            EXPECT_TRUE(mixed(0));
        }
    }
}

TEST_F(OrderVdpComp0, DSetOrderVdpComp0_SendsCommandSeventeenToThreePlanesFirst)
{
    const RecordSnapshot before;
    at_call("VDP_VsyncSendCmd", [] { EXPECT_EQ(0, record("bComp0OnTop")); });
    EXPECT_EQ(1u, d_PMX_SetOrderVdpComp0(0, 1));
    EXPECT_TRACE(R"(
        VDP_VsyncSendCmd(0, 17)
        VDP_VsyncSendCmd(1, 17)
        VDP_VsyncSendCmd(2, 17)
        PMX_HalSwapPlane1_2(0, 1)
        VDP_GetHwEnable(0) = VDP_ENABLED
        vPmxMixPlane(0, 1)
    )");
    EXPECT_RECORD_CHANGED(before, "bComp0OnTop");
}

TEST_F(OrderVdpComp0, DSetOrderVdpComp0_MixerIdAndValue_AreHandedOn)
{
    EXPECT_EQ(1u, d_PMX_SetOrderVdpComp0(7, 0xFFFFFFFF));
    EXPECT_TRACE(R"(
        VDP_VsyncSendCmd(0, 17)
        VDP_VsyncSendCmd(1, 17)
        VDP_VsyncSendCmd(2, 17)
        PMX_HalSwapPlane1_2(7, 0xFFFFFFFF)
        VDP_GetHwEnable(0) = VDP_ENABLED
        vPmxMixPlane(7, 1)
    )");
    EXPECT_EQ(0xFFFFFFFFu, on_top());
    EXPECT_EQ(1u, d_PMX_SetOrderVdpComp0(255, 0));
    EXPECT_TRACE(R"(
        VDP_VsyncSendCmd(0, 17)
        VDP_VsyncSendCmd(1, 17)
        VDP_VsyncSendCmd(2, 17)
        PMX_HalSwapPlane1_2(255, 0)
        VDP_GetHwEnable(1) = VDP_DISABLED
        vPmxNotMixPlane(255, 1)
    )");
    EXPECT_EQ(0u, on_top());
}

TEST_F(OrderVdpComp0, DGetOrderVdpComp0_AnyMixerId_ReadsTheOneValue)
{
    EXPECT_EQ(0u, on_top());
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 2));
    board::trace::clear();
    for (const UCHAR mixer : { 0, 1, 7, 255 })
        EXPECT_EQ(2u, on_top(mixer));
}

TEST_F(OrderVdpComp0, VdpGetPlanePosition_FollowsTheHardwareWhoeverSwappedIt)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    EXPECT_EQ(DRV_PMX_PLANE_2, PMX_VdpGetPlanePosition(0, 0));
    EXPECT_EQ(DRV_PMX_PLANE_1, PMX_VdpGetPlanePosition(0, 1));
    EXPECT_EQ(1u, PMX_SetSwapEnable(0, 0, 1));
    EXPECT_EQ(DRV_PMX_PLANE_1, PMX_VdpGetPlanePosition(0, 0));
    EXPECT_EQ(DRV_PMX_PLANE_2, PMX_VdpGetPlanePosition(0, 1));
    board::trace::clear();
    EXPECT_EQ(1u, on_top());
}

TEST_F(OrderVdpComp0, Reset_LeavesTheChoice)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    PMX_Reset(0);
    board::trace::clear();
    EXPECT_EQ(1u, on_top());
    EXPECT_EQ(1, record("bComp0OnTop"));
}

TEST_F(OrderVdpComp0, UninitAndInit_LeaveTheChoice)
{
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 0xFFFFFFFF));
    PMX_Uninit();
    PMX_Init();
    board::trace::clear();
    EXPECT_EQ(0xFFFFFFFFu, on_top());
}
