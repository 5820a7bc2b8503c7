// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <algorithm>
#include <list>
#include <stdexcept>

#include "board/devices.h"
#include "board/display_part.h"
#include "board/names.h"
#include "board/tokens.h"

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
    unsigned calls = 0;                ///< with these arguments, since it was set
    std::chrono::microseconds until{}; ///< of When::For
};

/** In the order in which they were set; what has fired for good is taken out. */
std::list<Script>& scripts()
{
    static std::list<Script> instance;
    return instance;
}

/** Null pointer when the platform has none of this name. */
const PlatformFunction* find_function(std::string_view name)
{
    const auto functions = platform_functions();
    const auto found = std::find_if(functions.begin(), functions.end(),
                                    [&](const PlatformFunction& function) { return function.name == name; });
    return found == functions.end() ? nullptr : &*found;
}

std::string names_of(const PlatformFunction& function, bool (*wanted)(const PlatformParameter&))
{
    std::string text;
    for (const PlatformParameter& parameter : function.parameters)
    {
        if (wanted(parameter))
            text += (text.empty() ? "" : ", ") + std::string(parameter.name);
    }
    return text;
}

const PlatformParameter* find_parameter(const PlatformFunction& function, std::string_view name)
{
    const auto found = std::find_if(function.parameters.begin(), function.parameters.end(),
                                    [&](const PlatformParameter& parameter) { return parameter.name == name; });
    return found == function.parameters.end() ? nullptr : &*found;
}

bool is_rest(std::string_view token)
{
    return token == "..." || token == "…";
}

/** A matcher that can never be met, or cannot be read, would look like a fault that never happens. */
void check_matcher(const std::string& function, const PlatformParameter& parameter, std::string_view token)
{
    const std::string what = function + ": " + std::string(parameter.name);
    if (token == "*")
        return;
    if (!parameter.is_read)
        throw std::invalid_argument(what + " is an output, and says nothing when the call begins; write *");
    if (token.starts_with('"'))
        unquote(token);
    else if (token.starts_with('{') || token.starts_with('['))
    {
        for (const std::string_view part : tokens::split(tokens::inside(token, token[0], token[0] == '{' ? '}' : ']')))
        {
            if (token[0] == '{' && !is_rest(part) && part.find('=') == part.npos)
                throw std::invalid_argument(what + ": a record's field is written NAME=VALUE, not " +
                                            std::string(part));
        }
    }
    else if (parameter.is_number && !tokens::number(token) && !names::number_of(token))
    {
        std::string near;
        for (const std::string& name : names::nearest(token, names::all()))
            near += (near.empty() ? "; did you mean " : ", ") + name;
        throw std::invalid_argument(what + ": " + std::string(token) + " is neither a number nor a name" + near +
                                    (near.empty() ? "" : "?"));
    }
}

[[noreturn]] void refuse_count(const PlatformFunction& function, std::size_t written)
{
    throw std::invalid_argument(std::string(function.name) + " has " + std::to_string(function.parameters.size()) +
                                " arguments (" + names_of(function, [](const PlatformParameter&) { return true; }) +
                                "), not " + std::to_string(written) + "; ... stands for the rest");
}

void check_arguments(const PlatformFunction& function, const Fault& fault)
{
    if (fault.arguments.empty())
        return;
    auto tokens = tokens::split(fault.arguments);
    const bool is_open = !tokens.empty() && is_rest(tokens.back());
    if (is_open)
        tokens.pop_back();
    const std::size_t count = function.parameters.size();
    if (tokens.size() > count || (tokens.size() < count && !is_open))
        refuse_count(function, tokens.size());
    for (std::size_t i = 0; i < tokens.size(); ++i)
    {
        std::string_view token = tokens[i];
        const std::size_t equals = token.find_first_of("={[\"");
        if (equals != token.npos && token[equals] == '=')
        {
            const std::string_view name = tokens::trim(token.substr(0, equals));
            if (name != function.parameters[i].name)
                throw std::invalid_argument(fault.function + ": here stands " +
                                            std::string(function.parameters[i].name) + ", not " + std::string(name));
            token = tokens::trim(token.substr(equals + 1));
        }
        check_matcher(fault.function, function.parameters[i], token);
    }
}

void check_outputs(const PlatformFunction& function, const Fault& fault)
{
    for (const Fault::Output& output : fault.outputs)
    {
        const auto of_this_name = [&](const Fault::Output& other) { return other.name == output.name; };
        if (std::count_if(fault.outputs.begin(), fault.outputs.end(), of_this_name) > 1)
            throw std::invalid_argument(fault.function + ": " + output.name + " is set twice");
        const PlatformParameter* const parameter = find_parameter(function, output.name);
        if (parameter == nullptr || !parameter->is_output)
        {
            const std::string there = names_of(function, [](const PlatformParameter& one) { return one.is_output; });
            throw std::invalid_argument(fault.function + " has no output " + output.name +
                                        (there.empty() ? "" : "; it has " + there));
        }
        if (parameter->check == nullptr)
            throw std::invalid_argument(fault.function + ": " + output.name +
                                        " is the address of something, and a fault has none to hand out");
        try
        {
            parameter->check(output.value);
        }
        catch (const std::invalid_argument& error)
        {
            throw std::invalid_argument(fault.function + ": " + output.name + ": " + error.what());
        }
    }
}

/** One spelling for all that mean the same: 0x1 is 1, and so is what is called so. */
std::string plain(std::string_view token)
{
    const auto together = [](std::string_view parts) {
        std::string text;
        for (const std::string_view part : tokens::split(parts))
            text += (text.empty() ? "" : ", ") + plain(part);
        return text;
    };
    if (token.starts_with('['))
        return "[" + together(tokens::inside(token, '[', ']')) + "]";
    if (token.starts_with('{'))
        return "{" + together(tokens::inside(token, '{', '}')) + "}";
    const std::size_t equals = token.find_first_of("={[\"");
    if (equals != token.npos && token[equals] == '=')
        return std::string(tokens::trim(token.substr(0, equals))) + "=" + plain(tokens::trim(token.substr(equals + 1)));
    const auto number = tokens::number(token);
    const auto named = number ? number : names::number_of(token);
    return named ? std::to_string(*named) : std::string(token);
}

/** The arguments one by one, by their places; what does not matter at the end is left out. */
std::vector<std::string> plain_arguments(std::string_view arguments)
{
    std::vector<std::string> all;
    for (std::string_view token : tokens::split(arguments))
    {
        const std::size_t equals = token.find_first_of("={[\"");
        if (equals != token.npos && token[equals] == '=')
            token = tokens::trim(token.substr(equals + 1));
        all.push_back(plain(token));
    }
    while (!all.empty() && (all.back() == "*" || is_rest(all.back())))
        all.pop_back();
    return all;
}

bool is_same_call(const Fault& one, const Fault& other)
{
    return one.function == other.function && plain_arguments(one.arguments) == plain_arguments(other.arguments);
}

/** Each call of the platform is held against all of them. */
void refuse_too_many(std::size_t count)
{
    constexpr std::size_t most = 256;
    if (count > most)
        throw std::invalid_argument("more than " + std::to_string(most) + " faults at once");
}

bool is_over(const Script& script)
{
    return script.fault.when == Fault::When::For && now() >= script.until;
}

bool is_meant(const Fault& fault, const TraceEntry& call)
{
    if (fault.function != call.function)
        return false;
    return fault.arguments.empty() || call.matches(fault.function + "(" + fault.arguments + ")");
}

/** Counts a call that is meant; whether the fault is due. */
bool counts_to_due(Script& script)
{
    ++script.calls;
    switch (script.fault.when)
    {
    case Fault::When::On: return script.calls == script.fault.n;
    case Fault::When::From: return script.calls >= script.fault.n;
    case Fault::When::Always:
    case Fault::When::For: break;
    }
    return true;
}

/** As it would be set now, to do the same. */
Fault rest_of(const Script& script)
{
    Fault rest = script.fault;
    if (rest.when == Fault::When::For)
        rest.time = script.until - now();
    else if (rest.when != Fault::When::Always)
        rest.n -= std::min(script.calls, rest.n - 1);
    return rest;
}

std::string call_text(const Fault& fault)
{
    return fault.arguments.empty() ? fault.function : fault.function + "(" + fault.arguments + ")";
}

std::string when_text(const Fault& fault)
{
    switch (fault.when)
    {
    case Fault::When::On: return fault.n == 1 ? "" : " on " + std::to_string(fault.n);
    case Fault::When::From: return " from " + std::to_string(fault.n);
    case Fault::When::Always: return " always";
    case Fault::When::For: break;
    }
    return " for " + display_part::to_text({ true, fault.time });
}

Value answer_of(const Fault& fault)
{
    return Value::number(fault.answer, names::name_of(names::family_of(fault.function, "result"), fault.answer));
}

} // namespace

void check(const Fault& fault)
{
    const PlatformFunction* const found = find_function(fault.function);
    if (found == nullptr)
        throw std::invalid_argument("no platform function is called " + fault.function +
                                    nearest_functions(fault.function, true));
    if (!found->has_result)
        throw std::invalid_argument(fault.function + " has no result that a fault could answer" +
                                    nearest_functions(fault.function, true));
    const bool is_counted = fault.when == Fault::When::On || fault.when == Fault::When::From;
    if (is_counted && fault.n == 0)
        throw std::invalid_argument("calls of " + fault.function + " are counted from 1");
    if (fault.when == Fault::When::For && fault.time <= std::chrono::microseconds::zero())
        throw std::invalid_argument("a fault of " + fault.function + " lasts for some time");
    check_arguments(*found, fault);
    check_outputs(*found, fault);
}

void check_all(const std::vector<Fault>& faults)
{
    refuse_too_many(faults.size());
    for (const Fault& fault : faults)
        check(fault);
}

void set(const Fault& fault)
{
    check(fault);
    scripts().remove_if(is_over);
    const auto replaced = [&](const Script& script) { return is_same_call(script.fault, fault); };
    refuse_too_many(scripts().size() + 1 -
                    static_cast<std::size_t>(std::count_if(scripts().begin(), scripts().end(), replaced)));
    scripts().remove_if(replaced);
    scripts().push_back({ fault, 0, now() + fault.time });
}

void clear(std::string_view function)
{
    scripts().remove_if([&](const Script& script) { return script.fault.function == function; });
}

void clear(std::string_view function, std::string_view arguments)
{
    const Fault meant{ std::string(function), 0, Fault::When::On, 1, std::string(arguments) };
    scripts().remove_if([&](const Script& script) { return is_same_call(script.fault, meant); });
}

void clear_all()
{
    scripts().clear();
}

std::vector<Fault> active()
{
    std::vector<Fault> faults;
    for (const Script& script : scripts())
    {
        if (!is_over(script))
            faults.push_back(rest_of(script));
    }
    return faults;
}

std::pair<std::string, std::string> read_call(std::string_view written)
{
    const std::size_t open = written.find('(');
    if (open == written.npos)
        return { std::string(written), {} };
    if (tokens::closing(written, open) != written.size() - 1)
        throw std::invalid_argument("behind a call's arguments nothing may stand: " + std::string(written));
    std::string arguments(tokens::trim(written.substr(open + 1, written.size() - open - 2)));
    std::string function(tokens::trim(written.substr(0, open)));
    // They would mean a call with no arguments, which nobody can make.
    if (const PlatformFunction* const known = find_function(function);
        known != nullptr && arguments.empty() && !known->parameters.empty())
        refuse_count(*known, 0);
    // Whatever it is called with.
    if (is_rest(arguments))
        arguments.clear();
    return { std::move(function), std::move(arguments) };
}

std::string to_text(const Fault& fault)
{
    std::string text = call_text(fault) + " " + answer_of(fault).to_text() + when_text(fault);
    for (const Fault::Output& output : fault.outputs)
        text.append(" ").append(output.name).append("=").append(output.value);
    return text;
}

void power_on(const Description& description)
{
    clear_all();
    for (const Fault& fault : description.faults)
        set(fault);
}

Value state()
{
    std::vector<Value> faults;
    for (const Script& script : scripts())
    {
        if (is_over(script))
            continue;
        const Fault& fault = script.fault;
        Value outputs = Value::record({});
        for (const Fault::Output& output : fault.outputs)
            outputs.add(output.name, Value::text(output.value));
        const std::string when = when_text(fault);
        faults.push_back(Value::record(
            { { "call", Value::text(call_text(fault)) },
              { "answer", answer_of(fault) },
              { "when", Value::text(when.empty() ? "on 1" : when.substr(1)) },
              { "calls", Value::number(script.calls) },
              { "until_us", fault.when == Fault::When::For ? Value::number(script.until.count()) : Value::null() },
              { "outputs", outputs } }));
    }
    return Value::list(std::move(faults));
}

std::optional<Fault> due(const TraceEntry& call)
{
    std::optional<Fault> latest;
    scripts().remove_if([&](Script& script) {
        if (is_over(script))
            return true;
        if (!is_meant(script.fault, call) || !counts_to_due(script))
            return false;
        latest = script.fault;
        return script.fault.when == Fault::When::On;
    });
    return latest;
}

} // namespace faults
} // namespace board
