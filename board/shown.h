// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What of the devices decides what is seen, as plain numbers. Who looks at every call copies and compares them, where
 *  the whole state by name would take longer than the call. */
#pragma once

#include <array>
#include <compare>
#include <cstdint>
#include <optional>

namespace board
{

namespace mixer
{
struct Shown
{
    std::array<bool, 8> mixed{}; ///< by plane, from 0
    bool muted = false;
    bool digital_out = false;
    std::optional<std::uint8_t> digital_bits;
    std::optional<std::uint8_t> mode;

    auto operator<=>(const Shown&) const = default;
};
Shown shown();
} // namespace mixer

namespace tv_encoder
{
struct Shown
{
    bool has_format = false;
    std::uint8_t target = 0;
    std::uint8_t frequency = 0;
    bool enabled = false;
    bool black_screen = false;

    auto operator<=>(const Shown&) const = default;
};
/** Component, and composite. */
std::array<Shown, 2> shown();
} // namespace tv_encoder

namespace hdmi_av
{
/** What one of the outputs was told last. */
struct Told
{
    bool enabled = false;
    std::int64_t mode = 0;

    auto operator<=>(const Told&) const = default;
};
struct Shown
{
    bool sink_plugged = false;
    std::optional<Told> hdmi;
    std::optional<Told> digital;

    auto operator<=>(const Shown&) const = default;
};
Shown shown();
} // namespace hdmi_av

namespace timers
{
/** The function that a timer will call; null while it does not run, or where there is none of this handle. */
const void* next_call_of(std::uint32_t handle);
} // namespace timers

} // namespace board
