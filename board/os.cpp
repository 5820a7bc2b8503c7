// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The operating-system layer: handles, semaphores, formatting. What would make a thread wait for itself is reported and
// refused, and so is a wait of the one that tools and tests run in: nobody else would go on meanwhile.
#include <limits>
#include <map>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/format.h"
#include "board/threads.h"

#include "u_os.h"

namespace
{

using board::names::Family;

struct Semaphore
{
    X_SEMA_TYPE_T type;
    UINT32 count;        ///< a mutex or binary one: 0 taken, 1 free
    unsigned holder = 0; ///< of a mutex: the thread
};

struct Os
{
    HANDLE_T last_handle = 0;
    std::map<HANDLE_T, Semaphore> semaphores;
};

Os os_state;

/** A semaphore by its handle; null with a report when there is none. */
Semaphore* find_semaphore(HANDLE_T handle, const char* function)
{
    if (const auto found = os_state.semaphores.find(handle); found != os_state.semaphores.end())
        return &found->second;
    board::os::report_bad_handle(function, "semaphore", handle);
    return nullptr;
}

std::string handle_text(HANDLE_T handle)
{
    return "handle " + std::to_string(handle);
}

/** Whether the thread that runs may wait for a semaphore that is taken. */
bool can_wait(const Semaphore& semaphore)
{
    const unsigned self = board::threads::context().number;
    return self != 0 && (semaphore.type != X_SEMA_TYPE_MUTEX || semaphore.holder != self);
}

/** Says why a lock was refused, unless its caller did not want to wait. */
void report_refused_lock(HANDLE_T handle, const Semaphore& semaphore, X_SEMA_OPTION_T option)
{
    if (semaphore.type == X_SEMA_TYPE_MUTEX && semaphore.holder == board::threads::context().number)
        board::report_misuse("x_sema_lock: a second lock by the holder, " + handle_text(handle));
    else if (option != X_SEMA_OPTION_NOWAIT)
        board::report_misuse("x_sema_lock: nobody is left to give the semaphore, " + handle_text(handle));
}

bool creatable(X_SEMA_TYPE_T type, UINT32 value)
{
    return type == X_SEMA_TYPE_COUNTING || ((type == X_SEMA_TYPE_BINARY || type == X_SEMA_TYPE_MUTEX) && value <= 1);
}

} // namespace

namespace board
{

namespace os
{

void power_on(const Description&)
{
    os_state = {};
    timers::power_on();
}

std::uint32_t new_handle()
{
    return ++os_state.last_handle;
}

void report_bad_handle(const std::string& function, const std::string& kind, std::uint32_t handle)
{
    // Handle 0 stands for a creation that failed, or for a handle that was cleared: callers rely on the failure.
    if (handle == 0)
        trace::notice(kind, function + ": " + kind + " call with handle 0, by design");
    else
        report_misuse(function + ": no " + kind + " has handle " + std::to_string(handle) +
                      (handle <= os_state.last_handle ? " any more" : ""));
}

bool is_mutex(std::uint32_t handle)
{
    const auto found = os_state.semaphores.find(handle);
    return found != os_state.semaphores.end() && found->second.type == X_SEMA_TYPE_MUTEX;
}

bool mutex_held(std::uint32_t handle)
{
    return is_mutex(handle) && os_state.semaphores.at(handle).count == 0;
}

Value state()
{
    std::vector<Value> mutexes, semaphores;
    for (const auto& [handle, semaphore] : os_state.semaphores)
    {
        Value value;
        value.add("handle", Value::number(handle));
        if (semaphore.type == X_SEMA_TYPE_MUTEX)
        {
            mutexes.push_back(value.add("held", flag(semaphore.count == 0)));
            continue;
        }
        value.add("type", named(Family::SemaType, semaphore.type));
        semaphores.push_back(value.add("count", Value::number(semaphore.count)));
    }
    Value value;
    value.add("now_us", Value::number(now().count()));
    value.add("mutexes", Value::list(std::move(mutexes)));
    value.add("semaphores", Value::list(std::move(semaphores)));
    value.add("timers", timers::state());
    return value;
}

} // namespace os
} // namespace board

extern "C" {

INT32 x_sema_create(HANDLE_T* phSema, X_SEMA_TYPE_T eType, UINT32 u4InitValue)
try
{
    BOARD_CALL_R(x_sema_create, phSema, eType, u4InitValue);
    if (phSema == nullptr || !creatable(eType, u4InitValue))
    {
        board::report_misuse(phSema == nullptr ? "x_sema_create: nowhere to put the handle"
                                               : "x_sema_create: no such type, or it cannot begin with this value");
        return boardCall.fail(-1);
    }
    *phSema = board::os::new_handle();
    os_state.semaphores[*phSema] = { eType, u4InitValue };
    return boardCall.answer(OSR_OK);
}
BOARD_CALL_END(x_sema_create)

INT32 x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption)
try
{
    BOARD_CALL_R(x_sema_lock, hSema, eOption);
    Semaphore* semaphore = find_semaphore(hSema, "x_sema_lock");
    while (semaphore != nullptr && semaphore->count == 0 && eOption != X_SEMA_OPTION_NOWAIT && can_wait(*semaphore))
    {
        if (!board::threads::wait_for(hSema))
            return boardCall.fail(-1);
        semaphore = find_semaphore(hSema, "x_sema_lock"); // it may have been deleted
    }
    if (semaphore == nullptr)
        return boardCall.fail(-1);
    if (semaphore->count == 0)
    {
        report_refused_lock(hSema, *semaphore, eOption);
        return boardCall.fail(-1);
    }
    --semaphore->count;
    semaphore->holder = board::threads::context().number;
    return boardCall.answer(OSR_OK);
}
BOARD_CALL_END(x_sema_lock)

INT32 x_sema_unlock(HANDLE_T hSema)
try
{
    BOARD_CALL_ACTING(x_sema_unlock, hSema);
    Semaphore* const semaphore = find_semaphore(hSema, "x_sema_unlock");
    if (semaphore == nullptr)
        return boardCall.answer_or_fault(-1);
    if (semaphore->type == X_SEMA_TYPE_MUTEX && semaphore->count != 0)
    {
        board::report_misuse("x_sema_unlock: unlock without lock, " + handle_text(hSema));
        return boardCall.answer_or_fault(-1);
    }
    if (semaphore->type == X_SEMA_TYPE_COUNTING)
    {
        if (semaphore->count == std::numeric_limits<UINT32>::max())
            return boardCall.answer_or_fault(-1);
        ++semaphore->count;
    }
    else
        semaphore->count = 1;
    board::threads::given(hSema);
    return boardCall.answer_or_fault(OSR_OK);
}
BOARD_CALL_END(x_sema_unlock)

INT32 x_sema_delete(HANDLE_T hSema)
try
{
    BOARD_CALL_R(x_sema_delete, hSema);
    if (find_semaphore(hSema, "x_sema_delete") == nullptr)
        return boardCall.fail(-1);
    if (board::os::mutex_held(hSema))
    {
        board::report_misuse("x_sema_delete: delete while held, " + handle_text(hSema));
        return boardCall.fail(-1);
    }
    os_state.semaphores.erase(hSema);
    return boardCall.answer(OSR_OK);
}
BOARD_CALL_END(x_sema_delete)

INT32 x_vsnprintf(CHAR* szBuffer, size_t zSize, const CHAR* szFormat, va_list rArgs)
try
{
    BOARD_CALL_R(x_vsnprintf, text(szBuffer, zSize), zSize, text(szFormat), values(rArgs));
    if (szBuffer == nullptr || zSize == 0)
    {
        board::report_misuse("x_vsnprintf: no room for the text's end");
        return boardCall.fail(-1);
    }
    board::Formatted formatted = board::format(szFormat, rArgs);
    if (!formatted.complaint.empty())
        board::report_misuse(std::move(formatted.complaint));
    const std::size_t copied = formatted.text.copy(szBuffer, zSize - 1);
    szBuffer[copied] = '\0';
    return boardCall.answer(static_cast<INT32>(formatted.text.size()));
}
BOARD_CALL_END(x_vsnprintf)

} // extern "C"
