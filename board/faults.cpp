// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <algorithm>
#include <map>
#include <stdexcept>

#include "board/devices.h"
#include "board/names.h"

namespace board
{

std::string nearest_functions(std::string_view wrong, bool with_result)
{
    std::vector<std::string_view> candidates;
    for (const PlatformFunction& function : platform_functions())
    {
        if (function.has_result || !with_result)
            candidates.push_back(function.name);
    }
    std::string text;
    for (const std::string& near : names::nearest(wrong, candidates))
        text += (text.empty() ? "; did you mean " : ", ") + near;
    return text.empty() ? text : text + "?";
}

namespace faults
{
namespace
{

struct Script
{
    Fault fault;
    unsigned calls = 0; ///< since it was set
};

/** By function; what has fired for good is taken out. */
std::map<std::string, Script, std::less<>>& scripts()
{
    static std::map<std::string, Script, std::less<>> instance;
    return instance;
}

} // namespace

void check(const Fault& fault)
{
    const auto functions = platform_functions();
    const auto found = std::find_if(functions.begin(), functions.end(),
                                    [&](const PlatformFunction& function) { return function.name == fault.function; });
    if (found == functions.end())
        throw std::invalid_argument("no platform function is called " + fault.function +
                                    nearest_functions(fault.function, true));
    if (!found->has_result)
        throw std::invalid_argument(fault.function + " has no result that a fault could answer" +
                                    nearest_functions(fault.function, true));
    // Its table is called: success without one would have the layer jump to nowhere.
    if (fault.function == "i4ImQueryInterface" && static_cast<std::int32_t>(fault.answer) >= 0)
        throw std::invalid_argument("i4ImQueryInterface hands out a table when it answers " +
                                    std::to_string(fault.answer) + ", and a fault has none; answer less than 0");
    if (fault.when != Fault::When::Always && fault.n == 0)
        throw std::invalid_argument("calls of " + fault.function + " are counted from 1");
}

void set(const Fault& fault)
{
    check(fault);
    scripts()[fault.function] = { fault, 0 };
}

void clear(std::string_view function)
{
    if (const auto found = scripts().find(function); found != scripts().end())
        scripts().erase(found);
}

void clear_all()
{
    scripts().clear();
}

std::vector<Fault> active()
{
    std::vector<Fault> faults;
    for (const auto& [function, script] : scripts())
        faults.push_back(script.fault);
    return faults;
}

void power_on(const Description& description)
{
    for (const Fault& fault : description.faults)
        check(fault);
    clear_all();
    for (const Fault& fault : description.faults)
        set(fault);
}

std::optional<std::int64_t> due(std::string_view function)
{
    const auto found = scripts().find(function);
    if (found == scripts().end())
        return std::nullopt;
    Script& script = found->second;
    const std::int64_t answer = script.fault.answer;
    if (script.fault.when == Fault::When::Always)
        return answer;
    ++script.calls;
    if (script.calls < script.fault.n)
        return std::nullopt;
    if (script.fault.when == Fault::When::On)
        scripts().erase(found);
    else
        script.calls = script.fault.n; // from now on, however often
    return answer;
}

} // namespace faults
} // namespace board
