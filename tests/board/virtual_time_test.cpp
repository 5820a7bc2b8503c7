// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Simulated time costs what happens in it, and nothing for passing. */
#include "device_test.h"

#include <algorithm>
#include <chrono>
#include <ctime>
#include <limits>

#include "u_os.h"

using namespace std::chrono_literals;

namespace
{

unsigned counted_expiries;

extern "C" void virtual_time_expiry(HANDLE_T, void*)
{
    ++counted_expiries;
}

class VirtualTime : public DeviceTest
{
protected:
    void SetUp() override
    {
        DeviceTest::SetUp();
        counted_expiries = 0;
    }

    static void start_timer(UINT32 milliseconds, X_TIMER_FLAG_T flag)
    {
        HANDLE_T timer = 0;
        ASSERT_EQ(OSR_OK, x_timer_create(&timer));
        ASSERT_EQ(OSR_OK, x_timer_start(timer, milliseconds, flag, virtual_time_expiry, nullptr));
    }

    /** Processor time, in nanoseconds, of letting this much virtual time pass; the least of some tries. */
    static std::int64_t cost_of(std::chrono::microseconds passing)
    {
        const auto spent = [] {
            timespec time = {};
            clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
            return std::int64_t{ time.tv_sec } * 1'000'000'000 + time.tv_nsec;
        };
        std::int64_t least = std::numeric_limits<std::int64_t>::max();
        for (int tries = 0; tries < 9; ++tries)
        {
            board::trace::clear();
            const std::int64_t before = spent();
            board::advance(passing);
            least = std::min(least, spent() - before);
        }
        return least;
    }
};

// What happens in ten minutes is what the board does then: no step for time that passes alone.
TEST_F(VirtualTime, TenMinutes_TakeAsManyStepsAsTimersExpire)
{
    start_timer(1'000, X_TIMER_FLAG_REPEAT);
    start_timer(10'000, X_TIMER_FLAG_REPEAT);
    start_timer(599'999, X_TIMER_FLAG_ONCE);
    board::trace::clear();
    board::advance(10min);
    const unsigned once_a_second = 600;
    const unsigned every_ten_seconds = 60;
    EXPECT_EQ(once_a_second + every_ten_seconds + 1, counted_expiries);
    EXPECT_EQ(counted_expiries, board::trace::entries().size())
        << "one notice for each expiry, and nothing else happens";
    EXPECT_EQ(10min, board::now());
}

// A board that looked at its timers at every tick would need ten times as long for ten times the time.
TEST_F(VirtualTime, LongSilence_CostsNoMoreThanAShortOne)
{
    start_timer(2'000'000'000, X_TIMER_FLAG_REPEAT);
    const std::int64_t minute = cost_of(1min);
    const std::int64_t ten_minutes = cost_of(10min);
    EXPECT_LT(ten_minutes, 5 * minute + 10'000) << "nanoseconds; one minute took " << minute;
    EXPECT_EQ(0u, counted_expiries);
}

} // namespace
