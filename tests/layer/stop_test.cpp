// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The light stop, and what may come behind any way of shutting down. */
#include <stdexcept>

#include "tests/layer/sequences.h"
#include "tests/support/layer_fixture.h"

using Stop = LayerTest;

namespace
{

/** A whole start-up on a board whose PLL has been programmed before. */
std::string init_again(const std::string& mutex, const std::string& timer, bool is_registered)
{
    std::string lines = "LOG1 \"PMX_Init\\n\"\n";
    lines += "x_sema_create(" + mutex + ", X_SEMA_TYPE_MUTEX, 1) = 0\n";
    lines += sequences::reset({ .boot_word = 0x0000010C,
                                .mode = RES_1080P60HZ,
                                .control_a = sequences::programmed_control_a,
                                .control_b = sequences::programmed_control_b });
    lines += "i4ImRegisterInterface2(66, 0, 9, _rPMXIF, 0)\n";
    if (is_registered)
        lines += "LOG9 \"Fail to register IID_IPMX of PMX Comp 0\\n\"\n";
    lines += "x_timer_create(" + timer + ") = 0\n";
    return lines + R"(
        LOG0 "[PMX] create a timer \n"
        PMX_VsyncInit()
        PMX_HalSetDigitalOutDrv(3)
        register_pm_ops(pmx_pm_ops) = 0
    )";
}

/** What the board still holds for the layer: mutexes, timers, interfaces, power-management operations. */
std::vector<std::size_t> held_by_the_board()
{
    const board::Value state = board::state();
    std::vector<std::size_t> numbers;
    for (const char* list : { "os.mutexes", "os.timers", "interface_manager.interfaces", "power.registered" })
    {
        const board::Value* const items = state.find(list);
        if (items == nullptr)
            throw std::invalid_argument(std::string("the board's state has no ") + list);
        numbers.push_back(items->items().size());
    }
    return numbers;
}

using Numbers = std::vector<std::size_t>;

} // namespace

TEST_F(Stop, Stop_StopsVsyncHandlingAndMarksTheLayer)
{
    started();
    const RecordSnapshot before;
    PMX_Stop();
    EXPECT_TRACE(R"(
        LOG1 "PMX_Stop\n"
        PMX_VsyncStop()
    )");
    EXPECT_RECORD_CHANGED(before, "_PmxInitiated");
    EXPECT_EQ(0, record("_PmxInitiated"));
}

TEST_F(Stop, Stop_MarksTheLayerBeforeItStopsVsyncHandling)
{
    started();
    std::int64_t at_stop = -1;
    at_call("PMX_VsyncStop", [&] { at_stop = record("_PmxInitiated"); });
    PMX_Stop();
    EXPECT_EQ(0, at_stop);
}

TEST_F(Stop, Stop_NotStarted_OnlyLogs)
{
    for (const int number : { 0, 2, 255 })
    {
        set_record("_PmxInitiated", number);
        const RecordSnapshot before;
        PMX_Stop();
        EXPECT_TRACE(R"(LOG1 "PMX_Stop\n")");
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(Stop, Stop_LeavesRegistrationAndPowerManagement)
{
    started();
    PMX_Stop();
    board::trace::clear();
    EXPECT_EQ(0, board::suspend());
    EXPECT_TRACE("PMX_HalClockSet(0, 0)\nPMX_HalClockSet(2, 0)");
    EXPECT_LE(0, i4PmxUnregisterIM(66, 0));
}

TEST_F(Stop, StopThenUninit_DeletesNeitherTimerNorMutex)
{
    started();
    PMX_Stop();
    board::trace::clear();
    const RecordSnapshot before;
    PMX_Uninit();
    EXPECT_TRACE(R"(LOG1 "PMX_Uninit\n")");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(1, record("MutexPMX"));
    EXPECT_EQ(2, record("status.hPMXTimer"));
}

TEST_F(Stop, StopTheni4Uninit_DoesNothing)
{
    started();
    PMX_Stop();
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(0, i4PMX_Uninit(4));
    EXPECT_TRACE(R"(
        LOG1 "i4PMX_Uninit u4Case 4\n"
        LOG1 "i4PMX_Uninit return 0\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Stop, StopThenInit_RunsTheFullStartUpAgain)
{
    started();
    PMX_Stop();
    board::trace::clear();
    PMX_Init();
    EXPECT_TRACE(init_again("3", "4", true));
    EXPECT_EQ(3, record("MutexPMX"));
    EXPECT_EQ(4, record("status.hPMXTimer"));
    EXPECT_EQ(1, record("_PmxInitiated"));
}

TEST_F(Stop, UninitThenInit_StartsAnew)
{
    started();
    PMX_Uninit();
    board::trace::clear();
    PMX_Init();
    EXPECT_TRACE(init_again("3", "4", false));
    EXPECT_EQ(1, record("_PmxInitiated"));
    PMX_Uninit();
    board::trace::clear();
    EXPECT_EQ(0, board::suspend());
    EXPECT_NO_TRACE();
}

TEST_F(Stop, i4UninitThenInit_StartsAnew)
{
    started();
    EXPECT_EQ(0, i4PMX_Uninit(1));
    board::trace::clear();
    PMX_Init();
    EXPECT_TRACE(init_again("3", "4", false));
    EXPECT_EQ(1, record("_PmxInitiated"));
}

TEST_F(Stop, i4UninitWithAFailedDeletionThenInit_TakesANewMutex)
{
    started();
    board::faults::set({ "x_sema_delete", -1 });
    EXPECT_EQ(-1, i4PMX_Uninit(1));
    EXPECT_EQ(1, record("MutexPMX"));
    board::trace::clear();
    PMX_Init();
    EXPECT_TRACE(init_again("3", "4", false));
    EXPECT_EQ(3, record("MutexPMX"));
}

TEST_F(Stop, EveryWayOfShuttingDown_LeavesWhatItsContractSays)
{
    EXPECT_EQ((Numbers{ 0, 0, 0, 0 }), held_by_the_board());
    started();
    EXPECT_EQ((Numbers{ 1, 1, 1, 1 }), held_by_the_board());
    PMX_Uninit();
    EXPECT_EQ((Numbers{ 0, 0, 0, 0 }), held_by_the_board());

    power_on();
    started();
    EXPECT_EQ(0, i4PMX_Uninit(0));
    EXPECT_EQ((Numbers{ 0, 0, 0, 1 }), held_by_the_board());

    power_on();
    started();
    PMX_Stop();
    EXPECT_EQ((Numbers{ 1, 1, 1, 1 }), held_by_the_board());
    PMX_Init();
    EXPECT_EQ((Numbers{ 2, 2, 1, 1 }), held_by_the_board());
}
