// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The board for C programs: what it does, and what it says to what cannot be done.
#include "board/board_c.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <functional>
#include <string>
#include <utility>

#include "board/board.h"
#include "board/replaced.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "u_os.h"

namespace
{

/** A board with a layer that has started; what happened before is forgotten. */
class BoardC : public ::testing::Test
{
protected:
    void SetUp() override
    {
        testing::internal::CaptureStderr();
        ASSERT_EQ(0, board_c_power_on("default"));
        PMX_Init();
        ASSERT_EQ(0, board_c_forget());
    }

    void TearDown() override
    {
        board_c_finish();
        testing::internal::GetCapturedStderr();
    }

    /** It failed, and said why. */
    static void refused(int result, const std::string& why)
    {
        EXPECT_EQ(-1, result) << why;
        EXPECT_NE(std::string::npos, std::string(board_c_error()).find(why)) << board_c_error();
    }

    static void refused(const char* text, const std::string& why) { refused(text == nullptr ? -1 : 0, why); }
};

TEST_F(BoardC, Expectations_LookAtWhatHappenedSinceItWasForgotten)
{
    EXPECT_EQ(0u, board_c_entries());
    EXPECT_EQ(0, board_c_expect("no-more"));
    PMX_SetTvType(0, PMX_TV_TYPE_PAL);
    EXPECT_EQ(0, board_c_expect("next PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)"));
    EXPECT_EQ(0, board_c_expect("no-more"));
    EXPECT_EQ(0, board_c_expect("state ucTvType PMX_TV_TYPE_PAL"));
    refused(board_c_expect("next PMX_HalSetTvType(0, 1)"), "found nothing more");
    EXPECT_EQ(1, board_c_count("PMX_HalSetTvType(...)"));
    EXPECT_EQ(0, board_c_forget());
    EXPECT_EQ(0, board_c_count("PMX_HalSetTvType(...)"));
    refused(board_c_expect("call PMX_HalSetTvType(...)"), "made no call at all");
}

TEST_F(BoardC, Expectations_LookAtACommandAndWhatFollows)
{
    EXPECT_EQ(0, board_c_do("source osd0 start 1280x720 rgb"));
    PMX_SetTvType(0, PMX_TV_TYPE_PAL);
    EXPECT_EQ(0, board_c_expect("result 1"));
    EXPECT_EQ(0, board_c_expect("call NOTICE source *"));
    EXPECT_EQ(0, board_c_expect("call PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)"));
    refused(board_c_do("source osd9 start 1280x720 rgb"), "osd9");
    PMX_SetTvType(0, PMX_TV_TYPE_NTSC);
    EXPECT_EQ(0, board_c_expect("call PMX_HalSetTvType(0, PMX_TV_TYPE_NTSC)")) << "behind a command that failed";
}

TEST_F(BoardC, Entries_TellAll)
{
    EXPECT_EQ(0, board_c_do("fault x_timer_create -1"));
    HANDLE_T timer = 0;
    EXPECT_EQ(-1, x_timer_create(&timer));
    EXPECT_EQ(0, board_c_advance(5));
    const board::trace::Operation scope("PMX_SetBrightness");
    TVE_SetEnable(1, FALSE);
    PMX_IsLog(9, "%s", "unseen");

    ASSERT_EQ(3u, board_c_entries());
    BOARD_C_ENTRY_T entry;
    ASSERT_EQ(0, board_c_entry(0, &entry));
    EXPECT_STREQ("x_timer_create", entry.szFunction);
    EXPECT_TRUE(entry.iKind == BOARD_C_CALL && entry.iHasResult == 1 && entry.i8Result == -1 && entry.iFaulted == 1);
    ASSERT_EQ(0, board_c_entry(1, &entry));
    EXPECT_STREQ("TVE_SetEnable(1, 0)", entry.szLine);
    EXPECT_STREQ("PMX_SetBrightness", entry.szOperation);
    EXPECT_EQ(static_cast<unsigned long long>(board::now().count()), entry.u8Microseconds);
    EXPECT_TRUE(entry.iHasResult == 0 && entry.iFaulted == 0 && entry.uDepth == 0 && entry.uArguments == 2);
    EXPECT_STREQ("1", board_c_argument(1, "u4Tve"));
    long long number = 7;
    EXPECT_EQ(0, board_c_argument_number(1, "fgEnable", &number));
    EXPECT_EQ(0, number);
    ASSERT_EQ(0, board_c_entry(2, &entry));
    EXPECT_EQ(BOARD_C_LOG, entry.iKind);
    EXPECT_STREQ("unseen", entry.szText);
}

TEST_F(BoardC, Entries_ArePrinted)
{
    TVE_SetEnable(1, FALSE);
    testing::internal::CaptureStdout();
    EXPECT_EQ(0, board_c_print_entries());
    EXPECT_EQ("      2000 us  TVE_SetEnable(1, 0)\n", testing::internal::GetCapturedStdout());
}

TEST_F(BoardC, State_IsReadFromBoardAndLayer)
{
    TVE_SetEnable(1, TRUE);
    EXPECT_STREQ("1", board_c_state("tv_encoder.encoders[1].enabled"));
    EXPECT_STREQ("RES_1080P60HZ", board_c_state("ucMode"));
    const std::string status = board_c_status();
    EXPECT_EQ(0u, status.find("Board default, 2 ms after power-on\n")) << status;
    EXPECT_NE(std::string::npos, status.find("RES_1080P60HZ")) << status;
    EXPECT_EQ(std::string::npos, status.find("Not the board's own")) << status;
    long long number = 0;
    EXPECT_EQ(0, board_c_state_number("record.ucMode", &number));
    EXPECT_EQ(RES_1080P60HZ, number);
    refused(board_c_state("ucMod"), "did you mean");
    refused(board_c_state_number("tv_encoder.encoders[1].format", &number), "is no number: null");
    EXPECT_EQ(RES_1080P60HZ, number) << "it was written though nothing was read";
}

TEST_F(BoardC, Console_IsKeptAndShown)
{
    Printf("first\n");
    EXPECT_STREQ("first\n", board_c_console());
    EXPECT_EQ(0, board_c_expect("console \"first\""));
    board_c_forget();
    EXPECT_STREQ("", board_c_console());
    board_c_show_console(1);
    EXPECT_EQ(0, board_c_power_on("default"));
    testing::internal::CaptureStdout();
    Printf("second\n");
    board_c_show_console(0);
    Printf("third\n");
    std::fflush(stdout);
    EXPECT_EQ("second\n", testing::internal::GetCapturedStdout()) << "power-on has changed who sees it";
    board_c_console_level(9);
    PMX_IsLog(9, "%s", "fourth\n");
    EXPECT_STREQ("second\nthird\nfourth\n", board_c_console());
}

/** What a call of this prints on the standard output. */
template <typename Call>
std::string printed_by(const Call& call)
{
    testing::internal::CaptureStdout();
    call();
    std::fflush(stdout);
    return testing::internal::GetCapturedStdout();
}

TEST_F(BoardC, Console_OfWhatOnlyMightHappen_IsNotShown)
{
    const std::string file = (std::filesystem::temp_directory_path() / "board_c_console.json").string();
    board_c_show_console(1);
    EXPECT_EQ("", printed_by([] { board_c_do("what-if PMX_QueryStatus"); }));
    EXPECT_NE("", printed_by([] { board_c_do("PMX_QueryStatus"); })) << "it prints something";
    EXPECT_EQ(0, board_c_power_on("default"));
    EXPECT_NE("", printed_by([] { board_c_do("PMX_QueryStatus"); }));
    EXPECT_EQ(0, board_c_do(("save " + file).c_str()));
    EXPECT_EQ("", printed_by([&] { EXPECT_EQ(0, board_c_do(("restore " + file).c_str())); }));
    EXPECT_NE("", printed_by([] { board_c_do("PMX_QueryStatus"); })) << "behind it all is shown again";
    board_c_show_console(0);
    std::filesystem::remove(file);
}

TEST_F(BoardC, WhatNoCommandSays_CannotBeRestored)
{
    const std::string file = (std::filesystem::temp_directory_path() / "board_c_lost.json").string();
    const std::string save = "save " + file;
    const std::string restore = "restore " + file;
    ASSERT_EQ(0, board_c_do(save.c_str())); // the layer was started by the program itself
    refused(board_c_do(restore.c_str()), "the program has called the layer or the platform itself");
    const std::pair<const char*, void (*)()> others[] = {
        { "the program has called the layer or the platform itself",
          [] { PMX_SetForceMode(0, TRUE); } }, // stores alone
        { "board_c_advance", [] { board_c_advance(1); } },
        { "board_c_meanwhile",
          [] {
              board_c_meanwhile(
                  "PMX_HalSetMode", 1, 0, [](void*) {}, nullptr);
          } },
    };
    for (const auto& [why, act] : others)
    {
        ASSERT_EQ(0, board_c_do("power-on"));
        ASSERT_EQ(0, board_c_do("PMX_Init"));
        ASSERT_EQ(0, board_c_do("state ucMode"));
        ASSERT_EQ(0, board_c_do(save.c_str()));
        EXPECT_EQ(0, board_c_do(restore.c_str())) << board_c_error();
        act();
        ASSERT_EQ(0, board_c_do(save.c_str()));
        refused(board_c_do(restore.c_str()), why);
    }
    std::filesystem::remove(file);
}

void print_much(void*)
{
    for (unsigned i = 0; i < 10'000; ++i)
        std::printf("a line of the program's own\n");
}

TEST_F(BoardC, WhatTheProgramHasPrinted_IsNotPrintedTwice)
{
    EXPECT_EQ(0, board_c_meanwhile("PMX_HalSetTvType", 1, 0, print_much, nullptr));
    const std::string printed = printed_by([] {
        std::printf("before, ");
        EXPECT_EQ(0, board_c_do("what-if PMX_SetTvType 0 PMX_TV_TYPE_PAL"));
    });
    EXPECT_EQ(0u, printed.find("before, "));
    EXPECT_EQ(std::string::npos, printed.find("before, ", 1));
    EXPECT_EQ(0, board_c_do("meanwhile off"));
}

std::string seen_inside;

void look_inside(void* argument)
{
    ++*static_cast<int*>(argument);
    seen_inside = board_c_state("tv_encoder.encoders[1].enabled");
    board_c_do("sink unplug");
}

TEST_F(BoardC, Meanwhile_AnActionRunsInsideACall)
{
    int runs = 0;
    EXPECT_EQ(0, board_c_meanwhile("TVE_SetEnable", 2, 0, look_inside, &runs));
    TVE_SetEnable(0, TRUE);
    EXPECT_EQ(0, runs);
    TVE_SetEnable(1, TRUE);
    EXPECT_EQ(1, runs);
    EXPECT_EQ("1", seen_inside) << "the device has not acted yet";
    EXPECT_STREQ("0", board_c_state("hdmi_av.sink_plugged"));
    EXPECT_EQ(0, board_c_meanwhile("TVE_SetEnable", 1, 1, look_inside, &runs));
    TVE_SetEnable(1, FALSE);
    EXPECT_EQ(2, runs) << "as a thread";
}

TEST_F(BoardC, Finish_TellsWhatNeverHappenedAndWhatShouldNot)
{
    EXPECT_EQ(0, board_c_finish());
    int runs = 0;
    board_c_meanwhile("TVE_SetEnable", 1, 0, look_inside, &runs);
    refused(board_c_finish(), "never happened");
    EXPECT_EQ(0, board_c_finish()) << "it is told once";
    x_sema_unlock(77);
    EXPECT_EQ(1u, board_c_misuses());
    refused(board_c_finish(), "the platform was misused 1 times");
    EXPECT_EQ(0, board_c_expect("misuses 1"));
    EXPECT_EQ(0, board_c_finish());
}

TEST_F(BoardC, Replaced_NothingIsHere)
{
    EXPECT_EQ(0, board_c_is_replaced("TVE_SetEnable"));
    refused(board_c_is_replaced("TVE_SetEnabled"), "TVE_SetEnable");
    EXPECT_EQ(nullptr, board::state().find("replaced"));
    EXPECT_EQ(board::platform_functions().size(), board::replaced::functions().size());
}

TEST_F(BoardC, BadInput_IsTold)
{
    long long number = 0;
    refused(board_c_do(nullptr), "no command is given");
    refused(board_c_do(""), "no command is given");
    refused(board_c_do("  # nothing"), "no command is given");
    refused(board_c_do("advance 1s\nadvance 1s"), "one command at a time");
    refused(board_c_do("sink unplugg"), "sink unplug");
    refused(board_c_do(std::string(100000, 'x').c_str()), "no command xxx");
    EXPECT_GT(1000u, std::string(board_c_error()).size());
    refused(board_c_do("\xFF\x1B"), "no command \\xFF\\x1B");
    refused(board_c_do("PMX_Inti"), "PMX_Init");
    refused(board_c_do("fault TVE_SetEnable 1"), "has no result");
    refused(board_c_do("fault x_timer_create -1 always phTimer=9 phTimer=8"), "phTimer is set twice");
    refused(board_c_do("power-on nowhere"), "no such board: nowhere");
    refused(board_c_do("state \"unclosed"), "");
    refused(board_c_expect(nullptr), "no expectation is given");
    refused(board_c_expect("nothing"), "no expectation nothing");
    refused(board_c_expect("next TVE_SetEnabled(1)"), "TVE_SetEnable");
    refused(board_c_count(nullptr), "no call is given");
    refused(board_c_count("TVE_SetEnable(1"), "");
    refused(board_c_count("TVE_SetEnabled(...)"), "did you mean TVE_SetEnable");
    refused(board_c_entry(0, nullptr), "no place for the entry");
    BOARD_C_ENTRY_T entry;
    refused(board_c_entry(0, &entry), "there is no entry 0; there are 0");
    TVE_SetEnable(1, TRUE);
    refused(board_c_argument(0, nullptr), "no argument is given");
    refused(board_c_argument(0, "fgEnabled"), "TVE_SetEnable has no argument fgEnabled; it has u4Tve, fgEnable");
    refused(board_c_argument_number(0, "u4Tve", nullptr), "no place for the number");
    refused(board_c_argument_number(9, "u4Tve", &number), "there is no entry 9; there are 1");
    refused(board_c_state(nullptr), "no path is given");
    refused(board_c_state_number("ucMode", nullptr), "no place for the number");
    refused(board_c_meanwhile(nullptr, 1, 0, look_inside, nullptr), "no platform function is given");
    refused(board_c_meanwhile("TVE_SetEnable", 1, 0, nullptr, nullptr), "no action is given");
    refused(board_c_meanwhile("TVE_SetEnable", 0, 0, look_inside, nullptr), "counted from 1");
    refused(board_c_meanwhile("TVE_SetEnabled", 1, 0, look_inside, nullptr), "did you mean TVE_SetEnable");
    refused(board_c_is_replaced(nullptr), "no platform function is given");
}

TEST_F(BoardC, FailedPowerOn_LeavesTheBoardAsItWas)
{
    TVE_SetEnable(1, TRUE);
    refused(board_c_power_on("nowhere"), "no such board: nowhere");
    refused(board_c_power_on(""), "no board is given");
    EXPECT_EQ(1u, board_c_entries());
    EXPECT_STREQ("1", board_c_state("tv_encoder.encoders[1].enabled"));
    EXPECT_EQ(0, board_c_power_on("default"));
    EXPECT_EQ(0u, board_c_entries());
    EXPECT_STREQ("0", board_c_state("tv_encoder.encoders[1].enabled"));
}

void try_what_must_wait(void* argument)
{
    auto& failed = *static_cast<int*>(argument);
    failed += board_c_power_on("default");
    failed += board_c_finish();
    failed += board_c_forget();
    failed += board_c_expect("no-more");
    failed += board_c_do("power-on");
    failed += board_c_do("expect no-more");
}

TEST_F(BoardC, InsideACall_WhatWouldEndItIsRefused)
{
    int failed = 0;
    board_c_meanwhile("TVE_SetEnable", 1, 0, try_what_must_wait, &failed);
    TVE_SetEnable(1, TRUE);
    EXPECT_EQ(-6, failed);
    EXPECT_EQ(0, board_c_expect("call TVE_SetEnable(1, 1)"));
}

} // namespace
