// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/meanwhile.h"

#include <algorithm>
#include <exception>
#include <stdexcept>
#include <utility>

#include "board/contained.h"
#include "board/devices.h"
#include "board/recorder.h"
#include "board/threads.h"

namespace board
{
namespace
{

struct Script
{
    meanwhiles::Armed armed;
    bool as_thread = false;
    std::function<void()> action;
};

struct Meanwhiles
{
    std::vector<Script> scripts;
    std::function<void(const TraceEntry&)> every_call;
    std::exception_ptr failure; ///< the first one
};

Meanwhiles& meanwhiles_state()
{
    static Meanwhiles instance;
    return instance;
}

void carry_out(const Script& script)
{
    const auto act = [action = script.action] {
        const trace::By scope("meanwhile");
        contained(action);
    };
    if (script.as_thread)
        contained([&] { threads::run(script.armed.name, act); });
    else
        act();
}

std::vector<Script> take_due(std::string_view function)
{
    std::vector<Script> due;
    std::erase_if(meanwhiles_state().scripts, [&](Script& script) {
        if (script.armed.function != function || ++script.armed.calls < script.armed.n)
            return false;
        due.push_back(std::move(script));
        return true;
    });
    return due;
}

/** The same exception, that says which function it has kept from its work. */
std::exception_ptr with_function(const char* function)
{
    try
    {
        throw;
    }
    catch (const std::exception& error)
    {
        return std::make_exception_ptr(
            std::runtime_error(std::string(function) + " could not do its work: " + error.what()));
    }
    catch (...)
    {
        return std::current_exception();
    }
}

} // namespace

void keep_failure(const char* function) noexcept
{
    std::exception_ptr& failure = meanwhiles_state().failure;
    if (failure)
        return;
    try
    {
        failure = function == nullptr ? std::current_exception() : with_function(function);
    }
    catch (...) // no memory for the words either
    {
        failure = std::current_exception();
    }
}

void meanwhile(std::string function, unsigned n, std::function<void()> action, MeanwhileAs as)
{
    const auto functions = platform_functions();
    if (std::none_of(functions.begin(), functions.end(), [&](const auto& known) { return known.name == function; }))
        throw std::invalid_argument("no platform function is called " + function + nearest_functions(function, false));
    if (n == 0)
        throw std::invalid_argument("calls of " + function + " are counted from 1");
    std::string name = as.name.empty() ? "meanwhile inside " + function : std::move(as.name);
    meanwhiles_state().scripts.push_back(
        { { std::move(function), n, 0, std::move(name) }, as.thread, std::move(action) });
}

void at_every_call(std::function<void(const TraceEntry&)> action)
{
    meanwhiles_state().every_call = std::move(action);
}

namespace meanwhiles
{

std::vector<Armed> armed()
{
    std::vector<Armed> all;
    for (const Script& script : meanwhiles_state().scripts)
        all.push_back(script.armed);
    return all;
}

void forget(std::string_view function)
{
    std::erase_if(meanwhiles_state().scripts,
                  [function](const Script& script) { return script.armed.function == function; });
}

void forget_all()
{
    meanwhiles_state().scripts.clear();
}

void rethrow_failure()
{
    if (const std::exception_ptr failure = std::exchange(meanwhiles_state().failure, nullptr))
        std::rethrow_exception(failure);
}

void forget_failures()
{
    meanwhiles_state().failure = nullptr;
}

void call_ends(std::string_view function, std::uint64_t sequence)
{
    if (!meanwhiles_state().scripts.empty())
    {
        for (const Script& script : take_due(function))
            carry_out(script);
    }
    if (!meanwhiles_state().every_call || threads::context().in_hook)
        return;
    const TraceEntry* const entry = entry_of(sequence);
    if (entry == nullptr)
        return;
    const trace::By scope("meanwhile");
    const auto hook = meanwhiles_state().every_call;
    const TraceEntry copy = *entry;
    threads::Context& context = threads::context();
    context.in_hook = true;
    contained([&] { hook(copy); });
    context.in_hook = false;
}

} // namespace meanwhiles
} // namespace board
