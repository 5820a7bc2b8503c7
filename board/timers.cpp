// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Timers of the operating-system layer, on the board's virtual clock.
#include <algorithm>
#include <map>
#include <stdexcept>
#include <utility>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/shown.h"
#include "board/threads.h"

#include "u_os.h"

namespace
{

using std::chrono::microseconds;

struct Timer
{
    bool running = false;
    microseconds expiry{};
    microseconds interval{};
    X_TIMER_FLAG_T flag = X_TIMER_FLAG_ONCE;
    x_timer_cb_fct callback = nullptr;
    void* argument = nullptr;
    std::uint64_t order = 0; ///< of starting: decides between timers that run out at the same moment
};

struct Timers
{
    microseconds now{};
    std::uint64_t starts = 0;
    std::map<HANDLE_T, Timer> timers;
    microseconds alarm{};
    std::uint64_t alarm_order = 0;
    void (*alarm_action)() = nullptr;
};

Timers timers_state;

/** A timer by its handle; null with a report when there is none. */
Timer* find_timer(HANDLE_T handle, const char* function)
{
    if (const auto found = timers_state.timers.find(handle); found != timers_state.timers.end())
        return &found->second;
    board::os::report_bad_handle(function, "timer", handle);
    return nullptr;
}

void expire(HANDLE_T handle)
{
    Timer& timer = timers_state.timers.at(handle);
    if (timer.flag == X_TIMER_FLAG_REPEAT)
    {
        timer.expiry += timer.interval;
        timer.order = ++timers_state.starts;
    }
    else
        timer.running = false;
    // The expiry may stop, start or delete its own timer.
    const x_timer_cb_fct callback = timer.callback;
    void* const argument = timer.argument;
    const std::string name = board::trace_arguments::function_value(reinterpret_cast<const void*>(callback)).string();
    const board::trace::Operation scope(name);
    board::trace::notice("expiry", "timer " + std::to_string(handle) + ": " + name);
    board::threads::Context& context = board::threads::context();
    ++context.expiry_functions;
    callback(handle, argument);
    --context.expiry_functions;
}

/** The running timer that runs out first, up to a moment; 0 when none does. */
HANDLE_T next_expiry(microseconds until)
{
    HANDLE_T next = 0;
    for (const auto& [handle, timer] : timers_state.timers)
    {
        if (!timer.running || timer.expiry > until)
            continue;
        const Timer* const best = next == 0 ? nullptr : &timers_state.timers.at(next);
        if (best == nullptr || timer.expiry < best->expiry ||
            (timer.expiry == best->expiry && timer.order < best->order))
            next = handle;
    }
    return next;
}

/** Whether the board's own alarm comes up to a moment, and before that timer. */
bool alarm_is_next(microseconds until, HANDLE_T timer)
{
    if (timers_state.alarm_action == nullptr || timers_state.alarm > until)
        return false;
    if (timer == 0)
        return true;
    const Timer& other = timers_state.timers.at(timer);
    return timers_state.alarm < other.expiry ||
           (timers_state.alarm == other.expiry && timers_state.alarm_order < other.order);
}

void pass(microseconds duration)
{
    const microseconds until = timers_state.now + duration;
    while (true)
    {
        const HANDLE_T handle = next_expiry(until);
        if (alarm_is_next(until, handle))
        {
            timers_state.now = std::max(timers_state.now, timers_state.alarm);
            std::exchange(timers_state.alarm_action, nullptr)();
        }
        else if (handle != 0)
        {
            timers_state.now = std::max(timers_state.now, timers_state.timers.at(handle).expiry);
            expire(handle);
        }
        else
            break;
    }
    timers_state.now = std::max(timers_state.now, until);
}

} // namespace

namespace board
{

std::chrono::microseconds now()
{
    return timers_state.now;
}

void advance(std::chrono::microseconds duration)
{
    if (duration < microseconds::zero() || duration > microseconds::max() - timers_state.now)
        throw std::invalid_argument("time passes forwards, and not for ever");
    pass(duration);
}

bool os::in_timer_context()
{
    return threads::context().expiry_functions != 0;
}

namespace timers
{

void power_on()
{
    timers_state = {};
}

Value state()
{
    std::vector<Value> timers;
    for (const auto& [handle, timer] : timers_state.timers)
    {
        Value value;
        value.add("handle", Value::number(handle));
        value.add("running", flag(timer.running));
        value.add("expiry_us", timer.running ? Value::number(timer.expiry.count()) : Value::null());
        value.add("interval_us", Value::number(timer.interval.count()));
        value.add("flag", named(names::Family::TimerFlag, timer.flag));
        value.add("callback", trace_arguments::function_value(reinterpret_cast<const void*>(timer.callback)));
        timers.push_back(std::move(value));
    }
    return Value::list(std::move(timers));
}

const void* next_call_of(std::uint32_t handle)
{
    const auto timer = timers_state.timers.find(handle);
    return timer != timers_state.timers.end() && timer->second.running
               ? reinterpret_cast<const void*>(timer->second.callback)
               : nullptr;
}

void set_alarm(std::chrono::microseconds due, void (*action)())
{
    timers_state.alarm = due;
    timers_state.alarm_order = ++timers_state.starts;
    timers_state.alarm_action = action;
}

void clear_alarm()
{
    timers_state.alarm_action = nullptr;
}

} // namespace timers
} // namespace board

extern "C" {

INT32 x_timer_create(HANDLE_T* phTimer)
try
{
    BOARD_CALL_R(x_timer_create, phTimer);
    if (phTimer == nullptr)
    {
        board::report_misuse("x_timer_create: nowhere to put the handle");
        return boardCall.fail(-1);
    }
    *phTimer = board::os::new_handle();
    timers_state.timers[*phTimer] = {};
    return boardCall.answer(OSR_OK);
}
BOARD_CALL_END(x_timer_create)

INT32 x_timer_start(HANDLE_T hTimer, UINT32 u4DelayMs, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback, void* pvArg)
try
{
    BOARD_CALL_R(x_timer_start, hTimer, u4DelayMs, eFlag, pfCallback, ignored(pvArg));
    Timer* const timer = find_timer(hTimer, "x_timer_start");
    if (timer == nullptr)
        return boardCall.fail(-1);
    std::string wrong;
    if (pfCallback == nullptr)
        wrong = "no expiry function";
    else if (eFlag != X_TIMER_FLAG_ONCE && eFlag != X_TIMER_FLAG_REPEAT)
        wrong = "neither once nor repeatedly";
    else if (eFlag == X_TIMER_FLAG_REPEAT && u4DelayMs == 0)
        wrong = "repeatedly without an interval";
    if (!wrong.empty())
    {
        board::report_misuse("x_timer_start: " + wrong + ", handle " + std::to_string(hTimer));
        return boardCall.fail(-1);
    }
    const microseconds interval = std::chrono::milliseconds(u4DelayMs);
    *timer = { true, timers_state.now + interval, interval, eFlag, pfCallback, pvArg, ++timers_state.starts };
    return boardCall.answer(OSR_OK);
}
BOARD_CALL_END(x_timer_start)

INT32 x_timer_stop(HANDLE_T hTimer)
try
{
    BOARD_CALL_R(x_timer_stop, hTimer);
    Timer* const timer = find_timer(hTimer, "x_timer_stop");
    if (timer == nullptr)
        return boardCall.fail(-1);
    timer->running = false;
    return boardCall.answer(OSR_OK);
}
BOARD_CALL_END(x_timer_stop)

INT32 x_timer_delete(HANDLE_T hTimer)
try
{
    BOARD_CALL_R(x_timer_delete, hTimer);
    if (find_timer(hTimer, "x_timer_delete") == nullptr)
        return boardCall.fail(-1);
    timers_state.timers.erase(hTimer);
    return boardCall.answer(OSR_OK);
}
BOARD_CALL_END(x_timer_delete)

void x_thread_delay(UINT32 u4DelayMs)
try
{
    BOARD_CALL(x_thread_delay, u4DelayMs);
    if (board::os::in_timer_context())
        board::report_misuse("x_thread_delay: the timer's context must not sleep");
    else
        pass(std::chrono::milliseconds(u4DelayMs));
}
BOARD_CALL_END(x_thread_delay)

} // extern "C"
