// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/examples.h"

namespace pmxboard
{

const char* const overview_examples = R"(Examples:
  pmxboard run scenarios/cold-boot.pmx
      start the mixer on the default board and watch every platform call
  pmxboard run --trace-format summary scenarios/first-look.pmx
      see in short what a change of the output does, and what it shows then
  pmxboard modes
      see the resolution modes
  pmxboard ops PMX_SetModeEx
      see what an operation takes and promises
  printf 'PMX_Init\nwhat-if PMX_SetTvType 0 PMX_TV_TYPE_PAL\n' | pmxboard shell
      type commands; without a pipe at a prompt, where the tabulator completes
  pmxboard run scenarios/display-part-answers.pmx | pmxboard decode -
      have a console log explained

Each sub-command has more: pmxboard run --help.
Exit codes: 0 done, 1 a step failed, 2 wrong usage.)";

const char* const run_examples = R"(Examples:
  pmxboard run scenarios/cold-boot.pmx
      start the mixer on the default board and watch every platform call
  pmxboard run --quiet scenarios/*.pmx && echo fine
      run scenarios as tests: only failures are shown
  pmxboard run --quiet --keep-going --junit verdicts.xml scenarios/s*.pmx
      run all of them whatever fails, and write the verdicts for a build server
  printf 'PMX_Init\nPMX_GetMode 0\n' | pmxboard run -
      try something out
  pmxboard run --only TVE_,VDP_ --op PMX_SetModeEx scenarios/fifth-osd.pmx
      see what the mode change has to say to TV encoder and video plane
  pmxboard run --stores --op PMX_SetModeEx scenarios/frequency-change.pmx
      see what the mode change stores between its calls
  printf 'PMX_Init\nmeanwhile PMX_HalSetTvType poke ucMode 3\nPMX_SetTvType 0 3\n' | pmxboard run --stores -
      see what a neighbour does while the layer is inside a call
  printf 'PMX_Init\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\ndiff\n' | pmxboard run -
      see what a command changed
  printf 'PMX_Init\nwhat-if PMX_SetTvType 0 PMX_TV_TYPE_PAL\n' | pmxboard run -
      see what it would do, and change nothing
  pmxboard run --trace-format jsonl --trace-file calls.jsonl scenarios/cold-boot.pmx
      keep the calls for a program, one JSON object a line
  pmxboard run --trace-format chrome scenarios/display-part-answers.pmx >run.json
      open run.json in chrome://tracing or at ui.perfetto.dev
  pmxboard run --board boards/default --verbose scenarios/cold-boot.pmx
      choose the board, and see arguments by name

The language of scenarios is described in docs/scenarios.md.
Exit codes: 0 done, 1 a step failed, 2 wrong usage.)";

const char* const state_examples = R"(Examples:
  printf 'PMX_Init\nsave before.json\nPMX_SetCBEnable 0 1\nsave after.json\n' | pmxboard run -
      save the state before and after a command
  pmxboard state after.json
      show all of it
  pmxboard state after.json ucCBEnable arOutputConf[PMX_OUTPUT_HDMI] mixer.colour_bar
      show parts of it
  pmxboard state before.json after.json || echo differs
      show what differs, with the exit code of diff(1)
  pmxboard state --json before.json after.json mixer | grep '"path"'
      the same of the mixer hardware alone, for a program

The keys are described in docs/board.md.
Exit codes: 0 done or equal, 1 different, 2 wrong usage or no such state.)";

const char* const status_examples = R"(Examples:
  printf 'PMX_Init\nstatus\nsave now.json\n' | pmxboard run --trace-format summary -
      show it in a scenario, and save the state
  pmxboard status now.json
      show it later, of the saved state
  pmxboard status --json now.json | grep '"disagreements"'
      the same for a program: here, whether record and hardware disagree

Exit codes: 0 done, 2 wrong usage or no such state.)";

const char* const shell_examples = R"(Examples:
  pmxboard shell
      a prompt: Tab completes, help tells more, Ctrl-D ends
  pmxboard shell --board boards/default
      on a board of your own
  printf 'PMX_Init\nhelp PMX_GetMode\nPMX_GetMode 0\n' | pmxboard shell
      from a pipe: wrong lines are told, and the others carried out

A line is a command of the scenario language, docs/scenarios.md; docs/shell.md
tells the keys. The history is kept in $PMXBOARD_HISTORY, or else in
pmxboard/history under $XDG_STATE_HOME or ~/.local/state; none is kept when
PMXBOARD_HISTORY is empty.
Exit codes: 0 done, 1 a line from a pipe failed, 2 wrong usage.)";

const char* const ops_examples = R"(Examples:
  pmxboard ops | less
      every operation with what it does, in the groups of the header
  pmxboard ops PMX_SetModeEx
      arguments, contract and a line that works
  pmxboard ops 'PMX_*AspectRatio*'
      those whose names fit
  pmxboard ops --json PMX_SetTvType PMX_GetTvType
      for programs, always a list
  pmxboard ops TVE_SetEnable
      the functions of the platform have their contracts, too

Exit codes: 0 done, 2 wrong usage.)";

const char* const modes_examples = R"(Examples:
  pmxboard modes
      every mode, one line each
  pmxboard modes 720p50 RES_1080I60HZ 38
      all about some of them, in short, by name or number
  pmxboard modes --json RES_480P
      for programs, always a list

Columns: Hz, as its name tells; prg, reported as progressive; HD, reported as HD
output; tve, HD for the TV encoders; cap, the capability bit that admits it; CS,
its colour group; bar, width of the colour bar; pll, family of the video PLL's
word; boot, the TV type with which the boot loader may leave it. Oddities are
the layer's own.
Exit codes: 0 done, 2 wrong usage.)";

const char* const decode_examples = R"(Examples:
  pmxboard decode tests/decode/player.log
      the story of a log that was captured somewhere within a run
  pmxboard decode --verbose tests/decode/player.log
      every line first, with the operation and the step that it comes from
  pmxboard decode --against scenarios/first-mode-after-boot.pmx tests/decode/first-mode.log
      where it departs from what the layer prints in that situation
  pmxboard decode --to-scenario tests/decode/first-mode.log >first-mode.pmx
      a scenario that prints the same
  pmxboard run scenarios/display-part-never-answers.pmx | pmxboard decode -
      the story of a scenario
  pmxboard decode --json tests/decode/player.log >decoded.json
      the same for a program
  pmxboard decode --texts
      every text that the layer prints, with its level, operation and step

A log may have anything before, between and behind the layer's lines. docs/decode.md tells the rest.
Exit codes: 0 done, 1 the log departs from the scenario, 2 wrong usage, or a scenario that fails.)";

const char* const record_examples = R"(Examples:
  pmxboard record change.rec scenarios/first-mode-after-boot.pmx
      what goes in and out of the layer in that scenario
  pmxboard record --size 65536 change.rec scenarios/first-mode-after-boot.pmx
      the same, as much of its end as a ring of 64 KiB holds

docs/recorder.md tells how a product records the same.
Exit codes: 0 done, 1 the scenario fails, which is recorded, 2 wrong usage.)";

const char* const replay_examples = R"(Examples:
  pmxboard record change.rec scenarios/first-mode-after-boot.pmx
      a recording
  pmxboard replay change.rec
      does the layer do the same once more?
  pmxboard replay --show change.rec | less
      what was recorded: number, time, thread, and the call
  pmxboard replay --to-scenario change.rec > change.pmx
      a scenario that plays the same on the board

FILE is a recording or a memory dump that holds one; docs/recorder.md tells the
rest.
Exit codes: 0 equal, 1 the layer departs from it, 2 wrong usage, or no such
recording.)";

const char* const report_examples = R"(Examples:
  pmxboard report scenarios/display-part-never-answers.pmx -o story.html
      open story.html in a browser, and see why there were no graphics, and for how long
  pmxboard report scenarios/display-part-answers.pmx scenarios/display-part-never-answers.pmx -o two.html
      see what differs between two runs, side by side
  pmxboard report --board default --board bedroom-player scenarios/frequency-change.pmx -o boards.html
      the same of one scenario on two boards

A scenario that fails is told as far as it came.
Exit codes: 0 done, 1 a step failed, 2 wrong usage.)";

} // namespace pmxboard
