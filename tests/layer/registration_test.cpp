// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Registration at the interface manager; suspend and resume. */
#include "drv_if.h"
#include "tests/support/layer_fixture.h"
#include "u_os.h"

using Registration = LayerTest;
using Power = LayerTest;

TEST_F(Registration, RegisterIM_HandsTheTableAndTheComponentIdAsTag)
{
    const RecordSnapshot before;
    EXPECT_EQ(0, i4PmxRegisterIM(66, 0));
    EXPECT_TRACE("i4ImRegisterInterface2(66, 0, 9, _rPMXIF, 0) = 0");
    EXPECT_EQ(0, i4PmxRegisterIM(12, 34));
    EXPECT_TRACE("i4ImRegisterInterface2(12, 34, 9, _rPMXIF, 34) = 0");
    EXPECT_EQ(0, i4PmxRegisterIM(0xFFFF, 0xFFFE));
    EXPECT_TRACE("i4ImRegisterInterface2(0xFFFF, 0xFFFE, 9, _rPMXIF, 0xFFFE) = 0");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Registration, RegisterIM_Fails_LoggedWithTheComponentIdAndReturned)
{
    for (const std::int32_t answer : { -1, -7, -2147483647 - 1 })
    {
        board::faults::set({ "i4ImRegisterInterface2", answer });
        EXPECT_EQ(answer, i4PmxRegisterIM(66, 5));
        EXPECT_TRACE("i4ImRegisterInterface2(66, 5, 9, _rPMXIF, 5) = " + std::to_string(answer) + R"(
            LOG9 "Fail to register IID_IPMX of PMX Comp 5\n"
        )");
    }
    board::faults::set({ "i4ImRegisterInterface2", -1 });
    EXPECT_EQ(-1, i4PmxRegisterIM(66, 0xFFFF));
    EXPECT_TRACE(R"(
        i4ImRegisterInterface2(66, 0xFFFF, 9, _rPMXIF, 0xFFFF) = -1
        LOG9 "Fail to register IID_IPMX of PMX Comp 65535\n"
    )");
}

TEST_F(Registration, RegisterIM_PositiveResult_IsNoFailure)
{
    for (const int answer : { 5, 0x18000 })
    {
        board::faults::set({ "i4ImRegisterInterface2", answer });
        EXPECT_EQ(answer, i4PmxRegisterIM(66, 0));
        EXPECT_TRACE("i4ImRegisterInterface2(66, 0, 9, _rPMXIF, 0) = " + std::to_string(answer));
    }
}

TEST_F(Registration, RegisterIM_Twice_TheSecondFails)
{
    EXPECT_EQ(0, i4PmxRegisterIM(66, 0));
    board::trace::clear();
    EXPECT_GT(0, i4PmxRegisterIM(66, 0));
    EXPECT_TRACE(R"(
        i4ImRegisterInterface2(66, 0, 9, _rPMXIF, 0)
        LOG9 "Fail to register IID_IPMX of PMX Comp 0\n"
    )");
}

TEST_F(Registration, UnregisterIM_WithdrawsTheTable)
{
    EXPECT_EQ(0, i4PmxRegisterIM(66, 0));
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(0, i4PmxUnregisterIM(66, 0));
    EXPECT_TRACE("i4ImUnregisterInterface2(66, 0, 9) = 0");
    EXPECT_RECORD_UNCHANGED(before);
    void* table = nullptr;
    void* tag = nullptr;
    EXPECT_GT(0, i4ImQueryInterface(66, 0, IID_IPMX, &table, &tag));
}

TEST_F(Registration, UnregisterIM_Fails_TheTextSaysRegisterToo)
{
    EXPECT_GT(0, i4PmxUnregisterIM(66, 0));
    EXPECT_TRACE(R"(
        i4ImUnregisterInterface2(66, 0, 9)
        LOG9 "Fail to register IID_IPMX of PMX Comp 0\n"
    )");
    board::faults::set({ "i4ImUnregisterInterface2", -9 });
    EXPECT_EQ(-9, i4PmxUnregisterIM(12, 0x8022));
    EXPECT_TRACE(R"(
        i4ImUnregisterInterface2(12, 32802, 9) = -9
        LOG9 "Fail to register IID_IPMX of PMX Comp 32802\n"
    )");
}

TEST_F(Registration, UnregisterIM_TheWholeComponentIsTheKey)
{
    EXPECT_EQ(0, i4PmxRegisterIM(0x8142, 0x8001));
    board::trace::clear();
    EXPECT_EQ(0, i4PmxUnregisterIM(0x8142, 0x8001));
    EXPECT_TRACE("i4ImUnregisterInterface2(0x8142, 0x8001, 9) = 0");
}

TEST_F(Registration, UnregisterIM_PositiveResult_IsNoFailure)
{
    for (const int answer : { 5, 0x18000 })
    {
        board::faults::set({ "i4ImUnregisterInterface2", answer });
        EXPECT_EQ(answer, i4PmxUnregisterIM(66, 0));
        EXPECT_TRACE("i4ImUnregisterInterface2(66, 0, 9) = " + std::to_string(answer));
    }
}

TEST_F(Power, Suspend_GatesTheClocksZeroAndTwo)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(0, board::suspend());
    EXPECT_TRACE(R"(
        PMX_HalClockSet(0, 0)
        PMX_HalClockSet(2, 0)
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Power, Resume_RunsTheClocksZeroAndTwo)
{
    started();
    EXPECT_EQ(0, board::suspend());
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(0, board::resume());
    EXPECT_TRACE(R"(
        PMX_HalClockSet(0, 1)
        PMX_HalClockSet(2, 1)
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Power, SuspendAndResume_IgnoreTheirArgument)
{
    int anything = 0;
    for (void* const param : { static_cast<void*>(nullptr), static_cast<void*>(&anything) })
    {
        EXPECT_EQ(0, i4PMX_Suspend(param));
        EXPECT_TRACE("PMX_HalClockSet(0, 0)\nPMX_HalClockSet(2, 0)");
        EXPECT_EQ(0, i4PMX_Resume(param));
        EXPECT_TRACE("PMX_HalClockSet(0, 1)\nPMX_HalClockSet(2, 1)");
    }
}

TEST_F(Power, SuspendAndResume_AreWhatIsRegistered)
{
    EXPECT_EQ(&i4PMX_Suspend, pmx_pm_ops.suspend);
    EXPECT_EQ(&i4PMX_Resume, pmx_pm_ops.resume);
}

TEST_F(Power, Suspend_BeforeStartUp_NothingIsRegistered)
{
    EXPECT_EQ(0, board::suspend());
    EXPECT_EQ(0, board::resume());
    EXPECT_NO_TRACE();
}

TEST_F(Power, Suspend_TheRecordIsNeitherSavedNorRestored)
{
    started();
    EXPECT_EQ(0, board::suspend());
    set_record("ucBrightness", 7);
    board::trace::clear();
    EXPECT_EQ(0, board::resume());
    EXPECT_TRACE("PMX_HalClockSet(0, 1)\nPMX_HalClockSet(2, 1)");
    EXPECT_EQ(7, record("ucBrightness"));
}
