// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Shut-down, both ways, and the light stop. */
#include "tests/layer/sequences.h"
#include "tests/support/layer_fixture.h"

using Shutdown = LayerTest;

TEST_F(Shutdown, Uninit_TakesEverythingBack)
{
    started();
    const RecordSnapshot before;
    PMX_Uninit();
    EXPECT_TRACE(R"(
        LOG1 "PMX_Uninit\n"
        unregister_pm_ops(pmx_pm_ops) = 0
        PMX_VsyncStop()
        i4ImUnregisterInterface2(66, 0, 9) = 0
        x_timer_delete(2) = 0
        x_sema_delete(1) = 0
    )");
    EXPECT_RECORD_CHANGED(before, "MutexPMX", "_PmxInitiated");
    EXPECT_EQ(0, record("MutexPMX"));
    EXPECT_EQ(0, record("_PmxInitiated"));
}

TEST_F(Shutdown, Uninit_BeforeInit_OnlyLogs)
{
    const RecordSnapshot before;
    PMX_Uninit();
    EXPECT_TRACE(R"(LOG1 "PMX_Uninit\n")");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Shutdown, Uninit_Twice_SecondOnlyLogs)
{
    started();
    PMX_Uninit();
    board::trace::clear();
    const RecordSnapshot before;
    PMX_Uninit();
    EXPECT_TRACE(R"(LOG1 "PMX_Uninit\n")");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Shutdown, Uninit_InitiatedByAnotherNumberThanOne_OnlyLogs)
{
    started();
    for (const int number : { 0, 2, 255 })
    {
        set_record("_PmxInitiated", number);
        const RecordSnapshot before;
        PMX_Uninit();
        EXPECT_TRACE(R"(LOG1 "PMX_Uninit\n")");
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(Shutdown, Uninit_TimerCannotBeDeleted_AssertsAndGoesOn)
{
    for (const std::int64_t answer : { -1, 1 })
    {
        power_on();
        started();
        fail("x_timer_delete", answer);
        PMX_Uninit();
        EXPECT_TRACE(R"(
            LOG1 "PMX_Uninit\n"
            unregister_pm_ops(pmx_pm_ops) = 0
            PMX_VsyncStop()
            i4ImUnregisterInterface2(66, 0, 9) = 0
            x_timer_delete(2) = )" +
                     std::to_string(answer) + R"(
            Assert("x_timer_delete(_arPmxDispPartStatus.hPMXTimer)==OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
            x_sema_delete(1) = 0
        )");
        EXPECT_EQ(0, record("MutexPMX"));
        EXPECT_EQ(0, record("_PmxInitiated"));
        expect_asserts(1);
    }
}

TEST_F(Shutdown, Uninit_MutexCannotBeDeleted_AssertsAndForgetsIt)
{
    for (const std::int64_t answer : { -1, 1 })
    {
        power_on();
        started();
        fail("x_sema_delete", answer);
        PMX_Uninit();
        EXPECT_TRACE(R"(
            LOG1 "PMX_Uninit\n"
            unregister_pm_ops(pmx_pm_ops) = 0
            PMX_VsyncStop()
            i4ImUnregisterInterface2(66, 0, 9) = 0
            x_timer_delete(2) = 0
            x_sema_delete(1) = )" +
                     std::to_string(answer) + R"(
            Assert("x_sema_delete (MutexPMX) == OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
        )");
        EXPECT_EQ(0, record("MutexPMX"));
        EXPECT_EQ(0, record("_PmxInitiated"));
        expect_asserts(1);
    }
}

TEST_F(Shutdown, Uninit_EverythingFails_GoesOnToItsEnd)
{
    started();
    fail("unregister_pm_ops", -1);
    fail("i4ImUnregisterInterface2", -2);
    fail("x_timer_delete", -3);
    fail("x_sema_delete", -4);
    PMX_Uninit();
    EXPECT_TRACE(R"(
        LOG1 "PMX_Uninit\n"
        unregister_pm_ops(pmx_pm_ops) = -1
        PMX_VsyncStop()
        i4ImUnregisterInterface2(66, 0, 9) = -2
        LOG9 "Fail to register IID_IPMX of PMX Comp 0\n"
        x_timer_delete(2) = -3
        Assert("x_timer_delete(_arPmxDispPartStatus.hPMXTimer)==OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
        x_sema_delete(1) = -4
        Assert("x_sema_delete (MutexPMX) == OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
    )");
    EXPECT_EQ(0, record("MutexPMX"));
    EXPECT_EQ(0, record("_PmxInitiated"));
    expect_asserts(2);
}

TEST_F(Shutdown, Uninit_MutexWasNeverCreated_DeletesHandleZeroAndAsserts)
{
    fail("x_sema_create", -1);
    started();
    PMX_Uninit();
    EXPECT_TRACE(R"(
        LOG1 "PMX_Uninit\n"
        unregister_pm_ops(pmx_pm_ops) = 0
        PMX_VsyncStop()
        i4ImUnregisterInterface2(66, 0, 9) = 0
        x_timer_delete(1) = 0
        x_sema_delete(0)
        Assert("x_sema_delete (MutexPMX) == OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
    )");
    EXPECT_EQ(0, record("_PmxInitiated"));
    expect_asserts(2);
}

TEST_F(Shutdown, Uninit_AfterAReset_TheTimerHasNoHandle)
{
    started();
    PMX_Reset(0);
    board::trace::clear();
    PMX_Uninit();
    EXPECT_TRACE(R"(
        LOG1 "PMX_Uninit\n"
        unregister_pm_ops(pmx_pm_ops) = 0
        PMX_VsyncStop()
        i4ImUnregisterInterface2(66, 0, 9) = 0
        x_timer_delete(0)
        Assert("x_timer_delete(_arPmxDispPartStatus.hPMXTimer)==OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
        x_sema_delete(1) = 0
    )");
    expect_asserts(1);
}

TEST_F(Shutdown, i4Uninit_LeavesPowerManagementRegisteredAndLogsArgumentAndResult)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(0, i4PMX_Uninit(7));
    EXPECT_TRACE(R"(
        LOG1 "i4PMX_Uninit u4Case 7\n"
        PMX_VsyncStop()
        i4ImUnregisterInterface2(66, 0, 9) = 0
        x_timer_delete(2) = 0
        x_sema_delete(1) = 0
        LOG1 "i4PMX_Uninit return 0\n"
    )");
    EXPECT_RECORD_CHANGED(before, "MutexPMX", "_PmxInitiated");
    EXPECT_EQ(0, record("MutexPMX"));
    EXPECT_EQ(0, record("_PmxInitiated"));

    EXPECT_EQ(0, board::suspend());
    EXPECT_TRACE("PMX_HalClockSet(0, 0)\nPMX_HalClockSet(2, 0)");
}

TEST_F(Shutdown, i4Uninit_TheCaseSelectsNothing)
{
    for (const std::int64_t number : { 0LL, 1LL, 0x7FFFFFFFLL, 0xFFFFFFFFLL })
    {
        power_on();
        started();
        EXPECT_EQ(0, i4PMX_Uninit(static_cast<UINT32>(number)));
        EXPECT_TRACE("LOG1 \"i4PMX_Uninit u4Case " + std::to_string(number == 0xFFFFFFFFLL ? -1 : number) + "\\n\"\n" +
                     R"(
            PMX_VsyncStop()
            i4ImUnregisterInterface2(66, 0, 9) = 0
            x_timer_delete(2) = 0
            x_sema_delete(1) = 0
            LOG1 "i4PMX_Uninit return 0\n"
        )");
    }
}

TEST_F(Shutdown, i4Uninit_BeforeInit_TwoLogLinesAndZero)
{
    const RecordSnapshot before;
    EXPECT_EQ(0, i4PMX_Uninit(0));
    EXPECT_TRACE(R"(
        LOG1 "i4PMX_Uninit u4Case 0\n"
        LOG1 "i4PMX_Uninit return 0\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Shutdown, i4Uninit_InitiatedByAnotherNumberThanOne_TwoLogLinesAndZero)
{
    started();
    for (const int number : { 0, 2, 255 })
    {
        set_record("_PmxInitiated", number);
        const RecordSnapshot before;
        EXPECT_EQ(0, i4PMX_Uninit(3));
        EXPECT_TRACE(R"(
            LOG1 "i4PMX_Uninit u4Case 3\n"
            LOG1 "i4PMX_Uninit return 0\n"
        )");
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(Shutdown, i4Uninit_MutexCannotBeDeleted_MinusOneAndTheHandleIsKept)
{
    for (const std::int64_t answer : { -5, 1 })
    {
        power_on();
        started();
        const RecordSnapshot before;
        fail("x_sema_delete", answer);
        EXPECT_EQ(-1, i4PMX_Uninit(1));
        EXPECT_TRACE(R"(
            LOG1 "i4PMX_Uninit u4Case 1\n"
            PMX_VsyncStop()
            i4ImUnregisterInterface2(66, 0, 9) = 0
            x_timer_delete(2) = 0
            x_sema_delete(1) = )" +
                     std::to_string(answer) + R"(
            LOG1 "i4PMX_Uninit return -1\n"
        )");
        EXPECT_RECORD_CHANGED(before, "_PmxInitiated");
        EXPECT_EQ(1, record("MutexPMX"));
        EXPECT_EQ(0, record("_PmxInitiated"));
    }
}

TEST_F(Shutdown, i4Uninit_AnyHandleButZero_IsAMutexToDelete)
{
    for (const std::int64_t handle : { 2LL, 255LL, 0x80000000LL, 0xFFFFFFFFLL })
    {
        power_on();
        started();
        fail("x_sema_delete", 0);
        set_record("MutexPMX", handle);
        EXPECT_EQ(0, i4PMX_Uninit(1));
        EXPECT_CALLS(R"(
            PMX_VsyncStop()
            i4ImUnregisterInterface2(66, 0, 9) = 0
            x_timer_delete(2) = 0
            x_sema_delete()" +
                     std::to_string(handle) + ") = 0");
        EXPECT_EQ(0, record("MutexPMX"));
    }
}

TEST_F(Shutdown, i4Uninit_NoMutex_DeletesNoneAndStillLeavesTheLayerUninitialised)
{
    fail("x_sema_create", -1);
    started();
    EXPECT_EQ(0, i4PMX_Uninit(1));
    EXPECT_TRACE(R"(
        LOG1 "i4PMX_Uninit u4Case 1\n"
        PMX_VsyncStop()
        i4ImUnregisterInterface2(66, 0, 9) = 0
        x_timer_delete(1) = 0
        LOG1 "i4PMX_Uninit return 0\n"
    )");
    EXPECT_EQ(0, record("_PmxInitiated"));
    EXPECT_EQ(0, record("MutexPMX"));
    expect_asserts(1);
}

TEST_F(Shutdown, i4Uninit_TimerCannotBeDeleted_AssertsAndGoesOn)
{
    started();
    fail("i4ImUnregisterInterface2", -2);
    fail("x_timer_delete", -3);
    EXPECT_EQ(0, i4PMX_Uninit(1));
    EXPECT_TRACE(R"(
        LOG1 "i4PMX_Uninit u4Case 1\n"
        PMX_VsyncStop()
        i4ImUnregisterInterface2(66, 0, 9) = -2
        LOG9 "Fail to register IID_IPMX of PMX Comp 0\n"
        x_timer_delete(2) = -3
        Assert("x_timer_delete(_arPmxDispPartStatus.hPMXTimer)==OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
        x_sema_delete(1) = 0
        LOG1 "i4PMX_Uninit return 0\n"
    )");
    EXPECT_EQ(0, record("MutexPMX"));
    EXPECT_EQ(0, record("_PmxInitiated"));
    expect_asserts(1);
}
