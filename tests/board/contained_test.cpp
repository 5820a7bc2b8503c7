// SPDX-License-Identifier: MIT OR GPL-2.0-only
// No exception leaves a platform function: whoever called it may be the layer, or C, which cannot pass it on.
#include "board/contained.h"

#include <gtest/gtest.h>

#include <new>
#include <stdexcept>
#include <string>

#include "board/board.h"
#include "board/board_c.h"

#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "u_os.h"

namespace
{

/** What was kept of a failure; empty when nothing was. */
std::string kept()
{
    try
    {
        board::meanwhiles::rethrow_failure();
        return {};
    }
    catch (const std::exception& error)
    {
        return error.what();
    }
}

class Contained : public ::testing::Test
{
protected:
    Contained() { board::power_on({}); }
    ~Contained() override
    {
        mend();
        board::meanwhiles::forget_failures();
        board::power_on({});
    }

    /** From the n-th look at the layer on there is no memory: a call looks when it begins, and when it ends. */
    static void break_down(unsigned n)
    {
        const auto look = [n, looks = 0u]() mutable {
            if (++looks >= n)
                throw std::bad_alloc();
        };
        board::trace::set_store_watch({ look, {} });
    }
    static void mend()
    {
        board::trace::set_store_watch({});
        board::trace::set_sink({});
        board::set_console({});
    }
};

TEST_F(Contained, CallThatCannotBegin_AnswersAsADeviceThatFails)
{
    const auto fails = [](const char* function, auto call, auto answer) {
        break_down(1);
        EXPECT_EQ(answer, call()) << function;
        mend();
        EXPECT_EQ(std::string(function) + " could not do its work: std::bad_alloc", kept());
    };
    HANDLE_T timer = 0;
    fails(
        "x_timer_create", [&] { return x_timer_create(&timer); }, -1);
    EXPECT_EQ(0u, timer);
    vPmxMixPlane(0, 1);
    fails(
        "fgPmxHalMixPlane", [] { return fgPmxHalMixPlane(0, 1); }, FALSE);
    fails(
        "x_reg_read32", [] { return x_reg_read32(0x10); }, 0u);
    fails(
        "TVE_SetEnable", [] { return TVE_SetEnable(0, TRUE), 0; }, 0);
}

TEST_F(Contained, CallThatCannotEnd_HasItsAnswer)
{
    break_down(2);
    HANDLE_T timer = 0;
    EXPECT_EQ(OSR_OK, x_timer_create(&timer));
    EXPECT_NE(0u, timer);
    EXPECT_EQ("std::bad_alloc", kept());
}

TEST_F(Contained, CallThatBreaksOff_HasItsAnswerInTheTrace)
{
    board::set_console([](std::string_view) { throw std::runtime_error("no paper"); }); // for a misuse
    EXPECT_EQ(-1, x_timer_create(nullptr));
    EXPECT_EQ(-1, x_sema_create(nullptr, X_SEMA_TYPE_MUTEX, 1));
    const auto& entries = board::trace::entries();
    ASSERT_EQ(2u, entries.size());
    EXPECT_EQ("x_timer_create(null) = -1", entries[0].brief());
    EXPECT_EQ("x_sema_create(null, X_SEMA_TYPE_MUTEX, 1) = -1", entries[1].brief());
    EXPECT_EQ("x_timer_create could not do its work: no paper", kept());
}

TEST_F(Contained, FailedCall_LeavesTheNestingAsItWas)
{
    board::trace::set_sink([](const board::TraceEntry&) { throw std::bad_alloc(); });
    TVE_SetEnable(0, TRUE);
    mend();
    EXPECT_EQ("std::bad_alloc", kept());
    TVE_SetEnable(0, FALSE);
    EXPECT_EQ(0u, board::trace::entries().back().depth);
}

TEST_F(Contained, PrintThatNobodyCanShow_IsAFailureOfThePrint)
{
    board::set_console([](std::string_view) { throw std::runtime_error("no paper"); });
    Printf("text");
    EXPECT_EQ("Printf could not do its work: no paper", kept());
}

TEST_F(Contained, FirstFailureIsKept)
{
    board::set_console([](std::string_view text) { throw std::runtime_error(std::string(text)); });
    Printf("first");
    Printf("second");
    EXPECT_EQ("Printf could not do its work: first", kept());
    EXPECT_EQ("", kept());
}

TEST_F(Contained, WhatIsNoException_IsContainedToo)
{
    board::set_console([](std::string_view) { throw 5; });
    Printf("text");
    EXPECT_THROW(board::meanwhiles::rethrow_failure(), int);
}

// The layer has no unwind tables: an exception that met it would end the program.
TEST_F(Contained, Layer_GoesThroughWithDevicesThatFailAnywhere)
{
    unsigned n = 1;
    for (bool was_met = true; was_met; n += 7)
    {
        board::power_on({});
        break_down(n);
        board::contained([] { const board::trace::Operation scope("PMX_Init"); });
        PMX_Init();
        PMX_SetTvType(0, PMX_TV_TYPE_PAL);
        PMX_Reset(0);
        PMX_Uninit();
        mend();
        was_met = !kept().empty();
    }
    EXPECT_LT(150u, n) << "they make more calls than that";
}

TEST_F(Contained, ThreadOfTheBoard_EndsWithItsFailure)
{
    board::meanwhile("TVE_SetEnable", 1, [] { throw std::runtime_error("in a thread"); }, { true, "thread" });
    TVE_SetEnable(0, TRUE);
    EXPECT_EQ("in a thread", kept());
}

TEST_F(Contained, CProgram_IsTold)
{
    testing::internal::CaptureStderr();
    EXPECT_EQ(-1, board_c_power_on(nullptr));
    EXPECT_EQ(-1, board_c_power_on("no such board"));
    EXPECT_EQ(0, board_c_power_on("default"));
    board::set_console([](std::string_view) { throw std::runtime_error("no paper"); });
    Printf("text");
    board_c_advance(1);
    const std::string told = testing::internal::GetCapturedStderr();
    EXPECT_NE(std::string::npos, told.find("no board is given\n")) << told;
    EXPECT_NE(std::string::npos, told.find("no such board")) << told;
    EXPECT_NE(std::string::npos, told.find("Printf could not do its work: no paper\n")) << told;
}

} // namespace
