// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Runs paths on the virtual board and writes each path's last call, and every call of the platform within it, as one
 * JSON object a line. Reads from the standard input: a line `path NUMBER`, then the path's lines. */
#include "tools/cost/recorder.h"

#include <cstdlib>
#include <cstring>
#include <iostream>
#include <map>
#include <ostream>
#include <stdexcept>
#include <vector>

#include "drv_if.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"

namespace cost
{
namespace
{

bool listening = false;         // the path's last line runs
bool in_operation = false;      // it is inside the layer
unsigned in_platform = 0;       // it is inside the platform, where further calls are the platform's own
std::string calls;              // made so far by the operation
std::vector<std::string> lines; // what the last line made of operations

/** The layer has no unwind tables: no exception may pass through it. */
[[noreturn]] void give_up(const std::string& message)
{
    std::cerr << message << std::endl;
    std::exit(1);
}

std::string hex(const void* first, std::size_t size)
{
    constexpr char digits[] = "0123456789abcdef";
    const auto* const bytes = static_cast<const unsigned char*>(first);
    std::string text;
    for (std::size_t i = 0; i < size; ++i)
        text.append(1, digits[bytes[i] >> 4]).append(1, digits[bytes[i] & 0xF]);
    return text;
}

std::string member(const char* name, const std::string& value)
{
    return "{\"" + std::string(name) + "\": \"" + value + "\"}";
}

std::string state()
{
    std::string text;
    for (std::size_t i = 0; i < state_object_count; ++i)
        text += hex(state_objects[i].first, state_objects[i].size);
    return text;
}

} // namespace

Call::Call(Kind kind, const char* name)
    : m_recorded(listening && in_platform == 0 && in_operation == (kind == Kind::Platform)), m_kind(kind), m_name(name)
{
    if (kind == Kind::Platform)
        ++in_platform;
    else if (m_recorded)
    {
        in_operation = true;
        calls.clear();
        lines.push_back("\"state\": \"" + state() + "\", ");
    }
}

Call::~Call()
{
    if (m_kind == Kind::Platform)
        --in_platform;
    if (!m_recorded)
        return;
    const std::string made = "\"name\": \"" + m_name + "\", \"arguments\": [" + m_arguments + "], \"outputs\": {" +
                             m_outputs + "}, \"result\": " + (m_result.empty() ? "null" : m_result);
    if (m_kind == Kind::Platform)
    {
        calls += (calls.empty() ? "{" : ", {") + made + "}";
        return;
    }
    in_operation = false;
    lines.back() += made + ", \"calls\": [" + calls + "]";
}

void Call::add(const std::string& argument)
{
    if (m_recorded)
        m_arguments += (m_arguments.empty() ? "" : ", ") + argument;
}

void Call::tag(const void* value)
{
    number(reinterpret_cast<std::uintptr_t>(value));
}

void Call::text(const char* text)
{
    add(text == nullptr ? "null" : member("text", hex(text, std::strlen(text))));
}

void Call::symbol(const void* address)
{
    for (std::size_t i = 0; i < named_address_count; ++i)
    {
        if (named_addresses[i].address == address)
            return add(member("symbol", named_addresses[i].name));
    }
    if (m_recorded)
        give_up(m_name + " is given the address of something without a public name");
}

void Call::data(const void* first, std::size_t size)
{
    add(first == nullptr ? "null" : member("data", hex(first, size)));
}

void Call::place(const void* first)
{
    add(first == nullptr ? "null" : "{\"place\": true}");
}

/* Only conversions that the layer uses: %d %i %u %x %c, %ld and the like, %s, %%. */
void Call::values(const char* format, va_list values)
{
    for (const char* at = std::strchr(format, '%'); at != nullptr; at = std::strchr(at, '%'))
    {
        at += 1 + std::strspn(at + 1, "0123456789-+ #.");
        const std::size_t length = std::strspn(at, "l");
        at += length;
        if (*at == '%')
            ++at;
        else if (*at == 's')
            text(va_arg(values, const char*));
        else if (*at == '\0' || std::strchr("diuxXc", *at) == nullptr)
            give_up(m_name + ": no reader for a conversion in: " + format);
        else if (length == 0)
            number(va_arg(values, int));
        else
            add("{\"long\": " + std::to_string(va_arg(values, long)) + "}");
    }
}

void Call::wrote(std::size_t index, const void* first, std::size_t size)
{
    if (m_recorded && first != nullptr)
        m_outputs += (m_outputs.empty() ? "\"" : ", \"") + std::to_string(index) + "\": \"" + hex(first, size) + "\"";
}

void Call::answered(std::int64_t result)
{
    m_result = std::to_string(result);
}

namespace
{

std::map<void*, const IVdp*> tables; // by tag: the video planes' own

UINT32 set_color_mode(void* tag, DRV_PMX_COLOR_SPACE_T color_space)
{
    Call call(Call::Kind::Platform, "pu4SetColorMode");
    call.tag(tag);
    call.number(color_space);
    const UINT32 result = tables.at(tag)->pu4SetColorMode(tag, color_space);
    call.answered(result);
    return result;
}

constexpr IVdp recording_table = { nullptr, nullptr, nullptr,        nullptr, nullptr, nullptr,
                                   nullptr, nullptr, set_color_mode, nullptr, nullptr };

/** Read and run one path; false at the end of the input. */
bool run_path(std::string& heading)
{
    std::vector<std::string> path;
    std::string line;
    bool more = false;
    while (!more && std::getline(std::cin, line))
    {
        more = line.starts_with("path ");
        if (!more)
            path.push_back(line);
    }
    if (!heading.empty())
    {
        pmxboard::Output output(pmxboard::OutputOptions{});
        pmxboard::Session session(output, "default", ".");
        lines.clear();
        for (std::size_t i = 0; i < path.size(); ++i)
        {
            listening = i + 1 == path.size();
            session.run_line(path[i]);
        }
        listening = false;
        session.finish();
        if (lines.size() != 1)
            throw std::runtime_error("the last line of a path has to call one operation");
        std::cout << "{\"path\": " << heading.substr(5) << ", " << lines.front() << "}"
                  << std::endl; // whole, should a later path crash
    }
    heading = line;
    return more;
}

} // namespace

void exchange_table(void** table, void* const* tag)
{
    if (in_operation && *table != nullptr)
    {
        tables[*tag] = static_cast<const IVdp*>(*table);
        *table = const_cast<IVdp*>(&recording_table);
    }
}

} // namespace cost

int main()
{
    std::string heading;
    try
    {
        while (cost::run_path(heading))
            continue;
        return 0;
    }
    catch (const std::exception& error)
    {
        std::cerr << heading << ": " << error.what() << '\n';
        return 1;
    }
}
