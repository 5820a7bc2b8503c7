// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/trace.h"

#include <cxxabi.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "board/devices.h"
#include "board/executable_symbols.h"
#include "board/recorder.h"
#include "board/threads.h"
#include "board/tokens.h"

namespace board
{
namespace
{

Value::Base base_of(std::string_view function, std::string_view argument)
{
    static constexpr std::string_view hexadecimal[] = { "u4Address", "u4Value", "u4BgColor", "u4PlaneOrder",
                                                        "u4Capability" };
    const bool hex = std::find(std::begin(hexadecimal), std::end(hexadecimal), argument) != std::end(hexadecimal) ||
                     (function == "x_reg_read32" && argument == "result");
    return hex ? Value::Base::Hex : Value::Base::Decimal;
}

/** A number gets the name and the base of its parameter. */
Value dressed(Value value, names::Family family, Value::Base base)
{
    if (value.kind() != Value::Kind::Number || !value.string().empty())
        return value;
    const bool hex = base == Value::Base::Hex || value.base() == Value::Base::Hex;
    return Value::number(value.as_number(), names::name_of(family, value.as_number()),
                         hex ? Value::Base::Hex : Value::Base::Decimal);
}

/** "pu4PlaneOrder" of "array(pu4PlaneOrder, 8)", "pvParameter" of "value(\"pvParameter\", …)". */
std::string_view name_in(std::string_view token)
{
    for (std::size_t open = token.find('('); open != token.npos; open = token.find('('))
        token = tokens::split(token.substr(open + 1, tokens::closing(token, open) - open - 1)).front();
    if (token.starts_with('&'))
        token.remove_prefix(1);
    if (token.starts_with('"'))
        token = token.substr(1, token.size() - 2);
    return token;
}

CallSite::Parameter parameter(std::string_view function, std::string_view name)
{
    return { std::string(name), names::family_of(function, name), base_of(function, name) };
}

/** A function's plain name: without its parameters and an unnamed namespace; empty when it has none worth showing. */
std::string plain_name(std::string_view symbol)
{
    int status = 0;
    const std::string mangled(symbol);
    char* const demangled = abi::__cxa_demangle(mangled.c_str(), nullptr, nullptr, &status);
    std::string name = demangled != nullptr ? demangled : mangled;
    std::free(demangled);
    if (name.find('{') != name.npos)
        return {};
    static constexpr std::string_view unnamed = "(anonymous namespace)::";
    for (std::size_t at = name.find(unnamed); at != name.npos; at = name.find(unnamed))
        name.erase(at, unnamed.size());
    return name.substr(0, name.find('('));
}

Value named_object(const void* object, const char* unknown)
{
    if (object == nullptr)
        return Value::null();
    const auto& objects = recorder().objects;
    if (const auto found = objects.find(object); found != objects.end())
        return Value::symbol(found->second);
    const std::string name = plain_name(executable_symbols::name_at(object));
    return Value::symbol(name.empty() ? unknown : name);
}

} // namespace

CallSite::CallSite(std::string_view function_name, std::string_view tokens)
    : function(function_name), result(parameter(function_name, "result"))
{
    for (const std::string_view token : tokens::split(tokens))
        parameters.push_back(parameter(function_name, name_in(token)));
}

CallRecord::CallRecord(const CallSite& site, std::vector<CallArgument> arguments)
    : m_site(site), m_is_handed_on(threads::context().replacement == site.function), m_arguments(std::move(arguments)),
      m_sequence(0), m_power_on(recorder().power_on), m_by_before(threads::context().by)
{
    if (m_is_handed_on)
        return;
    trace::look();
    TraceEntry& entry = add_entry(TraceEntry::Kind::Call, site.function);
    m_sequence = entry.sequence;
    entry.arguments.reserve(m_arguments.size());
    for (std::size_t i = 0; i < m_arguments.size(); ++i)
    {
        const CallSite::Parameter& parameter = site.parameters[i];
        if (!m_arguments[i].left_out)
            entry.arguments.push_back(
                { parameter.name, dressed(std::move(m_arguments[i].value), parameter.family, parameter.base) });
    }
    contained([&] { m_fault = faults::due(entry); });
    threads::Context& context = threads::context();
    ++context.depth;
    context.by = site.function;
}

CallRecord::~CallRecord()
{
    if (m_is_handed_on)
        return;
    contained([this] {
        if (m_power_on != recorder().power_on)
            return;
        write_outputs();
        trace::look();
        meanwhiles::call_ends(m_site.function, m_sequence);
    });
    threads::Context& context = threads::context();
    context.by = m_by_before;
    if (m_power_on != recorder().power_on)
        return;
    --context.depth;
    contained([this] {
        if (const TraceEntry* const entry = entry_of(m_sequence))
            finished(*entry);
    });
}

void CallRecord::write_outputs()
{
    TraceEntry* const entry = entry_of(m_sequence);
    if (entry == nullptr || entry->kind != TraceEntry::Kind::Call)
        return;
    auto recorded = entry->arguments.begin();
    for (std::size_t i = 0; i < m_arguments.size(); ++i)
    {
        const CallArgument& argument = m_arguments[i];
        if (argument.left_out)
            continue;
        const bool unchanged = m_outputs_unchanged && argument.unchanged_by_failure;
        const CallSite::Parameter& parameter = m_site.parameters[i];
        if (argument.at_end)
            recorded->value =
                unchanged ? Value::symbol("<unchanged>") : dressed(argument.at_end(), parameter.family, parameter.base);
        ++recorded;
    }
}

void CallRecord::put_fault_outputs()
{
    for (const Fault::Output& output : m_fault->outputs)
    {
        for (std::size_t i = 0; i < m_arguments.size(); ++i)
        {
            if (m_site.parameters[i].name != output.name || !m_arguments[i].put)
                continue;
            m_arguments[i].put(output.value);
            m_arguments[i].unchanged_by_failure = false;
        }
    }
}

void CallRecord::set_result(std::int64_t result, bool faulted)
{
    TraceEntry* const entry = m_power_on == recorder().power_on ? entry_of(m_sequence) : nullptr;
    if (entry == nullptr)
        return;
    entry->result = dressed(Value::number(result), m_site.result.family, m_site.result.base);
    entry->faulted = faulted;
}

void CallRecord::log(std::int32_t level, std::string text, bool shown)
{
    if (TraceEntry* const entry = entry_of(m_sequence))
    {
        entry->kind = TraceEntry::Kind::Log;
        entry->arguments.clear();
        entry->level = level;
        entry->text = std::move(text);
        entry->shown = shown;
    }
}

void CallRecord::assertion()
{
    if (TraceEntry* const entry = entry_of(m_sequence))
        entry->kind = TraceEntry::Kind::Assert;
}

Value trace_arguments::object_value(const void* object)
{
    return named_object(object, "<object>");
}

Value trace_arguments::function_value(const void* function)
{
    return named_object(function, "<function>");
}

CallArgument trace_arguments::text(char* buffer, std::size_t size)
{
    return { {},
             [buffer, size] {
                 if (buffer == nullptr || size == 0)
                     return Value::null();
                 return Value::text(std::string(buffer, strnlen(buffer, size)));
             },
             true,
             false,
             [buffer, size](std::string_view written) { outputs::put_text(buffer, size, written); } };
}

} // namespace board
