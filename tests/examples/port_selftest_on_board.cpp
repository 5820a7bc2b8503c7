// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The self-test of ports, run on the virtual board: all of it is met there, and each contract is missed when the board
// is made to break it. What no fault can do, because it is done right or not at all, wrappers of the linker do.
#include <algorithm>
#include <array>
#include <csetjmp>
#include <cstdarg>
#include <cstring>
#include <functional>
#include <iostream>
#include <set>
#include <string>
#include <vector>

#include "board/board.h"
#include "pmx_hal.h"
#include "u_os.h"

using board::Fault;

extern "C" {

int i4PortSelftest(BOOL fgHardware, void (*pfLine)(const char* szLine));

/** What a wrapper breaks; null pointer: nothing. */
static const char* pending = nullptr;

static bool breaks(const char* what)
{
    return pending != nullptr && std::strcmp(pending, what) == 0;
}

/** Where a function goes that does not come back. */
static std::jmp_buf out;

static x_timer_cb_fct wanted_expiry;

static void wrong_expiry(HANDLE_T hTimer, void* pvArg)
{
    wanted_expiry(breaks("another handle") ? hTimer + 1 : hTimer, breaks("another argument") ? nullptr : pvArg);
}

INT32 __real_x_timer_start(HANDLE_T, UINT32, X_TIMER_FLAG_T, x_timer_cb_fct, void*);
INT32 __wrap_x_timer_start(HANDLE_T hTimer, UINT32 u4DelayMs, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback,
                           void* pvArg)
{
    static HANDLE_T running;
    if (breaks("never starts anew") && running == hTimer && hTimer != 0)
        return OSR_OK;
    running = hTimer;
    wanted_expiry = pfCallback;
    return __real_x_timer_start(hTimer, breaks("early") ? 1 : u4DelayMs,
                                breaks("again and again") ? X_TIMER_FLAG_REPEAT : eFlag, wrong_expiry, pvArg);
}

INT32 __real_x_timer_stop(HANDLE_T);
INT32 __wrap_x_timer_stop(HANDLE_T hTimer)
{
    return breaks("no stop") && hTimer != 0 ? OSR_OK : __real_x_timer_stop(hTimer);
}

INT32 __real_x_timer_delete(HANDLE_T);
INT32 __wrap_x_timer_delete(HANDLE_T hTimer)
{
    return breaks("no deletion") && hTimer != 0 ? OSR_OK : __real_x_timer_delete(hTimer);
}

void __real_x_thread_delay(UINT32);
void __wrap_x_thread_delay(UINT32 u4DelayMs)
{
    __real_x_thread_delay(breaks("short sleep") ? u4DelayMs / 10 : u4DelayMs);
}

INT32 __real_x_sema_unlock(HANDLE_T);
INT32 __wrap_x_sema_unlock(HANDLE_T hSema)
{
    return breaks("still held") && hSema != 0 ? OSR_OK : __real_x_sema_unlock(hSema);
}

INT32 __real_x_vsnprintf(CHAR*, size_t, const CHAR*, va_list);
INT32 __wrap_x_vsnprintf(CHAR* szBuffer, size_t zSize, const CHAR* szFormat, va_list rArgs)
{
    if (breaks("crash"))
        std::longjmp(out, 1);
    return __real_x_vsnprintf(szBuffer, breaks("no limit") ? zSize + 8 : zSize, szFormat, rArgs);
}

INT32 __real_i4ImQueryInterface(UINT16, UINT16, UINT32, void**, void**);
INT32 __wrap_i4ImQueryInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void** ppvIf, void** ppvTag)
{
    return breaks("no table") ? 0 : __real_i4ImQueryInterface(u2CompType, u2CompId, u4IfId, ppvIf, ppvTag);
}

} // extern "C"

namespace
{

std::vector<std::string> lines;

void keep(const char* line)
{
    lines.emplace_back(line);
}

std::string without_number(const std::string& line)
{
    const std::string what = line.substr(line.find(" - ") + 3);
    return what.substr(0, what.find(" # SKIP"));
}

struct Outcome
{
    int result = 0;
    std::set<std::string> all;
    std::set<std::string> failed;
};

Outcome run()
{
    lines.clear();
    Outcome outcome;
    outcome.result = i4PortSelftest(TRUE, keep);
    for (const std::string& line : lines)
    {
        if (line.starts_with("1..") || line.starts_with("# "))
            continue;
        outcome.all.insert(without_number(line));
        if (line.starts_with("not "))
            outcome.failed.insert(without_number(line));
    }
    return outcome;
}

/** A fault of every call with these arguments. */
Fault fault(const std::string& call, std::int64_t answer, std::vector<Fault::Output> outputs = {})
{
    Fault scripted;
    std::tie(scripted.function, scripted.arguments) = board::faults::read_call(call);
    scripted.answer = answer;
    scripted.when = Fault::When::Always;
    scripted.outputs = std::move(outputs);
    return scripted;
}

/** A break, and a line that tells it. */
struct Break
{
    std::function<void()> plant;
    std::string told_by;
};

Break by(const Fault& scripted, const std::string& told_by)
{
    return { [scripted] { board::faults::set(scripted); }, told_by };
}

Break by(const char* wrapper, const std::string& told_by)
{
    return { [wrapper] { pending = wrapper; }, told_by };
}

const std::string eight = "[9, 9, 9, 9, 9, 9, 9, 9]";

const std::vector<Break> planted = {
    by(fault("x_sema_create", -1), "x_sema_create: a mutex is created with OSR_OK"),
    by(fault("x_sema_create", 0), "x_sema_create: its handle is written, and is not 0"),
    by(fault("x_sema_lock", -1), "x_sema_lock: a free mutex is taken with OSR_OK"),
    by(fault("x_sema_unlock", -1), "x_sema_unlock: its holder gives it back with OSR_OK"),
    by("still held", "x_sema_unlock: it is free again"),
    by(fault("x_sema_delete", -1), "x_sema_delete: a free mutex is deleted with OSR_OK"),
    by(fault("x_sema_lock(0, ...)", 0), "x_sema_lock: handle 0 fails"),
    by(fault("x_sema_unlock(0)", 0), "x_sema_unlock: handle 0 fails"),
    by(fault("x_sema_delete(0)", 0), "x_sema_delete: handle 0 fails"),
    by(fault("x_sema_lock(*, X_SEMA_OPTION_NOWAIT)", 0), "x_sema_lock: a handle that was deleted fails"),
    by(fault("x_timer_create", -1), "x_timer_create: a timer is created with OSR_OK"),
    by(fault("x_timer_create", 0), "x_timer_create: its handle is written, and is not 0"),
    by(fault("x_timer_stop", -1), "x_timer_stop: a timer that does not run is stopped with OSR_OK"),
    by(fault("x_timer_start", -1), "x_timer_start: a stopped timer is started with OSR_OK"),
    by("early", "x_timer_start: it does not run out before its time"),
    by(fault("x_timer_start", 0), "x_timer_start: it runs out"),
    by("another handle", "x_timer_start: the expiry function is given the timer's handle"),
    by("another argument", "x_timer_start: the expiry function is given the argument"),
    by("again and again", "x_timer_start: X_TIMER_FLAG_ONCE runs out once"),
    by(fault("x_timer_start", -1), "x_timer_start: a running timer is started again with OSR_OK"),
    by("early", "x_timer_start: its full interval begins anew"),
    by("never starts anew", "x_timer_start: started twice, it runs out once"),
    by(fault("x_timer_stop", -1), "x_timer_stop: a running timer is stopped with OSR_OK"),
    by("no stop", "x_timer_stop: it does not run out any more"),
    by(fault("x_timer_delete", -1), "x_timer_delete: a running timer is deleted with OSR_OK"),
    by("no deletion", "x_timer_delete: it does not run out any more"),
    by(fault("x_timer_start(0, ...)", 0), "x_timer_start: handle 0 fails"),
    by(fault("x_timer_stop(0)", 0), "x_timer_stop: handle 0 fails"),
    by(fault("x_timer_delete(0)", 0), "x_timer_delete: handle 0 fails"),
    by(fault("x_timer_start", 0), "x_timer_start: a handle that was deleted fails"),
    by("short sleep", "x_thread_delay: it sleeps at least as long as it is told"),
    by(fault("x_vsnprintf", 18, { { "szBuffer", "\"-7\"" } }), "x_vsnprintf: numbers, texts and widths are formatted"),
    by(fault("x_vsnprintf", -1), "x_vsnprintf: it answers the text's length"),
    by("no limit", "x_vsnprintf: a text that does not fit is cut, and has an end"),
    by("no limit", "x_vsnprintf: nothing is written behind the end"),
    by(fault("x_vsnprintf", 3), "x_vsnprintf: it answers the length of the whole text"),
    by(fault("x_vsnprintf", 0, { { "szBuffer", "\"\"" } }), "x_vsnprintf: a null text is (null)"),
    by(fault("get_part_id_by_name", 0), "get_part_id_by_name: a partition that is not there is negative"),
    by(fault("i4NFBPartitionRead(-1, ...)", 4), "i4NFBPartitionRead: a negative id fails"),
    by(fault("i4NFBPartitionRead(-1, ...)", -1, { { "pvDest", "[1]" } }),
       "i4NFBPartitionRead: a failed read leaves the destination alone"),
    by(fault("i4NFBPartitionRead(*, 0, ...)", 3), "i4NFBPartitionRead: its first word is read"),
    by(fault("i4NFBPartitionRead(*, 0xFFFFFFF0, ...)", 4), "i4NFBPartitionRead: a read past the end fails"),
    by(fault("register_pm_ops", -1), "register_pm_ops: operations are registered with 0"),
    by(fault("unregister_pm_ops", -1), "unregister_pm_ops: they are withdrawn with 0"),
    by("no table", "i4ImQueryInterface: what is not registered fails"),
    by(fault("i4ImUnregisterInterface2", 0), "i4ImUnregisterInterface2: what is not registered fails"),
    by(fault("i4ImRegisterInterface2", -1), "i4ImRegisterInterface2: a table is registered"),
    by("no table", "i4ImQueryInterface: it yields the table"),
    by(fault("i4ImQueryInterface", 0, { { "ppvTag", "3" } }), "i4ImQueryInterface: it yields the tag"),
    by(fault("i4ImReleaseInterface", -1), "i4ImReleaseInterface: it is given back"),
    by(fault("i4ImUnregisterInterface2", -1), "i4ImUnregisterInterface2: the table is withdrawn"),
    by("no table", "i4ImUnregisterInterface2: it is gone"),
    by(fault("VDP_GetHwEnable", 7), "VDP_GetHwEnable: disabled, hidden or enabled"),
    by(fault("fgVdpIsWaitforSyncCtrl", 2), "fgVdpIsWaitforSyncCtrl: TRUE or FALSE"),
    by(fault("i4GetHotPlugStatus", 2), "i4GetHotPlugStatus: exactly 1 for a sink, else 0"),
    by(fault("fgIsHotPlugChgRes", 2), "fgIsHotPlugChgRes: TRUE or FALSE"),
    by(fault("fgPmxHalMixPlane(0, ...)", 2), "fgPmxHalMixPlane: TRUE or FALSE"),
    by(fault("fgPmxHalMixPlane(9, ...)", 2), "fgPmxHalMixPlane: another mixer does no harm"),
    by(fault("fgPmxHalSwapPlane1_2(0)", 2), "fgPmxHalSwapPlane1_2: TRUE or FALSE"),
    by(fault("fgPmxHalSwapPlane1_2(9)", 2), "fgPmxHalSwapPlane1_2: another mixer does no harm"),
    by(fault("fgPmxHalSwapPlane3_4", 2), "fgPmxHalSwapPlane3_4: TRUE or FALSE"),
    by(fault("fgPmxHalSwapPlane6_7", 2), "fgPmxHalSwapPlane6_7: TRUE or FALSE"),
    by(fault("fgPmxHalSwapPlane4_7", 2), "fgPmxHalSwapPlane4_7: TRUE or FALSE"),
    by(fault("fgPmxHalSwapPlane1_3", 2), "fgPmxHalSwapPlane1_3: TRUE or FALSE"),
    by(fault("fgPmxHalSwapPlane5_8", 2), "fgPmxHalSwapPlane5_8: TRUE or FALSE"),
    by(fault("PMX_HalGetPlaneOrder", -1), "PMX_HalGetPlaneOrder: the selectors are read with 0"),
    by(fault("PMX_HalGetPlaneOrder", 0), "PMX_HalGetPlaneOrder: all eight are written, 0 to 7"),
    by(fault("fgPmxDrvSetAvd(99, ...)", 1), "fgPmxDrvSetAvd: a command that there is not is refused"),
    by(fault("fgPmxDrvGetAvdInfo(99, *)", 1), "fgPmxDrvGetAvdInfo: a query that there is not has no answer"),
    by(fault("fgPmxDrvGetAvdInfo", 1), "fgPmxDrvGetAvdInfo: outputs are filled by TRUE, and by nothing else"),
    by(fault("PMX_HalSetPlaneOrder", -1), "PMX_HalSetPlaneOrder: an order is set with 0"),
    by(fault("PMX_HalSetPlaneOrder", 0), "PMX_HalSetPlaneOrder: all eight delays are written"),
    by(fault("PMX_HalGetPlaneOrder", 0, { { "pu1PlnSel", eight } }), "PMX_HalGetPlaneOrder: it reads what was set"),
    by(fault("fgPmxHalMixPlane", 0), "fgPmxHalMixPlane: a plane is mixed, and is not, as it was told"),
    by(fault("fgPmxHalSwapPlane1_2", 0), "fgPmxHalSwapPlane1_2: planes are swapped, and are not, as it was told"),
    by(fault("TVE_SetFmtEx", 0), "TVE_SetFmtEx: a format is set with TVE_SET_OK"),
};

/** Met by coming back, or skipped where there is nothing to meet. */
const std::set<std::string> met_by_returning = {
    "PMX_IsLog: it prints a null text and returns",
    "Printf: it prints and returns",
    "UTIL_Printf: it prints and returns",
    "Assert: it reports and returns",
    "register_pm_ops: the same ones a second time do no harm",
    "get_part_id_by_name: the boot loader's partition is there",
};

unsigned wrong = 0;

void complain(const std::string& what)
{
    std::cout << what << '\n';
    ++wrong;
}

/** Whoever crashes has been named. */
void check_names()
{
    std::string about;
    for (const std::string& line : lines)
    {
        if (line.starts_with("# "))
            about = line + ",";
        else if (!line.starts_with("1.."))
        {
            const std::string what = without_number(line);
            if (about.find(" " + what.substr(0, what.find(':')) + ",") == about.npos)
                complain("not named before it is called: " + what);
        }
    }
    pending = "crash";
    lines.clear();
    if (setjmp(out) == 0)
        i4PortSelftest(FALSE, keep);
    pending = nullptr;
    if (lines.empty() || lines.back() != "# x_vsnprintf")
        complain("a crash of x_vsnprintf is not seen: " + (lines.empty() ? std::string() : lines.back()));
}

using Order = std::array<UINT8, 8>;

Order order_now()
{
    Order order{};
    PMX_HalGetPlaneOrder(0, order.data());
    return order;
}

} // namespace

int main()
{
    const board::Description player = board::load_description("default");
    board::power_on(player);
    const Order order{ 1, 0, 2, 3, 4, 5, 7, 6 };
    std::array<INT32, 8> delays{};
    PMX_HalSetPlaneOrder(0, order.data(), delays.data());
    const Outcome whole = run();
    if (order_now() != order)
        complain("the order of the planes is not put back");
    if (whole.result != 0 || !whole.failed.empty())
        complain("the board fails: " + (whole.failed.empty() ? std::string("by its result") : *whole.failed.begin()));
    const std::string console = board::console_text();
    for (const char* const shown : { "PMX_IsLog, (null)\n", "Printf, 1\n", "UTIL_Printf, 2\n" })
    {
        if (console.find(std::string("port_selftest: ") + shown) == console.npos)
            complain(std::string("the console does not show ") + shown);
    }

    check_names();

    std::set<std::string> told = met_by_returning;
    for (const Break& one : planted)
    {
        board::power_on(player);
        one.plant();
        const Outcome broken = run();
        pending = nullptr;
        if (!broken.failed.contains(one.told_by))
            complain("a break is not told: " + one.told_by);
        if (broken.result == 0)
            complain("a break is no failure: " + one.told_by);
        told.insert(one.told_by);
    }
    for (const std::string& line : whole.all)
    {
        if (!told.contains(line))
            complain("nothing breaks: " + line);
    }
    std::cout << whole.all.size() << " contracts, " << planted.size() << " breaks, " << wrong << " complaints\n";
    return wrong == 0 ? 0 : 1;
}
