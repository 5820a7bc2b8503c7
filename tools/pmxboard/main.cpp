// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/command_line.h"
#include "tools/pmxboard/files/ending.h"

int main(int count, char** arguments)
{
    pmxboard::end_in_order();
    return pmxboard::run_command_line(count, arguments);
}
