/** @file
 *  Worked examples of each sub-command, as its --help ends with them. A test runs every one of them. */
#pragma once

namespace pmxboard
{

extern const char* const run_examples;

} // namespace pmxboard
