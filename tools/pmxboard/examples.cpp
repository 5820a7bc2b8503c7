#include "tools/pmxboard/examples.h"

namespace pmxboard
{

const char* const run_examples = R"(Examples:
  pmxboard run scenarios/cold-boot.pmx
      start the mixer on the default board and watch every platform call
  pmxboard run --quiet scenarios/*.pmx && echo fine
      run scenarios as tests: only failures are shown
  printf 'PMX_Init\nPMX_GetMode 0\n' | pmxboard run -
      try something out
  pmxboard run --trace json --trace-file calls.jsonl scenarios/cold-boot.pmx
      keep the calls for a program, one JSON object a line
  pmxboard run --board boards/default --verbose scenarios/cold-boot.pmx
      choose the board, and see arguments by name

The language of scenarios is described in docs/scenarios.md.
Exit codes: 0 done, 1 a step failed, 2 wrong usage.)";

} // namespace pmxboard
