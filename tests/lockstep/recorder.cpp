// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Runs one operation in one layer, and is the platform meanwhile. */
#include "tests/lockstep/recorder.h"

#include <cstdlib>
#include <cstring>
#include <iostream>
#include <string_view>

#include "tests/lockstep/lockstep.h"
#include "tests/lockstep/random.h"
#include "tools/record_view/record_layout.h"

namespace lockstep
{
namespace
{

alignas(8) unsigned char caller[caller_size];

struct Object
{
    void* addresses[2];
    std::size_t offset;
    std::size_t size;
};

const std::vector<Object>& objects()
{
    static const std::vector<Object> made = [] {
        std::vector<Object> all;
        std::size_t offset = 0;
        for (const record_view::Object& object : record_view::objects())
        {
            for (unsigned i = 0; i < state_object_count; ++i)
            {
                if (object.symbol == state_objects[i].name)
                    all.push_back(
                        { { state_objects[i].addresses[0], state_objects[i].addresses[1] }, offset, object.node.size });
            }
            offset = (offset + object.node.size + 7) / 8 * 8;
        }
        if (all.size() != record_view::objects().size() || all.size() != state_object_count)
        {
            std::cerr << "the layers' state is not what the record's layout lists\n";
            std::exit(2);
        }
        return all;
    }();
    return made;
}

unsigned layer_now;
const Surroundings* surroundings_now;
Trace* trace_now;
Call* call_now;

void take_image(unsigned char* to)
{
    for (const Object& object : objects())
        std::memcpy(to + object.offset, object.addresses[layer_now], object.size);
    std::memcpy(to + caller_offset(), caller, caller_size);
}

void put_image(const Image& image)
{
    for (const Object& object : objects())
        std::memcpy(object.addresses[layer_now], &image[object.offset], object.size);
    std::memcpy(caller, &image[caller_offset()], caller_size);
}

void disturb(const Disturbance& disturbance)
{
    if (disturbance.offset >= caller_offset())
    {
        std::memcpy(caller + (disturbance.offset - caller_offset()), &disturbance.value, disturbance.size);
        return;
    }
    for (const Object& object : objects())
    {
        if (disturbance.offset >= object.offset && disturbance.offset < object.offset + object.size)
            std::memcpy(static_cast<char*>(object.addresses[layer_now]) + (disturbance.offset - object.offset),
                        &disturbance.value, disturbance.size);
    }
}

bool within(const void* pointer, const void* first, std::size_t size, std::uint64_t& offset)
{
    offset = reinterpret_cast<std::uintptr_t>(pointer) - reinterpret_cast<std::uintptr_t>(first);
    return offset < size;
}

std::uint64_t pointed(const void* pointer)
{
    std::uint64_t offset = 0;
    if (pointer == nullptr)
        return 0;
    if (within(pointer, caller, caller_size, offset))
        return to_caller + offset;
    for (const Object& object : objects())
    {
        if (within(pointer, object.addresses[layer_now], object.size, offset))
            return to_state + object.offset + offset;
    }
    return to_elsewhere;
}

/* What a frame finds on the stack must not be what it would have written there. */
__attribute__((noinline)) void dirty_stack()
{
    unsigned char stack[2048];
    std::memset(stack, 0xA5, sizeof stack);
    asm volatile("" : : "r"(stack) : "memory");
}

} // namespace

Recorder::Recorder(unsigned function)
{
    Trace& trace = *trace_now;
    m_drawn = mixed(surroundings_now->seed + 0x9E3779B97F4A7C15 * (trace.calls.size() + 1));
    const std::size_t at = trace.images.size();
    trace.images.resize(at + image_size());
    take_image(&trace.images[at]);
    call_now = &trace.calls.emplace_back(Call{ function, 0, static_cast<unsigned>(trace.given.size()) });
}

std::uint64_t Recorder::draw()
{
    m_drawn += 0x9E3779B97F4A7C15;
    return mixed(m_drawn);
}

void Recorder::add(std::uint64_t value, const void* first, std::size_t size)
{
    if (call_now->count == argument_limit)
    {
        std::cerr << platform[call_now->function].name << " has too many arguments\n";
        std::abort();
    }
    std::vector<unsigned char>& bytes = trace_now->bytes;
    ++call_now->count;
    trace_now->given.push_back({ value, static_cast<std::uint32_t>(bytes.size()), static_cast<std::uint32_t>(size) });
    const auto* const from = static_cast<const unsigned char*>(first);
    bytes.insert(bytes.end(), from, from + size);
}

void Recorder::tag(const void* value)
{
    number(reinterpret_cast<std::uintptr_t>(value));
}

void Recorder::text(const char* text)
{
    add(text != nullptr, text, text == nullptr ? 0 : std::strlen(text));
}

void Recorder::symbol(const void* address)
{
    std::uint64_t value = pointed(address);
    for (unsigned i = 0; i < named_address_count; ++i)
    {
        if (named_addresses[i].addresses[layer_now] == address)
            value = to_named + i;
    }
    number(value);
}

void Recorder::data(const void* first, std::size_t size)
{
    add(pointed(first), first, first == nullptr ? 0 : size);
}

void Recorder::place(const void* first)
{
    number(pointed(first));
}

void Recorder::values(const char* format, va_list values)
{
    static constexpr std::string_view between = "0123456789-+ #.";
    for (const char* at = std::strchr(format, '%'); at != nullptr; at = std::strchr(at, '%'))
    {
        ++at;
        while (between.find(*at) != std::string_view::npos)
            ++at;
        const bool is_long = *at == 'l';
        while (*at == 'l')
            ++at;
        if (*at == '%')
            ++at;
        else if (*at == 's')
            text(va_arg(values, const char*));
        else if (is_long)
            number(va_arg(values, long));
        else
            number(va_arg(values, int));
    }
}

std::int64_t Recorder::answer(bool is_boolean, bool is_success_one)
{
    const Disturbance& disturbance = surroundings_now->disturbance;
    if (disturbance.call == trace_now->calls.size() - 1)
        disturb(disturbance);

    static constexpr std::int64_t booleans[] = { 0, 1, 0, 1, 0, 1, 2, 255 };
    static constexpr std::int64_t numbers[] = { 0, 0, 0, 1, 1, 2, -1, 255, 256, 257, -2147483647 - 1, 0x7FFFFFFF };
    const std::uint64_t drawn = draw();
    if (is_boolean)
        return surroundings_now->calm ? static_cast<std::int64_t>(drawn & 1) : booleans[drawn % 8];
    const std::int64_t usual = is_success_one ? 1 : 0;
    return surroundings_now->calm || drawn % 2 == 0 ? usual : numbers[drawn / 2 % 12];
}

void Recorder::write(void* place, std::size_t count, std::size_t width)
{
    if (place == nullptr)
        return;
    for (std::size_t i = 0; i < count; ++i)
    {
        const std::uint64_t drawn = draw();
        std::uint64_t value = width == 1 && drawn % 8 != 0 ? drawn / 8 % 8 : drawn / 8 % 64;
        if (drawn % 32 == 0)
            value = drawn >> 16;
        std::memcpy(static_cast<char*>(place) + i * width, &value, width);
    }
}

void Recorder::write_text(char* place, std::size_t size)
{
    static constexpr const char* texts[] = { "", "text\n", "per cent %% once more\n" };
    const char* const text = texts[draw() % 3];
    if (place != nullptr && size > std::strlen(text))
        std::strcpy(place, text);
}

void Recorder::write_tag(void** place)
{
    if (place != nullptr)
        *place = reinterpret_cast<void*>(draw());
}

std::uint64_t point(std::size_t offset)
{
    return reinterpret_cast<std::uintptr_t>(caller + offset);
}

unsigned operation_number(const std::string& name)
{
    for (unsigned i = 0; i < operation_count; ++i)
    {
        if (operations[i].function.name == name)
            return i;
    }
    std::cerr << "there is no operation " << name << '\n';
    std::exit(2);
}

void run(const Operation& operation, unsigned layer, const Arguments& arguments, const Image& before,
         const Surroundings& surroundings, Trace& trace)
{
    layer_now = layer;
    surroundings_now = &surroundings;
    trace_now = &trace;
    trace.calls.clear();
    trace.given.clear();
    trace.bytes.clear();
    trace.images.clear();
    put_image(before);
    dirty_stack();
    trace.result = operation.run(operation.entries[layer], arguments.data());
    trace.after.resize(image_size());
    take_image(trace.after.data());
}

} // namespace lockstep
