// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The interface manager: a registry of tables with reference counts.
#include <compare>
#include <map>

#include "board/device_values.h"
#include "board/devices.h"

#include "drv_if.h"

namespace
{

struct Key
{
    UINT16 type;
    UINT16 id;
    UINT32 interface;

    auto operator<=>(const Key&) const = default;
};

struct Interface
{
    const void* table;
    void* tag;
    unsigned held = 0;    ///< queries that were not released yet
    unsigned before = 0;  ///< the same when the operation that runs began
    unsigned refused = 0; ///< releases that a scripted fault has answered since
};

std::map<Key, Interface> interface_manager_state;

using board::names::Family;

std::string key_text(const Key& key)
{
    return board::named(Family::ComponentType, key.type).to_text() + " " + std::to_string(key.id) + " " +
           board::named(Family::InterfaceId, key.interface).to_text();
}

} // namespace

namespace board::interface_manager
{

void power_on(const Description&)
{
    interface_manager_state.clear();
}

Value state()
{
    std::vector<Value> interfaces;
    for (const auto& [key, interface] : interface_manager_state)
    {
        Value value;
        value.add("component_type", named(Family::ComponentType, key.type));
        value.add("component_id", Value::number(key.id));
        value.add("interface_id", named(Family::InterfaceId, key.interface));
        value.add("table", trace_arguments::object_value(interface.table));
        value.add("tag", trace_arguments::tag(interface.tag).value);
        value.add("held", Value::number(interface.held));
        interfaces.push_back(std::move(value));
    }
    return Value().add("interfaces", Value::list(std::move(interfaces)));
}

bool held(std::uint16_t component_type, std::uint16_t component_id, std::uint32_t interface_id)
{
    const auto found = interface_manager_state.find({ component_type, component_id, interface_id });
    return found != interface_manager_state.end() && found->second.held != 0;
}

void operation_begins()
{
    for (auto& [key, interface] : interface_manager_state)
    {
        interface.before = interface.held;
        interface.refused = 0;
    }
}

void operation_ends(const std::string& operation)
{
    for (const auto& [key, interface] : interface_manager_state)
    {
        if (interface.held > interface.before + interface.refused)
            report_misuse("i4ImQueryInterface: " + key_text(key) + " is not given back by " + operation);
    }
}

} // namespace board::interface_manager

extern "C" {

INT32 i4ImRegisterInterface2(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, const void* pvIf, void* pvTag)
try
{
    BOARD_CALL_R(i4ImRegisterInterface2, u2CompType, u2CompId, u4IfId, object(pvIf), tag(pvTag));
    const Key key{ u2CompType, u2CompId, u4IfId };
    if (pvIf == nullptr)
    {
        board::report_misuse("i4ImRegisterInterface2: the table of " + key_text(key) + " is a null pointer");
        return boardCall.fail(-1);
    }
    return boardCall.answer(interface_manager_state.try_emplace(key, Interface{ pvIf, pvTag }).second ? 0 : -1);
}
BOARD_CALL_END(i4ImRegisterInterface2)

INT32 i4ImUnregisterInterface2(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId)
try
{
    BOARD_CALL_R(i4ImUnregisterInterface2, u2CompType, u2CompId, u4IfId);
    const Key key{ u2CompType, u2CompId, u4IfId };
    const auto found = interface_manager_state.find(key);
    if (found == interface_manager_state.end())
        return boardCall.answer(-1);
    if (found->second.held != 0)
        board::report_misuse("i4ImUnregisterInterface2: " + key_text(key) + " is withdrawn while it is held " +
                             std::to_string(found->second.held) + " times");
    interface_manager_state.erase(found);
    return boardCall.answer(0);
}
BOARD_CALL_END(i4ImUnregisterInterface2)

INT32 i4ImQueryInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void** ppvIf, void** ppvTag)
try
{
    BOARD_CALL_ACTING(i4ImQueryInterface, u2CompType, u2CompId, u4IfId, object(ppvIf), tag(ppvTag));
    // A success without a table would have the caller jump to nowhere: such an answer needs one that is there.
    if (boardCall.fault() && static_cast<INT32>(boardCall.fault()->answer) < 0)
        return boardCall.fault_answer();
    const Key key{ u2CompType, u2CompId, u4IfId };
    if (ppvIf == nullptr || ppvTag == nullptr)
    {
        board::report_misuse("i4ImQueryInterface: nowhere to put table and tag of " + key_text(key));
        return boardCall.fail(-1);
    }
    const auto found = interface_manager_state.find(key);
    if (found == interface_manager_state.end())
    {
        if (boardCall.fault())
            board::trace::notice("fault", "i4ImQueryInterface: there is no table of " + key_text(key) +
                                              " to succeed with, and the query fails");
        return boardCall.fail(-1);
    }
    ++found->second.held;
    *ppvIf = const_cast<void*>(found->second.table);
    *ppvTag = found->second.tag;
    return boardCall.answer_or_fault(0);
}
BOARD_CALL_END(i4ImQueryInterface)

INT32 i4ImReleaseInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void* pvTag)
try
{
    BOARD_CALL_ACTING(i4ImReleaseInterface, u2CompType, u2CompId, u4IfId, tag(pvTag));
    const Key key{ u2CompType, u2CompId, u4IfId };
    const auto found = interface_manager_state.find(key);
    if (boardCall.fault())
    {
        if (found != interface_manager_state.end())
            ++found->second.refused; // its holder cannot help it
        return boardCall.fault_answer();
    }
    std::string wrong;
    if (found == interface_manager_state.end())
        wrong = "is not registered";
    else if (found->second.tag != pvTag)
        wrong = "has another tag";
    else if (found->second.held == 0)
        wrong = "is not held";
    if (!wrong.empty())
    {
        board::report_misuse("i4ImReleaseInterface: " + key_text(key) + " " + wrong);
        return boardCall.fail(-1);
    }
    --found->second.held;
    return boardCall.answer(0);
}
BOARD_CALL_END(i4ImReleaseInterface)

} // extern "C"
