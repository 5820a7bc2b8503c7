// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The slots of the mixer's table as operations, on the table that a neighbour holds. */
#pragma once

#include "drv_if_pmx.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/operation.h"

namespace pmxboard
{

/** The table and tag that a neighbour holds while it calls. */
struct HeldTable
{
    const IPMX* table = nullptr;
    void* tag = nullptr;
};

inline HeldTable& held_table()
{
    static HeldTable now;
    return now;
}

template <typename Slot, Slot IPMX::*slot>
struct SlotOf;

/** A slot as an operation on the table that is held. */
template <typename R, typename... A, R (*IPMX::*slot)(A...)>
struct SlotOf<R (*)(A...), slot>
{
    static Operation operation(const char* name, const std::vector<ParameterName>& names)
    {
        R (*const type)(A...) = nullptr;
        Operation made;
        made.name = name;
        made.parameters = parameters_of(type, name, names);
        made.result_family = board::names::family_of(name, "result");
        made.call = [](const Operation& self, const Values& values) {
            if (held_table().table->*slot == nullptr)
                throw StepFailed("the slot " + self.name + " of the registered table is null");
            return call_function(held_table().table->*slot, self, values);
        };
        return made;
    }
};

} // namespace pmxboard
