// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A trace of a run in JSON lines, which somebody hands over for a log. */
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace pmxboard::decode
{

/** Whether bytes begin like a trace in JSON lines. */
bool is_trace_lines(std::string_view bytes);

/** Whether they begin like a trace for a viewer, which has no console lines. */
bool is_viewer_trace(std::string_view bytes);

struct TraceLine
{
    std::optional<std::string> printed; ///< as a console with time stamps shows it; nothing for what is not printed
    bool powers_on = false;             ///< it counts from one again
};

TraceLine read_trace_line(std::string_view line);

} // namespace pmxboard::decode
