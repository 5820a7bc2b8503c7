// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The numbers that cross the interfaces to middleware and neighbouring drivers.

#include <gtest/gtest.h>

#include "drv_av_d.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "numbers.h"
#include "u_os.h"
#include "x_avd.h"
#include "x_plane_mxr.h"
#include "x_vid_dec.h"

using namespace numbers;

TEST(NeighbourEnumerators, OperatingSystem)
{
    expect_numbers({
        NUMBER(OSR_OK, 0),
        NUMBER(X_SEMA_TYPE_BINARY, 0),
        NUMBER(X_SEMA_TYPE_COUNTING, 1),
        NUMBER(X_SEMA_TYPE_MUTEX, 2),
        NUMBER(X_SEMA_OPTION_WAIT, 1),
        NUMBER(X_SEMA_OPTION_NOWAIT, 2),
        NUMBER(X_TIMER_FLAG_ONCE, 1),
        NUMBER(X_TIMER_FLAG_REPEAT, 2),
    });
}

TEST(NeighbourEnumerators, TvEncoder)
{
    expect_numbers({
        NUMBER(TVE_1, 0),
        NUMBER(TVE_2, 1),
        NUMBER(TVE_SET_OK, 1),
        NUMBER(ASPECT_RATIO_4_3, 0),
        NUMBER(ASPECT_RATIO_16_9_FULL_FORMAT, 1),
    });
}

TEST(NeighbourEnumerators, VideoPlane)
{
    expect_numbers({ NUMBER(VDP_DISABLED, 0), NUMBER(VDP_HIDDEN, 1), NUMBER(VDP_ENABLED, 2) });
}

TEST(NeighbourEnumerators, AspectCodes)
{
    expect_numbers({
        NUMBER(ASP_UNKNOW, 0),
        NUMBER(ASP_1_1, 1),
        NUMBER(ASP_4_3, 2),
        NUMBER(ASP_16_9, 3),
        NUMBER(ASP_221_1, 4),
        NUMBER(ASP_4_3_LB, 5),
        NUMBER(ASP_16_9_NORMAL, 6),
        NUMBER(ASP_UNDEFINED, 7),
        NUMBER(ASP_16_9_PAN_SCAN, 8),
        NUMBER(ASP_4_3_FULL, 9),
    });
}

TEST(NeighbourEnumerators, HdmiCodes)
{
    expect_numbers({
        NUMBER(HDMI_RGB, 0),
        NUMBER(HDMI_RGB_FULL, 1),
        NUMBER(HDMI_YCBCR_444, 2),
        NUMBER(HDMI_YCBCR_422, 3),
        NUMBER(HDMI_XV_YCC, 4),
        NUMBER(HDMI_YCBCR_444_FULL, 5),
        NUMBER(HDMI_YCBCR_422_FULL, 6),
        NUMBER(HDMI_PICTURE_4_3, 1),
        NUMBER(HDMI_PICTURE_16_9, 2),
        NUMBER(HDMI_AS_PICTURE_AR, 8),
    });
}

TEST(NeighbourEnumerators, AvdCommands)
{
    expect_numbers({
        NUMBER(PMX_CHG_HDMI_COLOR_SPACE, 0),
        NUMBER(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, 1),
        NUMBER(PMX_SET_UI_TV_SYSTEM, 2),
        NUMBER(PMX_SET_HDMI_BRIGHTNESS, 4),
        NUMBER(PMX_SET_HDMI_CONTRAST, 5),
        NUMBER(PMX_SET_HDMI_HUE, 6),
        NUMBER(PMX_SET_HDMI_SATURATION, 7),
        NUMBER(PMX_CHG_DEEP_COLOR_BIT, 8),
        NUMBER(PMX_SET_VIDEO_PLL, 9),
        NUMBER(PMX_SET_HDMI_RES_CHG, 10),
        NUMBER(PMX_CHG_UI_RES_AUTO, 13),
        NUMBER(PMX_SET_HDMI_SHARPNESS, 15),
        NUMBER(PMX_SET_CCIR_RES_CHG, 16),
    });
}

TEST(NeighbourEnumerators, AvdCommandsOfTheExternalChip)
{
    expect_numbers({
        NUMBER(PMX_SET_EXT_SHARPNESS, 17),
        NUMBER(PMX_SET_EXT_BRIGHTNESS, 18),
        NUMBER(PMX_SET_EXT_CONTRAST, 19),
        NUMBER(PMX_SET_EXT_SATURATION, 20),
        NUMBER(PMX_SET_EXT_COLOR_SPACE, 21),
        NUMBER(PMX_SET_EXT_Y_C_DELAY, 22),
        NUMBER(PMX_SET_EXT_CUE_CORRECT, 23),
        NUMBER(PMX_SET_EXT_BORDER_LEVEL, 24),
        NUMBER(PMX_SET_EXT_DEINTERLACE_MODE, 25),
        NUMBER(PMX_SET_EXT_NOISE_REDUCTION, 26),
        NUMBER(PMX_SET_EXT_EDGE_ENHANCEMENT, 27),
        NUMBER(PMX_SET_EXT_DETAIL_ENHANCEMENT, 28),
        NUMBER(PMX_SET_EXT_ZOOM_IMAGE, 29),
        NUMBER(PMX_SET_EXT_GAMMA, 30),
        NUMBER(PMX_SET_EXT_DEEP_COLOR, 31),
    });
}

TEST(NeighbourEnumerators, AvdQueries)
{
    expect_numbers({ NUMBER(PMX_GET_VALID_RES_AND_VFREQ, 1) });
}

TEST(NeighbourEnumerators, MiddlewareDigitalFormats)
{
    expect_numbers({
        NUMBER(PLA_MXR_DIGITAL_OUTPUT_FMT_YBR, 0),
        NUMBER(PLA_MXR_DIGITAL_OUTPUT_FMT_RGB, 1),
        NUMBER(PLA_MXR_DIGITAL_OUTPUT_FMT_XVYCC, 2),
        NUMBER(PLA_MXR_DIGITAL_OUTPUT_FMT_YBR422, 3),
        NUMBER(PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB, 4),
    });
}

TEST(NeighbourEnumerators, MiddlewareExternalChipSettings)
{
    expect_numbers({
        NUMBER(PLA_MXR_EXT_SHARPNESS, 0),
        NUMBER(PLA_MXR_EXT_BRIGHTNESS, 1),
        NUMBER(PLA_MXR_EXT_CONTRAST, 2),
        NUMBER(PLA_MXR_EXT_SATURATION, 3),
        NUMBER(PLA_MXR_EXT_COLOR_SPACE, 4),
        NUMBER(PLA_MXR_EXT_Y_C_DELAY, 5),
        NUMBER(PLA_MXR_EXT_CUE_CORRECT, 6),
        NUMBER(PLA_MXR_EXT_BORDER_LEVEL, 7),
        NUMBER(PLA_MXR_EXT_DEINTERLACE_MODE, 8),
        NUMBER(PLA_MXR_EXT_NOISE_REDUCTION, 9),
        NUMBER(PLA_MXR_EXT_EDGE_ENHANCEMENT, 10),
        NUMBER(PLA_MXR_EXT_DETAIL_ENHANCEMENT, 11),
        NUMBER(PLA_MXR_EXT_ZOOM_IMAGE, 12),
        NUMBER(PLA_MXR_EXT_GAMMA, 13),
        NUMBER(PLA_MXR_EXT_DEEP_COLOR, 14),
    });
}

TEST(NeighbourEnumerators, MiddlewareClosedCaption)
{
    expect_numbers({ NUMBER(PLA_MXR_CLOSED_CAPTION_OFF, 0), NUMBER(PLA_MXR_CLOSED_CAPTION_ON, 1) });
}

TEST(NeighbourEnumerators, Are32BitsWide)
{
    EXPECT_TRUE((all_are_32_bits_wide<X_SEMA_TYPE_T, X_SEMA_OPTION_T, X_TIMER_FLAG_T, TVE_ASPECT_RATIO_T>));
    EXPECT_TRUE((all_are_32_bits_wide<VDP_ENABLE_T, ASPECT_RATIO_T, PMX_AVD_COMMAND_T, PMX_AVD_QUERY_T>));
    EXPECT_TRUE((all_are_32_bits_wide<HDMI_COLOR_SPACE_T, HDMI_PICTURE_ASPECT_RATIO_T, HDMI_AFD_FORMT_T>));
    EXPECT_TRUE((all_are_32_bits_wide<PLA_MXR_DIGITAL_OUTPUT_FMT_T, PLA_MXR_EXTERNAL_CHIP_SETTING_E>));
    EXPECT_TRUE((all_are_32_bits_wide<PLA_MXR_CLOSED_CAPTION_ON_OFF_T>));
}
