// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Verbs for what neighbouring drivers call: the platform, and the table that the mixer registers.
#include "drv_if.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/ipmx.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

std::int64_t number_of_tag(void* tag)
{
    return static_cast<std::int64_t>(reinterpret_cast<std::uintptr_t>(tag));
}

void call_slot(Session& session, const Words& given)
{
    const Operation* const slot = find(ipmx_slots(), given.at("SLOT"));
    if (slot == nullptr)
        throw LineError("IPMX has no slot " + given.at("SLOT") +
                        did_you_mean(given.at("SLOT"), names_of(ipmx_slots())));
    std::vector<std::string> words(given.line().words().begin() + 2, given.line().words().end());
    const bool registered_tag = words[0] == "tag";
    if (registered_tag)
        words[0] = "0";
    Values values = read_arguments(*slot, words);

    void* table = nullptr;
    void* tag = nullptr;
    const INT32 queried = i4ImQueryInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, &table, &tag);
    if (queried < 0)
        throw StepFailed("no IPMX table is registered: i4ImQueryInterface answers " + std::to_string(queried));
    held_table() = { static_cast<const IPMX*>(table), tag };
    if (registered_tag)
        values[0] = board::Value::number(number_of_tag(tag));

    // What is expected of the call is not mixed with what every neighbour does around it.
    session.begin_window();
    try
    {
        session.run(*slot, values);
    }
    catch (const StepFailed&)
    {
        i4ImReleaseInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, tag);
        throw;
    }
    session.end_window();
    const INT32 released = i4ImReleaseInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, tag);
    if (released < 0)
        throw StepFailed("the IPMX table cannot be given back: i4ImReleaseInterface answers " +
                         std::to_string(released));
}

void call_platform(Session& session, const Words& words)
{
    const std::string& name = words.at("FUNCTION");
    const Operation* const operation = find(neighbours(), name);
    if (operation == nullptr)
        throw LineError("a neighbour cannot call " + name + " here" + did_you_mean(name, names_of(neighbours())));
    const Values values = read_arguments(*operation, std::span(words.line().words()).subspan(2));
    session.set_outcome(operation->name, operation->run(values));
}

} // namespace

std::vector<Verb> neighbour_verbs()
{
    return {
        { "neighbour",
          { { "neighbour FUNCTION [ARGUMENT…]",
              "call a function of the platform, one that takes numbers and returns nothing, as a neighbouring driver "
              "would behind the layer's back",
              call_platform } } },
        { "ipmx",
          { { "ipmx SLOT tag|NUMBER [ARGUMENT…]",
              "call through the table that the mixer has registered, with the tag that it has registered or another "
              "one: query the interface manager as a neighbouring driver does, call the slot and give the table back",
              call_slot } } },
    };
}

} // namespace pmxboard
