// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Power management: the operations that drivers registered, and the kernel that runs them.
#include <algorithm>
#include <vector>

#include "board/device_values.h"
#include "board/devices.h"

#include "u_os.h"

namespace
{

struct Power
{
    std::vector<const PM_OPERATIONS_T*> registered;
    bool suspended = false;
    unsigned suspends = 0;
    unsigned resumes = 0;
};

Power power_state;

/** Runs one operation under its own name; a driver may leave it out. */
int run(int (*operation)(void*))
{
    if (operation == nullptr)
        return 0;
    const board::trace::Operation scope(
        board::trace_arguments::function_value(reinterpret_cast<const void*>(operation)).string());
    return operation(nullptr);
}

} // namespace

namespace board
{

int suspend()
{
    int result = 0;
    const auto registered = power_state.registered; // an operation may withdraw itself
    for (const PM_OPERATIONS_T* operations : registered)
    {
        const int answered = run(operations->suspend);
        result = result != 0 ? result : answered;
    }
    power_state.suspended = true;
    ++power_state.suspends;
    return result;
}

int resume()
{
    int result = 0;
    const auto registered = power_state.registered;
    for (auto operations = registered.rbegin(); operations != registered.rend(); ++operations)
    {
        const int answered = run((*operations)->resume);
        result = result != 0 ? result : answered;
    }
    power_state.suspended = false;
    ++power_state.resumes;
    return result;
}

namespace power
{

void power_on(const Description&)
{
    power_state = {};
}

Value state()
{
    std::vector<Value> registered;
    for (const PM_OPERATIONS_T* operations : power_state.registered)
        registered.push_back(trace_arguments::object_value(operations));
    Value value;
    value.add("registered", Value::list(std::move(registered)));
    value.add("suspended", flag(power_state.suspended));
    value.add("suspends", Value::number(power_state.suspends));
    value.add("resumes", Value::number(power_state.resumes));
    return value;
}

} // namespace power
} // namespace board

extern "C" {

int register_pm_ops(const PM_OPERATIONS_T* prOps)
try
{
    BOARD_CALL_R(register_pm_ops, object(prOps));
    auto& registered = power_state.registered;
    if (prOps == nullptr)
    {
        board::report_misuse("register_pm_ops: the operations are a null pointer");
        return boardCall.fail(-1);
    }
    if (std::find(registered.begin(), registered.end(), prOps) != registered.end())
        board::trace::notice("power", "register_pm_ops: registered already and kept once, by design: a driver that was "
                                      "stopped and started again registers again");
    else
        registered.push_back(prOps);
    // The last thing that the mixer does when it starts: from here on drivers of sources find it.
    if (board::trace_arguments::object_value(prOps).string() == "pmx_pm_ops")
        board::sources::mixer_has_started();
    return boardCall.answer(0);
}
BOARD_CALL_END(register_pm_ops)

int unregister_pm_ops(const PM_OPERATIONS_T* prOps)
try
{
    BOARD_CALL_R(unregister_pm_ops, object(prOps));
    return boardCall.answer(std::erase(power_state.registered, prOps) == 0 ? -1 : 0);
}
BOARD_CALL_END(unregister_pm_ops)

} // extern "C"
