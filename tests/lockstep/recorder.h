// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the platform functions of the lockstep programs do: they are written from the headers and hand everything to
 *  one of these. */
#pragma once

#include <cstdarg>
#include <cstddef>
#include <cstdint>

#include "drv_if_vdp.h"

namespace lockstep
{

/** One call, from its arguments to its answer. */
class Recorder
{
public:
    explicit Recorder(unsigned function);

    template <typename T>
    void number(T value)
    {
        add(static_cast<std::uint64_t>(value), nullptr, 0);
    }
    void tag(const void* value);
    void text(const char* text);
    void symbol(const void* address);
    void data(const void* first, std::size_t size);
    void place(const void* first);
    void values(const char* format, va_list values);

    /** The result, after which the neighbour has been. */
    std::int64_t answer(bool is_boolean, bool is_success_one);
    /** Fill a place: so many numbers of so many bytes. */
    void write(void* place, std::size_t count, std::size_t width);
    void write_text(char* place, std::size_t size);
    void write_tag(void** place);

private:
    void add(std::uint64_t value, const void* first, std::size_t size);
    std::uint64_t draw();

    std::uint64_t m_drawn;
};

/** A video plane's table. */
extern const IVdp plane_table;

} // namespace lockstep
