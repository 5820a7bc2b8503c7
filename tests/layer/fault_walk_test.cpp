// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The n-th platform call with a result fails, for every n: start-up and shut-down always go on to their end. */
#include <algorithm>
#include <map>

#include "tests/support/layer_fixture.h"

namespace
{

struct Point
{
    std::string function;
    unsigned n; ///< which of its calls
};

struct Outcome
{
    std::vector<std::string> calls;
    std::vector<Point> points; ///< calls with a result
    unsigned logs = 0;
    unsigned asserts = 0;
};

Outcome observe(const std::function<void()>& operation)
{
    Outcome outcome;
    std::map<std::string, unsigned> seen;
    board::trace::clear();
    operation();
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        using Kind = board::TraceEntry::Kind;
        outcome.logs += entry.kind == Kind::Log ? 1 : 0;
        outcome.asserts += entry.kind == Kind::Assert ? 1 : 0;
        if (entry.kind != Kind::Call)
            continue;
        outcome.calls.push_back(entry.function);
        if (entry.result)
            outcome.points.push_back({ entry.function, ++seen[entry.function] });
    }
    board::trace::clear();
    return outcome;
}

/** Answers that are failures of whatever kind: negative, a positive code, the largest. */
constexpr std::int64_t answers[] = { -1, 1, 0x7FFFFFFF };

} // namespace

class FaultWalk : public LayerTest
{
protected:
    /** What an operation calls when this point fails: the same, but that planes reported as swapped leave the second
     *  one alone. */
    static std::vector<std::string> expected_calls(const Outcome& clean, const Point& point)
    {
        std::vector<std::string> calls = clean.calls;
        if (point.function == "fgPmxHalSwapPlane1_2")
            std::erase(calls, "vPmxNotMixPlane");
        return calls;
    }

    void walk(std::size_t number_of_points, const std::vector<std::string>& asserting,
              const std::function<void()>& prepare, const std::function<void()>& operation,
              const std::function<void(const Point&, std::int64_t)>& check)
    {
        prepare();
        const Outcome clean = observe(operation);
        ASSERT_EQ(number_of_points, clean.points.size());
        EXPECT_EQ(0u, clean.asserts);
        for (const Point& point : clean.points)
        {
            for (const std::int64_t answer : answers)
            {
                SCOPED_TRACE(point.function + " call " + std::to_string(point.n) + " answers " +
                             std::to_string(answer));
                power_on();
                prepare();
                board::faults::set({ point.function, answer, board::Fault::When::On, point.n });
                const Outcome faulted = observe(operation);
                EXPECT_EQ(expected_calls(clean, point), faulted.calls);
                const bool asserts = std::find(asserting.begin(), asserting.end(), point.function) != asserting.end();
                EXPECT_EQ(asserts ? 1u : 0u, faulted.asserts);
                const bool is_logged = point.function.starts_with("i4Im") && answer < 0;
                EXPECT_EQ(clean.logs + (is_logged ? 1 : 0), faulted.logs);
                check(point, answer);
                expect_asserts(faulted.asserts);
            }
        }
    }
};

TEST_F(FaultWalk, Init_AnyCallFails_GoesOnToItsEnd)
{
    walk(
        16, { "x_sema_create", "x_timer_create" }, [] {}, [] { PMX_Init(); },
        [](const Point& point, std::int64_t) {
            EXPECT_EQ(1, record("_PmxInitiated"));
            EXPECT_EQ(point.function == "x_sema_create", record("MutexPMX") == 0);
            EXPECT_EQ(point.function == "x_timer_create", record("status.hPMXTimer") == 0);
            EXPECT_EQ(point.function == "i4NFBPartitionRead" || point.function == "get_part_id_by_name" ? RES_480I
                                                                                                        : RES_1080P60HZ,
                      record("ucMode"));
        });
}

TEST_F(FaultWalk, Uninit_AnyCallFails_GoesOnToItsEnd)
{
    walk(
        4, { "x_timer_delete", "x_sema_delete" }, [] { started(); }, [] { PMX_Uninit(); },
        [](const Point&, std::int64_t) {
            EXPECT_EQ(0, record("_PmxInitiated"));
            EXPECT_EQ(0, record("MutexPMX"));
        });
}

TEST_F(FaultWalk, i4Uninit_AnyCallFails_GoesOnToItsEndAndReportsTheMutexAlone)
{
    INT32 result = 1;
    walk(
        3, { "x_timer_delete" }, [] { started(); }, [&result] { result = i4PMX_Uninit(0); },
        [&result](const Point& point, std::int64_t) {
            const bool mutex_stays = point.function == "x_sema_delete";
            EXPECT_EQ(mutex_stays ? -1 : 0, result);
            EXPECT_EQ(mutex_stays ? 1 : 0, record("MutexPMX"));
            EXPECT_EQ(0, record("_PmxInitiated"));
        });
}

TEST_F(FaultWalk, Reset_AnyCallFails_GoesOnToItsEnd)
{
    walk(
        12, {}, [] {}, [] { PMX_Reset(0); },
        [](const Point& point, std::int64_t) {
            const bool read_failed = point.function == "i4NFBPartitionRead" || point.function == "get_part_id_by_name";
            EXPECT_EQ(read_failed ? RES_480I : RES_1080P60HZ, record("ucMode"));
        });
}
