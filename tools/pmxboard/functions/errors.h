// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What ends a run: a line that nobody can mean, or a step that did not do what the scenario says. */
#pragma once

#include <stdexcept>

namespace pmxboard
{

/** The line is wrong; nothing of it was done. */
class LineError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/** The line is right, but its step failed. */
class StepFailed : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

} // namespace pmxboard
