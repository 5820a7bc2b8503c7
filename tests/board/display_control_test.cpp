// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"
#include "drv_osd.h"

namespace
{

class DisplayControl : public DeviceTest
{
};

TEST_F(DisplayControl, PowerOn_NoDelayWasSet)
{
    EXPECT_EQ("{video_plane_delay=null}", board::display_control::state().to_text());
}

TEST_F(DisplayControl, SetVideoPlaneDelay_KeepsTheLastPair)
{
    DCM_SetVideoPlaneDelay(2, 3);
    EXPECT_EQ("DCM_SetVideoPlaneDelay(2, 3)", last_call());
    EXPECT_EQ("{video_plane_delay=[2, 3]}", board::display_control::state().to_text());

    DCM_SetVideoPlaneDelay(-2147483647 - 1, 2147483647);
    EXPECT_EQ("DCM_SetVideoPlaneDelay(-2147483648, 2147483647)", last_call());
    EXPECT_EQ("{video_plane_delay=[-2147483648, 2147483647]}", board::display_control::state().to_text());
    EXPECT_EQ(2u, board::trace::entries().size());
}

TEST_F(DisplayControl, PowerOn_ForgetsTheDelays)
{
    DCM_SetVideoPlaneDelay(10, 10);
    power_on({});
    EXPECT_EQ("{video_plane_delay=null}", board::display_control::state().to_text());
}

} // namespace
