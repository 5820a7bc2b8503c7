// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The display timer: starting it, its failures, its expiry. */
#include <chrono>

#include "board/video_planes.h"
#include "tests/layer/mode_ex.h"

using namespace std::chrono_literals;

using DisplayTimer = LayerTest;

namespace
{

constexpr const char* timeout = "LOG0 \"PMX timeout.\\n\"\n";

/** The board's names for what it saw a timer do. */
std::vector<std::string> expiries()
{
    std::vector<std::string> seen;
    for (const std::string& notice : LayerTest::notices())
    {
        if (notice.starts_with("NOTICE expiry"))
            seen.push_back(notice);
    }
    return seen;
}

} // namespace

TEST_F(DisplayTimer, SetFormatChangeTimer_StopsAndStartsOnceAndSetsNoFlag)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetFormatChangeTimer(10000));
    EXPECT_TRACE(R"(
        LOG0 "Display Format Change Timer Set.\n"
        x_timer_stop(2) = 0
        x_timer_start(2, 10000, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = 0
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DisplayTimer, SetFormatChangeTimer_AnyInterval_IsHandedOn)
{
    started();
    for (const UINT32 interval : { 0u, 1u, 9999u, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu })
    {
        EXPECT_EQ(1u, PMX_SetFormatChangeTimer(interval));
        EXPECT_CALLS("x_timer_stop(2) = 0\nx_timer_start(2, " + std::to_string(interval) +
                     ", X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = 0");
    }
}

TEST_F(DisplayTimer, SetFormatChangeTimer_RunsOutOnce)
{
    started();
    EXPECT_EQ(1u, PMX_SetFormatChangeTimer(250));
    board::advance(250ms - 1us);
    EXPECT_EQ(0u, expiries().size());
    board::advance(1us);
    EXPECT_EQ(std::vector<std::string>{ R"(NOTICE expiry "timer 2: _PMX_TmrIsr")" }, expiries());
    board::advance(100s);
    EXPECT_EQ(1u, expiries().size());
}

TEST_F(DisplayTimer, SetFormatChangeTimer_WhileRunning_StartsItsFullIntervalAnew)
{
    started();
    EXPECT_EQ(1u, PMX_SetFormatChangeTimer(10000));
    board::advance(6s);
    EXPECT_EQ(1u, PMX_SetFormatChangeTimer(10000));
    board::advance(10s - 1us);
    EXPECT_EQ(0u, expiries().size());
    board::advance(1us);
    EXPECT_EQ(1u, expiries().size());
    board::advance(100s);
    EXPECT_EQ(1u, expiries().size());
}

TEST_F(DisplayTimer, SetFormatChangeTimer_StopFails_AssertsAndStartsAllTheSame)
{
    started();
    const RecordSnapshot before;
    for (const int answer : { -1, 1, 0x7FFFFFFF })
    {
        board::faults::set({ "x_timer_stop", answer });
        EXPECT_EQ(1u, PMX_SetFormatChangeTimer(10000));
        EXPECT_TRACE(R"(
            LOG0 "Display Format Change Timer Set.\n"
            x_timer_stop(2) = )" +
                     std::to_string(answer) + R"(
            Assert("x_timer_stop(_arPmxDispPartStatus.hPMXTimer) == OSR_OK", "src/driver/pmx/pmx_handshake.cpp")
            x_timer_start(2, 10000, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = 0
        )");
    }
    EXPECT_RECORD_UNCHANGED(before);
    expect_asserts(3);
}

TEST_F(DisplayTimer, SetFormatChangeTimer_StartFails_AssertsAndReturnsOne)
{
    started();
    const RecordSnapshot before;
    for (const int answer : { -1, 1, 0x7FFFFFFF })
    {
        board::faults::set({ "x_timer_start", answer });
        EXPECT_EQ(1u, PMX_SetFormatChangeTimer(5));
        EXPECT_TRACE(R"(
            LOG0 "Display Format Change Timer Set.\n"
            x_timer_stop(2) = 0
            x_timer_start(2, 5, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = )" +
                     std::to_string(answer) +
                     R"(
            Assert("x_timer_start(_arPmxDispPartStatus.hPMXTimer, u4TimeInterval, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, )"
                     R"(NULL)==OSR_OK", "src/driver/pmx/pmx_handshake.cpp")
        )");
    }
    EXPECT_RECORD_UNCHANGED(before);
    expect_asserts(3);
}

TEST_F(DisplayTimer, SetFormatChangeTimer_AfterAnotherReset_FailsWithTheHandleThatIsGone)
{
    started();
    PMX_Reset(0);
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetFormatChangeTimer(10000));
    EXPECT_TRACE(R"(
        LOG0 "Display Format Change Timer Set.\n"
        x_timer_stop(0) = -1
        Assert("x_timer_stop(_arPmxDispPartStatus.hPMXTimer) == OSR_OK", "src/driver/pmx/pmx_handshake.cpp")
        x_timer_start(0, 10000, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = -1
        Assert("x_timer_start(_arPmxDispPartStatus.hPMXTimer, u4TimeInterval, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, )"
                 R"(NULL)==OSR_OK", "src/driver/pmx/pmx_handshake.cpp")
    )");
    expect_asserts(2);
}

TEST_F(DisplayTimer, TmrIsr_LowersTheFlag)
{
    started();
    set_record("status.fgTimerAlreadySet", 1);
    set_record("status.fgPmxFormatChangeFlag", 1);
    const RecordSnapshot before;
    _PMX_TmrIsr(2, nullptr);
    EXPECT_TRACE(std::string(timeout) + mode_ex::lowered);
    EXPECT_RECORD_CHANGED(before, "status.fgTimerAlreadySet", "status.fgPmxFormatChangeFlag");
    EXPECT_EQ(0, record("status.fgTimerAlreadySet"));
    EXPECT_EQ(0, record("status.fgPmxFormatChangeFlag"));
}

TEST_F(DisplayTimer, TmrIsr_AnyNonZeroFlags_BecomeZero)
{
    started();
    for (const int number : { 2, 254, 255 })
    {
        set_record("status.fgTimerAlreadySet", number);
        set_record("status.fgPmxFormatChangeFlag", number);
        set_record("status.fgPmxEnabeOsdFlag", number);
        _PMX_TmrIsr(2, nullptr);
        EXPECT_TRACE(std::string(timeout) + mode_ex::lowered);
        EXPECT_EQ(0, record("status.fgTimerAlreadySet"));
        EXPECT_EQ(0, record("status.fgPmxFormatChangeFlag"));
        EXPECT_EQ(0, record("status.fgPmxEnabeOsdFlag"));
    }
}

TEST_F(DisplayTimer, TmrIsr_NothingRaised_MixesAllTheSame)
{
    started();
    const RecordSnapshot before;
    _PMX_TmrIsr(2, nullptr);
    EXPECT_TRACE(std::string(timeout) + mode_ex::lowered);
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DisplayTimer, TmrIsr_IgnoresItsArguments)
{
    started();
    int anything = 0;
    for (const HANDLE_T handle : { 0u, 1u, 0xFFFFFFFFu })
    {
        _PMX_TmrIsr(handle, &anything);
        EXPECT_TRACE(std::string(timeout) + mode_ex::lowered);
    }
    EXPECT_EQ(0, anything);
}

TEST_F(DisplayTimer, TmrIsr_WhileTheVideoPlaneWaits_OwesTheRelease)
{
    started();
    set_record("status.fgTimerAlreadySet", 1);
    set_record("status.fgPmxFormatChangeFlag", 1);
    board::video_planes::set_waiting_for_sync(true);
    _PMX_TmrIsr(2, nullptr);
    EXPECT_TRACE(R"(
        LOG0 "PMX timeout.\n"
        LOG0 "Display Format Change :0.\n"
        LOG0 "Set Osd Enable :1.\n"
        fgVdpIsWaitforSyncCtrl() = 1
    )");
    EXPECT_EQ(1, record("status.fgPmxEnabeOsdFlag"));
    EXPECT_EQ(0, record("status.fgTimerAlreadySet"));
}

TEST_F(DisplayTimer, TmrIsr_ClearsTheTimersFlagBeforeItLowersTheOther)
{
    started();
    set_record("status.fgTimerAlreadySet", 1);
    set_record("status.fgPmxFormatChangeFlag", 1);
    std::vector<std::string> seen;
    board::at_every_call([&seen](const board::TraceEntry& entry) {
        seen.push_back(entry.brief() + " T" + std::to_string(record("status.fgTimerAlreadySet")) + " F" +
                       std::to_string(record("status.fgPmxFormatChangeFlag")));
    });
    _PMX_TmrIsr(2, nullptr);
    ASSERT_LE(3u, seen.size());
    EXPECT_EQ(R"(LOG0 "PMX timeout.\n" T1 F1)", seen[0]);
    EXPECT_EQ(R"(LOG0 "Display Format Change :0.\n" T0 F1)", seen[1]);
    EXPECT_EQ(R"(LOG0 "Set Osd Enable :1.\n" T0 F0)", seen[2]);
}

TEST_F(DisplayTimer, TmrIsr_InTheTimersContext_NeitherSleepsNorLocks)
{
    started();
    EXPECT_EQ(1u, PMX_SetFormatChangeFlag(TRUE));
    EXPECT_EQ(1u, PMX_SetFormatChangeTimer(10000));
    board::trace::clear();
    board::advance(10s);
    EXPECT_EQ(1u, expiries().size());
    EXPECT_TRACE(std::string(timeout) + mode_ex::lowered);
    EXPECT_EQ(0u, board::misuses());
}
