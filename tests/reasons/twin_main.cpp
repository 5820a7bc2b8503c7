// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The tool, with the layer that tells its reasons in the place of the one that ships. It ends with how many it told. */
#include <iostream>

#include "tools/pmxboard/commands/command_line.h"
#include "tools/pmxboard/files/ending.h"
#include "tools/pmxboard/reasons/reason.h"
#include "tools/pmxboard/reasons/twin.h"

int main(int count, char** arguments)
{
    pmxboard::end_in_order();
    pmxboard::lead_in_twin();
    const int code = pmxboard::run_command_line(count, arguments);
    std::cerr << "reasons: " << pmxboard::told_reasons().size() << '\n';
    return code;
}
