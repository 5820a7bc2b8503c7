// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/meanwhile.h"

#include <stdexcept>

#include "board/threads.h"
#include "device_test.h"

#include "drv_tve.h"
#include "pmx_hal.h"
#include "u_os.h"

namespace
{

using Lines = std::vector<std::string>;

class Meanwhile : public DeviceTest
{
protected:
    void TearDown() override
    {
        board::trace::set_sink({});
        board::at_every_call({});
        board::meanwhiles::forget_all();
        board::meanwhiles::forget_failures();
        DeviceTest::TearDown();
    }

    /** Each entry with its depth, and behind @ the thread where it is not the first. */
    static Lines trace()
    {
        Lines lines;
        for (const board::TraceEntry& entry : board::trace::entries())
            lines.push_back(std::to_string(entry.depth) + " " + entry.brief() +
                            (entry.thread == 0 ? "" : " @" + std::to_string(entry.thread)));
        return lines;
    }

    static HANDLE_T new_mutex()
    {
        HANDLE_T handle = 0;
        x_sema_create(&handle, X_SEMA_TYPE_MUTEX, 1);
        board::trace::clear();
        return handle;
    }

    static std::string failure()
    {
        try
        {
            board::meanwhiles::rethrow_failure();
        }
        catch (const std::exception& error)
        {
            return error.what();
        }
        return "none";
    }
};

TEST_F(Meanwhile, RunsOnceInsideTheCall_BehindItsEffect)
{
    Lines seen;
    board::meanwhile("PMX_HalSetMode", 1, [&] {
        seen.push_back(member(board::mixer::state(), "mode"));
        PMX_VsyncInit();
    });
    PMX_HalSetMode(0, RES_480P);
    PMX_HalSetMode(0, RES_576P);
    EXPECT_EQ((Lines{ "RES_480P" }), seen);
    EXPECT_EQ((Lines{ "0 PMX_HalSetMode(0, RES_480P)", "1 PMX_VsyncInit()", "0 PMX_HalSetMode(0, RES_576P)" }),
              trace());
}

TEST_F(Meanwhile, TheAnswerIsSettled)
{
    board::meanwhile("i4GetHotPlugStatus", 1, [] { board::hdmi_av::plug(false); });
    EXPECT_EQ(1, i4GetHotPlugStatus());
    EXPECT_EQ(0, i4GetHotPlugStatus());
    board::faults::set({ "i4GetHotPlugStatus", 7, board::Fault::When::On, 1 });
    board::meanwhile("i4GetHotPlugStatus", 1, [] { board::hdmi_av::plug(true); });
    EXPECT_EQ(7, i4GetHotPlugStatus()) << "a fault answers instead of acting; somebody else acts all the same";
    EXPECT_EQ(1, i4GetHotPlugStatus());
}

TEST_F(Meanwhile, OnTheNthCallFromNow_InTheOrderOfArming)
{
    Lines order;
    PMX_VsyncInit();
    board::meanwhile("PMX_VsyncInit", 2, [&] { order.push_back("second"); });
    board::meanwhile("PMX_VsyncInit", 1, [&] { order.push_back("first"); });
    board::meanwhile("PMX_VsyncInit", 2, [&] { order.push_back("second too"); });
    board::meanwhile("PMX_VsyncStop", 1, [&] { order.push_back("never"); });
    PMX_VsyncInit();
    EXPECT_EQ((Lines{ "first" }), order);
    PMX_VsyncInit();
    PMX_VsyncInit();
    EXPECT_EQ((Lines{ "first", "second", "second too" }), order);
    ASSERT_EQ(1u, board::meanwhiles::armed().size());
    EXPECT_EQ("PMX_VsyncStop", board::meanwhiles::armed()[0].function);
}

TEST_F(Meanwhile, WhatItCallsMayBeTheFunctionItself_AndAnotherMeanwhiles)
{
    board::meanwhile("PMX_VsyncInit", 1, [] {
        PMX_VsyncInit();
        PMX_VsyncStop();
    });
    board::meanwhile("PMX_VsyncStop", 1, [] { PMX_VsyncEnable(); });
    PMX_VsyncInit();
    EXPECT_EQ((Lines{ "0 PMX_VsyncInit()", "1 PMX_VsyncInit()", "1 PMX_VsyncStop()", "2 PMX_VsyncEnable()" }), trace());
}

TEST_F(Meanwhile, TakenBack)
{
    bool happened = false;
    const auto arm = [&] { board::meanwhile("PMX_VsyncInit", 1, [&] { happened = true; }); };
    arm();
    board::meanwhiles::forget("PMX_VsyncStop");
    EXPECT_EQ(1u, board::meanwhiles::armed().size());
    board::meanwhiles::forget("PMX_VsyncInit");
    PMX_VsyncInit();
    arm();
    board::meanwhiles::forget_all();
    PMX_VsyncInit();
    arm();
    board::power_on({});
    PMX_VsyncInit();
    EXPECT_FALSE(happened);
}

TEST_F(Meanwhile, RefusesWhatCannotHappen)
{
    const auto refusal = [](const std::string& function, unsigned n) {
        try
        {
            board::meanwhile(function, n, [] {});
        }
        catch (const std::invalid_argument& error)
        {
            return std::string(error.what());
        }
        return std::string("taken");
    };
    EXPECT_EQ("no platform function is called PMX_VsyncIni; did you mean PMX_VsyncInit?",
              refusal("PMX_VsyncIni", 1).substr(0, 72));
    EXPECT_EQ("calls of PMX_VsyncInit are counted from 1", refusal("PMX_VsyncInit", 0));
    EXPECT_TRUE(board::meanwhiles::armed().empty());
}

TEST_F(Meanwhile, WhatItThrows_EndsThere_AndIsKept)
{
    board::meanwhile("PMX_VsyncInit", 1, [] { throw std::runtime_error("one"); });
    board::meanwhile("PMX_VsyncInit", 1, [] { throw std::runtime_error("two"); }, { .thread = true });
    bool went_on = false;
    board::meanwhile("PMX_VsyncInit", 1, [&] { went_on = true; });
    PMX_VsyncInit();
    EXPECT_TRUE(went_on);
    EXPECT_EQ(1u, board::trace::entries().size());
    EXPECT_EQ("one", failure());
    EXPECT_EQ("none", failure());
}

TEST_F(Meanwhile, TheSinkGetsItBeforeTheCallThatItIsIn)
{
    Lines lines;
    board::trace::set_sink([&](const board::TraceEntry& entry) { lines.push_back(entry.brief()); });
    board::meanwhile("PMX_VsyncInit", 1, [] { PMX_VsyncStop(); });
    PMX_VsyncInit();
    EXPECT_EQ((Lines{ "PMX_VsyncStop()", "PMX_VsyncInit()" }), lines);
}

TEST_F(Meanwhile, AtEveryCall_BehindTheEffect_AndNotForItself)
{
    Lines lines;
    board::at_every_call([&](const board::TraceEntry& entry) {
        lines.push_back(entry.brief());
        EXPECT_EQ("RES_480P", member(board::mixer::state(), "mode"));
        PMX_VsyncInit();
    });
    PMX_HalSetMode(0, RES_480P);
    board::trace::notice("plug", "out");
    PMX_IsLog(1, "log");
    EXPECT_EQ((Lines{ "PMX_HalSetMode(0, RES_480P)", "LOG1 \"log\"" }), lines);
    board::at_every_call({});
    PMX_HalSetMode(0, RES_480P);
    EXPECT_EQ(2u, lines.size());
}

TEST_F(Meanwhile, AtEveryCall_MayClearTheTraceAndPowerTheBoardOn)
{
    board::at_every_call([](const board::TraceEntry&) { board::trace::clear(); });
    PMX_HalSetMode(0, RES_480P);
    EXPECT_TRUE(board::trace::entries().empty());
    board::at_every_call([](const board::TraceEntry&) { board::power_on({}); });
    EXPECT_EQ(-1, get_part_id_by_name("none"));
    EXPECT_TRUE(board::trace::entries().empty());
    unsigned calls = 0;
    board::at_every_call([&](const board::TraceEntry&) { ++calls; });
    board::meanwhile("PMX_VsyncInit", 1, [] { board::trace::clear(); });
    PMX_VsyncInit();
    EXPECT_EQ(0u, calls) << "of what is forgotten nothing can be told";
    PMX_VsyncInit();
    EXPECT_EQ(1u, calls);
    board::at_every_call({});
    PMX_VsyncInit();
    EXPECT_EQ(0u, board::trace::entries().back().depth);
}

/* Threads */

using Threads = Meanwhile;

void lock_and_unlock(HANDLE_T mutex)
{
    const board::trace::Operation scope("Theirs");
    const INT32 locked = x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
    PMX_VsyncEnable();
    if (locked == OSR_OK)
        x_sema_unlock(mutex);
}

TEST_F(Threads, FreeMutex_RunsThroughInsideTheCall)
{
    const HANDLE_T mutex = new_mutex();
    board::meanwhile("PMX_VsyncInit", 1, [=] { lock_and_unlock(mutex); }, { .thread = true });
    PMX_VsyncInit();
    PMX_VsyncStop();
    EXPECT_EQ((Lines{ "0 PMX_VsyncInit()", "1 x_sema_lock(1, X_SEMA_OPTION_WAIT) = 0 @1", "1 PMX_VsyncEnable() @1",
                      "1 x_sema_unlock(1) = 0 @1", "0 PMX_VsyncStop()" }),
              trace());
    EXPECT_EQ("Theirs", board::trace::entries()[1].operation);
    EXPECT_EQ("", board::trace::entries()[4].operation);
}

TEST_F(Threads, HeldMutex_WaitsAndGoesOnInsideTheRelease)
{
    const HANDLE_T mutex = new_mutex();
    board::meanwhile("PMX_VsyncInit", 1, [=] { lock_and_unlock(mutex); }, { .thread = true });
    {
        const board::trace::Operation scope("Ours");
        x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
        PMX_VsyncInit();
        EXPECT_EQ((Lines{ "Theirs waits for mutex 1" }), board::threads::waiting());
        PMX_VsyncStop();
        x_sema_unlock(mutex);
        PMX_VsyncDisable();
    }
    EXPECT_EQ((Lines{ "0 x_sema_lock(1, X_SEMA_OPTION_WAIT) = 0", "0 PMX_VsyncInit()",
                      "1 x_sema_lock(1, X_SEMA_OPTION_WAIT) = 0 @1", "2 NOTICE thread \"Theirs waits for mutex 1\" @1",
                      "0 PMX_VsyncStop()", "0 x_sema_unlock(1) = 0", "2 NOTICE thread \"Theirs goes on\" @1",
                      "1 PMX_VsyncEnable() @1", "1 x_sema_unlock(1) = 0 @1", "0 PMX_VsyncDisable()" }),
              trace());
    EXPECT_TRUE(board::threads::waiting().empty());
    EXPECT_EQ(0u, board::misuses());
    EXPECT_EQ("Ours", board::trace::entries().back().operation);
}

TEST_F(Threads, TheSameThreadNested_IsTheDeadlockThatItAlwaysWas)
{
    const HANDLE_T mutex = new_mutex();
    board::meanwhile("PMX_VsyncInit", 1, [=] { lock_and_unlock(mutex); });
    x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
    PMX_VsyncInit();
    x_sema_unlock(mutex);
    EXPECT_EQ(1u, board::misuses());
    EXPECT_EQ("2 NOTICE misuse \"x_sema_lock: a second lock by the holder, handle 1\"", trace().at(3));
}

TEST_F(Threads, WhoDoesNotWantToWait_DoesNot)
{
    const HANDLE_T mutex = new_mutex();
    INT32 answer = 0;
    board::meanwhile("PMX_VsyncInit", 1, [&] { answer = x_sema_lock(mutex, X_SEMA_OPTION_NOWAIT); },
                     { .thread = true });
    x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
    PMX_VsyncInit();
    EXPECT_EQ(-1, answer);
    EXPECT_EQ(0u, board::misuses());
    x_sema_unlock(mutex);
}

TEST_F(Threads, SeveralWait_EachGoesOnAtItsTurn)
{
    const HANDLE_T mutex = new_mutex();
    Lines order;
    for (const char* const name : { "a", "b", "c" })
        board::meanwhile("PMX_VsyncInit", 1,
                         [&order, mutex, name] {
                             x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
                             order.push_back(name);
                             x_sema_unlock(mutex);
                         },
                         { .thread = true, .name = name });
    x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
    PMX_VsyncInit();
    EXPECT_EQ((Lines{ "a waits for mutex 1", "b waits for mutex 1", "c waits for mutex 1" }),
              board::threads::waiting());
    x_sema_unlock(mutex);
    EXPECT_EQ((Lines{ "a", "b", "c" }), order);
    EXPECT_TRUE(board::threads::waiting().empty());
}

TEST_F(Threads, AThreadThatKeepsTheMutex_KeepsTheOthersWaiting)
{
    const HANDLE_T mutex = new_mutex();
    board::meanwhile("PMX_VsyncInit", 1, [=] { x_sema_lock(mutex, X_SEMA_OPTION_WAIT); }, { .thread = true });
    board::meanwhile("PMX_VsyncInit", 1, [=] { lock_and_unlock(mutex); }, { .thread = true });
    PMX_VsyncInit();
    EXPECT_EQ(1u, board::threads::waiting().size());
    EXPECT_EQ(-1, x_sema_lock(mutex, X_SEMA_OPTION_WAIT));
    EXPECT_EQ("NOTICE misuse \"x_sema_lock: nobody is left to give the semaphore, handle 1\"",
              board::trace::entries().back().brief());
    x_sema_unlock(mutex);
    EXPECT_TRUE(board::threads::waiting().empty());
}

TEST_F(Threads, ASecondLockByTheHolder_IsRefusedInAnyThread)
{
    const HANDLE_T mutex = new_mutex();
    board::meanwhile("PMX_VsyncInit", 1,
                     [=] {
                         x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
                         EXPECT_EQ(-1, x_sema_lock(mutex, X_SEMA_OPTION_WAIT));
                         x_sema_unlock(mutex);
                     },
                     { .thread = true });
    PMX_VsyncInit();
    EXPECT_EQ(1u, board::misuses());
    EXPECT_TRUE(board::threads::waiting().empty());
}

TEST_F(Threads, EachGoesOnWithWhatItWaitsFor)
{
    const HANDLE_T first = new_mutex();
    const HANDLE_T second = new_mutex();
    Lines order;
    for (const HANDLE_T mutex : { first, second })
        board::meanwhile("PMX_VsyncInit", 1,
                         [&order, mutex] {
                             x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
                             order.push_back(std::to_string(mutex));
                             x_sema_unlock(mutex);
                         },
                         { .thread = true });
    x_sema_lock(first, X_SEMA_OPTION_WAIT);
    x_sema_lock(second, X_SEMA_OPTION_WAIT);
    PMX_VsyncInit();
    x_sema_unlock(second);
    EXPECT_EQ((Lines{ "2" }), order);
    x_sema_unlock(first);
    EXPECT_EQ((Lines{ "2", "1" }), order);
}

TEST_F(Threads, WhileTheyAreEnded_NobodyWaitsAgain)
{
    const HANDLE_T first = new_mutex();
    const HANDLE_T second = new_mutex();
    std::vector<INT32> answers;
    board::meanwhile("PMX_VsyncInit", 1,
                     [&] {
                         for (const HANDLE_T mutex : { first, second })
                             answers.push_back(x_sema_lock(mutex, X_SEMA_OPTION_WAIT));
                     },
                     { .thread = true });
    x_sema_lock(first, X_SEMA_OPTION_WAIT);
    x_sema_lock(second, X_SEMA_OPTION_WAIT);
    PMX_VsyncInit();
    board::threads::end_all();
    EXPECT_EQ((std::vector<INT32>{ -1, -1 }), answers);
}

TEST_F(Threads, Semaphore_IsWaitedForToo)
{
    HANDLE_T semaphore = 0;
    x_sema_create(&semaphore, X_SEMA_TYPE_BINARY, 0);
    bool has_it = false;
    board::meanwhile("PMX_VsyncInit", 1, [&] { has_it = x_sema_lock(semaphore, X_SEMA_OPTION_WAIT) == OSR_OK; },
                     { .thread = true });
    PMX_VsyncInit();
    EXPECT_EQ((Lines{ "meanwhile inside PMX_VsyncInit waits for semaphore 1" }), board::threads::waiting());
    x_sema_unlock(semaphore);
    EXPECT_TRUE(has_it);
}

TEST_F(Threads, DeletedWhileOneWaits_TheWaitNeverEnds)
{
    HANDLE_T semaphore = 0;
    x_sema_create(&semaphore, X_SEMA_TYPE_COUNTING, 0);
    INT32 answer = 0;
    board::meanwhile("PMX_VsyncInit", 1, [&] { answer = x_sema_lock(semaphore, X_SEMA_OPTION_WAIT); },
                     { .thread = true });
    PMX_VsyncInit();
    x_sema_delete(semaphore);
    board::threads::end_all();
    EXPECT_EQ(-1, answer);
    EXPECT_EQ(1u, board::misuses());
}

TEST_F(Threads, NobodyGivesIt_EndsAsAMisuse_AndTheThreadRunsToItsEnd)
{
    const HANDLE_T mutex = new_mutex();
    board::meanwhile("PMX_VsyncInit", 1, [=] { lock_and_unlock(mutex); }, { .thread = true });
    x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
    PMX_VsyncInit();
    board::trace::clear();
    board::threads::end_all();
    EXPECT_EQ((Lines{ "0 NOTICE misuse \"thread: Theirs waits for mutex 1, which nobody gives back\"",
                      "0 PMX_VsyncEnable() @1" }),
              trace());
    EXPECT_EQ(1u, board::misuses());
    board::threads::end_all();
    EXPECT_EQ(1u, board::misuses());
}

TEST_F(Threads, PowerOn_EndsThem_ButNotFromOneOfThem)
{
    const HANDLE_T mutex = new_mutex();
    bool ended = false;
    board::meanwhile("PMX_VsyncInit", 1,
                     [&] {
                         x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
                         ended = true;
                     },
                     { .thread = true });
    x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
    PMX_VsyncInit();
    board::power_on({});
    EXPECT_TRUE(ended);
    EXPECT_EQ(0u, board::misuses());
    EXPECT_TRUE(board::trace::entries().empty());

    board::meanwhile("PMX_VsyncInit", 1, [] { board::power_on({}); }, { .thread = true });
    PMX_VsyncInit();
    EXPECT_EQ("only the board's own thread ends the others", failure());
}

TEST_F(Threads, TimersContext_IsOfTheThreadThatItRunsIn)
{
    HANDLE_T timer = 0;
    x_timer_create(&timer);
    x_timer_start(
        timer, 1, X_TIMER_FLAG_ONCE, [](HANDLE_T, void*) { PMX_VsyncInit(); }, nullptr);
    board::meanwhile("PMX_VsyncInit", 1, [] { x_thread_delay(1); }, { .thread = true });
    board::advance(std::chrono::milliseconds(1));
    EXPECT_EQ(0u, board::misuses()) << "another thread may sleep while the timers' does not";
    EXPECT_EQ(2000, board::now().count());
}

TEST_F(Threads, NestedMeanwhiles_EachInItsOwn)
{
    const HANDLE_T mutex = new_mutex();
    board::meanwhile("PMX_VsyncInit", 1,
                     [=] {
                         const board::trace::Operation scope("Outer");
                         x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
                         PMX_VsyncStop();
                         x_sema_unlock(mutex);
                     },
                     { .thread = true });
    board::meanwhile("PMX_VsyncStop", 1, [=] { lock_and_unlock(mutex); }, { .thread = true });
    PMX_VsyncInit();
    EXPECT_EQ((Lines{ "0 PMX_VsyncInit()", "1 x_sema_lock(1, X_SEMA_OPTION_WAIT) = 0 @1", "1 PMX_VsyncStop() @1",
                      "2 x_sema_lock(1, X_SEMA_OPTION_WAIT) = 0 @2", "3 NOTICE thread \"Theirs waits for mutex 1\" @2",
                      "1 x_sema_unlock(1) = 0 @1", "3 NOTICE thread \"Theirs goes on\" @2", "2 PMX_VsyncEnable() @2",
                      "2 x_sema_unlock(1) = 0 @2" }),
              trace());
}

} // namespace
