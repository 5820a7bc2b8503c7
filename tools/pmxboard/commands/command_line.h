// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The command line. */
#pragma once

namespace pmxboard
{

/** The exit code: see command.h. */
int run_command_line(int count, const char* const* arguments);

} // namespace pmxboard
