// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Worked examples of each sub-command, as its --help ends with them. A test runs every one of them. */
#pragma once

namespace pmxboard
{

/** Of the tool as a whole. */
extern const char* const overview_examples;

extern const char* const run_examples;
extern const char* const state_examples;
extern const char* const status_examples;
extern const char* const shell_examples;
extern const char* const ops_examples;
extern const char* const modes_examples;
extern const char* const decode_examples;
extern const char* const record_examples;
extern const char* const report_examples;
extern const char* const replay_examples;

} // namespace pmxboard
