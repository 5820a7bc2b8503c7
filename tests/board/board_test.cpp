// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/board.h"

#include <chrono>

#include "device_test.h"

#include "pmx_hal.h"
#include "u_os.h"

using namespace std::chrono_literals;

namespace
{

class Board : public DeviceTest
{
};

TEST_F(Board, State_HasEveryDeviceInOrder)
{
    EXPECT_EQ((std::vector<std::string>{ "os", "console", "flash", "registers", "interface_manager", "power", "mixer",
                                         "tv_encoder", "video_planes", "osd_planes", "sources", "hdmi_av",
                                         "display_part", "display_control", "faults" }),
              board::state().keys());
}

TEST_F(Board, PowerOn_MakesEverythingAsGoodAsNew)
{
    const std::string as_new = board::state().to_text();
    HANDLE_T handle = 0;
    x_sema_create(&handle, X_SEMA_TYPE_MUTEX, 1);
    x_sema_unlock(handle);
    x_thread_delay(5);
    PMX_HalSetMode(0, 12);
    x_reg_write32(0x10, 1);
    Assert("0", "a.cpp", 1);
    EXPECT_NE(as_new, board::state().to_text());
    EXPECT_EQ(1u, board::misuses());
    EXPECT_EQ(1u, board::asserts());
    power_on({});
    EXPECT_EQ(as_new, board::state().to_text());
    EXPECT_EQ(0us, board::now());
    EXPECT_EQ(0u, board::misuses());
    EXPECT_EQ(0u, board::asserts());
    EXPECT_EQ("", board::console_text());
    EXPECT_TRUE(board::trace::entries().empty());
}

TEST_F(Board, PowerOn_WithTheDescriptionInForce)
{
    board::Description description;
    description.name = "mine";
    description.console_level = 7;
    power_on(description);
    EXPECT_EQ("mine", board::description().name);
    power_on(board::description());
    EXPECT_EQ("mine", board::description().name);
    EXPECT_EQ(7, board::console_level());
}

TEST_F(Board, Misuse_IsPrintedTracedAndCounted)
{
    board::set_console_level(-1);
    board::report_misuse("something");
    EXPECT_EQ("BOARD misuse: something\n", board::console_text());
    EXPECT_EQ("NOTICE misuse \"something\"", last_call());
    EXPECT_EQ(1u, board::misuses());
}

} // namespace
