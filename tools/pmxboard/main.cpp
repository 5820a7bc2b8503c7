// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/command_line.h"

int main(int count, char** arguments)
{
    return pmxboard::run_command_line(count, arguments);
}
