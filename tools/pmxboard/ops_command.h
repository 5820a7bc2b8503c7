/** @file
 *  `pmxboard ops`: the operations of the layer, their contracts and an example of each. */
#pragma once

#include <iosfwd>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/help.h"

namespace pmxboard
{

struct OpsOptions
{
    std::vector<std::string> names; ///< of operations and of the platform's functions; * stands for anything
    bool json = false;
    std::string colour = "auto";
};

/** The exit code. */
int show_operations(const OpsOptions& options, std::ostream& to);

/** A line that works on the default board, and the lines that it needs before it. */
struct OperationExample
{
    std::string_view line;
    std::vector<std::string_view> before = { "PMX_Init" };
};

/** Null pointer when there is none, which is a gap. */
const OperationExample* example_of(std::string_view operation);

} // namespace pmxboard
