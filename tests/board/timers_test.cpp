// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"

#include <chrono>
#include <functional>
#include <vector>

#include "u_os.h"

using namespace std::chrono_literals;

namespace
{

struct Expiry
{
    HANDLE_T handle;
    std::intptr_t argument;
    std::chrono::microseconds at;

    bool operator==(const Expiry&) const = default;
};

std::vector<Expiry> expiries;
std::function<void(HANDLE_T)> in_expiry;

extern "C" void timer_test_expiry(HANDLE_T hTimer, void* pvArg)
{
    expiries.push_back({ hTimer, reinterpret_cast<std::intptr_t>(pvArg), board::now() });
    if (in_expiry)
        in_expiry(hTimer);
}

class Timers : public DeviceTest
{
protected:
    void SetUp() override
    {
        DeviceTest::SetUp();
        expiries.clear();
        in_expiry = nullptr;
    }

    static HANDLE_T created()
    {
        HANDLE_T handle = 0;
        EXPECT_EQ(OSR_OK, x_timer_create(&handle));
        return handle;
    }

    static INT32 start(HANDLE_T handle, UINT32 delay, X_TIMER_FLAG_T flag = X_TIMER_FLAG_ONCE,
                       std::intptr_t argument = 0)
    {
        return x_timer_start(handle, delay, flag, timer_test_expiry, reinterpret_cast<void*>(argument));
    }

    static std::string now(std::string_view path) { return member(board::os::state(), "timers" + std::string(path)); }

    /** The trace, one line an entry. */
    static std::vector<std::string> lines()
    {
        std::vector<std::string> all;
        for (const board::TraceEntry& entry : board::trace::entries())
            all.push_back(entry.brief());
        return all;
    }
};

using Expiries = std::vector<Expiry>;
using Lines = std::vector<std::string>;

TEST_F(Timers, Once_ExpiresAtItsMomentAndNoMore)
{
    const HANDLE_T handle = created();
    EXPECT_EQ("[{handle=1, running=0, expiry_us=null, interval_us=0, flag=X_TIMER_FLAG_ONCE, callback=null}]", now(""));
    EXPECT_EQ(OSR_OK, start(handle, 10, X_TIMER_FLAG_ONCE, 42));
    EXPECT_EQ("x_timer_start(1, 10, X_TIMER_FLAG_ONCE, timer_test_expiry, <pointer>) = 0", last_call());
    EXPECT_EQ("[{handle=1, running=1, expiry_us=10000, interval_us=10000, flag=X_TIMER_FLAG_ONCE, "
              "callback=timer_test_expiry}]",
              now(""));
    board::advance(9999us);
    EXPECT_EQ(Expiries{}, expiries);
    board::advance(1us);
    EXPECT_EQ((Expiries{ { 1, 42, 10ms } }), expiries);
    EXPECT_EQ("0", now("[0].running"));
    board::advance(1h);
    EXPECT_EQ(1u, expiries.size());
}

TEST_F(Timers, Repeating_ExpiresAtEveryIntervalOfOneAdvance)
{
    start(created(), 4, X_TIMER_FLAG_REPEAT);
    board::advance(10ms);
    EXPECT_EQ((Expiries{ { 1, 0, 4ms }, { 1, 0, 8ms } }), expiries);
    EXPECT_EQ(10ms, board::now());
    EXPECT_EQ("12000", now("[0].expiry_us"));
    EXPECT_EQ("X_TIMER_FLAG_REPEAT", now("[0].flag"));
    x_timer_stop(1);
    board::advance(10ms);
    EXPECT_EQ(2u, expiries.size());
}

TEST_F(Timers, SeveralTimers_ExpireInOrderOfTimeThenOfStarting)
{
    const HANDLE_T a = created(), b = created(), c = created();
    start(b, 5);
    start(c, 3);
    start(a, 5);
    board::advance(5ms);
    EXPECT_EQ((Expiries{ { c, 0, 3ms }, { b, 0, 5ms }, { a, 0, 5ms } }), expiries);
}

TEST_F(Timers, StartAgain_CountsFromItsFullInterval)
{
    const HANDLE_T handle = created();
    start(handle, 10);
    board::advance(6ms);
    start(handle, 10);
    board::advance(9ms);
    EXPECT_EQ(Expiries{}, expiries);
    board::advance(1ms);
    EXPECT_EQ((Expiries{ { 1, 0, 16ms } }), expiries);
}

TEST_F(Timers, Stop_AndDelete_KeepItFromExpiring)
{
    const HANDLE_T stopped = created(), deleted = created();
    start(stopped, 1);
    start(deleted, 1);
    EXPECT_EQ(OSR_OK, x_timer_stop(stopped));
    EXPECT_EQ("x_timer_stop(1) = 0", last_call());
    EXPECT_EQ(OSR_OK, x_timer_stop(stopped)) << "also when it is not running";
    EXPECT_EQ(OSR_OK, x_timer_delete(deleted));
    EXPECT_EQ("x_timer_delete(2) = 0", last_call());
    board::advance(1s);
    EXPECT_EQ(Expiries{}, expiries);
    EXPECT_EQ("[{handle=1, running=0, expiry_us=null, interval_us=1000, flag=X_TIMER_FLAG_ONCE, "
              "callback=timer_test_expiry}]",
              now(""));
}

TEST_F(Timers, InAnExpiry_StopStartAndDeleteOfItselfAreFine)
{
    const HANDLE_T handle = created();
    in_expiry = [](HANDLE_T timer) { x_timer_stop(timer); };
    start(handle, 2, X_TIMER_FLAG_REPEAT);
    board::advance(10ms);
    EXPECT_EQ(1u, expiries.size());

    in_expiry = [](HANDLE_T timer) { start(timer, 3); };
    start(handle, 1);
    board::advance(8ms);
    EXPECT_EQ((Expiries{ { 1, 0, 2ms }, { 1, 0, 11ms }, { 1, 0, 14ms }, { 1, 0, 17ms } }), expiries);

    in_expiry = [](HANDLE_T timer) { x_timer_delete(timer); };
    board::advance(1s);
    EXPECT_EQ(5u, expiries.size());
    EXPECT_EQ("[]", now(""));
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(Timers, ZeroDelay_ExpiresWhenTimeIsLookedAt)
{
    start(created(), 0);
    EXPECT_EQ(Expiries{}, expiries);
    board::advance(0us);
    EXPECT_EQ((Expiries{ { 1, 0, 0us } }), expiries);
}

TEST_F(Timers, DuringASleep_ExpiresNestedInTheCallThatSleeps)
{
    start(created(), 1);
    board::trace::clear();
    {
        const board::trace::Operation operation("PMX_Reset");
        x_thread_delay(2);
    }
    EXPECT_EQ((Lines{ "x_thread_delay(2)", "NOTICE expiry \"timer 1: timer_test_expiry\"" }), lines());
    EXPECT_EQ(2ms, board::now());
    const auto& entries = board::trace::entries();
    EXPECT_EQ(0u, entries[0].time_us);
    EXPECT_EQ(0u, entries[0].depth);
    EXPECT_EQ(1000u, entries[1].time_us);
    EXPECT_EQ(1u, entries[1].depth);
    EXPECT_EQ("PMX_Reset", entries[1].operation) << "the operation that sleeps is the outermost one";
}

TEST_F(Timers, Expiry_RunsUnderTheNameOfItsFunction)
{
    in_expiry = [](HANDLE_T timer) { x_timer_stop(timer); };
    start(created(), 1);
    board::trace::clear();
    board::advance(1ms);
    EXPECT_EQ((Lines{ "NOTICE expiry \"timer 1: timer_test_expiry\"", "x_timer_stop(1) = 0" }), lines());
    EXPECT_EQ("timer_test_expiry", board::trace::entries()[0].operation);
    EXPECT_EQ("timer_test_expiry", board::trace::entries()[1].operation);
    EXPECT_EQ(0u, board::trace::entries()[1].depth);
    x_timer_stop(1);
    EXPECT_EQ("", board::trace::entries().back().operation);
}

TEST_F(Timers, Expiry_ThatSleeps_IsReported)
{
    in_expiry = [](HANDLE_T) {
        EXPECT_TRUE(board::os::in_timer_context());
        x_thread_delay(5);
    };
    start(created(), 1);
    board::advance(2ms);
    EXPECT_EQ(1u, board::misuses());
    EXPECT_EQ(2ms, board::now());
    EXPECT_FALSE(board::os::in_timer_context());
}

TEST_F(Timers, Start_ThatMakesNoSense_IsReported)
{
    const HANDLE_T handle = created();
    EXPECT_EQ(-1, x_timer_start(handle, 1, X_TIMER_FLAG_ONCE, nullptr, nullptr));
    EXPECT_EQ("NOTICE misuse \"x_timer_start: no expiry function, handle 1\"", last_call());
    EXPECT_EQ(-1, start(handle, 1, static_cast<X_TIMER_FLAG_T>(3)));
    EXPECT_EQ("NOTICE misuse \"x_timer_start: neither once nor repeatedly, handle 1\"", last_call());
    EXPECT_EQ(-1, start(handle, 0, X_TIMER_FLAG_REPEAT));
    EXPECT_EQ("NOTICE misuse \"x_timer_start: repeatedly without an interval, handle 1\"", last_call());
    EXPECT_EQ("0", now("[0].running"));
    EXPECT_EQ(3u, board::misuses());
}

TEST_F(Timers, Faults_AnswerInsteadOfActing)
{
    const HANDLE_T handle = created();
    answer_always("x_timer_start", -1);
    EXPECT_EQ(-1, start(handle, 1));
    EXPECT_EQ("0", now("[0].running"));
    board::faults::clear_all();
    start(handle, 1);
    answer_always("x_timer_stop", -2);
    EXPECT_EQ(-2, x_timer_stop(handle));
    EXPECT_EQ("1", now("[0].running"));
    answer_always("x_timer_delete", -3);
    EXPECT_EQ(-3, x_timer_delete(handle));
    EXPECT_EQ("x_timer_delete(1) = -3", last_call());
    board::advance(1ms);
    EXPECT_EQ(1u, expiries.size());
}

} // namespace
