// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Scenarios that a stranger has written, run in this process. */
#pragma once

#include <string>
#include <string_view>

#include "tools/pmxboard/view/output.h"

namespace fuzz
{

/** The lines that may be carried out: none that writes files or reads them outside of place(), that lets time pass for
 *  long, or makes many copies of the process; and not too many. */
std::string harmless(std::string_view bytes);

struct Shown
{
    bool done = false;
    std::string people;
    std::string diagnostics;
};

/** Run lines that stand in place() on the default board. What is shown is fit for a terminal. */
Shown run(const std::string& lines, pmxboard::OutputOptions options = {});

} // namespace fuzz
