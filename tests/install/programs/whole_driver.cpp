// SPDX-License-Identifier: MIT OR GPL-2.0-only
// All functions of the TV encoder driver are the program's own.
#include "bench.h"
#include "board/board_c.h"
#include "own_encoder.h"

namespace
{

void calls_arrive_and_are_recorded()
{
    power_on_and_start();
    set_mode();
    demand(uFormatsSet == 2 && aucTargetFormat[TVE_1] == RES_576P && aucTargetFormat[TVE_2] == RES_576I,
           "the driver was given other formats");
    demand(recorded("TVE_SetFmtEx(...) = 1") == 2, "calls are not recorded once");
    demand(recorded("TVE_SetFmtEx(1, RES_576P, 50, RES_576I, 1, 0, *) = 1") == 1, "arguments are not recorded");
    demand(recorded("x_thread_delay(3)") == 2, "what the driver calls is not recorded");
    for (const board::TraceEntry& entry : board::trace::entries())
        demand(entry.function != "x_thread_delay" || entry.arguments[0].value.as_number() != 3 || entry.depth == 1,
               "what the driver calls does not stand below its own call");
}

void answers_are_the_drivers_own()
{
    u4SetFormatAnswer = 7;
    power_on_and_start();
    set_mode();
    demand(recorded("TVE_SetFmtEx(...) = 7") == 2, "the driver's answer is not recorded");
    demand(board::asserts() == 2, "the layer did not have the driver's answer");
    u4SetFormatAnswer = TVE_SET_OK;
}

void faults_answer_in_its_place()
{
    power_on_and_start();
    uFormatsSet = 0;
    board::faults::set({ "TVE_SetFmtEx", 0, board::Fault::When::On, 2 });
    set_mode();
    demand(uFormatsSet == 1, "the driver was called though a fault answered");
    demand(recorded("TVE_SetFmtEx(...) = 0") == 1, "the fault's answer is not recorded");
}

void meanwhiles_happen_in_its_calls()
{
    power_on_and_start();
    board::meanwhile("TVE_SetFmtEx", 1, [] { board::hdmi_av::plug(false); });
    set_mode();
    demand(board::meanwhiles::armed().empty() && recorded("NOTICE plug *") == 1, "nothing happened meanwhile");
}

void state_says_whose_it_is()
{
    const board::Value state = board::state();
    demand(board::replaced_functions().size() == 14, "not all functions are known to be the program's own");
    demand(state.find("replaced") != nullptr && state.find("replaced[0]")->string() == "TVE_SetFmtEx",
           "the state does not say whose the functions are");
    demand(state.find("tv_encoder.encoders[0].format")->kind() == board::Value::Kind::Null,
           "the board's own device has been set");
}

/** For people, for programs, and in a state that somebody else reads. */
void status_says_whose_it_is(const char* file)
{
    demand(board_c_power_on("default") == 0 && board_c_do("PMX_Init") == 0, board_c_error());
    set_mode();
    const std::string status = board_c_status();
    demand(status.find("Not the board's own") != status.npos && status.find("TVE_SetFmtEx") != status.npos, status);
    demand(status.find("disagree") == status.npos, status);
    demand(std::string(board_c_state("replaced[0]")) == "TVE_SetFmtEx" && board_c_is_replaced("TVE_SetHue") == 1,
           "the state does not say whose the functions are");
    demand(board_c_do((std::string("save \"") + file + "\"").c_str()) == 0, board_c_error());
    demand(board_c_finish() == 0, board_c_error());
}

} // namespace

int main(int, char** arguments)
{
    calls_arrive_and_are_recorded();
    answers_are_the_drivers_own();
    faults_answer_in_its_place();
    meanwhiles_happen_in_its_calls();
    state_says_whose_it_is();
    status_says_whose_it_is(arguments[1]);
}
