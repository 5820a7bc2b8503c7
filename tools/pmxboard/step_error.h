/** @file
 *  What ends a run: a line that nobody can mean, or a step that did not do what the scenario says. */
#pragma once

#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

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

/** "; did you mean X, Y?", or nothing when no candidate is near. */
std::string did_you_mean(std::string_view wrong, const std::vector<std::string_view>& candidates);

} // namespace pmxboard
