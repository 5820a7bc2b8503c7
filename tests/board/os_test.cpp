// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"

#include <chrono>
#include <cstdarg>
#include <limits>

#include "u_os.h"

using namespace std::chrono_literals;

namespace
{

class Os : public DeviceTest
{
protected:
    static HANDLE_T semaphore(X_SEMA_TYPE_T type, UINT32 value)
    {
        HANDLE_T handle = 0;
        EXPECT_EQ(OSR_OK, x_sema_create(&handle, type, value));
        return handle;
    }
    static HANDLE_T mutex() { return semaphore(X_SEMA_TYPE_MUTEX, 1); }

    static std::string now(std::string_view path) { return member(board::os::state(), path); }

    /** Message of the last misuse; empty when nothing was reported since power-on. */
    static std::string misuse()
    {
        std::string text;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.kind == board::TraceEntry::Kind::Notice && entry.function == "misuse")
                text = entry.text;
        }
        return text;
    }

    /** The last call's line, notices apart. */
    static std::string call()
    {
        std::string line;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.kind == board::TraceEntry::Kind::Call)
                line = entry.brief();
        }
        return line;
    }
};

TEST_F(Os, Create_YieldsSmallHandlesThatAreNeverUsedAgain)
{
    HANDLE_T handle = 9;
    EXPECT_EQ(OSR_OK, x_sema_create(&handle, X_SEMA_TYPE_MUTEX, 1));
    EXPECT_EQ(1u, handle);
    EXPECT_EQ("x_sema_create(1, X_SEMA_TYPE_MUTEX, 1) = 0", last_call());
    EXPECT_EQ(OSR_OK, x_timer_create(&handle));
    EXPECT_EQ(2u, handle);
    EXPECT_EQ("x_timer_create(2) = 0", last_call());
    EXPECT_EQ(OSR_OK, x_timer_delete(2));
    EXPECT_EQ(OSR_OK, x_timer_create(&handle));
    EXPECT_EQ(3u, handle);
    power_on({});
    EXPECT_EQ(OSR_OK, x_timer_create(&handle));
    EXPECT_EQ(1u, handle);
}

TEST_F(Os, Create_Refused_LeavesTheHandleAlone)
{
    HANDLE_T handle = 9;
    EXPECT_EQ(-1, x_sema_create(&handle, X_SEMA_TYPE_MUTEX, 2));
    EXPECT_EQ(-1, x_sema_create(&handle, X_SEMA_TYPE_BINARY, 2));
    EXPECT_EQ(-1, x_sema_create(&handle, static_cast<X_SEMA_TYPE_T>(3), 1));
    EXPECT_EQ(9u, handle);
    EXPECT_EQ("x_sema_create(9, 3, 1) = -1", call());
    EXPECT_EQ("x_sema_create: no such type, or it cannot begin with this value", misuse());
    EXPECT_EQ(-1, x_sema_create(nullptr, X_SEMA_TYPE_MUTEX, 1));
    EXPECT_EQ("x_sema_create: nowhere to put the handle", misuse());
    EXPECT_EQ(-1, x_timer_create(nullptr));
    EXPECT_EQ("x_timer_create(null) = -1", call());
    EXPECT_EQ("x_timer_create: nowhere to put the handle", misuse());
    EXPECT_EQ(5u, board::misuses());
}

TEST_F(Os, Mutex_LockUnlockDelete)
{
    const HANDLE_T handle = mutex();
    EXPECT_EQ("{handle=1, held=0}", now("mutexes[0]"));
    EXPECT_FALSE(board::os::mutex_held(handle));
    EXPECT_EQ(OSR_OK, x_sema_lock(handle, X_SEMA_OPTION_WAIT));
    EXPECT_EQ("x_sema_lock(1, X_SEMA_OPTION_WAIT) = 0", last_call());
    EXPECT_TRUE(board::os::mutex_held(handle));
    EXPECT_EQ("{handle=1, held=1}", now("mutexes[0]"));
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle));
    EXPECT_EQ("x_sema_unlock(1) = 0", last_call());
    EXPECT_EQ(OSR_OK, x_sema_lock(handle, X_SEMA_OPTION_NOWAIT));
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle));
    EXPECT_EQ(OSR_OK, x_sema_delete(handle));
    EXPECT_EQ("x_sema_delete(1) = 0", last_call());
    EXPECT_EQ("[]", now("mutexes"));
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(Os, Mutex_SecondLockByHolder_IsReportedAndDoesNotHang)
{
    const HANDLE_T handle = mutex();
    x_sema_lock(handle, X_SEMA_OPTION_WAIT);
    EXPECT_EQ(-1, x_sema_lock(handle, X_SEMA_OPTION_WAIT));
    EXPECT_EQ("x_sema_lock: a second lock by the holder, handle 1", misuse());
    EXPECT_EQ(-1, x_sema_lock(handle, X_SEMA_OPTION_NOWAIT));
    EXPECT_EQ(2u, board::misuses());
    EXPECT_EQ("BOARD misuse: x_sema_lock: a second lock by the holder, handle 1\n"
              "BOARD misuse: x_sema_lock: a second lock by the holder, handle 1\n",
              board::console_text());
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle)) << "one lock was taken, one is given back";
    EXPECT_FALSE(board::os::mutex_held(handle));
}

TEST_F(Os, Mutex_CreatedTaken_IsHeld)
{
    const HANDLE_T handle = semaphore(X_SEMA_TYPE_MUTEX, 0);
    EXPECT_TRUE(board::os::mutex_held(handle));
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle));
}

TEST_F(Os, Mutex_UnlockWithoutLock_IsReported)
{
    const HANDLE_T handle = mutex();
    EXPECT_EQ(-1, x_sema_unlock(handle));
    EXPECT_EQ("x_sema_unlock: unlock without lock, handle 1", misuse());
    EXPECT_EQ("x_sema_unlock(1) = -1", call());
}

TEST_F(Os, Mutex_DeleteWhileHeld_IsReportedAndLeavesItUsable)
{
    const HANDLE_T handle = mutex();
    x_sema_lock(handle, X_SEMA_OPTION_WAIT);
    EXPECT_EQ(-1, x_sema_delete(handle));
    EXPECT_EQ("x_sema_delete: delete while held, handle 1", misuse());
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle));
    EXPECT_EQ(OSR_OK, x_sema_delete(handle));
}

TEST_F(Os, Semaphore_Binary)
{
    const HANDLE_T handle = semaphore(X_SEMA_TYPE_BINARY, 0);
    EXPECT_EQ("{handle=1, type=X_SEMA_TYPE_BINARY, count=0}", now("semaphores[0]"));
    EXPECT_EQ(-1, x_sema_lock(handle, X_SEMA_OPTION_NOWAIT));
    EXPECT_EQ(0u, board::misuses()) << "not to wait is what was asked for";
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle));
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle));
    EXPECT_EQ("1", now("semaphores[0].count")) << "it is free or taken, nothing else";
    EXPECT_EQ(OSR_OK, x_sema_lock(handle, X_SEMA_OPTION_WAIT));
    EXPECT_EQ(-1, x_sema_lock(handle, X_SEMA_OPTION_WAIT));
    EXPECT_EQ("x_sema_lock: nobody is left to give the semaphore, handle 1", misuse());
    EXPECT_EQ(OSR_OK, x_sema_delete(handle)) << "nobody owns it";
}

TEST_F(Os, Semaphore_Counting)
{
    const HANDLE_T handle = semaphore(X_SEMA_TYPE_COUNTING, 2);
    EXPECT_EQ(OSR_OK, x_sema_lock(handle, X_SEMA_OPTION_WAIT));
    EXPECT_EQ(OSR_OK, x_sema_lock(handle, X_SEMA_OPTION_WAIT));
    EXPECT_EQ(-1, x_sema_lock(handle, X_SEMA_OPTION_NOWAIT));
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle));
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle));
    EXPECT_EQ(OSR_OK, x_sema_unlock(handle));
    EXPECT_EQ("{handle=1, type=X_SEMA_TYPE_COUNTING, count=3}", now("semaphores[0]"));
    const HANDLE_T full = semaphore(X_SEMA_TYPE_COUNTING, std::numeric_limits<UINT32>::max());
    EXPECT_EQ(-1, x_sema_unlock(full)) << "no further";
    EXPECT_EQ("4294967295", now("semaphores[1].count"));
}

TEST_F(Os, Handle0_FailsByDesign)
{
    EXPECT_EQ(-1, x_sema_lock(0, X_SEMA_OPTION_WAIT));
    EXPECT_EQ("NOTICE semaphore \"x_sema_lock: semaphore call with handle 0, by design\"", last_call());
    EXPECT_EQ(-1, x_sema_unlock(0));
    EXPECT_EQ(-1, x_sema_delete(0));
    EXPECT_EQ(-1, x_timer_start(
                      0, 1, X_TIMER_FLAG_ONCE, [](HANDLE_T, void*) {}, nullptr));
    EXPECT_EQ("NOTICE timer \"x_timer_start: timer call with handle 0, by design\"", last_call());
    EXPECT_EQ(-1, x_timer_stop(0));
    EXPECT_EQ("x_timer_stop(0) = -1", call());
    EXPECT_EQ(-1, x_timer_delete(0));
    EXPECT_EQ("x_timer_delete(0) = -1", call());
    EXPECT_EQ(0u, board::misuses());
    EXPECT_EQ("", board::console_text());
}

TEST_F(Os, UnknownHandle_IsReported)
{
    EXPECT_EQ(-1, x_sema_lock(7, X_SEMA_OPTION_WAIT));
    EXPECT_EQ("x_sema_lock: no semaphore has handle 7", misuse());
    EXPECT_EQ(-1, x_sema_unlock(7));
    EXPECT_EQ("x_sema_unlock: no semaphore has handle 7", misuse());
    const HANDLE_T handle = mutex();
    EXPECT_EQ(-1, x_timer_stop(handle)) << "a semaphore is no timer";
    EXPECT_EQ("x_timer_stop: no timer has handle 1 any more", misuse());
    x_sema_delete(handle);
    EXPECT_EQ(-1, x_sema_delete(handle));
    EXPECT_EQ("x_sema_delete: no semaphore has handle 1 any more", misuse());
    EXPECT_EQ(-1, x_timer_delete(8));
    EXPECT_EQ(-1, x_timer_start(8, 1, X_TIMER_FLAG_ONCE, nullptr, nullptr));
    EXPECT_EQ(6u, board::misuses());
}

TEST_F(Os, Faults_AnswerInsteadOfActing)
{
    HANDLE_T handle = 9;
    answer_always("x_sema_create", -3);
    EXPECT_EQ(-3, x_sema_create(&handle, X_SEMA_TYPE_MUTEX, 1));
    EXPECT_EQ(9u, handle);
    EXPECT_EQ("x_sema_create(9, X_SEMA_TYPE_MUTEX, 1) = -3", last_call());
    answer_always("x_timer_create", -4);
    EXPECT_EQ(-4, x_timer_create(&handle));
    EXPECT_EQ("x_timer_create(9) = -4", last_call());
    board::faults::clear_all();
    const HANDLE_T made = mutex();
    answer_always("x_sema_lock", -5);
    EXPECT_EQ(-5, x_sema_lock(made, X_SEMA_OPTION_WAIT));
    EXPECT_FALSE(board::os::mutex_held(made));
    answer_always("x_sema_delete", -6);
    EXPECT_EQ(-6, x_sema_delete(made));
    EXPECT_EQ("[{handle=1, held=0}]", now("mutexes"));
}

TEST_F(Os, FailingUnlock_ActsAndThenAnswers)
{
    const HANDLE_T handle = mutex();
    x_sema_lock(handle, X_SEMA_OPTION_WAIT);
    answer_always("x_sema_unlock", -7);
    EXPECT_EQ(-7, x_sema_unlock(handle));
    EXPECT_TRUE(board::trace::entries().back().faulted);
    EXPECT_FALSE(board::os::mutex_held(handle));
    EXPECT_EQ(0u, board::misuses());
    EXPECT_EQ(-7, x_sema_unlock(handle)) << "a misuse is a misuse, whatever is answered";
    EXPECT_EQ(1u, board::misuses());
}

TEST_F(Os, ThreadDelay_LetsTimePass)
{
    x_thread_delay(3);
    EXPECT_EQ(3ms, board::now());
    EXPECT_EQ("x_thread_delay(3)", last_call());
    x_thread_delay(0);
    x_thread_delay(std::numeric_limits<UINT32>::max());
    EXPECT_EQ(3ms + 4294967295ms, board::now());
    EXPECT_EQ("4294967298000", now("now_us"));
}

TEST_F(Os, Advance_RefusesToGoBackOrOnForEver)
{
    board::advance(250us);
    EXPECT_THROW(board::advance(-1us), std::invalid_argument);
    EXPECT_THROW(board::advance(std::chrono::microseconds::max()), std::invalid_argument);
    EXPECT_EQ(250us, board::now());
}

DRV_PRINTF_FORMAT(3, 4)
INT32 formatted(CHAR* buffer, size_t size, const CHAR* format, ...)
{
    std::va_list values;
    va_start(values, format);
    const INT32 length = x_vsnprintf(buffer, size, format, values);
    va_end(values);
    return length;
}

TEST_F(Os, Vsnprintf_CutsAndTerminates)
{
    CHAR buffer[6] = "#####";
    EXPECT_EQ(4, formatted(buffer, sizeof buffer, "%d %s", 12, "x"));
    EXPECT_STREQ("12 x", buffer);
    EXPECT_EQ("x_vsnprintf(\"12 x\", 6, \"%d %s\") = 4", last_call());
    EXPECT_EQ(9, formatted(buffer, sizeof buffer, "%s%d", "abcdef", 789));
    EXPECT_STREQ("abcde", buffer);
    EXPECT_EQ("x_vsnprintf(\"abcde\", 6, \"%s%d\") = 9", last_call());
    const CHAR* volatile null = nullptr; // or the compiler knows better
    EXPECT_EQ(6, formatted(buffer, 1, "%s", null));
    EXPECT_STREQ("", buffer);
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(Os, Vsnprintf_WithoutRoom_IsReported)
{
    CHAR buffer[2] = "#";
    EXPECT_EQ(-1, formatted(buffer, 0, "x"));
    EXPECT_STREQ("#", buffer);
    EXPECT_EQ("x_vsnprintf: no room for the text's end", misuse());
    EXPECT_EQ("x_vsnprintf(<unchanged>, 0, \"x\") = -1", call());
    EXPECT_EQ(-1, formatted(nullptr, 5, "x"));
    EXPECT_EQ(2u, board::misuses());
}

TEST_F(Os, Vsnprintf_Fault_LeavesTheBufferAlone)
{
    answer_always("x_vsnprintf", -2);
    CHAR buffer[4] = "###";
    EXPECT_EQ(-2, formatted(buffer, sizeof buffer, "x"));
    EXPECT_STREQ("###", buffer);
    EXPECT_EQ("x_vsnprintf(<unchanged>, 4, \"x\") = -2", last_call());
    board::faults::set({ "x_vsnprintf", 7, board::Fault::When::Always, 1, {}, {}, { { "szBuffer", "\"abcdef\"" } } });
    EXPECT_EQ(7, formatted(buffer, sizeof buffer, "x"));
    EXPECT_STREQ("abc", buffer) << "as much as there is room for";
    EXPECT_EQ(7, formatted(buffer, 0, "x"));
    EXPECT_EQ(7, formatted(nullptr, 4, "x"));
    EXPECT_EQ("x_vsnprintf(null, 4, \"x\") = 7", last_call());
}

TEST_F(Os, Vsnprintf_OfAFormatThatIsWrong_IsReported)
{
    CHAR buffer[8] = "";
    int count = 0;
    EXPECT_EQ(6, formatted(buffer, sizeof buffer, "a%nb", &count));
    EXPECT_STREQ("a<%n>b", buffer);
    EXPECT_EQ("a console text has the conversion %n", misuse());
    EXPECT_EQ(0, count);
}

TEST_F(Os, State_AsNew)
{
    mutex();
    board::advance(1s);
    power_on({});
    EXPECT_EQ("{now_us=0, mutexes=[], semaphores=[], timers=[]}", board::os::state().to_text());
}

} // namespace
