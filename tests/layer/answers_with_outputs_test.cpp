// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Calls that write what they are asked for and answer neither 0 nor 1, or a failure all the same: which of the two
 *  counts. */
#include <algorithm>

#include "tests/support/layer_fixture.h"

using AnswersWithOutputs = LayerTest;

namespace
{

void answers_with(const char* function, std::int64_t answer, const char* output, const char* value)
{
    board::faults::set({ .function = function,
                         .answer = answer,
                         .when = board::Fault::When::Always,
                         .outputs = { { output, value } } });
}

} // namespace

TEST_F(AnswersWithOutputs, Init_AHandleThatCameWithAFailure_IsReportedAndKept)
{
    for (const std::int64_t answer : { -1, 1, 2 })
    {
        power_on();
        answers_with("x_sema_create", answer, "phSema", "0x155");
        answers_with("x_timer_create", answer, "phTimer", "0x166");
        PMX_Init();
        EXPECT_EQ(0x155, record("MutexPMX"));
        EXPECT_EQ(0x166, record("status.hPMXTimer"));
        expect_asserts(2);
    }
}

TEST_F(AnswersWithOutputs, Reset_WhateverTheReadAnswers_TheByteThatItWroteCounts)
{
    for (const std::int64_t answer : { -1, 0, 1, 2, 4 })
    {
        answers_with("i4NFBPartitionRead", answer, "pvDest", "[2, 0, 0, 0]");
        EXPECT_EQ(2, PMX_GetHDMIDefaultRes());
        PMX_Reset(0);
        EXPECT_EQ(2, record("ucMode"));
    }
}

TEST_F(AnswersWithOutputs, ChkSupportedRes_AnyAnswerButFalse_GivesWhatTheDriverWrote)
{
    started();
    for (const std::int64_t answer : { 0, 1, 2, 255 })
    {
        board::faults::set({ .function = "fgPmxDrvGetAvdInfo",
                             .answer = answer,
                             .when = board::Fault::When::Always,
                             .outputs = { { "pvParameter", "{u4ValidAutoRes=7, u2ValidAutoVfreq=50}" } } });
        UCHAR resolution = 99;
        UINT16 frequency = 99;
        EXPECT_EQ(answer != 0 ? 1u : 0u, PMX_ChkSupportedRes(0, RES_1080P60HZ, 60, &resolution, &frequency));
        EXPECT_EQ(answer != 0 ? 7 : 99, resolution);
        EXPECT_EQ(answer != 0 ? 50 : 99, frequency);
    }
}

TEST_F(AnswersWithOutputs, ArbPlaneOrder_AnyAnswerButZero_IsARefusal_WhateverWasWritten)
{
    started();
    for (const std::int64_t answer : { 2, 0 })
    {
        answers_with("PMX_HalSetPlaneOrder", answer, "pi4PlnDelay", "[9, 9, 9, 9, 9, 9, 9, 9]");
        EXPECT_EQ(answer == 0 ? 1u : 0u, PMX_SetArbPlaneOrder(0, 0x76543210));
        const auto& entries = board::trace::entries();
        EXPECT_EQ(answer == 0, std::any_of(entries.begin(), entries.end(), [](const board::TraceEntry& entry) {
                      return entry.function == "DCM_SetVideoPlaneDelay";
                  }));
        answers_with("PMX_HalGetPlaneOrder", answer, "pu1PlnSel", "[7, 6, 5, 4, 3, 2, 1, 0]");
        UINT32 order = 99;
        EXPECT_EQ(answer == 0 ? 1u : 0u, PMX_GetArbPlaneOrder(0, &order));
        EXPECT_EQ(answer == 0 ? 0x76543210u : 99u, order);
    }
}
