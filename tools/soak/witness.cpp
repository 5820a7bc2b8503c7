// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/soak/witness.h"

#include "tests/lockstep/random.h"

namespace soak
{

void Witness::see(std::uint64_t number)
{
    m_hash = lockstep::mixed(m_hash + 1) ^ lockstep::mixed(number);
}

void Witness::see(std::string_view text)
{
    constexpr std::uint64_t prime = 0x100000001B3;
    std::uint64_t hash = text.size();
    for (const char c : text)
        hash = (hash ^ static_cast<unsigned char>(c)) * prime;
    see(hash);
}

void Witness::see(const board::Value& value)
{
    see(static_cast<std::uint64_t>(value.kind()));
    see(static_cast<std::uint64_t>(value.as_number()));
    see(value.string());
    for (const std::string& key : value.keys())
        see(key);
    for (const board::Value& item : value.items())
        see(item);
}

void Witness::see(const board::TraceEntry& entry)
{
    see(entry.function);
    see(entry.text);
    see(static_cast<std::uint64_t>(entry.level));
    for (const board::TraceArgument& argument : entry.arguments)
        see(argument.value);
    if (entry.result)
        see(*entry.result);
}

void Witness::see(const pmxboard::Outcome& outcome)
{
    if (outcome.result)
        see(*outcome.result);
    for (const pmxboard::OutputValue& output : outcome.outputs)
        see(output.value.value_or(board::Value::text("untouched")));
}

} // namespace soak
