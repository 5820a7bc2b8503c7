// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The devices of the board: each holds its state in one struct in its own file, makes it good as new and reports it.
 *  What one device must know of another it asks here. */
#pragma once

#include "board/board.h"

namespace board
{

namespace os
{
void power_on(const Description& description);
Value state();
/** Whether there is a mutex of this handle, and whether it is held. */
bool is_mutex(std::uint32_t handle);
bool mutex_held(std::uint32_t handle);
/** Whether a timer's expiry function is running, in the thread that runs. */
bool in_timer_context();
/** A small number that no object of the operating-system layer has had since power-on. */
std::uint32_t new_handle();
/** A call came for an object ("timer", "semaphore") that does not exist. */
void report_bad_handle(const std::string& function, const std::string& kind, std::uint32_t handle);
} // namespace os

/** The operating-system layer's timers, and the clock. */
namespace timers
{
void power_on();
Value state();
/** Let the board itself do something at a moment, in a thread of its own and not in the timers' context. There is one
 *  alarm; setting it anew replaces it. */
void set_alarm(std::chrono::microseconds due, void (*action)());
void clear_alarm();
} // namespace timers

namespace console
{
void power_on(const Description& description);
Value state();
/** Print what is no stack function's print. */
void print(std::string_view text);
} // namespace console

namespace flash
{
void power_on(const Description& description);
Value state();
} // namespace flash

namespace registers
{
void power_on(const Description& description);
Value state();
} // namespace registers

namespace interface_manager
{
void power_on(const Description& description);
Value state();
/** Whether somebody holds this interface. */
bool held(std::uint16_t component_type, std::uint16_t component_id, std::uint32_t interface_id);
/** An outermost operation of the layer begins, and ends: what it fetched it has to have given back by then. */
void operation_begins();
void operation_ends(const std::string& operation);
} // namespace interface_manager

namespace power
{
void power_on(const Description& description);
Value state();
} // namespace power

namespace mixer
{
/** How many values stand behind pointers to them. */
inline constexpr unsigned PLANES = 8;
inline constexpr unsigned GAMMA_POINTS = 9;
void power_on(const Description& description);
Value state();
} // namespace mixer

namespace tv_encoder
{
void power_on(const Description& description);
Value state();
} // namespace tv_encoder

namespace video_planes
{
void power_on(const Description& description);
Value state();
} // namespace video_planes

namespace osd_planes
{
/** How many values stand behind a pointer to them. */
inline constexpr unsigned PLANES_WITH_OFFSET = 5;
void power_on(const Description& description);
Value state();
} // namespace osd_planes

namespace sources
{
void power_on(const Description& description);
Value state();
} // namespace sources

namespace hdmi_av
{
/** What a command's parameter, or a query's, is recorded as. */
CallArgument command_parameter(const void* parameter, std::uint32_t command);
CallArgument query_parameter(void* parameter, std::uint32_t query);
void power_on(const Description& description);
Value state();
} // namespace hdmi_av

namespace display_part
{
void power_on(const Description& description);
Value state();
} // namespace display_part

namespace display_control
{
void power_on(const Description& description);
Value state();
} // namespace display_control

namespace trace
{
/** Empty the trace and count from 1 again; calls that are running are forgotten. */
void power_on();
} // namespace trace

namespace faults
{
void power_on(const Description& description);
Value state();
/** Throws std::invalid_argument when a fault cannot be scripted: see faults::set. */
void check(const Fault& fault);
/** The same of those that are to be in force together, and of how many there are. */
void check_all(const std::vector<Fault>& faults);
/** Counts a call that begins; the fault that is due. */
std::optional<Fault> due(const TraceEntry& call);
} // namespace faults

/** "; did you mean X, Y?" with the platform functions whose names are nearest, or nothing. */
std::string nearest_functions(std::string_view wrong, bool with_result);

/** Report a misuse of the platform: console line, trace notice, counted. */
void report_misuse(std::string text);

} // namespace board
