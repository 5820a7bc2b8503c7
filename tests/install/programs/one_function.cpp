// SPDX-License-Identifier: MIT OR GPL-2.0-only
// One function is the program's own, and hands on to the board's.
#include "bench.h"
#include "own_encoder.h"

int main()
{
    power_on_and_start();
    TVE_SetBlackScreen(TVE_2, TRUE);
    demand(uBlackScreensHandedOn == 1, "the program's function was not called");
    demand(recorded("TVE_SetBlackScreen(1, 1)") == 1, "the call is not recorded once");
    demand(board::replaced_functions() == std::vector<std::string>{ "TVE_SetBlackScreen" },
           "other functions are taken for the program's own");
    const board::Value state = board::state();
    const board::Value* const shown = state.find("tv_encoder.encoders[1].black_screen");
    demand(shown != nullptr && shown->as_number() == 1, "it was not handed on");

    set_mode();
    demand(uBlackScreensHandedOn > 1 && recorded("TVE_SetBlackScreen(...)") == uBlackScreensHandedOn,
           "calls of the layer are not recorded once");
    demand(recorded("TVE_SetFmtEx(...) = 1") == 2, "the board's other functions have gone");
}
