#include "tools/pmxboard/cli.h"

int main(int count, char** arguments)
{
    return pmxboard::run_command_line(count, arguments);
}
