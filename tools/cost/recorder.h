// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Records what passes between a caller, the layer and the platform, in the raw: the arguments as they are handed over,
 *  and what is answered. The functions between which it stands are written from the headers. */
#pragma once

#include <cstdarg>
#include <cstddef>
#include <cstdint>
#include <string>
#include <type_traits>

#include "drv_if_vdp.h"

namespace cost
{

/** One call, from its arguments to its result. What it does not record (a call that the layer did not make) it lets
 *  pass. */
class Call
{
public:
    enum class Kind
    {
        Operation,
        Platform
    };

    Call(Kind kind, const char* name);
    ~Call();
    Call(const Call&) = delete;
    Call& operator=(const Call&) = delete;

    template <typename T>
    void number(T value)
    {
        add(std::to_string(static_cast<std::int64_t>(value)));
    }
    void tag(const void* value);
    void text(const char* text);
    void symbol(const void* address);
    void data(const void* first, std::size_t size);
    void place(const void* first);
    /** The values that go with a format. */
    void values(const char* format, va_list values);

    /** What an output holds after the call; `index` counts the parameters. */
    void wrote(std::size_t index, const void* first, std::size_t size);
    void answered(std::int64_t result);

private:
    void add(const std::string& argument);

    bool m_recorded;
    Kind m_kind;
    std::string m_name;
    std::string m_arguments;
    std::string m_outputs;
    std::string m_result;
};

/** Put a recording table in the place of a video plane's. */
void exchange_table(void** table, void* const* tag);

/** What the layer holds, object by object. Written from the object file. */
struct StateObject
{
    const char* name;
    const unsigned char* first;
    std::size_t size;
};
extern const StateObject state_objects[];
extern const std::size_t state_object_count;

/** The names of what a pointer may lead to. Written from the headers. */
struct NamedAddress
{
    const char* name;
    const void* address;
};
extern const NamedAddress named_addresses[];
extern const std::size_t named_address_count;

} // namespace cost
