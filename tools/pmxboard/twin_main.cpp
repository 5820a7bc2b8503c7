// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The tool, with the layer that tells its reasons in the place of the one that ships. It ends with how many it told.
 * Behind --reasons it writes each between the lines of a trace, with the entry behind which it was given. */
#include <cstring>
#include <iostream>

#include "board/json.h"
#include "board/trace.h"
#include "tools/pmxboard/commands/command_line.h"
#include "tools/pmxboard/files/ending.h"
#include "tools/pmxboard/reasons/reason.h"
#include "tools/pmxboard/reasons/twin.h"

static void write_between_entries(const pmxboard::Reason& reason)
{
    const auto& entries = board::trace::entries();
    const board::Json line = { { "reason", reason.number },
                               { "values", { reason.a, reason.b } },
                               { "after", entries.empty() ? 0 : entries.back().sequence } };
    std::cout << board::written(line) << '\n';
}

int main(int count, char** arguments)
{
    pmxboard::end_in_order();
    pmxboard::lead_in_twin();
    if (count > 1 && std::strcmp(arguments[1], "--reasons") == 0)
    {
        pmxboard::on_told_reason(write_between_entries);
        ++arguments;
        --count;
    }
    const int code = pmxboard::run_command_line(count, arguments);
    std::cerr << "reasons: " << pmxboard::told_reasons().size() << '\n';
    return code;
}
